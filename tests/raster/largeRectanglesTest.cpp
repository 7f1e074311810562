// SPDX-License-Identifier: MIT
//
// Rectangles that the inner caches do not hold, whose rows may be fetched ahead of the work,
// against the naive models: whole buffers, rows that are short, long, joined and apart.

#include <gtest/gtest.h>

#include "raster.h"
#include "reference/rasterBitsReference.h"
#include "reference/rasterYuvReference.h"
#include "reference/rasteropsReference.h"
#include "reference/rasteropsRopReference.h"
#include "reference/rasterpixReference.h"
#include "support/bigRows.h"
#include "support/guardedBuffer.h"
#include "support/random.h"

namespace {

using reference::Bytes;
using tests::areEqual;
using tests::BigRows;
using tests::GuardedBuffer;
using tests::noise;
using tests::Random;

constexpr uint32 kRops = 16;

/// Rows that are large, and no more.
BigRows someLargeRows(Random& random, uint32 bytesPerPixel) {
  constexpr size_t kLarge = size_t{600} << 10;
  const uint32 width = random.oneOf({40u, 300u, 2000u}) + random.below(80);
  return tests::someBigRows(random, bytesPerPixel, width, kLarge / bytesPerPixel);
}

/// Runs `expect(memory)` on noise and `draw(bytes)` on the same; both are to leave the same.
template <class Expect, class Draw>
testing::AssertionResult drawsAsExpected(Random& random, size_t size, const Expect& expect,
                                         const Draw& draw) {
  Bytes expected = noise(random, size);
  GuardedBuffer actual(size);
  actual.assign(expected);
  expect(expected);
  draw(actual.data());
  return areEqual(actual, expected);
}

TEST(LargeRectangles, AreFilledByOperations) {
  Random random(1);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (uint32 rop = 0; rop < kRops; ++rop) {
      const BigRows r = someLargeRows(random, bytesPerPixel);
      const auto pitch = static_cast<int32>(r.pitch);
      const uint32 pixel = random.word();
      ASSERT_TRUE(drawsAsExpected(
          random, r.end(),
          [&](Bytes& memory) {
            reference::rectRopFill(memory, static_cast<int64>(r.base), pitch, bytesPerPixel, pixel,
                                   rop, 0, 0, r.width, r.height);
          },
          [&](uint8* memory) {
            Raster_RectROPfill(memory + r.base, pitch, bytesPerPixel, pixel, rop, 0, 0, r.width,
                               r.height);
          }))
          << r << " operation " << rop;
    }
  }
}

TEST(LargeRectangles, AreGivenAnAlpha) {
  Random random(2);
  for (int round = 0; round < 6; ++round) {
    const BigRows r = someLargeRows(random, 4);
    const auto alpha = static_cast<uint8>(random.word());
    ASSERT_TRUE(drawsAsExpected(
        random, r.end(),
        [&](Bytes& memory) {
          reference::rectFillAlpha(memory, r.base, r.pitch, alpha, 0, 0, r.width, r.height);
        },
        [&](uint8* memory) {
          Raster_RectFillAlpha(memory + r.base, r.pitch, alpha, 0, 0, r.width, r.height);
        }))
        << r;
  }
}

TEST(LargeRectangles, AreTiledByOperations) {
  Random random(3);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (uint32 rop = 0; rop < kRops; ++rop) {
      const BigRows r = someLargeRows(random, bytesPerPixel);
      const uint32 tileWidth = 1 + random.below(70);
      const uint32 tileHeight = 1 + random.below(20);
      const uint32 tilePitch = tileWidth * bytesPerPixel;
      ASSERT_TRUE(drawsAsExpected(
          random, r.end() + size_t{tilePitch} * tileHeight,
          [&](Bytes& memory) {
            reference::rectPixmapRopCopy(memory, static_cast<int64>(r.base), r.pitch,
                                         static_cast<int64>(r.end()), tilePitch, bytesPerPixel, 3,
                                         5, tileWidth, tileHeight, rop, 0, 0, r.width, r.height);
          },
          [&](uint8* memory) {
            Raster_RectPixmapROPcopy(memory + r.base, r.pitch, memory + r.end(), tilePitch,
                                     static_cast<int32>(bytesPerPixel), 3, 5, tileWidth, tileHeight,
                                     rop, 0, 0, r.width, r.height);
          }))
          << r << " operation " << rop << ", tile " << tileWidth << "x" << tileHeight;
    }
  }
}

TEST(LargeRectangles, AreMadeOfBits) {
  Random random(4);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    for (const bool stencil : {false, true}) {
      const BigRows r = someLargeRows(random, bytesPerPixel);
      const auto bytes = static_cast<int32>(bytesPerPixel);
      const auto width = static_cast<int32>(r.width);
      const auto height = static_cast<int32>(r.height);
      const uint32 bitsPitch = (r.width + 7) / 8;
      const uint32 foreground = random.word();
      const uint32 background = random.word();
      ASSERT_TRUE(drawsAsExpected(
          random, r.end() + size_t{bitsPitch} * r.height,
          [&](Bytes& memory) {
            reference::bitsToPixels(memory, static_cast<int64>(r.end()), bitsPitch,
                                    static_cast<int64>(r.base), r.pitch, bytesPerPixel, width,
                                    height, foreground, background, stencil);
          },
          [&](uint8* memory) {
            if (stencil) {
              Raster_BitsToPixelsStencil(memory + r.end(), bitsPitch, memory + r.base, r.pitch,
                                         bytes, width, height, foreground);
            } else {
              Raster_BitsToPixels(memory + r.end(), bitsPitch, memory + r.base, r.pitch, bytes,
                                  width, height, foreground, background);
            }
          }))
          << r << (stencil ? " stencil" : "");
    }
  }
}

TEST(LargeRectangles, AreConvertedFromVideo) {
  Random random(5);
  for (const uint32 format : {RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY}) {
    for (const int32 depth : {15, 16, 24, 32}) {
      const uint32 width = 2 * (300 + random.below(200));
      const uint32 height = (uint32{600} << 10) / (2 * width) + 1;
      const Bytes source = noise(random, size_t{2} * width * height);
      Bytes expected(size_t{width} * height * reference::bytesOf(depth));
      reference::yuvToRgb(source, expected, width, height, format, depth);
      GuardedBuffer actual(expected.size());
      Raster_YUVtoRGB(source.data(), actual.data(), width, height, format, depth);
      ASSERT_TRUE(areEqual(actual, expected)) << width << "x" << height << ", depth " << depth;
    }
  }
}

}  // namespace
