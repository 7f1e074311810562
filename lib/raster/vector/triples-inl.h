// SPDX-License-Identifier: MIT
//
// Pixels of three bytes in 32-bit lanes, and back. Included once per instruction set, after
// Highway.
//
// Four pixels are twelve bytes or sixteen:
//
//     in memory   b g r b g r b g r b g r . . . .
//     in lanes    b g r 0 b g r 0 b g r 0 b g r 0
//
// Bytes change places within the 16-byte parts of a vector only. In a vector of several parts the
// 32-bit words are first (or afterwards) moved so that each part has its own three:
//
//     in memory   0 1 2 3 4 5 . .        words of eight pixels
//     in parts    0 1 2 . 3 4 5 .

#if defined(RASTER_TRIPLES_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_TRIPLES_INL_H
#undef RASTER_TRIPLES_INL_H
#else
#define RASTER_TRIPLES_INL_H
#endif

#include <array>
#include <cstddef>

#include "hwy/highway.h"
#include "rows-inl.h"

#if HWY_TARGET != HWY_SCALAR

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// For every 128-bit part of a vector the same choice of its bytes; kNoByte gives 0.
using BytesOfPart = std::array<uint8, 16>;
constexpr uint8 kNoByte = 0x80;

template <class D> HWY_INLINE hn::Vec<D> chooseBytes(D d, hn::Vec<D> v, const BytesOfPart& choice) {
  const hn::Repartition<uint8, D> d8;
  return hn::BitCast(
      d, hn::TableLookupBytesOr0(hn::BitCast(d8, v), hn::LoadDup128(d8, choice.data())));
}

/// A choice of the vector's 32-bit words.
template <class D> using WordOrder = std::array<int32, kLanes<hn::Repartition<uint32, D>>>;

template <class D>
HWY_INLINE hn::Vec<D> chooseWords(D d, hn::Vec<D> v, const WordOrder<D>& choice) {
  const hn::Repartition<uint32, D> d32;
  return hn::BitCast(
      d, hn::TableLookupLanes(hn::BitCast(d32, v), hn::SetTableIndices(d32, choice.data())));
}

// ---- To lanes ---------------------------------------------------------------------------------

/// Gives each part of a vector its four 3-byte pixels, from the word `first` of the vector on.
template <class D> constexpr WordOrder<D> partTriples(size_t first) {
  WordOrder<D> words{};
  for (size_t i = 0; i < words.size(); ++i)
    words[i] = i % 4 == 3 ? 0 : static_cast<int32>(first + i / 4 * 3 + i % 4);
  return words;
}

/// Four 3-byte pixels to words, from the byte `first` of a part on.
constexpr BytesOfPart expandTriples(size_t first) {
  BytesOfPart bytes{};
  for (size_t i = 0; i < bytes.size(); ++i)
    bytes[i] = i % 4 == 3 ? kNoByte : static_cast<uint8>(first + i / 4 * 3 + i % 4);
  return bytes;
}

/// The 3-byte pixels of a vector, from its byte kFirst on, in 32-bit lanes; byte 3 is 0.
template <size_t kFirst = 0, class D> HWY_INLINE hn::Vec<D> spreadTriples(D d, hn::Vec<D> bytes) {
  if constexpr (kLanes<D> == 4) {
    static constexpr BytesOfPart kExpand = expandTriples(kFirst);
    return chooseBytes(d, bytes, kExpand);
  } else {
    static constexpr WordOrder<D> kParts = partTriples<D>(kFirst / 4);
    static constexpr BytesOfPart kExpand = expandTriples(0);
    return chooseBytes(d, chooseWords(d, bytes, kParts), kExpand);
  }
}

// ---- From lanes --------------------------------------------------------------------------------

/// Where word `i` of vector `vector` of a block comes from when the words of its 3-byte pixels,
/// three from each part, follow each other through the memory of the block.
constexpr size_t packedWord(size_t vector, size_t i, size_t words) {
  const size_t used = words / 4 * 3;
  const size_t at = (i + 4 * words - vector * used) % words;
  return at < used ? at / 3 * 4 + at % 3 : 3;
}
template <class D> constexpr WordOrder<D> closeTriples(size_t vector) {
  WordOrder<D> words{};
  for (size_t i = 0; i < words.size(); ++i)
    words[i] = static_cast<int32>(packedWord(vector, i, words.size()));
  return words;
}

/// The low three bytes of a part's four pixels as its first three words; `rotated` (by the vector
/// of a block) where a part is the whole vector.
constexpr BytesOfPart shrinkTriples(size_t vector) {
  BytesOfPart bytes{};
  for (size_t i = 0; i < bytes.size(); ++i) {
    const size_t from = packedWord(vector, i / 4, 4) * 4 + i % 4;
    bytes[i] = from < 12 ? static_cast<uint8>(from / 3 * 4 + from % 3) : kNoByte;
  }
  return bytes;
}

/// The low three bytes of 32-bit lanes, one after the other: in the first three quarters of the
/// vector, or where they lie in the memory of a block as its vector kVector.
template <size_t kVector = 0, class D> HWY_INLINE hn::Vec<D> gatherTriples(D d, hn::Vec<D> pixels) {
  if constexpr (kLanes<D> == 4) {
    static constexpr BytesOfPart kShrink = shrinkTriples(kVector);
    return chooseBytes(d, pixels, kShrink);
  } else {
    static constexpr BytesOfPart kShrink = shrinkTriples(0);
    static constexpr WordOrder<D> kClose = closeTriples<D>(kVector);
    return chooseWords(d, chooseBytes(d, pixels, kShrink), kClose);
  }
}

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif

#endif
