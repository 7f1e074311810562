// SPDX-License-Identifier: MIT
//
// The colours of a picture in the order in which they are met, up to a number of them.

#ifndef RASTER_TOOLS_LIVE_COLOR_TABLE_H
#define RASTER_TOOLS_LIVE_COLOR_TABLE_H

#include <bit>

#include "baseTypes.h"

namespace tool::live {

template <uint32 kMost> class ColorTable {
 public:
  /// What indexOf says when there is no room for a colour.
  static constexpr uint32 kNone = kMost;

  uint32 indexOf(uint32 color) {
    constexpr uint32 kSpread = 0x9E3779B1;  // 2^32 divided by the golden ratio
    uint32 slot = color * kSpread >> (32 - kSlotBits);
    for (; slots[slot] != 0; slot = (slot + 1) % kSlots)
      if (colors[slots[slot] - 1] == color) return slots[slot] - 1u;
    if (count == kMost) return kNone;
    colors[count] = color;
    slots[slot] = static_cast<uint16>(++count);
    return count - 1;
  }
  uint32 size() const { return count; }
  uint32 color(uint32 index) const { return colors[index]; }

 private:
  static constexpr uint32 kSlotBits = std::bit_width(kMost) + 1;
  static constexpr uint32 kSlots = 1u << kSlotBits;
  uint32 colors[kMost];
  uint16 slots[kSlots] = {};  // an index and 1
  uint32 count = 0;
};

}  // namespace tool::live

#endif
