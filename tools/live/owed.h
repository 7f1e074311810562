// SPDX-License-Identifier: MIT
//
// What a viewer lacks: moves that it can make by itself, and the pixels to be sent after them.

#ifndef RASTER_TOOLS_LIVE_OWED_H
#define RASTER_TOOLS_LIVE_OWED_H

#include <vector>

#include "changeList.h"
#include "moves.h"

namespace tool::live {

class Owed {
 public:
  /// Everything, of a picture of this size.
  Owed(uint32 width, uint32 height);

  Rect bounds() const { return pixels.bounds(); }

  /// The viewer has not got these pixels.
  void add(const Rect& rect) { pixels.add(rect); }
  /// The picture has changed; none of it is left to the viewer to be moved.
  void add(const ChangeList& changed) { pixels.add(changed); }
  /// The picture has changed, and the viewer can move what it has. In `foreign` it has other pixels
  /// than the picture (the cursor's), and may keep them.
  void add(const Changes& changes, const Rect& foreign);
  /// All pixels are to be sent, none moved.
  void forgetMoves();

  // In the order in which the viewer gets them, within a part of the picture. Moves that reach
  // beyond it are forgotten.
  std::vector<Move> takeMoves(const Rect& part);
  std::vector<Rect> pixelsWithin(const Rect& part) const { return pixels.within(part); }
  void subtractPixels(const Rect& part) { pixels.subtract(part); }

 private:
  bool hasMostOf(const std::vector<Move>& wanted) const;
  void add(const Move& move, const Rect& foreign);

  std::vector<Move> moves;
  ChangeList pixels;  // once the moves are made
};

}  // namespace tool::live

#endif
