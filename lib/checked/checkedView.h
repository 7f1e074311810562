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

/// The depths of pixels of 0 to 4 bytes, a bit each.
inline constexpr uint32 kDepths[] = {0, 1u << 8 | 1u << 6 | 1u << 3, 1u << 16 | 1u << 15, 1u << 24,
                                     1u << 24};

inline bool isFormat(uint32 depth, uint32 bpp) {
  if (bpp == 1) return depth == 1;
  return bpp <= 32 && bpp % 8 == 0 && depth < 32 && (kDepths[bpp / 8] >> depth & 1) != 0;
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
  if ((view->width | view->height | view->pitch) > INT32_MAX ||
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

/// Whether two valid views may have memory in common: what is cheap to ask before the same question
/// about parts of them. Gaps behind their last rows count.
inline bool areNear(const RasterView& a, const RasterView& b) {
  const uint64 atA = reinterpret_cast<uintptr_t>(a.data);
  const uint64 atB = reinterpret_cast<uintptr_t>(b.data);
  return atA < atB + uint64{b.pitch} * b.height && atB < atA + uint64{a.pitch} * a.height;
}

/// The size of a source and the place in it that falls on the top left of the rectangle.
struct Source {
  int32 x, y;
  uint32 width, height;
};
/// For calls without a source, which is never too small then: the area's place in it is how much
/// was clipped off.
inline constexpr Source kNoSource = {0, 0, UINT32_MAX, UINT32_MAX};

/// Whether a piece from `first` to `end`, which is not empty, lies in a view's side, and as much
/// from `from` on in a source's.
inline bool fits(int32 first, int32 end, uint32 viewSize, int32 from, uint32 sourceSize) {
  return first >= 0 && static_cast<uint32>(end) <= viewSize && from >= 0 &&
         static_cast<uint32>(from) <= sourceSize &&
         static_cast<uint32>(end - first) <= sourceSize - static_cast<uint32>(from);
}

/// What is left of a rectangle that is not empty.
Area clipped(const RasterView& dst, Rect rect, Source src);

/// Checks a rectangle (null: the whole view) against a valid view and its source, and clips it if
/// the flags say so. The one place where coordinates are compared with sizes.
inline RasterStatus place(const RasterView& dst, const Rect* given, Source src, uint32 flags,
                          Area* area) {
  if ((flags & ~uint32{RASTER_CHECKED_CLIP}) != 0) return RASTER_STATUS_BAD_ARGUMENT;
  Rect rect = {0, 0, static_cast<int32>(dst.width), static_cast<int32>(dst.height)};
  if (given != nullptr) rect = *given;
  if (rect.right <= rect.left || rect.bottom <= rect.top) {
    *area = {};
  } else if (fits(rect.left, rect.right, dst.width, src.x, src.width) &&
             fits(rect.top, rect.bottom, dst.height, src.y, src.height)) {
    *area = {static_cast<uint32>(rect.left),
             static_cast<uint32>(rect.top),
             static_cast<uint32>(src.x),
             static_cast<uint32>(src.y),
             static_cast<uint32>(rect.right - rect.left),
             static_cast<uint32>(rect.bottom - rect.top)};
  } else if (flags == 0) {
    return RASTER_STATUS_OUTSIDE;
  } else {
    *area = clipped(dst, rect, src);
  }
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
