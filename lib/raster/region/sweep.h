// SPDX-License-Identifier: MIT
//
// Regions rebuilt by a scanline sweep.
//
// The sweep goes from edge to edge: an edge is a y where a rectangle begins or ends. Between two
// edges the region is a set of spans, and a rectangle of the result grows downwards as long as the
// same span stays. All tables are arrays on the stack.

#ifndef RASTER_REGION_SWEEP_H
#define RASTER_REGION_SWEEP_H

#include "region/rectList.h"

namespace raster {

/// Stores a rectangle behind the `used` others, rebuilds the list and tells the region's area.
/// False, and only stored, when the result takes too many rectangles.
bool sweepWith(RectList* list, uint32 used, const RectListEntry& added, uint32& area);

/// Rebuilds the list without a hole; returns the region's area. Panics when the result takes too
/// many rectangles.
uint32 sweepWithout(RectList* list, uint32 used, const RectListEntry& hole);

}  // namespace raster

#endif
