// SPDX-License-Identifier: MIT
//
// The colours of a picture in the order in which they are met, up to a number of them.

#ifndef RASTER_TOOLS_LIVE_COLOUR_TABLE_H
#define RASTER_TOOLS_LIVE_COLOUR_TABLE_H

#include <bit>

#include "baseTypes.h"

namespace tool::live {

template <uint32 kMost> class ColourTable {
 public:
  /// What indexOf says when there is no room for a colour.
  static constexpr uint32 kNone = kMost;

  uint32 indexOf(uint32 colour) {
    constexpr uint32 kSpread = 0x9E3779B1;  // 2^32 divided by the golden ratio
    uint32 slot = colour * kSpread >> (32 - kSlotBits);
    for (; slots[slot] != 0; slot = (slot + 1) % kSlots)
      if (colours[slots[slot] - 1] == colour) return slots[slot] - 1u;
    if (count == kMost) return kNone;
    colours[count] = colour;
    slots[slot] = static_cast<uint16>(++count);
    return count - 1;
  }
  uint32 size() const { return count; }
  uint32 colour(uint32 index) const { return colours[index]; }

 private:
  static constexpr uint32 kSlotBits = std::bit_width(kMost) + 1;
  static constexpr uint32 kSlots = 1u << kSlotBits;
  uint32 colours[kMost];
  uint16 slots[kSlots] = {};  // an index and 1
  uint32 count = 0;
};

}  // namespace tool::live

#endif
