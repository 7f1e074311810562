// SPDX-License-Identifier: MIT
//
// The arithmetic of blending on planes: one channel of a pixel in each 16-bit lane, the form for
// packed pixels. Included once per instruction set.

#if defined(RASTER_BLEND_PLANES_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_PLANES_INL_H
#undef RASTER_BLEND_PLANES_INL_H
#else
#define RASTER_BLEND_PLANES_INL_H
#endif

#include "blendMemory-inl.h"
#include "frame/frameBuffer.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

using Words = hn::ScalableTag<uint16>;
using WordLanes = hn::Vec<Words>;

/// The channels of pixels, each as the upper byte of a lane. The lower bytes have no meaning.
struct Planes {
  WordLanes c0, c1, c2, alpha;
};

/// Planes whose lower bytes are 1.
struct ExactPlanes : Planes {};

/// A number of 0 to 255 for each pixel, to multiply its channels with: it stands in both bytes.
struct PlaneFactor {
  WordLanes v;
};

HWY_INLINE PlaneFactor planeFactor(uint8 value) {
  return {hn::Set(Words(), static_cast<uint16>(value * 0x0101))};
}
HWY_INLINE PlaneFactor inv(PlaneFactor f) { return {hn::Xor(f.v, hn::Set(Words(), 0xFFFF))}; }

HWY_INLINE PlaneFactor alphaOf(const Planes& p) {
#if HWY_TARGET == HWY_SCALAR
  return {hn::ShiftRight<8>(p.alpha) * hn::Set(Words(), 0x0101)};
#else
  const hn::Repartition<uint8, Words> d8;
  alignas(16) static constexpr uint8 kUpper[16] = {1, 1, 3,  3,  5,  5,  7,  7,
                                                   9, 9, 11, 11, 13, 13, 15, 15};
  const auto bytes = hn::TableLookupBytes(hn::BitCast(d8, p.alpha), hn::LoadDup128(d8, kUpper));
  return {hn::BitCast(Words(), bytes)};
#endif
}

/// The high product of 256 * c + 1 and 257 * f has c * f / 255 as its upper byte.
HWY_INLINE Planes mul(const ExactPlanes& p, PlaneFactor f) {
  return {hn::MulHigh(p.c0, f.v), hn::MulHigh(p.c1, f.v), hn::MulHigh(p.c2, f.v),
          hn::MulHigh(p.alpha, f.v)};
}
HWY_INLINE WordLanes exact(WordLanes c) {
  return hn::OrAnd(hn::Set(Words(), 1), c, hn::Set(Words(), 0xFF00));
}
HWY_INLINE Planes mul(const Planes& p, PlaneFactor f) {
  return mul(ExactPlanes{{exact(p.c0), exact(p.c1), exact(p.c2), exact(p.alpha)}}, f);
}

HWY_INLINE WordLanes addPlanes(WordLanes a, WordLanes b) {
#if HWY_TARGET == HWY_SCALAR
  const auto upper = hn::Set(Words(), 0xFF00);
  return hn::SaturatedAdd(a & upper, b & upper);
#else
  const hn::Repartition<uint8, Words> d8;
  return hn::BitCast(Words(), hn::SaturatedAdd(hn::BitCast(d8, a), hn::BitCast(d8, b)));
#endif
}
HWY_INLINE Planes add(const Planes& a, const Planes& b) {
  return {addPlanes(a.c0, b.c0), addPlanes(a.c1, b.c1), addPlanes(a.c2, b.c2), a.alpha};
}

/// Splits words of channels 0 and 1 and words of channel 2 and alpha.
HWY_INLINE Planes planesOf(WordLanes lower, WordLanes upper) {
  return {hn::ShiftLeft<8>(lower), lower, hn::ShiftLeft<8>(upper), upper};
}

/// Loads pixels of four bytes: kLanes<Words> of them, or the first few.
#if HWY_TARGET == HWY_SCALAR
HWY_INLINE Planes loadPlanes(const uint8* at, WholeBlock part) {
  return planesOf(loadPart<4>(Words(), at, 0, part), loadPart<4>(Words(), at, 2, part));
}
#elif HWY_TARGET == HWY_AVX3
template <class Part> HWY_INLINE Planes loadPlanes(const uint8* at, Part part) {
  const Words d;
  const auto first = loadPart<4>(d, at, 0, part);
  const auto second = loadPart<4>(d, at, 2 * kLanes<Words>, part);
  return planesOf(hn::ConcatEven(d, second, first), hn::ConcatOdd(d, second, first));
}
#else
/// Each block of sixteen bytes gets four pixels, the upper half of a vector those after the next.
HWY_INLINE WordLanes loadEveryOtherBlock(const uint8* at) {
  if constexpr (kLanes<Words> == 8) {
    return loadLanes(Words(), at);
  } else {
    const hn::Half<Words> half;
    return hn::Combine(Words(), loadLanes(half, at + 32), loadLanes(half, at));
  }
}
HWY_INLINE Planes loadPlanes(const uint8* at, WholeBlock /*part*/) {
  const Words d;
  const hn::Repartition<uint8, Words> d8;
  const hn::Repartition<uint64, Words> d64;
  alignas(16) static constexpr uint8 kSplit[16] = {0, 1, 4, 5, 8,  9,  12, 13,
                                                   2, 3, 6, 7, 10, 11, 14, 15};
  const auto split = [&](WordLanes pixels) HWY_ATTR {
    const auto bytes = hn::TableLookupBytes(hn::BitCast(d8, pixels), hn::LoadDup128(d8, kSplit));
    return hn::BitCast(d64, bytes);
  };
  const auto first = split(loadEveryOtherBlock(at));
  const auto second = split(loadEveryOtherBlock(at + 16));
  return planesOf(hn::BitCast(d, hn::InterleaveLower(d64, first, second)),
                  hn::BitCast(d, hn::InterleaveUpper(d64, first, second)));
}
#endif

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
