// SPDX-License-Identifier: MIT
//
// Conversion, blending and comparison.

#include <cstring>

#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr uint32 kPaletteSize = 256;
constexpr uint32 kBlendFlags = RASTER_BLEND_USE_SRC_ALPHA | RASTER_BLEND_USE_DST_ALPHA;
constexpr RasterBlend kOver = {RASTER_BLEND_OVER, 0, 0, 0, 0};

/// Whether the converter knows the pair. One-byte colour is converted to, but only copied from.
bool converts(const RasterView& dst, const RasterView& src, bool fromPalette) {
  if (fromPalette) return src.bpp == 8;
  return src.bpp > 8 ? !isPlane(src) : haveSameFormat(dst, src);
}

bool isBlend(const RasterBlend& blend) {
  return blend.op < RASTER_BLEND_COUNT && (blend.flags & ~kBlendFlags) == 0 &&
         blend.srcAlpha <= 255 && blend.dstAlpha <= 255 && blend.staged <= 1 &&
         !(blend.op == RASTER_BLEND_SATURATE &&
           (blend.flags & uint32{RASTER_BLEND_USE_DST_ALPHA}) != 0 && blend.dstAlpha == 0);
}

/// The comparison itself, of valid views.
RasterStatus compare(const RasterView& a, const Rect* rect, const RasterView& b, int32 bX, int32 bY,
                     uint32 flags, int32* difference) {
  Area area;
  const RasterStatus status = place(a, rect, {bX, bY, b.width, b.height}, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  *difference = 0;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  *difference = Raster_ComparePixels(a.data, a.pitch, static_cast<int32>(a.bpp), b.data, b.pitch,
                                     static_cast<int32>(b.bpp), area.x, area.y, area.srcX,
                                     area.srcY, area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus checkComparison(const RasterView* a, const RasterView* b) {
  RasterStatus status = checkPixels(a);
  if (status == RASTER_STATUS_OK) status = checkPixels(b);
  if (status != RASTER_STATUS_OK) return status;
  return a->bpp == b->bpp ? RASTER_STATUS_OK : RASTER_STATUS_BAD_FORMAT;
}

RasterStatus compareList(const RasterView& a, const RasterView& b, const RectList& list,
                         uint32 flags, int32* difference) {
  int32 first = 0;
  for (const RectListEntry& entry : list.rects) {
    if (entry.height <= 0 || entry.width <= 0) break;
    const int64 right = int64{entry.x} + entry.width;
    const int64 bottom = int64{entry.y} + entry.height;
    if (right > INT32_MAX || bottom > INT32_MAX) return RASTER_STATUS_BAD_ARGUMENT;
    const Rect rect = {entry.x, entry.y, static_cast<int32>(right), static_cast<int32>(bottom)};
    int32 here = 0;
    const RasterStatus status = compare(a, &rect, b, entry.x, entry.y, flags, &here);
    if (status != RASTER_STATUS_OK) return status;
    if (first == 0) first = here;
  }
  *difference = first;
  return RASTER_STATUS_OK;
}

}  // namespace
}  // namespace raster::checked

using raster::checked::Area;

extern "C" {

RasterStatus RasterChecked_Convert(const RasterView* dst, const Rect* rect, const RasterView* src,
                                   int32 srcX, int32 srcY, const uint32* palette, uint32 colors,
                                   uint32 flags) {
  using namespace raster::checked;
  Area area;
  const RasterStatus status = placeBoth(dst, rect, src, srcX, srcY, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (!converts(*dst, *src, palette != nullptr)) return RASTER_STATUS_BAD_FORMAT;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  if (areNear(*dst, *src) && area.inDst(*dst).overlaps(area.inSrc(*src)))
    return RASTER_STATUS_OVERLAP;
  uint32 whole[kPaletteSize];
  if (palette != nullptr && colors < kPaletteSize) {
    memcpy(whole, palette, sizeof(uint32) * colors);
    memset(whole + colors, 0, sizeof(uint32) * (kPaletteSize - colors));
    palette = whole;
  }
  Raster_ConvertPixels(dst->data, dst->pitch, codeOf(*dst), src->data, src->pitch, codeOf(*src),
                       palette != nullptr, palette, area.srcX, area.srcY, area.x, area.y,
                       area.width, area.height);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Blend(const RasterView* dst, const Rect* rect, const RasterView* src,
                                 int32 srcX, int32 srcY, const RasterBlend* blend, uint32 flags) {
  using namespace raster::checked;
  const RasterBlend& how = blend != nullptr ? *blend : kOver;
  if (!isBlend(how)) return RASTER_STATUS_BAD_ARGUMENT;
  Area area;
  const RasterStatus status = placeBoth(dst, rect, src, srcX, srcY, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (src->bpp != 32 || dst->depth == 3) return RASTER_STATUS_BAD_FORMAT;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  Raster_AlphaBlend(dst->data, area.x, area.y, dst->pitch, src->data, area.srcX, area.srcY,
                    src->pitch, area.width, area.height, dst->depth, dst->bpp, how.op, how.flags,
                    how.srcAlpha, how.dstAlpha, static_cast<uint8>(how.staged));
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Compare(const RasterView* a, const Rect* rect, const RasterView* b,
                                   int32 bX, int32 bY, uint32 flags, int32* difference) {
  if (difference == nullptr) return RASTER_STATUS_NULL;
  const RasterStatus status = raster::checked::checkComparison(a, b);
  if (status != RASTER_STATUS_OK) return status;
  return raster::checked::compare(*a, rect, *b, bX, bY, flags, difference);
}

RasterStatus RasterChecked_CompareRects(const RasterView* a, const RasterView* b,
                                        const RectList* list, uint32 flags, int32* difference) {
  if (difference == nullptr || list == nullptr) return RASTER_STATUS_NULL;
  if ((flags & ~uint32{RASTER_CHECKED_CLIP}) != 0) return RASTER_STATUS_BAD_ARGUMENT;
  const RasterStatus status = raster::checked::checkComparison(a, b);
  if (status != RASTER_STATUS_OK) return status;
  return raster::checked::compareList(*a, *b, *list, flags, difference);
}

RasterStatus RasterChecked_CompareMasked(const RasterView* a, const RasterView* b,
                                         const RasterView* mask, int32 maxDiffs, bool* agree) {
  using namespace raster::checked;
  if (agree == nullptr) return RASTER_STATUS_NULL;
  if (maxDiffs < 0) return RASTER_STATUS_BAD_ARGUMENT;
  for (const RasterView* view : {a, b, mask}) {
    const RasterStatus status = checkPixels(view);
    if (status != RASTER_STATUS_OK) return status;
    if (!haveSameFormat(*view, *a)) return RASTER_STATUS_BAD_FORMAT;
    if (view->width != a->width || view->height != a->height) return RASTER_STATUS_BAD_ARGUMENT;
    if (view->pitch != rowBytes(a->width, a->bpp)) return RASTER_STATUS_BAD_VIEW;
  }
  const auto bpp = static_cast<int32>(a->bpp);
  *agree = Raster_CompareMasked(a->data, a->pitch, bpp, b->data, b->pitch, bpp, mask->data,
                                mask->pitch, bpp, 0, 0, a->width, a->height, maxDiffs);
  return RASTER_STATUS_OK;
}

}  // extern "C"
