// SPDX-License-Identifier: MIT
//
// One picture placed on another: which part of it lands there, and names for the operations.

#ifndef RASTER_TOOLS_DRAWING_H
#define RASTER_TOOLS_DRAWING_H

#include <CLI/CLI.hpp>
#include <span>
#include <string>

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

/// The number of a name in a table, or the number that the text is. A usage error lists the names.
uint32 numberOfName(const std::string& text, std::span<const char* const> names);

/// The names, separated by commas.
std::string listOf(std::span<const char* const> names);

}  // namespace tool

#endif
