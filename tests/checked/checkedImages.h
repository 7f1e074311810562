// SPDX-License-Identifier: MIT
//
// Random images on views.

#ifndef TESTS_CHECKED_IMAGES_H
#define TESTS_CHECKED_IMAGES_H

#include "checked/checkedScenes.h"
#include "support/viewImages.h"

namespace tests {

/// A view of some format with some pixels.
inline GuardedView somePicture(Random& random) {
  const PixelFormat format = someFormat(random);
  const uint32 width = 1 + random.below(40);
  return {random, format, width, 1 + random.below(40)};
}

/// An image on a view, its rows in either direction; one of indices has so many colours.
inline ImageUtilImage imageOf(Random& random, const RasterView& view, uint32 colors) {
  ImageUtilImage image = imageOn(view);
  image.flags = random.below(2);
  image.numColors = view.bpp == 8 ? colors : 0;
  for (ImageUtilColor& color : image.palette) {
    const Bytes bytes = random.bytes(3);
    color = {bytes[0], bytes[1], bytes[2], 0};
  }
  return image;
}

}  // namespace tests

#endif
