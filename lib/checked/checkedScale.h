// SPDX-License-Identifier: MIT
//
// Scaling between views, for rectangles, cursors and images alike.

#ifndef RASTER_CHECKED_SCALE_H
#define RASTER_CHECKED_SCALE_H

#include "checkedView.h"

namespace raster::checked {

/// Destination pixels per source pixel.
struct Factors {
  double x, y;
};

/// Whether both factors are numbers that Raster_Scale takes.
bool isFactor(Factors factors);

/// Whether Raster_Scale knows the pair of formats.
bool scales(const RasterView& dst, const RasterView& src);

/// Draws an area of the scaled picture. The views are valid, and everything fits Raster_Scale.
RasterStatus drawScaled(const RasterView& dst, const Area& area, const RasterView& src,
                        Factors factors, bool smooth);

/// The sizes of pictures that can be scaled.
inline constexpr uint32 kScaleSizeEnd = 32768;
inline bool isScaleSize(uint32 width, uint32 height) {
  return width < kScaleSizeEnd && height < kScaleSizeEnd;
}

}  // namespace raster::checked

#endif
