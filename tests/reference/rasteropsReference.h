// SPDX-License-Identifier: MIT
//
// The naive model of fill and copy: one pixel, one byte at a time. It shares nothing with the
// library.

#ifndef TESTS_RASTEROPS_REFERENCE_H
#define TESTS_RASTEROPS_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

/// Pictures are byte vectors; a position is a byte index into one.
using Bytes = std::vector<uint8>;

void rectFill(Bytes& fb, size_t base, uint32 pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x,
              uint32 y, uint32 width, uint32 height);

/// Both rectangles lie in `memory`, at the bases `dst` and `src`.
void rectCopy(Bytes& memory, size_t dst, uint32 dstPitch, size_t src, uint32 srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height);

void rectFillAlpha(Bytes& fb, size_t base, uint32 pitch, uint8 alpha, uint32 x, uint32 y,
                   uint32 width, uint32 height);

}  // namespace reference

#endif
