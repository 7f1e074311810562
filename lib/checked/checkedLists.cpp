// SPDX-License-Identifier: MIT
//
// Rect lists. The list is changed as a copy, and whether a difference fits is known before it is
// made.

#include <bit>

#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr uint32 kListSize = RASTER_RECT_LIST_SIZE;
constexpr uint32 kMaxRegion = kListSize - 1;

/// One rectangle by its edges.
struct Box {
  int64 left, top, right, bottom;

  explicit Box(const RectListEntry& r)
      : left(r.x), top(r.y), right(int64{r.x} + r.width), bottom(int64{r.y} + r.height) {}
  void cover(const Box& other) {
    left = std::min(left, other.left);
    top = std::min(top, other.top);
    right = std::max(right, other.right);
    bottom = std::max(bottom, other.bottom);
  }
  bool fits() const {
    return right <= INT32_MAX && bottom <= INT32_MAX && right - left <= INT32_MAX &&
           bottom - top <= INT32_MAX;
  }
};

/// Copies the entries of a list that count, with zeros behind them, and checks them together with
/// the rectangle of the call.
RasterStatus takeList(const RectList* list, const RectListEntry& rect, RectList* copy,
                      uint32* used) {
  if (list == nullptr) return RASTER_STATUS_NULL;
  if (rect.width < 0 || rect.height < 0) return RASTER_STATUS_BAD_ARGUMENT;
  *copy = {};
  *used = 0;
  Box all(rect);
  for (; *used < kListSize && list->rects[*used].width > 0; ++*used) {
    const RectListEntry& entry = list->rects[*used];
    if (entry.height <= 0) return RASTER_STATUS_BAD_ARGUMENT;
    copy->rects[*used] = entry;
    all.cover(Box(entry));
  }
  if (!all.fits()) return RASTER_STATUS_BAD_ARGUMENT;
  return *used == kListSize ? RASTER_STATUS_TOO_BIG : RASTER_STATUS_OK;
}

/// Ascending numbers, each once.
struct Edges {
  uint32 count = 0;
  int32 at[2 * kListSize];

  void add(int32 number) {
    uint32 place = count;
    while (place != 0 && at[place - 1] > number) --place;
    if (place != 0 && at[place - 1] == number) return;
    for (uint32 i = count++; i != place; --i) at[i] = at[i - 1];
    at[place] = number;
  }
};

/// The columns between neighbouring edges, one bit each, that a rectangle covers.
uint32 columnsOf(const Edges& edges, const RectListEntry& rect) {
  uint32 columns = 0;
  for (uint32 i = 0; i + 1 < edges.count; ++i) {
    const bool covered = rect.x <= edges.at[i] && edges.at[i] < int64{rect.x} + rect.width;
    columns |= uint32{covered} << i;
  }
  return columns;
}

bool crosses(const RectListEntry& rect, int32 y) {
  return rect.y <= y && y < int64{rect.y} + rect.height;
}

/// The number of runs of `now` that `before` does not have just so.
uint32 newRuns(uint32 now, uint32 before) {
  uint32 count = 0;
  while (now != 0) {
    const uint32 first = now & (0 - now);
    const uint32 run = now & ~(now + first);
    const uint32 around = run | run << 1 | run >> 1;
    count += (before & around) != run;
    now &= ~run;
  }
  return count;
}

/// The number of rectangles that a region has without a hole: one for every span that does not go
/// on from the scanlines above.
uint32 countRects(const RectList& list, uint32 used, const RectListEntry& hole) {
  Edges columns;
  Edges rows;
  const auto addEdges = [&](const RectListEntry& r) {
    columns.add(r.x);
    columns.add(r.x + r.width);
    rows.add(r.y);
    rows.add(r.y + r.height);
  };
  for (uint32 i = 0; i < used; ++i) addEdges(list.rects[i]);
  addEdges(hole);
  uint32 count = 0;
  uint32 before = 0;
  for (uint32 row = 0; row < rows.count; ++row) {
    uint32 now = 0;
    for (uint32 i = 0; i < used; ++i)
      if (crosses(list.rects[i], rows.at[row])) now |= columnsOf(columns, list.rects[i]);
    if (crosses(hole, rows.at[row])) now &= ~columnsOf(columns, hole);
    count += newRuns(now, before);
    before = now;
  }
  return count;
}

void finish(const RectList& made, uint32 madeArea, RectList* list, uint32* area) {
  *list = made;
  if (area != nullptr) *area = madeArea;
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_AddRect(RectList* list, int32 x, int32 y, int32 width, int32 height,
                                   uint32* area) {
  RectList made;
  uint32 used = 0;
  const RasterStatus status = raster::checked::takeList(list, {x, y, width, height}, &made, &used);
  if (status != RASTER_STATUS_OK) return status;
  const uint32 madeArea = Raster_AddRect(&made, x, y, width, height);
  raster::checked::finish(made, madeArea, list, area);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_SubRect(RectList* list, int32 x, int32 y, int32 width, int32 height,
                                   uint32* area) {
  using namespace raster::checked;
  const RectListEntry hole = {x, y, width, height};
  RectList made;
  uint32 used = 0;
  const RasterStatus status = takeList(list, hole, &made, &used);
  if (status != RASTER_STATUS_OK) return status;
  if (width != 0 && height != 0 && countRects(made, used, hole) > kMaxRegion)
    return RASTER_STATUS_TOO_BIG;
  finish(made, Raster_SubRect(&made, x, y, width, height), list, area);
  return RASTER_STATUS_OK;
}

}  // extern "C"
