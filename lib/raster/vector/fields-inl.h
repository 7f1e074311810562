// SPDX-License-Identifier: MIT
//
// The fields of pixels in lanes: from one format to another, widened to bytes and narrowed again.
// Included once per instruction set, after Highway.

#include "frame/pixelFormat.h"

#if defined(RASTER_FIELDS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_FIELDS_INL_H
#undef RASTER_FIELDS_INL_H
#else
#define RASTER_FIELDS_INL_H
#endif

#include "hwy/highway.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

// ---- From one format to another ----------------------------------------------------------------

template <int kRight, class V> HWY_INLINE V shiftLanes(V v) {
  if constexpr (kRight > 0) {
    return hn::ShiftRight<kRight>(v);
  } else if constexpr (kRight < 0) {
    return hn::ShiftLeft<-kRight>(v);
  } else {
    return v;
  }
}

template <class D> HWY_INLINE hn::Vec<D> setMask(D d, uint32 mask) {
  return hn::Set(d, static_cast<hn::TFromD<D>>(mask));
}

/// The bits that a conversion repeats `kRight` bits lower.
template <class Move, int kRight>
inline constexpr uint32 kRepeatMask =
    (Move::Red::kRepeatRight == kRight ? Move::Red::kRepeatMask : 0) |
    (Move::Green::kRepeatRight == kRight ? Move::Green::kRepeatMask : 0) |
    (Move::Blue::kRepeatRight == kRight ? Move::Blue::kRepeatMask : 0);

template <class Move, int kRight, class D>
HWY_INLINE hn::Vec<D> addRepeated(D d, hn::Vec<D> color, hn::Vec<D> tops) {
  constexpr uint32 kMask = kRepeatMask<Move, kRight>;
  if constexpr (kMask == 0) {
    return color;
  } else {
    return hn::OrAnd(color, hn::ShiftRight<kRight>(tops), setMask(d, kMask));
  }
}

/// Whether red lies in the upper half of a pixel and is narrowed to two bytes with the others, so
/// that one instruction moves red and blue (narrowByProducts).
template <class From, class To>
inline constexpr bool kHasProducts =
    From::Red::kMask == 0xFF0000 && From::Blue::kMask == 0xFF && To::kBytes == 2;

#if HWY_TARGET != HWY_SCALAR

/// Red and blue, as numbers of 16 bits, are multiplied to where they meet green, and added.
template <class From, class To, class D>
HWY_INLINE hn::Vec<D> narrowByProducts(D d, hn::Vec<D> pixels) {
  using Move = ColorMove<From, To>;
  const hn::Repartition<int16, D> d16;
  const hn::RebindToSigned<D> d32;
  constexpr int kRight = Move::Green::kRight;
  constexpr auto topsOf = [](uint32 mask, int right) {
    return right < 0 ? mask >> -right : mask << right;
  };
  constexpr uint32 kRedFactor = 1u << (kRight + 16 - Move::Red::kRight);
  constexpr uint32 kBlueFactor = 1u << (kRight - Move::Blue::kRight);
  static_assert(kRedFactor < 0x8000 && kBlueFactor < 0x8000);
  const auto outer =
      hn::And(pixels, setMask(d, topsOf(Move::Red::kTopMask, Move::Red::kRight) |
                                     topsOf(Move::Blue::kTopMask, Move::Blue::kRight)));
  const auto factors = hn::BitCast(d16, hn::Set(d, kRedFactor << 16 | kBlueFactor));
  auto rest = hn::Zero(d32);
  const auto moved =
      hn::ReorderWidenMulAccumulate(d32, hn::BitCast(d16, outer), factors, hn::Zero(d32), rest);
  const auto green = setMask(d, topsOf(Move::Green::kTopMask, kRight));
  return hn::ShiftRight<kRight>(hn::OrAnd(hn::BitCast(d, moved), pixels, green));
}

#endif

/// convertColor on lanes. Channels that move alike move together.
template <class From, class To, class D>
HWY_INLINE hn::Vec<D> convertLanes(D d, hn::Vec<D> pixels) {
  using Move = ColorMove<From, To>;
  using R = typename Move::Red;
  using G = typename Move::Green;
  using B = typename Move::Blue;
#if HWY_TARGET != HWY_SCALAR
  if constexpr (kHasProducts<From, To>) return narrowByProducts<From, To>(d, pixels);
#endif
  auto tops = hn::And(shiftLanes<B::kRight>(pixels), setMask(d, B::kTopMask));
  const auto green = shiftLanes<G::kRight>(pixels);
  if constexpr (R::kRight == G::kRight) {
    tops = hn::OrAnd(tops, green, setMask(d, G::kTopMask | R::kTopMask));
  } else {
    tops = hn::OrAnd(tops, green, setMask(d, G::kTopMask));
    tops = hn::OrAnd(tops, shiftLanes<R::kRight>(pixels), setMask(d, R::kTopMask));
  }
  // Every distance once: the mask of a distance has the bits of all channels that have it.
  auto color = addRepeated<Move, R::kRepeatRight>(d, tops, tops);
  if constexpr (G::kRepeatRight != R::kRepeatRight)
    color = addRepeated<Move, G::kRepeatRight>(d, color, tops);
  if constexpr (B::kRepeatRight != R::kRepeatRight && B::kRepeatRight != G::kRepeatRight)
    color = addRepeated<Move, B::kRepeatRight>(d, color, tops);
  return color;
}

// ---- Channels of 16-bit pixels as bytes --------------------------------------------------------

/// One channel of 16-bit pixels widened to 8 bits: v of b bits, repeated, is v times
/// (2^b + 1) * 2^(8 - 2b), rounded down.
template <class F, class D> HWY_INLINE hn::Vec<D> widenChannel(D d, hn::Vec<D> pixels) {
  static_assert(F::kBits >= 4 && F::kBits <= 8, "channels of 4 to 8 bits are widened");
  constexpr int kLow = F::kTop - F::kBits;
  constexpr auto factorAt = [](int low) {
    return uint64{(1u << F::kBits) + 1} << (24 - 2 * F::kBits - low);
  };
  // Where the channel lies when it is multiplied: at the top unless its factor fits 16 bits.
  constexpr bool kStays = kLow != 0 && factorAt(kLow) <= 0xFFFF;
  constexpr int kUp = kStays ? 0 : 16 - F::kTop;
  auto channel = shiftLanes<-kUp>(pixels);
  if constexpr (kLow != 0) channel = hn::And(channel, setMask(d, F::kMask << kUp));
  return hn::MulHigh(channel, setMask(d, static_cast<uint32>(factorAt(kLow + kUp))));
}

/// Multiplies a field, where it lies, by a pattern that puts copies of it into the upper byte.
template <class Field, class D16>
HWY_INLINE hn::Vec<D16> copyField(D16 d16, hn::Vec<D16> words, uint16 pattern) {
  // A constant that GCC knows would become a chain of shifts and sums.
  const auto copies = inRegister(hn::Set(d16, pattern));
  return hn::Mul(hn::And(words, setMask(d16, Field::kMask)), copies);
}

/// Widens a field of five or six bits to the upper byte: itself, and its top bits once more. The
/// lower byte has no meaning.
template <class Field, class D16>
HWY_INLINE hn::Vec<D16> widenToUpper(D16 d16, hn::Vec<D16> words) {
  constexpr int kUp = 16 - Field::kTop;
  if constexpr (kUp >= Field::kBits) {
    return copyField<Field>(d16, words, (1 << kUp) + (1 << (kUp - Field::kBits)));
  } else {
    const auto top = hn::ShiftLeft<kUp>(words);
    const auto mask = setMask(d16, 0xFFFF0000u >> Field::kBits & 0xFFFF);
    return hn::OrAnd(hn::ShiftRight<Field::kBits>(top), top, mask);
  }
}

/// Narrows the upper byte of each lane to the field's place. Bits outside it have no meaning.
template <class Field, class V> HWY_INLINE V narrow(V channel) {
  return shiftLanes<16 - Field::kTop>(channel);
}

/// Narrows the upper byte of each lane to a field of a pixel that has no other fields yet.
template <class Field, class D16>
HWY_INLINE hn::Vec<D16> firstField(D16 d16, hn::Vec<D16> channel) {
  if constexpr (Field::kTop == Field::kBits) return narrow<Field>(channel);
  return hn::And(narrow<Field>(channel), setMask(d16, Field::kMask));
}
template <class Field, class D16>
HWY_INLINE hn::Vec<D16> addField(D16 d16, hn::Vec<D16> others, hn::Vec<D16> channel) {
  return hn::OrAnd(others, narrow<Field>(channel), setMask(d16, Field::kMask));
}

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
