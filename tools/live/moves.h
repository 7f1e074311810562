// SPDX-License-Identifier: MIT
//
// What of a picture's changes has only gone up or down, as when a text scrolls: a viewer can do
// that by itself.

#ifndef RASTER_TOOLS_LIVE_MOVES_H
#define RASTER_TOOLS_LIVE_MOVES_H

#include <vector>

#include "changeList.h"
#include "pixelView.h"

namespace tool::live {

/// The pixels of `to` are those that stood `down` rows above before; below, when it is negative.
struct Move {
  Rect to;
  int32 down;

  Rect from() const { return {to.left, to.top - down, to.right, to.bottom - down}; }
};

/// What became of a picture.
struct Changes {
  Changes() = default;
  Changes(uint32 width, uint32 height) : all(width, height) {}
  void clear() {
    all.clear();
    moves.clear();
  }

  ChangeList all;  // what may differ from before, the moves among it
  std::vector<Move> moves;
};

/// Finds moves between two pictures of one size that differ in `runs` only, which are disjoint;
/// `damage` holds all of them, and tells what belongs together. There is one distance for all, the
/// places are disjoint, and in the order of the result none overwrites what a later one takes.
/// Pixels are compared, not guessed; top bytes do not count. What is not found costs no more than
/// its bytes.
std::vector<Move> findMoves(const PixelView& now, const PixelView& before,
                            const std::vector<Rect>& runs, const ChangeList& damage);

}  // namespace tool::live

#endif
