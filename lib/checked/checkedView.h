// SPDX-License-Identifier: MIT
//
// The checks that the functions share: views, and rectangles in views.

#ifndef RASTER_CHECKED_VIEW_H
#define RASTER_CHECKED_VIEW_H

#include <algorithm>
#include <cstdint>

#include "rasterChecked.h"

namespace raster::checked {

/// The limits that a function was given, or the defaults.
RasterLimits limitsOf(const RasterLimits* given);

// ---- Views -------------------------------------------------------------------------------------

inline bool isFormat(uint32 depth, uint32 bpp) {
  switch (bpp) {
    case 32:
    case 24:
      return depth == 24;
    case 16:
      return depth == 16 || depth == 15;
    case 8:
      return depth == 8 || depth == 6 || depth == 3;
    default:
      return bpp == 1 && depth == 1;
  }
}

inline bool isPlane(const RasterView& view) { return view.bpp == 1; }
inline bool hasFormat(const RasterView& view, uint32 depth, uint32 bpp) {
  return view.depth == depth && view.bpp == bpp;
}
inline bool haveSameFormat(const RasterView& a, const RasterView& b) {
  return hasFormat(a, b.depth, b.bpp);
}

/// The format's code, as Raster_GetBPPDepth gives it.
inline int32 codeOf(const RasterView& view) {
  return static_cast<int32>(view.bpp == 32 ? 32 : view.depth);
}

inline uint64 rowBytes(uint32 width, uint32 bpp) { return (uint64{width} * bpp + 7) / 8; }

/// The bytes from the first to the last one of some rows, the gap behind the last one left out.
inline uint64 rowsBytes(uint32 width, uint32 height, uint32 pitch, uint32 bpp) {
  return width == 0 || height == 0 ? 0 : uint64{height - 1} * pitch + rowBytes(width, bpp);
}

/// RasterChecked_View.
inline RasterStatus checkView(const RasterView* view) {
  if (view == nullptr) return RASTER_STATUS_NULL;
  if (!isFormat(view->depth, view->bpp)) return RASTER_STATUS_BAD_FORMAT;
  // Of pixels of 2 and 4 bytes there are only whole ones in a row.
  const uint32 part = view->bpp == 16 || view->bpp == 32 ? view->bpp / 8 - 1 : 0;
  if (view->width > INT32_MAX || view->height > INT32_MAX || view->pitch > INT32_MAX ||
      view->pitch < rowBytes(view->width, view->bpp) || (view->pitch & part) != 0)
    return RASTER_STATUS_BAD_VIEW;
  const uint64 needed = rowsBytes(view->width, view->height, view->pitch, view->bpp);
  if (needed > view->bytes) return RASTER_STATUS_BAD_VIEW;
  return needed != 0 && view->data == nullptr ? RASTER_STATUS_NULL : RASTER_STATUS_OK;
}

/// As checkView, for views of whole pixels.
inline RasterStatus checkPixels(const RasterView* view) {
  const RasterStatus status = checkView(view);
  return status == RASTER_STATUS_OK && isPlane(*view) ? RASTER_STATUS_BAD_FORMAT : status;
}

/// The memory of a rectangle of a view: from the first to the last byte, gaps included.
struct Span {
  uintptr_t first;
  uintptr_t end;

  Span(const void* bytes, uint64 size)
      : first(reinterpret_cast<uintptr_t>(bytes)), end(first + static_cast<uintptr_t>(size)) {}
  Span(const RasterView& view, uint32 x, uint32 y, uint32 width, uint32 height)
      : Span(view.data, rowsBytes(width, height, view.pitch, view.bpp)) {
    const uintptr_t offset =
        uintptr_t{y} * view.pitch + uintptr_t{x} / 8 * view.bpp + uintptr_t{x} % 8 * view.bpp / 8;
    first += offset;
    end += offset;
  }
  explicit Span(const RasterView& view) : Span(view, 0, 0, view.width, view.height) {}

  bool overlaps(const Span& other) const { return first < other.end && other.first < end; }
};

// ---- Rectangles --------------------------------------------------------------------------------

/// Where a call works once it is checked and clipped: in the destination and in the source.
struct Area {
  uint32 x, y;
  uint32 srcX, srcY;
  uint32 width, height;

  bool isEmpty() const { return width == 0 || height == 0; }
  Span inDst(const RasterView& view) const { return {view, x, y, width, height}; }
  Span inSrc(const RasterView& view) const { return {view, srcX, srcY, width, height}; }
};

/// A source of any size and the place in it that falls on the top left of the rectangle.
struct Source {
  int64 x, y;
  int64 width, height;
};
inline constexpr int64 kEndless = int64{1} << 40;
/// For calls without a source: the area's place in it is how much was clipped off.
inline constexpr Source kNoSource = {0, 0, kEndless, kEndless};

/// One side of an area, as numbers of any size.
struct Side {
  int64 to;
  int64 from;
  int64 size;

  /// Cuts off what lies outside; false when there was something.
  bool cut(int64 toSize, int64 fromSize) {
    if (to >= 0 && from >= 0 && to + size <= toSize && from + size <= fromSize) return true;
    const int64 low = std::max<int64>(0, std::max(-to, -from));
    const int64 high = std::min(size, std::min(toSize - to, fromSize - from));
    *this = {to + low, from + low, std::max<int64>(0, high - low)};
    return false;
  }
};

/// Checks a rectangle (null: the whole view) against a valid view and its source, and clips it if
/// the flags say so. The one place where coordinates are compared with sizes.
inline RasterStatus place(const RasterView& dst, const Rect* rect, const Source& src, uint32 flags,
                          Area* area) {
  if ((flags & ~uint32{RASTER_CHECKED_CLIP}) != 0) return RASTER_STATUS_BAD_ARGUMENT;
  Side column = {0, src.x, dst.width};
  Side row = {0, src.y, dst.height};
  if (rect != nullptr) {
    column = {rect->left, src.x, int64{rect->right} - rect->left};
    row = {rect->top, src.y, int64{rect->bottom} - rect->top};
  }
  *area = {};
  if (column.size <= 0 || row.size <= 0) return RASTER_STATUS_OK;
  const bool inColumns = column.cut(dst.width, src.width);
  const bool inRows = row.cut(dst.height, src.height);
  if (!(inColumns && inRows) && flags == 0) return RASTER_STATUS_OUTSIDE;
  if (column.size == 0 || row.size == 0) return RASTER_STATUS_OK;
  *area = {static_cast<uint32>(column.to),   static_cast<uint32>(row.to),
           static_cast<uint32>(column.from), static_cast<uint32>(row.from),
           static_cast<uint32>(column.size), static_cast<uint32>(row.size)};
  return RASTER_STATUS_OK;
}

/// As place, for a destination of whole pixels that is still to be checked, and no source.
inline RasterStatus placeIn(const RasterView* dst, const Rect* rect, uint32 flags, Area* area) {
  const RasterStatus status = checkPixels(dst);
  return status != RASTER_STATUS_OK ? status : place(*dst, rect, kNoSource, flags, area);
}

/// As place, for two views that are still to be checked; the source may be a bit plane.
inline RasterStatus placeBoth(const RasterView* dst, const Rect* rect, const RasterView* src,
                              int32 srcX, int32 srcY, uint32 flags, Area* area) {
  RasterStatus status = checkPixels(dst);
  if (status == RASTER_STATUS_OK) status = checkView(src);
  if (status != RASTER_STATUS_OK) return status;
  return place(*dst, rect, {srcX, srcY, src->width, src->height}, flags, area);
}

}  // namespace raster::checked

#endif
