// SPDX-License-Identifier: MIT
//
// Sizes, positions, rectangles and colours on the command line.

#ifndef RASTER_TOOLS_GEOMETRY_H
#define RASTER_TOOLS_GEOMETRY_H

#include <string>

#include "rect.h"
#include "rectSize.h"

namespace tool {

struct Size {
  uint32 width;
  uint32 height;
};

/// A size that may depend on another one: in pixels, with one side to follow from the other, or as
/// a factor.
struct SizeRequest {
  uint32 width = 0;   ///< 0: as the height asks
  uint32 height = 0;  ///< 0: as the width asks
  double factor = 0;  ///< when neither is given

  /// The size that a picture gets; no side is below 1.
  Size of(const Size& original) const;
};

SizeRequest parseSizeRequest(const std::string& text);  // WxH, Wx, xH, FACTOR, PERCENT%

// Each parser throws a usage error that quotes the text and shows the form.
Size parseSize(const std::string& text);     // WxH
Point parsePoint(const std::string& text);   // X,Y
Rect parseRegion(const std::string& text);   // WxH+X+Y, or WxH at 0,0
uint32 parseColor(const std::string& text);  // RRGGBB, #RRGGBB, #RGB, 0xRRGGBB
std::string regionText(const Rect& rect);    // WxH+X+Y

}  // namespace tool

#endif
