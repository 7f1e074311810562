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

/// Compares the damaged parts of `now` with `seen` tile by tile, copies tiles that differ into
/// `seen`, whose pixels these are, and adds them to `changed`. All of one size. The top byte of a
/// pixel does not count.
TileCount takeChanges(const PixelView& now, uint8* seen, uint32 seenPitch, const ChangeList& damage,
                      ChangeList& changed);

}  // namespace tool::live

#endif
