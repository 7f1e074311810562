// SPDX-License-Identifier: MIT
//
// Where the rows of a rectangle lie, for tests that lay rectangles over each other at will and then
// give them exactly the memory that they touch.

#ifndef TESTS_BYTE_RANGE_H
#define TESTS_BYTE_RANGE_H

#include <algorithm>
#include <cstdint>

#include "baseTypes.h"

namespace tests {

/// The bytes from `begin` up to `end`, as positions relative to any origin.
struct ByteRange {
  int64 begin = 0;
  int64 end = 0;

  size_t size() const { return static_cast<size_t>(end - begin); }

  /// The smallest range with both in it.
  ByteRange with(const ByteRange& other) const {
    if (other.begin == other.end) return *this;
    if (begin == end) return other;
    return {std::min(begin, other.begin), std::max(end, other.end)};
  }
};

/// What `height` rows of `bytes` bytes touch, the first one at `first`, each next one `step` later.
inline ByteRange rowsRange(int64 first, int64 step, int64 bytes, int64 height) {
  if (bytes <= 0 || height <= 0) return {};
  const int64 last = first + (height - 1) * step;
  return {std::min(first, last), std::max(first, last) + bytes};
}

/// `origin` moved by `offset` bytes, which may leave the buffer on the way.
inline uint8* moved(uint8* origin, int64 offset) {
  return reinterpret_cast<uint8*>(  // NOLINT(performance-no-int-to-ptr)
      reinterpret_cast<uintptr_t>(origin) + static_cast<uintptr_t>(offset));
}

}  // namespace tests

#endif
