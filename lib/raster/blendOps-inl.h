// SPDX-License-Identifier: MIT
//
// The fourteen compositing operators and the arithmetic that they are written in. Included once per
// instruction set.
//
// The operators know products, sums and complements only, so the same line serves vectors, single
// pixels and the question which inputs it needs. Pixels come in two forms, whichever is at hand:
// Bytes, as they lie in memory, and Halves, as products need and leave them.

#include "blendArithmetic.h"

#if defined(RASTER_BLEND_OPS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_OPS_INL_H
#undef RASTER_BLEND_OPS_INL_H
#else
#define RASTER_BLEND_OPS_INL_H
#endif

#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Loads lanes into a register. Without the barrier GCC reads the memory again at every use.
template <class D> HWY_INLINE hn::Vec<D> loadOnce(D d, const uint8* at) {
  auto lanes = loadLanes(d, at);
#if HWY_TARGET != HWY_SCALAR
  asm("" : "+v"(lanes.raw));
#endif
  return lanes;
}

/// Four bytes in a 32-bit lane.
template <class D> struct Bytes { hn::Vec<D> v; };

/// Bytes 0 and 2, and bytes 1 and 3, each as the upper byte of a 16-bit half of the lane. The lower
/// bytes have no meaning.
template <class D> struct Halves { hn::Vec<D> even, odd; };

template <class D> HWY_INLINE Halves<D> halvesOf(Bytes<D> p) {
  return {hn::ShiftLeft<8>(p.v), p.v};
}
template <class D> HWY_INLINE Halves<D> halvesOf(Halves<D> p) { return p; }

template <class D> HWY_INLINE Bytes<D> bytesOf(Halves<D> p) {
  const auto upper = hn::Set(D(), 0xFF00FF00u);
#if HWY_TARGET == HWY_SCALAR
  return {hn::ShiftRight<8>(p.even & upper) | (p.odd & upper)};
#else
  const hn::Repartition<uint16, D> d16;
  const auto even = hn::BitCast(D(), hn::ShiftRight<8>(hn::BitCast(d16, p.even)));
  return {hn::OrAnd(even, p.odd, upper)};
#endif
}
template <class D> HWY_INLINE Bytes<D> bytesOf(Bytes<D> p) { return p; }

#if HWY_TARGET == HWY_SCALAR

/// A number of 0 to 255 for each pixel, to multiply its bytes with.
template <class D> struct Factor { hn::Vec<D> v; };
template <class D> HWY_INLINE Factor<D> factor(D d, uint32 value) { return {hn::Set(d, value)}; }
template <class D> HWY_INLINE Factor<D> inv(Factor<D> f) { return {hn::Set(D(), 255) - f.v}; }
template <class D> HWY_INLINE Factor<D> alphaOf(Bytes<D> p) { return {hn::ShiftRight<24>(p.v)}; }
template <class D> HWY_INLINE Factor<D> alphaOf(Halves<D> p) { return alphaOf(Bytes<D>{p.odd}); }

/// Multiplies two bytes at a time, in the lower bytes of the halves, by one product of the lane.
template <class D> HWY_INLINE hn::Vec<D> mulHalves(hn::Vec<D> bytes, Factor<D> f) {
  const auto low = hn::Set(D(), 0x00FF00FFu);
  const auto products = (bytes & low) * f.v;
  return products + hn::Set(D(), 0x00010001u) + (hn::ShiftRight<8>(products) & low);
}
template <class D> HWY_INLINE Halves<D> mul(Halves<D> p, Factor<D> f) {
  return {mulHalves(hn::ShiftRight<8>(p.even), f), mulHalves(hn::ShiftRight<8>(p.odd), f)};
}
template <class D> HWY_INLINE Halves<D> mul(Bytes<D> p, Factor<D> f) {
  return {mulHalves(p.v, f), mulHalves(hn::ShiftRight<8>(p.v), f)};
}

/// Adds the lower bytes of the halves; a carry fills the byte that it comes from.
template <class D> HWY_INLINE hn::Vec<D> addHalves(hn::Vec<D> a, hn::Vec<D> b) {
  const auto low = hn::Set(D(), 0x00FF00FFu);
  const auto sum = (a & low) + (b & low);
  const auto carry = hn::ShiftRight<8>(sum) & low;
  return (sum | (hn::ShiftLeft<8>(carry) - carry)) & low;
}
template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Bytes<D> b) {
  const auto odd = addHalves<D>(hn::ShiftRight<8>(a.v), hn::ShiftRight<8>(b.v));
  return {addHalves<D>(a.v, b.v) | hn::ShiftLeft<8>(odd)};
}
template <class D> HWY_INLINE Bytes<D> add(Halves<D> a, Halves<D> b) {
  return add(bytesOf(a), bytesOf(b));
}

#else

template <class D> using Words = hn::Repartition<uint16, D>;

/// A number of 0 to 255 for each pixel, to multiply its bytes with: it stands in each of the four.
template <class D> struct Factor { hn::Vec<D> v; };
template <class D> HWY_INLINE Factor<D> factor(D d, uint32 value) {
  return {hn::Set(d, value * 0x01010101u)};
}
template <class D> HWY_INLINE Factor<D> inv(Factor<D> f) {
  return {hn::Xor(f.v, hn::Set(D(), 0xFFFFFFFFu))};
}
template <class D> HWY_INLINE Factor<D> alphaOf(Bytes<D> p) {
  const hn::Repartition<uint8, D> d8;
  alignas(16) static constexpr uint8 kAlphas[16] = {3,  3,  3,  3,  7,  7,  7,  7,
                                                    11, 11, 11, 11, 15, 15, 15, 15};
  const auto bytes = hn::TableLookupBytes(hn::BitCast(d8, p.v), hn::LoadDup128(d8, kAlphas));
  return {hn::BitCast(D(), bytes)};
}
template <class D> HWY_INLINE Factor<D> alphaOf(Halves<D> p) { return alphaOf(Bytes<D>{p.odd}); }

/// The high products of 256 * c + 1 and 257 * f have c * f / 255 as their upper byte.
template <class D> HWY_INLINE hn::Vec<D> mulHalves(hn::Vec<D> upper, Factor<D> f) {
  const Words<D> d16;
  const auto c = hn::BitCast(d16, upper | hn::Set(D(), 0x00010001u));
  return hn::BitCast(D(), hn::MulHigh(c, hn::BitCast(d16, f.v)));
}
template <class D> HWY_INLINE hn::Vec<D> upperBytes(hn::Vec<D> v) {
  return v & hn::Set(D(), 0xFF00FF00u);
}
template <class D> HWY_INLINE Halves<D> mul(Halves<D> p, Factor<D> f) {
  return {mulHalves<D>(upperBytes<D>(p.even), f), mulHalves<D>(upperBytes<D>(p.odd), f)};
}
template <class D> HWY_INLINE Halves<D> mul(Bytes<D> p, Factor<D> f) {
  const auto even = hn::ShiftLeft<8>(hn::BitCast(Words<D>(), p.v));
  return {mulHalves<D>(hn::BitCast(D(), even), f), mulHalves<D>(upperBytes<D>(p.v), f)};
}

template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Bytes<D> b) {
  const hn::Repartition<uint8, D> d8;
  return {hn::BitCast(D(), hn::SaturatedAdd(hn::BitCast(d8, a.v), hn::BitCast(d8, b.v)))};
}
template <class D> HWY_INLINE Halves<D> add(Halves<D> a, Halves<D> b) {
  return {add(Bytes<D>{a.even}, Bytes<D>{b.even}).v, add(Bytes<D>{a.odd}, Bytes<D>{b.odd}).v};
}

#endif

template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Halves<D> b) { return add(a, bytesOf(b)); }
template <class D> HWY_INLINE Bytes<D> add(Halves<D> a, Bytes<D> b) { return add(bytesOf(a), b); }

template <class P> HWY_INLINE constexpr P mul(P p, One /*f*/) { return p; }
template <class P> HWY_INLINE constexpr Nothing mul(P /*p*/, Zero /*f*/) { return {}; }
template <class P> HWY_INLINE constexpr P add(P p, Nothing /*zero*/) { return p; }

namespace {

// The operators (Porter and Duff, 1984), one line each. `c` has the source `s` and its alpha `sa`,
// the destination `d` and its alpha `da`, and the source's share `f` of Saturate.
constexpr auto kClear = [](const auto& c) { return c.nothing; };
constexpr auto kSource = [](const auto& c) { return c.s; };
constexpr auto kDestination = [](const auto& c) { return c.d; };
constexpr auto kOver = [](const auto& c) { return add(c.s, mul(c.d, inv(c.sa))); };
constexpr auto kOverReverse = [](const auto& c) { return add(c.d, mul(c.s, inv(c.da))); };
constexpr auto kIn = [](const auto& c) { return mul(c.s, c.da); };
constexpr auto kInReverse = [](const auto& c) { return mul(c.d, c.sa); };
constexpr auto kOut = [](const auto& c) { return mul(c.s, inv(c.da)); };
constexpr auto kOutReverse = [](const auto& c) { return mul(c.d, inv(c.sa)); };
constexpr auto kAtop = [](const auto& c) { return add(mul(c.s, c.da), mul(c.d, inv(c.sa))); };
constexpr auto kAtopReverse = [](const auto& c) {
  return add(mul(c.d, c.sa), mul(c.s, inv(c.da)));
};
// Deliberate: the exclusive or of the family is computed as Atop-reverse.
constexpr auto kXor = kAtopReverse;
constexpr auto kAdd = [](const auto& c) { return add(c.s, c.d); };
constexpr auto kSaturate = [](const auto& c) { return add(c.d, mul(c.s, c.f)); };

/// By number.
constexpr auto kOperators =
    std::make_tuple(kClear, kSource, kDestination, kOver, kOverReverse, kIn, kInReverse, kOut,
                    kOutReverse, kAtop, kAtopReverse, kXor, kAdd, kSaturate);
static_assert(std::tuple_size_v<decltype(kOperators)> == kBlendOperators);

/// The inputs that an operator reads, with (kFlagDstAlpha) or without a constant destination alpha.
template <auto kOperator, uint32 kFlags>
constexpr uint32 kInputs = [] {
  constexpr bool kConstant = (kFlags & kFlagDstAlpha) != 0;
  struct {
    Nothing nothing;
    UsesOf<kUsesSource> s, sa;
    UsesOf<kUsesDestination> d;
    std::conditional_t<kConstant, UsesOf<kUsesDstAlpha>, One> da;
    std::conditional_t<kConstant, UsesOf<kUsesDstAlpha>, Zero> f;
  } c;
  return inputsOf(kOperator(c));
}();

}  // namespace

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
