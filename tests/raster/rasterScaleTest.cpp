// SPDX-License-Identifier: MIT
//
// Scaling against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cmath>
#include <cstring>
#include <functional>
#include <limits>
#include <string>

#include "message.h"
#include "raster.h"
#include "reference/rasterScaleReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/someValues.h"

namespace {

using reference::ScaleAnswer;
using reference::ScaleCall;
using tests::GuardedBuffer;
using tests::Random;
using Bytes = std::vector<uint8>;

bool run(uint8* dst, const uint8* src, const ScaleCall& c) {
  return Raster_Scale(dst + c.dstBase, c.dstPitch, c.dstBpp, c.dstDepth, c.dstWidth, c.dstHeight, 1,
                      c.x1, c.y1, c.x2, c.y2, src + c.srcBase, c.srcPitch, c.srcBpp, c.srcDepth, 2,
                      c.srcWidth, c.srcHeight, 3, c.scaleX, c.scaleY, c.smooth);
}

std::string describe(const ScaleCall& c) {
  char text[400];
  snprintf(text, sizeof text,
           "D%dB%d %dx%d pitch %d base %d -> D%dB%d %dx%d pitch %d base %d, (%d,%d)-(%d,%d), "
           "scale %.17g x %.17g, smooth %d",
           c.srcDepth, c.srcBpp, c.srcWidth, c.srcHeight, c.srcPitch, static_cast<int>(c.srcBase),
           c.dstDepth, c.dstBpp, c.dstWidth, c.dstHeight, c.dstPitch, static_cast<int>(c.dstBase),
           c.x1, c.y1, c.x2, c.y2, c.scaleX, c.scaleY, c.smooth);
  return text;
}

/// The formats that the scaler accepts: source depth and bpp, destination depth and bpp.
struct Formats {
  int32 srcDepth;
  uint32 srcBpp;
  uint32 dstDepth;
  uint32 dstBpp;
};
constexpr Formats kFormats[] = {
    {24, 32, 24, 32}, {24, 24, 24, 24}, {24, 32, 24, 24}, {24, 32, 16, 16}, {16, 16, 16, 16},
    {8, 8, 8, 8},     {32, 32, 32, 32}, {8, 16, 8, 16},   {16, 24, 16, 24}, {16, 32, 16, 32},
    {24, 32, 16, 32}, {24, 32, 16, 24}, {0, 8, 0, 8}};

ScaleCall withFormats(const Formats& formats) {
  ScaleCall c;
  c.srcDepth = formats.srcDepth;
  c.srcBpp = formats.srcBpp;
  c.dstDepth = formats.dstDepth;
  c.dstBpp = formats.dstBpp;
  return c;
}

/// Bytes from the base of a frame buffer to the end of its last row.
size_t extent(uint32 width, uint32 height, size_t pitch, uint32 bpp) {
  return width == 0 || height == 0 ? 0 : (height - 1) * pitch + size_t{width} * (bpp / 8);
}

/// Gives the frame buffers of a call pitches and bases; the source may run from bottom to top.
void placeBuffers(Random& random, ScaleCall& c) {
  c.dstPitch = c.dstWidth * (c.dstBpp / 8) + random.below(9);
  c.dstBase = random.below(5);
  const auto pitch = static_cast<int32>(c.srcWidth * (c.srcBpp / 8) + random.below(9));
  c.srcBase = random.below(5);
  c.srcPitch = pitch;
  if (random.below(8) == 0 && c.srcHeight != 0) {
    c.srcPitch = -pitch;
    c.srcBase += (c.srcHeight - 1) * static_cast<size_t>(pitch);
  }
}

size_t srcBytesOf(const ScaleCall& c) {
  const size_t pitch = static_cast<size_t>(std::abs(c.srcPitch));
  const size_t first = c.srcPitch < 0 ? c.srcBase - (c.srcHeight - 1) * pitch : c.srcBase;
  return first + extent(c.srcWidth, c.srcHeight, pitch, c.srcBpp);
}

/// Runs a call on noise between guard pages and compares every byte with the model.
void check(Random& random, const ScaleCall& c) {
  const auto guard = [&] { return tests::someGuard(random); };
  const Bytes source = random.bytes(srcBytesOf(c));
  Bytes expected = random.bytes(c.dstBase + extent(c.dstWidth, c.dstHeight, c.dstPitch, c.dstBpp));
  GuardedBuffer src(source.size(), guard());
  GuardedBuffer dst(expected.size(), guard());
  src.assign(source);
  dst.assign(expected);
  const ScaleAnswer answer = reference::scale(expected, source, c);
  ASSERT_EQ(run(dst.data(), src.data(), c), answer.result) << describe(c);
  ASSERT_TRUE(dst.bytes() == expected) << describe(c);
}

/// A rectangle of the destination: all of it, or any part.
void someRectangle(Random& random, ScaleCall& c) {
  const auto w = static_cast<int32>(c.dstWidth);
  const auto h = static_cast<int32>(c.dstHeight);
  c.x2 = w;
  c.y2 = h;
  if (random.below(2) == 0) return;
  c.x1 = random.between(0, w);
  c.x2 = random.between(c.x1, w);
  c.y1 = random.between(0, h);
  c.y2 = random.between(c.y1, h);
}

double someScale(Random& random) {
  switch (random.below(6)) {
    case 0:
      return random.oneOf({1.0, 2.0, 3.0, 4.0, 1.5, 1.25, 0.5, 0.25, 0.125, 2.0 / 3, 0.8, 0.75, 0.4,
                           1.0 / 3, 1.0 / 32, 1.0 / 33, 64.0, 1.0 / 64});
    case 1:
      return std::exp2(random.between(-15000, 6000) / 1000.0);
    case 2:
      return 1 + random.between(-1000, 1000) / 65536.0;
    case 3:
      return 65536.0 / random.between(0x10001, 0x80000);
    default:
      return std::exp2(random.between(-2500, 2500) / 1000.0);
  }
}

uint32 someSize(Random& random, uint32 large) {
  return random.below(6) == 0 ? 1 + random.below(large) : 1 + random.below(40);
}

/// Any formats, sizes, factors and smoothing.
ScaleCall someCall(Random& random, uint32 largestWidth) {
  ScaleCall c = withFormats(kFormats[random.below(std::size(kFormats))]);
  c.dstWidth = someSize(random, largestWidth);
  c.dstHeight = someSize(random, 50);
  c.srcWidth = someSize(random, largestWidth);
  c.srcHeight = someSize(random, 50);
  c.scaleX = someScale(random);
  c.scaleY = someScale(random);
  c.smooth = random.between(0, 1);
  return c;
}

void checkRandomCalls(uint64 seed, int rounds, int32 smooth) {
  Random random(seed);
  for (int round = 0; round < tests::rounds(rounds); ++round) {
    ScaleCall c = someCall(random, 700);
    if (random.below(4) == 0) c.scaleY = c.scaleX;
    if (random.below(6) == 0) c.scaleX = c.scaleY = random.oneOf({0.5, 0.25});
    if (random.below(4) == 0) c.scaleX = double{1} * c.dstWidth / c.srcWidth;
    if (random.below(4) == 0) c.scaleY = double{1} * c.dstHeight / c.srcHeight;
    c.smooth = smooth;
    someRectangle(random, c);
    placeBuffers(random, c);
    check(random, c);
    if (testing::Test::HasFatalFailure()) FAIL() << "round " << round;
  }
}

TEST(Raster_Scale, EqualsTheModelWithoutSmoothing) { checkRandomCalls(1, 6000, 0); }
TEST(Raster_Scale, EqualsTheModelWithSmoothing) { checkRandomCalls(2, 12000, 1); }

/// Runs a call whose frame buffers lie in one memory and compares every byte with the model. The
/// bases count from the start of the other frame buffer, in either direction.
void checkInOneMemory(Random& random, ScaleCall c) {
  const size_t dstBytes = extent(c.dstWidth, c.dstHeight, c.dstPitch, c.dstBpp);
  const auto first = static_cast<int64>(std::min(c.dstBase, c.srcBase));
  c.dstBase -= static_cast<size_t>(first);
  c.srcBase -= static_cast<size_t>(first);
  Bytes expected = random.bytes(std::max(c.dstBase + dstBytes, srcBytesOf(c)));
  GuardedBuffer memory(expected.size(), tests::someGuard(random));
  memory.assign(expected);
  const ScaleAnswer answer = reference::scale(expected, expected, c);
  ASSERT_EQ(run(memory.data(), memory.data(), c), answer.result) << describe(c);
  ASSERT_TRUE(memory.bytes() == expected) << describe(c);
}

/// A pitch of rows that lie apart, or that reach into one another.
uint32 somePitch(Random& random, uint32 rowBytes) {
  return random.oneOf({rowBytes, rowBytes + random.below(9), random.below(rowBytes + 1)});
}

/// The row cache decides: a source row is resampled whole when it is first needed, and stays so.
TEST(Raster_Scale, EqualsTheModelWhereTheFrameBuffersOverlap) {
  Random random(10);
  for (int round = 0; round < tests::rounds(12000); ++round) {
    ScaleCall c = someCall(random, 200);
    if (random.below(3) == 0) c.scaleY = c.scaleX;
    if (random.below(4) == 0) c.scaleX = c.scaleY = random.oneOf({0.5, 0.25, 1.0, 2.0});
    someRectangle(random, c);
    const uint32 srcPitch = somePitch(random, c.srcWidth * (c.srcBpp / 8));
    c.srcPitch = static_cast<int32>(srcPitch);
    c.dstPitch = random.below(2) == 0 ? srcPitch : somePitch(random, c.dstWidth * (c.dstBpp / 8));
    const size_t srcBytes = extent(c.srcWidth, c.srcHeight, srcPitch, c.srcBpp);
    const size_t dstBytes = extent(c.dstWidth, c.dstHeight, c.dstPitch, c.dstBpp);
    // In one place, a few bytes beside each other, or anywhere where they still touch.
    const size_t apart = random.oneOf({0u, random.below(70), random.below(20000)});
    c.dstBase = random.below(2) == 0 ? std::min(apart, srcBytes) : 0;
    c.srcBase = c.dstBase == 0 ? std::min(apart, dstBytes) : 0;
    checkInOneMemory(random, c);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

TEST(Raster_Scale, EqualsTheModelWhereDestinationRowsOverlap) {
  Random random(11);
  for (int round = 0; round < tests::rounds(6000); ++round) {
    ScaleCall c = someCall(random, 200);
    someRectangle(random, c);
    placeBuffers(random, c);
    c.dstPitch = random.below(c.dstWidth * (c.dstBpp / 8) + 1);
    check(random, c);
    if (HasFatalFailure()) FAIL() << "round " << round;
  }
}

/// Positions wrap at 32 bits: horizontal ones go on unsigned, vertical ones turn negative.
TEST(Raster_Scale, EqualsTheModelWherePositionsWrap) {
  Random random(3);
  for (int round = 0; round < tests::rounds(300); ++round) {
    ScaleCall c = withFormats(kFormats[random.below(std::size(kFormats))]);
    c.dstWidth = 32767 - random.below(3);
    c.dstHeight = 32767 - random.below(3);
    c.srcWidth = 1 + random.below(60);
    c.srcHeight = 1 + random.below(60);
    c.scaleX = std::exp2(-random.between(0, 14900) / 1000.0);
    c.scaleY = std::exp2(-random.between(0, 14900) / 1000.0);
    c.smooth = random.between(0, 1);
    c.x1 = random.between(0, 32700);
    c.x2 = c.x1 + random.between(1, 64);
    c.y1 = random.between(0, 32700);
    c.y2 = c.y1 + random.between(1, 3);
    placeBuffers(random, c);
    // Only the rectangle exists: its rows are all in one place, and the base lies before them.
    c.dstPitch = 0;
    c.dstBase = 0;
    const Bytes source = random.bytes(srcBytesOf(c));
    Bytes expected = random.bytes(size_t{c.dstWidth} * (c.dstBpp / 8));
    Bytes actual = expected;
    const ScaleAnswer answer = reference::scale(expected, source, c);
    ASSERT_EQ(run(actual.data(), source.data(), c), answer.result) << describe(c);
    ASSERT_TRUE(actual == expected) << describe(c);
  }
}

/// Steps of all kinds, on pixels at the ends of the range, where quotients are closest to the next.
TEST(Raster_Scale, DividesExactlyForEveryKindOfStep) {
  Random random(4);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    ScaleCall c = withFormats(kFormats[random.below(3)]);
    const uint32 zeros = random.below(17);
    const auto step = [&] { return ((0x10000 + random.below(0x80000)) >> zeros << zeros) + 1e-3; };
    c.dstWidth = 1 + random.below(70);
    c.dstHeight = 1 + random.below(6);
    c.srcWidth = 1 + random.below(300);
    c.srcHeight = 1 + random.below(30);
    c.scaleX = 65536.0 / step();
    c.scaleY = 65536.0 / step();
    c.smooth = 1;
    c.x2 = static_cast<int32>(c.dstWidth);
    c.y2 = static_cast<int32>(c.dstHeight);
    placeBuffers(random, c);
    Bytes source(srcBytesOf(c));
    for (uint8& byte : source) byte = random.oneOf<uint8>({0, 1, 2, 127, 128, 253, 254, 255});
    Bytes expected(c.dstBase + extent(c.dstWidth, c.dstHeight, c.dstPitch, c.dstBpp));
    Bytes actual = expected;
    reference::scale(expected, source, c);
    ASSERT_TRUE(run(actual.data(), source.data(), c));
    ASSERT_TRUE(actual == expected) << "round " << round << ": " << describe(c);
  }
}

/// Sums of more than 257 bright columns overflow from one channel into the next.
TEST(Raster_Scale, LetsSumsOfManyColumnsWrap) {
  Random random(5);
  for (const double scale : {1.0 / 200, 1.0 / 300, 1.0 / 1000.5, 1.0 / 9000}) {
    for (const Formats& formats : {kFormats[0], kFormats[1]}) {
      ScaleCall c = withFormats(formats);
      c.srcWidth = 20000;
      c.srcHeight = 2;
      c.dstWidth = 120;
      c.dstHeight = 2;
      c.scaleX = scale;
      c.scaleY = 0.75;
      c.smooth = 1;
      c.x2 = 120;
      c.y2 = 2;
      placeBuffers(random, c);
      Bytes source(srcBytesOf(c), 0xFF);
      Bytes expected(c.dstBase + extent(c.dstWidth, c.dstHeight, c.dstPitch, c.dstBpp));
      Bytes actual = expected;
      reference::scale(expected, source, c);
      ASSERT_TRUE(run(actual.data(), source.data(), c));
      EXPECT_TRUE(actual == expected) << describe(c);
    }
  }
}

/// A picture of 4-byte pixels, packed.
struct Picture {
  uint32 width;
  uint32 height;
  std::vector<uint32> pixels;

  Picture(uint32 w, uint32 h, uint32 pixel = 0)
      : width(w), height(h), pixels(size_t{w} * h, pixel) {}
  uint32& at(uint32 x, uint32 y) { return pixels[size_t{y} * width + x]; }
  static Picture noise(uint32 w, uint32 h, uint64 seed) {
    Picture picture(w, h);
    Random random(seed);
    for (uint32& pixel : picture.pixels) pixel = random.word();
    return picture;
  }
};

bool scaleRect(Picture& to, int32 x1, int32 y1, int32 x2, int32 y2, const Picture& from,
               double scaleX, double scaleY, int32 smooth) {
  return Raster_Scale(to.pixels.data(), to.width * 4, 32, 24, to.width, to.height, 0, x1, y1, x2,
                      y2, from.pixels.data(), static_cast<int32>(from.width * 4), 32, 24, 0,
                      from.width, from.height, 0, scaleX, scaleY, smooth);
}
bool scaleAll(Picture& to, const Picture& from, double scaleX, double scaleY, int32 smooth) {
  return scaleRect(to, 0, 0, static_cast<int32>(to.width), static_cast<int32>(to.height), from,
                   scaleX, scaleY, smooth);
}

TEST(Raster_Scale, DrawsAPartAsItIsInTheWhole) {
  const Picture from = Picture::noise(50, 40, 6);
  Random random(7);
  for (const double scale : {3.0, 1.5, 1.0, 0.8, 0.5, 0.3, 0.25}) {
    for (const int32 smooth : {0, 1}) {
      Picture whole(static_cast<uint32>(50 * scale), static_cast<uint32>(40 * scale));
      ASSERT_TRUE(scaleAll(whole, from, scale, scale, smooth));
      for (int round = 0; round < tests::rounds(20); ++round) {
        const auto x1 = random.between(0, static_cast<int32>(whole.width) - 1);
        const auto y1 = random.between(0, static_cast<int32>(whole.height) - 1);
        Picture part = whole;
        const auto x2 = random.between(x1 + 1, static_cast<int32>(whole.width));
        const auto y2 = random.between(y1 + 1, static_cast<int32>(whole.height));
        for (int32 y = y1; y < y2; ++y) {
          for (int32 x = x1; x < x2; ++x)
            part.at(static_cast<uint32>(x), static_cast<uint32>(y)) = 0x12345678;
        }
        ASSERT_TRUE(scaleRect(part, x1, y1, x2, y2, from, scale, scale, smooth));
        ASSERT_EQ(part.pixels, whole.pixels) << scale << " smooth " << smooth;
      }
    }
  }
}

TEST(Raster_Scale, ReplicatesPixelsAtWholeFactorsWithoutSmoothing) {
  Picture from = Picture::noise(13, 9, 8);
  for (const uint32 factor : {1u, 2u, 4u, 8u, 64u}) {
    Picture to(13 * factor, 9 * factor);
    ASSERT_TRUE(scaleAll(to, from, factor, factor, 0));
    for (uint32 y = 0; y < to.height; ++y) {
      for (uint32 x = 0; x < to.width; ++x) ASSERT_EQ(to.at(x, y), from.at(x / factor, y / factor));
    }
  }
}

// Deliberate: the weights of a mix add up to 255.
TEST(Raster_Scale, DarkensAConstantPictureByTheMissing256thPerMix) {
  const auto darker = [](uint32 c) { return c * 255 / 256; };
  for (const uint32 c : {0u, 1u, 100u, 255u}) {
    const Picture from(10, 10, c * 0x01010101u);
    Picture to(30, 30);
    ASSERT_TRUE(scaleAll(to, from, 3, 3, 1));
    // Twice inside; once where the columns are copied.
    EXPECT_EQ(to.at(15, 15), darker(darker(c)) * 0x01010101u);
    EXPECT_EQ(to.at(0, 15), darker(c) * 0x01010101u);
    EXPECT_EQ(to.at(29, 15), darker(c) * 0x01010101u);
    EXPECT_EQ(to.at(0, 0), darker(c) * 0x01010101u);
  }
}

// Deliberate: a pixel that reaches past the right edge is divided by the whole step all the same.
TEST(Raster_Scale, DarkensTheRightEdgeWhenReducing) {
  const Picture from(8, 2, 0xFFFFFFFF);
  Picture to(5, 1);
  ASSERT_TRUE(scaleAll(to, from, 0.5, 0.5, 1));
  // Rows weigh 255/256; the last average has one of its two columns; then the last column itself.
  EXPECT_EQ(to.pixels,
            (std::vector<uint32>{0xFEFEFEFE, 0xFEFEFEFE, 0xFEFEFEFE, 0x7E7E7E7E, 0xFEFEFEFE}));
}

// Deliberate: whole columns weigh 256/256 in an average, whole rows 255/256.
TEST(Raster_Scale, WeighsWholeColumnsMoreThanWholeRows) {
  const Picture from(9, 9, 0x80808080);
  Picture columns(4, 9);
  ASSERT_TRUE(scaleAll(columns, from, 0.5, 1, 1));
  EXPECT_EQ(columns.at(1, 1), 0x80808080u);
  Picture rows(9, 4);
  ASSERT_TRUE(scaleAll(rows, from, 1, 0.5, 1));
  EXPECT_EQ(rows.at(1, 1), 0x7F7F7F7Fu);
}

TEST(Raster_Scale, AveragesAtMost32Rows) {
  Picture from(2, 64, 0);
  for (uint32 y = 0; y < 64; ++y) from.at(0, y) = from.at(1, y) = y < 32 ? 0x40404040 : 0xFFFFFFFF;
  Picture to(1, 1);
  ASSERT_TRUE(scaleAll(to, from, 1, 1.0 / 64, 1));
  EXPECT_EQ(to.at(0, 0), (0x3Fu * 32 / 64) * 0x01010101u);
}

// Deliberate: only a step other than one whole pixel mixes rows.
TEST(Raster_Scale, TakesRowsAsTheyAreAtAVerticalFactorOfOne) {
  Picture from = Picture::noise(8, 8, 9);
  Picture to(8, 8);
  ASSERT_TRUE(scaleAll(to, from, 1, 1, 1));
  EXPECT_EQ(to.pixels, from.pixels);
}

// Deliberate: 32-bit pixels onto 24-bit ones without mixing take every fourth pixel, then zeros,
// and leave the last pixel of a row alone.
TEST(Raster_Scale, StepsBySixteenBytesFrom32To24Bits) {
  for (const int32 smooth : {0, 1}) {
    const uint32 from[6] = {0xA0112233, 0xA1445566, 0xA2778899, 0xA3AABBCC, 0xA4DDEEFF, 0xA5010203};
    uint8 to[19];
    memset(to, 0x55, sizeof to);
    ASSERT_TRUE(Raster_Scale(to, 18, 24, 24, 6, 1, 0, 0, 0, 6, 1, from, 24, 32, 24, 0, 6, 1, 0, 1,
                             1, smooth));
    const uint8 expected[19] = {0x33, 0x22, 0x11, 0xFF, 0xEE, 0xDD, 0,    0,    0,   0,
                                0,    0,    0,    0,    0,    0x55, 0x55, 0x55, 0x55};
    EXPECT_EQ(0, memcmp(to, expected, sizeof to)) << "smooth " << smooth;
  }
}

TEST(Raster_Scale, SmoothsDepth24ForAnyNonZeroRequestAndDepth16Never) {
  const Picture from = Picture::noise(6, 6, 10);
  Picture nearest(12, 12);
  Picture smooth(12, 12);
  ASSERT_TRUE(scaleAll(nearest, from, 2, 2, 0));
  ASSERT_TRUE(scaleAll(smooth, from, 2, 2, 1));
  EXPECT_NE(nearest.pixels, smooth.pixels);
  for (const int32 request : {2, -1, std::numeric_limits<int32>::min()}) {
    Picture to(12, 12);
    ASSERT_TRUE(scaleAll(to, from, 2, 2, request));
    EXPECT_EQ(to.pixels, smooth.pixels);
  }
  const uint16 from16[2] = {0x1234, 0xFEDC};
  uint16 to16[4] = {};
  ASSERT_TRUE(
      Raster_Scale(to16, 8, 16, 16, 4, 1, 0, 0, 0, 4, 1, from16, 4, 16, 16, 0, 2, 1, 0, 2, 1, 1));
  EXPECT_EQ(0, memcmp(to16, "\x34\x12\x34\x12\xDC\xFE\xDC\xFE", 8));
}

TEST(Raster_Scale, RefusesFactorsUpToTheLimitAndWhatIsNoNumber) {
  const Picture from(2, 2, 1);
  constexpr double kLimit = 1.0 / 32767;
  const double nan = std::numeric_limits<double>::quiet_NaN();
  for (const double bad : {kLimit, 0.0, -1.0, nan, -std::numeric_limits<double>::infinity()}) {
    Picture to(2, 2, 7);
    EXPECT_FALSE(scaleAll(to, from, bad, 1, 0));
    EXPECT_FALSE(scaleAll(to, from, 1, bad, 0));
    EXPECT_EQ(to.pixels, Picture(2, 2, 7).pixels);
  }
  for (const int32 smooth : {0, 1}) {
    for (const double good : {std::nextafter(kLimit, 1.0), 1e300, HUGE_VAL}) {
      Picture to(2, 2);
      EXPECT_TRUE(scaleAll(to, from, good, good, smooth));
    }
  }
}

TEST(Raster_Scale, RefusesSizesOf32768) {
  const Picture from(32767, 1, 1);  // every row of the source, with a pitch of 0
  const auto call = [&](uint32 dstWidth, uint32 dstHeight, uint32 srcWidth, uint32 srcHeight) {
    uint32 to = 0;
    return Raster_Scale(&to, 4, 32, 24, dstWidth, dstHeight, 0, 0, 0, 1, 1, from.pixels.data(), 0,
                        32, 24, 0, srcWidth, srcHeight, 0, 1, 1, 0);
  };
  EXPECT_TRUE(call(32767, 32767, 32767, 32767));
  EXPECT_FALSE(call(32768, 1, 1, 1));
  EXPECT_FALSE(call(1, 32768, 1, 1));
  EXPECT_FALSE(call(1, 1, 32768, 1));
  EXPECT_FALSE(call(1, 1, 1, 32768));
}

TEST(Raster_Scale, DrawsNothingIntoAnEmptyRectangle) {
  GuardedBuffer nothing(0);
  const auto call = [&](int32 x1, int32 y1, int32 x2, int32 y2, uint32 srcWidth, uint32 srcHeight) {
    return Raster_Scale(nothing.data(), 16, 32, 24, 4, 4, 0, x1, y1, x2, y2, nothing.data(), 16, 32,
                        24, 0, srcWidth, srcHeight, 0, 1, 1, 1);
  };
  EXPECT_TRUE(call(2, 0, 2, 4, 4, 4));
  EXPECT_TRUE(call(0, 3, 4, 3, 4, 4));
  EXPECT_TRUE(call(3, 0, 1, 4, 4, 4));
  EXPECT_TRUE(call(0, 0, 4, 4, 0, 4));
  EXPECT_TRUE(call(0, 0, 4, 4, 4, 0));
}

TEST(Raster_Scale, RefusesRectanglesOutsideTheDestination) {
  const Picture from(4, 4, 1);
  Picture to(4, 4, 7);
  EXPECT_FALSE(scaleRect(to, -1, 0, 4, 4, from, 1, 1, 0));
  EXPECT_FALSE(scaleRect(to, 0, -1, 4, 4, from, 1, 1, 0));
  EXPECT_FALSE(scaleRect(to, 0, 0, 5, 4, from, 1, 1, 0));
  EXPECT_FALSE(scaleRect(to, 0, 0, 4, 5, from, 1, 1, 0));
  EXPECT_EQ(to.pixels, Picture(4, 4, 7).pixels);
}

/// What a piece of code logs in a process of its own.
std::string logInProcess(const std::function<void()>& body) {
  static int channel;
  int ends[2];
  if (pipe(ends) != 0) abort();
  const pid_t child = fork();
  if (child == 0) {
    channel = ends[1];
    Log_SetSink([](const char* text) {
      if (write(channel, text, strlen(text)) < 0) abort();
    });
    body();
    _exit(0);
  }
  close(ends[1]);
  std::string said;
  char buffer[256];
  for (ssize_t count = 0; (count = read(ends[0], buffer, sizeof buffer)) > 0;)
    said.append(buffer, static_cast<size_t>(count));
  close(ends[0]);
  int status = 0;
  waitpid(child, &status, 0);
  EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
  return said;
}

/// A call that is refused for its formats, or is to be.
void expectRefused(const Formats& f) {
  uint32 pixel = 7;
  const bool drawn = Raster_Scale(&pixel, 4, f.dstBpp, f.dstDepth, 1, 1, 0, 0, 0, 1, 1, &pixel, 4,
                                  f.srcBpp, f.srcDepth, 0, 1, 1, 0, 1, 1, 0);
  if (drawn || pixel != 7) abort();
}

TEST(Raster_Scale, LogsEachKindOfRefusalOncePerProcess) {
  const std::string said = logInProcess([] {
    for (int time = 0; time < 3; ++time) {
      expectRefused({24, 24, 32, 24});
      expectRefused({24, 32, 15, 16});
      expectRefused({24, 32, 8, 8});
      expectRefused({16, 16, 24, 32});
      expectRefused({15, 16, 15, 16});
      expectRefused({17, 24, 17, 24});
    }
  });
  EXPECT_EQ(said,
            "Raster_Scale: Dest color format (depth 32, BPP 24) is not supported.\n"
            "Raster_Scale: Color depth conversion from D24B32 to D15B16 is not supported.\n"
            "Raster_Scale: Dest depth 15 is not supported.\n");
}

TEST(Raster_Scale, LogsTheFirstRefusalThatApplies) {
  const auto said = [](const Formats& formats) {
    return logInProcess([&] { expectRefused(formats); });
  };
  // The format before the pair, the pair before the depth, and a strange bpp without a word.
  EXPECT_EQ(said({24, 32, 17, 16}),
            "Raster_Scale: Dest color format (depth 17, BPP 16) is not supported.\n");
  EXPECT_EQ(said({16, 16, 24, 32}),
            "Raster_Scale: Color depth conversion from D16B16 to D24B32 is not supported.\n");
  EXPECT_EQ(said({24, 24, 24, 32}),
            "Raster_Scale: Color depth conversion from D24B24 to D24B32 is not supported.\n");
  EXPECT_EQ(said({-1, 16, 15, 16}),
            "Raster_Scale: Color depth conversion from D-1B16 to D15B16 is not supported.\n");
  EXPECT_EQ(said({15, 16, 15, 16}), "Raster_Scale: Dest depth 15 is not supported.\n");
  EXPECT_EQ(said({15, 17, 15, 17}), "");
}

TEST(Raster_Scale, LogsNothingForOtherRefusals) {
  EXPECT_EQ(logInProcess([] {
              uint32 pixel = 0;
              Raster_Scale(&pixel, 4, 8, 24, 1, 1, 0, 0, 0, 2, 1, &pixel, 4, 8, 24, 0, 1, 1, 0, 1,
                           1, 0);
              Raster_Scale(&pixel, 4, 32, 24, 1, 1, 0, 0, 0, 1, 1, &pixel, 4, 32, 24, 0, 40000, 1,
                           0, 1, 1, 0);
              Raster_Scale(&pixel, 4, 32, 24, 1, 1, 0, 0, 0, 1, 1, &pixel, 4, 32, 24, 0, 1, 1, 0, 0,
                           1, 0);
            }),
            "");
}

TEST(Raster_Scale, CopiesWholePixelsOfMoreThanFourBytes) {
  const Bytes from = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10};
  GuardedBuffer to(20);
  ASSERT_TRUE(Raster_Scale(to.data(), 20, 40, 40, 4, 1, 0, 0, 0, 4, 1, from.data(), 10, 40, 40, 0,
                           2, 1, 0, 2, 1, 1));
  EXPECT_EQ(to.bytes(), (Bytes{1, 2, 3, 4, 5, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 6, 7, 8, 9, 10}));
}

TEST(Raster_ScaleInit, IsAlwaysTrueAndNeverNeeded) {
  EXPECT_TRUE(Raster_ScaleInit());
  Raster_ScaleExit();
  EXPECT_TRUE(Raster_ScaleInit());
}

Rect sourceOf(Rect rect, uint32 width, uint32 height, double x, double y) {
  EXPECT_EQ(Raster_ScaleSrcCoordinates(&rect, width, height, x, y), rect.bottom);
  return rect;
}
void expectRect(const Rect& actual, const Rect& expected) {
  EXPECT_TRUE(memcmp(&actual, &expected, sizeof actual) == 0)
      << actual.left << "," << actual.top << " " << actual.right << "," << actual.bottom;
}

TEST(Raster_ScaleSrcCoordinates, WidensByAPixelAndStaysWithinTheSource) {
  expectRect(sourceOf({10, 20, 30, 40}, 100, 100, 1, 1), {9, 19, 31, 41});
  expectRect(sourceOf({0, 0, 100, 100}, 100, 100, 1, 1), {0, 0, 100, 100});
}

TEST(Raster_ScaleSrcCoordinates, WidensByAStepWhenTheImageWasReduced) {
  expectRect(sourceOf({10, 20, 30, 40}, 100, 100, 2.5, 3), {22, 57, 78, 123});
}

TEST(Raster_ScaleSrcCoordinates, WidensByAPixelWhenTheImageWasEnlarged) {
  expectRect(sourceOf({10, 20, 31, 41}, 100, 100, 0.5, 0.25), {4, 4, 17, 12});
  // Truncated before the comparison: -0.5 is 0 already.
  expectRect(sourceOf({1, 0, 2, 3}, 100, 100, 0.5, 0.5), {0, 0, 2, 3});
}

TEST(Raster_ScaleSrcCoordinates, LimitsOnlyTheFarSides) {
  expectRect(sourceOf({500, 600, 700, 800}, 9, 7, 1.5, 1.5), {748, 898, 13, 10});
  expectRect(sourceOf({-50, -60, -40, -30}, 9, 7, 1, 1), {0, 0, -39, -29});
}

TEST(Raster_ScaleSrcCoordinates, SaturatesBeyondTheRange) {
  constexpr int32 kMax = std::numeric_limits<int32>::max();
  constexpr int32 kMin = std::numeric_limits<int32>::min();
  expectRect(sourceOf({kMax, kMin, kMax, kMin}, 0xFFFFFFFF, 1, 4, 4), {kMax, 0, kMax, kMin});
}

}  // namespace
