// SPDX-License-Identifier: MIT
//
// The colour equation of video for a single pixel.

#ifndef RASTER_VIDEO_COLOR_H
#define RASTER_VIDEO_COLOR_H

#include "baseTypes.h"

namespace raster {

/// Channels of 0 to 255.
struct Rgb {
  uint32 r, g, b;
};

constexpr uint32 limitToByte(int32 v) { return static_cast<uint32>(v < 0 ? 0 : v > 255 ? 255 : v); }

/// BT.601 with limited range, in 8 bits of fraction; `rounding` is added before they are dropped.
constexpr Rgb colorOf(int32 y, int32 cb, int32 cr, int32 rounding) {
  const int32 luma = 298 * (y - 16) + rounding;
  return {limitToByte((luma + 409 * (cr - 128)) >> 8),
          limitToByte((luma - 100 * (cb - 128) - 208 * (cr - 128)) >> 8),
          limitToByte((luma + 516 * (cb - 128)) >> 8)};
}

}  // namespace raster

#endif
