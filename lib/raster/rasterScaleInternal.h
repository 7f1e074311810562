// SPDX-License-Identifier: MIT
//
// The scaler behind Raster_Scale: what one call asks for once its arguments are checked.

#ifndef RASTER_RASTER_SCALE_INTERNAL_H
#define RASTER_RASTER_SCALE_INTERNAL_H

#include "frameBuffer.h"

namespace raster {

/// One source pixel in 16.16 fixed point, the unit of steps and positions.
inline constexpr uint32 kOnePixel = 0x10000;

/// One scaling call. The destination rectangle is not empty and neither is the source; sizes of the
/// source are below 32768.
struct ScaleJob {
  uint8* dst;  ///< the rectangle's first pixel
  intptr_t dstPitch;
  uint32 dstBytesPerPixel;
  uint32 width;  ///< of the destination rectangle
  uint32 height;
  const uint8* src;
  intptr_t srcPitch;
  uint32 srcBytesPerPixel;
  uint32 srcWidth;
  uint32 srcHeight;
  uint32 stepX;  ///< source pixels per destination pixel, 16.16
  uint32 stepY;
  uint32 startX;  ///< source position of the rectangle's first pixel, 16.16, wrapped to 32 bits
  uint32 startY;
  bool smooth;
  bool depthsDiffer;
  bool sizesDiffer;

  bool converts() const { return depthsDiffer || sizesDiffer; }
  uint32 xLimit() const { return (srcWidth - 1) * kOnePixel; }
};

/// Draws the job's rectangle.
void scaleCore(const ScaleJob& job);

}  // namespace raster

#endif
