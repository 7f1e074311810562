// SPDX-License-Identifier: MIT
//
// The library's rect lists as rectangles, and back.

#ifndef RASTER_TOOLS_RECT_LISTS_H
#define RASTER_TOOLS_RECT_LISTS_H

#include <vector>

#include "raster.h"

namespace tool {

inline Rect rectOf(const RectListEntry& entry) {
  return {entry.x, entry.y, entry.x + entry.width, entry.y + entry.height};
}

inline void addTo(RectList& list, const Rect& rect) {
  Raster_AddRect(&list, rect.left, rect.top, rect.right - rect.left, rect.bottom - rect.top);
}

inline bool isEmpty(const RectList& list) { return list.rects[0].width <= 0; }

inline std::vector<Rect> rectsOf(const RectList& list) {
  std::vector<Rect> rects;
  for (const RectListEntry& entry : list.rects) {
    if (entry.width <= 0) break;
    rects.push_back(rectOf(entry));
  }
  return rects;
}

}  // namespace tool

#endif
