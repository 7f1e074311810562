// SPDX-License-Identifier: MIT
//
// The naive model of format conversion: one pixel at a time, every step as it is described. It
// shares nothing with the library.

#ifndef TESTS_RASTER_CONV_REFERENCE_H
#define TESTS_RASTER_CONV_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

/// Pictures are byte vectors; a position is a byte index into one.
using Bytes = std::vector<uint8>;

/// Where one side of a conversion lies in its picture.
struct Spot {
  size_t base;
  uint32 pitch;
  uint32 x, y;
};

uint32 convertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth, bool pseudoColor,
                       const std::vector<uint32>& palette);

/// The codes must be right.
void convertPixels(Bytes& dst, const Spot& to, int32 dstDepth, const Bytes& src, const Spot& from,
                   int32 srcDepth, bool pseudoColor, const std::vector<uint32>& palette,
                   uint32 width, uint32 height);

void copyPixels(Bytes& dst, const Spot& to, const Bytes& src, const Spot& from, int32 depth,
                uint32 width, uint32 height);

}  // namespace reference

#endif
