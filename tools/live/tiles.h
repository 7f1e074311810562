// SPDX-License-Identifier: MIT
//
// What of the damaged parts of a screen is really different from what was seen before.

#ifndef RASTER_TOOLS_LIVE_TILES_H
#define RASTER_TOOLS_LIVE_TILES_H

#include "changeList.h"
#include "pixelView.h"

namespace tool::live {

struct TileCount {
  uint64 compared = 0;
  uint64 equal = 0;
};

/// Compares the damaged parts of `now` with `seen` tile by tile, and adds those that differ to
/// `runs`: disjoint, as wide as tiles side by side. All of one size. The top byte of a pixel does
/// not count.
TileCount findChanges(const PixelView& now, const PixelView& seen, const ChangeList& damage,
                      std::vector<Rect>& runs);

/// Copies rectangles of `now` into `seen`.
void takeOver(const PixelView& now, uint8* seen, uint32 seenPitch, const std::vector<Rect>& runs);

}  // namespace tool::live

#endif
