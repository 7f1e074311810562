// SPDX-License-Identifier: MIT
//
// Expansion of bit planes to pixels: the kernels.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/plane/rasterBitsKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <algorithm>

#include "vector/pixelPattern-inl.h"
#include "plane/rasterBitsInternal.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// The first `count` pixels of a byte of the plane, each from its own bit, without a branch. Pixels
/// that a stencil leaves out are written elsewhere.
template <unsigned kBytes, bool kStencil>
HWY_INLINE void expandOneByOne(uint32 byte, uint8* dst, size_t count, const BitColors& colors) {
  uint8 elsewhere[kBytes];
  for (size_t x = 0; x < count; ++x) {
    const uint32 set = byte >> (7 - x) & 1;
    uint8* const at = dst + x * kBytes;
    if constexpr (kStencil) {
      const intptr_t away = reinterpret_cast<intptr_t>(at) - reinterpret_cast<intptr_t>(elsewhere);
      storePixel<kBytes>(nextRow(elsewhere, away & -static_cast<intptr_t>(set)), colors.foreground);
    } else {
      const uint32 all = 0 - set;
      storePixel<kBytes>(at, (colors.foreground & all) | (colors.background & ~all));
    }
  }
}

#if HWY_TARGET == HWY_SCALAR

template <unsigned kBytes, bool kStencil>
void expandRows(const Expansion& e, const BitColors& colors) {
  const uint8* bits = e.bits;
  uint8* dst = e.dst;
  for (uint32 y = e.height; y != 0;
       --y, bits = nextRow(bits, e.bitsPitch), dst = nextRow(dst, e.dstPitch)) {
    for (size_t x = 0; x < e.width; x += 8)
      expandOneByOne<kBytes, kStencil>(bits[x / 8], dst + x * kBytes,
                                       std::min(e.width - x, size_t{8}), colors);
  }
}

#else

using Bytes = hn::ScalableTag<uint8>;

/// For every four bits, the first pixel's the highest, the words of four pixels: all ones where a
/// pixel's bit is set.
template <unsigned kBytes> struct FourPixelMasks {
  uint32 word[16][kBytes];

  constexpr FourPixelMasks() : word() {
    for (uint32 bits = 0; bits < 16; ++bits) {
      for (uint32 i = 0; i < 4 * kBytes; ++i) {
        const uint32 set = bits >> (3 - i / kBytes) & 1;
        word[bits][i / 4] |= set * 0xFF << i % 4 * 8;
      }
    }
  }
};
template <unsigned kBytes> inline constexpr FourPixelMasks<kBytes> kFourPixelMasks;

/// The constant pixels of a call as the words of any four.
struct ColorWords {
  PixelWords foreground;
  PixelWords background;
};

/// Four pixels from the low four bits of `bits`. Those that a stencil leaves out are written back.
template <unsigned kBytes, bool kStencil>
HWY_INLINE void expandFour(uint32 bits, uint8* dst, const ColorWords& words) {
  if (kStencil && bits == 0) return;
  for (unsigned i = 0; i < kBytes; ++i) {
    uint8* const at = dst + 4 * i;
    const uint32 clear = kStencil ? loadPixel<4>(at) : words.background.word[i % 3];
    const uint32 difference = words.foreground.word[i % 3] ^ clear;
    storePixel<4>(at, clear ^ (difference & kFourPixelMasks<kBytes>.word[bits][i]));
  }
}

/// Less than eight pixels, from the first bit of a byte of the plane on.
template <unsigned kBytes, bool kStencil>
HWY_INLINE void expandFew(const uint8* bits, uint8* dst, size_t count, const BitColors& colors,
                          const ColorWords& words) {
  constexpr bool kMasked = kStencil && HWY_TARGET == HWY_AVX3;  // what is left out is not touched
  uint32 byte = *bits;
  if (!kMasked && count >= 4) {
    expandFour<kBytes, kStencil>(byte >> 4, dst, words);
    dst += size_t{4} * kBytes;
    byte <<= 4;
    count -= 4;
  }
  expandOneByOne<kBytes, kStencil>(byte, dst, count, colors);
}

/// For every byte of a run of pixels: which byte of the plane, and which bit there, decides on it.
template <unsigned kBytes> struct BitOfByte {
  uint8 byte[kBytes * kLanes<Bytes>];
  uint8 bit[kBytes * kLanes<Bytes>];

  constexpr BitOfByte() : byte(), bit() {
    for (size_t i = 0; i < sizeof byte; ++i) {
      byte[i] = static_cast<uint8>(i / kBytes / 8);
      bit[i] = static_cast<uint8>(0x80 >> i / kBytes % 8);
    }
  }
};
template <unsigned kBytes> inline constexpr BitOfByte<kBytes> kBitOfByte;

/// How much farther ahead masked stores fetch, which wait longer for their memory than loads do.
template <bool kStencil>
inline constexpr size_t kFartherBy = kStencil&& HWY_TARGET == HWY_AVX3 ? 3072 : 0;

/// The constant pixels of a call, in memory.
struct Patterns {
  PixelPattern foreground;
  PixelPattern background;
};

/// The bits for as many pixels as `d` has lanes, repeated over the vector. They are loaded at their
/// own width: put together in memory first, they would be waited for.
template <class D> HWY_INLINE hn::Vec<D> planeBits(D d, const uint8* bits) {
  using Unit = std::conditional_t<kLanes<D> == 8, uint8,
                                  std::conditional_t<kLanes<D> == 16, uint16, uint32>>;
  const hn::Repartition<Unit, D> units;
  const auto unitAt = [&](size_t i) HWY_ATTR {
    Unit unit;
    memcpy(&unit, bits + i * sizeof unit, sizeof unit);
    return hn::Set(units, unit);
  };
  if constexpr (kLanes<D> == 64)
    return hn::BitCast(d, hn::OddEven(unitAt(1), unitAt(0)));
  else
    return hn::BitCast(d, unitAt(0));
}

/// Whether the bits for kPixels pixels are all clear.
template <size_t kPixels> HWY_INLINE bool isClear(const uint8* bits) {
  constexpr size_t kBytes = kPixels / 8;
  using Unit = std::conditional_t<
      kBytes == 1, uint8,
      std::conditional_t<kBytes == 2, uint16, std::conditional_t<kBytes == 4, uint32, size_t>>>;
  Unit units[kBytes / sizeof(Unit)];
  memcpy(units, bits, sizeof units);
  Unit any = 0;
  for (const Unit unit : units) any |= unit;
  return any == 0;
}

/// Stores the bytes of `lanes` that `set` chooses. Where masks are to be had, the others are not
/// touched; elsewhere they are written back. (The masks of AVX2 take some processors longer than
/// all the rest.)
template <class D> HWY_INLINE void storeChosen(D d, hn::Mask<D> set, hn::Vec<D> lanes, uint8* at) {
#if HWY_TARGET == HWY_AVX3
  hn::BlendedStore(lanes, set, d, at);
#else
  hn::StoreU(hn::IfThenElse(set, lanes, hn::LoadU(d, at)), d, at);
#endif
}

/// Expands as many pixels as `d` has lanes, which takes kBytes vectors. `far` ones are fetched
/// ahead.
template <unsigned kBytes, bool kStencil, bool kFar, class D>
HWY_INLINE void expandGroup(D d, const uint8* bits, uint8* dst, const Patterns& patterns) {
  const auto everywhere = planeBits(d, bits);
  for (size_t i = 0; i < kBytes * kLanes<D>; i += kLanes<D>) {
    if (kFar && i % kCacheLine == 0) fetchAhead(dst + i + kFartherBy<kStencil>);
    const size_t ofPixel = kBytes == 3 ? i : 0;
    const size_t ofByte = kBytes == 3 ? i : i % (8 * kBytes);
    const auto bit = hn::LoadU(d, kBitOfByte<kBytes>.bit + ofByte);
    const auto byte = hn::TableLookupBytes(everywhere, hn::LoadU(d, kBitOfByte<kBytes>.byte + i));
    const auto set = hn::TestBit(byte, bit);
    const auto foreground = hn::LoadU(d, patterns.foreground.bytes + ofPixel);
    if constexpr (kStencil) {
      storeChosen(d, set, foreground, dst + i);
    } else {
      const auto background = hn::LoadU(d, patterns.background.bytes + ofPixel);
      hn::StoreU(hn::IfThenElse(set, foreground, background), d, dst + i);
    }
  }
}

/// Expands the pixels of a row from `x` on in groups of the lanes of `d` and then of smaller ones;
/// returns the first pixel that is left.
template <unsigned kBytes, bool kStencil, bool kFar, class D>
HWY_INLINE size_t expandGroups(D d, const uint8* bits, uint8* dst, size_t x, size_t width,
                               const Patterns& patterns) {
  for (; width - x >= kLanes<D>; x += kLanes<D>) {
    if (kStencil && isClear<kLanes<D>>(bits + x / 8)) continue;
    expandGroup<kBytes, kStencil, kFar>(d, bits + x / 8, dst + x * kBytes, patterns);
  }
  if constexpr (kLanes < D >> 8) {
    if (width - x >= 8)
      x = expandGroups<kBytes, kStencil, false>(hn::Half<D>(), bits, dst, x, width, patterns);
  }
  return x;
}

/// The pixels of a stencil that share one look at their bits: four vectors of them, or three of
/// pixels of three bytes.
template <unsigned kBytes> inline constexpr size_t kRun = kLanes<Bytes>*(4 / kBytes);

/// Expands whole runs of a stencil's row; returns the first pixel that is left.
template <unsigned kBytes, bool kFar>
HWY_INLINE size_t expandRuns(const uint8* bits, uint8* dst, size_t width,
                             const Patterns& patterns) {
  size_t x = 0;
  for (; width - x >= kRun<kBytes>; x += kRun<kBytes>) {
    if (isClear<kRun<kBytes>>(bits + x / 8)) continue;
    for (size_t i = x; i < x + kRun<kBytes>; i += kLanes<Bytes>)
      expandGroup<kBytes, true, kFar>(Bytes(), bits + i / 8, dst + i * kBytes, patterns);
  }
  return x;
}

template <unsigned kBytes, bool kStencil, bool kRuns, bool kFar>
HWY_INLINE void expandRowsFrom(const Expansion& e, const BitColors& colors) {
  const Patterns patterns = {patternOf(repeatPixel(colors.foreground, kBytes)),
                             patternOf(repeatPixel(colors.background, kBytes))};
  const uint8* bits = e.bits;
  uint8* dst = e.dst;
  for (uint32 y = e.height; y != 0;
       --y, bits = nextRow(bits, e.bitsPitch), dst = nextRow(dst, e.dstPitch)) {
    size_t x = 0;
    if constexpr (kRuns) x = expandRuns<kBytes, kFar>(bits, dst, e.width, patterns);
    x = expandGroups<kBytes, kStencil, kFar>(Bytes(), bits, dst, x, e.width, patterns);
    if (x != e.width)
      expandOneByOne<kBytes, kStencil>(bits[x / 8], dst + x * kBytes, e.width - x, colors);
  }
}

/// Rows of less than eight pixels have no use for vectors.
template <unsigned kBytes, bool kStencil>
HWY_NOINLINE void expandNarrowRows(const Expansion& e, const BitColors& colors) {
  const ColorWords words = {repeatPixel(colors.foreground, kBytes),
                            repeatPixel(colors.background, kBytes)};
  const BitColors pixels = colors;  // read here, as a store to a pixel might change it
  const size_t width = e.width;
  const uint8* bits = e.bits;
  uint8* dst = e.dst;
  for (uint32 y = e.height; y != 0;
       --y, bits = nextRow(bits, e.bitsPitch), dst = nextRow(dst, e.dstPitch))
    expandFew<kBytes, kStencil>(bits, dst, width, pixels, words);
}

/// Not in line, so that it takes no registers from the rows that are too short for it.
template <unsigned kBytes, bool kFar>
HWY_NOINLINE void expandRowsByRuns(const Expansion& e, const BitColors& colors) {
  expandRowsFrom<kBytes, true, true, kFar>(e, colors);
}

template <unsigned kBytes, bool kStencil>
void expandRows(const Expansion& e, const BitColors& colors) {
  if (e.width < 8) return expandNarrowRows<kBytes, kStencil>(e, colors);
  // Pixels of one byte come slowly enough as it is, but where only a masked store touches them.
  constexpr bool kMayBeFar = kBytes > 1 || (kStencil && HWY_TARGET == HWY_AVX3);
  const bool far = kMayBeFar && isFar(e.width * kBytes, e.height);
  if constexpr (kStencil && kBytes <= 2) {  // of larger pixels, a group is a run
    if (e.width >= kRun<kBytes>) {
      const auto expandByRuns =
          far ? expandRowsByRuns<kBytes, kMayBeFar> : expandRowsByRuns<kBytes, false>;
      expandByRuns(e, colors);
      return;
    }
  } else if (far) {
    expandRowsFrom<kBytes, kStencil, false, kMayBeFar>(e, colors);
    return;
  }
  expandRowsFrom<kBytes, kStencil, false, false>(e, colors);
}

#endif

constexpr BitsKernels kKernels = {
    {expandRows<1, false>, expandRows<2, false>, expandRows<3, false>, expandRows<4, false>},
    {expandRows<1, true>, expandRows<2, true>, expandRows<3, true>, expandRows<4, true>}};

}  // namespace

const BitsKernels* bitsKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(bitsKernels);

}  // namespace

const BitsKernels* lookUpBits() { return HWY_DYNAMIC_DISPATCH(bitsKernels)(); }

}  // namespace raster

#endif
