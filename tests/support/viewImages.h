// SPDX-License-Identifier: MIT
//
// Images whose pixels are those of a view.

#ifndef TESTS_VIEW_IMAGES_H
#define TESTS_VIEW_IMAGES_H

#include "imageUtil.h"
#include "rasterChecked.h"

namespace tests {

/// An image on a view's pixels, without a palette.
inline ImageUtilImage imageOn(const RasterView& view) {
  ImageUtilImage image = {};
  image.width = view.width;
  image.height = view.height;
  image.depth = view.depth;
  image.bpp = view.bpp;
  image.bytesPerLine = view.pitch;
  image.data = view.data;
  return image;
}

}  // namespace tests

#endif
