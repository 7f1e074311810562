// SPDX-License-Identifier: MIT

#include "changedRects.h"

#include <algorithm>

#include "geometry.h"
#include "raster.h"
#include "rectLists.h"

namespace tool {
namespace {

bool differ(const Picture& a, const Picture& b, const Rect& rect) {
  const auto x = static_cast<uint32>(rect.left);
  const auto y = static_cast<uint32>(rect.top);
  return Raster_ComparePixels(a.data(), a.pitch(), static_cast<int32>(a.record.bpp), b.data(),
                              b.pitch(), static_cast<int32>(b.record.bpp), x, y, x, y,
                              widthOf(rect), heightOf(rect)) != 0;
}

}  // namespace

std::vector<Rect> changedRects(const Picture& before, const Picture& after, uint32 tileSize) {
  const Rect area = before.bounds();
  const auto step = static_cast<int32>(tileSize);
  RectList list = {};
  Raster_ClearRectList(&list);
  for (int32 y = 0; y < area.bottom; y += step) {
    for (int32 x = 0; x < area.right; x += step) {
      const Rect tile = {x, y, std::min(x + step, area.right), std::min(y + step, area.bottom)};
      if (differ(before, after, tile))
        Raster_AddRect(&list, x, y, tile.right - tile.left, tile.bottom - tile.top);
    }
  }
  return rectsOf(list);
}

Rect boundingRect(const Picture& before, const Picture& after, const std::vector<Rect>& rects) {
  Rect box = {};
  for (const Rect& rect : rects) Rect_Union(&box, &rect);
  const auto trim = [&](auto edgeOf, int32& side, int32 step) {
    while (box.left < box.right && box.top < box.bottom && !differ(before, after, edgeOf()))
      side += step;
  };
  trim([&] { return Rect{box.left, box.top, box.right, box.top + 1}; }, box.top, 1);
  trim([&] { return Rect{box.left, box.bottom - 1, box.right, box.bottom}; }, box.bottom, -1);
  trim([&] { return Rect{box.left, box.top, box.left + 1, box.bottom}; }, box.left, 1);
  trim([&] { return Rect{box.right - 1, box.top, box.right, box.bottom}; }, box.right, -1);
  return box;
}

}  // namespace tool
