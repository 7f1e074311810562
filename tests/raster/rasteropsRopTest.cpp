// SPDX-License-Identifier: MIT
//
// ROP fill and ROP copy against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "raster.h"
#include "reference/rasteropsRopReference.h"
#include "support/byteRange.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using tests::ByteRange;
using tests::GuardedBuffer;
using tests::Messages;
using tests::moved;
using tests::Random;
using tests::rowsRange;

// ---- Fill --------------------------------------------------------------------------------------

struct Fill {
  int64 fb;
  int32 pitch;
  uint32 bytesPerPixel, pixel, rop, x, y, width, height;

  ByteRange range() const {
    return rowsRange(fb + int64{y} * pitch + int64{x} * bytesPerPixel,
                     reference::rowStep(pitch, bytesPerPixel), int64{width} * bytesPerPixel,
                     height);
  }
  std::string text() const {
    return "pitch " + std::to_string(pitch) + " bytes " + std::to_string(bytesPerPixel) +
           " pixel " + std::to_string(pixel) + " rop " + std::to_string(rop) + " at " +
           std::to_string(x) + "," + std::to_string(y) + " size " + std::to_string(width) + "x" +
           std::to_string(height);
  }
};

Fill someFill(Random& random, uint32 rop) {
  Fill f{};
  f.bytesPerPixel = 1 + random.below(4);
  f.rop = rop;
  f.pixel = random.oneOf({random.word(), 0u, 0xFFFFFFFFu, 0xFFu, random.word() & 0xFFFF});
  f.x = random.below(9);
  f.y = random.below(4);
  f.width = tests::someWidth(random);
  f.height = random.below(f.width > 100 ? 4 : 20);
  const auto bytes = static_cast<int32>(f.width * f.bytesPerPixel);
  // Also rows without a gap, and rows that overlap each other.
  f.pitch = random.oneOf({bytes, bytes + random.between(0, 40), random.between(0, 70)});
  if (random.below(2) == 0) f.pitch = -f.pitch;
  return f;
}

TEST(Raster_RectROPfill, EqualsTheModelAndTouchesNothingElse) {
  Random random(1);
  for (int round = 0; round < tests::rounds(8000); ++round) {
    Fill f = someFill(random, static_cast<uint32>(round) % 16);
    const ByteRange range = f.range();
    f.fb -= range.begin;
    Bytes expected = random.bytes(range.size());
    GuardedBuffer actual(expected.size(), tests::someGuard(random));
    actual.assign(expected);
    reference::rectRopFill(expected, f.fb, f.pitch, f.bytesPerPixel, f.pixel, f.rop, f.x, f.y,
                           f.width, f.height);
    Raster_RectROPfill(moved(actual.data(), f.fb), f.pitch, f.bytesPerPixel, f.pixel, f.rop, f.x,
                       f.y, f.width, f.height);
    ASSERT_EQ(actual.bytes(), expected) << "round " << round << ": " << f.text();
  }
}

TEST(Raster_RectROPfill, EqualsRectFillForCopy) {
  Random random(2);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const Bytes before = random.bytes(400);
    Bytes filled = before;
    Bytes combined = before;
    Raster_RectFill(filled.data(), 41, bytesPerPixel, 0x12345678, 1, 2, 7, 6);
    Raster_RectROPfill(combined.data(), 41, bytesPerPixel, 0x12345678, RASTER_ROP_COPY, 1, 2, 7, 6);
    EXPECT_EQ(combined, filled);
  }
}

/// The text of an unsupported pixel size.
void expectUnsupported(const Messages& said) {
  EXPECT_EQ(said.warning, "Raster: Unsupported frame buffer depth\n");
  EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterops")) << said.panic;
}

TEST(Raster_RectROPfill, PanicsForAPixelSizeOfFiveBeforeAnythingElseIsLookedAt) {
  for (const uint32 rop :
       std::initializer_list<uint32>{0u, RASTER_ROP_COPY, RASTER_ROP_NOOP, 6u, 16u, 0xFFFFFFFFu}) {
    for (const uint32 bytesPerPixel : {0u, 5u, 0xFFFFFFFFu}) {
      expectUnsupported(tests::messagesOf(
          [&] { Raster_RectROPfill(nullptr, 0, bytesPerPixel, 0, rop, 0, 0, 0, 0); }));
    }
  }
}

TEST(Raster_RectROPfill, LeavesTheBufferAloneForNoopAndForUnknownOperations) {
  GuardedBuffer forbidden(64);
  forbidden.forbid();
  for (const uint32 rop :
       std::initializer_list<uint32>{RASTER_ROP_NOOP, 16u, 17u, 0x80000006u, 0xFFFFFFFFu}) {
    for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      const Messages said = tests::messagesOf(
          [&] { Raster_RectROPfill(forbidden.data(), 8, bytesPerPixel, 1, rop, 0, 0, 2, 8); });
      EXPECT_EQ(said.warning + said.panic + said.log, "");
    }
  }
}

/// Four bytes through one operation, as many pixels as they hold.
Bytes filled(Bytes bytes, uint32 bytesPerPixel, uint32 pixel, uint32 rop) {
  Raster_RectROPfill(bytes.data(), 0, bytesPerPixel, pixel, rop, 0, 0,
                     static_cast<uint32>(bytes.size()) / bytesPerPixel, 1);
  return bytes;
}

TEST(Raster_RectROPfill, InvertsWhateverThePixelIs) {
  for (const uint32 pixel : {0u, 0x55u, 0xFFFFFFFFu})
    EXPECT_EQ(filled({0x0F}, 1, pixel, 10), Bytes{0xF0});
}

TEST(Raster_RectROPfill, XorsTheThreeBytesOfAPixelSeparately) {
  EXPECT_EQ(filled({1, 2, 3, 4, 5, 6}, 3, 0x00FF0000, 6), (Bytes{1, 2, 0xFC, 4, 5, 0xF9}));
}

TEST(Raster_RectROPfill, SetsAllBitsWithTheTopByte) {
  EXPECT_EQ(filled({1, 2}, 2, 0, 15), (Bytes{0xFF, 0xFF}));
  EXPECT_EQ(filled({1, 2, 3, 4}, 4, 0, 15), (Bytes{0xFF, 0xFF, 0xFF, 0xFF}));
}

TEST(Raster_RectROPfill, UsesTheLowBitsOfThePixelOnly) {
  EXPECT_EQ(filled({0xFF, 0xFF, 0xFF, 0xFF}, 2, 0xFFFF1234, 1), (Bytes{0x34, 0x12, 0x34, 0x12}));
}

TEST(Raster_RectROPfill, WritesNothingForAWidthOrHeightOfZero) {
  GuardedBuffer nothing(0);
  for (uint32 rop = 0; rop < 16; ++rop) {
    for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      Raster_RectROPfill(nothing.data(), 64, bytesPerPixel, 1, rop, 0, 0, 0, 5);
      Raster_RectROPfill(nothing.data(), 64, bytesPerPixel, 1, rop, 0, 0, 5, 0);
    }
  }
}

// Deliberate: the step is rounded down, toward minus infinity, and the first row is not.
TEST(Raster_RectROPfill, StepsByTheRoundedPitchButStartsWithTheFullOne) {
  uint8 fb[16] = {};
  Raster_RectROPfill(fb + 12, -5, 4, 0xFFFFFFFF, 6, 0, 1, 1, 1);  // at 12 - 5
  EXPECT_EQ(0, memcmp(fb + 6, "\x00\xFF\xFF\xFF\xFF\x00", 6));
  uint8 rows[16] = {};
  Raster_RectROPfill(rows + 8, -5, 4, 0xFFFFFFFF, 6, 0, 0, 1, 2);  // at 8 and 8 - 8
  EXPECT_EQ(0, memcmp(rows, "\xFF\xFF\xFF\xFF\x00\x00\x00\x00\xFF\xFF\xFF\xFF\x00", 13));
}

// ---- Copy --------------------------------------------------------------------------------------

struct Copy {
  int64 dst;
  int32 dstPitch;
  int64 src;
  int32 srcPitch;
  uint32 bytesPerPixel, srcX, srcY, rop, dstX, dstY, width, height;

  ByteRange range(int64 base, int32 pitch, uint32 x, uint32 y) const {
    const bool bottomUp = srcY < dstY;
    const int64 row = y + (bottomUp ? int64{height} - 1 : 0);
    return rowsRange(base + row * pitch + int64{x} * bytesPerPixel,
                     reference::rowStep(bottomUp ? -int64{pitch} : pitch, bytesPerPixel),
                     int64{width} * bytesPerPixel, height);
  }
  ByteRange range() const {
    return range(dst, dstPitch, dstX, dstY).with(range(src, srcPitch, srcX, srcY));
  }
  std::string text() const {
    return "dst " + std::to_string(dst) + " pitch " + std::to_string(dstPitch) + " at " +
           std::to_string(dstX) + "," + std::to_string(dstY) + ", src " + std::to_string(src) +
           " pitch " + std::to_string(srcPitch) + " at " + std::to_string(srcX) + "," +
           std::to_string(srcY) + ", bytes " + std::to_string(bytesPerPixel) + " rop " +
           std::to_string(rop) + " size " + std::to_string(width) + "x" + std::to_string(height);
  }
};

/// Runs a copy and the model on one memory that holds both rectangles exactly.
void checkCopy(Random& random, Copy c) {
  const ByteRange range = c.range();
  c.dst -= range.begin;
  c.src -= range.begin;
  Bytes expected = random.bytes(range.size());
  GuardedBuffer actual(expected.size(), tests::someGuard(random));
  actual.assign(expected);
  reference::rectRopCopy(expected, c.dst, c.dstPitch, c.src, c.srcPitch, c.bytesPerPixel, c.srcX,
                         c.srcY, c.rop, c.dstX, c.dstY, c.width, c.height);
  Raster_RectROPcopy(moved(actual.data(), c.dst), c.dstPitch, moved(actual.data(), c.src),
                     c.srcPitch, c.bytesPerPixel, c.srcX, c.srcY, c.rop, c.dstX, c.dstY, c.width,
                     c.height);
  ASSERT_EQ(actual.bytes(), expected) << c.text();
}

int32 somePitch(Random& random, uint32 width, uint32 bytesPerPixel) {
  const auto bytes = static_cast<int32>(width * bytesPerPixel);
  const int32 pitch = random.oneOf({bytes, bytes + random.between(0, 40), random.between(0, 40)});
  return random.below(3) == 0 ? -pitch : pitch;
}

/// A copy whose coordinates ask for one of the walks: 0 top down, 1 bottom up, 2 right to left.
Copy someCopy(Random& random, uint32 bytesPerPixel, uint32 rop, uint32 walk) {
  Copy c{};
  c.bytesPerPixel = bytesPerPixel;
  c.rop = rop;
  c.srcX = random.below(9);
  c.srcY = 4 + random.below(4);
  c.dstX = walk == 2 ? c.srcX + 1 + random.below(9) : random.below(c.srcX + 1);
  c.dstY = walk == 0 ? c.srcY - random.below(4) : c.srcY + (walk == 1 ? 1 + random.below(4) : 0);
  c.width = tests::someWidth(random);
  c.height = random.below(c.width > 100 ? 4 : 12);
  c.dstPitch = somePitch(random, c.width, bytesPerPixel);
  c.srcPitch = random.below(2) == 0 ? c.dstPitch : somePitch(random, c.width, bytesPerPixel);
  return c;
}

TEST(Raster_RectROPcopy, EqualsTheModelAtEveryByteDistanceInEveryWalk) {
  Random random(3);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (uint32 rop = 0; rop < 16; ++rop) {
      for (int64 distance = -130; distance <= 130; ++distance) {
        const uint32 walk = random.below(3);
        if (rop == RASTER_ROP_COPY) continue;  // not a walk: below
        for (const uint32 w : {walk, 2u}) {
          Copy c = someCopy(random, bytesPerPixel, rop, w);
          // The first rows to be processed lie `distance` apart.
          const int64 up = w == 1 ? int64{c.height} - 1 : 0;
          c.dst = distance + (c.srcY + up) * c.srcPitch + int64{c.srcX} * bytesPerPixel -
                  (c.dstY + up) * c.dstPitch - int64{c.dstX} * bytesPerPixel;
          checkCopy(random, c);
          if (HasFatalFailure()) FAIL() << "distance " << distance;
        }
      }
    }
  }
}

TEST(Raster_RectROPcopy, WalksLongRowsWithoutAGapIntoWhatItStored) {
  Random random(6);
  for (int round = 0; round < tests::rounds(1000); ++round) {
    Copy c{};
    c.bytesPerPixel = 1 + random.below(4);
    c.rop = random.oneOf({uint32{RASTER_ROP_XOR}, uint32{RASTER_ROP_COPY_INVERTED}});
    c.width = 20 + random.below(150);
    c.height = 2 + random.below(5);
    c.srcPitch = c.dstPitch = static_cast<int32>(c.width * c.bytesPerPixel);
    // Nearer than the rectangle is long, before or behind the source.
    c.dst = random.between(-4, 4) * c.dstPitch + random.between(-70, 70);
    checkCopy(random, c);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

TEST(Raster_RectROPcopy, EqualsTheModelWithinOneFrameBuffer) {
  Random random(4);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    const uint32 bytesPerPixel = 1 + random.below(4);
    uint32 rop = random.below(16);
    if (rop == RASTER_ROP_COPY) rop = 6;
    Copy c = someCopy(random, bytesPerPixel, rop, random.below(3));
    c.srcPitch = c.dstPitch;
    checkCopy(random, c);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

TEST(Raster_RectROPcopy, EqualsTheModelBetweenFrameBuffers) {
  Random random(5);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    Copy c = someCopy(random, 1 + random.below(4), random.below(16), random.below(3));
    if (c.rop == RASTER_ROP_COPY) c.dstPitch = c.srcPitch = static_cast<int32>(c.width * 4 + 4);
    c.src = -c.range(c.src, c.srcPitch, c.srcX, c.srcY).begin;
    const ByteRange source = c.range(c.src, c.srcPitch, c.srcX, c.srcY);
    const ByteRange target = c.range(c.dst, c.dstPitch, c.dstX, c.dstY);
    c.dst += static_cast<int64>(source.size()) - target.begin;
    checkCopy(random, c);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

/// Whether the operation's result depends on the source, by its truth table.
bool readsSource(uint32 rop) { return (rop & 3) != rop >> 2; }

TEST(Raster_RectROPcopy, ReadsTheSourceOnlyWhereTheOperationDependsOnIt) {
  GuardedBuffer forbidden(4096);
  forbidden.forbid();
  for (uint32 rop = 0; rop < 16; ++rop) {
    if (readsSource(rop)) continue;
    for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      for (const uint32 dstX : {0u, 1u}) {
        Bytes dst(400, 0x33);
        Raster_RectROPcopy(dst.data(), 72, forbidden.data(), 72, bytesPerPixel, 0, 0, rop, dstX, 0,
                           17, 5);
        const auto result = static_cast<uint8>(reference::combine(rop, 0, 0x33));
        EXPECT_EQ(dst[4], result) << "rop " << rop;
      }
    }
  }
}

TEST(Raster_RectROPcopy, EqualsRectCopyForCopyAlsoWithAPixelSizeOfFive) {
  Random random(6);
  for (const uint32 bytesPerPixel : {1u, 2u, 3u, 4u, 5u}) {
    for (int round = 0; round < tests::rounds(200); ++round) {
      Copy c = someCopy(random, bytesPerPixel, RASTER_ROP_COPY, random.below(3));
      c.width = random.below(40);
      c.srcPitch = c.dstPitch = 320;
      Bytes plain = random.bytes(320 * 40);
      Bytes combined = plain;
      Raster_RectCopy(plain.data(), 320, plain.data(), 320, bytesPerPixel, c.srcX, c.srcY, c.dstX,
                      c.dstY, c.width, c.height);
      const Messages said = tests::messagesOf([&] {
        Raster_RectROPcopy(combined.data(), 320, combined.data(), 320, bytesPerPixel, c.srcX,
                           c.srcY, RASTER_ROP_COPY, c.dstX, c.dstY, c.width, c.height);
      });
      ASSERT_EQ(combined, plain) << c.text();
      ASSERT_EQ(said.warning + said.panic, "");
    }
  }
}

TEST(Raster_RectROPcopy, CopiesWithNegativePitches) {
  Bytes memory = {1, 2, 3, 4, 0, 0, 0, 0};
  Raster_RectROPcopy(&memory[6], -2, &memory[2], -2, 1, 0, 0, RASTER_ROP_COPY, 0, 0, 2, 2);
  EXPECT_EQ(memory, (Bytes{1, 2, 3, 4, 1, 2, 3, 4}));
}

TEST(Raster_RectROPcopy, PanicsForAPixelSizeOfFiveOnTwoLines) {
  std::string lines[2];
  for (const uint32 rop : std::initializer_list<uint32>{0u, RASTER_ROP_NOOP, 6u, 20u}) {
    for (const uint32 dstX : {0u, 1u}) {
      const Messages said = tests::messagesOf(
          [&] { Raster_RectROPcopy(nullptr, 0, nullptr, 0, 5, 0, 0, rop, dstX, 0, 0, 0); });
      expectUnsupported(said);
      lines[dstX] = said.panic;
    }
  }
  EXPECT_NE(lines[0], lines[1]);
}

TEST(Raster_RectROPcopy, LeavesTheDestinationAloneForNoopAndForUnknownOperations) {
  GuardedBuffer forbidden(64);
  forbidden.forbid();
  for (const uint32 rop : std::initializer_list<uint32>{RASTER_ROP_NOOP, 16u, 20u, 0xFFFFFFFFu}) {
    for (const uint32 dstX : {0u, 1u}) {
      Raster_RectROPcopy(forbidden.data(), 8, forbidden.data(), 8, 1, 0, 0, rop, dstX, 0, 2, 2);
    }
  }
}

TEST(Raster_RectROPcopy, CombinesWithTheUnchangedSourceOnePixelToTheRight) {
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const Bytes before = Random(7).bytes(size_t{41} * bytesPerPixel);
    Bytes row = before;
    Raster_RectROPcopy(row.data(), 0, row.data(), 0, bytesPerPixel, 0, 0, 6, 1, 0, 40, 1);
    for (size_t i = bytesPerPixel; i < row.size(); ++i)
      EXPECT_EQ(row[i], before[i] ^ before[i - bytesPerPixel]);
  }
}

TEST(Raster_RectROPcopy, CombinesWithTheUnchangedSourceOneRowDown) {
  const Bytes before = Random(8).bytes(10 * 64);
  Bytes fb = before;
  Raster_RectROPcopy(fb.data(), 64, fb.data(), 64, 4, 0, 0, 6, 0, 1, 16, 9);
  for (size_t i = 64; i < fb.size(); ++i) EXPECT_EQ(fb[i], before[i] ^ before[i - 64]);
}

TEST(Raster_RectROPcopy, WalksToTheRightWhenTheDestinationLiesFurtherLeft) {
  // Two bases for one memory: the destination is one byte ahead of the source, and what the walk to
  // the right has stored is the next pixel's source.
  Bytes row = {1, 0, 0, 0, 0, 0};
  Raster_RectROPcopy(&row[0], 0, &row[0] - 2, 0, 1, 2, 0, 7, 1, 0, 5, 1);
  EXPECT_EQ(row, (Bytes{1, 1, 1, 1, 1, 1}));
}

TEST(Raster_RectROPcopy, XorsTheThreeBytesOfAPixelSeparately) {
  Bytes src = {0xFF, 0, 0, 0xFF, 0, 0};
  Bytes dst = {1, 2, 3, 4, 5, 6};
  Raster_RectROPcopy(dst.data(), 6, src.data(), 6, 3, 0, 0, 6, 0, 0, 2, 1);
  EXPECT_EQ(dst, (Bytes{0xFE, 2, 3, 0xFB, 5, 6}));
}

// Deliberate: the pitch is rounded down after the negation, so -33 steps by -34.
TEST(Raster_RectROPcopy, RoundsTheNegatedPitch) {
  Bytes src(100, 0xFF);
  Bytes dst(100, 0);
  // Bottom up: the last row is found at 2 * 33, the one before it 34 bytes earlier.
  Raster_RectROPcopy(dst.data(), 33, &src[8], 33, 2, 0, 0, 6, 0, 1, 1, 2);
  for (size_t i = 0; i < dst.size(); ++i) {
    const bool touched = i == 66 || i == 67 || i == 32 || i == 33;
    EXPECT_EQ(dst[i], touched ? 0xFF : 0) << i;
  }
}

TEST(Raster_RectROPcopy, WritesNothingForAWidthOrHeightOfZero) {
  GuardedBuffer nothing(0);
  for (uint32 rop = 0; rop < 16; ++rop) {
    for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      for (const uint32 dstX : {0u, 1u}) {
        uint8* at = nothing.data();
        Raster_RectROPcopy(at, 64, at, 64, bytesPerPixel, 0, 0, rop, dstX, 0, 0, 5);
        Raster_RectROPcopy(at, 64, at, 64, bytesPerPixel, 0, 0, rop, dstX, 0, 5, 0);
      }
    }
  }
}

}  // namespace
