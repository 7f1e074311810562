// SPDX-License-Identifier: MIT
//
// The fourteen compositing operators. Included once per instruction set.
//
// They know products, sums and complements only, so the same line serves vectors, single pixels,
// every form that pixels come in and the question which inputs it needs.

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
static_assert(std::tuple_size_v<decltype(kOperators)> == RASTER_BLEND_COUNT);

/// The inputs that an operator reads, with (RASTER_BLEND_USE_DST_ALPHA) or without a constant
/// destination alpha.
template <auto kOperator, uint32 kFlags>
constexpr uint32 kInputs = [] {
  constexpr bool kConstant = (kFlags & RASTER_BLEND_USE_DST_ALPHA) != 0;
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
