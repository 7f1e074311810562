// SPDX-License-Identifier: MIT
//
// Where a case takes its numbers from: given bytes as long as there are some, then a sequence that
// follows from a seed. The same on every machine and word size.

#ifndef TESTS_CHOICES_H
#define TESTS_CHOICES_H

#include <cstring>
#include <initializer_list>
#include <vector>

#include "baseTypes.h"
#include "support/random.h"

namespace tests {

class Choices {
 public:
  explicit Choices(uint64 seed) : random_(seed) {}
  Choices(const uint8* bytes, size_t size) : bytes_(bytes), left_(size), random_(1) {}

  uint8 byte() {
    if (left_ == 0) return static_cast<uint8>(random_.next() >> 56);
    --left_;
    return *bytes_++;
  }
  uint32 word() {
    uint32 word = byte();
    for (int i = 0; i < 3; ++i) word = word << 8 | byte();
    return word;
  }
  uint64 longWord() {
    const uint64 high = word();
    return high << 32 | word();
  }

  /// A number of [0, count).
  uint32 below(uint32 count) {
    if (count <= 256) return byte() % count;
    return word() % count;
  }
  /// A number of [low, high].
  int32 between(int32 low, int32 high) {
    const int64 span = int64{high} - low + 1;
    if (span <= 256) return static_cast<int32>(low + byte() % span);
    return static_cast<int32>(low + word() % span);
  }
  bool chance(uint32 oneIn) { return below(oneIn) == 0; }
  template <class T> T oneOf(std::initializer_list<T> values) {
    return values.begin()[below(static_cast<uint32>(values.size()))];
  }

  /// Any double: often a plain factor, sometimes any pattern of bits.
  double number() {
    switch (below(4)) {
      case 0: {
        const uint64 bits = longWord();
        double value = 0;
        memcpy(&value, &bits, sizeof value);
        return value;
      }
      case 1:
        return between(-40, 40);
      default:
        return between(1, 60000) / 10000.0;
    }
  }
  /// A factor that pictures are scaled by.
  double factor() { return between(200, 60000) / 10000.0; }

  /// Bytes that follow from one word, half of the time with runs.
  std::vector<uint8> fill(size_t size) {
    Random random(word());
    if (below(2) == 0) return random.bytes(size);
    std::vector<uint8> bytes(size);
    for (size_t at = 0; at < size;) {
      const uint32 pixel = random.below(4) * 0x40302010u;
      for (uint32 run = 1 + random.below(60); run != 0 && at < size; --run, ++at)
        bytes[at] = static_cast<uint8>(pixel >> (at % 4 * 8));
    }
    return bytes;
  }

 private:
  const uint8* bytes_ = nullptr;
  size_t left_ = 0;
  Random random_;
};

}  // namespace tests

#endif
