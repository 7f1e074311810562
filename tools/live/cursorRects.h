// SPDX-License-Identifier: MIT
//
// The cursor as rectangles of an update, for viewers that draw it themselves.

#ifndef RASTER_TOOLS_LIVE_CURSOR_RECTS_H
#define RASTER_TOOLS_LIVE_CURSOR_RECTS_H

#include "bytes.h"
#include "liveCursor.h"
#include "viewerFormat.h"

namespace tool::live {

/// In the viewer's format, with a mask: pixels that are at least half opaque are there, in their
/// own colour, and the others are not.
void putCursor(const LiveCursor& cursor, const ViewerFormat& format, Bytes& out);

/// With alpha, whatever the viewer's format.
void putCursorWithAlpha(const LiveCursor& cursor, Bytes& out);

}  // namespace tool::live

#endif
