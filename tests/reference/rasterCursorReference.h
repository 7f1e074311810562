// SPDX-License-Identifier: MIT
//
// Cursors pixel by pixel: expansion of planes, clipping by trying every pixel, and drawing.

#ifndef TESTS_RASTER_CURSOR_REFERENCE_H
#define TESTS_RASTER_CURSOR_REFERENCE_H

#include <vector>

#include "raster.h"

namespace reference {

using Bytes = std::vector<uint8>;

/// The bytes of a plane in 64-bit arithmetic; 0xFFFFFFFF where a step exceeds 32 bits.
uint32 cursorSize(uint64 width, uint64 height, uint64 bitsPerPixel);

/// A bit plane as pixels; bytes between rows stay as they are in `dst`.
void expandBitPlane(Bytes& dst, size_t at, const Bytes& bits, uint32 width, uint32 height,
                    uint32 bitsPerPixel);

/// The box of a cursor at (x, y), found by asking for each of its pixels whether it is visible.
bool cursorBox(const RasterFrameBufferDesc& fb, const RasterCursor& cursor, int32 x, int32 y,
               RasterCursorBox* box);

/// Draws a mask cursor into the pixels of `fb` that the box names, which start at (x, y).
void drawMaskCursor(Bytes& fb, size_t pitch, uint32 bytes, size_t x, size_t y, const Bytes& andMask,
                    const Bytes& xorMask, uint32 cursorWidth, const RasterCursorBox& box);

}  // namespace reference

#endif
