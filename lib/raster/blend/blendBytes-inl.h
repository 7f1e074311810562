// SPDX-License-Identifier: MIT
//
// The arithmetic of blending on pixels of three and four bytes, one in each 32-bit lane. Included
// once per instruction set.
//
// Pixels come in two forms, whichever is at hand: Bytes, as they lie in memory, and Halves, as
// products need and leave them.

#if defined(RASTER_BLEND_BYTES_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_BYTES_INL_H
#undef RASTER_BLEND_BYTES_INL_H
#else
#define RASTER_BLEND_BYTES_INL_H
#endif

#include "blendMemory-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Four bytes in a 32-bit lane.
template <class D> struct Bytes { hn::Vec<D> v; };

/// Bytes 0 and 2, and bytes 1 and 3, each as the upper byte of a 16-bit half of the lane. The lower
/// bytes have no meaning.
template <class D> struct Halves { hn::Vec<D> even, odd; };

template <class D> HWY_INLINE Halves<D> halvesOf(Bytes<D> p) {
  return {hn::ShiftLeft<8>(p.v), p.v};
}
template <class D> HWY_INLINE Halves<D> halvesOf(Halves<D> p) { return p; }

template <class D> HWY_INLINE Bytes<D> bytesOf(Halves<D> p) {
  const auto upper = hn::Set(D(), 0xFF00FF00u);
#if HWY_TARGET == HWY_SCALAR
  return {hn::ShiftRight<8>(p.even & upper) | (p.odd & upper)};
#else
  const hn::Repartition<uint16, D> d16;
  const auto even = hn::BitCast(D(), hn::ShiftRight<8>(hn::BitCast(d16, p.even)));
  return {hn::OrAnd(even, p.odd, upper)};
#endif
}
template <class D> HWY_INLINE Bytes<D> bytesOf(Bytes<D> p) { return p; }

#if HWY_TARGET == HWY_SCALAR

/// A number of 0 to 255 for each pixel, to multiply its bytes with.
template <class D> struct Factor { hn::Vec<D> v; };
template <class D> HWY_INLINE Factor<D> factor(D d, uint32 value) { return {hn::Set(d, value)}; }
template <class D> HWY_INLINE Factor<D> inv(Factor<D> f) { return {hn::Set(D(), 255) - f.v}; }
template <class D> HWY_INLINE Factor<D> alphaOf(Bytes<D> p) { return {hn::ShiftRight<24>(p.v)}; }
template <class D> HWY_INLINE Factor<D> alphaOf(Halves<D> p) { return alphaOf(Bytes<D>{p.odd}); }

/// Multiplies two bytes at a time, in the lower bytes of the halves, by one product of the lane.
template <class D> HWY_INLINE hn::Vec<D> mulHalves(hn::Vec<D> bytes, Factor<D> f) {
  const auto low = hn::Set(D(), 0x00FF00FFu);
  const auto products = (bytes & low) * f.v;
  return products + hn::Set(D(), 0x00010001u) + (hn::ShiftRight<8>(products) & low);
}
template <class D> HWY_INLINE Halves<D> mul(Halves<D> p, Factor<D> f) {
  return {mulHalves(hn::ShiftRight<8>(p.even), f), mulHalves(hn::ShiftRight<8>(p.odd), f)};
}
template <class D> HWY_INLINE Halves<D> mul(Bytes<D> p, Factor<D> f) {
  return {mulHalves(p.v, f), mulHalves(hn::ShiftRight<8>(p.v), f)};
}

/// Adds the lower bytes of the halves; a carry fills the byte that it comes from.
template <class D> HWY_INLINE hn::Vec<D> addHalves(hn::Vec<D> a, hn::Vec<D> b) {
  const auto low = hn::Set(D(), 0x00FF00FFu);
  const auto sum = (a & low) + (b & low);
  const auto carry = hn::ShiftRight<8>(sum) & low;
  return (sum | (hn::ShiftLeft<8>(carry) - carry)) & low;
}
template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Bytes<D> b) {
  const auto odd = addHalves<D>(hn::ShiftRight<8>(a.v), hn::ShiftRight<8>(b.v));
  return {addHalves<D>(a.v, b.v) | hn::ShiftLeft<8>(odd)};
}
template <class D> HWY_INLINE Bytes<D> add(Halves<D> a, Halves<D> b) {
  return add(bytesOf(a), bytesOf(b));
}

#else

template <class D> using WordsOf = hn::Repartition<uint16, D>;

/// A number of 0 to 255 for each pixel, to multiply its bytes with: it stands in each of the four.
template <class D> struct Factor { hn::Vec<D> v; };
template <class D> HWY_INLINE Factor<D> factor(D d, uint32 value) {
  return {hn::Set(d, value * 0x01010101u)};
}
template <class D> HWY_INLINE Factor<D> inv(Factor<D> f) {
  return {hn::Xor(f.v, hn::Set(D(), 0xFFFFFFFFu))};
}
template <class D> HWY_INLINE Factor<D> alphaOf(Bytes<D> p) {
  const hn::Repartition<uint8, D> d8;
  alignas(16) static constexpr uint8 kAlphas[16] = {3,  3,  3,  3,  7,  7,  7,  7,
                                                    11, 11, 11, 11, 15, 15, 15, 15};
  const auto bytes = hn::TableLookupBytes(hn::BitCast(d8, p.v), hn::LoadDup128(d8, kAlphas));
  return {hn::BitCast(D(), bytes)};
}
template <class D> HWY_INLINE Factor<D> alphaOf(Halves<D> p) { return alphaOf(Bytes<D>{p.odd}); }

/// The high products of 256 * c + 1 and 257 * f have c * f / 255 as their upper byte.
template <class D> HWY_INLINE hn::Vec<D> mulHalves(hn::Vec<D> upper, Factor<D> f) {
  const WordsOf<D> d16;
  const auto c = hn::BitCast(d16, upper | hn::Set(D(), 0x00010001u));
  return hn::BitCast(D(), hn::MulHigh(c, hn::BitCast(d16, f.v)));
}
template <class D> HWY_INLINE hn::Vec<D> upperBytes(hn::Vec<D> v) {
  return v & hn::Set(D(), 0xFF00FF00u);
}
template <class D> HWY_INLINE Halves<D> mul(Halves<D> p, Factor<D> f) {
  return {mulHalves<D>(upperBytes<D>(p.even), f), mulHalves<D>(upperBytes<D>(p.odd), f)};
}
template <class D> HWY_INLINE Halves<D> mul(Bytes<D> p, Factor<D> f) {
  const auto even = hn::ShiftLeft<8>(hn::BitCast(WordsOf<D>(), p.v));
  return {mulHalves<D>(hn::BitCast(D(), even), f), mulHalves<D>(upperBytes<D>(p.v), f)};
}

template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Bytes<D> b) {
  const hn::Repartition<uint8, D> d8;
  return {hn::BitCast(D(), hn::SaturatedAdd(hn::BitCast(d8, a.v), hn::BitCast(d8, b.v)))};
}
template <class D> HWY_INLINE Halves<D> add(Halves<D> a, Halves<D> b) {
  return {add(Bytes<D>{a.even}, Bytes<D>{b.even}).v, add(Bytes<D>{a.odd}, Bytes<D>{b.odd}).v};
}

#endif

template <class D> HWY_INLINE Bytes<D> add(Bytes<D> a, Halves<D> b) { return add(a, bytesOf(b)); }
template <class D> HWY_INLINE Bytes<D> add(Halves<D> a, Bytes<D> b) { return add(bytesOf(a), b); }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
