// SPDX-License-Identifier: MIT
//
// Pixels in 32-bit lanes, as the scaler loads, mixes, sums and stores them. Included once per
// instruction set.

#if defined(RASTER_SCALE_LANES_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_LANES_INL_H
#undef RASTER_SCALE_LANES_INL_H
#else
#define RASTER_SCALE_LANES_INL_H
#endif

#include <algorithm>
#include <array>

#include "rasterScaleInternal.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"
#include "vector/triples-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

inline constexpr size_t kBlock = 1;

inline void copyRow(uint8* dst, const uint8* src, size_t bytes) { memcpy(dst, src, bytes); }

inline bool areStreamed(const ScaleJob&) { return false; }
inline void endStreams() {}

#else

using Pixels = hn::ScalableTag<uint32>;          // one pixel a lane
using Halves = hn::Repartition<uint16, Pixels>;  // two channels of a pixel, 16 bits each
using Pairs = hn::Repartition<uint64, Pixels>;   // two pixels
using PixelVec = hn::Vec<Pixels>;
using HalvesVec = hn::Vec<Halves>;

inline constexpr size_t kBlock = kLanes<Pixels>;

/// Whether rows of 4-byte pixels go past the caches: where their vectors lie at multiples of their
/// size.
inline bool areStreamed(const ScaleJob& job) {
  const auto places = reinterpret_cast<uintptr_t>(job.dst) | static_cast<uintptr_t>(job.dstPitch);
  return isStreamed(job.rowBytes(), job.touchedBytes(), job.height) &&
         places % sizeof(PixelVec) == 0;
}

/// Copies a run of a few vectors at most, without a call.
HWY_INLINE void copyShort(uint8* dst, const uint8* src, size_t bytes) {
  forLanes(hn::Repartition<uint8, Pixels>(), bytes,
           [=](auto d, size_t i) { hn::StoreU(hn::LoadU(d, src + i), d, dst + i); });
}

/// Copies a row. Small rectangles have many short ones.
HWY_INLINE void copyRow(uint8* dst, const uint8* src, size_t bytes) {
  if (bytes > 16 * kBlock) {
    memcpy(dst, src, bytes);
  } else {
    copyShort(dst, src, bytes);
  }
}

/// Stores the first lanes: at least one of them, and not all.
template <class D> HWY_INLINE void storeFirst(D d, hn::Vec<D> pixels, size_t count, uint8* at) {
  if constexpr (HWY_TARGET == HWY_AVX3 && kLanes<D> == kBlock) {
    void* to = at;
    hn::BlendedStore(pixels, hn::FirstN(d, count), d, static_cast<uint32*>(to));
  } else if constexpr (kHasHalf<D>) {
    const hn::Half<D> half;
    const auto lower = hn::LowerHalf(half, pixels);
    if (count < kLanes<D> / 2) return storeFirst(half, lower, count, at);
    storeLanes(half, lower, at);
    if (count > kLanes<D> / 2)
      storeFirst(half, hn::UpperHalf(half, pixels), count - kLanes<D> / 2, at + 2 * kLanes<D>);
  }
}

/// Whether vectors can be loaded of which only the first pixels are there.
inline constexpr bool kLoadsParts = HWY_TARGET <= HWY_AVX2;

#if HWY_TARGET <= HWY_AVX2

/// Loads the first lanes; the others are 0, and their memory is not touched.
template <class D> HWY_INLINE hn::Vec<D> loadFirst(D d, const uint8* at, size_t count) {
  const void* from = at;
  return hn::MaskedLoad(hn::FirstN(d, count), d, static_cast<const uint32*>(from));
}

#endif

#if HWY_TARGET == HWY_AVX3

/// A vector of 3-byte pixels as 4-byte ones, the fourth byte being 0. Reads exactly these.
HWY_INLINE PixelVec widenPixels(const uint8* at) {
  return spreadTriples(Pixels(), loadFirst(Pixels(), at, kBlock / 4 * 3));
}
/// The same for the first pixels of a vector.
HWY_INLINE PixelVec widenFirst(const uint8* at, size_t count) {
  const Pixels d;
  if (count % 4 == 0) return spreadTriples(d, loadFirst(d, at, count / 4 * 3));
  const hn::Repartition<uint8, Pixels> d8;  // a mask of that many bits takes long on 32-bit x86
  return spreadTriples(d, hn::BitCast(d, hn::MaskedLoad(hn::FirstN(d8, 3 * count), d8, at)));
}

#else

/// Where the bytes of 4-byte pixels are when the first 2 * kBlock bytes of the 3-byte ones are in
/// the lower half of a vector and the last ones in the upper half.
inline constexpr auto kFromHalves = [] {
  std::array<uint8, 4 * kBlock> bytes{};
  for (size_t i = 0; i < bytes.size(); ++i) {
    const size_t from = i / 4 * 3 + i % 4;
    const size_t place = i < 2 * kBlock ? from : from + kBlock;
    bytes[i] = i % 4 == 3 ? kNoByte : static_cast<uint8>(place % 16);
  }
  return bytes;
}();

/// A vector of 3-byte pixels as 4-byte ones, the fourth byte being 0. Reads exactly these.
HWY_INLINE PixelVec widenPixels(const uint8* at) {
  const hn::Repartition<uint8, Pixels> d8;
  const hn::Half<decltype(d8)> half;
  const auto bytes = hn::Combine(d8, hn::LoadU(half, at + kBlock), hn::LoadU(half, at));
  return hn::BitCast(Pixels(), hn::TableLookupBytesOr0(bytes, hn::LoadU(d8, kFromHalves.data())));
}
/// The same for the first pixels of a vector.
HWY_INLINE PixelVec widenFirst(const uint8* at, size_t count) {
  if (count == kBlock) return widenPixels(at);
  uint8 pixels[4 * kBlock] = {};
  copyShort(pixels, at, 3 * count);
  return widenPixels(pixels);
}

#endif

/// The same where a third more of memory may be read.
HWY_INLINE PixelVec widenWithin(const uint8* at) {
  if constexpr (HWY_TARGET == HWY_AVX2) return widenPixels(at);
  return spreadTriples(Pixels(), loadLanes(Pixels(), at));
}

/// Stores a vector of pixels in three bytes each: exactly these, by two stores.
HWY_INLINE void storeTriples(PixelVec pixels, uint8* at) {
  const Pixels d;
  const hn::Half<Pixels> half;
  const hn::Half<decltype(half)> quarter;
  const PixelVec packed = gatherTriples(d, pixels);
  storeLanes(half, hn::LowerHalf(half, packed), at);
  storeLanes(quarter, hn::LowerHalf(quarter, hn::UpperHalf(half, packed)), at + 2 * kBlock);
}

/// Stores the first pixels in three bytes each.
HWY_INLINE void storeFirstTriples(PixelVec pixels, size_t count, uint8* at) {
  if (count == kBlock) return storeTriples(pixels, at);
  uint8 packed[4 * kBlock];
  storeLanes(Pixels(), gatherTriples(Pixels(), pixels), packed);
  copyShort(at, packed, 3 * count);
}

/// Widens a row of 3-byte pixels; reads exactly that. `out` has room for a vector more.
HWY_INLINE void widenRow(const uint8* row, uint32 count, uint8* out) {
  const Pixels d;
  uint32 i = 0;
  for (; size_t{3} * (count - i) >= 4 * kBlock; i += kBlock)
    storeLanes(d, widenWithin(row + size_t{3} * i), out + size_t{4} * i);
  for (; i < count; i += kBlock)
    storeLanes(d, widenFirst(row + size_t{3} * i, std::min<size_t>(count - i, kBlock)),
               out + size_t{4} * i);
}

/// The pixels of the even (kFirst 0) or odd (kFirst 1) columns of two vectors, within each 16-byte
/// part: two of the first vector and two of the second.
template <int kFirst, class V> HWY_INLINE V everyOther(V left, V right) {
  constexpr int kPick = kFirst == 0 ? 0x88 : 0xDD;
  if constexpr (sizeof(left.raw) == 16) {
    return V{_mm_castps_si128(
        _mm_shuffle_ps(_mm_castsi128_ps(left.raw), _mm_castsi128_ps(right.raw), kPick))};
#if HWY_TARGET <= HWY_AVX2
  } else if constexpr (sizeof(left.raw) == 32) {
    return V{_mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(left.raw), _mm256_castsi256_ps(right.raw), kPick))};
#endif
#if HWY_TARGET <= HWY_AVX3
  } else {
    return V{_mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(left.raw), _mm512_castsi512_ps(right.raw), kPick))};
#endif
  }
}

/// Puts in order what instructions leave that work within 16-byte parts: part b has the units b,
/// b + parts, b + 2 * parts... of kUnit pixels.
template <unsigned kUnit, class D> HWY_INLINE hn::Vec<D> inOrder(D d, hn::Vec<D> pixels) {
  constexpr size_t kParts = kLanes<D> / 4;
  if constexpr (kParts == 1) {
    return pixels;
  } else {
    static constexpr WordOrder<D> kOrder = [] {
      WordOrder<D> order{};
      for (size_t i = 0; i < order.size(); ++i) {
        const size_t unit = i / kUnit;
        order[i] = static_cast<int32>(unit % kParts * 4 + unit / kParts * kUnit + i % kUnit);
      }
      return order;
    }();
    return chooseWords(d, pixels, kOrder);
  }
}

/// A weight of each lane in both halves.
HWY_INLINE PixelVec inBothHalves(PixelVec weight) {
  return hn::Or(weight, hn::ShiftLeft<16>(weight));
}

/// The mix of two vectors of pixels; weights fill both halves of their pixel.
HWY_INLINE PixelVec mixLanes(PixelVec p0, PixelVec p1, HalvesVec w0, HalvesVec w1) {
  const Halves d;
  const HalvesVec v0 = hn::BitCast(d, p0);
  const HalvesVec v1 = hn::BitCast(d, p1);
  const HalvesVec even = hn::Set(d, uint16{255});
  const HalvesVec low = hn::Add(hn::Mul(hn::And(v0, even), w0), hn::Mul(hn::And(v1, even), w1));
  const HalvesVec high =
      hn::Add(hn::Mul(hn::ShiftRight<8>(v0), w0), hn::Mul(hn::ShiftRight<8>(v1), w1));
  return hn::BitCast(Pixels(), hn::Or(hn::ShiftRight<8>(low), hn::AndNot(even, high)));
}

/// Channel sums of a vector of pixels in 16-bit lanes.
struct LaneSums {
  HalvesVec br;
  HalvesVec ga;

  HWY_INLINE void add(PixelVec pixels) {
    const HalvesVec v = hn::BitCast(Halves(), pixels);
    br = hn::Add(br, hn::And(v, hn::Set(Halves(), uint16{255})));
    ga = hn::Add(ga, hn::ShiftRight<8>(v));
  }
  /// Adds channel * weight / 256, truncated. A weight fills both halves of its pixel.
  HWY_INLINE void add(PixelVec pixels, HalvesVec weight) {
    const HalvesVec v = hn::BitCast(Halves(), pixels);
    br = hn::Add(br, hn::MulHigh(hn::ShiftLeft<8>(v), weight));
    ga = hn::Add(ga, hn::MulHigh(hn::And(v, hn::Set(Halves(), uint16{0xFF00})), weight));
  }
};

HWY_INLINE LaneSums noSums() { return {hn::Zero(Halves()), hn::Zero(Halves())}; }

#endif

/// The pixels of a destination row in whole vectors: what samplers fill.
inline size_t blockPixels(const ScaleJob& job) {
  return (job.width + kBlock - 1) / kBlock * kBlock;
}

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
