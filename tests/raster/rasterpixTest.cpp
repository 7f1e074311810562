// SPDX-License-Identifier: MIT
//
// Tiling against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <csignal>
#include <string>

#include "raster.h"
#include "reference/rasterpixReference.h"
#include "support/byteRange.h"
#include "support/guardedBuffer.h"
#include "support/ownProcess.h"
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

uint32 roundedPitch(uint32 pitch, uint32 bytesPerPixel) {
  return bytesPerPixel == 3 ? pitch : pitch / bytesPerPixel * bytesPerPixel;
}

/// Where rows of one picture lie. The rows of every block step by the rounded pitch from a first
/// row that is found with the full one, so the last row is somewhere between the two.
ByteRange touched(int64 base, uint32 pitch, uint32 bytesPerPixel, uint32 x, uint32 y, uint32 width,
                  uint32 height) {
  const int64 first = base + int64{y} * pitch + int64{x} * bytesPerPixel;
  return rowsRange(first, pitch, int64{width} * bytesPerPixel, height)
      .with(rowsRange(first, roundedPitch(pitch, bytesPerPixel), int64{width} * bytesPerPixel,
                      height));
}

/// The arguments of a tiling, or of a worker where the pixmap is the source block.
struct Tiling {
  int64 dst;
  uint32 dstPitch;
  int64 pixmap;
  uint32 pixmapPitch;
  uint32 bytesPerPixel, tileX, tileY, pixmapWidth, pixmapHeight, rop, dstX, dstY, width, height;

  ByteRange dstRange() const {
    return touched(dst, dstPitch, bytesPerPixel, dstX, dstY, width, height);
  }
  ByteRange pixmapRange() const {
    return touched(pixmap, pixmapPitch, bytesPerPixel, 0, 0, pixmapWidth, pixmapHeight);
  }
  std::string text() const {
    return "dst " + std::to_string(dst) + " pitch " + std::to_string(dstPitch) + " at " +
           std::to_string(dstX) + "," + std::to_string(dstY) + " size " + std::to_string(width) +
           "x" + std::to_string(height) + ", pixmap " + std::to_string(pixmap) + " pitch " +
           std::to_string(pixmapPitch) + " size " + std::to_string(pixmapWidth) + "x" +
           std::to_string(pixmapHeight) + " phase " + std::to_string(tileX) + "," +
           std::to_string(tileY) + ", bytes " + std::to_string(bytesPerPixel) + " rop " +
           std::to_string(rop);
  }
};

uint32 someSize(Random& random) {
  return random.oneOf(
      {1 + random.below(9), 1 + random.below(70), 1u << random.below(7), 1 + random.below(300)});
}

Tiling someTiling(Random& random, uint32 rop) {
  Tiling t{};
  t.bytesPerPixel = 1 + random.below(4);
  t.rop = rop;
  t.pixmapWidth = someSize(random);
  t.pixmapHeight = 1 + random.below(12);
  t.tileX = random.oneOf({random.below(t.pixmapWidth), random.word()});
  t.tileY = random.oneOf({random.below(t.pixmapHeight), random.word()});
  t.dstX = random.below(9);
  t.dstY = random.below(4);
  t.width = random.below(12) == 0 ? 700 + random.below(700) : random.below(130);
  t.height = random.below(t.width > 130 ? 5 : 30);
  t.dstPitch = (t.dstX + t.width) * t.bytesPerPixel + random.below(3) * random.below(40);
  t.pixmapPitch = t.pixmapWidth * t.bytesPerPixel + random.below(3) * random.below(30);
  return t;
}

/// Runs a tiling and the model on one memory that holds both pictures exactly.
void checkTiling(Random& random, Tiling t) {
  const ByteRange range = t.dstRange().with(t.pixmapRange());
  t.dst -= range.begin;
  t.pixmap -= range.begin;
  Bytes expected = random.bytes(range.size());
  GuardedBuffer actual(expected.size(), tests::someGuard(random));
  actual.assign(expected);
  reference::rectPixmapRopCopy(expected, t.dst, t.dstPitch, t.pixmap, t.pixmapPitch,
                               t.bytesPerPixel, t.tileX, t.tileY, t.pixmapWidth, t.pixmapHeight,
                               t.rop, t.dstX, t.dstY, t.width, t.height);
  uint8* dst = moved(actual.data(), t.dst);
  uint8* pixmap = moved(actual.data(), t.pixmap);
  const auto bytesPerPixel = static_cast<int32>(t.bytesPerPixel);
  if (t.rop == RASTER_ROP_COPY && random.below(2) == 0) {
    Raster_RectPixmapCopy(dst, t.dstPitch, pixmap, t.pixmapPitch, bytesPerPixel, t.tileX, t.tileY,
                          t.pixmapWidth, t.pixmapHeight, t.dstX, t.dstY, t.width, t.height);
  } else {
    Raster_RectPixmapROPcopy(dst, t.dstPitch, pixmap, t.pixmapPitch, bytesPerPixel, t.tileX,
                             t.tileY, t.pixmapWidth, t.pixmapHeight, t.rop, t.dstX, t.dstY, t.width,
                             t.height);
  }
  ASSERT_EQ(actual.bytes(), expected) << t.text();
}

TEST(Raster_RectPixmapROPcopy, EqualsTheModelWithASeparatePixmap) {
  Random random(1);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    Tiling t = someTiling(random, static_cast<uint32>(round) % 18);
    t.pixmap = t.dstRange().end;
    checkTiling(random, t);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

TEST(Raster_RectPixmapROPcopy, EqualsTheModelForEveryPixmapWidthAlsoWithTallPixmaps) {
  Random random(6);
  for (uint32 width = 1; width <= 70; ++width) {
    for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      Tiling t = someTiling(random, random.oneOf(std::initializer_list<uint32>{
                                        RASTER_ROP_COPY, 1 + random.below(14)}));
      t.bytesPerPixel = bytesPerPixel;
      t.pixmapWidth = width;
      t.pixmapHeight = random.oneOf({1 + random.below(4), 1 + random.below(80)});
      t.width = random.oneOf({random.below(100), 200 + random.below(500)});
      t.height = random.oneOf({random.below(20), random.below(200)});
      t.dstPitch = (t.dstX + t.width) * bytesPerPixel + random.oneOf({0u, random.below(40)});
      if (random.below(2) == 0) t.dstPitch = (t.dstPitch + 63) / 64 * 64;
      t.pixmapPitch = width * bytesPerPixel + random.oneOf({0u, random.below(30)});
      t.pixmap = t.dstRange().end;
      checkTiling(random, t);
      if (HasFatalFailure()) FAIL() << "width " << width;
    }
  }
}

TEST(Raster_RectPixmapROPcopy, EqualsTheModelWithAPixmapInsideOrBesideTheRectangle) {
  Random random(2);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    Tiling t = someTiling(random, static_cast<uint32>(round) % 16);
    const ByteRange dst = t.dstRange();
    t.pixmap = random.oneOf(
        {dst.begin + random.between(-130, 130),
         dst.begin + static_cast<int64>(random.below(1 + static_cast<uint32>(dst.size()))),
         dst.end - random.between(0, 130)});
    checkTiling(random, t);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

/// Pixmaps that no memory has room for; the rectangle meets the first pixels of their rows only.
TEST(Raster_RectPixmapROPcopy, EqualsTheModelWherePixmapRowsHaveMoreBytesThanAnAddress) {
  struct {
    uint32 width, bytesPerPixel;
  } const pixmaps[] = {{0x40000000, 4}, {0x40000001, 4}, {0x7FFFFFFF, 4}, {0xFFFFFFFF, 4},
                       {0x55555556, 3}, {0xAAAAAAAB, 3}, {0x80000000, 2}, {0x80000001, 2}};
  Random random(7);
  for (const auto& [pixmapWidth, bytesPerPixel] : pixmaps) {
    for (uint32 rop = 0; rop < 16; ++rop) {
      const uint32 width = 1 + random.below(40);
      const uint32 height = 1 + random.below(5);
      const uint32 tileX = random.below(3);
      const uint32 pitch = (width + tileX) * bytesPerPixel;
      Bytes expected = random.bytes(size_t{pitch} * (height + 2));
      GuardedBuffer actual(expected.size(), tests::someGuard(random));
      actual.assign(expected);
      const int64 dst = 2 * int64{pitch};  // after the two rows of the pixmap
      reference::rectPixmapRopCopy(expected, dst, pitch, 0, pitch, bytesPerPixel, tileX, 1,
                                   pixmapWidth, 2, rop, 0, 0, width, height);
      Raster_RectPixmapROPcopy(moved(actual.data(), dst), pitch, actual.data(), pitch,
                               static_cast<int32>(bytesPerPixel), tileX, 1, pixmapWidth, 2, rop, 0,
                               0, width, height);
      ASSERT_EQ(actual.bytes(), expected) << pixmapWidth << " x " << bytesPerPixel;
    }
  }
}

TEST(Raster_RectPixmapROPcopy, EqualsTheModelWithRowsThatOverlapEachOther) {
  Random random(3);
  for (int round = 0; round < tests::rounds(2000); ++round) {
    Tiling t = someTiling(random, static_cast<uint32>(round) % 16);
    t.dstPitch = random.below(t.dstPitch + 1);
    t.pixmapPitch = random.below(t.pixmapPitch + 1);
    t.pixmap = t.dstRange().end;
    checkTiling(random, t);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

using Worker = void (*)(uint8*, uint32, const uint8*, uint32, uint32, uint32, uint32, uint32,
                        uint32, uint32, uint32);
constexpr Worker kWorkers[] = {nullptr, RasterRectPixmapROPcopy8, RasterRectPixmapROPcopy16,
                               RasterRectPixmapROPcopy24, RasterRectPixmapROPcopy32};

TEST(RasterRectPixmapROPcopy, EqualsTheModelAtEveryByteDistance) {
  Random random(4);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (uint32 rop = 0; rop < 16; ++rop) {
      for (int64 distance = -130; distance <= 130; ++distance) {
        const uint32 width = random.below(71);
        const uint32 height = random.below(5);
        const uint32 dstPitch = random.below(320);
        const uint32 srcPitch = random.oneOf({dstPitch, random.below(320)});
        int64 dst = distance;
        int64 src = 0;
        const auto range = [&](int64 base, uint32 pitch) {
          return touched(base, pitch, bytesPerPixel, 0, 0, width, height);
        };
        const ByteRange both = range(dst, dstPitch).with(range(src, srcPitch));
        // The blocks are found with full pitches at (3, 2) and (1, 5).
        dst -= both.begin + 2 * int64{dstPitch} + 3 * int64{bytesPerPixel};
        src -= both.begin + 5 * int64{srcPitch} + int64{bytesPerPixel};
        Bytes expected = random.bytes(both.size());
        GuardedBuffer actual(expected.size(), tests::someGuard(random));
        actual.assign(expected);
        reference::pixmapBlock(expected, dst, dstPitch, src, srcPitch, bytesPerPixel, 1, 5, rop, 3,
                               2, width, height);
        kWorkers[bytesPerPixel](moved(actual.data(), dst), dstPitch, moved(actual.data(), src),
                                srcPitch, 1, 5, rop, 3, 2, width, height);
        ASSERT_EQ(actual.bytes(), expected)
            << "bytes " << bytesPerPixel << " rop " << rop << " distance " << distance
            << " pitches " << dstPitch << "," << srcPitch << " size " << width << "x" << height;
      }
    }
  }
}

TEST(RasterRectPixmapROPcopy, WritesNothingForNoopAndForUnknownOperations) {
  GuardedBuffer forbidden(64);
  forbidden.forbid();
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (const uint32 rop : std::initializer_list<uint32>{RASTER_ROP_NOOP, 16u, 0xFFFFFFFFu})
      kWorkers[bytesPerPixel](forbidden.data(), 16, forbidden.data(), 16, 0, 0, rop, 0, 0, 2, 2);
  }
}

TEST(Raster_RectPixmapCopy, StartsWithTheReducedPhaseAndWraps) {
  const uint8 pixmap[] = {10, 11, 20, 21};
  uint8 row[5] = {};
  Raster_RectPixmapCopy(row, 5, pixmap, 2, 1, 3, 0, 2, 2, 0, 0, 5, 1);
  EXPECT_EQ(Bytes(row, row + 5), (Bytes{11, 10, 11, 10, 11}));
}

TEST(Raster_RectPixmapCopy, CutsTheRectangleAtThePixmapsEdge) {
  const uint8 pixmap[] = {0, 1, 2, 3};
  uint8 row[5] = {};
  Raster_RectPixmapCopy(row, 5, pixmap, 4, 1, 2, 0, 4, 1, 0, 0, 5, 1);
  EXPECT_EQ(Bytes(row, row + 5), (Bytes{2, 3, 0, 1, 2}));
  Raster_RectPixmapCopy(row, 5, pixmap, 4, 1, 1, 0, 4, 1, 1, 0, 3, 1);
  EXPECT_EQ(Bytes(row, row + 5), (Bytes{2, 1, 2, 3, 2}));
}

TEST(Raster_RectPixmapCopy, WrapsRowsToo) {
  const uint8 pixmap[] = {1, 2, 3};
  uint8 column[7] = {};
  Raster_RectPixmapCopy(column, 1, pixmap, 1, 1, 0, 5, 1, 3, 0, 0, 1, 7);
  EXPECT_EQ(Bytes(column, column + 7), (Bytes{3, 1, 2, 3, 1, 2, 3}));
}

TEST(Raster_RectPixmapROPcopy, EqualsPixmapCopyForCopy) {
  Random random(5);
  for (int32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const Bytes pixmap = random.bytes(30 * 5);
    Bytes copied = random.bytes(3000);
    Bytes combined = copied;
    Raster_RectPixmapCopy(copied.data(), 150, pixmap.data(), 30, bytesPerPixel, 4, 9, 6, 5, 1, 2,
                          30, 15);
    Raster_RectPixmapROPcopy(combined.data(), 150, pixmap.data(), 30, bytesPerPixel, 4, 9, 6, 5,
                             RASTER_ROP_COPY, 1, 2, 30, 15);
    EXPECT_EQ(combined, copied);
  }
}

TEST(Raster_RectPixmapROPcopy, WritesNothingForAWidthOrHeightOfZero) {
  GuardedBuffer nothing(0);
  uint8* at = nothing.data();
  for (int32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (uint32 rop = 0; rop < 16; ++rop) {
      Raster_RectPixmapROPcopy(at, 64, at, 8, bytesPerPixel, 1, 1, 2, 2, rop, 0, 0, 0, 5);
      Raster_RectPixmapROPcopy(at, 64, at, 8, bytesPerPixel, 1, 1, 2, 2, rop, 0, 0, 5, 0);
    }
    Raster_RectPixmapCopy(at, 64, at, 8, bytesPerPixel, 1, 1, 2, 2, 0, 0, 0, 5);
    Raster_RectPixmapCopy(at, 64, at, 8, bytesPerPixel, 1, 1, 2, 2, 0, 0, 5, 0);
  }
}

TEST(Raster_RectPixmapROPcopy, ReadsThePixmapOnlyWhereTheOperationDependsOnIt) {
  GuardedBuffer forbidden(4096);
  forbidden.forbid();
  for (const uint32 rop : {0u, 10u, 15u}) {
    for (int32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
      Bytes dst(40 * 40, 0x33);
      Raster_RectPixmapROPcopy(dst.data(), 40, forbidden.data(), 8, bytesPerPixel, 1, 1, 2, 2, rop,
                               0, 0, 10, 40);
      EXPECT_EQ(dst[0], rop == 0 ? 0 : rop == 10 ? 0xCC : 0xFF);
    }
  }
}

/// The signal that ends the tiling of an empty rectangle with a pixmap of this size.
int signalOfTiling(uint32 pixmapWidth, uint32 pixmapHeight, int32 bytesPerPixel, uint32 rop) {
  return tests::signalOfOwnProcess([=] {
    Raster_RectPixmapROPcopy(nullptr, 0, nullptr, 0, bytesPerPixel, 3, 2, pixmapWidth, pixmapHeight,
                             rop, 0, 0, 0, 0);
  });
}

TEST(Raster_RectPixmapROPcopy, DividesByAPixmapSizeOfZeroBeforeAnythingElse) {
  for (const int32 bytesPerPixel : {-1, 0, 1, 2, 3, 4, 5}) {
    for (const uint32 rop : {0u, uint32{RASTER_ROP_COPY}, uint32{RASTER_ROP_NOOP}, 10u, 16u}) {
      EXPECT_EQ(signalOfTiling(0, 1, bytesPerPixel, rop), SIGFPE) << bytesPerPixel << " " << rop;
      EXPECT_EQ(signalOfTiling(1, 0, bytesPerPixel, rop), SIGFPE) << bytesPerPixel << " " << rop;
    }
  }
  EXPECT_EQ(signalOfTiling(1, 1, 4, uint32{RASTER_ROP_NOOP}), 0);
}

TEST(Raster_RectPixmapCopy, DividesByAPixmapSizeOfZeroBeforeAnythingElse) {
  for (const uint32 width : {0u, 1u}) {
    EXPECT_EQ(tests::signalOfOwnProcess([=] {
                Raster_RectPixmapCopy(nullptr, 0, nullptr, 0, 5, 3, 2, width, 1 - width, 0, 0, 0,
                                      0);
              }),
              SIGFPE);
  }
}

TEST(Raster_RectPixmapROPcopy, PanicsForAPixelSizeOfFiveAlsoWithNothingToDo) {
  for (const int32 bytesPerPixel : {0, 5, -1}) {
    for (const uint32 rop :
         std::initializer_list<uint32>{0u, RASTER_ROP_COPY, RASTER_ROP_NOOP, 16u}) {
      for (const uint32 height : {0u, 1u}) {
        const Messages said = tests::messagesOf([&] {
          Raster_RectPixmapROPcopy(nullptr, 0, nullptr, 0, bytesPerPixel, 0, 0, 1, 1, rop, 0, 0, 0,
                                   height);
        });
        EXPECT_EQ(said.warning, "Raster: Unsupported frame buffer depth\n");
        EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterpix"))
            << said.panic;
      }
    }
    const Messages said = tests::messagesOf([&] {
      Raster_RectPixmapCopy(nullptr, 0, nullptr, 0, bytesPerPixel, 0, 0, 1, 1, 0, 0, 0, 0);
    });
    EXPECT_EQ(said.warning, "Raster: Unsupported frame buffer depth\n");
    EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterpix"))
        << said.panic;
  }
}

}  // namespace
