// SPDX-License-Identifier: MIT
//
// Bit planes for the other modules of the library, and what the kernels of the instruction-set
// levels and their caller share.

#ifndef RASTER_RASTER_BITS_INTERNAL_H
#define RASTER_RASTER_BITS_INTERNAL_H

#include "frame/frameBuffer.h"

namespace raster {

/// A bit plane, where its pixels go, and their number.
struct Expansion {
  const uint8* bits;
  intptr_t bitsPitch;
  uint8* dst;
  intptr_t dstPitch;
  size_t width;
  uint32 height;
};

/// What becomes of set and of clear bits; a stencil has no use for the background.
struct BitColors {
  uint32 foreground;
  uint32 background;
};

/// What the kernels of one instruction-set level offer, by pixel size from 1 byte up. The plane
/// must not lie among the pixels.
struct BitsKernels {
  using Expand = void (*)(const Expansion& e, const BitColors& colors);
  Expand twoColors[4];
  Expand stencil[4];
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const BitsKernels* lookUpBits();

/// As Raster_BitsToPixels.
void bitsToPixels(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                  int32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                  uint32 background);

}  // namespace raster

#endif
