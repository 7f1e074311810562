// SPDX-License-Identifier: MIT
//
// Rectangles and points: building, comparison, translation, intersection, union, containment, and
// the transforms that carry them from one frame of reference into another.
//
// Coordinates are signed 32-bit; `right` and `bottom` are exclusive. Every function accepts any
// 32-bit values: results that would overflow saturate, and the functions with a result say so.
// No function keeps state; any thread may call any of them.

#ifndef RASTER_RECT_H
#define RASTER_RECT_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

// NOLINTBEGIN(modernize-use-using)

/// The points (x, y) with left <= x < right and top <= y < bottom. Empty when right <= left or
/// bottom <= top; an empty rectangle keeps whatever coordinates it has.
typedef struct Rect {
  int32 left;
  int32 top;
  int32 right;
  int32 bottom;
} Rect;

typedef struct Point {
  int32 x;
  int32 y;
} Point;

// NOLINTEND(modernize-use-using)

TARNLIBS_EXPORT bool Rect_SetFromXYWH(Rect* r, int32 x, int32 y, int32 width, int32 height);
TARNLIBS_EXPORT bool Rect_IsEqual(const Rect* a, const Rect* b);
TARNLIBS_EXPORT bool Rect_IsSizeEqual(const Rect* a, const Rect* b);
TARNLIBS_EXPORT bool Rect_Translate(Rect* out, const Rect* r, const Point* offset);
TARNLIBS_EXPORT bool Rect_TranslateInv(Rect* out, const Rect* r, const Point* offset);
TARNLIBS_EXPORT bool Rect_Intersect(Rect* out, const Rect* a, const Rect* b);
TARNLIBS_EXPORT void Rect_Union(Rect* acc, const Rect* r);
TARNLIBS_EXPORT bool Rect_ContainsRect(const Rect* outer, const Rect* inner);
TARNLIBS_EXPORT bool Rect_ContainsPoint(const Rect* r, const Point* p);
TARNLIBS_EXPORT void Rect_Test(void);

TARNLIBS_EXPORT bool Rect_ApplyDiff(Rect* out, const Rect* to, const Rect* from, const Rect* r);
TARNLIBS_EXPORT bool Rect_ApplyDiffToPoint(Point* out, const Point* to, const Point* from,
                                           const Point* p);
TARNLIBS_EXPORT bool Rect_ApplyDiffEx(Rect* out, const Rect* to, const Rect* from, const Rect* r);
TARNLIBS_EXPORT bool Rect_IntersectPair(Rect* outIntersection, const Rect* a, const Rect* b,
                                        Rect* outMapped, const Rect* c);
TARNLIBS_EXPORT void Rect_ScalePoint(const Rect* from, const Rect* to, const Point* p, Point* out);
TARNLIBS_EXPORT int32 Rect_PointDistance(const Rect* r, const Point* p);

#ifdef __cplusplus
}
#endif

#endif
