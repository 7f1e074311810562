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

class Finding {
 public:
  Finding(const PixelView& captured, const PixelView& earlier, std::vector<Rect>& found)
      : now(captured), seen(earlier), runs(found) {}

  void find(const Rect& rect) {
    forSteps(rect.top, rect.bottom, kTileHeight, [&](int32 top, int32 bottom) {
      findInBand({rect.left, top, rect.right, bottom});
    });
  }
  const TileCount& tiles() const { return count; }

 private:
  /// One call finds a band equal, or stops at its first row that is not.
  void findInBand(const Rect& band) {
    const bool isEqual = equals(band);
    int32 differs = band.left;  // from here to the tile in question, all of them do
    forSteps(band.left, band.right, kTileWidth, [&](int32 left, int32 right) {
      ++count.compared;
      if (!isEqual && !equals({left, band.top, right, band.bottom})) return;
      ++count.equal;
      add({differs, band.top, left, band.bottom});
      differs = right;
    });
    add({differs, band.top, band.right, band.bottom});
  }

  bool equals(const Rect& part) const {
    const auto x = static_cast<uint32>(part.left);
    const auto y = static_cast<uint32>(part.top);
    return Raster_ComparePixels(now.data, now.pitch, kPixelBits, seen.data, seen.pitch, kPixelBits,
                                x, y, x, y, widthOf(part), heightOf(part)) == 0;
  }

  void add(const Rect& run) {
    if (!isEmpty(run)) runs.push_back(run);
  }

  const PixelView& now;
  const PixelView& seen;
  std::vector<Rect>& runs;
  TileCount count;
};

}  // namespace

TileCount findChanges(const PixelView& now, const PixelView& seen, const ChangeList& damage,
                      std::vector<Rect>& runs) {
  Finding finding(now, seen, runs);
  for (const RectList& list : damage.lists())
    for (const Rect& rect : rectsOf(list)) finding.find(rect);
  return finding.tiles();
}

void takeOver(const PixelView& now, uint8* seen, uint32 seenPitch, const std::vector<Rect>& runs) {
  for (const Rect& run : runs) {
    const auto x = static_cast<uint32>(run.left);
    const auto y = static_cast<uint32>(run.top);
    Raster_RectCopy(seen, seenPitch, now.data, now.pitch, kPixelBytes, x, y, x, y, widthOf(run),
                    heightOf(run));
  }
}

}  // namespace tool::live
