// SPDX-License-Identifier: MIT
//
// The naive model of the video conversion: one pixel, one byte at a time. It shares nothing with
// the library.

#ifndef TESTS_RASTER_YUV_REFERENCE_H
#define TESTS_RASTER_YUV_REFERENCE_H

#include <array>
#include <vector>

#include "baseTypes.h"
#include "raster.h"

namespace reference {

using Bytes = std::vector<uint8>;

struct VideoAttributes {
  uint32 size = 0;
  std::array<uint32, 3> pitches{};
  std::array<uint32, 3> offsets{};
};

/// Of one of the three formats; the packed ones leave pitches and offsets at 0.
VideoAttributes videoAttributes(uint32 format, uint32 width, uint32 height);

/// One pixel of 0x00RRGGBB; `rounding` is what is added before the division by 256.
uint32 yuvToPixel(int y, int cb, int cr, int rounding);

/// 0x00RRGGBB in the layout of a bppdepth of 15, 16, 24 or 32.
uint32 packPixel(uint32 rgb, int bppdepth);

uint32 bytesOf(int bppdepth);

/// Converts a frame at the start of `src` to the start of `dst`.
void yuvToRgb(const Bytes& src, Bytes& dst, uint32 width, uint32 height, uint32 format,
              int bppdepth);

struct RgbParam {
  uint32 multiplier, shift, mask;
};
RgbParam makeRgbParam(uint32 bits, uint32 mask);

}  // namespace reference

#endif
