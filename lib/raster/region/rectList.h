// SPDX-License-Identifier: MIT
//
// What a rect list is made of. Sums wrap around, as the caller's do.

#ifndef RASTER_REGION_RECT_LIST_H
#define RASTER_REGION_RECT_LIST_H

#include "raster.h"
#include "rectArithmetic.h"

namespace raster {

inline constexpr char kRectListSource[] = "lib/raster/rasterRect";

inline constexpr uint32 kListSize = RASTER_RECT_LIST_SIZE;
/// Deliberate: a sweep leaves one entry of the list unused, so its result always ends by itself.
inline constexpr uint32 kMaxResult = kListSize - 1;

inline int32 rightOf(const RectListEntry& r) { return addWrap(r.x, r.width); }
inline int32 bottomOf(const RectListEntry& r) { return addWrap(r.y, r.height); }
inline uint32 areaOf(const RectListEntry& r) {
  return static_cast<uint32>(r.width) * static_cast<uint32>(r.height);
}

/// Whether the list ends before entry `i`. Only the width counts.
inline bool endsAt(const RectList& list, uint32 i) {
  return i == kListSize || list.rects[i].width <= 0;
}

inline uint32 usedEntries(const RectList& list) {
  uint32 count = 0;
  while (!endsAt(list, count)) ++count;
  return count;
}

/// Clears the entries of a list from number `first` on. Not in line: where the size is known, GCC
/// takes string instructions, which take longer to begin than the whole.
void clearFrom(RectList* list, uint32 first);

/// Some rectangles of a list, one bit each: bit i is entry i.
using Rects = uint32;
inline constexpr Rects kNone = 0;
constexpr Rects bitOf(uint32 entry) { return Rects{1} << entry; }

}  // namespace raster

#endif
