// SPDX-License-Identifier: MIT
//
// Pixels of 32 bits that somebody else owns, and rectangles of them.

#ifndef RASTER_TOOLS_LIVE_PIXEL_VIEW_H
#define RASTER_TOOLS_LIVE_PIXEL_VIEW_H

#include "rectSize.h"

namespace tool::live {

struct PixelView {
  const uint8* data;
  uint32 pitch;  // bytes
  uint32 width;
  uint32 height;

  const uint8* at(int32 x, int32 y) const {
    return data + size_t{pitch} * static_cast<uint32>(y) + size_t{4} * static_cast<uint32>(x);
  }
  Rect bounds() const { return {0, 0, static_cast<int32>(width), static_cast<int32>(height)}; }
};

}  // namespace tool::live

#endif
