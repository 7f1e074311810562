// SPDX-License-Identifier: MIT
//
// One tile of the encoding ZRLE (RFC 6143, section 7.7.6), before it is deflated.

#ifndef RASTER_TOOLS_LIVE_ZRLE_TILE_H
#define RASTER_TOOLS_LIVE_ZRLE_TILE_H

#include "bytes.h"

namespace tool::live {

inline constexpr uint32 kZrleTileSide = 64;

/// Which bytes of a pixel are sent: `bytes` of them, from byte `offset` on.
struct PixelPacking {
  uint32 bytes;
  uint32 offset;
};

/// Appends a tile in the shortest of the forms that the encoding has: as it is, as runs, with a
/// palette, as runs with a palette, or as one colour. `pixels` are width x height values whose
/// bytes in memory are those of the viewer's pixels, at most 64 x 64.
void putZrleTile(const uint32* pixels, uint32 width, uint32 height, const PixelPacking& packing,
                 Bytes& out);

}  // namespace tool::live

#endif
