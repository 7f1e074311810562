// SPDX-License-Identifier: MIT
//
// Cursors: expansion, drawing and scaling.

#include <cstring>

#include "checkedMemory.h"
#include "checkedScale.h"

namespace raster::checked {
namespace {

constexpr uint32 kTooLarge = 0xFFFFFFFF;  // of Raster_CalculateCursorSize
constexpr uint8 kKeepScreen = 0xFF;
constexpr uint32 kMaskPlanes = 2;

// ---- Expansion ---------------------------------------------------------------------------------

/// A plane to be expanded.
struct SourcePlane {
  uint32 depth;
  const uint8* bits;
  size_t bytes;
};

/// Checks a plane against what Raster_ExpandPlanarCursorData reads of it.
RasterStatus checkPlane(const SourcePlane& plane, uint32 width, uint32 height, uint32 bitsPerPixel,
                        const Span& dst) {
  if (plane.depth != 1 && plane.depth != bitsPerPixel) return RASTER_STATUS_BAD_FORMAT;
  const uint32 needed = Raster_CalculateCursorSize(width, height, plane.depth);
  if (needed > plane.bytes) return RASTER_STATUS_TRUNCATED;
  if (needed != 0 && plane.bits == nullptr) return RASTER_STATUS_NULL;
  return Span(plane.bits, needed).overlaps(dst) ? RASTER_STATUS_OVERLAP : RASTER_STATUS_OK;
}

// ---- Planes ------------------------------------------------------------------------------------

bool isMask(const RasterCursor& cursor) { return cursor.type == RASTER_CURSOR_MASK; }

/// A plane without gaps as a view.
RasterView planeView(const RasterCursor& cursor, uint8* data, size_t bytes) {
  const uint32 bpp = isMask(cursor) ? cursor.bpp : 32;
  const uint32 depth = isMask(cursor) ? cursor.depth : 24;
  const uint64 pitch = std::min<uint64>(rowBytes(cursor.width, bpp), UINT32_MAX);
  return {data, bytes, static_cast<uint32>(pitch), cursor.width, cursor.height, depth, bpp};
}

/// The planes of a cursor as views; both are the same for one with alpha.
struct CursorPlanes {
  RasterView first;
  RasterView second;
};

RasterStatus takePlanes(const RasterCursor* cursor, size_t planeBytes, CursorPlanes* planes) {
  if (cursor == nullptr) return RASTER_STATUS_NULL;
  if (cursor->type > RASTER_CURSOR_ALPHA) return RASTER_STATUS_BAD_ARGUMENT;
  const bool mask = isMask(*cursor);
  uint8* const first = mask ? cursor->andMask : cursor->pixels;
  uint8* const second = mask ? cursor->xorMask : first;
  *planes = {planeView(*cursor, first, planeBytes), planeView(*cursor, second, planeBytes)};
  const RasterStatus status = checkPixels(&planes->first);
  return status != RASTER_STATUS_OK ? status : checkPixels(&planes->second);
}

// ---- Drawing -----------------------------------------------------------------------------------

/// Whether the cursor can be drawn into the frame buffer and, unless it is null, into `save`.
RasterStatus checkFormats(const RasterView& fb, const RasterView* save, const RasterCursor& cursor,
                          const RasterView& plane) {
  if (isMask(cursor) ? !haveSameFormat(fb, plane) : fb.depth == 3) return RASTER_STATUS_BAD_FORMAT;
  if (save == nullptr) return RASTER_STATUS_OK;
  const RasterStatus status = checkPixels(save);
  if (status != RASTER_STATUS_OK) return status;
  return haveSameFormat(fb, *save) ? RASTER_STATUS_OK : RASTER_STATUS_BAD_FORMAT;
}

/// Whether what is visible has room in `save`.
RasterStatus checkRoom(const RasterView& fb, const RasterView& save, const RasterCursorBox& box) {
  const auto width = static_cast<uint32>(box.width);
  const auto height = static_cast<uint32>(box.height);
  if (width > save.width || height > save.height) return RASTER_STATUS_OUTSIDE;
  const Span area(fb, static_cast<uint32>(box.x), static_cast<uint32>(box.y), width, height);
  return area.overlaps({save, 0, 0, width, height}) ? RASTER_STATUS_OVERLAP : RASTER_STATUS_OK;
}

// ---- Scaling -----------------------------------------------------------------------------------

RasterStatus scaledSize(uint32 width, uint32 height, int32 hotX, int32 hotY, Factors factors,
                        const RasterLimits& limits, RasterScaledCursor* size) {
  if (!isFactor(factors)) return RASTER_STATUS_BAD_ARGUMENT;
  // Up to here no number of the sizes wraps.
  if (!isScaleSize(width, height) || factors.x > kScaleSizeEnd || factors.y > kScaleSizeEnd)
    return RASTER_STATUS_TOO_BIG;
  int32 hot[2];
  size->planeBytes = Raster_GetScaledCursorSize(&size->paddedWidth, &size->paddedHeight,
                                                &size->width, &size->height, hot, width, height,
                                                factors.x, factors.y, hotX, hotY);
  size->hotX = hot[0];
  size->hotY = hot[1];
  if (!isScaleSize(size->paddedWidth, size->paddedHeight) ||
      !isScaleSize(size->width, size->height))
    return RASTER_STATUS_TOO_BIG;
  const uint64 paddedBytes = uint64{4} * size->paddedWidth * size->paddedHeight;
  const bool keeps = size->width <= limits.width && size->height <= limits.height &&
                     std::max<uint64>(size->planeBytes, paddedBytes) <= limits.pixelBytes;
  return keeps ? RASTER_STATUS_OK : RASTER_STATUS_LIMIT;
}

RasterView packedView(uint8* data, uint32 width, uint32 height) {
  const uint32 pitch = 4 * width;
  return {data, size_t{pitch} * height, pitch, width, height, 24, 32};
}

/// Scales one plane with a margin of `fill` around it, in a padded buffer of the caller.
RasterStatus scalePlane(const RasterView& plane, const RasterScaledCursor& size, Factors factors,
                        uint8 fill, bool smooth, uint8* padded, uint8* dst) {
  const RasterView around = packedView(padded, size.paddedWidth, size.paddedHeight);
  const RasterView to = packedView(dst, size.width, size.height);
  memset(padded, fill, around.bytes);
  if (plane.width != 0 && plane.height != 0)  // else there may be no data
    Raster_RectCopy(padded, around.pitch, plane.data, plane.pitch, 4, 0, 0,
                    (size.paddedWidth - plane.width) / 2, (size.paddedHeight - plane.height) / 2,
                    plane.width, plane.height);
  return drawScaled(to, {0, 0, 0, 0, to.width, to.height}, around, factors, smooth);
}

/// Both planes of a mask cursor, or the one of a cursor with alpha.
RasterStatus scalePlanes(const RasterCursor& cursor, const CursorPlanes& planes,
                         const RasterScaledCursor& size, Factors factors, uint8* padded,
                         uint8* dst) {
  if (!isMask(cursor)) return scalePlane(planes.first, size, factors, 0, true, padded, dst);
  const RasterStatus status =
      scalePlane(planes.first, size, factors, kKeepScreen, false, padded, dst);
  if (status != RASTER_STATUS_OK) return status;
  return scalePlane(planes.second, size, factors, 0, false, padded, dst + size.planeBytes);
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_ExpandCursor(uint32 width, uint32 height, uint32 andDepth,
                                        const uint8* andBits, size_t andBytes, uint32 xorDepth,
                                        const uint8* xorBits, size_t xorBytes, uint32 bitsPerPixel,
                                        uint8* dst, size_t dstBytes) {
  using namespace raster::checked;
  if (bitsPerPixel % 8 != 0 || bitsPerPixel == 0 || bitsPerPixel > 32)
    return RASTER_STATUS_BAD_FORMAT;
  if (width > INT32_MAX || height > INT32_MAX) return RASTER_STATUS_TOO_BIG;
  const uint32 size = Raster_CalculateCursorSize(width, height, bitsPerPixel);
  if (size > kTooLarge / 2) return RASTER_STATUS_TOO_BIG;
  if (2 * size > dstBytes) return RASTER_STATUS_OUTSIDE;
  if (size != 0 && dst == nullptr) return RASTER_STATUS_NULL;
  const Span made(dst, 2 * size);
  RasterStatus status =
      checkPlane({andDepth, andBits, andBytes}, width, height, bitsPerPixel, made);
  if (status == RASTER_STATUS_OK)
    status = checkPlane({xorDepth, xorBits, xorBytes}, width, height, bitsPerPixel, made);
  if (status != RASTER_STATUS_OK || size == 0) return status;
  Raster_ExpandPlanarCursorData(width, height, andDepth, andBits, xorDepth, xorBits, bitsPerPixel,
                                dst, 2 * size);
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_DrawCursor(const RasterView* fb, const RasterView* save,
                                      const RasterCursor* cursor, size_t planeBytes, int32 x,
                                      int32 y, RasterCursorBox* box) {
  using namespace raster::checked;
  CursorPlanes planes{};
  RasterStatus status = checkPixels(fb);
  if (status == RASTER_STATUS_OK) status = takePlanes(cursor, planeBytes, &planes);
  if (status == RASTER_STATUS_OK) status = checkFormats(*fb, save, *cursor, planes.first);
  if (status != RASTER_STATUS_OK) return status;
  const RasterFrameBufferDesc desc = {fb->width, fb->height, fb->depth, fb->bpp, fb->pitch};
  RasterCursorBox visible = {};
  if (Raster_ComputeCursorBox(&desc, cursor, x, y, &visible)) {
    if (save != nullptr) status = checkRoom(*fb, *save, visible);
    if (status != RASTER_STATUS_OK) return status;
    Raster_DrawCursor(fb->data, &desc, save != nullptr ? save->data : nullptr,
                      save != nullptr ? save->pitch : 0, cursor, &visible);
  }
  if (box != nullptr) *box = visible;
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_ScaledCursorSize(uint32 width, uint32 height, int32 hotX, int32 hotY,
                                            double scaleX, double scaleY,
                                            const RasterLimits* limits,
                                            RasterScaledCursor* scaled) {
  using namespace raster::checked;
  if (scaled == nullptr) return RASTER_STATUS_NULL;
  RasterScaledCursor size{};
  const RasterStatus status =
      scaledSize(width, height, hotX, hotY, {scaleX, scaleY}, limitsOf(limits), &size);
  if (status == RASTER_STATUS_OK) *scaled = size;
  return status;
}

RasterStatus RasterChecked_ScaleCursor(const RasterCursor* cursor, size_t planeBytes, double scaleX,
                                       double scaleY, const RasterLimits* limits, uint8* dst,
                                       size_t dstBytes, RasterScaledCursor* scaled) {
  using namespace raster::checked;
  CursorPlanes planes{};
  RasterScaledCursor size{};
  RasterStatus status = takePlanes(cursor, planeBytes, &planes);
  if (status != RASTER_STATUS_OK) return status;
  if (!hasFormat(planes.first, 24, 32)) return RASTER_STATUS_BAD_FORMAT;
  const Factors factors = {scaleX, scaleY};
  status = scaledSize(cursor->width, cursor->height, cursor->hotX, cursor->hotY, factors,
                      limitsOf(limits), &size);
  if (status != RASTER_STATUS_OK) return status;
  const uint64 bytes = uint64{size.planeBytes} * (isMask(*cursor) ? kMaskPlanes : 1);
  if (dst == nullptr) return RASTER_STATUS_NULL;
  if (bytes > dstBytes) return RASTER_STATUS_OUTSIDE;
  const Span made(dst, bytes);
  if (made.overlaps(Span(planes.first)) || made.overlaps(Span(planes.second)))
    return RASTER_STATUS_OVERLAP;
  const OwnedBytes padded = OwnedBytes::ofSize(uint64{4} * size.paddedWidth * size.paddedHeight);
  // Made elsewhere first: the second plane may find no memory.
  const OwnedBytes planesMade = OwnedBytes::ofSize(bytes);
  if (!padded || !planesMade) return RASTER_STATUS_NO_MEMORY;
  status = scalePlanes(*cursor, planes, size, factors, padded.get(), planesMade.get());
  if (status != RASTER_STATUS_OK) return status;
  memcpy(dst, planesMade.get(), static_cast<size_t>(bytes));
  if (scaled != nullptr) *scaled = size;
  return RASTER_STATUS_OK;
}

}  // extern "C"
