// SPDX-License-Identifier: MIT
//
// The naive model of the raster operations: one pixel after the other, each read from and stored to
// one memory, so that overlaps of any kind come out as the order of the pixels makes them.

#ifndef TESTS_RASTEROPS_ROP_REFERENCE_H
#define TESTS_RASTEROPS_ROP_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

/// Pictures are byte vectors; a position is a byte index into one.
using Bytes = std::vector<uint8>;

/// The result of operation `rop` (0 to 15) on source and destination bits.
uint32 combine(uint32 rop, uint32 s, uint32 d);

/// Combines one pixel: words of 1, 2 and 4 bytes; three single bytes, the last one first if
/// `fallingBytes`.
void combinePixel(Bytes& memory, int64 dst, int64 src, uint32 bytesPerPixel, uint32 rop,
                  bool fallingBytes);

/// The distance between two rows: words of 2 and 4 bytes step by whole words.
int64 rowStep(int64 pitch, uint32 bytesPerPixel);

void rectRopFill(Bytes& memory, int64 fb, int32 pitch, uint32 bytesPerPixel, uint32 pixel,
                 uint32 rop, uint32 x, uint32 y, uint32 width, uint32 height);

/// Both rectangles lie in `memory`, at the bases `dst` and `src`.
void rectRopCopy(Bytes& memory, int64 dst, int32 dstPitch, int64 src, int32 srcPitch,
                 uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                 uint32 dstY, uint32 width, uint32 height);

}  // namespace reference

#endif
