// SPDX-License-Identifier: MIT
//
// Rows of palette indices to pixels, through a table of the palette's colours in the format of the
// destination. Included once per instruction set, after Highway.
//
// Nobody says how long a palette is, only that the indices are inside it. So the table is made for
// the indices that have been met: up to the highest one.

#if defined(RASTER_COLOR_TABLE_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_COLOR_TABLE_INL_H
#undef RASTER_COLOR_TABLE_INL_H
#else
#define RASTER_COLOR_TABLE_INL_H
#endif

#include <algorithm>
#include <cstddef>

#include "hwy/highway.h"
#include "pixelLanes-inl.h"
#include "rasterConvInternal.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// The colours of a palette as pixels of the format To.
template <class To> class ColorTable {
 public:
  /// Pixels of 3 and 4 bytes are held as two tables of their halves.
  static constexpr size_t kHalves = To::kBytes <= 2 ? 1 : 2;

#if HWY_TARGET == HWY_AVX3
  using Lanes = hn::ScalableTag<std::conditional_t<kHalves == 1, uint16, uint32>>;
  using Halves = hn::ScalableTag<uint16>;
  static constexpr size_t kMinRow = kBlockPixels<Lanes>;
#else
  /// Without vectors that hold the table, palette entries that need no conversion are best read
  /// where they are.
  static constexpr bool kPays = kHalves == 1;
#endif

  /// `palette` is the bytes of the palette's entries.
  explicit ColorTable(const uint8* palette) : palette_(palette) {}

  /// Converts a row of at least kMinRow pixels.
  void convertRow(uint8* dst, const uint8* src, size_t pixels) {
    // So short that the indices are still near when they are read a second time.
    constexpr size_t kStretch = 4096;
    for (size_t first = 0; first < pixels;) {
      const size_t end = first + std::min(kStretch, pixels - first);
      if (known_ < kEntries) know(highest(src + first, end - first) + 1);
      lookUp(dst, src, first, end);
      first = end;
    }
  }

 private:
  static constexpr size_t kEntries = 256;

  static size_t highest(const uint8* indices, size_t count) {
    uint8 result = 0;
    for (size_t i = 0; i < count; ++i) result = std::max(result, indices[i]);
    return result;
  }

  /// Makes the entries below `count`.
  void know(size_t count) {
    const uint8* const palette = palette_;
    for (size_t i = known_; i < count; ++i) {
      const uint32 color = loadPixel<4>(palette + i * sizeof(uint32));
      const uint32 pixel = kSameFields<Code32, To> ? color : convertColor<Code32, To>(color);
      halves_[0][i] = static_cast<uint16>(pixel);
      if constexpr (kHalves == 2) halves_[1][i] = static_cast<uint16>(pixel >> 16);
    }
    known_ = std::max(known_, count);
  }

#if HWY_TARGET == HWY_AVX3

  /// The whole table of one half in eight vectors.
  struct Vectors {
    hn::Vec<Halves> v[kEntries / kLanes<Halves>];

    hn::Vec<Halves> pair(size_t i, hn::Vec<Halves> indices) const {
      return {_mm512_permutex2var_epi16(v[2 * i].raw, indices.raw, v[2 * i + 1].raw)};
    }
    HWY_INLINE hn::Vec<Halves> at(hn::Vec<Halves> indices) const {
      const Halves d;
      const auto bit6 = hn::TestBit(indices, hn::Set(d, 64));
      const auto bit7 = hn::TestBit(indices, hn::Set(d, 128));
      return hn::IfThenElse(bit7, hn::IfThenElse(bit6, pair(3, indices), pair(2, indices)),
                            hn::IfThenElse(bit6, pair(1, indices), pair(0, indices)));
    }
  };

  HWY_INLINE Vectors vectorsOf(size_t half) const {
    Vectors vectors;
    for (size_t i = 0; i < kEntries / kLanes<Halves>; ++i)
      vectors.v[i] = hn::Load(Halves(), halves_[half] + i * kLanes<Halves>);
    return vectors;
  }

  /// The block of pixels at `src`.
  static HWY_INLINE Block<Lanes> loadBlockOf(const uint8* src, const Vectors& low,
                                             const Vectors& high) {
    Block<Lanes> block;
    for (size_t i = 0; i < 2; ++i) {
      const auto indices =
          hn::PromoteTo(Halves(), loadLanes(hn::Rebind<uint8, Halves>(), src + i * kLanes<Halves>));
      if constexpr (kHalves == 1) {
        block.v[i] = low.at(indices);
      } else {
        const auto ordered = inOrderForInterleaving(Halves(), indices);
        interleaveHalves(Lanes(), low.at(ordered), high.at(ordered), block.v + 2 * i);
      }
    }
    return block;
  }

  void lookUp(uint8* dst, const uint8* src, size_t first, size_t end) const {
    const Vectors low = vectorsOf(0);
    const Vectors high = vectorsOf(kHalves - 1);
    const auto block = [&](size_t x) HWY_ATTR {
      storeBlock<To::kBytes>(Lanes(), loadBlockOf(src + x, low, high), dst + x * To::kBytes);
    };
    for (; end - first >= kMinRow; first += kMinRow) block(first);
    if (first != end) block(end - kMinRow);
  }

#else

  void lookUp(uint8* HWY_RESTRICT dst, const uint8* HWY_RESTRICT src, size_t first,
              size_t end) const {
    for (size_t x = first; x < end; ++x)
      storePixel<To::kBytes>(dst + x * To::kBytes, halves_[0][src[x]]);
  }

#endif

  const uint8* palette_;
  size_t known_ = 0;
  alignas(64) uint16 halves_[kHalves][kEntries];
};

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
