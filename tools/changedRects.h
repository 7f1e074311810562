// SPDX-License-Identifier: MIT
//
// Where two pictures of one size differ, as a short list of rectangles.

#ifndef RASTER_TOOLS_CHANGED_RECTS_H
#define RASTER_TOOLS_CHANGED_RECTS_H

#include <vector>

#include "picture.h"
#include "rect.h"

namespace tool {

/// Compares tiles of `tileSize` pixels and collects those that differ in a rect list. The
/// rectangles are disjoint and hold every difference; they are few, so they may hold equal pixels
/// as well.
std::vector<Rect> changedRects(const Picture& before, const Picture& after, uint32 tileSize);

/// The smallest rectangle with all differences that lie within the given ones; empty without any.
Rect boundingRect(const Picture& before, const Picture& after, const std::vector<Rect>& rects);

}  // namespace tool

#endif
