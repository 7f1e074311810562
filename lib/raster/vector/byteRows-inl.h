// SPDX-License-Identifier: MIT
//
// Rows of bytes as vectors that overlap. Included once per instruction set, after Highway.
//
// A row's first and last vector lie where the row begins and ends, the others at aligned addresses
// between them:
//
//     |==first==|
//          |--------|--------|--------|
//                                |==last===|
//
// So no row has a tail loop, and rows of any length and place take the same few branches. Vectors
// may overlap provided that each one is made before its neighbour is stored; hence this is for rows
// of which no step reads what an earlier one stored.
//
// What a vector is made of is an argument: make(tag, src, dst, at) gives the lanes at the offset
// `at` of a row.

#if defined(RASTER_BYTE_ROWS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BYTE_ROWS_INL_H
#undef RASTER_BYTE_ROWS_INL_H
#else
#define RASTER_BYTE_ROWS_INL_H
#endif

#include "frame/frameBuffer.h"
#include "hwy/highway.h"
#include "rows-inl.h"
#include "streams-inl.h"

#if HWY_TARGET != HWY_SCALAR

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// Runs body(tag) for the largest vector that `lanes` lanes fill: `d`, a half of it and so on, of
/// no less than kLeast lanes. Returns false where they fill none.
template <size_t kLeast = 1, class D, class Body>
HWY_INLINE bool withLargestVector(D d, size_t lanes, const Body& body) {
  if (lanes >= kLanes<D>) {
    body(d);
    return true;
  }
  if constexpr (kLanes<D> >= 2 * kLeast) {
    return withLargestVector<kLeast>(hn::Half<D>(), lanes, body);
  } else {
    return false;
  }
}

/// Calls body(row) where row(dst, src, bytes) stores a row of `bytes`, at most two vectors of `d`:
/// the widest lanes that fit, from either end.
template <class D, class Make, class Body>
HWY_INLINE void withShortRow(D d, size_t bytes, const Make& make, const Body& body) {
  withLargestVector(d, bytes, [&](auto tag) HWY_ATTR {
    constexpr size_t n = kLanes<decltype(tag)>;
    if (bytes == n) {
      body([&, tag](uint8* dst, const uint8* src, size_t /*size*/)
               HWY_ATTR { storeLanes(tag, make(tag, src, dst, 0), dst); });
    } else {
      body([&, tag](uint8* dst, const uint8* src, size_t size) HWY_ATTR {
        const auto first = make(tag, src, dst, 0);
        const auto last = make(tag, src, dst, size - n);
        storeLanes(tag, first, dst);
        storeLanes(tag, last, dst + size - n);
      });
    }
  });
}

/// Stores `bytes` from the offset `at` of a row on, two to four vectors, which are made first.
template <class D, class Make>
HWY_INLINE void storeFourVectors(D d, uint8* dst, const uint8* src, size_t at, size_t bytes,
                                 const Make& make) {
  constexpr size_t n = kLanes<D>;
  const size_t end = at + bytes;
  const auto first = make(d, src, dst, at);
  const auto second = make(d, src, dst, at + n);
  const auto third = make(d, src, dst, end - 2 * n);
  const auto last = make(d, src, dst, end - n);
  storeLanes(d, first, dst + at);
  storeLanes(d, second, dst + at + n);
  storeLanes(d, third, dst + end - 2 * n);
  storeLanes(d, last, dst + end - n);
}

/// Stores a row of more than two vectors in the order of a walk, four at a time. The outer two are
/// made first and stored last.
template <Walk kWalk, class Make>
HWY_INLINE void storeLongRow(uint8* dst, const uint8* src, size_t bytes, const Make& make) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t n = kLanes<decltype(d)>;
  const size_t end = bytes - n;
  const auto first = make(d, src, dst, 0);
  const auto last = make(d, src, dst, end);
  const auto storeOne = [&](size_t at) HWY_ATTR { storeLanes(d, make(d, src, dst, at), dst + at); };
  const auto storeFour = [&](size_t at)
                             HWY_ATTR { storeFourVectors(d, dst, src, at, 4 * n, make); };
  if constexpr (kWalk == Walk::kToRight) {
    size_t i = n - reinterpret_cast<uintptr_t>(dst) % n;
    for (; i + 3 * n < end; i += 4 * n) storeFour(i);
    for (; i < end; i += n) storeOne(i);
  } else {
    size_t i = bytes - 1 - (reinterpret_cast<uintptr_t>(dst) + bytes - 1) % n;
    for (; i > 4 * n; i -= 4 * n) storeFour(i - 4 * n);
    for (; i > n; i -= n) storeOne(i - n);
  }
  storeLanes(d, first, dst);
  storeLanes(d, last, dst + end);
}

/// Stores a row of more than a vector past the caches.
template <class Make>
HWY_INLINE void streamLongRow(uint8* dst, const uint8* src, size_t bytes, const Make& make) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t n = kLanes<decltype(d)>;
  const size_t end = bytes - n;
  storeLanes(d, make(d, src, dst, 0), dst);
  for (size_t i = n - reinterpret_cast<uintptr_t>(dst) % n; i < end; i += n)
    putLanes<true>(d, make(d, src, dst, i), dst + i);
  storeLanes(d, make(d, src, dst, end), dst + end);
}

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif

#endif
