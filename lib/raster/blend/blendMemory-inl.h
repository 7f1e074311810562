// SPDX-License-Identifier: MIT
//
// How blending reads and writes blocks of pixels, whole and, at the end of a row, in part. Included
// once per instruction set.

#if defined(RASTER_BLEND_MEMORY_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_MEMORY_INL_H
#undef RASTER_BLEND_MEMORY_INL_H
#else
#define RASTER_BLEND_MEMORY_INL_H
#endif

#include <algorithm>
#include <type_traits>

#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// How much of a block of pixels is in the rectangle: all of it.
struct WholeBlock {};

/// Loads lanes from `offset` bytes after the start of a block of pixels of kBytes bytes.
template <size_t kBytes, class D>
HWY_INLINE hn::Vec<D> loadPart(D d, const uint8* block, size_t offset, WholeBlock /*part*/) {
  return inRegister(loadLanes(d, block + offset));
}
/// Stores lanes to the start of a block of pixels of kBytes bytes.
template <size_t kBytes, class D>
HWY_INLINE void storePart(D d, hn::Vec<D> lanes, uint8* block, WholeBlock /*part*/) {
  storeLanes(d, lanes, block);
}

#if HWY_TARGET == HWY_AVX3

/// The same where the rectangle has the first pixels only, by masks: memory behind them is not
/// touched.
struct FirstPixels {
  size_t count;
};

/// What a mask counts: pixels, or bytes of pixels of three. Fewer bits are quicker to find.
template <size_t kBytes>
using MaskUnit =
    std::conditional_t<kBytes == 4, uint32, std::conditional_t<kBytes == 2, uint16, uint8>>;

template <size_t kBytes, class D>
HWY_INLINE hn::Vec<D> loadPart(D d, const uint8* block, size_t offset, FirstPixels part) {
  using Unit = MaskUnit<kBytes>;
  const hn::Repartition<Unit, D> units;
  const size_t count = part.count * kBytes / sizeof(Unit);
  const size_t first = std::min(offset / sizeof(Unit), count);
  const void* from = block + first * sizeof(Unit);
  const auto mask = hn::FirstN(units, count - first);
  return inRegister(hn::BitCast(d, hn::MaskedLoad(mask, units, static_cast<const Unit*>(from))));
}
template <size_t kBytes, class D>
HWY_INLINE void storePart(D d, hn::Vec<D> lanes, uint8* block, FirstPixels part) {
  using Unit = MaskUnit<kBytes>;
  const hn::Repartition<Unit, D> units;
  void* const to = block;
  const auto mask = hn::FirstN(units, part.count * kBytes / sizeof(Unit));
  hn::BlendedStore(hn::BitCast(units, lanes), mask, units, static_cast<Unit*>(to));
}

#endif

// ---- Pixels of four bytes without the fourth ---------------------------------------------------

/// A whole block whose last byte is not in the rectangle.
struct AllButLastByte {};

/// Whether storeColors leaves out byte 3 of every pixel. Where it does not, it writes back what
/// loadColors has read. That of a row's last pixel is neither read nor written: AllButLastByte.
inline constexpr bool kMasksColors = HWY_TARGET == HWY_AVX3;

#if HWY_TARGET != HWY_SCALAR

// Not by a mask: from memory that is far a masked load takes several times as long.
template <class D> HWY_INLINE hn::Vec<D> loadColors(D d, const uint8* block, WholeBlock part) {
  return loadPart<4>(d, block, 0, part);
}

#endif

#if HWY_TARGET == HWY_AVX3

template <class D, class Part> HWY_INLINE auto colorMask(D d, Part /*whole*/) {
  const hn::Repartition<uint8, D> d8;
  return hn::MaskFromVec(hn::BitCast(d8, hn::Set(d, 0x00FFFFFFu)));
}
template <class D> HWY_INLINE auto colorMask(D d, FirstPixels part) {
  const hn::Repartition<uint8, D> d8;
  const auto pixels = hn::FirstN(d, part.count);
  return hn::MaskFromVec(hn::BitCast(d8, hn::IfThenElseZero(pixels, hn::Set(d, 0x00FFFFFFu))));
}

template <class D, class Part>
HWY_INLINE hn::Vec<D> loadColors(D d, const uint8* block, Part part) {
  const hn::Repartition<uint8, D> d8;
  return inRegister(hn::BitCast(d, hn::MaskedLoad(colorMask(d, part), d8, block)));
}
template <class D, class Part>
HWY_INLINE void storeColors(D d, hn::Vec<D> pixels, hn::Vec<D> /*before*/, uint8* block,
                            Part part) {
  const hn::Repartition<uint8, D> d8;
  hn::BlendedStore(hn::BitCast(d8, pixels), colorMask(d, part), d8, block);
}

#elif HWY_TARGET != HWY_SCALAR

template <class D>
HWY_INLINE void storeColors(D d, hn::Vec<D> pixels, hn::Vec<D> before, uint8* block,
                            WholeBlock part) {
  storePart<4>(d, hn::IfVecThenElse(hn::Set(d, 0x00FFFFFFu), pixels, before), block, part);
}

/// Half of a vector in bytes. The second half of a block without its last byte is moved together
/// with the byte before it.
template <class D> using HalfOfBytes = hn::Half<hn::Repartition<uint8, D>>;
template <class D> inline constexpr size_t kSecondHalf = kLanes<HalfOfBytes<D>> - 1;

template <class D>
HWY_INLINE hn::Vec<D> loadColors(D d, const uint8* block, AllButLastByte /*part*/) {
  const HalfOfBytes<D> half;
  const auto second = hn::ShiftRightBytes<1>(half, hn::LoadU(half, block + kSecondHalf<D>));
  return hn::BitCast(d, hn::Combine(hn::Twice<HalfOfBytes<D>>(), second, hn::LoadU(half, block)));
}
template <class D>
HWY_INLINE void storeColors(D d, hn::Vec<D> pixels, hn::Vec<D> before, uint8* block,
                            AllButLastByte /*part*/) {
  const HalfOfBytes<D> half;
  const hn::Repartition<uint8, D> d8;
  const auto all = hn::BitCast(d8, hn::IfVecThenElse(hn::Set(d, 0x00FFFFFFu), pixels, before));
  const auto first = hn::LowerHalf(half, all);
  const auto second = hn::UpperHalf(half, all);
  hn::StoreU(first, half, block);
  hn::StoreU(hn::CombineShiftRightBytes<kSecondHalf<D>>(half, second, first), half,
             block + kSecondHalf<D>);
}

#endif

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
