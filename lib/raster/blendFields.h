// SPDX-License-Identifier: MIT
//
// Where the channels of a packed pixel lie, and how a field becomes eight bits.

#ifndef RASTER_BLEND_FIELDS_H
#define RASTER_BLEND_FIELDS_H

#include "baseTypes.h"

namespace raster {

/// A channel's place in a pixel. Narrowing a byte keeps its top bits. Widening a field puts it at
/// the top of the byte and repeats it below: a product with the pattern of kCopies.
template <int kFirstBit, int kBits> struct Field {
  static constexpr int kShift = kFirstBit;
  static constexpr uint32 kMask = (1u << kBits) - 1;

  /// How far above the field's first bit the top bits of a byte are.
  static constexpr int kUp = 8 - kBits;

  /// The product with this number is the widened field as the upper byte of 16 bits.
  static constexpr uint32 kCopies = [] {
    uint32 copies = 0;
    for (int bit = 16 - kBits; bit >= (kBits == 3 ? 10 : 4); bit -= kBits) copies |= 1u << bit;
    return copies;
  }();

  /// Deliberate: the last two bits of a byte widened from three repeat the field's low two bits,
  /// not its high ones, and are not part of the product.
  static constexpr uint32 kLowCopy = kBits == 3 ? 0x0300 : 0;

  static constexpr uint32 widen(uint32 field) {
    return ((field * kCopies) | (field << 8 & kLowCopy)) >> 8 & 0xFF;
  }
};

/// In place of a field where there is none.
struct NoField {
  static constexpr uint32 kCopies = 0;
  static constexpr uint32 kLowCopy = 0;
};

/// Whether the products fit 16 bits and the fields come back when the bytes are narrowed.
template <int kBits> constexpr bool widensExactly() {
  using AnyField = Field<0, kBits>;
  for (uint32 field = 0; field <= AnyField::kMask; ++field) {
    if (field * AnyField::kCopies > 0xFFFF || AnyField::widen(field) >> AnyField::kUp != field)
      return false;
  }
  return true;
}
static_assert(widensExactly<2>() && widensExactly<3>() && widensExactly<5>() && widensExactly<6>());
static_assert(Field<0, 2>::widen(2) == 0xAA && Field<0, 3>::widen(4) == 0x90);
static_assert(Field<0, 5>::widen(21) == 0xAD && Field<0, 6>::widen(33) == 0x86);

}  // namespace raster

#endif
