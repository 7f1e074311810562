// SPDX-License-Identifier: MIT
//
// A PNG file in memory: what its header says, and whether it is all there. The library trusts a
// stream in memory to be whole, so this is looked at first.

#ifndef RASTER_TOOLS_PNG_FILE_H
#define RASTER_TOOLS_PNG_FILE_H

#include <vector>

#include "inputStream.h"

namespace tool {

enum PngColorType : uint32 { kGrey = 0, kRgb = 2, kPalette = 3, kGreyAlpha = 4, kRgba = 6 };

struct PngFile {
  uint32 width;
  uint32 height;
  uint32 bitDepth;
  uint32 colorType;
  bool isInterlaced;
  bool hasTransparency;  ///< a transparent colour, or palette entries with alpha
  std::vector<uint8> bytes;

  bool hasAlpha() const { return (colorType & 4) != 0 || hasTransparency; }
};

constexpr size_t kPngStart = 8;

/// Whether these bytes begin a PNG file.
bool beginsPng(const std::vector<uint8>& bytes);

/// Reads a PNG file, of which `start` has been read already. Fails when it is none, or is cut off.
PngFile readPng(InputStream& input, std::vector<uint8> start = {});

const char* colorTypeName(uint32 colorType);

}  // namespace tool

#endif
