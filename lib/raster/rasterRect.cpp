// SPDX-License-Identifier: MIT
//
// Rect lists: a region as at most 16 disjoint rectangles.

#include <algorithm>

#include "host/panicPlace.h"
#include "raster.h"
#include "region/draft.h"
#include "region/sweep.h"

namespace raster {
namespace {

constexpr int kNegativeSizeBug = 15740;

/// The first entry of a list, unlike the others, is unused by its height too.
bool isCleared(const RectList& list) {
  return list.rects[0].width <= 0 || list.rects[0].height <= 0;
}

RectListEntry boundingBox(const RectList& list) {
  int32 left = list.rects[0].x;
  int32 top = list.rects[0].y;
  int32 right = rightOf(list.rects[0]);
  int32 bottom = bottomOf(list.rects[0]);
  for (uint32 i = 1; !endsAt(list, i); ++i) {
    left = std::min(left, list.rects[i].x);
    top = std::min(top, list.rects[i].y);
    right = std::max(right, rightOf(list.rects[i]));
    bottom = std::max(bottom, bottomOf(list.rects[i]));
  }
  return {left, top, subWrap(right, left), subWrap(bottom, top)};
}

uint32 addRect(RectList* list, const RectListEntry& rect) {
  if (isCleared(*list)) {
    list->rects[0] = rect;
    return areaOf(rect);
  }
  const uint32 used = usedEntries(*list);
  uint32 area = 0;
  if (used < kMaxResult && endsAt(*list, used + 1) && addWhole(list, used, rect, area)) return area;
  if (sweepWith(list, used, rect, area)) return area;
  list->rects[0] = boundingBox(*list);
  clearFrom(list, 1);
  return areaOf(list->rects[0]);
}

uint32 subRect(RectList* list, const RectListEntry& rect) {
  const uint32 used = usedEntries(*list);
  uint32 area = 0;
  if (used != kListSize && cutEach(list, used, rect, area)) return area;
  return sweepWithout(list, used, rect);
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_ClearRectList(RectList* list) { raster::clearFrom(list, 0); }

uint32 Raster_AddRect(RectList* list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0) return 0;
  if (height < 0 || width < 0)
    raster::assertFailed(raster::kRectListSource, raster::kNegativeSizeBug);
  return raster::addRect(list, {x, y, width, height});
}

uint32 Raster_SubRect(RectList* list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0 || raster::isCleared(*list)) return 0;
  return raster::subRect(list, {x, y, width, height});
}

}  // extern "C"
