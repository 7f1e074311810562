// SPDX-License-Identifier: MIT
//
// Expansion of bit planes to pixels: two colours, or one colour through a stencil.

#include <algorithm>

#include "vector/kernelChoice.h"
#include "raster.h"
#include "plane/rasterBitsInternal.h"

namespace raster {
namespace {

const BitsKernels& kernels() { return chosenKernels<lookUpBits>(); }

constexpr size_t kNibble = 4;

/// Sizes that are not positive mean that there is nothing to do.
Expansion expansionOf(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch, int32 width,
                      int32 height) {
  return {bits,
          pitchOf(bitsPitch),
          dst,
          pitchOf(dstPitch),
          static_cast<size_t>(std::max(width, 0)),
          static_cast<uint32>(std::max(height, 0))};
}

/// Four pixels after each look at the plane, which may lie in the rectangle.
template <unsigned kBytes> void walk(const Expansion& e, const BitColors& colors, bool stencil) {
  const uint8* bits = e.bits;
  uint8* dst = e.dst;
  for (uint32 y = e.height; y != 0;
       --y, bits = nextRow(bits, e.bitsPitch), dst = nextRow(dst, e.dstPitch)) {
    uint32 byte = 0;
    for (size_t x = 0; x < e.width; ++x) {
      if (x % kNibble == 0) byte = bits[x / 8];
      const bool set = (byte >> (7 - x % 8) & 1) != 0;
      if (set || !stencil)
        storePixel<kBytes>(dst + x * kBytes, set ? colors.foreground : colors.background);
    }
  }
}

template <unsigned kBytes> void expand(const Expansion& e, const BitColors& colors, bool stencil) {
  const RowSpan plane(e.bits, e.bitsPitch, (e.width + 7) / 8, e.height);
  const RowSpan pixels(e.dst, e.dstPitch, e.width * kBytes, e.height);
  if (e.width == 0 || e.height == 0) return;
  if (plane.isApartFrom(pixels)) {
    (stencil ? kernels().stencil : kernels().twoColors)[kBytes - 1](e, colors);
  } else {
    walk<kBytes>(e, colors, stencil);
  }
}

}  // namespace

void bitsToPixels(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                  int32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                  uint32 background) {
  withPixelSize(static_cast<uint32>(bytesPerPixel), [&](auto bytes) {
    expand<bytes>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height),
                  {foreground, background}, false);
  });
}

}  // namespace raster

using raster::expand;
using raster::expansionOf;

extern "C" {

void Raster_BitsToPixels(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                         int32 bytesPerPixel, int32 width, int32 height, uint32 foreground,
                         uint32 background) {
  raster::bitsToPixels(bits, bitsPitch, dst, dstPitch, bytesPerPixel, width, height, foreground,
                       background);
}

void Raster_BitsToPixelsStencil(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                int32 bytesPerPixel, int32 width, int32 height, uint32 foreground) {
  raster::withPixelSize(static_cast<uint32>(bytesPerPixel), [&](auto bytes) {
    expand<bytes>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, 0},
                  true);
  });
}

void RasterBitsToPixels8(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                         int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<1>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, background},
            false);
}

void RasterBitsToPixels16(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<2>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, background},
            false);
}

void RasterBitsToPixels24(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<3>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, background},
            false);
}

void RasterBitsToPixels32(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                          int32 width, int32 height, uint32 foreground, uint32 background) {
  expand<4>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, background},
            false);
}

void RasterBitsToPixelsStencil8(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                int32 width, int32 height, uint32 foreground) {
  expand<1>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, 0}, true);
}

void RasterBitsToPixelsStencil16(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<2>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, 0}, true);
}

void RasterBitsToPixelsStencil24(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<3>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, 0}, true);
}

void RasterBitsToPixelsStencil32(const uint8* bits, uint32 bitsPitch, uint8* dst, uint32 dstPitch,
                                 int32 width, int32 height, uint32 foreground) {
  expand<4>(expansionOf(bits, bitsPitch, dst, dstPitch, width, height), {foreground, 0}, true);
}

}  // extern "C"
