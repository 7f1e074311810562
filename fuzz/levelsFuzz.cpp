// SPDX-License-Identifier: MIT
//
// Every function at every instruction-set level that is built, in one process: the same results.
//
// A library settles its level once, so there is a copy of its file for every level.

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "digest/apiCases.h"
#include "fuzzing.h"

namespace {

using fuzz::require;
using tests::Api;

constexpr const char* kLevels[] = {"scalar", "avx2", "avx3"};

class Results : public tests::Sink {
 public:
  void add(const void* bytes, size_t size) override {
    const auto* first = static_cast<const uint8*>(bytes);
    all.insert(all.end(), first, first + size);
  }
  fuzz::Bytes all;
};

void* nameOf(void* library, const char* name) {
  void* found = dlsym(library, name);
  if (found == nullptr) fprintf(stderr, "no %s\n", name), abort();
  return found;
}

/// Loads the library's copy for a level and lets it settle there.
Api loadLevel(const std::string& level) {
  const std::string path = std::string(RASTER_LEVELS_FOLDER) + "/libraster-" + level + ".so";
  void* library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) fprintf(stderr, "%s\n", dlerror()), abort();
  setenv("RASTER_CPU_LEVEL", level.c_str(), 1);
  Api api = {};
#define RASTER_API_LOAD(name) \
  api.name = reinterpret_cast<decltype(api.name)>(nameOf(library, #name));
  RASTER_API(RASTER_API_LOAD)
#undef RASTER_API_LOAD
  api.mmxSwitch = static_cast<uint32*>(nameOf(library, "rasterops_mmx"));
  uint8 pixel[4] = {};
  api.Raster_RectROPfill(pixel, 4, 4, 0, 6, 0, 0, 1, 1);
  return api;
}

const std::vector<Api>& apis() {
  static const std::vector<Api> loaded = [] {
    std::vector<Api> all;
    for (const char* level : kLevels) all.push_back(loadLevel(level));
    return all;
  }();
  return loaded;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  fuzz::Bytes expected;
  for (const Api& api : apis()) {
    tests::Choices choices(bytes, size);
    Results results;
    runApiCase(api, choices, results);
    if (&api == &apis().front()) {
      expected = results.all;
    } else {
      require(results.all == expected);
    }
  }
  return 0;
}
