// SPDX-License-Identifier: MIT
//
// What the rectangle functions share: sums with wrap-around and with saturation, emptiness, and
// intersection.

#ifndef RASTER_RECT_ARITHMETIC_H
#define RASTER_RECT_ARITHMETIC_H

#include <algorithm>
#include <limits>

#include "rect.h"

namespace raster {

inline constexpr int32 kInt32Max = std::numeric_limits<int32>::max();
inline constexpr int32 kInt32Min = std::numeric_limits<int32>::min();

constexpr int32 addWrap(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) + static_cast<uint32>(b));
}
constexpr int32 subWrap(int32 a, int32 b) {
  return static_cast<int32>(static_cast<uint32>(a) - static_cast<uint32>(b));
}
constexpr int32 negateWrap(int32 a) { return subWrap(0, a); }

/// A sum after saturation, and whether there was nothing to saturate.
struct Saturated {
  int32 value;
  bool exact;
};

/// a + b, saturated when the wrapped sum went the wrong way.
constexpr Saturated addSaturated(int32 a, int32 b) {
  const int32 sum = addWrap(a, b);
  if (b > 0 && a > sum) return {kInt32Max, false};
  if (b < 0 && a < sum) return {kInt32Min, false};
  return {sum, true};
}

/// The 32-bit number nearest to `value`.
constexpr Saturated saturate(int64 value) {
  if (value > kInt32Max) return {kInt32Max, false};
  if (value < kInt32Min) return {kInt32Min, false};
  return {static_cast<int32>(value), true};
}

constexpr bool isEmpty(const Rect& r) { return r.right <= r.left || r.bottom <= r.top; }

/// The common part; empty, with these coordinates, when there is none.
constexpr Rect intersection(const Rect& a, const Rect& b) {
  return {std::max(a.left, b.left), std::max(a.top, b.top), std::min(a.right, b.right),
          std::min(a.bottom, b.bottom)};
}

}  // namespace raster

#endif
