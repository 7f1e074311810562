// SPDX-License-Identifier: MIT
//
// Rows of pixels that together are larger than a cache.

#ifndef TESTS_BIG_ROWS_H
#define TESTS_BIG_ROWS_H

#include <gtest/gtest.h>

#include <ostream>
#include <vector>

#include "support/guardedBuffer.h"
#include "support/random.h"

namespace tests {

/// A destination that lies anywhere, with gaps between its rows or without.
struct BigRows {
  size_t base;
  uint32 bytesPerPixel;
  uint32 pitch;
  uint32 width;
  uint32 height;

  size_t end() const { return base + size_t{pitch} * (height - 1) + size_t{width} * bytesPerPixel; }
};

inline std::ostream& operator<<(std::ostream& out, const BigRows& r) {
  return out << "base " << r.base << " pitch " << r.pitch << " size " << r.width << "x" << r.height
             << " bytes " << r.bytesPerPixel;
}

/// Rows of `width` pixels, at least `pixels` in all.
inline BigRows someBigRows(Random& random, uint32 bytesPerPixel, uint32 width, size_t pixels) {
  BigRows rows{};
  const uint32 gap = random.below(2) * bytesPerPixel * (1 + random.below(7));
  rows.base = size_t{random.below(64)} * bytesPerPixel;
  rows.bytesPerPixel = bytesPerPixel;
  rows.width = width;
  rows.pitch = width * bytesPerPixel + gap;
  rows.height = static_cast<uint32>(pixels / width) + 1;
  return rows;
}

/// Noise that is made fast.
inline std::vector<uint8> noise(Random& random, size_t size) {
  std::vector<uint8> bytes = random.bytes(65521);
  bytes.reserve(size + bytes.size());
  while (bytes.size() < size) bytes.insert(bytes.end(), bytes.begin(), bytes.begin() + 65521);
  bytes.resize(size);
  return bytes;
}

/// Whether two buffers are equal; tells where they are not, in place of all their bytes.
inline testing::AssertionResult areEqual(const GuardedBuffer& actual,
                                         const std::vector<uint8>& expected) {
  for (size_t i = 0; i < expected.size(); ++i) {
    if (actual.data()[i] != expected[i])
      return testing::AssertionFailure() << "byte " << i << " of " << expected.size() << " differs";
  }
  return testing::AssertionSuccess();
}

}  // namespace tests

#endif
