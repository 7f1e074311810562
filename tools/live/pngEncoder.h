// SPDX-License-Identifier: MIT
//
// The encoding TightPNG: every rectangle is a PNG file, with a palette where that is possible.

#ifndef RASTER_TOOLS_LIVE_PNG_ENCODER_H
#define RASTER_TOOLS_LIVE_PNG_ENCODER_H

#include <vector>

#include "bytes.h"
#include "imageUtil.h"
#include "pixelView.h"

namespace tool::live {

class PngEncoder {
 public:
  /// The most pixels that one rectangle may have: lengths have 22 bits.
  static constexpr uint32 kMostPixels = 1u << 20;

  /// zlib's level, 0 to 9.
  void setLevel(int wanted) { level = wanted; }
  /// Appends what stands behind a rectangle's header.
  void put(const PixelView& pixels, const Rect& rect, Bytes& out);

 private:
  bool findPalette(const PixelView& pixels, const Rect& rect);

  int level = 1;
  ImageUtilImage image = {};
  std::vector<uint8> indices;
};

}  // namespace tool::live

#endif
