// SPDX-License-Identifier: MIT
//
// The fourteen compositing operators. Included once per instruction set.
//
// They know sums of pixels, products of a pixel and a factor, and complements of factors only, in
// any order. So the same line serves vectors, single pixels, every form that pixels come in, and
// the questions which inputs it needs and which other operator computes the same.

#include "blendArithmetic.h"

#if defined(RASTER_BLEND_OPS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_OPS_INL_H
#undef RASTER_BLEND_OPS_INL_H
#else
#define RASTER_BLEND_OPS_INL_H
#endif

#include "hwy/highway.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

template <class P> HWY_INLINE constexpr P mul(P p, One /*f*/) { return p; }
template <class P> HWY_INLINE constexpr Nothing mul(P /*p*/, Zero /*f*/) { return {}; }
template <class F> HWY_INLINE constexpr Nothing mul(Nothing /*p*/, F /*f*/) { return {}; }
template <class P> HWY_INLINE constexpr P add(P p, Nothing /*zero*/) { return p; }
template <class P> HWY_INLINE constexpr P add(Nothing /*zero*/, P p) { return p; }

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
static_assert(std::tuple_size_v<decltype(kOperators)> == RASTER_BLEND_COUNT);

/// An operator's formula, with (RASTER_BLEND_USE_DST_ALPHA) or without a constant destination
/// alpha.
template <auto kOperator, uint32 kFlags>
constexpr auto kFormula = [] {
  constexpr bool kConstant = (kFlags & RASTER_BLEND_USE_DST_ALPHA) != 0;
  struct {
    Nothing nothing;
    Letter<'s', kUsesSource> s;
    Letter<'a', kUsesSource> sa;
    Letter<'d', kUsesDestination> d;
    std::conditional_t<kConstant, Letter<'A', kUsesDstAlpha>, One> da;
    std::conditional_t<kConstant, Letter<'f', kUsesDstAlpha>, Zero> f;
  } c;
  return kOperator(c);
}();

/// The inputs that it reads.
template <auto kOperator, uint32 kFlags>
constexpr uint32 kInputs = inputsOf(kFormula<kOperator, kFlags>);

/// What an operator makes of clear source pixels, whose factor is `sa`.
template <auto kOperator, uint32 kFlags, class SourceAlpha> constexpr auto ofClear(SourceAlpha sa) {
  constexpr bool kConstant = (kFlags & RASTER_BLEND_USE_DST_ALPHA) != 0;
  struct {
    Nothing nothing;
    Nothing s;
    SourceAlpha sa;
    Letter<'d', kUsesDestination> d;
    std::conditional_t<kConstant, Letter<'A', kUsesDstAlpha>, One> da;
    std::conditional_t<kConstant, Letter<'f', kUsesDstAlpha>, Zero> f;
  } c{{}, {}, sa, {}, {}, {}};
  return kOperator(c);
}

/// Whether source pixels that are 0 in all bytes leave the destination as it is, and whether the
/// destination is multiplied by something of the source.
template <auto kOperator, uint32 kFlags>
constexpr bool kClearKeeps =
    (kFlags & RASTER_BLEND_USE_DST_ALPHA) == 0 &&
    std::is_same_v<decltype(ofClear<kOperator, kFlags>(Zero())), Letter<'d', kUsesDestination>>;
template <auto kOperator, uint32 kFlags>
constexpr bool kUsesSrcAlpha = (inputsOf(ofClear<kOperator, kFlags>(Letter<'a', kUsesSource>())) &
                                kUsesSource) != 0;

/// The number of the first operator that has the same formula.
template <uint32 kFlags, size_t kOp, size_t kFirst = 0> constexpr size_t firstLike() {
  if constexpr (std::is_same_v<decltype(kFormula<std::get<kFirst>(kOperators), kFlags>),
                               decltype(kFormula<std::get<kOp>(kOperators), kFlags>)>) {
    return kFirst;
  } else {
    return firstLike<kFlags, kOp, kFirst + 1>();
  }
}
static_assert(firstLike<0, RASTER_BLEND_ATOP>() == RASTER_BLEND_OVER);
static_assert(firstLike<RASTER_BLEND_USE_DST_ALPHA, RASTER_BLEND_ATOP>() == RASTER_BLEND_ATOP);

}  // namespace

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
