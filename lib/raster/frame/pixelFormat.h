// SPDX-License-Identifier: MIT
//
// The pixel formats, described once: storage, the places of red, green and blue, and how a pixel of
// one format becomes a pixel of another.

#ifndef RASTER_PIXEL_FORMAT_H
#define RASTER_PIXEL_FORMAT_H

#include <tuple>
#include <type_traits>

#include "baseTypes.h"

namespace raster {

/// A channel's place in a pixel value.
template <unsigned kLowBit, unsigned kBitCount> struct Field {
  static constexpr int kBits = kBitCount;
  static constexpr int kTop = kLowBit + kBitCount;  ///< one above the highest bit
  static constexpr uint32 kMask = ((1u << kBitCount) - 1) << kLowBit;

  /// The top bits of a byte, in their place.
  static constexpr uint32 ofByte(uint32 byte) { return byte >> (8 - kBitCount) << kLowBit; }
};

/// A format by its code, its bytes a pixel, and its channels.
template <int32 kFormatCode, unsigned kSize, class R, class G, class B> struct PixelFormat {
  using Red = R;
  using Green = G;
  using Blue = B;
  static constexpr int32 kCode = kFormatCode;
  static constexpr unsigned kBytes = kSize;
};
using Code3 = PixelFormat<3, 1, Field<2, 1>, Field<5, 1>, Field<7, 1>>;
using Code6 = PixelFormat<6, 1, Field<4, 2>, Field<2, 2>, Field<0, 2>>;
using Code8 = PixelFormat<8, 1, Field<0, 3>, Field<3, 3>, Field<6, 2>>;
using Code15 = PixelFormat<15, 2, Field<10, 5>, Field<5, 5>, Field<0, 5>>;
using Code16 = PixelFormat<16, 2, Field<11, 5>, Field<5, 6>, Field<0, 5>>;
using Code24 = PixelFormat<24, 3, Field<16, 8>, Field<8, 8>, Field<0, 8>>;
using Code32 = PixelFormat<32, 4, Field<16, 8>, Field<8, 8>, Field<0, 8>>;

/// Whether two formats have the same channels in the same places: pixel values of codes 24 and 32
/// are told apart in memory only.
template <class A, class B>
inline constexpr bool kSameFields =
    std::is_same_v<typename A::Red, typename B::Red>&& std::is_same_v<
        typename A::Green, typename B::Green>&& std::is_same_v<typename A::Blue, typename B::Blue>;

/// `value` shifted right, or left where kRight is negative.
template <int kRight> constexpr uint32 shiftedRight(uint32 value) {
  if constexpr (kRight < 0) {
    return value << -kRight;
  } else {
    return value >> kRight;
  }
}

/// How a channel gets from its place in one format to that in another. Narrowing keeps the top
/// bits; widening repeats them in the new low bits.
template <class From, class To> struct ChannelMove {
  static constexpr int kRight = From::kTop - To::kTop;
  static constexpr uint32 kTopMask = shiftedRight<kRight>(From::kMask) & To::kMask;
  static constexpr int kRepeatRight = From::kBits;
  static constexpr uint32 kRepeatMask = To::kMask & ~kTopMask;
  static_assert(To::kBits <= 2 * From::kBits,
                "a channel at most doubles its bits: the top ones are repeated once");

  static constexpr uint32 apply(uint32 pixel) {
    const uint32 top = shiftedRight<kRight>(pixel) & kTopMask;
    return top | (top >> kRepeatRight & kRepeatMask);
  }
};

/// The moves of the three channels.
template <class From, class To> struct ColorMove {
  using Red = ChannelMove<typename From::Red, typename To::Red>;
  using Green = ChannelMove<typename From::Green, typename To::Green>;
  using Blue = ChannelMove<typename From::Blue, typename To::Blue>;
};

/// The colour of a pixel of one format in another; bits outside the fields are 0.
template <class From, class To> constexpr uint32 convertColor(uint32 pixel) {
  using Move = ColorMove<From, To>;
  return Move::Red::apply(pixel) | Move::Green::apply(pixel) | Move::Blue::apply(pixel);
}
static_assert(convertColor<Code16, Code32>(0x8410) == 0x00848284);
static_assert(convertColor<Code15, Code16>(0x0200) == 0x0420);
static_assert(convertColor<Code32, Code6>(0x00FFFFFF) == 0x3F);

/// What whole rectangles are converted from (beside palettes) and to. Indices into these lists are
/// indices into the table of kernels.
using SourceFormats = std::tuple<Code15, Code16, Code24, Code32>;
using DestinationFormats = std::tuple<Code3, Code6, Code8, Code15, Code16, Code24, Code32>;

/// Calls `body` with the member of a list of formats that has this code, as a value, and its index;
/// returns false when there is none.
template <class Formats, size_t kIndex = 0, class Body>
constexpr bool withFormat(int32 code, const Body& body) {
  if constexpr (kIndex == std::tuple_size_v<Formats>) {
    return false;
  } else {
    using Format = std::tuple_element_t<kIndex, Formats>;
    if (code != Format::kCode) return withFormat<Formats, kIndex + 1>(code, body);
    body(Format(), kIndex);
    return true;
  }
}

}  // namespace raster

#endif
