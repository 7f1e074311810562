// SPDX-License-Identifier: MIT
//
// Rectangles and points for the tests: readable, comparable, and random ones that meet the limits
// of 32 bits.

#ifndef TESTS_RECT_VALUES_H
#define TESTS_RECT_VALUES_H

#include <ostream>

#include "rect.h"
#include "support/random.h"

inline bool operator==(const Rect& a, const Rect& b) {
  return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}
inline bool operator==(const Point& a, const Point& b) { return a.x == b.x && a.y == b.y; }
inline std::ostream& operator<<(std::ostream& out, const Rect& r) {
  return out << "(" << r.left << ", " << r.top << ", " << r.right << ", " << r.bottom << ")";
}
inline std::ostream& operator<<(std::ostream& out, const Point& p) {
  return out << "(" << p.x << ", " << p.y << ")";
}

namespace tests {

inline constexpr int32 kMax = 0x7FFFFFFF;
inline constexpr int32 kMin = -0x7FFFFFFF - 1;

/// A coordinate of any size, often small and often at a limit.
inline int32 someCoordinate(Random& random) {
  const int32 near = random.between(-3, 3);
  switch (random.below(6)) {
    case 0:
      return kMax - 3 + near;
    case 1:
      return kMin + 3 + near;
    case 2:
      return random.between(kMin, kMax);
    case 3:
      return random.between(-100, 100);
    default:
      return near;
  }
}
inline Rect someRect(Random& random) {
  const int32 left = someCoordinate(random);
  const int32 top = someCoordinate(random);
  const int32 right = someCoordinate(random);
  return {left, top, right, someCoordinate(random)};
}
inline Point somePoint(Random& random) {
  const int32 x = someCoordinate(random);
  return {x, someCoordinate(random)};
}

}  // namespace tests

#endif
