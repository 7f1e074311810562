// SPDX-License-Identifier: MIT
//
// Constant pixels as vectors. Included once per instruction set, after Highway.

#if defined(RASTER_PIXEL_PATTERN_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_PIXEL_PATTERN_INL_H
#undef RASTER_PIXEL_PATTERN_INL_H
#else
#define RASTER_PIXEL_PATTERN_INL_H
#endif

#include <cstring>

#include "frame/frameBuffer.h"
#include "hwy/highway.h"
#include "rows-inl.h"

#if HWY_TARGET != HWY_SCALAR

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// Constant pixels in memory: the start of a row, over three vectors long.
struct PixelPattern {
  uint8 bytes[4 * kLanes<hn::ScalableTag<uint8>>];
};

inline PixelPattern patternOf(PixelWords pixels) {
  const hn::ScalableTag<uint32> d;
  uint32 words[4 * kLanes<hn::ScalableTag<uint32>>];
  hn::StoreInterleaved3(hn::Set(d, pixels.word[0]), hn::Set(d, pixels.word[1]),
                        hn::Set(d, pixels.word[2]), d, words);
  hn::StoreU(hn::LoadU(d, words), d, words + 3 * hn::Lanes(d));
  PixelPattern pattern;
  memcpy(&pattern, words, sizeof pattern);
  return pattern;
}

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif

#endif
