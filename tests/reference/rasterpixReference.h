// SPDX-License-Identifier: MIT
//
// The naive model of tiling: block after block, one pixel after the other, on one memory.

#ifndef TESTS_RASTERPIX_REFERENCE_H
#define TESTS_RASTERPIX_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

/// Pictures are byte vectors; a position is a byte index into one.
using Bytes = std::vector<uint8>;

/// A worker: a block of the pixmap at `src` into `dst`, without wrapping.
void pixmapBlock(Bytes& memory, int64 dst, uint32 dstPitch, int64 src, uint32 srcPitch,
                 uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                 uint32 dstY, uint32 width, uint32 height);

/// The tiling of a rectangle.
void rectPixmapRopCopy(Bytes& memory, int64 dst, uint32 dstPitch, int64 pixmap, uint32 pixmapPitch,
                       uint32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                       uint32 pixmapHeight, uint32 rop, uint32 dstX, uint32 dstY, uint32 width,
                       uint32 height);

}  // namespace reference

#endif
