// SPDX-License-Identifier: MIT
//
// Rectangles that no cache holds, which may be stored past the caches, against the naive models:
// whole buffers, at every alignment of a vector's store.

#include <gtest/gtest.h>

#include <algorithm>

#include "raster.h"
#include "reference/rasterConvReference.h"
#include "reference/rasterScaleReference.h"
#include "reference/rasterYuvReference.h"
#include "reference/rasteropsReference.h"
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

/// What a call must read and write to be far: at least what is taken for the largest cache.
constexpr size_t kFar = size_t{33} << 20;

/// Rows for which `touched` bytes a pixel are read and written.
BigRows someFarRows(Random& random, uint32 bytesPerPixel, uint32 touched) {
  return tests::someBigRows(random, bytesPerPixel, 2048 + random.below(3000), kFar / touched);
}

TEST(FarRectangles, AreFilled) {
  Random random(1);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const BigRows r = someFarRows(random, bytesPerPixel, bytesPerPixel);
    const uint32 pixel = random.word();
    Bytes expected(r.end(), 0x5A);
    GuardedBuffer actual(expected.size());
    actual.assign(expected);
    reference::rectFill(expected, r.base, r.pitch, bytesPerPixel, pixel, 0, 0, r.width, r.height);
    Raster_RectFill(actual.data() + r.base, r.pitch, bytesPerPixel, pixel, 0, 0, r.width, r.height);
    ASSERT_TRUE(areEqual(actual, expected)) << r;
  }
}

// Beyond the inner caches, where runs are left to the processor's string instructions.
TEST(FarRectangles, AreFilledFromAnyAddress) {
  Random random(11);
  for (const uint32 bytesPerPixel : {1u, 2u, 4u}) {
    for (const bool hasGaps : {false, true}) {
      for (size_t base = 0; base < 5; ++base) {
        const uint32 width = 2051 + random.below(4);
        const uint32 pitch = (width + (hasGaps ? 4 : 0)) * bytesPerPixel;
        const uint32 height = (1u << 20) / (width * bytesPerPixel) + 1;
        const uint32 pixel = random.word();
        Bytes expected(base + size_t{pitch} * (height - 1) + size_t{width} * bytesPerPixel, 0x5A);
        GuardedBuffer actual(expected.size());
        actual.assign(expected);
        reference::rectFill(expected, base, pitch, bytesPerPixel, pixel, 0, 0, width, height);
        Raster_RectFill(actual.data() + base, pitch, bytesPerPixel, pixel, 0, 0, width, height);
        ASSERT_TRUE(areEqual(actual, expected))
            << base << " + " << width << " pixels of " << bytesPerPixel << ", pitch " << pitch;
      }
    }
  }
}

TEST(FarRectangles, AreCopiedBetweenAnyAddresses) {
  Random random(12);
  for (const size_t from : {0u, 1u, 31u}) {
    for (const size_t to : {0u, 3u, 32u}) {
      const uint32 width = (1u << 20) + random.below(100);
      const Bytes source = noise(random, from + width);
      Bytes expected(to + width, 0x5A);
      GuardedBuffer actual(expected.size());
      actual.assign(expected);
      std::copy_n(source.begin() + static_cast<ptrdiff_t>(from), width,
                  expected.begin() + static_cast<ptrdiff_t>(to));
      Raster_RectCopy(actual.data() + to, width, source.data() + from, width, 1, 0, 0, 0, 0, width,
                      1);
      ASSERT_TRUE(areEqual(actual, expected)) << width << " bytes from " << from << " to " << to;
    }
  }
}

TEST(FarRectangles, AreCopied) {
  Random random(2);
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    const BigRows r = someFarRows(random, bytesPerPixel, 2 * bytesPerPixel);
    const Bytes source = noise(random, r.end());
    Bytes expected(r.end(), 0x5A);
    GuardedBuffer actual(expected.size());
    actual.assign(expected);
    const size_t rowBytes = size_t{r.width} * bytesPerPixel;
    for (size_t at = 0; at < r.height * size_t{r.pitch}; at += r.pitch)
      std::copy_n(source.begin() + static_cast<ptrdiff_t>(at), rowBytes,
                  expected.begin() + static_cast<ptrdiff_t>(r.base + at));
    Raster_RectCopy(actual.data() + r.base, r.pitch, source.data(), r.pitch, bytesPerPixel, 0, 0, 0,
                    0, r.width, r.height);
    ASSERT_TRUE(areEqual(actual, expected)) << r;
  }
}

TEST(FarRectangles, AreMovedWhereTheyOverlap) {
  constexpr uint32 kWidth = 2100;
  constexpr uint32 kPitch = 2110;
  constexpr uint32 kHeight = kFar / (2 * kWidth) + 1;
  struct Move {
    uint32 srcX, srcY, dstX, dstY;
  };
  Random random(3);
  for (const Move& m : {Move{0, 0, 1, 0}, Move{3, 0, 0, 0}, Move{0, 0, 0, 1}, Move{0, 2, 5, 0}}) {
    Bytes expected = noise(random, size_t{kPitch} * (kHeight + 2));
    GuardedBuffer actual(expected.size());
    actual.assign(expected);
    reference::rectCopy(expected, 0, kPitch, 0, kPitch, 1, m.srcX, m.srcY, m.dstX, m.dstY, kWidth,
                        kHeight);
    Raster_RectCopy(actual.data(), kPitch, actual.data(), kPitch, 1, m.srcX, m.srcY, m.dstX, m.dstY,
                    kWidth, kHeight);
    ASSERT_TRUE(areEqual(actual, expected))
        << m.srcX << "," << m.srcY << " to " << m.dstX << "," << m.dstY;
  }
}

void checkTiling(Random& random, uint32 bytesPerPixel, uint32 rop) {
  const BigRows r = someFarRows(random, bytesPerPixel, bytesPerPixel);
  const uint32 tileWidth = 1 + random.below(100);
  const uint32 tileHeight = 1 + random.below(20);
  const uint32 tilePitch = tileWidth * bytesPerPixel;
  // The pixmap lies behind the rectangle.
  Bytes expected = noise(random, r.end() + size_t{tilePitch} * tileHeight);
  GuardedBuffer actual(expected.size());
  actual.assign(expected);
  reference::rectPixmapRopCopy(expected, static_cast<int64>(r.base), r.pitch,
                               static_cast<int64>(r.end()), tilePitch, bytesPerPixel, 3, 5,
                               tileWidth, tileHeight, rop, 0, 0, r.width, r.height);
  Raster_RectPixmapROPcopy(actual.data() + r.base, r.pitch, actual.data() + r.end(), tilePitch,
                           static_cast<int32>(bytesPerPixel), 3, 5, tileWidth, tileHeight, rop, 0,
                           0, r.width, r.height);
  ASSERT_TRUE(areEqual(actual, expected)) << r << " operation " << rop;
}

TEST(FarRectangles, AreTiled) {
  Random random(4);
  checkTiling(random, 3, RASTER_ROP_COPY);
  checkTiling(random, 4, RASTER_ROP_COPY_INVERTED);
}

/// `shift` is what the destination lies beside a multiple of its pixel size.
void checkConversion(Random& random, int32 srcDepth, int32 dstDepth, size_t shift) {
  const auto bytesOf = [](int32 depth) { return static_cast<uint32>(depth + 7) / 8; };
  BigRows r = someFarRows(random, bytesOf(dstDepth), bytesOf(srcDepth) + bytesOf(dstDepth));
  r.base += shift;
  const uint32 srcPitch = r.width * bytesOf(srcDepth);
  const Bytes source = noise(random, size_t{srcPitch} * r.height);
  Bytes expected(r.end() + 16, 0x5A);
  GuardedBuffer actual(expected.size() - expected.size() % 16);
  expected.resize(actual.size());
  actual.assign(expected);
  reference::convertPixels(expected, {r.base, r.pitch, 0, 0}, dstDepth, source, {0, srcPitch, 0, 0},
                           srcDepth, false, {}, r.width, r.height);
  Raster_ConvertPixels(actual.data() + r.base, r.pitch, dstDepth, source.data(), srcPitch, srcDepth,
                       false, nullptr, 0, 0, 0, 0, r.width, r.height);
  ASSERT_TRUE(areEqual(actual, expected)) << srcDepth << " to " << dstDepth << ": " << r;
}

TEST(FarRectangles, AreConverted) {
  struct Pair {
    int32 src, dst;
  };
  Random random(5);
  for (const Pair& p : {Pair{15, 16}, Pair{16, 24}, Pair{16, 32}, Pair{24, 15}, Pair{24, 32},
                        Pair{32, 16}, Pair{32, 24}})
    checkConversion(random, p.src, p.dst, 0);
}

TEST(FarRectangles, AreConvertedToPixelsBesideTheirBoundaries) {
  Random random(6);
  checkConversion(random, 16, 32, 1);
  checkConversion(random, 24, 32, 2);
  checkConversion(random, 32, 16, 1);
}

/// Rows of 4-byte pixels, all of whose addresses are `shift` pixels beside a multiple of a vector.
void checkScaling(Random& random, double scale, int32 smooth, uint32 shift) {
  constexpr uint32 kVector = 64;
  reference::ScaleCall c;
  c.dstBpp = c.srcBpp = 32;
  c.dstDepth = 24;
  c.srcDepth = 24;
  c.scaleX = c.scaleY = scale;
  c.smooth = smooth;
  c.dstWidth = 1024 + random.below(1500);
  c.dstHeight = static_cast<uint32>(kFar / (size_t{4} * c.dstWidth)) + 1;
  c.dstPitch = (4 * c.dstWidth / kVector + 1) * kVector;
  c.dstBase = size_t{4} * shift;
  c.x2 = static_cast<int32>(c.dstWidth);
  c.y2 = static_cast<int32>(c.dstHeight);
  c.srcWidth = static_cast<uint32>(c.dstWidth / scale);
  c.srcHeight = static_cast<uint32>(c.dstHeight / scale);
  c.srcPitch = static_cast<int32>(4 * c.srcWidth);
  const Bytes source = noise(random, size_t{4} * c.srcWidth * c.srcHeight);
  Bytes expected(size_t{c.dstPitch} * c.dstHeight + kVector, 0x5A);
  GuardedBuffer actual(expected.size());
  actual.assign(expected);
  ASSERT_TRUE(reference::scale(expected, source, c).result);
  ASSERT_TRUE(Raster_Scale(actual.data() + c.dstBase, c.dstPitch, 32, 24, c.dstWidth, c.dstHeight,
                           0, 0, 0, c.x2, c.y2, source.data(), c.srcPitch, 32, 24, 0, c.srcWidth,
                           c.srcHeight, 0, scale, scale, smooth));
  ASSERT_TRUE(areEqual(actual, expected)) << c.dstWidth << "x" << c.dstHeight << " by " << scale
                                          << (smooth != 0 ? ", smooth" : "") << ", shift " << shift;
}

TEST(FarRectangles, AreScaled) {
  Random random(7);
  for (const int32 smooth : {0, 1}) {
    for (const double scale : {2.0, 1.5, 0.8}) checkScaling(random, scale, smooth, 0);
  }
  checkScaling(random, 0.5, 0, 0);
  checkScaling(random, 2, 0, 3);
  checkScaling(random, 1.5, 1, 5);
}

/// A frame of video; `shift` is what the destination lies beside a multiple of a vector.
void checkVideo(Random& random, uint32 format, int32 depth, size_t shift, uint32 width = 2048) {
  const uint32 bytes = reference::bytesOf(depth);
  const uint32 height = static_cast<uint32>(kFar / (size_t{width} * bytes) + 2) / 2 * 2;
  const Bytes source = noise(random, size_t{2} * width * height);
  Bytes frame(size_t{width} * bytes * height);
  reference::yuvToRgb(source, frame, width, height, format, depth);
  Bytes expected(shift, 0x5A);
  expected.insert(expected.end(), frame.begin(), frame.end());
  expected.resize(frame.size() + 64, 0x5A);
  GuardedBuffer actual(expected.size());
  actual.assign(Bytes(expected.size(), 0x5A));
  Raster_YUVtoRGB(source.data(), actual.data() + shift, width, height, format, depth);
  ASSERT_TRUE(areEqual(actual, expected))
      << width << " wide, depth " << depth << ", shift " << shift;
}

TEST(FarRectangles, AreConvertedFromVideo) {
  Random random(8);
  checkVideo(random, RASTER_VIDEO_YUY2, 16, 0);
  checkVideo(random, RASTER_VIDEO_UYVY, 32, 0);
  checkVideo(random, RASTER_VIDEO_YV12, 15, 0);
  checkVideo(random, RASTER_VIDEO_YV12, 32, 0);
  checkVideo(random, RASTER_VIDEO_YV12, 32, 4);
  checkVideo(random, RASTER_VIDEO_YUY2, 32, 0, 2064);  // rows that do not end with a vector
  checkVideo(random, RASTER_VIDEO_YV12, 16, 0, 2080);
}

TEST(FarRectangles, AreConvertedFromVideoInPlace) {
  constexpr uint32 kWidth = 2048;
  constexpr uint32 kHeight = kFar / (2 * kWidth);
  Random random(9);
  const Bytes source = noise(random, size_t{2} * kWidth * kHeight);
  Bytes expected(source.size());
  reference::yuvToRgb(source, expected, kWidth, kHeight, RASTER_VIDEO_UYVY, 16);
  GuardedBuffer actual(source.size());
  actual.assign(source);
  Raster_YUVtoRGB(actual.data(), actual.data(), kWidth, kHeight, RASTER_VIDEO_UYVY, 16);
  ASSERT_TRUE(areEqual(actual, expected));
}

}  // namespace
