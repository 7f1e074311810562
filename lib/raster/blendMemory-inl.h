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

#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Keeps lanes in a register. Without the barrier GCC reads the memory again at every use.
template <class V> HWY_INLINE V inRegister(V lanes) {
#if HWY_TARGET != HWY_SCALAR
  asm("" : "+v"(lanes.raw));
#endif
  return lanes;
}

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

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
