// SPDX-License-Identifier: MIT

#include "reference/rasterBitsReference.h"

namespace reference {

void bitsToPixels(Bytes& memory, int64 bits, uint32 bitsPitch, int64 dst, uint32 dstPitch,
                  uint32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                  uint32 background, bool stencil) {
  for (int64 r = 0; r < height; ++r) {
    uint8 byte = 0;
    for (int64 i = 0; i < width; ++i) {
      if (i % 4 == 0) byte = memory.at(static_cast<size_t>(bits + r * bitsPitch + i / 8));
      const bool set = (byte >> (7 - i % 8) & 1) != 0;
      if (stencil && !set) continue;
      for (uint32 k = 0; k < bytesPerPixel; ++k) {
        memory.at(static_cast<size_t>(dst + r * dstPitch + i * bytesPerPixel + k)) =
            static_cast<uint8>((set ? foreground : background) >> (8 * k));
      }
    }
  }
}

}  // namespace reference
