// SPDX-License-Identifier: MIT

#include "region/draft.h"

#include <algorithm>

namespace raster {
namespace {

bool isPlain(const RectListEntry& r) {
  return r.width > 0 && r.x < rightOf(r) && r.y < bottomOf(r);
}

bool overlapsRows(const RectListEntry& a, const RectListEntry& b) {
  return a.y < bottomOf(b) && b.y < bottomOf(a);
}
bool touchesColumns(const RectListEntry& a, const RectListEntry& b) {
  return a.x <= rightOf(b) && b.x <= rightOf(a);
}
bool hasSameColumns(const RectListEntry& a, const RectListEntry& b) {
  return a.x == b.x && a.width == b.width;
}
bool comesBefore(const RectListEntry& a, const RectListEntry& b) {
  return a.y < b.y || (a.y == b.y && a.x < b.x);
}
bool covers(const RectListEntry& a, const RectListEntry& b) {
  return a.x <= b.x && a.y <= b.y && rightOf(b) <= rightOf(a) && bottomOf(b) <= bottomOf(a);
}

/// Whether the union of two rectangles is a rectangle.
bool makeOne(const RectListEntry& a, const RectListEntry& b) {
  const bool inColumn = hasSameColumns(a, b) && a.y <= bottomOf(b) && b.y <= bottomOf(a);
  const bool inRow = a.y == b.y && a.height == b.height && touchesColumns(a, b);
  return inColumn || inRow || covers(a, b) || covers(b, a);
}

RectListEntry unionOf(const RectListEntry& a, const RectListEntry& b) {
  const int32 x = std::min(a.x, b.x);
  const int32 y = std::min(a.y, b.y);
  return {x, y, subWrap(std::max(rightOf(a), rightOf(b)), x),
          subWrap(std::max(bottomOf(a), bottomOf(b)), y)};
}

/// A list in the making, in the order of a sweep's result as long as what is put into it is.
class Draft {
 public:
  void append(const RectListEntry& r) {
    if (count_ <= kMaxResult) rects_[count_++] = r;
  }

  void insert(const RectListEntry& r) {
    if (count_ > kMaxResult) return;
    uint32 at = count_++;
    for (; at != 0 && comesBefore(r, rects_[at - 1]); --at) rects_[at] = rects_[at - 1];
    rects_[at] = r;
  }

  /// Inserts what a hole leaves of a rectangle that it meets.
  void insertAround(const RectListEntry& r, const RectListEntry& hole) {
    const int32 top = std::max(r.y, hole.y);
    const int32 bottom = std::min(bottomOf(r), bottomOf(hole));
    const int32 height = bottom - top;
    if (r.y < top) insert({r.x, r.y, r.width, top - r.y});
    if (r.x < hole.x) insert({r.x, top, hole.x - r.x, height});
    if (rightOf(hole) < rightOf(r))
      insert({rightOf(hole), top, rightOf(r) - rightOf(hole), height});
    if (bottom < bottomOf(r)) insert({r.x, bottom, r.width, bottomOf(r) - bottom});
  }

  /// Whether a sweep would give this back as it is: in order, no two rectangles on a scanline
  /// touching, none going on where another one ends.
  bool isSwept() const {
    if (count_ > kMaxResult) return false;
    for (uint32 i = 0; i != count_; ++i)
      if (!isSweptFrom(i)) return false;
    return true;
  }

  uint32 moveTo(RectList* list) const {
    uint32 area = 0;
    for (uint32 i = 0; i != count_; ++i) {
      list->rects[i] = rects_[i];
      area += areaOf(rects_[i]);
    }
    clearFrom(list, count_);
    return area;
  }

 private:
  bool isSweptFrom(uint32 i) const {
    const RectListEntry& r = rects_[i];
    const int32 bottom = bottomOf(r);
    if (!isPlain(r)) return false;
    if (i + 1 != count_ && !comesBefore(r, rects_[i + 1])) return false;
    for (uint32 k = i + 1; k != count_ && rects_[k].y <= bottom; ++k) {
      const RectListEntry& other = rects_[k];
      if (other.y == bottom ? hasSameColumns(r, other) : touchesColumns(r, other)) return false;
    }
    return true;
  }

  uint32 count_ = 0;
  RectListEntry rects_[kListSize];
};

/// Grows a rectangle over those of the list with which it makes one, and tells which. False when
/// it meets another one in any other way.
bool joins(const RectList& list, uint32 used, RectListEntry& whole, Rects& within) {
  if (!isPlain(whole)) return false;
  for (uint32 i = used; i-- != 0;) {
    const RectListEntry& other = list.rects[i];
    if (makeOne(whole, other)) {
      whole = unionOf(whole, other);
      within |= bitOf(i);
    } else if (overlapsRows(whole, other) && touchesColumns(whole, other)) {
      return false;
    }
  }
  return true;
}

}  // namespace

bool addWhole(RectList* list, uint32 used, RectListEntry rect, uint32& area) {
  Rects within = kNone;
  if (!joins(*list, used, rect, within)) return false;
  Draft draft;
  for (uint32 i = 0; i != used; ++i)
    if ((within & bitOf(i)) == kNone) draft.append(list->rects[i]);
  draft.insert(rect);
  if (!draft.isSwept()) return false;
  area = draft.moveTo(list);
  return true;
}

bool cutEach(RectList* list, uint32 used, const RectListEntry& hole, uint32& area) {
  if (!isPlain(hole)) return false;
  Draft draft;
  for (uint32 i = 0; i != used; ++i) {
    const RectListEntry& r = list->rects[i];
    const bool meets = overlapsRows(r, hole) && r.x < rightOf(hole) && hole.x < rightOf(r);
    if (meets) {
      draft.insertAround(r, hole);
    } else {
      draft.insert(r);
    }
  }
  if (!draft.isSwept()) return false;
  area = draft.moveTo(list);
  return true;
}

}  // namespace raster
