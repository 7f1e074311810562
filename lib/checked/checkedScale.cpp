// SPDX-License-Identifier: MIT
//
// Scaling of rectangles.

#include "checkedScale.h"

#include <cmath>

#include "checkedMemory.h"

namespace raster::checked {

bool isFactor(Factors factors) {
  constexpr double kLimit = 1.0 / 32767;
  return std::isfinite(factors.x) && std::isfinite(factors.y) && factors.x > kLimit &&
         factors.y > kLimit;
}

bool scales(const RasterView& dst, const RasterView& src) {
  if (dst.depth % 8 != 0) return false;
  return haveSameFormat(dst, src) || (src.bpp == 32 && (dst.bpp == 24 || dst.bpp == 16));
}

RasterStatus drawScaled(const RasterView& dst, const Area& area, const RasterView& src,
                        Factors factors, bool smooth) {
  const auto draw = [&] {
    const auto left = static_cast<int32>(area.x);
    const auto top = static_cast<int32>(area.y);
    Raster_Scale(dst.data, dst.pitch, dst.bpp, dst.depth, dst.width, dst.height, 0, left, top,
                 left + static_cast<int32>(area.width), top + static_cast<int32>(area.height),
                 src.data, static_cast<int32>(src.pitch), src.bpp, static_cast<int32>(src.depth), 0,
                 src.width, src.height, 0, factors.x, factors.y, smooth ? 1 : 0);
  };
  return attempt(draw) ? RASTER_STATUS_OK : RASTER_STATUS_NO_MEMORY;
}

}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_Scale(const RasterView* dst, const Rect* rect, const RasterView* src,
                                 double scaleX, double scaleY, uint32 smooth, uint32 flags) {
  using namespace raster::checked;
  if (!isFactor({scaleX, scaleY}) || smooth > 1) return RASTER_STATUS_BAD_ARGUMENT;
  Area area;
  RasterStatus status = checkPixels(src);
  if (status == RASTER_STATUS_OK) status = placeIn(dst, rect, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (!scales(*dst, *src)) return RASTER_STATUS_BAD_FORMAT;
  if (!isScaleSize(dst->width, dst->height) || !isScaleSize(src->width, src->height))
    return RASTER_STATUS_TOO_BIG;
  if (area.isEmpty() || src->width == 0 || src->height == 0) return RASTER_STATUS_OK;
  if (areNear(*dst, *src) && area.inDst(*dst).overlaps(Span(*src))) return RASTER_STATUS_OVERLAP;
  return drawScaled(*dst, area, *src, {scaleX, scaleY}, smooth != 0);
}

}  // extern "C"
