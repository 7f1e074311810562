// SPDX-License-Identifier: MIT
//
// Blending for the other modules of the library, and what the sources of the module share.

#ifndef RASTER_ALPHA_BLEND_INTERNAL_H
#define RASTER_ALPHA_BLEND_INTERNAL_H

#include <array>

#include "frame/frameBuffer.h"
#include "raster.h"

namespace raster {

/// The most bytes that the staged variant moves at once: whole pixels of every format.
inline constexpr size_t kStageBytes = 3072;

/// A rectangle to blend, as rows.
struct BlendRect {
  uint8* dst;
  intptr_t dstStep;
  const uint8* before;  ///< the destination's pixels: at dst, or apart from it
  intptr_t beforeStep;
  const uint8* src;
  intptr_t srcStep;
  size_t width;
  uint32 height;
  uint8 srcAlpha;       ///< 255 without RASTER_BLEND_USE_SRC_ALPHA
  uint8 dstAlpha;       ///< 255 without RASTER_BLEND_USE_DST_ALPHA
  uint8 saturateShare;  ///< the source's share of Saturate
};

/// A loop over a rectangle whose pixels do not overlap their sources.
struct BlendKernel {
  void (*blend)(const BlendRect& rect);
  bool readsBlocks;  ///< reads the destination's rows as a block copy does: all bytes, by vectors
};

/// By the two flags.
using BlendVariants = std::array<BlendKernel, 4>;

/// By operator.
using FormatKernels = std::array<BlendVariants, RASTER_BLEND_COUNT>;

/// The kernels of the formats, for the processor.
const FormatKernels& blendKernels6();
const FormatKernels& blendKernels8();
const FormatKernels& blendKernels15();
const FormatKernels& blendKernels16();
const FormatKernels& blendKernels24();
const FormatKernels& blendKernels32();

/// The block copies of the staged blends.
struct StageKernels {
  /// Copies rows that do not overlap.
  using CopyRows = void (*)(uint8* to, intptr_t toStep, const uint8* from, intptr_t fromStep,
                            size_t bytes, uint32 rows);
  CopyRows copyRows;
  /// Rows of pixels of four bytes: touches byte 3 of none, or of all but the last one of a row.
  CopyRows copyColors;
};
const StageKernels& blendStageKernels();

/// As Raster_AlphaBlend.
void alphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                uint32 depth, uint32 bpp, uint32 op, uint32 flags, uint32 srcAlpha, uint32 dstAlpha,
                uint8 staged);

}  // namespace raster

#endif
