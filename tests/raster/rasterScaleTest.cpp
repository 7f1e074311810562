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

namespace {

using reference::ScaleAnswer;
using reference::ScaleCall;
using tests::Guard;
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
  const auto guard = [&] { return random.oneOf({Guard::kBefore, Guard::kAfter}); };
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

void checkRandomCalls(uint64 seed, int rounds, int32 smooth) {
  Random random(seed);
  for (int round = 0; round < rounds; ++round) {
    ScaleCall c = withFormats(kFormats[random.below(std::size(kFormats))]);
    c.dstWidth = someSize(random, 700);
    c.dstHeight = someSize(random, 50);
    c.srcWidth = someSize(random, 700);
    c.srcHeight = someSize(random, 50);
    c.scaleX = someScale(random);
    c.scaleY = someScale(random);
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

}  // namespace
