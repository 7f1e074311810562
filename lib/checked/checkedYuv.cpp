// SPDX-License-Identifier: MIT
//
// Video frames.

#include "checkedView.h"

namespace raster::checked {
namespace {

uint64 halfUp(uint32 n) { return uint64{n} / 2 + n % 2; }

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_YuvBytes(uint32 format, uint32 width, uint32 height, uint64* bytes) {
  using namespace raster::checked;
  constexpr uint32 kMaxSize = INT32_MAX;  // of a view
  if (bytes == nullptr) return RASTER_STATUS_NULL;
  if (width > kMaxSize || height > kMaxSize) return RASTER_STATUS_TOO_BIG;
  switch (format) {
    case RASTER_VIDEO_YUY2:
    case RASTER_VIDEO_UYVY:
      *bytes = uint64{width} * height / 2 * 4;
      return RASTER_STATUS_OK;
    case RASTER_VIDEO_YV12:
      *bytes = 6 * halfUp(width) * halfUp(height);
      return RASTER_STATUS_OK;
    default:
      return RASTER_STATUS_BAD_FORMAT;
  }
}

RasterStatus RasterChecked_YuvToRgb(const RasterView* dst, const uint8* frame, size_t frameBytes,
                                    uint32 format) {
  using namespace raster::checked;
  uint64 needed = 0;
  RasterStatus status = checkPixels(dst);
  if (status == RASTER_STATUS_OK)
    status = RasterChecked_YuvBytes(format, dst->width, dst->height, &needed);
  if (status != RASTER_STATUS_OK) return status;
  if (dst->bpp == 8) return RASTER_STATUS_BAD_FORMAT;
  if (dst->pitch != rowBytes(dst->width, dst->bpp)) return RASTER_STATUS_BAD_VIEW;
  if (needed > UINT32_MAX) return RASTER_STATUS_TOO_BIG;
  if (needed > frameBytes) return RASTER_STATUS_TRUNCATED;
  if (needed == 0) return RASTER_STATUS_OK;
  if (frame == nullptr) return RASTER_STATUS_NULL;
  if (Span(*dst).overlaps(Span(frame, needed))) return RASTER_STATUS_OVERLAP;
  Raster_YUVtoRGB(frame, dst->data, dst->width, dst->height, format, codeOf(*dst));
  return RASTER_STATUS_OK;
}

}  // extern "C"
