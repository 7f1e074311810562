// SPDX-License-Identifier: MIT
//
// One picture placed on another: which part of it lands there.

#ifndef RASTER_TOOLS_DRAWING_H
#define RASTER_TOOLS_DRAWING_H

#include "picture.h"

namespace tool {

/// The visible part of a picture that is placed with its top left corner at `at`.
struct Placement {
  Rect onTarget;
  uint32 srcX;
  uint32 srcY;
};

/// Fails when nothing of the source lies on the target.
Placement place(const Picture& source, const Point& at, const Picture& target);

/// Multiplies the colours of 32-bit pixels by their alpha, as blending wants them.
void premultiply(Picture& picture);

/// Divides them by it, rounding to nearest.
void unpremultiply(Picture& picture);

}  // namespace tool

#endif
