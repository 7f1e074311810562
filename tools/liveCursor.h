// SPDX-License-Identifier: MIT
//
// A cursor as an X display tells it.

#ifndef RASTER_TOOLS_LIVE_CURSOR_H
#define RASTER_TOOLS_LIVE_CURSOR_H

#include <vector>

#include "rect.h"

namespace tool {

/// Premultiplied pixels of 32 bits.
struct LiveCursor {
  Point hotSpotOnScreen;
  Point hotSpot;
  uint32 width;
  uint32 height;
  std::vector<uint32> pixels;
};

}  // namespace tool

#endif
