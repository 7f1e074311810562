// SPDX-License-Identifier: MIT
//
// The video frame layouts: their four-character codes, sizes and planes.

#ifndef RASTER_VIDEO_ATTRIBUTES_H
#define RASTER_VIDEO_ATTRIBUTES_H

#include "baseTypes.h"

namespace raster {

/// Four characters in memory order as the number that the interfaces take.
constexpr uint32 fourCharacters(const char (&code)[5]) {
  uint32 number = 0;
  for (unsigned i = 0; i < 4; ++i) number |= static_cast<uint32>(code[i]) << (8 * i);
  return number;
}

constexpr uint32 kFormatYuy2 = fourCharacters("YUY2");
constexpr uint32 kFormatUyvy = fourCharacters("UYVY");
constexpr uint32 kFormatYv12 = fourCharacters("YV12");
static_assert(kFormatYuy2 == 0x32595559 && kFormatUyvy == 0x59565955 && kFormatYv12 == 0x32315659);

}  // namespace raster

extern "C" {

/// Gives the size of a frame in bytes and, for a planar format, the pitch in bytes and the offset
/// of each of its three planes. `pitches` and `offsets` (three entries each) may be null.
///
/// A packed format reports no planes: `pitches` stays as it is, and of `offsets` only the first
/// entry is set, to 0, as for every format. For an unknown format `size` is 0, the result false,
/// and the first such call of the process logs
/// "RasterComputeVideoAttributes: format :<format> not supported.\n".
bool RasterComputeVideoAttributes(uint32 format, uint32 width, uint32 height, uint32* size,
                                  uint32* pitches, uint32* offsets);

}  // extern "C"

#endif
