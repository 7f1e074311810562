// SPDX-License-Identifier: MIT
//
// Where a cursor's pixels are.

#ifndef TESTS_CURSOR_PLANES_H
#define TESTS_CURSOR_PLANES_H

#include "raster.h"

namespace tests {

/// Two planes of a format for a mask cursor; otherwise the first one, as pixels with alpha.
inline void setPlanes(RasterCursor& cursor, uint32 depth, uint32 bpp, uint8* first, uint8* second) {
  if (cursor.type == RASTER_CURSOR_MASK) {
    cursor.depth = depth;
    cursor.bpp = bpp;
    cursor.andMask = first;
    cursor.xorMask = second;
  } else {
    cursor.pixels = first;
  }
}

}  // namespace tests

#endif
