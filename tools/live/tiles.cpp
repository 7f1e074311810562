// SPDX-License-Identifier: MIT

#include "tiles.h"

#include <algorithm>

#include "raster.h"
#include "rectLists.h"

namespace tool::live {
namespace {

constexpr int32 kTileWidth = 32;
constexpr int32 kTileHeight = 16;
constexpr uint32 kPixelBytes = 4;
constexpr int32 kPixelBits = 32;

/// The end of the tile that holds a coordinate.
int32 tileEnd(int32 at, int32 step, int32 limit) { return std::min((at / step + 1) * step, limit); }

template <class Body> void forTiles(const Rect& rect, Body body) {
  for (int32 y = rect.top; y < rect.bottom;) {
    const int32 bottom = tileEnd(y, kTileHeight, rect.bottom);
    for (int32 x = rect.left; x < rect.right;) {
      const int32 right = tileEnd(x, kTileWidth, rect.right);
      body(Rect{x, y, right, bottom});
      x = right;
    }
    y = bottom;
  }
}

}  // namespace

TileCount takeChanges(const PixelView& now, uint8* seen, uint32 seenPitch, const ChangeList& damage,
                      ChangeList& changed) {
  TileCount count;
  const auto takeTile = [&](const Rect& tile, bool isEqual) {
    const auto x = static_cast<uint32>(tile.left);
    const auto y = static_cast<uint32>(tile.top);
    ++count.compared;
    if (isEqual ||
        Raster_ComparePixels(now.data, now.pitch, kPixelBits, seen, seenPitch, kPixelBits, x, y, x,
                             y, widthOf(tile), heightOf(tile)) == 0) {
      ++count.equal;
      return;
    }
    Raster_RectCopy(seen, seenPitch, now.data, now.pitch, kPixelBytes, x, y, x, y, widthOf(tile),
                    heightOf(tile));
    changed.add(tile);
  };
  for (const RectList& list : damage.lists()) {
    if (isEmpty(list)) continue;
    const bool isEqual = Raster_CompareRects(now.data, now.pitch, kPixelBits, seen, seenPitch,
                                             kPixelBits, &list) == 0;
    for (const Rect& rect : rectsOf(list))
      forTiles(rect, [&](const Rect& tile) { takeTile(tile, isEqual); });
  }
  return count;
}

}  // namespace tool::live
