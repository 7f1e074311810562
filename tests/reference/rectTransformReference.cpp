// SPDX-License-Identifier: MIT

#include "reference/rectTransformReference.h"

#include <initializer_list>

namespace reference {
namespace {

#ifdef __SIZEOF_INT128__
__extension__ using Wide = __int128;
#else
using Wide = int64;  // 32-bit compilers have nothing wider; the 64-bit run shows that it suffices
#endif

constexpr Wide kMax = 0x7FFFFFFF;
constexpr Wide kMin = -kMax - 1;

int32 clamp(Wide v, bool& exact) {
  if (v > kMax || v < kMin) exact = false;
  return static_cast<int32>(v > kMax ? kMax : v < kMin ? kMin : v);
}

/// The number of 32 bits that `v` wraps around to.
int32 wrapped(Wide v) {
  constexpr Wide kModulus = Wide{1} << 32;
  Wide rest = v % kModulus;
  if (rest > kMax) rest -= kModulus;
  if (rest < kMin) rest += kModulus;
  return static_cast<int32>(rest);
}

Wide sizeOf(int32 first, int32 last) {
  if (first >= last) return 0;
  const Wide size = Wide{last} - first;
  return size > kMax ? kMax : size;
}

int32 carry(int32 edge, int32 fromEdge, int32 toEdge, Wide fromSize, Wide toSize, bool& exact) {
  Wide d = Wide{edge} - fromEdge;
  if (toSize != fromSize) d = d * toSize / fromSize;
  return clamp(toEdge + d, exact);
}

int32 scaleOne(int32 p, int32 fromFirst, int32 fromLast, int32 toFirst, int32 toLast) {
  const Wide fromSize = sizeOf(fromFirst, fromLast);
  const Wide toSize = sizeOf(toFirst, toLast);
  const Wide e = toSize > fromSize ? 1 : 0;
  const Wide n = Wide{wrapped(Wide{p} - fromFirst)} * (toSize - e);
  Wide q = 1;
  if (fromFirst < fromLast && fromSize - e > 0) q = fromSize - e;
  Wide quotient = n / q;
  if (n % q < 0) --quotient;
  bool exact = true;
  return clamp(toFirst + quotient, exact);
}

int32 subtract(int32 a, int32 b) {
  const int32 minusB = wrapped(-Wide{b});
  const int32 s = wrapped(Wide{a} + minusB);
  if (minusB > 0 && s < a) return 0x7FFFFFFF;
  if (minusB < 0 && s > a) return -0x7FFFFFFF - 1;
  return s;
}

bool empty(const Rect& r) { return r.left >= r.right || r.top >= r.bottom; }

}  // namespace

Carried applyDiff(const Rect& to, const Rect& from, const Rect& r) {
  Carried out = {{}, true};
  out.rect.left = clamp(Wide{r.left} + to.left - from.left, out.exact);
  out.rect.right = clamp(Wide{r.right} + to.right - from.right, out.exact);
  out.rect.top = clamp(Wide{r.top} + to.top - from.top, out.exact);
  out.rect.bottom = clamp(Wide{r.bottom} + to.bottom - from.bottom, out.exact);
  return out;
}

Carried applyDiffEx(const Rect& to, const Rect& from, const Rect& r) {
  const Wide fromWidth = sizeOf(from.left, from.right);
  const Wide fromHeight = sizeOf(from.top, from.bottom);
  const Wide toWidth = sizeOf(to.left, to.right);
  const Wide toHeight = sizeOf(to.top, to.bottom);
  Carried out = {{}, true};
  out.rect.left = carry(r.left, from.left, to.left, fromWidth, toWidth, out.exact);
  out.rect.right = carry(r.right, from.right, to.right, fromWidth, toWidth, out.exact);
  out.rect.top = carry(r.top, from.top, to.top, fromHeight, toHeight, out.exact);
  out.rect.bottom = carry(r.bottom, from.bottom, to.bottom, fromHeight, toHeight, out.exact);
  return out;
}

Pair intersectPair(const Rect& a, const Rect& b, const Rect& c) {
  Pair pair = {};
  const Rect both = {a.left > b.left ? a.left : b.left, a.top > b.top ? a.top : b.top,
                     a.right < b.right ? a.right : b.right,
                     a.bottom < b.bottom ? a.bottom : b.bottom};
  if (empty(both) || empty(c)) return pair;
  const Rect mapped = applyDiffEx(c, a, both).rect;
  if (empty(mapped)) return pair;
  return {both, mapped, true};
}

Point scalePoint(const Rect& from, const Rect& to, const Point& p) {
  return {scaleOne(p.x, from.left, from.right, to.left, to.right),
          scaleOne(p.y, from.top, from.bottom, to.top, to.bottom)};
}

int32 pointDistance(const Rect& r, const Point& p) {
  const int32 lastX = r.right == -0x7FFFFFFF - 1 ? r.right : r.right - 1;
  const int32 lastY = r.bottom == -0x7FFFFFFF - 1 ? r.bottom : r.bottom - 1;
  int32 d = subtract(r.top, p.y);
  for (const int32 other : {subtract(r.left, p.x), subtract(p.y, lastY), subtract(p.x, lastX)})
    if (other > d) d = other;
  return d;
}

}  // namespace reference
