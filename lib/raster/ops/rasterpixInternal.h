// SPDX-License-Identifier: MIT
//
// What the tiling kernels of the instruction-set levels and their caller share.

#ifndef RASTER_RASTERPIX_INTERNAL_H
#define RASTER_RASTERPIX_INTERNAL_H

#include "frame/frameBuffer.h"

namespace raster {

/// Destination rows, and the pixmap rows that repeat in them: the row `srcY` of `srcRows` falls on
/// the first destination row, and the byte `phase` of `period` on its first byte.
struct TileRows {
  uint8* dst;
  intptr_t dstStep;
  size_t bytes;
  uint32 height;
  const uint8* src;
  intptr_t srcStep;
  uint32 srcRows;
  uint32 srcY;
  size_t period;
  size_t phase;
};

/// What the kernels of one instruction-set level offer.
struct TileKernels {
  /// By operation, null for those that do not read the source. The order of the pixels must not
  /// matter.
  using Tile = void (*)(const TileRows& rows);
  /// For any pixmap, straight from its rows.
  const Tile* tile;
  /// For pixmap rows of less than 1024 bytes, which are first repeated in a buffer.
  const Tile* tileWidened;
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const TileKernels* lookUpTile();

}  // namespace raster

#endif
