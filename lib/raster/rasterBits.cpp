// SPDX-License-Identifier: MIT
//
// Expansion of bit planes to pixels: two colours, or one colour through a stencil.

#include <algorithm>

#include "frameBuffer.h"
#include "raster.h"

namespace raster {
namespace {

/// A bit plane, where its pixels go, and their number.
struct Expansion {
  const uint8* bits;
  intptr_t bitsPitch;
  uint8* dst;
  intptr_t dstPitch;
  int32 width;
  int32 height;
};

/// What becomes of set and of clear bits. A stencil leaves the pixels of clear bits alone.
struct BitColors {
  uint32 foreground;
  uint32 background;
  bool stencil;
};

constexpr int32 kNibble = 4;

template <unsigned kBytes>
void expandNibble(uint8* dst, uint32 nibble, int32 count, const BitColors& colors) {
  for (int32 k = 0; k < count; ++k, dst += kBytes) {
    const bool set = (nibble >> (kNibble - 1 - k) & 1) != 0;
    if (set || !colors.stencil)
      storePixel<kBytes>(dst, set ? colors.foreground : colors.background);
  }
}

/// The expansion as it is defined, four pixels after each look at the plane.
template <unsigned kBytes> void expand(const Expansion& e, const BitColors& colors) {
  const uint8* bits = e.bits;
  uint8* dst = e.dst;
  for (int32 y = 0; y < e.height;
       ++y, bits = nextRow(bits, e.bitsPitch), dst = nextRow(dst, e.dstPitch)) {
    for (int32 x = 0; x < e.width; x += std::min(e.width - x, kNibble)) {
      const uint32 byte = bits[x / 8];
      expandNibble<kBytes>(dst + static_cast<size_t>(x) * kBytes, x % 8 == 0 ? byte >> 4 : byte,
                           std::min(e.width - x, kNibble), colors);
    }
  }
}

}  // namespace
}  // namespace raster

using raster::expand;
using raster::pitchOf;

extern "C" {

void Raster_BitsToPixels(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                         int32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                         uint32 background) {
  raster::withPixelSize(static_cast<uint32>(bytesPerPixel), [&](auto bytes) {
    expand<bytes>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
                  {foreground, background, false});
  });
}

void Raster_BitsToPixelsStencil(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                int32 bytesPerPixel, int32 width, int32 height, uint32 foreground) {
  raster::withPixelSize(static_cast<uint32>(bytesPerPixel), [&](auto bytes) {
    expand<bytes>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
                  {foreground, 0, true});
  });
}

void RasterBitsToPixels8(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                         int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<1>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, background, false});
}

void RasterBitsToPixels16(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<2>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, background, false});
}

void RasterBitsToPixels24(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<3>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, background, false});
}

void RasterBitsToPixels32(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<4>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, background, false});
}

void RasterBitsToPixelsStencil8(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                int32 width, int32 height, uint32 foreground) {
  expand<1>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, 0, true});
}

void RasterBitsToPixelsStencil16(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<2>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, 0, true});
}

void RasterBitsToPixelsStencil24(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<3>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, 0, true});
}

void RasterBitsToPixelsStencil32(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<4>({bits, pitchOf(bitsPitch), dst, pitchOf(dstPitch), width, height},
            {foreground, 0, true});
}

}  // extern "C"
