// SPDX-License-Identifier: MIT

#include "moves.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "raster.h"

namespace tool::live {
namespace {

constexpr uint64 kLeastArea = 8192;   // of changes, for which to look for moves
constexpr uint64 kLeastGain = 1024;   // pixels that a move saves
constexpr int32 kLeastRows = 8;       // of a move
constexpr int32 kWindow = 16;         // rows that are looked for together
constexpr int32 kProbes = 12;         // windows that are looked for
constexpr size_t kMostDistances = 2;  // that are tried

using Window = std::array<uint64, kWindow>;

/// A number for a row of a band, which equal rows have in common: of some pixels here and there.
class RowSamples {
 public:
  static constexpr int32 kPiece = 8;  // pixels side by side

  explicit RowSamples(const Rect& band) {
    const int32 room = band.right - band.left - kPiece;
    for (int32 i = 0; i < kPieces; ++i) columns[i] = band.left + room * i / (kPieces - 1);
  }

  uint64 of(const PixelView& picture, int32 y) const {
    constexpr uint64 kColors = 0x00FFFFFF00FFFFFF;
    constexpr uint64 kFactor = 0x9E3779B97F4A7C15;
    uint64 number = 0;
    for (const int32 x : columns) {
      uint64 words[kPiece / 2];
      memcpy(words, picture.at(x, y), sizeof words);
      for (const uint64 word : words) {
        number = (number ^ (word & kColors)) * kFactor;
        number ^= number >> 32;
      }
    }
    return number;
  }

 private:
  static constexpr int32 kPieces = 8;
  int32 columns[kPieces];
};

/// The largest of the changes, with what was damaged around it.
Rect mainPart(const std::vector<Rect>& runs, const ChangeList& damage) {
  const auto largest = std::max_element(
      runs.begin(), runs.end(), [](const Rect& a, const Rect& b) { return areaOf(a) < areaOf(b); });
  Rect part = *largest;
  const std::vector<Rect> damaged = damage.all();
  for (bool grows = true; grows;) {
    grows = false;
    const Rect reach = {part.left - 1, part.top - 1, part.right + 1, part.bottom + 1};
    for (const Rect& rect : damaged) {
      if (!Rect_Intersect(nullptr, &rect, &reach) || Rect_ContainsRect(&part, &rect)) continue;
      Rect_Union(&part, &rect);
      grows = true;
    }
  }
  return part;
}

class MoveSearch {
 public:
  MoveSearch(const PixelView& after, const PixelView& earlier, const std::vector<Rect>& changed)
      : now(after), before(earlier), runs(changed) {}

  std::vector<Move> search(const Rect& part) {
    band = boundsWithin(part);
    if (band.right - band.left < 2 * RowSamples::kPiece || band.bottom - band.top < 2 * kWindow ||
        changedWithin(band) < kLeastArea)
      return {};
    for (const int32 down : likelyDistances()) {
      std::vector<Move> moves = movesBy(down);
      if (!moves.empty()) return moves;
    }
    return {};
  }

 private:
  Rect boundsWithin(const Rect& part) const {
    Rect box = {};
    for (const Rect& run : runs) {
      Rect inside;
      if (Rect_Intersect(&inside, &run, &part)) Rect_Union(&box, &inside);
    }
    return box;
  }

  uint64 changedWithin(const Rect& part) const {
    uint64 area = 0;
    for (const Rect& run : runs) {
      Rect inside;
      if (Rect_Intersect(&inside, &run, &part)) area += areaOf(inside);
    }
    return area;
  }

  /// Where windows of the picture stood before, the distance of most of them first.
  std::vector<int32> likelyDistances() const {
    struct Vote {
      int32 down;
      int count;
    };
    const RowSamples samples(band);
    std::vector<uint64> rows;
    for (int32 y = band.top; y < band.bottom; ++y) rows.push_back(samples.of(before, y));
    std::vector<Vote> votes;
    const auto room = static_cast<int32>(rows.size()) - kWindow;
    for (int32 i = 0; i < kProbes; ++i) {
      const int32 at = room * i / (kProbes - 1);
      Window window;
      for (int32 row = 0; row < kWindow; ++row)
        window[static_cast<size_t>(row)] = samples.of(now, band.top + at + row);
      const int32 down = distanceOf(window, at, rows);
      if (down == 0) continue;
      const auto same = std::find_if(votes.begin(), votes.end(),
                                     [down](const Vote& vote) { return vote.down == down; });
      if (same == votes.end()) {
        votes.push_back({down, 1});
      } else {
        ++same->count;
      }
    }
    std::stable_sort(votes.begin(), votes.end(),
                     [](const Vote& a, const Vote& b) { return a.count > b.count; });
    std::vector<int32> distances;
    for (size_t i = 0; i < std::min(kMostDistances, votes.size()); ++i)
      distances.push_back(votes[i].down);
    return distances;
  }

  /// How far below the nearest rows that look like it a window stands, or 0 when there are none, or
  /// when all its rows are alike, which would be found anywhere.
  static int32 distanceOf(const Window& window, int32 at, const std::vector<uint64>& rows) {
    const auto last = static_cast<int32>(rows.size()) - kWindow;
    const auto isAt = [&](int32 row) {
      return row >= 0 && row <= last && std::equal(window.begin(), window.end(), rows.data() + row);
    };
    if (isAt(at) ||
        std::all_of(window.begin(), window.end(), [&](uint64 row) { return row == window[0]; }))
      return 0;
    for (int32 distance = 1; distance <= last; ++distance) {
      if (isAt(at + distance)) return -distance;
      if (isAt(at - distance)) return distance;
    }
    return 0;
  }

  bool isRowMoved(int32 y, int32 down) const {
    constexpr int32 kPixelBits = 32;
    const auto x = static_cast<uint32>(band.left);
    return Raster_ComparePixels(now.data, now.pitch, kPixelBits, before.data, before.pitch,
                                kPixelBits, x, static_cast<uint32>(y), x,
                                static_cast<uint32>(y - down), widthOf(band), 1) == 0;
  }

  /// The rows of the band that really stood there, from above to below, or the other way round when
  /// they go down.
  std::vector<Move> movesBy(int32 down) const {
    std::vector<Move> moves;
    const int32 first = std::max(band.top, down);
    const int32 end = std::min(band.bottom, static_cast<int32>(now.height) + down);
    for (int32 top = first; top < end; ++top) {
      int32 bottom = top;
      while (bottom < end && isRowMoved(bottom, down)) ++bottom;
      const Rect to = {band.left, top, band.right, bottom};
      if (bottom - top >= kLeastRows && changedWithin(to) >= kLeastGain)
        moves.push_back({to, down});
      top = bottom;
    }
    if (down > 0) std::reverse(moves.begin(), moves.end());
    return moves;
  }

  const PixelView& now;
  const PixelView& before;
  const std::vector<Rect>& runs;
  Rect band = {};
};

}  // namespace

std::vector<Move> findMoves(const PixelView& now, const PixelView& before,
                            const std::vector<Rect>& runs, const ChangeList& damage) {
  uint64 area = 0;
  for (const Rect& run : runs) area += areaOf(run);
  if (area < kLeastArea) return {};
  return MoveSearch(now, before, runs).search(mainPart(runs, damage));
}

}  // namespace tool::live
