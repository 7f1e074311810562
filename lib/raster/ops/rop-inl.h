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
#include "vector/byteRows-inl.h"
#include "hwy/highway.h"
#include "vector/rows-inl.h"

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

/// Combines a row in the order of a walk, a vector at a time.
template <class Rop, Walk kWalk>
HWY_INLINE void combineInOrder(uint8* dst, const uint8* src, size_t bytes) {
  const hn::ScalableTag<uint8> d8;
  const auto block = [&](auto d, size_t i) { combine<Rop>(d, src + i, dst + i); };
  if constexpr (kWalk == Walk::kToRight) {
    forLanes(d8, bytes, block);
  } else {
    forLanesFromRight(d8, bytes, block);
  }
}

/// What an operation makes of the lanes at an offset of a row (byteRows-inl.h).
template <class Rop> struct CombinedAt {
  template <class D>
  HWY_INLINE hn::Vec<D> operator()(D d, const uint8* src, const uint8* dst, size_t at) const {
    return combined<Rop>(d, src + at, dst + at);
  }
};

/// A table by code of what `entry` makes of each operation.
template <class Entry> constexpr auto ropTable(Entry entry) {
  return std::apply([&](auto... rop) { return std::array{entry(rop)...}; }, kRops);
}

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
