// SPDX-License-Identifier: MIT
//
// Blending, one pixel at a time and with plain divisions, on memory that checks its bounds.

#ifndef TESTS_ALPHA_BLEND_REFERENCE_H
#define TESTS_ALPHA_BLEND_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

using Bytes = std::vector<uint8>;

/// The destination formats: depth, bits per pixel, bytes per pixel.
struct BlendFormat {
  uint32 depth, bpp, bytes;
};
inline constexpr BlendFormat kBlendFormats[] = {{6, 8, 1},   {8, 8, 1},   {15, 16, 2},
                                                {16, 16, 2}, {24, 24, 3}, {24, 32, 4}};
inline constexpr uint32 kBlendOperators = 14;

/// What a call does to its pixels.
struct Blend {
  uint32 op;
  uint32 flags;
  uint32 srcAlpha;
  uint32 dstAlpha;
};

/// A channel's result from a source byte and its alpha byte, and an expanded destination channel.
uint32 blendChannel(const Blend& blend, uint32 source, uint32 sourceAlpha, uint32 destination);

/// A destination pixel (its low bytes) after a blend with the four source bytes at `source`.
uint32 blendPixel(const BlendFormat& format, const Blend& blend, const uint8* source, uint32 pixel);

/// A rectangle within one memory: the first pixels and the pitches of destination and source.
struct BlendPlace {
  size_t dst, dstPitch;
  size_t src, srcPitch;
  uint32 width, height;
};

/// Blends in place, from pixel to pixel.
void blendInPlace(Bytes& memory, const BlendPlace& place, const BlendFormat& format,
                  const Blend& blend);

/// Blends through a buffer of 3072 bytes, from chunk to chunk.
void blendStaged(Bytes& memory, const BlendPlace& place, const BlendFormat& format,
                 const Blend& blend);

}  // namespace reference

#endif
