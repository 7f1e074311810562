// SPDX-License-Identifier: MIT
//
// Rectangles: building, comparison, translation, intersection, union and containment.

#include "rect.h"

#include "rectArithmetic.h"

namespace raster {
namespace {

bool translate(Rect* out, const Rect& r, Point offset) {
  const Saturated left = addSaturated(r.left, offset.x);
  const Saturated top = addSaturated(r.top, offset.y);
  const Saturated right = addSaturated(r.right, offset.x);
  const Saturated bottom = addSaturated(r.bottom, offset.y);
  *out = {left.value, top.value, right.value, bottom.value};
  return left.exact && top.exact && right.exact && bottom.exact;
}

/// The far edge of a side that begins at `origin`. A negative size collapses it to the origin.
Saturated farEdge(int32 origin, int32 size) {
  return size < 0 ? Saturated{origin, false} : addSaturated(origin, size);
}

Rect boundingBox(const Rect& a, const Rect& b) {
  return {std::min(a.left, b.left), std::min(a.top, b.top), std::max(a.right, b.right),
          std::max(a.bottom, b.bottom)};
}

}  // namespace
}  // namespace raster

extern "C" {

bool Rect_SetFromXYWH(Rect* r, int32 x, int32 y, int32 width, int32 height) {
  const raster::Saturated right = raster::farEdge(x, width);
  const raster::Saturated bottom = raster::farEdge(y, height);
  *r = {x, y, right.value, bottom.value};
  return right.exact && bottom.exact;
}

bool Rect_IsEqual(const Rect* a, const Rect* b) {
  if (raster::isEmpty(*a) && raster::isEmpty(*b)) return true;
  return a->left == b->left && a->top == b->top && a->right == b->right && a->bottom == b->bottom;
}

bool Rect_IsSizeEqual(const Rect* a, const Rect* b) {
  if (raster::isEmpty(*a) && raster::isEmpty(*b)) return true;
  return raster::subWrap(a->right, a->left) == raster::subWrap(b->right, b->left) &&
         raster::subWrap(a->bottom, a->top) == raster::subWrap(b->bottom, b->top);
}

bool Rect_Translate(Rect* out, const Rect* r, const Point* offset) {
  return raster::translate(out, *r, *offset);
}

bool Rect_TranslateInv(Rect* out, const Rect* r, const Point* offset) {
  return raster::translate(out, *r, {raster::negateWrap(offset->x), raster::negateWrap(offset->y)});
}

bool Rect_Intersect(Rect* out, const Rect* a, const Rect* b) {
  const Rect common = raster::intersection(*a, *b);
  if (out != nullptr) {
    // Field by field: as a whole it would be put together in two registers first.
    out->left = common.left;
    out->top = common.top;
    out->right = common.right;
    out->bottom = common.bottom;
  }
  return !raster::isEmpty(common);
}

void Rect_Union(Rect* acc, const Rect* r) {
  if (raster::isEmpty(*acc)) {
    *acc = *r;
  } else if (!raster::isEmpty(*r)) {
    *acc = raster::boundingBox(*acc, *r);
  }
}

bool Rect_ContainsRect(const Rect* outer, const Rect* inner) {
  return outer->left <= inner->left && outer->top <= inner->top && outer->right >= inner->right &&
         outer->bottom >= inner->bottom;
}

bool Rect_ContainsPoint(const Rect* r, const Point* p) {
  return r->left <= p->x && p->x < r->right && r->top <= p->y && p->y < r->bottom;
}

void Rect_Test(void) {}

}  // extern "C"
