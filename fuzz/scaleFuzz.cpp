// SPDX-License-Identifier: MIT
//
// Scaling with any numbers, checked and exact: nothing outside the destination rectangle is written
// and nothing outside the source is read.

#include <cmath>
#include <cstring>

#include "fuzzing.h"

using fuzz::require;

namespace {

bool isValid(const RasterView& view) { return RasterChecked_View(&view) == RASTER_STATUS_OK; }

/// The exact function takes any numbers, as long as the buffers are what it is told.
void callExact(fuzz::Choices& c, const RasterView& d, const RasterView& s) {
  const int32 x1 = fuzz::coordinate(c);
  const int32 y1 = fuzz::coordinate(c);
  const int32 x2 = fuzz::coordinate(c);
  const int32 y2 = fuzz::coordinate(c);
  const double x = c.number();
  const double y = c.number();
  Raster_Scale(d.data, d.pitch, d.bpp, d.depth, d.width, d.height, 0, x1, y1, x2, y2, s.data,
               static_cast<int32>(s.pitch), s.bpp, static_cast<int32>(s.depth), 0, s.width,
               s.height, 0, x, y, c.between(-1, 2));
  Rect r = fuzz::rect(c);
  Raster_ScaleSrcCoordinates(&r, c.word(), c.word(), x, y);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  fuzz::Choices c(bytes, size);
  const fuzz::FuzzedView dst(c);
  const fuzz::FuzzedView src(c);
  const Rect rect = fuzz::rect(c);
  const fuzz::Bytes before = dst.bytes;
  const double x = c.number();
  const double y = c.number();
  const RasterStatus status =
      RasterChecked_Scale(&dst.view, &rect, &src.view, x, y, c.below(2), c.below(2));
  require(status == RASTER_STATUS_OK || dst.bytes == before);
  require(status != RASTER_STATUS_OK || (std::isfinite(x) && std::isfinite(y)));
  if (isValid(dst.view) && isValid(src.view)) callExact(c, dst.view, src.view);
  return 0;
}
