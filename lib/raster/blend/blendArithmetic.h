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
/// out of the formulas. What they do to pixels and factors is in blendOps-inl.h.
struct One {};
struct Zero {};
struct Nothing {};

constexpr Zero inv(One /*f*/) { return {}; }
constexpr One inv(Zero /*f*/) { return {}; }
constexpr Nothing alphaOf(Nothing /*p*/) { return {}; }
constexpr Nothing mul(Nothing /*p*/, One /*f*/) { return {}; }
constexpr Nothing mul(Nothing /*p*/, Zero /*f*/) { return {}; }
constexpr Nothing add(Nothing /*a*/, Nothing /*b*/) { return {}; }

/// What a formula may read.
inline constexpr uint32 kUsesSource = 1;
inline constexpr uint32 kUsesDestination = 2;
inline constexpr uint32 kUsesDstAlpha = 4;  // the constant

/// A formula as a type: letters for the inputs, and what is done with them. Operators whose
/// formulas are the same type compute the same.
template <char kLetter, uint32 kInputSet> struct Letter {
  static constexpr uint32 kUses = kInputSet;
};
template <char kSign, class... Terms> struct Formula {
  static constexpr uint32 kUses = (Terms::kUses | ...);
};
template <class Term>
concept IsFormula = requires {
  Term::kUses;
};

template <IsFormula P, IsFormula F> constexpr Formula<'*', P, F> mul(P /*p*/, F /*f*/) {
  return {};
}
template <IsFormula A, IsFormula B> constexpr Formula<'+', A, B> add(A /*a*/, B /*b*/) {
  return {};
}
template <IsFormula F> constexpr Formula<'-', F> inv(F /*f*/) { return {}; }

template <IsFormula Term> constexpr uint32 inputsOf(Term /*term*/) { return Term::kUses; }
constexpr uint32 inputsOf(Nothing /*term*/) { return 0; }

}  // namespace raster

#endif
