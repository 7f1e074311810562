// SPDX-License-Identifier: MIT
//
// What has changed of a picture: a rect list for every strip of it. A list that overflows becomes
// its bounding box, and so that costs the pixels of one strip, not of the whole picture.

#ifndef RASTER_TOOLS_LIVE_CHANGE_LIST_H
#define RASTER_TOOLS_LIVE_CHANGE_LIST_H

#include <vector>

#include "raster.h"

namespace tool::live {

class ChangeList {
 public:
  ChangeList() = default;
  ChangeList(uint32 width, uint32 height);

  Rect bounds() const { return area; }
  bool isEmpty() const;
  void clear();

  /// Adds what of a rectangle lies in the picture.
  void add(const Rect& rect);
  void add(const ChangeList& other);
  void addAll() { add(area); }
  /// Takes a rectangle out. Where a list has no room to say what is left, more is left of it, but
  /// nothing of the rectangle.
  void subtract(const Rect& rect);

  /// The rectangles of a part of the picture, disjoint, joined where one strip goes on in the next.
  std::vector<Rect> within(const Rect& part) const;
  std::vector<Rect> all() const { return within(area); }
  /// The list of each strip, for the library.
  const std::vector<RectList>& lists() const { return strips; }

 private:
  Rect area = {};
  std::vector<RectList> strips;
};

/// Puts the box of two rectangles in their place wherever it has at most `slack` pixels more than
/// both: one rectangle costs less to be sent than two.
void joinNear(std::vector<Rect>& rects, uint64 slack);

}  // namespace tool::live

#endif
