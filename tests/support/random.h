// SPDX-License-Identifier: MIT
//
// Seeded random numbers for the differential tests: the same on every machine and word size.
//
// RASTER_TEST_SEED=N gives every generator another sequence, RASTER_TEST_ROUNDS=N lets the random
// tests run N rounds each in place of their own number. A failed test names both (main.cpp).

#ifndef TESTS_RANDOM_H
#define TESTS_RANDOM_H

#include <cstdlib>
#include <initializer_list>
#include <vector>

#include "baseTypes.h"

namespace tests {

/// A number from the environment, or another one where there is none.
inline uint64 fromEnvironment(const char* name, uint64 otherwise) {
  const char* const text = getenv(name);
  return text == nullptr ? otherwise : strtoull(text, nullptr, 0);
}

/// How many rounds a random test runs that asks for so many.
inline int rounds(int count) {
  return static_cast<int>(fromEnvironment("RASTER_TEST_ROUNDS", static_cast<uint64>(count)));
}

/// Steele and Vigna's SplitMix64.
class Random {
 public:
  /// `seed` tells the generators of a program apart.
  explicit Random(uint64 seed) : state_(seed + (fromEnvironment("RASTER_TEST_SEED", 0) << 32)) {}

  uint64 next() {
    uint64 z = (state_ += 0x9E3779B97F4A7C15u);
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9u;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBu;
    return z ^ (z >> 31);
  }
  uint32 word() { return static_cast<uint32>(next() >> 32); }

  /// A number of [0, count).
  uint32 below(uint32 count) { return static_cast<uint32>(next() % count); }

  /// A number of [low, high].
  int32 between(int32 low, int32 high) {
    const int64 span = int64{high} - low + 1;
    return static_cast<int32>(low + static_cast<int64>(next() % static_cast<uint64>(span)));
  }

  template <class T> T oneOf(std::initializer_list<T> values) {
    return values.begin()[below(static_cast<uint32>(values.size()))];
  }

  std::vector<uint8> bytes(size_t count) {
    std::vector<uint8> result(count);
    for (uint8& byte : result) byte = static_cast<uint8>(next() >> 56);
    return result;
  }

 private:
  uint64 state_;
};

}  // namespace tests

#endif
