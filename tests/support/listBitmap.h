// SPDX-License-Identifier: MIT
//
// The pixels of a rect list, one bit each.

#ifndef TESTS_LIST_BITMAP_H
#define TESTS_LIST_BITMAP_H

#include <bitset>

#include "raster.h"

namespace tests {

/// The pixels of a square from 0, 0.
template <int32 kSide> using Bitmap = std::bitset<size_t{kSide} * kSide>;

template <int32 kSide> void paint(Bitmap<kSide>& bitmap, const RectListEntry& r, bool value) {
  for (int32 y = r.y; y < r.y + r.height; ++y)
    for (int32 x = r.x; x < r.x + r.width; ++x) bitmap[static_cast<size_t>(y * kSide + x)] = value;
}

/// A list whose rectangles lie in the square.
template <int32 kSide> Bitmap<kSide> bitmapOf(const RectList& list) {
  Bitmap<kSide> bitmap;
  for (const RectListEntry& r : list.rects) {
    if (r.width <= 0) break;
    paint<kSide>(bitmap, r, true);
  }
  return bitmap;
}

}  // namespace tests

#endif
