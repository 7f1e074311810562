// SPDX-License-Identifier: MIT
//
// The six destination formats: how their pixels become four bytes in a 32-bit lane (channels 0, 1
// and 2; the fourth has no meaning) and how they go back. Included once per instruction set.

#include "blendFields.h"

#if defined(RASTER_BLEND_FORMATS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_FORMATS_INL_H
#undef RASTER_BLEND_FORMATS_INL_H
#else
#define RASTER_BLEND_FORMATS_INL_H
#endif

#include "blendOps-inl.h"
#include "frameBuffer.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Shifts left by kBits, or right where that is negative.
template <int kBits, class V> HWY_INLINE V shiftLeft(V v) {
  if constexpr (kBits >= 0) {
    return hn::ShiftLeft<kBits>(v);
  } else {
    return hn::ShiftRight<-kBits>(v);
  }
}

/// Products of the 16-bit halves of a lane with two constants; they fit.
template <uint32 kLower, uint32 kUpper, class D>
HWY_INLINE hn::Vec<D> mulByConstants(D d, hn::Vec<D> v) {
#if HWY_TARGET == HWY_SCALAR
  if constexpr (kLower == kUpper || kUpper == 0) return v * hn::Set(d, kLower);
  return (v & hn::Set(d, 0xFFFFu)) * hn::Set(d, kLower) |
         hn::AndNot(hn::Set(d, 0xFFFFu), v) * hn::Set(d, kUpper);
#else
  const hn::Repartition<uint16, D> d16;
  const auto factors = hn::BitCast(d16, hn::Set(d, kLower | kUpper << 16));
  return hn::BitCast(d, hn::BitCast(d16, v) * factors);
#endif
}

/// Pixels of one or two bytes, with a field for each channel. Bits outside them become 0.
template <class Word, class C0, class C1, class C2> struct Packed {
  static constexpr size_t kBytes = sizeof(Word);
  static constexpr bool kKeepsBytes = false;

  template <class D> static HWY_INLINE Halves<D> load(D d, const uint8* at) {
    const auto word = hn::PromoteTo(d, loadLanes(hn::Rebind<Word, D>(), at));
    const auto even = (shiftLeft<-C0::kShift>(word) | shiftLeft<16 - C2::kShift>(word)) &
                      hn::Set(d, C0::kMask | C2::kMask << 16);
    const auto odd = shiftLeft<-C1::kShift>(word) & hn::Set(d, C1::kMask);
    return {widen<C0, C2>(d, even), widen<C1, NoField>(d, odd)};
  }

  template <class D, class Before>
  static HWY_INLINE void store(D d, Halves<D> p, Before /*before*/, uint8* at) {
    storeFields<8, 8, 24>(d, p.even, p.odd, p.even, at);
  }
  template <class D, class Before>
  static HWY_INLINE void store(D d, Bytes<D> p, Before /*before*/, uint8* at) {
    storeFields<0, 8, 16>(d, p.v, p.v, p.v, at);
  }

 private:
  /// Widens a field in each half of a lane.
  template <class Lower, class Upper, class D>
  static HWY_INLINE hn::Vec<D> widen(D d, hn::Vec<D> fields) {
    const auto widened = mulByConstants<Lower::kCopies, Upper::kCopies>(d, fields);
    constexpr uint32 kLowCopies = Lower::kLowCopy | Upper::kLowCopy << 16;
    if constexpr (kLowCopies == 0) return widened;
    return hn::OrAnd(widened, hn::ShiftLeft<8>(fields), hn::Set(d, kLowCopies));
  }

  /// Stores pixels from the bytes whose first bits are kBit0, kBit1 and kBit2 of three vectors.
  template <int kBit0, int kBit1, int kBit2, class D>
  static HWY_INLINE void storeFields(D d, hn::Vec<D> v0, hn::Vec<D> v1, hn::Vec<D> v2, uint8* at) {
    auto word = shiftLeft<C0::kShift - C0::kUp - kBit0>(v0) & hn::Set(d, C0::kMask << C0::kShift);
    word = hn::OrAnd(word, shiftLeft<C1::kShift - C1::kUp - kBit1>(v1),
                     hn::Set(d, C1::kMask << C1::kShift));
    word = hn::OrAnd(word, shiftLeft<C2::kShift - C2::kUp - kBit2>(v2),
                     hn::Set(d, C2::kMask << C2::kShift));
    const hn::Rebind<Word, D> narrow;
    storeLanes(narrow, hn::TruncateTo(narrow, word), at);
  }
};

/// Pixels of four bytes. The fourth one keeps its value: it is read and written back with the
/// others of its vector.
struct Bytes4 {
  static constexpr size_t kBytes = 4;
  static constexpr bool kKeepsBytes = true;

  template <class D> static HWY_INLINE Bytes<D> load(D d, const uint8* at) {
    return {loadOnce(d, at)};
  }
  template <class D, class P> static HWY_INLINE void store(D d, P p, Bytes<D> before, uint8* at) {
    const auto colors = hn::Set(d, 0x00FFFFFFu);
#if HWY_TARGET == HWY_SCALAR
    storeLanes(d, hn::OrAnd(hn::AndNot(colors, before.v), colors, bytesOf(p).v), at);
#else
    storeLanes(d, hn::IfVecThenElse(colors, bytesOf(p).v, before.v), at);
#endif
  }
};

#if HWY_TARGET == HWY_SCALAR

struct Bytes3 {
  static constexpr size_t kBytes = 3;
  static constexpr bool kKeepsBytes = false;

  template <class D> static HWY_INLINE Bytes<D> load(D d, const uint8* at) {
    return {hn::Set(d, loadPixel<3>(at))};
  }
  template <class D, class P, class Before>
  static HWY_INLINE void store(D /*d*/, P p, Before /*before*/, uint8* at) {
    storePixel<3>(at, hn::GetLane(bytesOf(p).v));
  }
};

#else

/// Pixels of three bytes. Four of them are the twelve lower bytes of a block of sixteen.
struct Bytes3 {
  static constexpr size_t kBytes = 3;
  static constexpr bool kKeepsBytes = false;

  template <class D> static HWY_INLINE Bytes<D> load(D d, const uint8* at) {
    const hn::Repartition<uint8, D> d8;
    alignas(16) static constexpr uint8 kSpread[16] = {0, 1, 2, 0x80, 3, 4,  5,  0x80,
                                                      6, 7, 8, 0x80, 9, 10, 11, 0x80};
    const auto blocks = hn::BitCast(d8, loadBlocks(d, at));
    return {hn::BitCast(d, hn::TableLookupBytesOr0(blocks, hn::LoadDup128(d8, kSpread)))};
  }

  template <class D, class P, class Before>
  static HWY_INLINE void store(D d, P p, Before /*before*/, uint8* at) {
    const hn::Repartition<uint8, D> d8;
    alignas(16) static constexpr uint8 kGather[16] = {0,  1,  2,  4,  5,    6,    8,    9,
                                                      10, 12, 13, 14, 0x80, 0x80, 0x80, 0x80};
    const auto bytes = hn::BitCast(d8, bytesOf(p).v);
    storeBlocks(d, hn::BitCast(d, hn::TableLookupBytesOr0(bytes, hn::LoadDup128(d8, kGather))), at);
  }

 private:
  // Three quarters of a vector are read and written as its lower half and half of the upper one.
  template <class D> static HWY_INLINE hn::Vec<D> loadQuarters(D d, const uint8* at) {
    const hn::Half<D> half;
    const hn::Half<decltype(half)> quarter;
    const auto upper = loadLanes(quarter, at + sizeof(uint32) * kLanes<decltype(half)>);
    return hn::Combine(d, hn::ZeroExtendVector(half, upper), loadLanes(half, at));
  }
  template <class D> static HWY_INLINE void storeQuarters(D /*d*/, hn::Vec<D> v, uint8* at) {
    const hn::Half<D> half;
    const hn::Half<decltype(half)> quarter;
    storeLanes(half, hn::LowerHalf(half, v), at);
    storeLanes(quarter, hn::LowerHalf(quarter, hn::UpperHalf(half, v)),
               at + sizeof(uint32) * kLanes<decltype(half)>);
  }

  template <class D> static HWY_INLINE hn::Vec<D> loadBlocks(D d, const uint8* at) {
    const auto bytes = loadQuarters(d, at);
    if constexpr (kLanes<D> == 4) {
      return bytes;
    } else {
      alignas(64) static constexpr uint32 kLane[16] = {0, 1, 2, 2, 3, 4,  5,  5,
                                                       6, 7, 8, 8, 9, 10, 11, 11};
      return hn::TableLookupLanes(bytes, hn::SetTableIndices(d, kLane));
    }
  }
  template <class D> static HWY_INLINE void storeBlocks(D d, hn::Vec<D> blocks, uint8* at) {
    if constexpr (kLanes<D> == 4) {
      storeQuarters(d, blocks, at);
    } else {
      alignas(64) static constexpr uint32 kLane[16] = {0, 1, 2, 4, 5, 6, 0, 0,
                                                       0, 0, 0, 0, 0, 0, 0, 0};
      alignas(64) static constexpr uint32 kLongLane[16] = {0,  1,  2,  4,  5, 6, 8, 9,
                                                           10, 12, 13, 14, 0, 0, 0, 0};
      constexpr const uint32* kFrom = kLanes<D> == 8 ? kLane : kLongLane;
      storeQuarters(d, hn::TableLookupLanes(blocks, hn::SetTableIndices(d, kFrom)), at);
    }
  }
};

#endif

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
