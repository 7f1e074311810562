// SPDX-License-Identifier: MIT

#include "region/sweep.h"

#include <algorithm>
#include <bit>
#include <cstdint>

#include "host/panicPlace.h"

namespace raster {
namespace {

/// The bit of the rectangle that is subtracted.
constexpr Rects kCut = bitOf(kListSize);

// ---- Edges -------------------------------------------------------------------------------------

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
    if (count == kListSize) notImplemented(kRectListSource);
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
    for (uint32 i = 0; i != settled; ++i) {
      rects_[i] = list.rects[i];
      area_ += areaOf(rects_[i]);
    }
    rects_[settled] = rects_[kNowhere] = {};
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
  void copyTo(RectList* list) const {
    for (uint32 i = 0; i <= count_; ++i) list->rects[i] = rects_[i];
    clearFrom(list, count_ + 1);
  }

 private:
  /// Deliberate: a span too wide for a signed width is written behind the others, but does not
  /// count as a rectangle. It becomes one that no span of the next scanline equals.
  void open(SpanTable& spans, uint32 i, int32 y) {
    const int32 width = subWrap(spans.end[i], spans.start[i]);
    rects_[count_] = {spans.start[i], y, width, 0};
    if (width > 0) {
      spans.rect[i] = count_++;
      rects_[count_] = {};
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

  /// Where spans end that have no rectangle: one without width.
  static constexpr uint32 kNowhere = kListSize;
  uint32 count_;
  uint32 area_ = 0;
  RectListEntry rects_[kListSize + 1];  ///< `count_`, the one behind them, and kNowhere
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

}  // namespace

bool sweepWith(RectList* list, uint32 used, const RectListEntry& added, uint32& area) {
  // Deliberate: a full list ignores the new rectangle and is only rebuilt.
  const uint32 known = std::min(used + 1, kListSize);
  if (used != kListSize) list->rects[used] = added;
  const uint32 alive = usedEntries(*list);
  const uint32 settled = settledEntries(*list, alive, added.y);

  EdgeTable edges;
  for (uint32 i = settled; i != known; ++i) edges.add(list->rects[i], bitOf(i));
  // Deliberate: entries behind the one that ended the list come to life, but have no edges.
  for (uint32 i = known; i != alive; ++i) edges.addBetween(list->rects[i], bitOf(i));

  BandTable bands(*list, settled);
  if (!sweep(*list, edges, {}, bands)) return false;
  bands.copyTo(list);
  area = bands.area();
  return true;
}

uint32 sweepWithout(RectList* list, uint32 used, const RectListEntry& hole) {
  const uint32 settled = settledEntries(*list, used, hole.y);
  EdgeTable edges;
  for (uint32 i = settled; i != used; ++i) edges.add(list->rects[i], bitOf(i));
  if (used != kListSize) {
    edges.add(hole, kCut);
  } else {
    // Deliberate: a full list is cut at its own edges only.
    edges.addBetween(hole, kCut);
  }
  BandTable bands(*list, settled);
  if (!sweep(*list, edges, hole, bands)) notImplemented(kRectListSource);
  bands.copyTo(list);
  return bands.area();
}

}  // namespace raster
