// SPDX-License-Identifier: MIT

#include "drawing.h"

#include <algorithm>

#include "failure.h"
#include "geometry.h"

namespace tool {

Placement place(const Picture& source, const Point& at, const Picture& target) {
  Rect placed;
  const Rect size = source.bounds();
  const Rect area = target.bounds();
  Placement result = {};
  if (!Rect_Translate(&placed, &size, &at) || !Rect_Intersect(&result.onTarget, &placed, &area) ||
      widthOf(result.onTarget) == 0 || heightOf(result.onTarget) == 0)
    throw Failure("at " + std::to_string(at.x) + "," + std::to_string(at.y) +
                  " nothing of the source lies on the destination");
  result.srcX = static_cast<uint32>(result.onTarget.left - at.x);
  result.srcY = static_cast<uint32>(result.onTarget.top - at.y);
  return result;
}

namespace {

/// Applies `change(channel, alpha)` to the colours of 32-bit pixels.
template <class Change> void changeColors(Picture& picture, Change change) {
  for (uint32 y = 0; y < picture.height(); ++y) {
    uint8* pixel = picture.data() + size_t{picture.pitch()} * y;
    for (uint32 x = 0; x < picture.width(); ++x, pixel += 4) {
      for (int channel = 0; channel < 3; ++channel)
        pixel[channel] = static_cast<uint8>(change(uint32{pixel[channel]}, uint32{pixel[3]}));
    }
  }
}

}  // namespace

void premultiply(Picture& picture) {
  changeColors(picture, [](uint32 channel, uint32 alpha) { return channel * alpha / 255; });
}

void unpremultiply(Picture& picture) {
  changeColors(picture, [](uint32 channel, uint32 alpha) {
    return alpha == 0 ? 0 : std::min(255u, (channel * 255 + alpha / 2) / alpha);
  });
}

}  // namespace tool
