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
template <size_t kBytes, class D>
HWY_INLINE hn::Vec<D> loadPart(D d, const uint8* block, size_t offset, FirstPixels part) {
  const hn::Repartition<uint8, D> d8;
  const size_t bytes = part.count * kBytes;
  if (offset > bytes) offset = bytes;
  const auto lanes = hn::MaskedLoad(hn::FirstN(d8, bytes - offset), d8, block + offset);
  return inRegister(hn::BitCast(d, lanes));
}
template <size_t kBytes, class D>
HWY_INLINE void storePart(D d, hn::Vec<D> lanes, uint8* block, FirstPixels part) {
  const hn::Repartition<uint8, D> d8;
  hn::BlendedStore(hn::BitCast(d8, lanes), hn::FirstN(d8, part.count * kBytes), d8, block);
}

#endif

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
