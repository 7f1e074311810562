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

/// By operator, and by the two flags. The last two places are empty.
using BlendVariants = std::array<BlendKernel, 4>;
using FormatKernels = std::array<BlendVariants, 16>;

/// The kernels for this processor, each time of two formats: of depths 6 and 8, of depths 15 and
/// 16, of pixels of three and of four bytes.
const FormatKernels* lookUpBlend8();
const FormatKernels* lookUpBlend16();
const FormatKernels* lookUpBlend32();

/// The block copies of the staged blends.
struct StageKernels {
  /// Copies rows that do not overlap.
  using CopyRows = void (*)(uint8* to, intptr_t toStep, const uint8* from, intptr_t fromStep,
                            size_t bytes, uint32 rows);
  CopyRows copyRows;
  /// Rows of pixels of four bytes: touches byte 3 of none, or of all but the last one of a row.
  CopyRows copyColors;
};
const StageKernels* lookUpBlendStage();

/// The arguments of Raster_AlphaBlend.
struct BlendCall {
  Corner<uint8> dst;
  Corner<const uint8> src;
  uint32 width, height;
  uint32 depth, bpp;
  uint32 op;
  uint32 flags = 0;
  uint32 srcAlpha = 0;
  uint32 dstAlpha = 0;
  bool staged = false;
};
void alphaBlend(const BlendCall& call);

}  // namespace raster

#endif
