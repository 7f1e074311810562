// SPDX-License-Identifier: MIT
//
// The row loops of the vector code. Included once per instruction set, after Highway.
//
// A kernel says what happens to one block of lanes; the loop here runs it over a row: whole vectors
// first, then each smaller power of two that still fits, down to one lane. So every lane is handled
// by the same text, nothing outside the row is touched, and the level without vectors runs one lane
// at a time as the reference.

#if defined(RASTER_ROWS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_ROWS_INL_H
#undef RASTER_ROWS_INL_H
#else
#define RASTER_ROWS_INL_H
#endif

#include <cstddef>
#include <cstring>

#include "baseTypes.h"
#include "cacheSize.h"
#include "frame/frameBuffer.h"
#include "hwy/highway.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace hn = hwy::HWY_NAMESPACE;

/// The number of lanes of a tag, at compile time, and whether there are vectors of half as many.
template <class D> inline constexpr size_t kLanes = hn::MaxLanes(D());
template <class D> inline constexpr bool kHasHalf = kLanes<D> >= 2;

/// Loads and stores lanes of any width at any alignment.
template <class D> HWY_INLINE hn::Vec<D> loadLanes(D d, const uint8* at) {
#if HWY_TARGET == HWY_SCALAR
  hn::TFromD<D> lane;
  memcpy(&lane, at, sizeof lane);
  return hn::Set(d, lane);
#else
  return hn::BitCast(d, hn::LoadU(hn::Repartition<uint8, D>(), at));
#endif
}
template <class D> HWY_INLINE void storeLanes(D d, hn::Vec<D> lanes, uint8* at) {
#if HWY_TARGET == HWY_SCALAR
  (void)d;
  const hn::TFromD<D> lane = hn::GetLane(lanes);
  memcpy(at, &lane, sizeof lane);
#else
  const hn::Repartition<uint8, D> d8;
  hn::StoreU(hn::BitCast(d8, lanes), d8, at);
#endif
}

/// Keeps lanes in a register. Without the barrier GCC reads the memory again at every use.
template <class V> HWY_INLINE V inRegister(V lanes) {
#if HWY_TARGET != HWY_SCALAR
  asm("" : "+v"(lanes.raw));
#endif
  return lanes;
}

/// What fetchAhead asks for at once.
inline constexpr size_t kCacheLine = 64;

/// Whether rows are together too much for the inner caches, so that it pays to fetch ahead.
HWY_INLINE bool isFar(size_t bytes, uint32 height) {
  constexpr uint64 kInnerCaches = uint64{512} * 1024;
  return uint64{bytes} * height >= kInnerCaches;
}

/// Whether it pays to fetch ahead rows that are read and written back. Beyond all caches the
/// processor is faster alone.
HWY_INLINE bool isFetchedAhead(size_t bytes, uint32 height) {
  return isFar(bytes, height) && !isBeyondCaches(uint64{bytes} * height);
}

/// Asks for the memory that a loop over a long row comes to soon: processors do not fetch far ahead
/// of stores by themselves. It is only a hint, so the end of the row does not matter.
HWY_INLINE void fetchAhead(const uint8* at) {
  constexpr intptr_t kAhead = 1024;
  __builtin_prefetch(nextRow(at, kAhead));
}

/// Runs row(dst) from the first row to the last one.
template <class Row> HWY_INLINE void forRows(const Rows& rows, const Row& row) {
  const intptr_t step = rows.step;  // read here, as a store to a pixel might change it
  uint8* dst = rows.first;
  for (uint32 y = rows.rows; y != 0; --y, dst = nextRow(dst, step)) row(dst);
}

/// Runs row(dst, src) from the first row to the last one, with the steps that are given.
template <class Row>
HWY_INLINE void forRows(const RowPair& rows, intptr_t dstStep, intptr_t srcStep, const Row& row) {
  uint8* dst = rows.dst;
  const uint8* src = rows.src;
  for (uint32 y = rows.rows; y != 0; --y, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep))
    row(dst, src);
}
template <class Row> HWY_INLINE void forRows(const RowPair& rows, const Row& row) {
  forRows(rows, rows.dstStep, rows.srcStep, row);
}

/// The same for rows whose steps are equal: one register less.
template <class Row> HWY_INLINE void forRowsInStep(const RowPair& rows, const Row& row) {
  forRows(rows, rows.dstStep, rows.dstStep, row);
}

/// Runs body(tag, first) for the rest of a row that is shorter than two blocks of `d`.
template <class D, class Body>
HWY_INLINE void forRestOfLanes(D d, size_t first, size_t count, const Body& body) {
  if (count - first >= hn::Lanes(d)) {
    body(d, first);
    first += hn::Lanes(d);
  }
  if constexpr (kHasHalf<D>) {
    if (first != count) forRestOfLanes(hn::Half<D>(), first, count, body);
  }
}

/// Runs body(tag, first) over the lanes [0, count) from left to right. `tag` says how many lanes
/// from `first` on the call is for: those of `d`, and at the end of the row smaller ones.
template <class D, class Body> HWY_INLINE void forLanes(D d, size_t count, const Body& body) {
  const size_t step = hn::Lanes(d);
  size_t first = 0;
  for (; count - first >= step; first += step) body(d, first);
  if constexpr (kHasHalf<D>) {
    if (first != count) forRestOfLanes(hn::Half<D>(), first, count, body);
  }
}

/// Runs body(tag, at) over a row of `count` lanes that is read and written back, from left to
/// right, four vectors at a time; with kFetches its memory is fetched ahead.
template <bool kFetches, class D, class Body>
HWY_INLINE void forLanesOfLongRow(D d, size_t count, uint8* row, const Body& body) {
  constexpr size_t kBytes = kLanes<D> * sizeof(hn::TFromD<D>);
  uint8* at = row;
  for (size_t fours = count / (4 * kLanes<D>); fours != 0; --fours, at += 4 * kBytes) {
    for (size_t k = 0; kFetches && k < 4 * kBytes; k += kCacheLine) fetchAhead(at + k);
    body(d, at);
    body(d, at + kBytes);
    body(d, at + 2 * kBytes);
    body(d, at + 3 * kBytes);
  }
  forLanes(d, count % (4 * kLanes<D>),
           [&](auto tag, size_t x) HWY_ATTR { body(tag, at + x * sizeof(hn::TFromD<D>)); });
}

/// forLanesFromRight for the rest of a row, [0, count), that is shorter than two blocks of `d`.
template <class D, class Body>
HWY_INLINE void forRestOfLanesFromRight(D d, size_t count, const Body& body) {
  if (count >= hn::Lanes(d)) {
    count -= hn::Lanes(d);
    body(d, count);
  }
  if constexpr (kHasHalf<D>) {
    if (count != 0) forRestOfLanesFromRight(hn::Half<D>(), count, body);
  }
}

/// As forLanes, from right to left: the smaller blocks are at the start of the row.
template <class D, class Body>
HWY_INLINE void forLanesFromRight(D d, size_t count, const Body& body) {
  const size_t step = hn::Lanes(d);
  for (; count >= step; count -= step) body(d, count - step);
  if constexpr (kHasHalf<D>) {
    if (count != 0) forRestOfLanesFromRight(hn::Half<D>(), count, body);
  }
}

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
