// SPDX-License-Identifier: MIT
//
// The sixteen raster operations, one line each. Included once per instruction set, after Highway.

#if defined(RASTER_ROP_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_ROP_INL_H
#undef RASTER_ROP_INL_H
#else
#define RASTER_ROP_INL_H
#endif

#include <array>
#include <cstddef>
#include <cstdint>
#include <tuple>
#include <utility>

#include "baseTypes.h"
#include "hwy/highway.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

constexpr uint32 Not(uint32 bits) { return ~bits; }  // for vectors, Highway's is found

// s and d are source and destination: a uint32 or a vector of bytes.
constexpr auto kClear = [](auto, auto d) { return d ^ d; };
constexpr auto kAnd = [](auto s, auto d) { return s & d; };
constexpr auto kAndReverse = [](auto s, auto d) { return s & Not(d); };
constexpr auto kCopy = [](auto s, auto) { return s; };
constexpr auto kAndInverted = [](auto s, auto d) { return Not(s) & d; };
constexpr auto kNoop = [](auto, auto d) { return d; };
constexpr auto kXor = [](auto s, auto d) { return s ^ d; };
constexpr auto kOr = [](auto s, auto d) { return s | d; };
constexpr auto kNor = [](auto s, auto d) { return Not(s | d); };
constexpr auto kEquiv = [](auto s, auto d) { return Not(s ^ d); };
constexpr auto kInvert = [](auto, auto d) { return Not(d); };
constexpr auto kOrReverse = [](auto s, auto d) { return s | Not(d); };
constexpr auto kCopyInverted = [](auto s, auto) { return Not(s); };
constexpr auto kOrInverted = [](auto s, auto d) { return Not(s) | d; };
constexpr auto kNand = [](auto s, auto d) { return Not(s & d); };
constexpr auto kSet = [](auto, auto d) { return d | Not(d); };

/// All operations by their codes, which are those of the X protocol's graphics-context functions.
constexpr std::tuple kRops{
    kClear, kAnd,   kAndReverse, kCopy,      kAndInverted,  kNoop,       kXor,  kOr,
    kNor,   kEquiv, kInvert,     kOrReverse, kCopyInverted, kOrInverted, kNand, kSet};

/// The truth table of an operation: its results for (s, d) = 11, 10, 01, 00 from bit 0 up.
template <class Rop> inline constexpr uint32 kTruthTable = Rop{}(0b0011u, 0b0101u) & 0b1111u;

// X numbered the operations so that a code is the operation's own truth table.
static_assert([]<size_t... kCode>(std::index_sequence<kCode...>) {
  return ((kTruthTable<std::tuple_element_t<kCode, decltype(kRops)>> == kCode) && ...);
}(std::make_index_sequence<16>()));

/// Whether the result depends on the source, on the destination.
template <class Rop>
inline constexpr bool kReadsSrc = (kTruthTable<Rop> & 3) != kTruthTable<Rop> >> 2;
template <class Rop>
inline constexpr bool kReadsDst = (kTruthTable<Rop> & 5) != (kTruthTable<Rop> >> 1 & 5);

/// What an operation makes of one block of lanes; reads only what it depends on.
template <class Rop, class D>
HWY_INLINE hn::Vec<D> combinedWith(D d, hn::Vec<D> s, const uint8* dst) {
  auto t = hn::Zero(d);
  if constexpr (kReadsDst<Rop>) t = loadLanes(d, dst);
  return Rop{}(s, t);
}
template <class Rop, class D>
HWY_INLINE hn::Vec<D> combined(D d, const uint8* src, const uint8* dst) {
  auto s = hn::Zero(d);
  if constexpr (kReadsSrc<Rop>) s = loadLanes(d, src);
  return combinedWith<Rop>(d, s, dst);
}

/// Combines one block of lanes.
template <class Rop, class D> HWY_INLINE void combine(D d, const uint8* src, uint8* dst) {
  storeLanes(d, combined<Rop>(d, src, dst), dst);
}

/// Combines a row from left to right, a vector at a time.
template <class Rop> HWY_INLINE void combineToRight(uint8* dst, const uint8* src, size_t bytes) {
  const hn::ScalableTag<uint8> d8;
  forLanes(d8, bytes, [&](auto d, size_t i) { combine<Rop>(d, src + i, dst + i); });
}

/// Combines a row from right to left, a vector at a time.
template <class Rop> HWY_INLINE void combineToLeft(uint8* dst, const uint8* src, size_t bytes) {
  const hn::ScalableTag<uint8> d8;
  forLanesFromRight(d8, bytes, [&](auto d, size_t i) { combine<Rop>(d, src + i, dst + i); });
}

// Where no step of a row reads what an earlier one stored, vectors may lie across each other, if
// each is made before the one that it lies across is stored. So the two at the ends of a row lie
// where the row does, those between them at vector boundaries, and rows of any length and place
// take the same few branches.

#if HWY_TARGET != HWY_SCALAR

/// What an operation makes of the lanes at an offset of a row.
template <class Rop> struct CombinedAt {
  template <class D>
  HWY_INLINE hn::Vec<D> operator()(D d, const uint8* src, const uint8* dst, size_t at) const {
    return combined<Rop>(d, src + at, dst + at);
  }
};

/// Calls body(row), where row(dst, src, bytes) combines rows of `bytes`, at most two vectors: with
/// the widest lanes that fit, from either end. combinedAt(tag, src, dst, offset) makes the lanes.
template <class D, class CombinedAt, class Body>
HWY_INLINE void withShortRow(D d, size_t bytes, const CombinedAt& combinedAt, const Body& body) {
  constexpr size_t n = kLanes<D>;
  if (bytes > n) {
    body([&, d](uint8* dst, const uint8* src, size_t size) HWY_ATTR {
      const auto first = combinedAt(d, src, dst, 0);
      const auto last = combinedAt(d, src, dst, size - n);
      storeLanes(d, first, dst);
      storeLanes(d, last, dst + size - n);
    });
  } else if (bytes == n) {
    body([&, d](uint8* dst, const uint8* src, size_t)
             HWY_ATTR { storeLanes(d, combinedAt(d, src, dst, 0), dst); });
  } else if constexpr (n > 1) {
    withShortRow(hn::Half<D>(), bytes, combinedAt, body);
  }
}

/// combineToRight where no step reads what an earlier one stored, for rows longer than a vector.
template <class Rop>
HWY_INLINE void combineLongToRight(uint8* dst, const uint8* src, size_t bytes) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t n = kLanes<decltype(d)>;
  const size_t lastAt = bytes - n;
  auto block = combined<Rop>(d, src, dst);
  size_t at = 0;
  for (size_t i = n - reinterpret_cast<uintptr_t>(dst) % n; i < lastAt; i += n) {
    const auto next = combined<Rop>(d, src + i, dst + i);
    storeLanes(d, block, dst + at);
    block = next;
    at = i;
  }
  const auto last = combined<Rop>(d, src + lastAt, dst + lastAt);
  storeLanes(d, block, dst + at);
  storeLanes(d, last, dst + lastAt);
}

/// combineToLeft where no step reads what an earlier one stored, for rows longer than a vector.
template <class Rop> HWY_INLINE void combineLongToLeft(uint8* dst, const uint8* src, size_t bytes) {
  const hn::ScalableTag<uint8> d;
  constexpr size_t n = kLanes<decltype(d)>;
  size_t at = bytes - n;
  auto block = combined<Rop>(d, src + at, dst + at);
  for (size_t end = bytes - 1 - (reinterpret_cast<uintptr_t>(dst) + bytes - 1) % n; end > n;
       end -= n) {
    const auto next = combined<Rop>(d, src + end - n, dst + end - n);
    storeLanes(d, block, dst + at);
    block = next;
    at = end - n;
  }
  const auto first = combined<Rop>(d, src, dst);
  storeLanes(d, block, dst + at);
  storeLanes(d, first, dst);
}

#endif

/// A table by code of what `entry` makes of each operation.
template <class Entry> constexpr auto ropTable(Entry entry) {
  return std::apply([&](auto... rop) { return std::array{entry(rop)...}; }, kRops);
}

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
