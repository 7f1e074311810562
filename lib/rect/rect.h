// SPDX-License-Identifier: MIT
/// \file
/// Rectangles and points: building, comparison, translation, intersection, union, containment, and
/// the transforms that carry them from one frame of reference into another.
///
/// Coordinates are signed 32-bit; `right` and `bottom` are exclusive. Any values are accepted: what
/// would overflow saturates, and functions with a result say so. Any thread may call any of them.

#ifndef RASTER_RECT_H
#define RASTER_RECT_H

#include "baseTypes.h"
#include "rasterExport.h"

#ifdef __cplusplus
extern "C" {
#endif

/// The points (x, y) with left <= x < right and top <= y < bottom. Empty when right <= left or
/// bottom <= top; an empty rectangle keeps whatever coordinates it has.
typedef struct Rect {
  int32 left;    ///< the first column
  int32 top;     ///< the first row
  int32 right;   ///< the column after the last one
  int32 bottom;  ///< the row after the last one
} Rect;

/// A pixel, by its place.
typedef struct Point {
  int32 x;  ///< the column
  int32 y;  ///< the row
} Point;

// ---- Rectangles --------------------------------------------------------------------------------

/// \defgroup rect_rectangles Rectangles
///
/// Where a sum saturates, a + b is formed with wrap-around; when it went the wrong way the largest
/// or the smallest 32-bit number is stored instead, and the call returns false. Outputs may be the
/// same records as inputs. No pointer may be null unless it says so.
/// @{

/// Fills `r` from an origin and a size. True when neither size is negative and neither sum
/// saturated. A size of 0 is valid. A negative size collapses its side to the origin.
RASTER_EXPORT bool Rect_SetFromXYWH(Rect* r, int32 x, int32 y, int32 width, int32 height);

/// Whether all four fields agree. Two empty rectangles are equal whatever their coordinates.
RASTER_EXPORT bool Rect_IsEqual(const Rect* a, const Rect* b);

/// Whether width and height (right - left and bottom - top, with wrap-around) agree. Two empty
/// rectangles are of equal size.
RASTER_EXPORT bool Rect_IsSizeEqual(const Rect* a, const Rect* b);

/// Stores `r` moved by `offset`. Each of the four sums saturates by itself; true when none did.
RASTER_EXPORT bool Rect_Translate(Rect* out, const Rect* r, const Point* offset);

/// Stores `r` moved by minus `offset`: Rect_Translate with both offsets negated.
///
/// Deliberate: the negation wraps around, so an offset of -0x80000000 stays what it is and moves
/// `r` the other way.
RASTER_EXPORT bool Rect_TranslateInv(Rect* out, const Rect* r, const Point* offset);

/// Whether `a` and `b` have points in common. `out` (may be null) receives the larger left and top
/// and the smaller right and bottom, also when that is empty.
RASTER_EXPORT bool Rect_Intersect(Rect* out, const Rect* a, const Rect* b);

/// Grows `acc` to the bounding box of both. An empty `acc` becomes a copy of `r`, even of an empty
/// one; an empty `r` leaves any other `acc` alone.
RASTER_EXPORT void Rect_Union(Rect* acc, const Rect* r);

/// Whether the edges of `inner` lie within those of `outer`.
///
/// Deliberate: unlike elsewhere emptiness plays no part. An empty `inner` is contained only when
/// its coordinates lie within, and an empty `outer` contains a rectangle of the same coordinates.
RASTER_EXPORT bool Rect_ContainsRect(const Rect* outer, const Rect* inner);

/// Whether the pixel at `p` lies in `r`.
RASTER_EXPORT bool Rect_ContainsPoint(const Rect* r, const Point* p);

/// Does nothing.
RASTER_EXPORT void Rect_Test(void);

/// @}

// ---- Transforms --------------------------------------------------------------------------------

/// \defgroup rect_transforms Transforms
///
/// A frame of reference is a rectangle. Sums here are exact in 64 bits and then saturate to 32; the
/// functions with a result return false when a field saturated, and store all fields all the same.
/// The size of a rectangle along an axis is 0 when that axis is empty, and at most 0x7FFFFFFF.
/// Outputs may be the same records as inputs. Mind the order of the arguments, which is not the
/// same everywhere.
/// @{

/// Moves every edge of `r` by the difference of that edge of `to` and `from`:
/// out = r + to - from. Edges move independently, so a difference in size carries over.
RASTER_EXPORT bool Rect_ApplyDiff(Rect* out, const Rect* to, const Rect* from, const Rect* r);

/// out = p + to - from.
RASTER_EXPORT bool Rect_ApplyDiffToPoint(Point* out, const Point* to, const Point* from,
                                         const Point* p);

/// Carries `r` from the frame `from` into the frame `to`: each edge's offset from the same edge of
/// `from` is multiplied by the size of `to` and divided by that of `from`, truncated toward zero,
/// and added to the edge of `to`. Along an axis of equal sizes the offset is not scaled. `from`
/// must not be empty along an axis where `to` is not (a division by zero).
RASTER_EXPORT bool Rect_ApplyDiffEx(Rect* out, const Rect* to, const Rect* from, const Rect* r);

/// Stores the intersection of `a` and `b` in `outIntersection`, and that intersection carried from
/// the frame `a` into the frame `c`, as by Rect_ApplyDiffEx, in `outMapped`. Either output may be
/// null. When the intersection, `c` or the carried rectangle is empty, both outputs are set to zero
/// and the result is false; saturation alone does not make it false.
RASTER_EXPORT bool Rect_IntersectPair(Rect* outIntersection, const Rect* a, const Rect* b,
                                      Rect* outMapped, const Rect* c);

/// Carries a point by scaling: along each axis its distance from the first pixel of `from` is
/// multiplied by the size of `to`, divided by the size of `from` and rounded down (toward minus
/// infinity). When `to` is the larger one, both sizes count one less, so that the first and the
/// last pixel of `from` meet the first and the last pixel of `to`. A divisor that is not positive
/// counts as 1; the result saturates.
///
/// Deliberate: the distance is taken with 32-bit wrap-around.
RASTER_EXPORT void Rect_ScalePoint(const Rect* from, const Rect* to, const Point* p, Point* out);

/// Returns the distance of `p` from `r` along the axis where it is larger: positive outside, 0 on
/// the outermost pixels, negative inside. Differences saturate as the sums of Rect_Translate do.
RASTER_EXPORT int32 Rect_PointDistance(const Rect* r, const Point* p);

/// @}

#ifdef __cplusplus
}
#endif

#endif
