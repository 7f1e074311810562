// SPDX-License-Identifier: MIT
//
// Rectangles and points carried from one frame of reference into another, plainly or scaled, and
// the distance of a point from a rectangle.
//
// Everything is worked out one axis at a time, in exact 64-bit arithmetic that saturates at the
// end.

#include "divisionByZero.h"
#include "rect.h"
#include "rectArithmetic.h"

namespace raster {
namespace {

/// One axis of a rectangle.
struct Axis {
  int32 first;
  int32 last;

  /// 0 when empty, and at most the largest 32-bit number.
  int64 size() const { return first < last ? std::min<int64>(int64{last} - first, kInt32Max) : 0; }
};

Axis horizontal(const Rect& r) { return {r.left, r.right}; }
Axis vertical(const Rect& r) { return {r.top, r.bottom}; }

/// The offset d from one edge of `from`, in the scale of `to`: exact, truncated toward zero. An
/// empty `from` cannot be scaled up; that is the caller's fault.
int64 scaledOffset(int64 d, const Axis& to, const Axis& from) {
  if (to.size() == from.size()) return d;
  if (from.size() == 0) divisionByZero();
  return d * to.size() / from.size();
}

/// An axis carried from one frame into another, and whether both of its ends fit.
struct CarriedAxis {
  Saturated first;
  Saturated last;
  bool exact() const { return first.exact && last.exact; }
};

CarriedAxis carryPlainly(const Axis& a, const Axis& to, const Axis& from) {
  return {saturate(int64{a.first} + to.first - from.first),
          saturate(int64{a.last} + to.last - from.last)};
}

CarriedAxis carryScaled(const Axis& a, const Axis& to, const Axis& from) {
  return {saturate(to.first + scaledOffset(int64{a.first} - from.first, to, from)),
          saturate(to.last + scaledOffset(int64{a.last} - from.last, to, from))};
}

Rect rectOf(const CarriedAxis& x, const CarriedAxis& y) {
  return {x.first.value, y.first.value, x.last.value, y.last.value};
}

int64 floorDivide(int64 n, int64 divisor) {
  return n < 0 ? (n - (divisor - 1)) / divisor : n / divisor;
}

/// A coordinate carried by scaling: when enlarging, the first and the last pixel of `from` meet
/// those of `to`, which takes one off both sizes.
int32 scaleCoordinate(int32 at, const Axis& from, const Axis& to) {
  const int64 lessOne = to.size() > from.size() ? 1 : 0;
  // Deliberate: the distance from the edge wraps around at 32 bits.
  const int64 n = subWrap(at, from.first) * (to.size() - lessOne);
  const int64 divisor = std::max<int64>(from.size() - lessOne, 1);
  return saturate(to.first + floorDivide(n, divisor)).value;
}

/// a - b, as the saturating sum of a and the wrapped negation of b.
int32 subSaturated(int32 a, int32 b) { return addSaturated(a, negateWrap(b)).value; }

/// The last pixel before an exclusive edge.
int32 lastBefore(int32 edge) { return edge == kInt32Min ? kInt32Min : edge - 1; }

}  // namespace
}  // namespace raster

extern "C" {

bool Rect_ApplyDiff(Rect* out, const Rect* to, const Rect* from, const Rect* r) {
  using namespace raster;
  const CarriedAxis x = carryPlainly(horizontal(*r), horizontal(*to), horizontal(*from));
  const CarriedAxis y = carryPlainly(vertical(*r), vertical(*to), vertical(*from));
  *out = rectOf(x, y);
  return x.exact() && y.exact();
}

bool Rect_ApplyDiffToPoint(Point* out, const Point* to, const Point* from, const Point* p) {
  const raster::Saturated x = raster::saturate(int64{p->x} + to->x - from->x);
  const raster::Saturated y = raster::saturate(int64{p->y} + to->y - from->y);
  *out = {x.value, y.value};
  return x.exact && y.exact;
}

bool Rect_ApplyDiffEx(Rect* out, const Rect* to, const Rect* from, const Rect* r) {
  using namespace raster;
  const CarriedAxis x = carryScaled(horizontal(*r), horizontal(*to), horizontal(*from));
  const CarriedAxis y = carryScaled(vertical(*r), vertical(*to), vertical(*from));
  *out = rectOf(x, y);
  return x.exact() && y.exact();
}

bool Rect_IntersectPair(Rect* outIntersection, const Rect* a, const Rect* b, Rect* outMapped,
                        const Rect* c) {
  using namespace raster;
  Rect common = intersection(*a, *b);
  Rect mapped = {};
  if (!isEmpty(common) && !isEmpty(*c)) {
    mapped = rectOf(carryScaled(horizontal(common), horizontal(*c), horizontal(*a)),
                    carryScaled(vertical(common), vertical(*c), vertical(*a)));
  }
  const bool any = !isEmpty(mapped);
  if (!any) common = mapped = {};
  if (outMapped != nullptr) *outMapped = mapped;
  if (outIntersection != nullptr) *outIntersection = common;
  return any;
}

void Rect_ScalePoint(const Rect* from, const Rect* to, const Point* p, Point* out) {
  using namespace raster;
  *out = {scaleCoordinate(p->x, horizontal(*from), horizontal(*to)),
          scaleCoordinate(p->y, vertical(*from), vertical(*to))};
}

int32 Rect_PointDistance(const Rect* r, const Point* p) {
  using namespace raster;
  return std::max({subSaturated(r->top, p->y), subSaturated(r->left, p->x),
                   subSaturated(p->y, lastBefore(r->bottom)),
                   subSaturated(p->x, lastBefore(r->right))});
}

}  // extern "C"
