// SPDX-License-Identifier: MIT
//
// Blending against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <cstring>
#include <string>

#include "raster.h"
#include "reference/alphaBlendReference.h"
#include "support/accessLog.h"
#include "support/guardedBuffer.h"
#include "support/level.h"
#include "support/ownProcess.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Blend;
using reference::BlendFormat;
using reference::BlendPlace;
using reference::Bytes;
using reference::kBlendFormats;
using reference::kBlendOperators;
using tests::Access;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;
using tests::WatchedMemory;

constexpr BlendFormat kBytes3 = kBlendFormats[4];
constexpr BlendFormat kBytes4 = kBlendFormats[5];

/// In place and staged.
constexpr uint8 kVariants[] = {0, 1};

/// Whether byte 3 of 4-byte pixels is left out at this level, and not only that of a row's end.
bool levelMasksByte3() {
  const std::string level = tests::levelInUse();
  return level == "scalar" || level == "avx3";
}

/// A rectangle in a destination and a source buffer that end with it. Byte 3 of a 4-byte
/// destination pixel is not part of it.
struct Place {
  size_t dstBase, srcBase;  // beyond the first byte, so that bases are unaligned
  uint32 dstPitch, srcPitch;
  uint32 dstX, dstY, srcX, srcY, width, height;

  size_t dstFirst(const BlendFormat& f) const {
    return dstBase + size_t{dstY} * dstPitch + size_t{dstX} * f.bytes;
  }
  size_t srcFirst() const { return srcBase + size_t{srcY} * srcPitch + size_t{srcX} * 4; }
  size_t dstEnd(const BlendFormat& f) const {
    const size_t row = size_t{width} * f.bytes;
    return dstFirst(f) + rowsBefore() * dstPitch + (f.bytes == 4 && row != 0 ? row - 1 : row);
  }
  size_t srcEnd() const { return srcFirst() + rowsBefore() * srcPitch + size_t{width} * 4; }
  size_t rowsBefore() const { return height == 0 ? 0 : height - 1; }

  /// In one memory that holds the source `behind` bytes after the destination's start.
  BlendPlace within(const BlendFormat& f, size_t behind) const {
    return {dstFirst(f), dstPitch, behind + srcFirst(), srcPitch, width, height};
  }
};

/// A width that is likely to meet a boundary of some vector size or of the staging buffer.
uint32 someWidth(Random& random, const BlendFormat& f) {
  switch (random.below(16)) {
    case 0:
      return 3072 / f.bytes * (1 + random.below(2)) + random.below(70) - 35;
    case 1:
      return 500 + random.below(2000);
    default:
      return random.below(71);
  }
}

Place somePlace(Random& random, const BlendFormat& f) {
  Place p{};
  p.dstBase = random.below(70);
  p.srcBase = random.below(70);
  p.dstX = random.below(9);
  p.srcX = random.below(9);
  p.dstY = random.below(3);
  p.srcY = random.below(3);
  p.width = someWidth(random, f);
  p.height = random.below(p.width > 100 ? 3 : 8);
  p.dstPitch = (p.dstX + p.width) * f.bytes + random.below(40);
  p.srcPitch = (p.srcX + p.width) * 4 + random.below(40);
  if (random.below(4) == 0) {  // rows without gaps
    p.dstPitch = p.width * f.bytes;
    p.srcPitch = p.width * 4;
  }
  return p;
}

/// A constant alpha, the extremes among them more often.
uint32 someAlpha(Random& random) {
  return random.below(4) == 0 ? random.oneOf({0u, 1u, 127u, 128u, 254u, 255u}) : random.below(256);
}

/// The operator 13 divides by a constant destination alpha.
Blend dividable(Blend blend) {
  if (blend.op == 13 && blend.dstAlpha == 0) blend.dstAlpha = 1;
  return blend;
}

Blend someBlend(Random& random) {
  Blend blend{random.below(kBlendOperators), random.word(), someAlpha(random), someAlpha(random)};
  if (random.below(2) == 0) blend.flags &= 3;
  return dividable(blend);
}

std::string describe(const Blend& b) {
  return "op " + std::to_string(b.op) + " flags " + std::to_string(b.flags) + " alphas " +
         std::to_string(b.srcAlpha) + ", " + std::to_string(b.dstAlpha);
}

std::string describe(const Place& p, const BlendFormat& f, const Blend& b) {
  const auto text = [](auto... numbers) { return ((std::to_string(numbers) + " ") + ...); };
  return "depth " + text(f.depth, f.bpp) + describe(b) + " dst base, x, y, pitch " +
         text(p.dstBase, p.dstX, p.dstY, p.dstPitch) + "src base, x, y, pitch " +
         text(p.srcBase, p.srcX, p.srcY, p.srcPitch) + "size " + text(p.width, p.height);
}

void blendAt(uint8* dst, const uint8* src, const Place& p, const BlendFormat& f, const Blend& b,
             uint8 staged) {
  Raster_AlphaBlend(dst + p.dstBase, p.dstX, p.dstY, p.dstPitch, src + p.srcBase, p.srcX, p.srcY,
                    p.srcPitch, p.width, p.height, f.depth, f.bpp, b.op, b.flags, b.srcAlpha,
                    b.dstAlpha, staged);
}

/// One row of pixels without gaps, from the first byte of both buffers.
void blendRow(uint8* dst, const uint8* src, uint32 width, const BlendFormat& f, const Blend& b,
              uint8 staged = 0) {
  blendAt(dst, src, {0, 0, width * f.bytes, width * 4, 0, 0, 0, 0, width, 1}, f, b, staged);
}

/// A single pixel after a blend.
uint32 blendOne(const BlendFormat& f, const Blend& b, std::array<uint8, 4> source, uint32 pixel,
                uint8 staged = 0) {
  std::array<uint8, 4> dst{};
  for (uint32 k = 0; k < 4; ++k) dst[k] = static_cast<uint8>(pixel >> (8 * k));
  blendRow(dst.data(), source.data(), 1, f, b, staged);
  return dst[0] | uint32{dst[1]} << 8 | uint32{dst[2]} << 16 | uint32{dst[3]} << 24;
}

/// Compares one row with the model, in place and staged.
void expectRow(const Bytes& before, const Bytes& source, const BlendFormat& f, const Blend& b) {
  const auto width = static_cast<uint32>(source.size() / 4);
  Bytes expected;
  for (uint32 x = 0; x < width; ++x) {
    uint32 pixel = 0;
    memcpy(&pixel, &before[size_t{x} * f.bytes], f.bytes);
    pixel = reference::blendPixel(f, b, &source[size_t{x} * 4], pixel);
    for (uint32 k = 0; k < f.bytes; ++k) expected.push_back(static_cast<uint8>(pixel >> (8 * k)));
  }
  for (const uint8 staged : kVariants) {
    Bytes actual = before;
    blendRow(actual.data(), source.data(), width, f, b, staged);
    ASSERT_EQ(actual, expected) << "depth " << f.depth << " staged " << int{staged} << " "
                                << describe(b);
  }
}

/// Pixels in runs that are clear, or of noise.
Bytes spriteRow(Random& random, size_t width) {
  Bytes row = random.bytes(width * 4);
  for (size_t x = 0; x < width;) {
    const size_t end = std::min<size_t>(width, x + 1 + random.below(48));
    if (random.below(2) == 0) std::fill_n(&row[4 * x], 4 * (end - x), uint8{0});
    x = end;
  }
  return row;
}

TEST(Raster_AlphaBlend, EqualsTheModelUnderClearRuns) {
  Random random(17);
  for (int round = 0; round < tests::rounds(40); ++round) {
    for (const BlendFormat& f : kBlendFormats) {
      for (uint32 op = 0; op < kBlendOperators; ++op) {
        const size_t width = 1 + random.below(200);
        expectRow(random.bytes(width * f.bytes), spriteRow(random, width), f,
                  {op, random.below(4), 200, 90});
      }
    }
  }
}

TEST(Raster_AlphaBlend, EqualsTheModelAndTouchesNothingElse) {
  Random random(1);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    const BlendFormat& f = kBlendFormats[random.below(6)];
    const Place p = somePlace(random, f);
    const Blend b = someBlend(random);
    const uint8 staged = random.oneOf<uint8>({0, 1, 2, 255});
    const Bytes source = random.bytes(p.srcEnd());
    const Bytes before = random.bytes(p.dstEnd(f));
    Bytes joined = before;
    joined.insert(joined.end(), source.begin(), source.end());
    reference::blendInPlace(joined, p.within(f, before.size()), f, b);
    joined.resize(before.size());

    GuardedBuffer src(source.size(), tests::someGuard(random));
    GuardedBuffer dst(before.size(), tests::someGuard(random));
    src.assign(source);
    dst.assign(before);
    blendAt(dst.data(), src.data(), p, f, b, staged);
    ASSERT_EQ(dst.bytes(), joined)
        << "round " << round << " staged " << int{staged} << ": " << describe(p, f, b);
    ASSERT_EQ(src.bytes(), source);
  }
}

/// Blends rows onto a buffer that ends before byte 3 of their last pixel; compares with the model.
void expectEndBeforeByte3(Random& random, const Place& p, const Blend& b, uint8 staged) {
  const Bytes source = random.bytes(p.srcEnd());
  const Bytes before = random.bytes(p.dstEnd(kBytes4));
  Bytes expected = before;
  expected.push_back(0);
  expected.insert(expected.end(), source.begin(), source.end());
  reference::blendInPlace(expected, p.within(kBytes4, before.size() + 1), kBytes4, b);
  expected.resize(before.size());
  GuardedBuffer dst(before.size());
  dst.assign(before);
  blendAt(dst.data(), source.data(), p, kBytes4, b, staged);
  ASSERT_EQ(dst.bytes(), expected) << "staged " << int{staged} << ": " << describe(p, kBytes4, b);
}

TEST(Raster_AlphaBlend, LeavesOutByte3OfARowsLastPixelForEveryWidth) {
  Random random(13);
  for (uint32 width = 1; width <= 1536; width = width < 70 ? width + 1 : width + 233) {
    for (uint32 op = 0; op < kBlendOperators; ++op) {
      for (uint32 flags = 0; flags < 4; ++flags) {
        const uint32 pitch = width * 4 + random.oneOf({0u, 1u, 64u});
        const Place p = {0, 0, pitch, pitch, 0, 0, 0, 0, width, 1 + op % 3};
        for (const uint8 staged : kVariants)
          expectEndBeforeByte3(random, p, {op, flags, 77, 99}, staged);
      }
    }
  }
}

// Another thread may count on byte 3 where masks are to be had, and at the end of a row everywhere.
TEST(Raster_AlphaBlend, WritesByte3BackOnlyWithinRowsOfLevelsWithoutMasks) {
  constexpr uint32 kWidth = 45;
  WatchedMemory dst(size_t{kWidth} * 4);
  const Bytes source = Random(14).bytes(size_t{kWidth} * 4);
  const size_t first = levelMasksByte3() ? 0 : kWidth - 1;
  for (uint32 op = 0; op < kBlendOperators; ++op) {
    std::fill_n(dst.data(), size_t{kWidth} * 4, uint8{0});
    uint8 stored = 0;
    const auto storeByte3 = [&] {
      ++stored;
      for (size_t x = first; x < kWidth; ++x) dst.data()[4 * x + 3] = stored;
    };
    dst.accessesOf(
        [&] {
          blendRow(dst.data(), source.data(), kWidth, kBytes4, {op, 0, 0, 0});
        },
        storeByte3);
    ASSERT_NE(stored, 0);
    for (size_t x = first; x < kWidth; ++x)
      ASSERT_EQ(dst.data()[4 * x + 3], stored) << "op " << op << " pixel " << x;
  }
}

TEST(Raster_AlphaBlend, WalksFromPixelToPixelOrChunkToChunkWhereSourceAndDestinationOverlap) {
  Random random(2);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    const BlendFormat& f = kBlendFormats[random.below(6)];
    Place p = somePlace(random, f);
    p.srcBase = random.below(300);
    p.dstBase = random.below(300);
    if (random.below(3) == 0) p.dstPitch = p.srcPitch;
    if (random.below(8) == 0) p.dstPitch = random.below(40);  // rows that overlap each other
    if (random.below(8) == 0) p.srcBase = p.dstBase;
    const Blend b = someBlend(random);
    const uint8 staged = random.oneOf<uint8>({0, 1});
    Bytes expected = random.bytes(std::max(p.srcEnd(), p.dstEnd(f) + 1));
    Bytes actual = expected;
    (staged != 0 ? reference::blendStaged : reference::blendInPlace)(expected, p.within(f, 0), f,
                                                                     b);
    blendAt(actual.data(), actual.data(), p, f, b, staged);
    ASSERT_EQ(actual, expected) << "round " << round << " staged " << int{staged} << ": "
                                << describe(p, f, b);
  }
}

// Three channels of a pixel cover three destination values for the same source and alpha.
TEST(Raster_AlphaBlend, IsExactForAllSourceDestinationAndAlphaValues) {
  constexpr uint32 kWidth = 256 * 86;
  Bytes source(size_t{kWidth} * 4);
  Bytes before(size_t{kWidth} * 4, 0x5A);
  for (uint32 x = 0; x < kWidth; ++x) {
    for (uint32 k = 0; k < 3; ++k) {
      source[4 * x + k] = static_cast<uint8>(x % 256);
      before[4 * x + k] = static_cast<uint8>(x / 256 * 3 + k);
    }
  }
  for (const Blend b :
       {Blend{3, 0, 0, 0}, Blend{4, 2, 0, 0}, Blend{9, 2, 0, 100}, Blend{10, 2, 0, 101},
        Blend{11, 2, 0, 200}, Blend{12, 0, 0, 0}, Blend{13, 2, 0, 3}}) {
    Bytes actual(before.size());
    Bytes expected = before;
    for (uint32 sa = 0; sa < 256; ++sa) {
      Blend blend = b;
      if (b.op == 4) blend.dstAlpha = sa;  // has no source alpha
      for (uint32 x = 0; x < kWidth; ++x) {
        source[4 * x + 3] = static_cast<uint8>(sa);
        for (uint32 k = 0; k < 3; ++k) {
          expected[4 * x + k] = static_cast<uint8>(
              reference::blendChannel(blend, source[4 * x], sa, before[4 * x + k]));
        }
      }
      actual = before;
      blendRow(actual.data(), source.data(), kWidth, kBytes4, blend);
      ASSERT_TRUE(actual == expected) << describe(blend) << " source alpha " << sa;
    }
  }
}

TEST(Raster_AlphaBlend, IsExactForEveryByteAndWordOfThePackedFormats) {
  Random random(3);
  for (const BlendFormat& f : kBlendFormats) {
    if (f.bytes > 2) continue;
    constexpr uint32 kWidth = 65536;
    Bytes before(size_t{kWidth} * f.bytes);
    for (uint32 x = 0; x < kWidth; ++x) memcpy(&before[size_t{x} * f.bytes], &x, f.bytes);
    for (uint32 op = 0; op < kBlendOperators; ++op) {
      const Bytes source = random.bytes(size_t{kWidth} * 4);
      expectRow(before, source, f, {op, 0, 0, 0});
      expectRow(before, source, f, dividable({op, 3, someAlpha(random), someAlpha(random)}));
    }
  }
}

TEST(Raster_AlphaBlend, AppliesEveryConstantOfBothFlags) {
  Random random(4);
  for (const BlendFormat& f : kBlendFormats) {
    for (uint32 op = 0; op < kBlendOperators; ++op) {
      for (uint32 alpha = 0; alpha < 256; ++alpha) {
        const Bytes source = random.bytes(size_t{37} * 4);
        const Bytes before = random.bytes(size_t{37} * f.bytes);
        expectRow(before, source, f, {op, 1, alpha, random.word()});
        expectRow(before, source, f, dividable({op, 2, random.word(), alpha}));
        expectRow(before, source, f, dividable({op, 3, alpha, someAlpha(random)}));
      }
    }
  }
}

TEST(Raster_AlphaBlend, IgnoresOtherFlagsAndTheAlphasOfFlagsThatAreNotSet) {
  for (uint32 op = 0; op < kBlendOperators; ++op) {
    EXPECT_EQ(blendOne(kBytes4, {op, 0xFFFFFFFC, 7, 0}, {10, 20, 30, 40}, 0x00A0B0C0),
              blendOne(kBytes4, {op, 0, 255, 255}, {10, 20, 30, 40}, 0x00A0B0C0));
  }
}

TEST(Raster_AlphaBlend, ScalesAllFourSourceBytesByTheSourceConstantFirst) {
  // 200 * 128 / 255 = 100 with an alpha of 255 * 128 / 255 = 128.
  EXPECT_EQ(blendOne(kBytes4, {3, 1, 128, 0}, {200, 200, 200, 255}, 200), 0x006464C7u);
}

TEST(Raster_AlphaBlend, AddsTruncatedTermsForOver) {
  EXPECT_EQ(blendOne(kBytes4, {3, 0, 0, 0}, {100, 100, 100, 128}, 0x00C8C8C8), 0x00C7C7C7u);
}

TEST(Raster_AlphaBlend, ClampsWhereColorsExceedTheirAlpha) {
  EXPECT_EQ(blendOne(kBytes4, {3, 0, 0, 0}, {255, 200, 1, 0}, 0x12FF8001), 0x12FFFFFFu);
  EXPECT_EQ(blendOne(kBytes4, {12, 0, 0, 0}, {255, 128, 126, 0}, 0x12808001), 0x12FEFFFFu);
}

TEST(Raster_AlphaBlend, DoesNothingWithoutRowsOrColumns) {
  GuardedBuffer nothing(0);
  for (const BlendFormat& f : kBlendFormats) {
    for (uint32 op = 0; op < kBlendOperators; ++op) {
      for (const uint8 staged : kVariants) {
        blendAt(nothing.data(), nothing.data(), {0, 0, 64, 64, 0, 0, 0, 0, 5, 0}, f, {op, 3, 0, 0},
                staged);
        blendAt(nothing.data(), nothing.data(), {0, 0, 64, 64, 0, 0, 0, 0, 0, 5}, f, {op, 3, 0, 0},
                staged);
      }
    }
  }
}

// Deliberate: the exclusive or is computed as Atop-reverse.
TEST(Raster_AlphaBlend, GivesTheSamePixelsForOperators10And11) {
  Random random(5);
  for (const BlendFormat& f : kBlendFormats) {
    for (uint32 flags = 0; flags < 4; ++flags) {
      const Bytes source = random.bytes(size_t{1000} * 4);
      const Bytes before = random.bytes(size_t{1000} * f.bytes);
      Bytes ten = before;
      Bytes eleven = before;
      blendRow(ten.data(), source.data(), 1000, f, {10, flags, 77, 99});
      blendRow(eleven.data(), source.data(), 1000, f, {11, flags, 77, 99});
      EXPECT_EQ(ten, eleven);
    }
  }
}

TEST(Raster_AlphaBlend, TakesTheDestinationAsOpaqueWithoutItsConstant) {
  const std::array<uint8, 4> source = {90, 80, 70, 100};
  for (const uint32 op : {4u, 13u})
    EXPECT_EQ(blendOne(kBytes4, {op, 0, 0, 0}, source, 0x11223344), 0x11223344u);
  EXPECT_EQ(blendOne(kBytes4, {7, 0, 0, 0}, source, 0x11223344), 0x11000000u);
  for (const uint32 op : {10u, 11u}) {
    EXPECT_EQ(blendOne(kBytes4, {op, 0, 0, 0}, source, 0x11223344),
              0x11000000u | 0x44 * 100 / 255 | 0x33 * 100 / 255 << 8 | 0x22 * 100 / 255 << 16);
  }
}

TEST(Raster_AlphaBlend, KeepsThreeBitFieldsThatRepeatTheirLowBits) {
  const BlendFormat f = kBlendFormats[1];
  EXPECT_EQ(blendOne(f, {2, 0, 0, 0}, {}, 0x24), 0x24u);
  // Deliberate: field 4 widens to 0x90, and 0x90 + 0x0F stays below the next field.
  EXPECT_EQ(blendOne(f, {12, 0, 0, 0}, {0, 0x0F, 0x10, 0}, 0x24), 0x25u);
}

TEST(Raster_AlphaBlend, ClearsTheFreeBitsOfDepths6And15) {
  for (uint32 op = 0; op < kBlendOperators; ++op) {
    for (const uint8 staged : kVariants) {
      const std::array<uint8, 4> source = {255, 255, 255, 255};
      EXPECT_EQ(blendOne(kBlendFormats[0], {op, 0, 0, 0}, source, 0xFF, staged) & 0xC0, 0u);
      EXPECT_EQ(blendOne(kBlendFormats[2], {op, 0, 0, 0}, source, 0xFFFF, staged) & 0x8000, 0u);
    }
  }
}

TEST(Raster_AlphaBlend, KeepsByte3OfFourBytePixels) {
  Random random(6);
  for (uint32 op = 0; op < kBlendOperators; ++op) {
    for (const uint8 staged : kVariants) {
      const Bytes source = random.bytes(size_t{1000} * 4);
      const Bytes before = random.bytes(size_t{1000} * 4);
      Bytes after = before;
      blendRow(after.data(), source.data(), 1000, kBytes4, {op, 0, 0, 0}, staged);
      for (size_t i = 3; i < after.size(); i += 4) ASSERT_EQ(after[i], before[i]);
    }
  }
}

TEST(Raster_AlphaBlend, GivesStagedWhatItGivesInPlaceAroundTheSizeOfAChunk) {
  Random random(7);
  for (const BlendFormat& f : kBlendFormats) {
    for (const uint32 chunks : {1u, 2u}) {
      for (uint32 op = 0; op < kBlendOperators; ++op) {
        const uint32 width = chunks * (3072 / f.bytes) + random.below(5) - 2;
        const Bytes source = random.bytes(size_t{width} * 4);
        const Bytes before = random.bytes(size_t{width} * f.bytes);
        Bytes inPlace = before;
        Bytes staged = before;
        blendRow(inPlace.data(), source.data(), width, f, {op, 2, 0, 9}, 0);
        blendRow(staged.data(), source.data(), width, f, {op, 2, 0, 9}, 128);
        ASSERT_EQ(staged, inPlace) << "depth " << f.depth << " width " << width << " op " << op;
      }
    }
  }
}

TEST(Raster_AlphaBlend, ReadsNoSourceForOperatorsWithoutOne) {
  GuardedBuffer src(4096);
  src.forbid();
  for (const BlendFormat& f : kBlendFormats) {
    for (const uint32 op : {0u, 2u}) {
      for (const uint8 staged : kVariants) {
        Bytes dst(size_t{45} * f.bytes);
        blendRow(dst.data(), src.data(), 45, f, {op, 3, 9, 9}, staged);
      }
    }
  }
}

TEST(Raster_AlphaBlend, ReadsNoDestinationInPlaceForOperatorsWithoutOne) {
  WatchedMemory dst(4096);
  const Bytes source = Random(8).bytes(size_t{45} * 4);
  for (const BlendFormat& f : kBlendFormats) {
    if (f.bytes == 4 && !levelMasksByte3()) continue;  // byte 3 is written back
    for (const uint32 op : {0u, 1u, 5u, 7u}) {
      const auto accesses = dst.accessesOf([&] {
        blendRow(dst.data(), source.data(), 45, f, {op, 2, 0, 77});
      });
      ASSERT_FALSE(accesses.empty());
      for (const Access& a : accesses) ASSERT_TRUE(a.writes) << "depth " << f.depth << " op " << op;
    }
  }
}

/// A run of loads and the run of stores that follows it.
struct Move {
  size_t loadsFrom, loadsTo;  // the first and the last offset
  size_t storesFrom, storesTo;
};

std::vector<Move> movesOf(const std::vector<Access>& accesses) {
  std::vector<Move> moves;
  bool stores = true;
  for (const Access& a : accesses) {
    if (!a.writes) {
      if (stores) moves.push_back({a.offset, a.offset, SIZE_MAX, 0});
      moves.back().loadsFrom = std::min(moves.back().loadsFrom, a.offset);
      moves.back().loadsTo = std::max(moves.back().loadsTo, a.offset);
    } else if (!moves.empty()) {
      moves.back().storesFrom = std::min(moves.back().storesFrom, a.offset);
      moves.back().storesTo = std::max(moves.back().storesTo, a.offset);
    }
    stores = a.writes;
  }
  return moves;
}

TEST(Raster_AlphaBlend, TouchesTheFrameBufferByBlocksOfAtMost3072BytesWhenStaged) {
  WatchedMemory dst(4096);
  const Bytes source = Random(9).bytes(size_t{1025} * 4);
  for (const uint32 op : {0u, 3u}) {
    const auto moves = movesOf(dst.accessesOf([&] {
      blendRow(dst.data(), source.data(), 1025, kBytes3, {op, 0, 0, 0}, 1);
    }));
    // 1025 pixels of 3 bytes are one block of 3072 bytes and one of 3.
    ASSERT_EQ(moves.size(), 2u) << "op " << op;
    for (size_t i = 0; i < moves.size(); ++i) {
      EXPECT_EQ(moves[i].loadsFrom, i * 3072);
      EXPECT_LT(moves[i].loadsTo, i == 0 ? 3072u : 3075u);
      EXPECT_EQ(moves[i].storesFrom, i * 3072);
      EXPECT_LT(moves[i].storesTo, i == 0 ? 3072u : 3075u);
    }
  }
}

TEST(Raster_AlphaBlend, TouchesSmallRowsByBlocksThatFitTheBufferWhenStaged) {
  constexpr size_t kPitch = 100;
  WatchedMemory dst(200 * kPitch);
  const Bytes source = Random(10).bytes(size_t{23} * 4 * 200);
  const auto moves = movesOf(dst.accessesOf([&] {
    Raster_AlphaBlend(dst.data(), 0, 0, kPitch, source.data(), 0, 0, 23 * 4, 23, 200, 24, 32, 3, 0,
                      0, 0, 1);
  }));
  for (const Move& m : moves) {
    EXPECT_EQ(m.loadsFrom, m.storesFrom);
    EXPECT_EQ(m.loadsFrom % kPitch, 0u);  // a block is a row
    EXPECT_LE((m.loadsTo - m.loadsFrom) / kPitch * 92, 3072u);
  }
}

TEST(Raster_AlphaBlend, BlendsInPlaceWithoutTheBuffer) {
  WatchedMemory dst(4096);
  const Bytes source = Random(11).bytes(size_t{1000} * 4);
  const auto moves = movesOf(dst.accessesOf([&] {
    blendRow(dst.data(), source.data(), 1000, kBytes3, {3, 0, 0, 0});
  }));
  EXPECT_GT(moves.size(), 30u);
}

TEST(Raster_AlphaBlend, PanicsForADepthWithoutKernelsEvenWhenThereIsNothingToBlend) {
  for (const auto& [depth, bpp] :
       {std::array{24u, 16u}, std::array{32u, 32u}, std::array{0u, 8u}, std::array{24u, 0u}}) {
    const Messages said = tests::messagesOf([&, depth = depth, bpp = bpp] {
      Raster_AlphaBlend(nullptr, 0, 0, 0, nullptr, 0, 0, 0, 0, 0, depth, bpp, 3, 0, 0, 0, 0);
    });
    EXPECT_EQ(said.panic, "ASSERT lib/raster/alphaBlend:205 bugNr=19864\n");
    EXPECT_EQ(said.warning, "");
  }
}

TEST(Raster_AlphaBlend, LooksAtBitsPerPixelForDepth24Only) {
  for (const BlendFormat& f : kBlendFormats) {
    if (f.depth == 24) continue;
    const BlendFormat odd = {f.depth, 77, f.bytes};
    EXPECT_EQ(blendOne(odd, {12, 0, 0, 0}, {1, 2, 3, 4}, 0x1234),
              blendOne(f, {12, 0, 0, 0}, {1, 2, 3, 4}, 0x1234));
  }
}

// Deliberate: Saturate divides by the constant destination alpha.
TEST(Raster_AlphaBlend, FaultsForSaturateOntoAConstantAlphaOfZero) {
  for (const uint8 staged : kVariants) {
    EXPECT_EQ(tests::signalOfOwnProcess([=] {
                blendOne(kBytes4, {13, 2, 0, 0}, {1, 2, 3, 4}, 0, staged);
              }),
              SIGFPE);
  }
  EXPECT_EQ(blendOne(kBytes4, {13, 0, 0, 0}, {1, 2, 3, 4}, 5), 5u);
}

TEST(Raster_AlphaBlendOver, IsOperator3WithoutConstants) {
  Random random(12);
  for (const BlendFormat& f : kBlendFormats) {
    for (const uint8 staged : kVariants) {
      const Bytes source = random.bytes(size_t{9} * 5 * 4);
      const Bytes before = random.bytes(size_t{11} * 7 * f.bytes);
      Bytes over = before;
      Bytes blend = before;
      Raster_AlphaBlendOver(over.data(), 1, 2, 11 * f.bytes, source.data(), 2, 1, 36, 7, 4, f.depth,
                            f.bpp, staged);
      Raster_AlphaBlend(blend.data(), 1, 2, 11 * f.bytes, source.data(), 2, 1, 36, 7, 4, f.depth,
                        f.bpp, 3, 0, 0, 0, staged);
      EXPECT_EQ(over, blend);
    }
  }
}

TEST(Raster_AlphaBlendOver, LeavesTheDestinationUnderClearAndReplacesItUnderOpaquePixels) {
  for (const BlendFormat& f : kBlendFormats) {
    const uint32 used = f.depth == 24 ? 0xFFFFFF : (1u << f.depth) - 1;
    EXPECT_EQ(blendOne(f, {3, 0, 0, 0}, {0, 0, 0, 0}, 0x2A5A5A5A & used), 0x2A5A5A5A & used);
    EXPECT_EQ(blendOne(f, {3, 0, 0, 0}, {0xFF, 0xFF, 0xFF, 0xFF}, 0x12 & used) & used, used);
  }
}

}  // namespace
