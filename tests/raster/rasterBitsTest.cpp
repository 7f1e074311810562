// SPDX-License-Identifier: MIT
//
// Bit-plane expansion against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <string>

#include "raster.h"
#include "reference/rasterBitsReference.h"
#include "support/byteRange.h"
#include "support/guardedBuffer.h"
#include "support/level.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using tests::ByteRange;
using tests::Guard;
using tests::GuardedBuffer;
using tests::Random;
using tests::rowsRange;

using Expand = void (*)(const uint8*, uint32, uint8*, uint32, int32, int32, uint32, uint32);
constexpr Expand kExpand[] = {nullptr, RasterBitsToPixels8, RasterBitsToPixels16,
                              RasterBitsToPixels24, RasterBitsToPixels32};
using Stencil = void (*)(const uint8*, uint32, uint8*, uint32, int32, int32, uint32);
constexpr Stencil kStencil[] = {nullptr, RasterBitsToPixelsStencil8, RasterBitsToPixelsStencil16,
                                RasterBitsToPixelsStencil24, RasterBitsToPixelsStencil32};

struct Plane {
  uint32 bitsPitch, dstPitch, bytesPerPixel;
  int32 width, height;
  uint32 foreground, background;
  bool stencil, throughWorker;

  ByteRange bitsRange(int64 bits) const {
    return rowsRange(bits, bitsPitch, (int64{width} + 7) / 8, height);
  }
  ByteRange dstRange(int64 dst) const {
    return rowsRange(dst, dstPitch, int64{width} * bytesPerPixel, height);
  }

  void run(const uint8* bits, uint8* dst) const {
    const auto size = static_cast<int32>(bytesPerPixel);
    if (stencil && throughWorker) {
      kStencil[bytesPerPixel](bits, bitsPitch, dst, dstPitch, width, height, foreground);
    } else if (stencil) {
      Raster_BitsToPixelsStencil(bits, bitsPitch, dst, dstPitch, size, width, height, foreground);
    } else if (throughWorker) {
      kExpand[bytesPerPixel](bits, bitsPitch, dst, dstPitch, width, height, foreground, background);
    } else {
      Raster_BitsToPixels(bits, bitsPitch, dst, dstPitch, size, width, height, foreground,
                          background);
    }
  }

  std::string text() const {
    return "pitches " + std::to_string(bitsPitch) + "," + std::to_string(dstPitch) + " bytes " +
           std::to_string(bytesPerPixel) + " size " + std::to_string(width) + "x" +
           std::to_string(height) + " colours " + std::to_string(foreground) + "," +
           std::to_string(background) + (stencil ? " stencil" : "") +
           (throughWorker ? " worker" : "");
  }
};

Plane somePlane(Random& random) {
  Plane p{};
  p.bytesPerPixel = 1 + random.below(4);
  p.width = random.below(10) == 0 ? random.between(300, 2000) : random.between(-2, 140);
  p.height = random.between(-1, p.width > 140 ? 3 : 9);
  const auto columns = static_cast<uint32>(std::max(p.width, 0));
  p.bitsPitch = random.oneOf({(columns + 7) / 8, (columns + 7) / 8 + random.below(9)});
  p.dstPitch = columns * p.bytesPerPixel + random.below(2) * random.below(40);
  p.foreground = random.word();
  p.background = random.word();
  p.stencil = random.below(2) != 0;
  p.throughWorker = random.below(2) != 0;
  return p;
}

TEST(Raster_BitsToPixels, EqualsTheModelAndReadsNoByteTooMany) {
  Random random(1);
  for (int round = 0; round < tests::rounds(10000); ++round) {
    const Plane p = somePlane(random);
    const Bytes plane = random.bytes(p.bitsRange(0).size());
    const Bytes before = random.bytes(p.dstRange(0).size());
    GuardedBuffer bits(plane.size(), tests::someGuard(random));
    GuardedBuffer dst(before.size(), tests::someGuard(random));
    bits.assign(plane);
    dst.assign(before);
    Bytes both = before;
    both.insert(both.end(), plane.begin(), plane.end());
    reference::bitsToPixels(both, static_cast<int64>(before.size()), p.bitsPitch, 0, p.dstPitch,
                            p.bytesPerPixel, p.width, p.height, p.foreground, p.background,
                            p.stencil);
    p.run(bits.data(), dst.data());
    Bytes after = dst.bytes();
    const Bytes planeAfter = bits.bytes();
    after.insert(after.end(), planeAfter.begin(), planeAfter.end());
    ASSERT_EQ(after, both) << "round " << round << ": " << p.text();
  }
}

// Larger rectangles have loops of their own, which ask for memory ahead.
TEST(Raster_BitsToPixels, EqualsTheModelBeyondTheInnerCaches) {
  constexpr uint32 kInnerCaches = 512 * 1024;
  Random random(5);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (const bool stencil : {false, true}) {
      Plane p{};
      p.bytesPerPixel = bytesPerPixel;
      p.width = random.between(1000, 1100);
      const uint32 rowBytes = static_cast<uint32>(p.width) * bytesPerPixel;
      p.height = static_cast<int32>(kInnerCaches / rowBytes) + 1;
      p.bitsPitch = 140;
      p.dstPitch = rowBytes + random.below(40);
      p.foreground = random.word();
      p.background = random.word();
      p.stencil = stencil;
      const Bytes plane = random.bytes(p.bitsRange(0).size());
      GuardedBuffer dst(p.dstRange(0).size());
      Bytes expected = random.bytes(dst.size());
      dst.assign(expected);
      expected.insert(expected.end(), plane.begin(), plane.end());
      reference::bitsToPixels(expected, static_cast<int64>(dst.size()), p.bitsPitch, 0, p.dstPitch,
                              bytesPerPixel, p.width, p.height, p.foreground, p.background,
                              stencil);
      p.run(plane.data(), dst.data());
      expected.resize(dst.size());
      ASSERT_TRUE(dst.bytes() == expected) << p.text();
    }
  }
}

TEST(Raster_BitsToPixels, LooksAtThePlaneForEveryFourPixelsWhereItLiesInTheRectangle) {
  Random random(2);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    Plane p = somePlane(random);
    if (random.below(4) == 0) p.dstPitch = random.below(p.dstPitch + 1);
    const ByteRange alone = p.dstRange(0);
    int64 bits = random.between(-130, static_cast<int32>(alone.size()) + 130);
    const ByteRange both = alone.with(p.bitsRange(bits));
    bits -= both.begin;
    const int64 dst = -both.begin;
    Bytes expected = random.bytes(both.size());
    GuardedBuffer actual(expected.size(), tests::someGuard(random));
    actual.assign(expected);
    reference::bitsToPixels(expected, bits, p.bitsPitch, dst, p.dstPitch, p.bytesPerPixel, p.width,
                            p.height, p.foreground, p.background, p.stencil);
    p.run(tests::moved(actual.data(), bits), tests::moved(actual.data(), dst));
    ASSERT_EQ(actual.bytes(), expected)
        << "round " << round << " bits at " << bits << " dst at " << dst << ": " << p.text();
  }
}

TEST(Raster_BitsToPixels, IgnoresTheBitsBeyondTheWidth) {
  const uint8 bits[] = {0xA0};
  uint8 row[4] = {9, 9, 9, 9};
  Raster_BitsToPixels(bits, 1, row, 4, 1, 3, 1, 1, 2);
  EXPECT_EQ(Bytes(row, row + 4), (Bytes{1, 2, 1, 9}));
}

TEST(Raster_BitsToPixels, TakesTheNinthPixelFromTheSecondByte) {
  GuardedBuffer bits(2);
  bits.assign({0x01, 0x80});
  uint8 row[9] = {};
  Raster_BitsToPixels(bits.data(), 2, row, 9, 1, 9, 1, 1, 2);
  EXPECT_EQ(Bytes(row, row + 9), (Bytes{2, 2, 2, 2, 2, 2, 2, 1, 1}));
}

TEST(Raster_BitsToPixels, DoesNothingForAPixelSizeOfFive) {
  for (const int32 bytesPerPixel : {0, 5, -1, INT_MIN}) {
    const tests::Messages said = tests::messagesOf([&] {
      Raster_BitsToPixels(nullptr, 1, nullptr, 4, bytesPerPixel, 3, 1, 1, 2);
      Raster_BitsToPixelsStencil(nullptr, 1, nullptr, 4, bytesPerPixel, 3, 1, 1);
    });
    EXPECT_EQ(said.log + said.warning + said.panic, "");
  }
}

TEST(Raster_BitsToPixels, StoresThreeBytePixelsLowestByteFirst) {
  const uint8 bits[] = {0x80};
  uint8 row[6] = {};
  Raster_BitsToPixels(bits, 1, row, 6, 3, 2, 1, 0x00112233, 0xFF445566);
  EXPECT_EQ(Bytes(row, row + 6), (Bytes{0x33, 0x22, 0x11, 0x66, 0x55, 0x44}));
}

TEST(Raster_BitsToPixels, WritesAndReadsNothingForSizesThatAreNotPositive) {
  GuardedBuffer forbidden(64);
  forbidden.forbid();
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (const auto& [width, height] :
         {std::pair{8, 0}, std::pair{0, 2}, std::pair{-1, 2}, std::pair{INT_MIN, 2},
          std::pair{8, -1}, std::pair{8, INT_MIN}}) {
      kExpand[bytesPerPixel](forbidden.data(), 1, forbidden.data(), 4, width, height, 1, 2);
      kStencil[bytesPerPixel](forbidden.data(), 1, forbidden.data(), 4, width, height, 1);
    }
  }
}

// Deliberate: rows of words step by the full pitch here, so they may lie at odd addresses.
TEST(Raster_BitsToPixels, StepsByTheFullPitchForEveryPixelSize) {
  const uint8 bits[] = {0x80, 0x80};
  uint8 fb[12] = {};
  Raster_BitsToPixels(bits, 1, fb, 5, 4, 1, 2, 0x04030201, 0);
  EXPECT_EQ(Bytes(fb, fb + 12), (Bytes{1, 2, 3, 4, 0, 1, 2, 3, 4, 0, 0, 0}));
}

TEST(Raster_BitsToPixelsStencil, LeavesPixelsOfClearBitsAlone) {
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const uint8 bits[] = {0x00, 0xFF};
    Bytes row(size_t{16} * bytesPerPixel, 0x5A);
    kStencil[bytesPerPixel](bits, 2, row.data(), 0, 16, 1, 0x01010101);
    Bytes expected(size_t{8} * bytesPerPixel, 0x5A);
    expected.resize(size_t{16} * bytesPerPixel, 1);
    EXPECT_EQ(row, expected);
  }
}

/// How many pixels a level may reach together: those of clear bits among them are then written
/// back.
uint32 pixelsReachedTogether(uint32 bytesPerPixel) {
  const std::string level = tests::levelInUse();
  if (level == "scalar" || level == "avx3") return 1;
  const uint32 vector = level == "avx2" ? 32 : 16;
  return vector * (4 / bytesPerPixel);
}

TEST(Raster_BitsToPixelsStencil, TouchesNothingUnderAnEmptyPlane) {
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    GuardedBuffer readOnly(size_t{300} * 4 * 3);
    GuardedBuffer forbidden(readOnly.size());
    readOnly.forbidWriting();
    forbidden.forbid();
    for (uint32 width = 1; width <= 300; width = width < 140 ? width + 1 : width + 53) {
      const Bytes bits(size_t{(width + 7) / 8} * 3);
      const Plane p = {(width + 7) / 8,
                       width * bytesPerPixel,
                       bytesPerPixel,
                       static_cast<int32>(width),
                       3,
                       0xFFFFFFFF,
                       0,
                       true,
                       width % 2 == 0};
      p.run(bits.data(), readOnly.data());
      p.run(bits.data(), forbidden.data());
    }
  }
}

/// Draws `width` pixels onto a buffer that has only those in [first, end), which is where the plane
/// has bits; compares with the model.
void expectWithin(Random& random, uint32 bytesPerPixel, uint32 width, uint32 first, uint32 end,
                  Guard guard) {
  Bytes bits((width + 7) / 8);
  for (uint32 x = first; x < end; ++x)
    if (random.below(2) != 0) bits[x / 8] |= static_cast<uint8>(0x80 >> x % 8);
  const Bytes before = random.bytes(size_t{end - first} * bytesPerPixel);
  const uint32 foreground = random.word();
  Bytes expected = before;
  for (uint32 x = first; x < end; ++x) {
    if ((bits[x / 8] >> (7 - x % 8) & 1) == 0) continue;
    for (uint32 k = 0; k < bytesPerPixel; ++k)
      expected[size_t{x - first} * bytesPerPixel + k] = static_cast<uint8>(foreground >> (8 * k));
  }
  GuardedBuffer dst(before.size(), guard);
  dst.assign(before);
  kStencil[bytesPerPixel](bits.data(), 0, tests::moved(dst.data(), -int64{first} * bytesPerPixel),
                          0, static_cast<int32>(width), 1, foreground);
  ASSERT_EQ(dst.bytes(), expected)
      << "bytes " << bytesPerPixel << " width " << width << " bits in " << first << ".." << end;
}

// A run of bits anywhere, and no memory before it or behind it, as far as the level can do without.
TEST(Raster_BitsToPixelsStencil, TouchesNothingBesideTheSetBits) {
  Random random(3);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    const uint32 bytesPerPixel = 1 + random.below(4);
    const uint32 together = pixelsReachedTogether(bytesPerPixel);
    const uint32 width = 1 + random.below(600);
    const uint32 first = random.below(width) / together * together;
    const uint32 end = std::min(width, first + (1 + random.below(9)) * together);
    expectWithin(random, bytesPerPixel, width, first, end, Guard::kBefore);
    expectWithin(random, bytesPerPixel, width, first, end, Guard::kAfter);
  }
}

}  // namespace
