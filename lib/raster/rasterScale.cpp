// SPDX-License-Identifier: MIT
//
// Scaling of rectangles: the checks of a call and its steps in 16.16 fixed point. The pixels are
// made in rasterScaleCore.cpp.

#include <atomic>
#include <cmath>
#include <limits>

#include "host/firstTime.h"
#include "vector/kernelChoice.h"
#include "message.h"
#include "raster.h"
#include "scale/rasterScaleInternal.h"

namespace raster {
namespace {

constexpr char kFunction[] = "Raster_Scale";

constexpr uint32 kSizeEnd = 32768;
constexpr double kScaleLimit = 1.0 / 32767;

struct DepthAndBpp {
  uint32 depth;
  uint32 bpp;
  bool operator==(const DepthAndBpp&) const = default;
};

/// Source and destination formats that the scaler can pair: equal ones, and 24-bit colour in 32
/// bits onto depths 24 and 16. Everything else is refused, with one message per kind and process.
bool formatsFit(DepthAndBpp dst, DepthAndBpp src) {
  static constinit std::atomic<bool> saidFormat{false};
  static constinit std::atomic<bool> saidConversion{false};
  static constinit std::atomic<bool> saidDepth{false};
  if (dst.bpp < dst.depth) {
    if (firstTime(saidFormat)) {
      Log("%s: Dest color format (depth %d, BPP %d) is not supported.\n", kFunction, dst.depth,
          dst.bpp);
    }
    return false;
  }
  const bool pairs = src == DepthAndBpp{24, 32} ? dst.depth == 24 || dst.depth == 16 : src == dst;
  if (!pairs) {
    if (firstTime(saidConversion)) {
      Log("%s: Color depth conversion from D%dB%d to D%dB%d is not supported.\n", kFunction,
          src.depth, src.bpp, dst.depth, dst.bpp);
    }
    return false;
  }
  if (dst.bpp % 8 != 0) return false;
  // Deliberate: 15-bit colour is no multiple of 8 either, so it is refused here.
  if (dst.depth % 8 != 0) {
    if (firstTime(saidDepth)) Log("Raster_Scale: Dest depth %d is not supported.\n", dst.depth);
    return false;
  }
  return true;
}

/// The source step for a factor above kScaleLimit; it fits 31 bits.
uint32 stepOf(double scale) { return static_cast<uint32>(65536.0 / scale); }

/// The integer part, at the nearest end of the range when it is beyond, 0 for no number.
int32 truncatedWithin32Bits(double value) {
  constexpr double kLow = std::numeric_limits<int32>::min();
  constexpr double kHigh = std::numeric_limits<int32>::max();
  if (value >= kHigh) return std::numeric_limits<int32>::max();
  if (value <= kLow) return std::numeric_limits<int32>::min();
  return value == value ? static_cast<int32>(value) : 0;
}

/// One side of an interval, before and after scaling.
struct Interval {
  int32 from;
  int32 to;
};
Interval sourceInterval(Interval scaled, uint32 size, double invScale) {
  const double margin = invScale > 1.0 ? invScale : 1.0;
  const int32 from = truncatedWithin32Bits(scaled.from * invScale - margin);
  const int32 to = truncatedWithin32Bits(std::ceil(invScale * scaled.to + margin));
  const int32 extent = truncatedWithin32Bits(size * invScale);
  return {from < 0 ? 0 : from, to < extent ? to : extent};
}

}  // namespace
}  // namespace raster

extern "C" {

bool Raster_ScaleInit(void) { return true; }

void Raster_ScaleExit(void) {}

bool Raster_Scale(void* dstBits, uint32 dstPitch, uint32 dstBpp, uint32 dstDepth, uint32 dstWidth,
                  uint32 dstHeight, uint32 /*dstIgnored*/, int32 x1, int32 y1, int32 x2, int32 y2,
                  const void* srcBits, int32 srcPitch, uint32 srcBpp, int32 srcDepth,
                  uint32 /*srcIgnored*/, uint32 srcWidth, uint32 srcHeight, uint32 /*ignored*/,
                  double scaleX, double scaleY, int32 smooth) {
  using raster::kScaleLimit;
  using raster::kSizeEnd;
  if (x1 < 0 || y1 < 0 || int64{dstWidth} < x2 || int64{dstHeight} < y2) return false;
  const raster::DepthAndBpp dst = {dstDepth, dstBpp};
  const raster::DepthAndBpp src = {static_cast<uint32>(srcDepth), srcBpp};
  if (!raster::formatsFit(dst, src)) return false;
  if (srcHeight >= kSizeEnd || srcWidth >= kSizeEnd || dstHeight >= kSizeEnd ||
      dstWidth >= kSizeEnd)
    return false;
  if (!(scaleX > kScaleLimit) || !(scaleY > kScaleLimit)) return false;
  if (x1 >= x2 || y1 >= y2 || srcWidth == 0 || srcHeight == 0) return true;

  raster::ScaleJob job{};
  job.dstPitch = raster::pitchOf(dstPitch);
  job.dstBytesPerPixel = dstBpp / 8;
  job.dst = raster::rowAt(static_cast<uint8*>(dstBits), job.dstPitch, static_cast<uint32>(y1),
                          static_cast<uint32>(x1), job.dstBytesPerPixel);
  job.width = static_cast<uint32>(x2 - x1);
  job.height = static_cast<uint32>(y2 - y1);
  job.src = static_cast<const uint8*>(srcBits);
  job.srcPitch = raster::pitchOf(srcPitch);
  job.srcBytesPerPixel = srcBpp / 8;
  job.srcWidth = srcWidth;
  job.srcHeight = srcHeight;
  job.stepX = raster::stepOf(scaleX);
  job.stepY = raster::stepOf(scaleY);
  job.startX = job.stepX * static_cast<uint32>(x1);
  job.startY = job.stepY * static_cast<uint32>(y1);
  job.smooth = dstDepth > 23 && smooth != 0 && job.dstBytesPerPixel <= 4;
  job.depthsDiffer = src.depth != dst.depth;
  job.sizesDiffer = srcBpp != dstBpp;
  raster::chosenKernels<raster::lookUpScale>().draw(job);
  return true;
}

int32 Raster_ScaleSrcCoordinates(Rect* rect, uint32 width, uint32 height, double invScaleX,
                                 double invScaleY) {
  const raster::Interval x = raster::sourceInterval({rect->left, rect->right}, width, invScaleX);
  const raster::Interval y = raster::sourceInterval({rect->top, rect->bottom}, height, invScaleY);
  *rect = {x.from, y.from, x.to, y.to};
  return rect->bottom;
}

}  // extern "C"
