// SPDX-License-Identifier: MIT
//
// Cursors that own their pixels: of either kind, scaled, drawn into a picture.

#ifndef RASTER_TOOLS_CURSOR_IMAGE_H
#define RASTER_TOOLS_CURSOR_IMAGE_H

#include <vector>

#include "picture.h"
#include "raster.h"

namespace tool {

/// Whether a cursor of this size can be drawn, and scaled by any factor that is allowed.
inline bool isCursorSize(uint32 width, uint32 height) {
  constexpr uint32 kLargestCursorSide = 1024;
  return width <= kLargestCursorSide && height <= kLargestCursorSide;
}

class CursorImage {
 public:
  /// Premultiplied pixels of 32 bits.
  static CursorImage ofPixels(uint32 width, uint32 height, const Point& hotSpot,
                              std::vector<uint32> pixels);
  /// Two planes of one bit a pixel; rows are padded to 32 bits.
  static CursorImage ofBitPlanes(uint32 width, uint32 height, const Point& hotSpot,
                                 const std::vector<uint8>& andBits,
                                 const std::vector<uint8>& xorBits);

  const RasterCursor& shape() const { return geometry; }
  /// The pixels of a cursor of pixels.
  const std::vector<uint32>& pixels() const { return first; }

  /// Enlarges or reduces it about its hot spot.
  void scaleBy(double scale);

  /// Draws it, clipped, with its hot spot at a pixel; false when nothing of it lies on the picture.
  /// A picture of 32 bits takes both kinds.
  bool drawOn(Picture& picture, const Point& at) const;

 private:
  CursorImage(uint32 type, uint32 width, uint32 height, const Point& hotSpot);
  RasterCursor record() const;

  RasterCursor geometry = {};
  std::vector<uint32> first;   // the pixels, or the AND plane
  std::vector<uint32> second;  // the XOR plane
};

}  // namespace tool

#endif
