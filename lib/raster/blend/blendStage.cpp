// SPDX-License-Identifier: MIT
//
// The block copies between frame buffers and the buffer of the staged blends.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/blend/blendStage.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "alphaBlendInternal.h"
#include "blendMemory-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

void copyRow(uint8* to, const uint8* from, size_t bytes) { memcpy(to, from, bytes); }

#else

/// A call of memcpy takes about as long as half of a kilobyte does here.
HWY_INLINE void copyRow(uint8* to, const uint8* from, size_t bytes) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t kVector = kLanes<decltype(d)>;
  size_t i = 0;
  for (; bytes - i >= 4 * kVector; i += 4 * kVector) {
    const auto first = hn::LoadU(d, from + i);
    const auto second = hn::LoadU(d, from + i + kVector);
    const auto third = hn::LoadU(d, from + i + 2 * kVector);
    const auto fourth = hn::LoadU(d, from + i + 3 * kVector);
    hn::StoreU(first, d, to + i);
    hn::StoreU(second, d, to + i + kVector);
    hn::StoreU(third, d, to + i + 2 * kVector);
    hn::StoreU(fourth, d, to + i + 3 * kVector);
  }
  forLanes(d, bytes - i, [&](auto tag, size_t x) HWY_ATTR {
    hn::StoreU(hn::LoadU(tag, from + i + x), tag, to + i + x);
  });
}

#endif

void copyRows(uint8* to, intptr_t toStep, const uint8* from, intptr_t fromStep, size_t bytes,
              uint32 rows) {
  for (; rows != 0; --rows, to = nextRow(to, toStep), from = nextRow(from, fromStep))
    copyRow(to, from, bytes);
}

#if HWY_TARGET == HWY_SCALAR

void copyRowOfColors(uint8* to, const uint8* from, size_t pixels) {
  memcpy(to, from, pixels * 4 - 1);
}

#elif HWY_TARGET == HWY_AVX3

HWY_INLINE void copyRowOfColors(uint8* to, const uint8* from, size_t pixels) {
  const hn::ScalableTag<uint32> d;
  constexpr size_t kBlock = kLanes<decltype(d)>;
  const auto copy = [&](size_t x, auto part) HWY_ATTR {
    const auto colors = loadColors(d, from + x * 4, part);
    storeColors(d, colors, colors, to + x * 4, part);
  };
  size_t x = 0;
  for (; pixels - x > kBlock; x += kBlock) copy(x, WholeBlock());
  // The end goes by the masks of blendEnd: other loads would have to wait for its stores.
  if (pixels - x == kBlock) return copy(x, AllButLastByte());
  copy(x, FirstPixels{pixels - x});
}

#else

/// What is left behind whole vectors goes with the bytes before it, in one move.
HWY_INLINE void copyRowOfColors(uint8* to, const uint8* from, size_t pixels) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t kVector = kLanes<decltype(d)>;
  const size_t bytes = pixels * 4 - 1;
  if (bytes < kVector) {
    copyRow(to, from, bytes);
  } else {
    copyRow(to, from, bytes / kVector * kVector);
    hn::StoreU(hn::LoadU(d, from + bytes - kVector), d, to + bytes - kVector);
  }
}

#endif

void copyColors(uint8* to, intptr_t toStep, const uint8* from, intptr_t fromStep, size_t bytes,
                uint32 rows) {
  for (; rows != 0; --rows, to = nextRow(to, toStep), from = nextRow(from, fromStep))
    copyRowOfColors(to, from, bytes / 4);
}

constexpr StageKernels kKernels = {copyRows, copyColors};

}  // namespace

const StageKernels* stageKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {

HWY_EXPORT(stageKernels);
const StageKernels* lookUpBlendStage() { return HWY_DYNAMIC_DISPATCH(stageKernels)(); }

}  // namespace raster

#endif
