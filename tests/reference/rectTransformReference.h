// SPDX-License-Identifier: MIT
//
// The naive model of the rectangle transforms, in arithmetic that is wide enough for anything.

#ifndef TESTS_RECT_TRANSFORM_REFERENCE_H
#define TESTS_RECT_TRANSFORM_REFERENCE_H

#include "rect.h"

namespace reference {

/// A rectangle, or a point in its left and top, with whether all of it fitted.
struct Carried {
  Rect rect;
  bool exact;
};

Carried applyDiff(const Rect& to, const Rect& from, const Rect& r);
Carried applyDiffEx(const Rect& to, const Rect& from, const Rect& r);

struct Pair {
  Rect intersection;
  Rect mapped;
  bool any;
};
Pair intersectPair(const Rect& a, const Rect& b, const Rect& c);

Point scalePoint(const Rect& from, const Rect& to, const Point& p);
int32 pointDistance(const Rect& r, const Point& p);

}  // namespace reference

#endif
