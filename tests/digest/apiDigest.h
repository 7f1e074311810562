// SPDX-License-Identifier: MIT
//
// The digest of all that comes of the first cases.

#ifndef TESTS_API_DIGEST_H
#define TESTS_API_DIGEST_H

#include <string>

#include "digest/apiCases.h"
#include "digest/sha256.h"

namespace tests {

class HashSink : public Sink {
 public:
  void add(const void* bytes, size_t size) override { hash_.add(bytes, size); }
  std::string finish() { return hash_.finish(); }

 private:
  Sha256 hash_;
};

/// With the functions that this program is linked with; `mmxSwitch` stands for the library's word.
inline std::string digestOfCases(int cases, uint32* mmxSwitch) {
#define RASTER_API_VALUE(name) &::name,
  const Api api = {RASTER_API(RASTER_API_VALUE) mmxSwitch};
#undef RASTER_API_VALUE
  HashSink sink;
  for (int i = 0; i < cases; ++i) {
    Choices choices(static_cast<uint64>(i) + 1);
    runApiCase(api, choices, sink);
  }
  return sink.finish();
}

}  // namespace tests

#endif
