// SPDX-License-Identifier: MIT
//
// Blending for the other modules of the library, and what the sources of the module share.

#ifndef RASTER_ALPHA_BLEND_INTERNAL_H
#define RASTER_ALPHA_BLEND_INTERNAL_H

#include <array>

#include "frameBuffer.h"

namespace raster {

/// The most bytes that the staged variant moves at once: whole pixels of every format.
inline constexpr size_t kStageBytes = 3072;

inline constexpr uint32 kBlendOver = 3;

/// The constant alphas of a call, 255 where there is none.
struct BlendConstants {
  uint32 srcAlpha;
  uint32 dstAlpha;
};

/// A kernel: blends one rectangle with one operator onto one format.
using BlendKernel = void (*)(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch,
                             const uint8* src, uint32 srcX, uint32 srcY, uint32 srcPitch,
                             uint32 width, uint32 height, uint32 flags, uint32 srcAlpha,
                             uint32 dstAlpha);
struct BlendPair {
  BlendKernel inPlace;
  BlendKernel staged;
};
using BlendRow = std::array<BlendPair, 16>;

/// As Raster_AlphaBlend.
void alphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                uint32 depth, uint32 bpp, uint32 op, uint32 flags, uint32 srcAlpha, uint32 dstAlpha,
                uint8 staged);

}  // namespace raster

#endif
