// SPDX-License-Identifier: MIT

#include "reference/rasterRectReference.h"

namespace reference {
namespace {

int32 sum(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) + static_cast<uint32>(b));
}
int32 difference(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) - static_cast<uint32>(b));
}

struct Edges {
  int32 y[32];
  int count = 0;

  void insert(int32 value) {
    int at = count - 1;
    while (at >= 0 && y[at] > value) --at;
    if (at >= 0 && y[at] == value) return;
    for (int i = count; i > at + 1; --i) y[i] = y[i - 1];
    y[at + 1] = value;
    ++count;
  }
};

struct Span {
  int32 used;
  int32 start;
  int32 end;
  bool inUse() const { return start < end; }
};

struct Spans {
  Span span[16] = {};

  void moveUp(int from) {
    for (int i = 15; i > from; --i) span[i] = span[i - 1];
  }
  void remove(int at) {
    for (int i = at; i < 15; ++i) span[i] = span[i + 1];
    span[15] = {};
  }

  void merge(int32 a, int32 b) {
    int at = 0;
    while (at < 16 && span[at].inUse() && !(a <= span[at].end)) ++at;
    if (at == 16) return;
    if (!span[at].inUse()) {
      span[at] = {0, a, b};
      return;
    }
    if (b < span[at].start) {
      moveUp(at);
      span[at] = {0, a, b};
      return;
    }
    span[at].start = a < span[at].start ? a : span[at].start;
    span[at].end = b > span[at].end ? b : span[at].end;
    while (at + 1 < 16 && span[at + 1].inUse() && span[at + 1].start <= b) {
      span[at].end = span[at + 1].end > span[at].end ? span[at + 1].end : span[at].end;
      remove(at + 1);
    }
  }

  /// False when a split finds all spans in use.
  bool cut(int32 x0, int32 x1) {
    int at = 0;
    while (at < 16 && span[at].inUse() && !(span[at].end > x0)) ++at;
    while (at < 16 && span[at].inUse()) {
      Span& s = span[at];
      if (x1 <= s.start) return true;
      if (x0 > s.start && x1 >= s.end) {
        s.end = x0;
        ++at;
      } else if (x0 > s.start) {
        if (span[15].inUse()) return false;
        moveUp(at + 1);
        span[at + 1] = {0, x1, s.end};
        s.end = x0;
        return true;
      } else if (x1 < s.end) {
        s.start = x1;
        return true;
      } else {
        remove(at);
      }
    }
    return true;
  }
};

Spans spansOfLine(const RectList& list, int32 line) {
  Spans spans;
  for (const RectListEntry& r : list.rects) {
    if (r.width <= 0) break;
    if (r.y <= line && line < sum(r.y, r.height)) spans.merge(r.x, sum(r.x, r.width));
  }
  return spans;
}

bool updateBands(RectList& out, Spans& spans, int32 line) {
  int count = 0;
  for (; count < 16 && out.rects[count].width > 0; ++count) {
    RectListEntry& r = out.rects[count];
    if (r.height != 0) continue;
    bool found = false;
    for (int i = 0; i < 16 && spans.span[i].inUse() && !found; ++i) {
      Span& s = spans.span[i];
      if (s.start == r.x && s.end == sum(r.x, r.width)) {
        s.used = 1;
        found = true;
      }
    }
    if (!found) r.height = difference(line, r.y);
  }
  for (int i = 0; i < 16 && spans.span[i].inUse(); ++i) {
    const Span& s = spans.span[i];
    if (s.used != 0) continue;
    out.rects[count] = {s.start, line, difference(s.end, s.start), 0};
    if (out.rects[count].width > 0) ++count;
    if (count > 15) return false;
  }
  return true;
}

uint32 areaOf(const RectList& list) {
  uint32 area = 0;
  for (const RectListEntry& r : list.rects)
    area += static_cast<uint32>(r.width) * static_cast<uint32>(r.height);
  return area;
}

void becomeBoundingBox(RectList& list) {
  int32 left = list.rects[0].x;
  int32 top = list.rects[0].y;
  int32 right = sum(left, list.rects[0].width);
  int32 bottom = sum(top, list.rects[0].height);
  for (const RectListEntry& r : list.rects) {
    if (r.width <= 0) break;
    if (r.x < left) left = r.x;
    if (r.y < top) top = r.y;
    if (sum(r.x, r.width) > right) right = sum(r.x, r.width);
    if (sum(r.y, r.height) > bottom) bottom = sum(r.y, r.height);
  }
  list = {};
  list.rects[0] = {left, top, difference(right, left), difference(bottom, top)};
}

}  // namespace

ListResult addRect(RectList& list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0) return {ListResult::kNone, 0};
  if (height < 0 || width < 0) return {ListResult::kNegativeSize, 0};
  if (list.rects[0].width <= 0 || list.rects[0].height <= 0) {
    list.rects[0] = {x, y, width, height};
    return {ListResult::kNone, static_cast<uint32>(width) * static_cast<uint32>(height)};
  }
  Edges edges;
  for (RectListEntry& r : list.rects) {
    const bool isFree = r.width <= 0;
    if (isFree) r = {x, y, width, height};
    edges.insert(r.y);
    edges.insert(sum(r.y, r.height));
    if (isFree) break;
  }
  RectList out = {};
  for (int i = 0; i < edges.count; ++i) {
    Spans spans = spansOfLine(list, edges.y[i]);
    if (!updateBands(out, spans, edges.y[i])) {
      becomeBoundingBox(list);
      return {ListResult::kNone, areaOf(list)};
    }
  }
  list = out;
  return {ListResult::kNone, areaOf(list)};
}

ListResult subRect(RectList& list, int32 x, int32 y, int32 width, int32 height) {
  if (height == 0 || width == 0) return {ListResult::kNone, 0};
  if (list.rects[0].width <= 0 || list.rects[0].height <= 0) return {ListResult::kNone, 0};
  const int32 bottom = sum(y, height);
  Edges edges;
  for (const RectListEntry& r : list.rects) {
    if (r.width <= 0) {
      edges.insert(y);
      edges.insert(bottom);
      break;
    }
    edges.insert(r.y);
    edges.insert(sum(r.y, r.height));
  }
  RectList out = {};
  for (int i = 0; i < edges.count; ++i) {
    const int32 line = edges.y[i];
    Spans spans = spansOfLine(list, line);
    if (y <= line && line < bottom && !spans.cut(x, sum(x, width)))
      return {ListResult::kTooManySpans, 0};
    if (!updateBands(out, spans, line)) return {ListResult::kTooManyRects, 0};
  }
  list = out;
  return {ListResult::kNone, areaOf(list)};
}

}  // namespace reference
