// SPDX-License-Identifier: MIT
//
// Changes of a region that need no sweep.
//
// A region has one form that a sweep gives back as it is, so a list in this form that describes the
// right region is the sweep's result. Most changes make such a list at once.

#ifndef RASTER_REGION_DRAFT_H
#define RASTER_REGION_DRAFT_H

#include "region/rectList.h"

namespace raster {

/// Adds a rectangle that keeps clear of the `used` others or makes one with each that it meets, and
/// tells the region's area. False, and nothing done, for any other.
bool addWhole(RectList* list, uint32 used, RectListEntry rect, uint32& area);

/// Cuts a hole out of each of the `used` rectangles by itself, and tells the region's area. False,
/// and nothing done, where the parts do not stay as they are.
bool cutEach(RectList* list, uint32 used, const RectListEntry& hole, uint32& area);

}  // namespace raster

#endif
