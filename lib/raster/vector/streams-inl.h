// SPDX-License-Identifier: MIT
//
// Stores past the caches, for rectangles that no cache holds: what is overwritten as a whole need
// not be fetched first. Included once per instruction set, after Highway.

#if defined(RASTER_STREAMS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_STREAMS_INL_H
#undef RASTER_STREAMS_INL_H
#else
#define RASTER_STREAMS_INL_H
#endif

#include <cstddef>

#include "cacheSize.h"
#include "hwy/cache_control.h"
#include "hwy/highway.h"
#include "rows-inl.h"

#if HWY_TARGET != HWY_SCALAR

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Whether `height` rows of `bytes` are to be stored past the caches: `touched` is what is read and
/// written for each. Of short rows too many cache lines are not whole.
HWY_INLINE bool isStreamed(size_t bytes, size_t touched, uint32 height) {
  constexpr size_t kMinRowBytes = 2048;
  return bytes >= kMinRowBytes && isBeyondCaches(uint64{touched} * height);
}

/// Stores lanes; with kStreams past the caches, at an address that is a multiple of their size, and
/// with endStreams() to follow.
template <bool kStreams, class D> HWY_INLINE void putLanes(D d, hn::Vec<D> lanes, uint8* at) {
  if constexpr (kStreams) {
    const hn::Repartition<uint8, D> d8;
    hn::Stream(hn::BitCast(d8, lanes), d8, at);
  } else {
    storeLanes(d, lanes, at);
  }
}

/// Lets nobody see later stores before those that went past the caches.
HWY_INLINE void endStreams() { hwy::FlushStream(); }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif

#endif
