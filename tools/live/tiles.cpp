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

/// Calls `body(from, to)` for every step of a grid that meets a stretch, with the part of it in
/// there.
template <class Body> void forSteps(int32 from, int32 end, int32 step, Body body) {
  for (int32 to = from; from < end; from = to) {
    to = std::min((from / step + 1) * step, end);
    body(from, to);
  }
}

class Taking {
 public:
  Taking(const PixelView& captured, uint8* target, uint32 targetPitch, ChangeList& told)
      : now(captured), seen(target), pitch(targetPitch), changed(told) {}

  void take(const Rect& rect) {
    forSteps(rect.top, rect.bottom, kTileHeight, [&](int32 top, int32 bottom) {
      takeBand({rect.left, top, rect.right, bottom});
    });
  }
  const TileCount& tiles() const { return count; }

 private:
  /// One call finds a band equal, or stops at its first row that is not. Tiles that differ side by
  /// side are copied together, while the inner cache has them.
  void takeBand(const Rect& band) {
    const bool isEqual = equals(band);
    int32 differs = band.left;  // from here to the tile in question, all of them do
    forSteps(band.left, band.right, kTileWidth, [&](int32 left, int32 right) {
      ++count.compared;
      if (!isEqual && !equals({left, band.top, right, band.bottom})) return;
      ++count.equal;
      takeRun({differs, band.top, left, band.bottom});
      differs = right;
    });
    takeRun({differs, band.top, band.right, band.bottom});
  }

  bool equals(const Rect& part) const {
    const auto x = static_cast<uint32>(part.left);
    const auto y = static_cast<uint32>(part.top);
    return Raster_ComparePixels(now.data, now.pitch, kPixelBits, seen, pitch, kPixelBits, x, y, x,
                                y, widthOf(part), heightOf(part)) == 0;
  }

  void takeRun(const Rect& run) {
    if (isEmpty(run)) return;
    const auto x = static_cast<uint32>(run.left);
    const auto y = static_cast<uint32>(run.top);
    Raster_RectCopy(seen, pitch, now.data, now.pitch, kPixelBytes, x, y, x, y, widthOf(run),
                    heightOf(run));
    changed.add(run);
  }

  const PixelView& now;
  uint8* seen;
  uint32 pitch;
  ChangeList& changed;
  TileCount count;
};

}  // namespace

TileCount takeChanges(const PixelView& now, uint8* seen, uint32 seenPitch, const ChangeList& damage,
                      ChangeList& changed) {
  Taking taking(now, seen, seenPitch, changed);
  for (const RectList& list : damage.lists())
    for (const Rect& rect : rectsOf(list)) taking.take(rect);
  return taking.tiles();
}

}  // namespace tool::live
