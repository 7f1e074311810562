// SPDX-License-Identifier: MIT
//
// Fill and copy for the other modules of the library: as the exported functions, but with signed
// pitches and without the way through the dynamic linker.

#ifndef RASTER_RASTEROPS_INTERNAL_H
#define RASTER_RASTEROPS_INTERNAL_H

#include "frameBuffer.h"

namespace raster {

/// Rows to be filled: the first one, the signed step to the next one, their length and number.
struct FillRows {
  uint8* row;
  intptr_t step;
  size_t bytes;
  uint32 height;
  PixelWords pixels;
};

/// Rows to be copied.
struct CopyRows {
  uint8* dst;
  intptr_t dstStep;
  const uint8* src;
  intptr_t srcStep;
  size_t bytes;
  uint32 height;
};

/// What the kernels of one instruction-set level offer.
struct RasteropsKernels {
  void (*fillRows)(const FillRows& job);
  void (*copyRows)(const CopyRows& job);
  void (*fillAlphaRows)(uint8* row, intptr_t step, size_t pixels, uint32 height, uint32 alphaBits);
};

/// Copies rows from the first one to the last one, each as memmove does.
void copyRows(const CopyRows& rows);

/// As Raster_RectFill.
void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height);

/// As Raster_RectCopy.
void rectCopy(uint8* dst, intptr_t dstPitch, const uint8* src, intptr_t srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height);

}  // namespace raster

#endif
