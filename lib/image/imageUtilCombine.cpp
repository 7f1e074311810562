// SPDX-License-Identifier: MIT
//
// Several images laid out into one.

#include <algorithm>
#include <cstdlib>

#include "imageUtil.h"
#include "imageUtilPriv.h"
#include "raster.h"
#include "ops/rasteropsInternal.h"
#include "rect.h"

namespace raster {
namespace {

constexpr uint8 kOpaque = 0xFF;

/// The images' bounding rectangle and the sum of their areas.
struct Extent {
  Rect bounds;
  uint64 area;
};

Extent measure(const ImageUtilImage* images, const int32* positions, uint32 count) {
  Extent extent{};
  for (uint32 i = 0; i < count; ++i) {
    Rect r{};
    Rect_SetFromXYWH(&r, positions[2 * size_t{i}], positions[2 * size_t{i} + 1],
                     static_cast<int32>(images[i].width), static_cast<int32>(images[i].height));
    Rect_Union(&extent.bounds, &r);
    extent.area += uint64{images[i].width} * images[i].height;
  }
  return extent;
}

/// The distance from `low` to `high`: 0 when it is negative, saturated when it is too large.
uint32 distance(int32 low, int32 high) {
  const int64 exact = int64{high} - low;
  return static_cast<uint32>(std::clamp<int64>(exact, 0, INT32_MAX));
}

/// An image's place in the result, cut to it. Only rectangles that saturated when they were
/// measured reach past it.
struct Place {
  uint32 x, y, width, height;
};

Place placeOf(const ImageUtilImage& image, const int32* position, const Rect& bounds,
              const ImageUtilImage& result) {
  Place place{};
  place.x = static_cast<uint32>(position[0]) - static_cast<uint32>(bounds.left);
  place.y = static_cast<uint32>(position[1]) - static_cast<uint32>(bounds.top);
  if (place.x >= result.width || place.y >= result.height) return place;
  place.width = std::min(image.width, result.width - place.x);
  place.height = std::min(image.height, result.height - place.y);
  return place;
}

/// Converts an image into the 32-bit result and makes its pixels opaque. `bppDepth` is the first
/// image's.
void placeConverted(const ImageUtilImage& image, uint32 bppDepth, const Place& p,
                    const ImageUtilImage& result) {
  Raster_ConvertPixels(result.data, result.bytesPerLine,
                       static_cast<int32>(Raster_GetBPPDepth(result.depth, result.bpp)), image.data,
                       image.bytesPerLine, static_cast<int32>(bppDepth), false, nullptr, 0, 0, p.x,
                       p.y, p.width, p.height);
  Raster_RectFillAlpha(result.data, result.bytesPerLine, kOpaque, p.x, p.y, p.width, p.height);
}

void placeCopied(const ImageUtilImage& image, const Place& p, const ImageUtilImage& result) {
  rectCopy({result.data, pitchOf(result.bytesPerLine), p.x, p.y},
           {image.data, pitchOf(image.bytesPerLine), 0, 0}, result.bpp / 8, p.width, p.height);
}

/// Makes the result's record and its pixels, all zero. False when there is no memory for them.
bool allocateResult(const Extent& extent, const ImageUtilImage& first, ImageUtilImage* result) {
  result->width = distance(extent.bounds.left, extent.bounds.right);
  result->height = distance(extent.bounds.top, extent.bounds.bottom);
  // Deliberate: gaps and overlaps of equal area cancel out, and the product is 32 bits wide.
  const bool covered = result->width * result->height == extent.area;
  const bool keepsFormat = covered || first.bpp == 32;
  result->depth = keepsFormat ? first.depth : 24;
  result->bpp = keepsFormat ? first.bpp : 32;
  if (!paddedRowBytes(result->width, result->bpp / 8, &result->bytesPerLine)) return false;
  result->data = static_cast<uint8*>(calloc(result->height, result->bytesPerLine));
  return result->data != nullptr;
}

bool combine(const ImageUtilImage* images, const int32* positions, uint32 count,
             ImageUtilImage* result) {
  const Extent extent = measure(images, positions, count);
  const ImageUtilImage& first = images[0];
  if (!allocateResult(extent, first, result)) return false;
  const bool converts = result->bpp != first.bpp;
  const uint32 bppDepth = Raster_GetBPPDepth(first.depth, first.bpp);
  for (uint32 i = 0; i < count; ++i) {
    if (images[i].data == nullptr) continue;
    const Place place = placeOf(images[i], positions + 2 * size_t{i}, extent.bounds, *result);
    if (converts) {
      placeConverted(images[i], bppDepth, place, *result);
    } else {
      placeCopied(images[i], place, *result);
    }
  }
  return true;
}

}  // namespace
}  // namespace raster

extern "C" {

bool ImageUtil_Combine(const ImageUtilImage* images, const int32* positions, uint32 count,
                       ImageUtilImage* result) {
  ImageUtilImage combined{};
  if (count != 0 && !raster::combine(images, positions, count, &combined)) {
    raster::freeImageData(&combined);
    return false;
  }
  *result = combined;
  return true;
}

}  // extern "C"
