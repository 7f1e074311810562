// SPDX-License-Identifier: MIT
//
// Rect lists: a region as at most 16 disjoint rectangles, rebuilt by a scanline sweep.
//
// The sweep goes from edge to edge: an edge is a y where a rectangle begins or ends. Between two
// edges the region is a set of spans, and a rectangle of the result grows downwards as long as the
// same span stays. All tables are arrays on the stack.

#include <algorithm>
#include <bit>
#include <cstring>

#include "panicPlace.h"
#include "raster.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterRect";
constexpr int kNegativeSizeBug = 15740;

constexpr uint32 kListSize = RASTER_RECT_LIST_SIZE;
/// Deliberate: a sweep leaves one entry of the list unused, so its result always ends by itself.
constexpr uint32 kMaxResult = kListSize - 1;

int32 addWrap(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) + static_cast<uint32>(b));
}
int32 subWrap(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) - static_cast<uint32>(b));
}

int32 rightOf(const RectListEntry& r) { return addWrap(r.x, r.width); }
int32 bottomOf(const RectListEntry& r) { return addWrap(r.y, r.height); }
uint32 areaOf(const RectListEntry& r) {
  return static_cast<uint32>(r.width) * static_cast<uint32>(r.height);
}

/// The entries before the one that ends the list. Only the width counts.
uint32 usedEntries(const RectList& list) {
  uint32 count = 0;
  while (count < kListSize && list.rects[count].width > 0) ++count;
  return count;
}

/// The first entry of a list, unlike the others, is unused by its height too.
bool isCleared(const RectList& list) {
  return list.rects[0].width <= 0 || list.rects[0].height <= 0;
}

// ---- Edges -------------------------------------------------------------------------------------

/// The rectangles that a scanline meets, one bit each: bit i is entry i of the list.
using Rects = uint32;
constexpr Rects kNone = 0;
/// The bit of the rectangle that is subtracted.
constexpr Rects kCut = Rects{1} << kListSize;

/// A scanline where rectangles begin or end.
struct Edge {
  int32 y;
  Rects changes;
};

/// The edges of all rectangles, ascending, each y once.
class EdgeTable {
 public:
  /// Adds the top and the bottom of a rectangle.
  void add(int32 top, int32 bottom, Rects rect) {
    const Rects changes = top < bottom ? rect : kNone;
    insert({top, changes});
    insert({bottom, changes});
  }

  /// Lets a rectangle whose own edges are not in the table begin and end at the next ones that are.
  void addBetween(int32 top, int32 bottom, Rects rect) {
    if (top >= bottom) return;
    changeFrom(top, rect);
    changeFrom(bottom, rect);
  }

  const Edge* begin() const { return edges_; }
  const Edge* end() const { return edges_ + count_; }

 private:
  void insert(Edge edge) {
    uint32 at = count_;
    while (at != 0 && edges_[at - 1].y > edge.y) --at;
    if (at != 0 && edges_[at - 1].y == edge.y) {
      edges_[at - 1].changes ^= edge.changes;
      return;
    }
    for (uint32 i = count_++; i != at; --i) edges_[i] = edges_[i - 1];
    edges_[at] = edge;
  }

  void changeFrom(int32 y, Rects rect) {
    uint32 at = 0;
    while (at != count_ && edges_[at].y < y) ++at;
    if (at != count_) edges_[at].changes ^= rect;
  }

  uint32 count_ = 0;
  Edge edges_[2 * kListSize];
};

// ---- Spans -------------------------------------------------------------------------------------

/// The pixels [start, end) of a scanline.
struct Span {
  int32 start;
  int32 end;
};

/// The region on one scanline: spans from left to right that neither overlap nor touch.
class SpanTable {
 public:
  /// Joins [start, end) with the spans that it overlaps or touches.
  void merge(Span span) {
    uint32 first = 0;
    while (first != count_ && spans_[first].end < span.start) ++first;
    uint32 last = first;
    for (; last != count_ && spans_[last].start <= span.end; ++last) {
      span.start = std::min(span.start, spans_[last].start);
      span.end = std::max(span.end, spans_[last].end);
    }
    replace(first, last, 1);
    spans_[first] = span;
  }

  /// Takes [start, end) out of the spans. Deliberate: nothing is done about an end before the
  /// start, which leaves the two sides of a span overlapping.
  void cut(Span hole) {
    uint32 at = 0;
    while (at != count_ && spans_[at].end <= hole.start) ++at;
    while (at != count_ && spans_[at].start < hole.end) {
      const bool keepsLeft = spans_[at].start < hole.start;
      const bool keepsRight = spans_[at].end > hole.end;
      if (keepsLeft && keepsRight) return split(at, hole);
      if (keepsRight) {
        spans_[at].start = hole.end;
        return;
      }
      if (keepsLeft) {
        spans_[at++].end = hole.start;
      } else {
        replace(at, at + 1, 0);
      }
    }
  }

  const Span* begin() const { return spans_; }
  const Span* end() const { return spans_ + count_; }

 private:
  void split(uint32 at, Span hole) {
    if (count_ == kListSize) notImplemented(kSource);
    replace(at, at + 1, 2);
    spans_[at + 1] = {hole.end, spans_[at].end};
    spans_[at].end = hole.start;
  }

  /// Makes room for `count` spans in place of those of [first, last).
  void replace(uint32 first, uint32 last, uint32 count) {
    memmove(spans_ + first + count, spans_ + last, (count_ - last) * sizeof(Span));
    count_ = count_ - (last - first) + count;
  }

  uint32 count_ = 0;
  Span spans_[kListSize];
};

// ---- Bands -------------------------------------------------------------------------------------

/// The rectangles of the result, in the order in which they begin. One that still grows downwards
/// is open and has the height 0.
class BandTable {
 public:
  /// Keeps the open rectangles that have their span on scanline `y` too, closes the others, and
  /// opens one for every other span. False when that would be too many.
  bool update(int32 y, const SpanTable& spans) {
    OpenRect still[kListSize];
    uint32 stillCount = 0;
    uint32 before = 0;
    for (const Span& span : spans) {
      while (before != openCount_ && open_[before].span.start < span.start) close(before++, y);
      const bool stays = before != openCount_ && open_[before].span.start == span.start &&
                         open_[before].span.end == span.end;
      if (stays) {
        still[stillCount++] = open_[before++];
      } else if (opens(span, y)) {
        still[stillCount++] = {span, count_ - 1};
        if (count_ > kMaxResult) return false;
      }
    }
    while (before != openCount_) close(before++, y);
    std::copy_n(still, stillCount, open_);
    openCount_ = stillCount;
    return true;
  }

  const RectList& result() const { return result_; }

 private:
  struct OpenRect {
    Span span;
    uint32 index;
  };

  /// Stores a new rectangle. Deliberate: a span too wide for a signed width is written behind the
  /// others but does not count as a rectangle.
  bool opens(const Span& span, int32 y) {
    const int32 width = subWrap(span.end, span.start);
    result_.rects[count_] = {span.start, y, width, 0};
    if (width <= 0) return false;
    ++count_;
    return true;
  }

  void close(uint32 which, int32 y) {
    RectListEntry& rect = result_.rects[open_[which].index];
    rect.height = subWrap(y, rect.y);
  }

  uint32 count_ = 0;
  uint32 openCount_ = 0;
  OpenRect open_[kListSize];
  RectList result_ = {};
};

// ---- The sweep ---------------------------------------------------------------------------------

/// The spans that the rectangles of `active` leave on a scanline.
SpanTable spansOf(const RectList& list, Rects active, const Span& hole) {
  SpanTable spans;
  for (Rects rest = active & ~kCut; rest != kNone; rest &= rest - 1) {
    const RectListEntry& rect = list.rects[std::countr_zero(rest)];
    const Span span = {rect.x, rightOf(rect)};
    if (span.start < span.end) spans.merge(span);
  }
  if ((active & kCut) != kNone) spans.cut(hole);
  return spans;
}

/// Rebuilds the region from edge to edge. False when it takes too many rectangles.
bool sweep(const RectList& list, const EdgeTable& edges, const Span& hole, BandTable* bands) {
  Rects active = kNone;
  for (const Edge& edge : edges) {
    active ^= edge.changes;
    if (!bands->update(edge.y, spansOf(list, active, hole))) return false;
  }
  return true;
}

uint32 totalArea(const RectList& list) {
  uint32 area = 0;
  for (const RectListEntry& rect : list.rects) area += areaOf(rect);
  return area;
}

RectListEntry boundingBox(const RectList& list) {
  int32 left = list.rects[0].x;
  int32 top = list.rects[0].y;
  int32 right = rightOf(list.rects[0]);
  int32 bottom = bottomOf(list.rects[0]);
  for (uint32 i = 1; i != usedEntries(list); ++i) {
    left = std::min(left, list.rects[i].x);
    top = std::min(top, list.rects[i].y);
    right = std::max(right, rightOf(list.rects[i]));
    bottom = std::max(bottom, bottomOf(list.rects[i]));
  }
  return {left, top, subWrap(right, left), subWrap(bottom, top)};
}

void addEdges(EdgeTable* edges, const RectList& list, uint32 from, uint32 to) {
  for (uint32 i = from; i != to; ++i)
    edges->add(list.rects[i].y, bottomOf(list.rects[i]), Rects{1} << i);
}

uint32 addRect(RectList* list, const RectListEntry& rect) {
  if (isCleared(*list)) {
    list->rects[0] = rect;
    return areaOf(rect);
  }
  // Deliberate: a full list ignores the new rectangle and is only rebuilt.
  const uint32 used = usedEntries(*list);
  const uint32 known = std::min(used + 1, kListSize);
  if (used != kListSize) list->rects[used] = rect;
  EdgeTable edges;
  addEdges(&edges, *list, 0, known);
  // Deliberate: entries behind the one that ended the list come to life, but have no edges.
  const uint32 alive = usedEntries(*list);
  for (uint32 i = known; i < alive; ++i)
    edges.addBetween(list->rects[i].y, bottomOf(list->rects[i]), Rects{1} << i);

  BandTable bands;
  *list = sweep(*list, edges, {}, &bands) ? bands.result() : RectList{{boundingBox(*list)}};
  return totalArea(*list);
}

uint32 subRect(RectList* list, const RectListEntry& rect) {
  const uint32 used = usedEntries(*list);
  EdgeTable edges;
  addEdges(&edges, *list, 0, used);
  if (used != kListSize) {
    edges.add(rect.y, bottomOf(rect), kCut);
  } else {
    // Deliberate: a full list is cut at its own edges only.
    edges.addBetween(rect.y, bottomOf(rect), kCut);
  }
  BandTable bands;
  if (!sweep(*list, edges, {rect.x, rightOf(rect)}, &bands)) notImplemented(kSource);
  *list = bands.result();
  return totalArea(*list);
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_ClearRectList(RectList* list) { *list = RectList{}; }

uint32 Raster_AddRect(RectList* list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0) return 0;
  if (height < 0 || width < 0) raster::assertFailed(raster::kSource, raster::kNegativeSizeBug);
  return raster::addRect(list, {x, y, width, height});
}

uint32 Raster_SubRect(RectList* list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0 || raster::isCleared(*list)) return 0;
  return raster::subRect(list, {x, y, width, height});
}

}  // extern "C"
