// SPDX-License-Identifier: MIT
//
// Comparison of pixels without their fourth byte, and of bytes under a mask.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/compare/rasterCompKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "compare/rasterCompInternal.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

/// Bytes between two looks at whether anything differs.
constexpr size_t kChunk = 256;

bool colorsDiffer(const uint8* a, const uint8* b, size_t pixels) {
  uint32 differing = 0;
  for (size_t i = 0; i < 4 * pixels; i += 4) differing |= loadPixel<4>(a + i) ^ loadPixel<4>(b + i);
  return (differing & kColorBits) != 0;
}

/// The number of pixels, from the left, up to the chunk that holds the first difference.
size_t samePixels(const uint8* a, const uint8* b, size_t pixels) {
  constexpr size_t kStep = kChunk / 4;
  size_t i = 0;
  for (; pixels - i >= kStep; i += kStep)
    if (colorsDiffer(a + 4 * i, b + 4 * i, kStep)) return i;
  return colorsDiffer(a + 4 * i, b + 4 * i, pixels - i) ? i : pixels;
}

// What a mask lets through of a run of bytes: the number of bytes that differ.
constexpr auto kWholeBytes = [](const uint8* a, const uint8* b, const uint8* mask, size_t bytes) {
  uint32 count = 0;
  for (size_t i = 0; i < bytes; ++i) count += a[i] != b[i] && mask[i] != 0 ? 1 : 0;
  return count;
};
constexpr auto kBits = [](const uint8* a, const uint8* b, const uint8* mask, size_t bytes) {
  uint32 count = 0;
  for (size_t i = 0; i < bytes; ++i) count += ((a[i] ^ b[i]) & mask[i]) != 0 ? 1 : 0;
  return count;
};
constexpr auto kColors = [](const uint8* a, const uint8* b, const uint8* mask, size_t bytes) {
  uint32 count = 0;
  for (size_t i = 0; i < bytes; ++i) count += i % 4 != 3 && ((a[i] ^ b[i]) & mask[i]) != 0 ? 1 : 0;
  return count;
};

template <auto kCount>
bool withinLimit(const uint8* a, const uint8* b, const uint8* mask, size_t bytes, size_t limit) {
  size_t count = 0;
  for (size_t i = 0; i < bytes && count <= limit; i += kChunk) {
    const size_t chunk = bytes - i < kChunk ? bytes - i : kChunk;
    count += kCount(a + i, b + i, mask + i, chunk);
  }
  return count <= limit;
}

#else

template <class D> HWY_INLINE bool allZero(D d, hn::Vec<D> lanes) {
  return hn::AllTrue(d, hn::Eq(lanes, hn::Zero(d)));
}

/// The bits of the colours in which the pixels at a and b differ.
template <class D> HWY_INLINE hn::Vec<D> colorDifference(D d, const uint8* a, const uint8* b) {
  return hn::And(hn::Xor(loadLanes(d, a), loadLanes(d, b)), hn::Set(d, kColorBits));
}

/// The number of pixels, from the left, up to the vectors that hold the first difference.
HWY_INLINE size_t samePixels(const uint8* a, const uint8* b, size_t pixels) {
  const hn::ScalableTag<uint32> d;
  const size_t step = hn::Lanes(d);
  const auto difference = [&](size_t x)
                              HWY_ATTR { return colorDifference(d, a + 4 * x, b + 4 * x); };
  size_t x = 0;
  for (; pixels - x >= 4 * step; x += 4 * step) {
    const auto left = hn::Or(difference(x), difference(x + step));
    const auto right = hn::Or(difference(x + 2 * step), difference(x + 3 * step));
    if (!allZero(d, hn::Or(left, right))) return x;
  }
  for (; pixels - x >= step; x += step)
    if (!allZero(d, difference(x))) return x;
  size_t same = pixels;
  forLanes(hn::Half<decltype(d)>(), pixels - x, [&](auto half, size_t i) HWY_ATTR {
    const size_t at = x + i;
    const auto rest = colorDifference(half, a + 4 * at, b + 4 * at);
    if (same == pixels && !allZero(half, rest)) same = at;
  });
  return same;
}

// What a mask lets through: each line gives the bits of a lane that differ and count.
struct ByteMask {
  using Lane = uint8;
  template <class D, class V> static HWY_INLINE V differing(D d, V a, V b, V mask) {
    return hn::IfThenZeroElse(hn::Eq(mask, hn::Zero(d)), hn::Xor(a, b));
  }
};
struct BitMask {
  using Lane = uint8;
  template <class D, class V> static HWY_INLINE V differing(D /*d*/, V a, V b, V mask) {
    return hn::And(hn::Xor(a, b), mask);
  }
};
struct ColorMask {
  using Lane = uint32;
  template <class D, class V> static HWY_INLINE V differing(D d, V a, V b, V mask) {
    return hn::And(hn::And(hn::Xor(a, b), mask), hn::Set(d, kColorBits));
  }
};

template <class D> HWY_INLINE size_t countBytes(D d, hn::Vec<D> differing) {
  const hn::Repartition<uint8, D> d8;
  (void)d;
  return hn::CountTrue(d8, hn::Ne(hn::BitCast(d8, differing), hn::Zero(d8)));
}

template <class Mask>
bool withinLimit(const uint8* a, const uint8* b, const uint8* mask, size_t bytes, size_t limit) {
  using Lane = typename Mask::Lane;
  const hn::ScalableTag<Lane> d;
  constexpr size_t kStep = kLanes<decltype(d)> * sizeof(Lane);
  const auto differing = [&](auto lanes, size_t i) HWY_ATTR {
    return Mask::differing(lanes, loadLanes(lanes, a + i), loadLanes(lanes, b + i),
                           loadLanes(lanes, mask + i));
  };
  size_t count = 0;
  size_t i = 0;
  for (; bytes - i >= 4 * kStep; i += 4 * kStep) {
    const auto v0 = differing(d, i);
    const auto v1 = differing(d, i + kStep);
    const auto v2 = differing(d, i + 2 * kStep);
    const auto v3 = differing(d, i + 3 * kStep);
    if (allZero(d, hn::Or(hn::Or(v0, v1), hn::Or(v2, v3)))) continue;
    count += countBytes(d, v0) + countBytes(d, v1) + countBytes(d, v2) + countBytes(d, v3);
    if (count > limit) return false;
  }
  forLanes(d, (bytes - i) / sizeof(Lane), [&](auto lanes, size_t x) HWY_ATTR {
    count += countBytes(lanes, differing(lanes, i + x * sizeof(Lane)));
  });
  return count <= limit;
}

#endif

/// The difference of the first bytes that differ, of two pixels that are not the same.
int32 orderOfColors(const uint8* a, const uint8* b) {
  while (*a == *b) ++a, ++b;
  return int32{*a} - int32{*b};
}

int32 compareColors(const uint8* a, intptr_t aStep, const uint8* b, intptr_t bStep, size_t pixels,
                    uint32 height) {
  for (; height != 0; --height, a = nextRow(a, aStep), b = nextRow(b, bStep)) {
    size_t x = samePixels(a, b, pixels);
    for (; x != pixels; ++x) {
      const uint32 differing = loadPixel<4>(a + 4 * x) ^ loadPixel<4>(b + 4 * x);
      if ((differing & kColorBits) != 0) return orderOfColors(a + 4 * x, b + 4 * x);
    }
  }
  return 0;
}

#if HWY_TARGET == HWY_SCALAR
constexpr RasterCompKernels kKernels = {compareColors, withinLimit<kWholeBytes>, withinLimit<kBits>,
                                        withinLimit<kColors>};
#else
constexpr RasterCompKernels kKernels = {compareColors, withinLimit<ByteMask>, withinLimit<BitMask>,
                                        withinLimit<ColorMask>};
#endif

}  // namespace

const RasterCompKernels* rasterCompKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(rasterCompKernels);

}  // namespace

const RasterCompKernels* lookUpComp() { return HWY_DYNAMIC_DISPATCH(rasterCompKernels)(); }

}  // namespace raster

#endif
