// SPDX-License-Identifier: MIT
//
// The cursor drawn into the picture, for viewers that do not draw it themselves.

#ifndef RASTER_TOOLS_LIVE_DRAWN_CURSOR_H
#define RASTER_TOOLS_LIVE_DRAWN_CURSOR_H

#include <vector>

#include "liveCursor.h"
#include "raster.h"

namespace tool::live {

/// The visible part of a cursor whose hot spot is at `at`; empty when nothing is.
Rect cursorBox(const LiveCursor& cursor, const Point& at, uint32 width, uint32 height);

/// While it lives the cursor is in the picture; then the pixels under it come back.
class DrawnCursor {
 public:
  /// A picture of 32-bit pixels.
  DrawnCursor(uint8* pixels, uint32 pitch, uint32 width, uint32 height, const LiveCursor& cursor,
              const Point& at);
  ~DrawnCursor();
  DrawnCursor(const DrawnCursor&) = delete;
  DrawnCursor& operator=(const DrawnCursor&) = delete;

 private:
  void swap();

  uint8* picture;
  uint32 picturePitch;
  RasterCursorBox box = {};
  std::vector<uint8> other;  // the box, with the cursor while the picture is without
};

}  // namespace tool::live

#endif
