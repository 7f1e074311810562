// SPDX-License-Identifier: MIT
//
// The naive model of bit-plane expansion: pixels one after the other, after a look at the plane for
// every four of them.

#ifndef TESTS_RASTER_BITS_REFERENCE_H
#define TESTS_RASTER_BITS_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

/// Pictures are byte vectors; a position is a byte index into one.
using Bytes = std::vector<uint8>;

/// The plane at `bits` and the pixels at `dst` lie in one memory. A stencil writes the foreground
/// only.
void bitsToPixels(Bytes& memory, int64 bits, uint32 bitsPitch, int64 dst, uint32 dstPitch,
                  uint32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                  uint32 background, bool stencil);

}  // namespace reference

#endif
