// SPDX-License-Identifier: MIT

#include "scaledPicture.h"

#include <algorithm>
#include <cmath>

#include "raster.h"

namespace tool::live {
namespace {

uint32 scaledSize(uint32 size, double factor) {
  return std::max(1u, static_cast<uint32>(size * factor));
}

}  // namespace

ScaledPicture::ScaledPicture(uint32 sourceWidth, uint32 sourceHeight, double factor)
    : source{0, 0, static_cast<int32>(sourceWidth), static_cast<int32>(sourceHeight)},
      scale(factor),
      width(scaledSize(sourceWidth, factor)),
      height(scaledSize(sourceHeight, factor)),
      pixels(size_t{4} * width * height) {}

Rect ScaledPicture::shownOf(const Rect& part) const {
  // The pixels that a shown pixel is mixed of reach a step, at least one pixel, beyond its own;
  // and the ratio of the sizes is not quite the factor.
  const auto reach = static_cast<int32>(std::ceil(std::max(1.0, 1 / scale))) + 1;
  constexpr int32 kSlack = 2;
  const Rect whole = view().bounds();
  Rect shown = {std::max(part.left - reach, 0), std::max(part.top - reach, 0), part.right + reach,
                part.bottom + reach};
  Rect_ApplyDiffEx(&shown, &whole, &source, &shown);
  shown = {shown.left - kSlack, shown.top - kSlack, shown.right + kSlack, shown.bottom + kSlack};
  Rect_Intersect(&shown, &shown, &whole);
  return shown;
}

Point ScaledPicture::shownOf(const Point& point) const {
  const Rect whole = view().bounds();
  Point shown;
  Rect_ScalePoint(&source, &whole, &point, &shown);
  return shown;
}

Point ScaledPicture::sourceOf(const Point& shown) const {
  const Rect whole = view().bounds();
  Point point;
  Rect_ScalePoint(&whole, &source, &shown, &point);
  return point;
}

void ScaledPicture::draw(const PixelView& from, const ChangeList& changed, ChangeList& drawn) {
  constexpr int32 kSmooth = 1;
  for (const Rect& part : changed.all()) {
    const Rect shown = shownOf(part);
    Raster_Scale(pixels.data(), 4 * width, 32, 24, width, height, 0, shown.left, shown.top,
                 shown.right, shown.bottom, from.data, static_cast<int32>(from.pitch), 32, 24, 0,
                 from.width, from.height, 0, scale, scale, kSmooth);
    drawn.add(shown);
  }
}

}  // namespace tool::live
