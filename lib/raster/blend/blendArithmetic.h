// SPDX-License-Identifier: MIT
//
// What the compiler knows about a blend before any pixel is there: the exact division by 255, the
// constant factors 255 and 0, and which inputs a formula uses.

#ifndef RASTER_BLEND_ARITHMETIC_H
#define RASTER_BLEND_ARITHMETIC_H

#include <tuple>
#include <type_traits>

#include "alphaBlendInternal.h"

namespace raster {

/// Both forms of a product divided by 255 that the kernels use are exact: with 16-bit lanes that
/// have a high product, and without.
constexpr bool dividesExactly() {
  for (uint32 c = 0; c <= 255; ++c) {
    for (uint32 f = 0; f <= 255; ++f) {
      const uint32 v = c * f;
      if ((256 * c + 1) * (257 * f) >> 24 != v / 255 || (v + 1 + (v >> 8)) >> 8 != v / 255)
        return false;
    }
  }
  return true;
}
static_assert(dividesExactly());

/// A factor of 255 / 255, one of 0, and pixels that are 0: an opaque destination takes its terms
/// out of the formulas.
struct One {};
struct Zero {};
struct Nothing {};

constexpr Zero inv(One /*f*/) { return {}; }
constexpr Nothing alphaOf(Nothing /*p*/) { return {}; }

/// What the terms of a formula are computed from: sets of inputs in place of the numbers.
inline constexpr uint32 kUsesSource = 1;
inline constexpr uint32 kUsesDestination = 2;
inline constexpr uint32 kUsesDstAlpha = 4;  // the constant
template <uint32 kSet> struct UsesOf {};

template <uint32 kA, uint32 kB> constexpr UsesOf<kA | kB> mul(UsesOf<kA> /*p*/, UsesOf<kB> /*f*/) {
  return {};
}
template <uint32 kA, uint32 kB> constexpr UsesOf<kA | kB> add(UsesOf<kA> /*a*/, UsesOf<kB> /*b*/) {
  return {};
}
template <uint32 kSet> constexpr UsesOf<kSet> inv(UsesOf<kSet> f) { return f; }
template <uint32 kSet> constexpr uint32 inputsOf(UsesOf<kSet> /*term*/) { return kSet; }
constexpr uint32 inputsOf(Nothing /*term*/) { return 0; }

}  // namespace raster

#endif
