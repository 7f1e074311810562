// SPDX-License-Identifier: MIT
//
// Fill and copy for the other modules of the library: as the exported functions, but with signed
// pitches and without the way through the dynamic linker.

#ifndef RASTER_RASTEROPS_INTERNAL_H
#define RASTER_RASTEROPS_INTERNAL_H

#include "frame/frameBuffer.h"

namespace raster {

/// What the kernels of one instruction-set level offer.
struct RasteropsKernels {
  void (*fillRows)(const Rows& rows, const PixelWords& pixels);
  void (*copyRows)(const RowPair& rows);
  void (*fillAlphaRows)(const Rows& rows, uint32 alphaBits);
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const RasteropsKernels* lookUpRasterops();

/// Copies rows from the first one to the last one, each as memmove does.
void copyRows(const RowPair& rows);

/// As Raster_RectFill.
void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height);

/// Copies rows, given from the top one down, as Raster_RectCopy does: from the last one up where
/// bottomUp is set.
void copyInOrder(const RowPair& rows, bool bottomUp);

/// As Raster_RectCopy.
inline void rectCopy(const Corner<uint8>& dst, const Corner<const uint8>& src, uint32 bytesPerPixel,
                     uint32 width, uint32 height) {
  if (height == 0) return;
  copyInOrder({.dst = dst.pixel(bytesPerPixel),
               .dstStep = dst.pitch,
               .src = src.pixel(bytesPerPixel),
               .srcStep = src.pitch,
               .bytes = size_t{width} * bytesPerPixel,
               .rows = height},
              dst.y > src.y);
}

}  // namespace raster

#endif
