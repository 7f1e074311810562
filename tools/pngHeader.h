// SPDX-License-Identifier: MIT
//
// The header of a PNG file, read by the tool itself to say what a file is and why it is refused.

#ifndef RASTER_TOOLS_PNG_HEADER_H
#define RASTER_TOOLS_PNG_HEADER_H

#include <string>

#include "baseTypes.h"

namespace tool {

struct PngHeader {
  uint32 width;
  uint32 height;
  uint32 bitDepth;
  uint32 colourType;
  bool interlaced;
};

enum PngColourType : uint32 { kGrey = 0, kRgb = 2, kPalette = 3, kGreyAlpha = 4, kRgba = 6 };

/// Fails with a clear text when the file is not a PNG.
PngHeader readPngHeader(const std::string& path);

const char* colourTypeName(uint32 colourType);

}  // namespace tool

#endif
