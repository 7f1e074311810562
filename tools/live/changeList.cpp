// SPDX-License-Identifier: MIT

#include "changeList.h"

#include <algorithm>

#include "pixelView.h"
#include "rectLists.h"

namespace tool::live {
namespace {

constexpr int32 kStripRows = 64;

Rect stripOf(size_t index, const Rect& area) {
  const int32 top = static_cast<int32>(index) * kStripRows;
  return {0, top, area.right, std::min(top + kStripRows, area.bottom)};
}

/// A rectangle that is cut can leave four, one that is covered none; no list may get more than 15.
bool hasRoomToCut(const RectList& list, const Rect& hole) {
  constexpr size_t kLargestResult = RASTER_RECT_LIST_SIZE - 1;
  const std::vector<Rect> rects = rectsOf(list);
  const auto cut = std::count_if(rects.begin(), rects.end(), [&](const Rect& rect) {
    return Rect_Intersect(nullptr, &rect, &hole) && !Rect_ContainsRect(&hole, &rect);
  });
  return rects.size() + 3 * static_cast<size_t>(cut) <= kLargestResult;
}

/// What lies above, below, left and right of the hole: a box for each side.
void keepAround(RectList& list, const Rect& strip, const Rect& hole) {
  const Rect sides[] = {{strip.left, strip.top, strip.right, hole.top},
                        {strip.left, hole.bottom, strip.right, strip.bottom},
                        {strip.left, hole.top, hole.left, hole.bottom},
                        {hole.right, hole.top, strip.right, hole.bottom}};
  const std::vector<Rect> rects = rectsOf(list);
  Raster_ClearRectList(&list);
  for (const Rect& side : sides) {
    Rect box = {};
    for (const Rect& rect : rects) {
      Rect inside;
      if (Rect_Intersect(&inside, &rect, &side)) Rect_Union(&box, &inside);
    }
    if (!isEmpty(box)) addTo(list, box);
  }
}

/// Calls `body(list, part, strip)` for every strip that meets `rect`, with the part of it in there.
template <class Strips, class Body>
void forStrips(Strips& strips, const Rect& area, const Rect& rect, Body body) {
  Rect inside;
  if (!Rect_Intersect(&inside, &rect, &area)) return;
  const auto first = static_cast<size_t>(inside.top / kStripRows);
  const auto last = static_cast<size_t>((inside.bottom - 1) / kStripRows);
  for (size_t i = first; i <= last; ++i) {
    const Rect strip = stripOf(i, area);
    Rect part;
    Rect_Intersect(&part, &inside, &strip);
    body(strips[i], part, strip);
  }
}

/// Adds a rectangle to the ones so far: longer, where it goes on below one of them.
void join(std::vector<Rect>& rects, const Rect& rect) {
  const auto above = std::find_if(rects.rbegin(), rects.rend(), [&](const Rect& other) {
    return other.bottom == rect.top && other.left == rect.left && other.right == rect.right;
  });
  if (above != rects.rend() && rect.top % kStripRows == 0) {
    above->bottom = rect.bottom;
  } else {
    rects.push_back(rect);
  }
}

}  // namespace

ChangeList::ChangeList(uint32 width, uint32 height)
    : area{0, 0, static_cast<int32>(width), static_cast<int32>(height)},
      strips((height + kStripRows - 1) / kStripRows) {
  clear();
}

bool ChangeList::isEmpty() const {
  return std::all_of(strips.begin(), strips.end(),
                     [](const RectList& list) { return tool::isEmpty(list); });
}

void ChangeList::clear() {
  for (RectList& list : strips) Raster_ClearRectList(&list);
}

void ChangeList::add(const Rect& rect) {
  forStrips(strips, area, rect,
            [](RectList& list, const Rect& part, const Rect& /*strip*/) { addTo(list, part); });
}

void ChangeList::add(const ChangeList& other) {
  for (const RectList& list : other.strips)
    for (const Rect& rect : rectsOf(list)) add(rect);
}

void ChangeList::subtract(const Rect& rect) {
  forStrips(strips, area, rect, [](RectList& list, const Rect& part, const Rect& strip) {
    if (hasRoomToCut(list, part)) {
      Raster_SubRect(&list, part.left, part.top, part.right - part.left, part.bottom - part.top);
    } else {
      keepAround(list, strip, part);
    }
  });
}

std::vector<Rect> ChangeList::within(const Rect& part) const {
  std::vector<Rect> rects;
  forStrips(strips, area, part,
            [&](const RectList& list, const Rect& inStrip, const Rect& /*strip*/) {
              for (const Rect& rect : rectsOf(list)) {
                Rect inside;
                if (Rect_Intersect(&inside, &rect, &inStrip)) join(rects, inside);
              }
            });
  return rects;
}

void joinNear(std::vector<Rect>& rects, uint64 slack) {
  for (size_t before = 0; before != rects.size();) {
    before = rects.size();
    for (size_t i = 0; i < rects.size(); ++i) {
      for (size_t k = i + 1; k < rects.size();) {
        Rect box = rects[i];
        Rect_Union(&box, &rects[k]);
        if (areaOf(box) > areaOf(rects[i]) + areaOf(rects[k]) + slack) {
          ++k;
          continue;
        }
        rects[i] = box;
        rects.erase(rects.begin() + static_cast<ptrdiff_t>(k));
      }
    }
  }
}

}  // namespace tool::live
