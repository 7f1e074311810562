// SPDX-License-Identifier: MIT
//
// Rect lists: a region as at most 16 disjoint rectangles, rebuilt by a scanline sweep.
//
// The sweep goes from edge to edge: an edge is a y where a rectangle begins or ends. Between two
// edges the region is a set of spans, and a rectangle of the result grows downwards as long as the
// same span stays. All tables are arrays on the stack.
//
// A region has one form that a sweep gives back as it is, so a list in this form that describes the
// right region is the sweep's result. Most changes make such a list without a sweep.

#include <algorithm>
#include <bit>
#include <cstdint>

#include "host/panicPlace.h"
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

/// Whether the list ends before entry `i`. Only the width counts.
bool endsAt(const RectList& list, uint32 i) { return i == kListSize || list.rects[i].width <= 0; }

/// The first entry of a list, unlike the others, is unused by its height too.
bool isCleared(const RectList& list) {
  return list.rects[0].width <= 0 || list.rects[0].height <= 0;
}

// ---- Edges -------------------------------------------------------------------------------------

/// The rectangles that a scanline meets, one bit each: bit i is entry i of the list.
using Rects = uint32;
constexpr Rects kNone = 0;
constexpr Rects bitOf(uint32 entry) { return Rects{1} << entry; }
/// The bit of the rectangle that is subtracted.
constexpr Rects kCut = bitOf(kListSize);

/// The scanlines where rectangles begin or end, ascending; one may come several times.
///
/// The fields of an entry lie in arrays of their own, here and in the spans: values that were just
/// stored are soon loaded again, and processors are slow where a load spans several stores.
class EdgeTable {
 public:
  /// Before the first edge stands one that stops every insertion.
  EdgeTable() {
    y_[0] = INT32_MIN;
    changes_[0] = kNone;
  }

  /// Adds the top and the bottom of a rectangle.
  void add(const RectListEntry& r, Rects rect) {
    const int32 bottom = bottomOf(r);
    const Rects changes = r.y < bottom ? rect : kNone;
    insert(r.y, changes);
    insert(bottom, changes);
  }

  /// Lets a rectangle whose own edges are not in the table begin and end at the next ones that are.
  void addBetween(const RectListEntry& r, Rects rect) {
    if (r.y >= bottomOf(r)) return;
    changeFrom(r.y, rect);
    changeFrom(bottomOf(r), rect);
  }

  uint32 count() const { return count_; }
  int32 y(uint32 edge) const { return y_[edge + 1]; }
  Rects changes(uint32 edge) const { return changes_[edge + 1]; }

 private:
  void insert(int32 y, Rects changes) {
    uint32 at = ++count_;
    // NOLINTNEXTLINE(clang-analyzer-core.UndefinedBinaryOperatorResult): the first edge ends it
    for (; y_[at - 1] > y; --at) {
      y_[at] = y_[at - 1];
      changes_[at] = changes_[at - 1];
    }
    y_[at] = y;
    changes_[at] = changes;
  }

  void changeFrom(int32 y, Rects rect) {
    uint32 at = 1;
    while (at <= count_ && y_[at] < y) ++at;
    if (at <= count_) changes_[at] ^= rect;
  }

  uint32 count_ = 0;
  int32 y_[1 + 2 * kListSize];
  Rects changes_[1 + 2 * kListSize];
};

// ---- Spans -------------------------------------------------------------------------------------

/// The region on one scanline: spans [start, end) from left to right that neither overlap nor
/// touch.
struct SpanTable {
  uint32 count = 0;
  int32 start[kListSize];
  int32 end[kListSize];
  uint32 rect[kListSize];  ///< the rectangle of the result that the span belongs to

  /// Puts a span in its place by its start; `join` must follow.
  void insert(int32 first, int32 last) {
    uint32 at = count++;
    for (; at != 0 && start[at - 1] > first; --at) copy(at - 1, at);
    start[at] = first;
    end[at] = last;
  }

  /// Joins spans that overlap or touch.
  void join() {
    uint32 last = 0;
    for (uint32 i = 1; i < count; ++i) {
      if (start[i] > end[last]) {
        copy(i, ++last);
      } else {
        end[last] = std::max(end[last], end[i]);
      }
    }
    count = std::min(count, last + 1);
  }

  /// Takes [first, last) out of the spans. Deliberate: nothing is done about a last before the
  /// first, which leaves the two sides of a span overlapping.
  void cut(int32 first, int32 last) {
    uint32 at = 0;
    while (at != count && end[at] <= first) ++at;
    while (at != count && start[at] < last) {
      const bool keepsLeft = start[at] < first;
      const bool keepsRight = end[at] > last;
      if (keepsLeft && keepsRight) return split(at, first, last);
      if (keepsRight) {
        start[at] = last;
      } else if (keepsLeft) {
        end[at++] = first;
      } else {
        remove(at);
      }
    }
  }

 private:
  void split(uint32 at, int32 first, int32 last) {
    if (count == kListSize) notImplemented(kSource);
    for (uint32 i = count++; i != at; --i) copy(i - 1, i);
    end[at] = first;
    start[at + 1] = last;
  }

  void remove(uint32 at) {
    --count;
    for (; at != count; ++at) copy(at + 1, at);
  }

  void copy(uint32 from, uint32 to) {
    start[to] = start[from];
    end[to] = end[from];
  }
};

// ---- Bands -------------------------------------------------------------------------------------

/// The rectangles of the result, in the order in which they begin. Those of the last scanline's
/// spans are open: they still grow downwards and have the height 0.
class BandTable {
 public:
  /// Begins with the first `settled` rectangles of a list.
  BandTable(const RectList& list, uint32 settled) : count_(settled) {
    std::copy_n(list.rects, settled, rects_);
    for (uint32 i = 0; i != settled; ++i) area_ += areaOf(rects_[i]);
  }

  /// Goes on to scanline `y`: spans that were on the last scanline too keep their rectangle; the
  /// rectangles of the others that were there are closed, and new spans open one. False when there
  /// are too many.
  bool update(int32 y, const SpanTable& before, SpanTable& now) {
    uint32 old = 0;
    for (uint32 i = 0; i != now.count; ++i) {
      while (old != before.count && before.start[old] < now.start[i]) close(before.rect[old++], y);
      const bool stays =
          old != before.count && before.start[old] == now.start[i] && before.end[old] == now.end[i];
      if (stays) {
        now.rect[i] = before.rect[old++];
      } else {
        open(now, i, y);
        if (count_ > kMaxResult) return false;
      }
    }
    while (old != before.count) close(before.rect[old++], y);
    return true;
  }

  uint32 area() const { return area_; }
  void copyTo(RectList* list) const { std::copy_n(rects_, kListSize, list->rects); }

 private:
  /// Deliberate: a span too wide for a signed width is written behind the others, but does not
  /// count as a rectangle. It becomes one that no span of the next scanline equals.
  void open(SpanTable& spans, uint32 i, int32 y) {
    const int32 width = subWrap(spans.end[i], spans.start[i]);
    rects_[count_] = {spans.start[i], y, width, 0};
    if (width > 0) {
      spans.rect[i] = count_++;
    } else {
      spans.end[i] = spans.start[i];
      spans.rect[i] = kNowhere;
    }
  }

  void close(uint32 which, int32 y) {
    RectListEntry& rect = rects_[which];
    rect.height = subWrap(y, rect.y);
    area_ += areaOf(rect);
  }

  static constexpr uint32 kNowhere = kListSize;
  uint32 count_;
  uint32 area_ = 0;
  RectListEntry rects_[kListSize + 1] = {};
};

// ---- The sweep ---------------------------------------------------------------------------------

/// Fills `spans` with what the rectangles of `active` leave on a scanline.
void findSpans(const RectList& list, Rects active, const RectListEntry& hole, SpanTable& spans) {
  spans.count = 0;
  for (Rects rest = active & ~kCut; rest != kNone; rest &= rest - 1) {
    const RectListEntry& rect = list.rects[std::countr_zero(rest)];
    if (rect.x < rightOf(rect)) spans.insert(rect.x, rightOf(rect));
  }
  spans.join();
  if ((active & kCut) != kNone) spans.cut(hole.x, rightOf(hole));
}

/// Rebuilds the region from edge to edge. False when it takes too many rectangles.
bool sweep(const RectList& list, const EdgeTable& edges, const RectListEntry& hole,
           BandTable& bands) {
  SpanTable tables[2];
  SpanTable* before = &tables[0];
  SpanTable* now = &tables[1];
  Rects active = kNone;
  for (uint32 edge = 0; edge != edges.count();) {
    const int32 y = edges.y(edge);
    for (; edge != edges.count() && edges.y(edge) == y; ++edge) active ^= edges.changes(edge);
    findSpans(list, active, hole, *now);
    if (!bands.update(y, *before, *now)) return false;
    std::swap(before, now);
  }
  return true;
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

uint32 usedEntries(const RectList& list) {
  uint32 count = 0;
  while (!endsAt(list, count)) ++count;
  return count;
}

/// Whether `b` lies below all of `a` and does not continue it.
bool isNextBand(const RectListEntry& a, const RectListEntry& b) {
  const bool continues = bottomOf(a) == b.y && a.x == b.x && a.width == b.width;
  const bool fits = a.y < bottomOf(a) && a.x < rightOf(a);
  return fits && bottomOf(a) <= b.y && !continues;
}

/// The number of leading entries that every sweep gives back as they are, whatever changes from
/// scanline `top` on: each is a band of its own, all else begins below, and the entry that comes
/// next begins alone, above `top`.
uint32 settledEntries(const RectList& list, uint32 count, int32 top) {
  uint32 next = 0;
  while (next + 1 < count && list.rects[next + 1].y < top &&
         isNextBand(list.rects[next], list.rects[next + 1])) {
    ++next;
  }
  for (uint32 i = next + 1; i < count; ++i)
    if (list.rects[i].y <= list.rects[next].y) return 0;
  return next;
}

// ---- Without a sweep ---------------------------------------------------------------------------

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
    if (count_ <= kMaxResult) list_.rects[count_++] = r;
  }

  void insert(const RectListEntry& r) {
    if (count_ > kMaxResult) return;
    uint32 at = count_++;
    for (; at != 0 && comesBefore(r, list_.rects[at - 1]); --at)
      list_.rects[at] = list_.rects[at - 1];
    list_.rects[at] = r;
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
    for (uint32 i = 0; i != count_; ++i) area += areaOf(list_.rects[i]);
    *list = list_;
    return area;
  }

 private:
  bool isSweptFrom(uint32 i) const {
    const RectListEntry& r = list_.rects[i];
    const int32 bottom = bottomOf(r);
    if (!isPlain(r)) return false;
    if (i + 1 != count_ && !comesBefore(r, list_.rects[i + 1])) return false;
    for (uint32 k = i + 1; k != count_ && list_.rects[k].y <= bottom; ++k) {
      const RectListEntry& other = list_.rects[k];
      if (other.y == bottom ? hasSameColumns(r, other) : touchesColumns(r, other)) return false;
    }
    return true;
  }

  uint32 count_ = 0;
  RectList list_ = {};
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

/// Adds a rectangle that keeps clear of the others or makes one with each that it meets. False,
/// and nothing done, for any other.
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

/// Cuts a hole out of each rectangle by itself. False, and nothing done, where the parts do not
/// stay as they are.
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

uint32 addRect(RectList* list, const RectListEntry& rect) {
  if (isCleared(*list)) {
    list->rects[0] = rect;
    return areaOf(rect);
  }
  // Deliberate: a full list ignores the new rectangle and is only rebuilt.
  const uint32 used = usedEntries(*list);
  const uint32 known = std::min(used + 1, kListSize);
  uint32 area = 0;
  if (used < kMaxResult && endsAt(*list, used + 1) && addWhole(list, used, rect, area)) return area;
  if (used != kListSize) list->rects[used] = rect;
  const uint32 alive = usedEntries(*list);
  const uint32 settled = settledEntries(*list, alive, rect.y);

  EdgeTable edges;
  for (uint32 i = settled; i != known; ++i) edges.add(list->rects[i], bitOf(i));
  // Deliberate: entries behind the one that ended the list come to life, but have no edges.
  for (uint32 i = known; i != alive; ++i) edges.addBetween(list->rects[i], bitOf(i));

  BandTable bands(*list, settled);
  if (sweep(*list, edges, {}, bands)) {
    bands.copyTo(list);
    return bands.area();
  }
  *list = RectList{{boundingBox(*list)}};
  return areaOf(list->rects[0]);
}

uint32 subRect(RectList* list, const RectListEntry& rect) {
  const uint32 used = usedEntries(*list);
  uint32 area = 0;
  if (used != kListSize && cutEach(list, used, rect, area)) return area;
  const uint32 settled = settledEntries(*list, used, rect.y);
  EdgeTable edges;
  for (uint32 i = settled; i != used; ++i) edges.add(list->rects[i], bitOf(i));
  if (used != kListSize) {
    edges.add(rect, kCut);
  } else {
    // Deliberate: a full list is cut at its own edges only.
    edges.addBetween(rect, kCut);
  }
  BandTable bands(*list, settled);
  if (!sweep(*list, edges, rect, bands)) notImplemented(kSource);
  bands.copyTo(list);
  return bands.area();
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
