// SPDX-License-Identifier: MIT
//
// A picture shown larger or smaller, of which only what changes is drawn again.

#ifndef RASTER_TOOLS_LIVE_SCALED_PICTURE_H
#define RASTER_TOOLS_LIVE_SCALED_PICTURE_H

#include <vector>

#include "changeList.h"
#include "pixelView.h"

namespace tool::live {

class ScaledPicture {
 public:
  /// `factor` is shown pixels per pixel.
  ScaledPicture(uint32 sourceWidth, uint32 sourceHeight, double factor);

  PixelView view() const { return {pixels.data(), 4 * width, width, height}; }
  uint8* data() { return pixels.data(); }

  /// Draws what of a picture has changed, and adds to `drawn` where.
  void draw(const PixelView& from, const ChangeList& changed, ChangeList& drawn);

  /// The part of the scaled picture that a part of the source has to do with.
  Rect shownOf(const Rect& part) const;
  Point shownOf(const Point& point) const;
  Point sourceOf(const Point& shown) const;

 private:
  Rect source;
  double scale;
  uint32 width;
  uint32 height;
  std::vector<uint8> pixels;
};

}  // namespace tool::live

#endif
