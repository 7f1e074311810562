// SPDX-License-Identifier: MIT
//
// Comparison of bytes, of pixels without their fourth byte, and of bytes under a mask.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/compare/rasterCompKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <cstring>

#include "compare/rasterCompInternal.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

/// Bytes between two looks at whether anything differs.
constexpr size_t kChunk = 256;

/// The number of bytes up to the chunk that holds the first difference.
size_t sameBytes(const uint8* a, const uint8* b, size_t bytes) {
  size_t i = 0;
  for (; bytes - i >= kChunk; i += kChunk)
    if (memcmp(a + i, b + i, kChunk) != 0) return i;
  return memcmp(a + i, b + i, bytes - i) == 0 ? bytes : i;
}

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

/// The bits that count in which two lanes differ: of whole bytes, and of pixels without the fourth.
constexpr auto kByteDifference = [](auto d, const uint8* a, const uint8* b)
                                     HWY_ATTR { return hn::Xor(loadLanes(d, a), loadLanes(d, b)); };
constexpr auto kColorDifference = [](auto d, const uint8* a, const uint8* b) HWY_ATTR {
  return hn::And(hn::Xor(loadLanes(d, a), loadLanes(d, b)), hn::Set(d, kColorBits));
};

/// The number of lanes, from the left, up to the vectors that hold the first difference.
template <auto kDifference, class D>
HWY_INLINE size_t sameLanes(D d, const uint8* a, const uint8* b, size_t lanes) {
  constexpr size_t kLaneBytes = sizeof(hn::TFromD<D>);
  constexpr size_t kStep = kLanes<D>;
  const auto difference = [&](auto tag, size_t x) HWY_ATTR {
    return kDifference(tag, a + kLaneBytes * x, b + kLaneBytes * x);
  };
  size_t x = 0;
  for (; lanes - x >= 4 * kStep; x += 4 * kStep) {
    const auto left = hn::Or(difference(d, x), difference(d, x + kStep));
    const auto right = hn::Or(difference(d, x + 2 * kStep), difference(d, x + 3 * kStep));
    if (!allZero(d, hn::Or(left, right))) return x;
  }
  for (; lanes - x >= kStep; x += kStep)
    if (!allZero(d, difference(d, x))) return x;
  size_t same = lanes;
  forLanes(hn::Half<D>(), lanes - x, [&](auto half, size_t i) HWY_ATTR {
    if (same == lanes && !allZero(half, difference(half, x + i))) same = x + i;
  });
  return same;
}

HWY_INLINE size_t sameBytes(const uint8* a, const uint8* b, size_t bytes) {
  return sameLanes<kByteDifference>(hn::ScalableTag<uint8>(), a, b, bytes);
}
HWY_INLINE size_t samePixels(const uint8* a, const uint8* b, size_t pixels) {
  return sameLanes<kColorDifference>(hn::ScalableTag<uint32>(), a, b, pixels);
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

/// The difference of the first bytes that differ, of which there are some.
int32 orderOfBytes(const uint8* a, const uint8* b) {
  while (*a == *b) ++a, ++b;
  return int32{*a} - int32{*b};
}

int32 compareBytes(const uint8* a, intptr_t aStep, const uint8* b, intptr_t bStep, size_t bytes,
                   uint32 height) {
  for (; height != 0; --height, a = nextRow(a, aStep), b = nextRow(b, bStep)) {
    const size_t same = sameBytes(a, b, bytes);
    if (same != bytes) return orderOfBytes(a + same, b + same);
  }
  return 0;
}

int32 compareColors(const uint8* a, intptr_t aStep, const uint8* b, intptr_t bStep, size_t pixels,
                    uint32 height) {
  for (; height != 0; --height, a = nextRow(a, aStep), b = nextRow(b, bStep)) {
    size_t x = samePixels(a, b, pixels);
    for (; x != pixels; ++x) {
      const uint32 differing = loadPixel<4>(a + 4 * x) ^ loadPixel<4>(b + 4 * x);
      if ((differing & kColorBits) != 0) return orderOfBytes(a + 4 * x, b + 4 * x);
    }
  }
  return 0;
}

#if HWY_TARGET == HWY_SCALAR
constexpr RasterCompKernels kKernels = {compareBytes, compareColors, withinLimit<kWholeBytes>,
                                        withinLimit<kBits>, withinLimit<kColors>};
#else
constexpr RasterCompKernels kKernels = {compareBytes, compareColors, withinLimit<ByteMask>,
                                        withinLimit<BitMask>, withinLimit<ColorMask>};
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
