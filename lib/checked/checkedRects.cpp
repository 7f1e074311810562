// SPDX-License-Identifier: MIT
//
// Fills, copies, raster operations and tiles.

#include "checkedView.h"

using raster::checked::Area;

namespace raster::checked {
namespace {

/// Where a copy works: two views of the same pixel size, which may overlap where they are one.
[[gnu::always_inline]] inline RasterStatus placeCopy(const RasterView* dst, const Rect* rect,
                                                     const RasterView* src, int32 srcX, int32 srcY,
                                                     uint32 flags, Area* area) {
  const RasterStatus status = placeBoth(dst, rect, src, srcX, srcY, flags, area);
  if (status != RASTER_STATUS_OK) return status;
  if (dst->bpp != src->bpp) return RASTER_STATUS_BAD_FORMAT;
  const bool same = dst->data == src->data && dst->pitch == src->pitch;
  if (!same && areNear(*dst, *src) && area->inDst(*dst).overlaps(area->inSrc(*src)))
    return RASTER_STATUS_OVERLAP;
  return RASTER_STATUS_OK;
}

/// The column (or row) of a pixmap that falls on the area's first one.
uint32 phase(int32 tile, uint32 clipped, uint32 size) {
  const int64 rest = (int64{tile} + clipped) % size;
  return static_cast<uint32>(rest < 0 ? rest + size : rest);
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_Fill(const RasterView* dst, const Rect* rect, uint32 pixel,
                                uint32 flags) {
  Area area;
  const RasterStatus status = raster::checked::placeIn(dst, rect, flags, &area);
  if (status != RASTER_STATUS_OK || area.isEmpty()) return status;
  Raster_RectFill(dst->data, dst->pitch, dst->bpp / 8, pixel, area.x, area.y, area.width,
                  area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_FillAlpha(const RasterView* dst, const Rect* rect, uint8 alpha,
                                     uint32 flags) {
  Area area;
  const RasterStatus status = raster::checked::placeIn(dst, rect, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (dst->bpp != 32) return RASTER_STATUS_BAD_FORMAT;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  Raster_RectFillAlpha(dst->data, dst->pitch, alpha, area.x, area.y, area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_RopFill(const RasterView* dst, const Rect* rect, uint32 pixel,
                                   uint32 rop, uint32 flags) {
  if (rop >= RASTER_ROP_COUNT) return RASTER_STATUS_BAD_ARGUMENT;
  Area area;
  const RasterStatus status = raster::checked::placeIn(dst, rect, flags, &area);
  if (status != RASTER_STATUS_OK || area.isEmpty()) return status;
  Raster_RectROPfill(dst->data, static_cast<int32>(dst->pitch), dst->bpp / 8, pixel, rop, area.x,
                     area.y, area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Copy(const RasterView* dst, const Rect* rect, const RasterView* src,
                                int32 srcX, int32 srcY, uint32 flags) {
  Area area;
  const RasterStatus status = raster::checked::placeCopy(dst, rect, src, srcX, srcY, flags, &area);
  if (status != RASTER_STATUS_OK || area.isEmpty()) return status;
  Raster_RectCopy(dst->data, dst->pitch, src->data, src->pitch, dst->bpp / 8, area.srcX, area.srcY,
                  area.x, area.y, area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_RopCopy(const RasterView* dst, const Rect* rect, const RasterView* src,
                                   int32 srcX, int32 srcY, uint32 rop, uint32 flags) {
  if (rop >= RASTER_ROP_COUNT) return RASTER_STATUS_BAD_ARGUMENT;
  Area area;
  const RasterStatus status = raster::checked::placeCopy(dst, rect, src, srcX, srcY, flags, &area);
  if (status != RASTER_STATUS_OK || area.isEmpty()) return status;
  Raster_RectROPcopy(dst->data, static_cast<int32>(dst->pitch), src->data,
                     static_cast<int32>(src->pitch), dst->bpp / 8, area.srcX, area.srcY, rop,
                     area.x, area.y, area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Tile(const RasterView* dst, const Rect* rect, const RasterView* pixmap,
                                int32 tileX, int32 tileY, uint32 rop, uint32 flags) {
  using namespace raster::checked;
  if (rop >= RASTER_ROP_COUNT) return RASTER_STATUS_BAD_ARGUMENT;
  Area area;
  RasterStatus status = raster::checked::checkPixels(pixmap);
  if (status == RASTER_STATUS_OK) status = raster::checked::placeIn(dst, rect, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (dst->bpp != pixmap->bpp) return RASTER_STATUS_BAD_FORMAT;
  if (pixmap->width == 0 || pixmap->height == 0) return RASTER_STATUS_BAD_ARGUMENT;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  if (areNear(*dst, *pixmap) && area.inDst(*dst).overlaps(Span(*pixmap)))
    return RASTER_STATUS_OVERLAP;
  Raster_RectPixmapROPcopy(dst->data, dst->pitch, pixmap->data, pixmap->pitch,
                           static_cast<int32>(dst->bpp / 8), phase(tileX, area.srcX, pixmap->width),
                           phase(tileY, area.srcY, pixmap->height), pixmap->width, pixmap->height,
                           rop, area.x, area.y, area.width, area.height);
  return RASTER_STATUS_OK;
}

}  // extern "C"
