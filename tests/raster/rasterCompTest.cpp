// SPDX-License-Identifier: MIT
//
// Comparison against the naive model: equal pictures, one difference at every place, noise; and the
// cases that the interface names.

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <string>

#include "raster.h"
#include "reference/rasterCompReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using reference::Rows;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;

int signOf(int32 value) { return (value > 0 ? 1 : 0) - (value < 0 ? 1 : 0); }

bool isPlainPanic(const Messages& said) {
  return said.warning.empty() &&
         tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterComp");
}

// ---- Plain -------------------------------------------------------------------------------------

/// A rectangle in a buffer that holds it exactly, guard to guard.
struct Side {
  size_t base;
  uint32 pitch;
  uint32 x, y;
};

/// The same rectangle in two buffers.
struct Case {
  uint32 bytesPerPixel;
  uint32 width, height;
  Side a, b;

  size_t first(const Side& side) const {
    return side.base + size_t{side.y} * side.pitch + size_t{side.x} * bytesPerPixel;
  }
  size_t end(const Side& side) const {
    const size_t lastRow = height == 0 ? 0 : height - 1;
    return first(side) + lastRow * side.pitch + size_t{width} * bytesPerPixel;
  }
  std::string describe() const {
    const auto text = [](const Side& s) {
      return " base " + std::to_string(s.base) + " pitch " + std::to_string(s.pitch) + " at " +
             std::to_string(s.x) + "," + std::to_string(s.y);
    };
    return std::to_string(width) + "x" + std::to_string(height) + " of " +
           std::to_string(bytesPerPixel) + " bytes, a" + text(a) + ", b" + text(b);
  }
};

Case someCase(Random& random) {
  Case c{};
  c.bytesPerPixel = 1 + random.below(5);
  c.width = tests::someWidth(random);
  c.height = random.below(c.width > 100 ? 4 : 12);
  const bool contiguous = random.below(3) == 0;
  for (Side* side : {&c.a, &c.b}) {
    side->base = random.below(70);
    side->x = contiguous ? 0 : random.below(9);
    side->y = random.below(4);
    side->pitch = (side->x + c.width) * c.bytesPerPixel + (contiguous ? 0 : random.below(40));
  }
  return c;
}

/// Two guarded buffers with equal pixels in the rectangle and noise around it.
struct Buffers {
  Buffers(Random& random, const Case& c)
      : a(random.bytes(c.end(c.a))),
        b(random.bytes(c.end(c.b))),
        memoryA(a.size(), tests::someGuard(random)),
        memoryB(b.size(), tests::someGuard(random)) {
    for (uint32 y = 0; y < c.height; ++y) {
      for (size_t i = 0; i < size_t{c.width} * c.bytesPerPixel; ++i) {
        const bool unused = c.bytesPerPixel == 4 && i % 4 == 3;
        if (!unused) b[c.first(c.b) + y * c.b.pitch + i] = a[c.first(c.a) + y * c.a.pitch + i];
      }
    }
  }

  int32 compare(const Case& c) {
    memoryA.assign(a);
    memoryB.assign(b);
    const auto bpp = static_cast<int32>(8 * c.bytesPerPixel);
    return Raster_ComparePixels(memoryA.data() + c.a.base, c.a.pitch, bpp,
                                memoryB.data() + c.b.base, c.b.pitch, bpp, c.a.x, c.a.y, c.b.x,
                                c.b.y, c.width, c.height);
  }
  int expected(const Case& c) const {
    return reference::compare(a, {c.first(c.a), c.a.pitch}, b, {c.first(c.b), c.b.pitch},
                              c.bytesPerPixel, c.width, c.height);
  }

  Bytes a, b;
  GuardedBuffer memoryA, memoryB;
};

TEST(Raster_ComparePixels, FindsEqualRectanglesEqualWithinDifferentSurroundings) {
  Random random(1);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    const Case c = someCase(random);
    Buffers buffers(random, c);
    ASSERT_EQ(buffers.compare(c), 0) << "round " << round << ": " << c.describe();
  }
}

TEST(Raster_ComparePixels, HasTheSignOfTheFirstDifference) {
  Random random(2);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    Case c = someCase(random);
    if (c.width == 0) c.width = 1;
    if (c.height == 0) c.height = 1;
    if (c.a.pitch < (c.a.x + c.width) * c.bytesPerPixel) c.a.pitch += c.bytesPerPixel;
    if (c.b.pitch < (c.b.x + c.width) * c.bytesPerPixel) c.b.pitch += c.bytesPerPixel;
    Buffers buffers(random, c);
    // One, two or many differing bytes.
    const uint32 differences = random.oneOf({1u, 2u, 2u, 50u});
    for (uint32 i = 0; i < differences; ++i) {
      const size_t row = random.below(c.height);
      const size_t byte = random.below(c.width * c.bytesPerPixel);
      buffers.b[c.first(c.b) + row * c.b.pitch + byte] ^= static_cast<uint8>(1 + random.below(255));
    }
    ASSERT_EQ(signOf(buffers.compare(c)), buffers.expected(c))
        << "round " << round << ": " << c.describe();
  }
}

TEST(Raster_ComparePixels, SeesADifferenceAtEveryPositionAndLane) {
  Random random(3);
  for (uint32 width = 1; width <= 200; width += width < 70 ? 1 : 13) {
    Case c{4, width, 1, {0, 4 * width, 0, 0}, {1, 4 * width, 0, 0}};
    Buffers buffers(random, c);
    for (size_t byte = 0; byte < size_t{4} * width; ++byte) {
      for (const uint8 flip : {uint8{0x01}, uint8{0x80}}) {
        buffers.b[1 + byte] ^= flip;
        const int32 order = buffers.compare(c);
        ASSERT_EQ(signOf(order), buffers.expected(c)) << "width " << width << " byte " << byte;
        ASSERT_EQ(order == 0, byte % 4 == 3);
        buffers.b[1 + byte] ^= flip;
      }
    }
  }
}

TEST(Raster_ComparePixels, ComparesBytesAsUnsigned) {
  for (const int32 bpp : {8, 16, 24, 32}) {
    const uint8 a[4] = {0x80, 0, 0, 0};
    const uint8 b[4] = {0x7F, 0xFF, 0xFF, 0xFF};
    EXPECT_GT(Raster_ComparePixels(a, 4, bpp, b, 4, bpp, 0, 0, 0, 0, 1, 1), 0);
    EXPECT_LT(Raster_ComparePixels(b, 4, bpp, a, 4, bpp, 0, 0, 0, 0, 1, 1), 0);
  }
}

TEST(Raster_ComparePixels, LooksAtTheLowestAddressFirst) {
  const uint8 a[4] = {1, 9, 0, 0};
  const uint8 b[4] = {2, 0, 0, 0};
  EXPECT_LT(Raster_ComparePixels(a, 4, 32, b, 4, 32, 0, 0, 0, 0, 1, 1), 0);
  EXPECT_LT(Raster_ComparePixels(a, 3, 24, b, 3, 24, 0, 0, 0, 0, 1, 1), 0);
}

// Deliberate: the fourth byte of a 4-byte pixel never counts.
TEST(Raster_ComparePixels, IgnoresTheFourthByte) {
  Bytes a(40 * 10 * 4, 0x55);
  Bytes b = a;
  for (size_t i = 3; i < b.size(); i += 4) b[i] = 0xAA;
  EXPECT_EQ(Raster_ComparePixels(a.data(), 160, 32, b.data(), 160, 32, 0, 0, 0, 0, 40, 10), 0);
  EXPECT_EQ(Raster_ComparePixels(a.data(), 160, 32, b.data(), 160, 32, 1, 0, 2, 1, 30, 9), 0);
}

TEST(Raster_ComparePixels, PanicsForUnequalOrOddBitsPerPixelInAnyRectangle) {
  const std::array<int32, 2> cases[] = {{16, 32}, {12, 12}, {8, 12}, {12, 8}, {32, 24}, {15, 16}};
  for (const auto& [aBpp, bBpp] : cases) {
    for (const uint32 height : {0u, 1u}) {
      const Messages said = tests::messagesOf([&, a = aBpp, b = bBpp] {
        Raster_ComparePixels(nullptr, 0, a, nullptr, 0, b, 0, 0, 0, 0, 1, height);
      });
      EXPECT_TRUE(isPlainPanic(said)) << aBpp << " and " << bBpp << ": " << said.panic;
    }
  }
}

TEST(Raster_ComparePixels, FindsNoRowsEqual) {
  for (const int32 bpp : {8, 16, 24, 32})
    EXPECT_EQ(Raster_ComparePixels(nullptr, 5, bpp, nullptr, 7, bpp, 1, 2, 3, 4, 5, 0), 0);
}

// ---- Over a list -------------------------------------------------------------------------------

TEST(Raster_CompareRects, ReturnsTheFirstDifferenceOfTheListInItsOrder) {
  Bytes a(64 * 4 * 8, 5);
  Bytes b = a;
  b[3 * 256 + 10 * 4] = 9;  // a is less at (10, 3)
  b[1 * 256 + 40 * 4] = 1;  // a is more at (40, 1)
  const auto compare = [&](const RectList& list) {
    return signOf(Raster_CompareRects(a.data(), 256, 32, b.data(), 256, 32, &list));
  };
  EXPECT_EQ(compare({{{0, 0, 10, 8}, {11, 0, 29, 8}}}), 0);
  EXPECT_EQ(compare({{{0, 0, 10, 8}, {10, 3, 1, 1}, {40, 1, 1, 1}}}), -1);
  EXPECT_EQ(compare({{{0, 0, 10, 8}, {40, 1, 1, 1}, {10, 3, 1, 1}}}), 1);
}

TEST(Raster_CompareRects, EndsAtAnEntryThatIsEmptyByWidthOrHeight) {
  const Bytes a(100, 1);
  const Bytes b(100, 2);
  for (const auto& [width, height] : {std::array{0, 5}, std::array{5, 0}, std::array{-5, 5},
                                      std::array{5, -5}, std::array{0, 0}}) {
    const RectList list = {{{0, 0, width, height}, {0, 0, 5, 5}}};
    EXPECT_EQ(Raster_CompareRects(a.data(), 10, 8, b.data(), 10, 8, &list), 0);
  }
}

TEST(Raster_CompareRects, ReturnsZeroForAnEmptyFirstEntryEvenWithBadBitsPerPixel) {
  const RectList list = {};
  EXPECT_EQ(Raster_CompareRects(nullptr, 0, 12, nullptr, 0, 32, &list), 0);
  const RectList one = {{{0, 0, 1, 1}}};
  EXPECT_TRUE(isPlainPanic(
      tests::messagesOf([&] { Raster_CompareRects(nullptr, 0, 12, nullptr, 0, 32, &one); })));
}

// Deliberate: nothing but an empty entry ends the walk.
TEST(Raster_CompareRects, WalksPastTheSixteenthEntry) {
  const Bytes a(100, 1);
  Bytes b = a;
  b[17] = 0;
  std::array<RectListEntry, 18> entries{};
  for (int32 i = 0; i < 16; ++i) entries[static_cast<size_t>(i)] = {i, 0, 1, 1};
  const auto compare = [&] {
    return signOf(Raster_CompareRects(a.data(), 100, 8, b.data(), 100, 8,
                                      reinterpret_cast<const RectList*>(entries.data())));
  };
  EXPECT_EQ(compare(), 0);
  entries[16] = {17, 0, 1, 1};
  EXPECT_EQ(compare(), 1);
}

// ---- Under a mask ------------------------------------------------------------------------------

/// Three images without gaps, as Raster_CompareMasked wants them.
struct Images {
  Bytes a, b, mask;
  uint32 width, height;
  int32 bpp;

  uint32 pitch() const { return width * static_cast<uint32>((bpp + 7) / 8); }
  bool compare(int32 maxDiffs) const {
    return Raster_CompareMasked(a.data(), pitch(), bpp, b.data(), pitch(), bpp, mask.data(),
                                pitch(), bpp, 0, 0, width, height, maxDiffs);
  }
  bool expected(int32 maxDiffs) const {
    return reference::compareMasked(a, b, mask, bpp, maxDiffs);
  }
  /// In memory that ends at a guard page.
  bool compareGuarded(int32 maxDiffs) const {
    GuardedBuffer guardedA(a.size());
    GuardedBuffer guardedB(b.size());
    GuardedBuffer guardedMask(mask.size());
    guardedA.assign(a);
    guardedB.assign(b);
    guardedMask.assign(mask);
    return Raster_CompareMasked(guardedA.data(), pitch(), bpp, guardedB.data(), pitch(), bpp,
                                guardedMask.data(), pitch(), bpp, 0, 0, width, height, maxDiffs);
  }
};

Images someImages(Random& random, int32 bpp) {
  Images images{{}, {}, {}, tests::someWidth(random), random.below(8), bpp};
  const size_t total = size_t{images.pitch()} * images.height;
  images.a = random.bytes(total);
  images.b = images.a;
  images.mask = random.bytes(total);
  // From no difference to nothing but differences; masks with holes.
  const uint32 oneIn = random.oneOf({1u, 3u, 40u, 1000u, 1000000u});
  const uint32 hole = random.oneOf({1u, 2u, 1000u});
  for (size_t i = 0; i < total; ++i) {
    if (random.below(oneIn) == 0) images.b[i] ^= static_cast<uint8>(random.word());
    if (random.below(hole) == 0) images.mask[i] = static_cast<uint8>(random.below(2));
  }
  return images;
}

TEST(Raster_CompareMasked, EqualsTheModelAroundTheExactNumberOfDifferences) {
  Random random(4);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    const int32 bpp = random.oneOf({8, 5, 16, 15, 24, 32, 25, 40});
    const Images images = someImages(random, bpp);
    // The least tolerance that lets the images pass.
    int32 low = 0;
    int32 high = static_cast<int32>(images.a.size()) + 1;
    while (low < high) {
      const int32 middle = (low + high) / 2;
      if (images.expected(middle)) {
        high = middle;
      } else {
        low = middle + 1;
      }
    }
    for (const int32 maxDiffs : {low, low - 1, low + 1, 0, -1, INT_MAX, INT_MIN}) {
      ASSERT_EQ(images.compareGuarded(maxDiffs), images.expected(maxDiffs))
          << "round " << round << ": " << images.width << "x" << images.height << " bpp " << bpp
          << " maxDiffs " << maxDiffs;
    }
  }
}

TEST(Raster_CompareMasked, CountsADifferenceAtEveryPosition) {
  for (const int32 bpp : {8, 16, 24, 32}) {
    Images images{Bytes(600, 7),
                  Bytes(600, 7),
                  Bytes(600, 0x10),
                  600u / static_cast<uint32>(bpp / 8),
                  1,
                  bpp};
    for (size_t i = 0; i < 600; ++i) {
      images.b[i] = 7 ^ 0x10;
      ASSERT_EQ(images.compare(0), bpp == 32 && i % 4 == 3) << "bpp " << bpp << " byte " << i;
      ASSERT_TRUE(images.compare(1));
      images.b[i] = 7 ^ 0x20;  // outside of the mask; with one byte per pixel the byte counts whole
      ASSERT_EQ(images.compare(0), bpp != 8 || (bpp == 32 && i % 4 == 3));
      images.b[i] = 7;
    }
  }
}

TEST(Raster_CompareMasked, IgnoresBytesUnderAMaskOfZero) {
  Images images{{1, 2, 3}, {9, 8, 7}, {0, 0, 0}, 3, 1, 8};
  EXPECT_TRUE(images.compare(0));
  images.mask[1] = 1;
  EXPECT_FALSE(images.compare(0));
  EXPECT_TRUE(images.compare(1));
}

TEST(Raster_CompareMasked, TakesTheMaskOfLargerPixelsAsBits) {
  const Images images{{0x10, 0xF0}, {0x20, 0x00}, {0x0F, 0x0F}, 1, 1, 16};
  EXPECT_TRUE(images.compare(0));
}

// Deliberate: every size that rounds up to four bytes leaves out the fourth.
TEST(Raster_CompareMasked, SkipsTheFourthByteFromTwentyFiveToThirtyTwoBits) {
  for (int32 bpp = 25; bpp <= 32; ++bpp) {
    Images images{Bytes(400, 1), Bytes(400, 1), Bytes(400, 0xFF), 100, 1, bpp};
    for (size_t i = 3; i < 400; i += 4) images.b[i] = 2;
    EXPECT_TRUE(images.compare(0)) << bpp;
    images.b[398] = 2;
    EXPECT_FALSE(images.compare(0)) << bpp;
  }
}

// Deliberate: bytes are counted against maxDiffs times the bytes per pixel, the fourth included.
TEST(Raster_CompareMasked, AllowsFourDifferingBytesForEachPixelOfFour) {
  Images images{Bytes(80, 1), Bytes(80, 1), Bytes(80, 0xFF), 20, 1, 32};
  for (size_t i = 0; i < 4; ++i) images.b[4 * i] = 2;
  EXPECT_TRUE(images.compare(1));  // four pixels, one byte each
  images.b[16] = 2;
  EXPECT_FALSE(images.compare(1));
}

TEST(Raster_CompareMasked, FindsImagesWithoutBytesEqual) {
  EXPECT_TRUE(Raster_CompareMasked(nullptr, 0, 8, nullptr, 0, 8, nullptr, 0, 8, 0, 0, 0, 5, 0));
  EXPECT_TRUE(
      Raster_CompareMasked(nullptr, 20, 32, nullptr, 20, 32, nullptr, 20, 32, 0, 0, 5, 0, -1));
}

/// The arguments of a masked comparison that can break a precondition, all of them good.
struct Preconditions {
  int32 aBpp = 16, bBpp = 16, maskBpp = 16;
  uint32 aPitch = 20, bPitch = 20, maskPitch = 20;
  int32 x = 0, y = 0;
  uint32 width = 10;

  Messages messages() const {
    const Bytes bytes(1000);
    const uint8* p = bytes.data();
    return tests::messagesOf([=, *this] {
      Raster_CompareMasked(p, aPitch, aBpp, p, bPitch, bBpp, p, maskPitch, maskBpp, x, y, width, 5,
                           0);
    });
  }
};

TEST(Raster_CompareMasked, PanicsForEachBrokenPrecondition) {
  EXPECT_EQ(Preconditions{}.messages().panic, "");
  const Preconditions broken[] = {
      {.aBpp = 15},
      {.bBpp = 15},
      {.maskBpp = 15},
      {.aPitch = 21},
      {.bPitch = 21},
      {.maskPitch = 21},
      {.x = 1},
      {.x = -1},
      {.y = 1},
      {.y = -1},
      {.width = 9},
      {.width = 11},
      {.aPitch = 24, .bPitch = 24, .maskPitch = 24},  // rows with padding
  };
  for (const Preconditions& p : broken)
    EXPECT_TRUE(isPlainPanic(p.messages())) << &p - broken << ": " << p.messages().panic;
}

TEST(Raster_CompareMasked, TestsItsPreconditionsInOrder) {
  // Each case breaks one more of the later conditions and must still report the same line.
  const std::string bits = Preconditions{.aBpp = 15}.messages().panic;
  const std::string pitches = Preconditions{.aPitch = 21}.messages().panic;
  const std::string place = Preconditions{.x = 1}.messages().panic;
  const std::string padding = Preconditions{.width = 9}.messages().panic;
  EXPECT_EQ((Preconditions{.aBpp = 15, .aPitch = 21, .x = 1, .width = 9}.messages().panic), bits);
  EXPECT_EQ((Preconditions{.aPitch = 21, .x = 1, .width = 9}.messages().panic), pitches);
  EXPECT_EQ((Preconditions{.x = 1, .width = 9}.messages().panic), place);
  EXPECT_NE(bits, pitches);
  EXPECT_NE(pitches, place);
  EXPECT_NE(place, padding);
}

}  // namespace
