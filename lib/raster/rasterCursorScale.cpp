// SPDX-License-Identifier: MIT
//
// Scaled cursors. A cursor is placed in a larger buffer first, with a margin on every side, so that
// smoothing has room to spread past its edges.

#include <emmintrin.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>

#include "raster.h"
#include "ops/rasteropsInternal.h"
#include "rect.h"
#include "utilAlloc.h"

namespace raster {
namespace {

constexpr uint32 kBytesPerPixel = 4;
constexpr uint32 kDepth = 24;
constexpr uint32 kBpp = 32;

// How planes are scaled, and what lies around the cursor.
constexpr int32 kNearest = 0;
constexpr int32 kSmoothed = 2;
constexpr uint8 kTransparent = 0;
constexpr uint8 kKeepScreen = 0xFF;
constexpr uint8 kInvertNothing = 0;

/// A number toward zero; one that does not fit, or is none, gives the smallest integer.
int32 truncatedOrLowest(double value) { return _mm_cvttsd_si32(_mm_set_sd(value)); }

/// A length in pixels, modulo 2^32.
uint32 wholePixels(double length) {
  if (std::fabs(length) < 9223372036854775808.0)
    return static_cast<uint32>(static_cast<uint64>(static_cast<int64>(length)));
  return 0;
}

/// How far smoothing reaches at a scale, in pixels of the cursor.
uint32 marginOf(double scale) {
  return static_cast<uint32>(std::max(truncatedOrLowest(1 / scale), truncatedOrLowest(scale))) + 1;
}

int32 scaledHotSpot(int32 hot, double scale) {
  return truncatedOrLowest(static_cast<double>(int64{hot} + static_cast<int32>(marginOf(scale))) *
                           scale);
}

/// The sizes and factors of a scaled cursor.
struct Scaling {
  double scaleX, scaleY;
  uint32 paddedWidth, paddedHeight;
  uint32 scaledWidth, scaledHeight;
};

/// The bytes of the padded plane. A number that does not fit becomes one that no memory has.
size_t paddedBytes(const Scaling& to) {
  size_t bytes = 0;
  return __builtin_mul_overflow(uint64{kBytesPerPixel} * to.paddedWidth, to.paddedHeight, &bytes)
             ? SIZE_MAX
             : bytes;
}

/// Whether a cursor and its margins fit the padded plane, as they do in the sizes that
/// Raster_GetScaledCursorSize gives for numbers.
bool fitsPadded(uint32 width, uint32 height, const Scaling& to) {
  return uint64{marginOf(to.scaleX)} + width <= to.paddedWidth &&
         uint64{marginOf(to.scaleY)} + height <= to.paddedHeight;
}

/// Scales one plane of `width` x `height` 4-byte pixels, surrounded by bytes of `fill`.
void RasterScaleCursorPlane(uint8* dst, const uint8* plane, uint32 width, uint32 height,
                            const Scaling& to, uint8 fill, int32 smooth) {
  const uint32 pitch = kBytesPerPixel * to.paddedWidth;
  const size_t bytes = paddedBytes(to);
  auto* padded = static_cast<uint8*>(UtilSafeMalloc0(bytes));
  memset(padded, fill, bytes);
  if (fitsPadded(width, height, to))
    rectCopy({padded, pitchOf(pitch), marginOf(to.scaleX), marginOf(to.scaleY)},
             {plane, pitchOf(kBytesPerPixel * width), 0, 0}, kBytesPerPixel, width, height);
  Rect all;
  Rect_SetFromXYWH(&all, 0, 0, static_cast<int32>(to.scaledWidth),
                   static_cast<int32>(to.scaledHeight));
  Raster_Scale(dst, kBytesPerPixel * to.scaledWidth, kBpp, kDepth, to.scaledWidth, to.scaledHeight,
               0, all.left, all.top, all.right, all.bottom, padded, static_cast<int32>(pitch), kBpp,
               kDepth, 0, to.paddedWidth, to.paddedHeight, 0, to.scaleX, to.scaleY, smooth);
  free(padded);
}

}  // namespace
}  // namespace raster

extern "C" {

uint32 Raster_GetScaledCursorSize(uint32* paddedWidth, uint32* paddedHeight, uint32* scaledWidth,
                                  uint32* scaledHeight, int32* scaledHot, uint32 width,
                                  uint32 height, double scaleX, double scaleY, int32 hotX,
                                  int32 hotY) {
  *paddedWidth = width + 2 * raster::marginOf(scaleX);
  *paddedHeight = height + 2 * raster::marginOf(scaleY);
  *scaledWidth = raster::wholePixels(std::ceil(*paddedWidth * scaleX));
  *scaledHeight = raster::wholePixels(std::ceil(*paddedHeight * scaleY));
  scaledHot[0] = raster::scaledHotSpot(hotX, scaleX);
  scaledHot[1] = raster::scaledHotSpot(hotY, scaleY);
  return *scaledWidth * raster::kBytesPerPixel * *scaledHeight;
}

void Raster_ScaleAlphaCursor(uint8* dst, const RasterCursor* cursor, double scaleX, double scaleY,
                             uint32 paddedWidth, uint32 paddedHeight, uint32 scaledWidth,
                             uint32 scaledHeight) {
  const raster::Scaling to = {scaleX, scaleY, paddedWidth, paddedHeight, scaledWidth, scaledHeight};
  raster::RasterScaleCursorPlane(dst, cursor->pixels, cursor->width, cursor->height, to,
                                 raster::kTransparent, raster::kSmoothed);
}

void Raster_ScaleColorCursor(uint8* andDst, uint8* xorDst, const RasterCursor* cursor,
                             double scaleX, double scaleY, uint32 paddedWidth, uint32 paddedHeight,
                             uint32 scaledWidth, uint32 scaledHeight) {
  const raster::Scaling to = {scaleX, scaleY, paddedWidth, paddedHeight, scaledWidth, scaledHeight};
  raster::RasterScaleCursorPlane(andDst, cursor->andMask, cursor->width, cursor->height, to,
                                 raster::kKeepScreen, raster::kNearest);
  raster::RasterScaleCursorPlane(xorDst, cursor->xorMask, cursor->width, cursor->height, to,
                                 raster::kInvertNothing, raster::kNearest);
}

}  // extern "C"
