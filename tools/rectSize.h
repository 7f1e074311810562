// SPDX-License-Identifier: MIT
//
// The size of a rectangle that is not turned inside out.

#ifndef RASTER_TOOLS_RECT_SIZE_H
#define RASTER_TOOLS_RECT_SIZE_H

#include "rect.h"

namespace tool {

inline uint32 widthOf(const Rect& rect) { return static_cast<uint32>(rect.right - rect.left); }
inline uint32 heightOf(const Rect& rect) { return static_cast<uint32>(rect.bottom - rect.top); }
inline uint64 areaOf(const Rect& rect) { return uint64{widthOf(rect)} * heightOf(rect); }
inline bool isEmpty(const Rect& rect) { return rect.right <= rect.left || rect.bottom <= rect.top; }

}  // namespace tool

#endif
