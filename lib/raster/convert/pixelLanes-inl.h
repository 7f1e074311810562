// SPDX-License-Identifier: MIT
//
// Pixels in vector lanes: loading and storing blocks of every pixel size. Included once per
// instruction set, after Highway.
//
// A block is as many pixels as a vector has bytes. It lies in four vectors of 32-bit lanes or two
// of 16-bit lanes, a pixel to a lane, and in memory it is one to four whole vectors: so a block is
// read and written without touching a byte beside it.

#if defined(RASTER_PIXEL_LANES_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_PIXEL_LANES_INL_H
#undef RASTER_PIXEL_LANES_INL_H
#else
#define RASTER_PIXEL_LANES_INL_H
#endif

#include <array>
#include <cstddef>

#include "hwy/highway.h"
#include "frame/pixelFormat.h"
#include "vector/fields-inl.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"
#include "vector/triples-inl.h"

#if HWY_TARGET != HWY_SCALAR

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// The pixels of a block.
template <class D> inline constexpr size_t kBlockPixels = kLanes<D> * sizeof(hn::TFromD<D>);

/// A block in lanes.
template <class D> struct Block {
  static constexpr size_t kVectors = sizeof(hn::TFromD<D>);
  hn::Vec<D> v[kVectors];
};

// ---- Three bytes a pixel -----------------------------------------------------------------------

template <class D> HWY_INLINE Block<D> loadTripleBlock(D d, const uint8* at) {
  constexpr size_t kLoaded = kLanes<D> * 4;
  constexpr size_t kUsed = kLanes<D> * 3;
  // The last vector ends where the block ends.
  return {{spreadTriples(d, loadLanes(d, at)), spreadTriples(d, loadLanes(d, at + kUsed)),
           spreadTriples(d, loadLanes(d, at + 2 * kUsed)),
           spreadTriples<kLoaded - kUsed>(d, loadLanes(d, at + 4 * kUsed - kLoaded))}};
}

/// Four vectors, three quarters of each in use, become three.
template <bool kStreams, class D>
HWY_INLINE void storeTripleBlock(D d, const Block<D>& block, uint8* at) {
  constexpr size_t kBytes = kLanes<D> * 4;
  const auto v0 = gatherTriples<0>(d, block.v[0]);
  const auto v1 = gatherTriples<1>(d, block.v[1]);
  const auto v2 = gatherTriples<2>(d, block.v[2]);
  const auto v3 = gatherTriples<3>(d, block.v[3]);
  putLanes<kStreams>(d, hn::IfThenElse(hn::FirstN(d, kLanes<D> / 4 * 3), v0, v1), at);
  putLanes<kStreams>(d, hn::IfThenElse(hn::FirstN(d, kLanes<D> / 2), v1, v2), at + kBytes);
  putLanes<kStreams>(d, hn::IfThenElse(hn::FirstN(d, kLanes<D> / 4), v2, v3), at + 2 * kBytes);
}

// ---- Narrow lanes ------------------------------------------------------------------------------

constexpr BytesOfPart evenThenOddBytes() {
  BytesOfPart bytes{};
  for (size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<uint8>(i % 8 * 2 + i / 8);
  return bytes;
}

/// Puts parts that each hold kVectors runs of bytes, one from each vector of a block, into the
/// order of the block.
template <class D, size_t kVectors> constexpr WordOrder<D> unzipParts() {
  WordOrder<D> words{};
  constexpr size_t kRun = 4 / kVectors;
  const size_t parts = words.size() / 4;
  for (size_t i = 0; i < words.size(); ++i) {
    const size_t run = i / kRun;
    words[i] = static_cast<int32>(run % parts * 4 + run / parts * kRun + i % kRun);
  }
  return words;
}

/// Stores the low bytes of 16-bit lanes: the even bytes of `zipped` are those of the first part of
/// a block, the odd ones those of the second.
template <size_t kVectors, class D> HWY_INLINE void storeZipped(D d, hn::Vec<D> zipped, uint8* at) {
  static constexpr BytesOfPart kUnzip = evenThenOddBytes();
  auto bytes = chooseBytes(d, zipped, kUnzip);
  if constexpr (kLanes<D> >= 16) {
    static constexpr WordOrder<D> kOrder = unzipParts<D, kVectors>();
    bytes = chooseWords(d, bytes, kOrder);
  }
  storeLanes(d, bytes, at);
}

/// Stores lanes below 256 as bytes.
template <class D> HWY_INLINE void storeByteBlock(D d, const Block<D>& block, uint8* at) {
  if constexpr (Block<D>::kVectors == 2) {
    storeZipped<2>(d, hn::Or(block.v[0], hn::ShiftLeft<8>(block.v[1])), at);
  } else {
    const hn::RebindToSigned<D> dSigned;
    const hn::Repartition<int16, D> dHalves;
    const hn::Repartition<uint16, D> d16;
    const auto halves = [&](auto a, auto b) HWY_ATTR {
      return hn::BitCast(
          d16, hn::ReorderDemote2To(dHalves, hn::BitCast(dSigned, a), hn::BitCast(dSigned, b)));
    };
    const auto low = halves(block.v[0], block.v[1]);
    const auto high = halves(block.v[2], block.v[3]);
    storeZipped<4>(d16, hn::Or(low, hn::ShiftLeft<8>(high)), at);
  }
}

/// Stores lanes below 65536 as halves.
template <bool kStreams, class D>
HWY_INLINE void storeHalfBlock(D /*d*/, const Block<D>& block, uint8* at) {
  const hn::Repartition<uint16, D> d16;
  for (size_t i = 0; i < 2; ++i) {
    const auto low = block.v[2 * i];
    const auto high = block.v[2 * i + 1];
#if HWY_TARGET == HWY_SSE4
    // ConcatEven would clear the upper halves first.
    const hn::Vec<decltype(d16)> halves{_mm_packus_epi32(low.raw, high.raw)};
#else
    const auto halves = hn::ConcatEven(d16, hn::BitCast(d16, high), hn::BitCast(d16, low));
#endif
    putLanes<kStreams>(d16, halves, at + i * kBlockPixels<D>);
  }
}

// ---- Wide channels -----------------------------------------------------------------------------

/// The order of quarters that makes the lower and upper halves of a vector's parts, when
/// interleaved with others of this order, the first and the second half of the result.
template <class D> constexpr WordOrder<D> orderForInterleaving() {
  WordOrder<D> words{};
  const size_t parts = words.size() / 4;
  for (size_t i = 0; i < words.size(); ++i)
    words[i] = static_cast<int32>((i / 4 + i / 2 % 2 * parts) * 2 + i % 2);
  return words;
}
template <class D16> HWY_INLINE hn::Vec<D16> inOrderForInterleaving(D16 d16, hn::Vec<D16> v) {
  if constexpr (kLanes<D16> == 8) {
    return v;
  } else {
    static constexpr WordOrder<D16> kOrder = orderForInterleaving<D16>();
    return chooseWords(d16, v, kOrder);
  }
}

/// Two vectors of a block from the halves of their lanes, which are in the order above.
template <class D, class V16>
HWY_INLINE void interleaveHalves(D d, V16 low, V16 high, hn::Vec<D>* vectors) {
  const hn::Repartition<uint16, D> d16;
  vectors[0] = hn::BitCast(d, hn::InterleaveLower(d16, low, high));
  vectors[1] = hn::BitCast(d, hn::InterleaveUpper(d16, low, high));
}

/// A block of opaque code 32 from 16-bit pixels.
template <class From, class D> HWY_INLINE Block<D> loadWidened(D d, const uint8* at) {
  const hn::Repartition<uint16, D> d16;
  Block<D> block;
  for (size_t i = 0; i < 2; ++i) {
    const auto pixels = inOrderForInterleaving(d16, loadLanes(d16, at + i * kBlockPixels<D>));
    const auto red = widenChannel<typename From::Red>(d16, pixels);
    const auto green = widenChannel<typename From::Green>(d16, pixels);
    const auto blue = widenChannel<typename From::Blue>(d16, pixels);
    interleaveHalves(d, hn::Or(blue, hn::ShiftLeft<8>(green)), hn::Or(red, setMask(d16, 0xFF00)),
                     block.v + 2 * i);
  }
  return block;
}

// ---- Blocks of any pixel size ------------------------------------------------------------------

template <unsigned kBytes, class D> HWY_INLINE Block<D> loadBlock(D d, const uint8* at) {
  static_assert(kBytes >= 2 && kBytes <= 4, "no source has pixels of another size");
  if constexpr (kBytes == 3) {
    return loadTripleBlock(d, at);
  } else {
    Block<D> block;
    for (size_t i = 0; i < Block<D>::kVectors; ++i) {
      const uint8* const from = at + i * kLanes<D> * kBytes;
      if constexpr (kBytes == sizeof(hn::TFromD<D>)) {
        block.v[i] = loadLanes(d, from);
      } else {
        const hn::Rebind<uint16, D> dHalf;
        block.v[i] = hn::PromoteTo(d, loadLanes(dHalf, from));
      }
    }
    return block;
  }
}

/// With kStreams as putLanes does; pixels of one byte have no such way.
template <unsigned kBytes, bool kStreams = false, class D>
HWY_INLINE void storeBlock(D d, const Block<D>& block, uint8* at) {
  if constexpr (kBytes == sizeof(hn::TFromD<D>)) {
    for (size_t i = 0; i < Block<D>::kVectors; ++i)
      putLanes<kStreams>(d, block.v[i], at + i * kBlockPixels<D>);
  } else if constexpr (kBytes == 3) {
    storeTripleBlock<kStreams>(d, block, at);
  } else if constexpr (kBytes == 2) {
    storeHalfBlock<kStreams>(d, block, at);
  } else {
    static_assert(!kStreams);
    storeByteBlock(d, block, at);
  }
}

// ---- Four pixels -------------------------------------------------------------------------------

/// For rows that are shorter than any block.
using Quad = hn::CappedTag<uint32, 4>;

/// Four pixels in 32-bit lanes; the bits above the pixel's are 0.
template <unsigned kBytes> HWY_INLINE hn::Vec<Quad> loadQuad(const uint8* at) {
  const Quad d;
  static_assert(kBytes >= 2 && kBytes <= 4, "no source has pixels of another size");
  if constexpr (kBytes == 4) {
    return loadLanes(d, at);
  } else if constexpr (kBytes == 3) {
    const auto words = hn::ZeroExtendVector(d, loadLanes(hn::Half<Quad>(), at));
    const auto last = hn::ZeroExtendVector(
        d, hn::ZeroExtendVector(hn::Half<Quad>(), loadLanes(hn::CappedTag<uint32, 1>(), at + 8)));
    return spreadTriples(d, hn::Or(words, hn::ShiftLeftBytes<8>(d, last)));
  } else {
    return hn::PromoteTo(d, loadLanes(hn::Rebind<uint16, Quad>(), at));
  }
}

/// Stores the low bytes of four lanes; of pixels that are narrower than three bytes the rest is 0.
template <unsigned kBytes> HWY_INLINE void storeQuad(hn::Vec<Quad> pixels, uint8* at) {
  const Quad d;
  if constexpr (kBytes == 4) {
    storeLanes(d, pixels, at);
  } else if constexpr (kBytes == 3) {
    const auto packed = gatherTriples(d, pixels);
    storeLanes(hn::Half<Quad>(), hn::LowerHalf(packed), at);
    storePixel<4>(at + 8, hn::ExtractLane(packed, 2));
  } else if constexpr (kBytes == 2) {
    const hn::Rebind<uint16, Quad> dNarrow;
    storeLanes(dNarrow, hn::TruncateTo(dNarrow, pixels), at);
  } else {
    storePixel<4>(at, hn::GetLane(hn::BitCast(hn::CappedTag<uint32, 1>(),
                                              hn::TruncateTo(hn::Rebind<uint8, Quad>(), pixels))));
  }
}

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif

#endif
