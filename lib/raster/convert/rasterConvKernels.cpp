// SPDX-License-Identifier: MIT
//
// The row loops of format conversion, one for each pair of a source and a destination format.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/convert/rasterConvKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <type_traits>
#include <utility>

#include "colorTable-inl.h"
#include "pixelLanes-inl.h"
#include "rasterConvInternal.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// The source that looks its pixels up in a palette.
struct Palette {
  static constexpr unsigned kBytes = 1;
};

/// What converted colours have in the bits outside the channels: they are opaque.
template <class To> inline constexpr uint32 kOpaque = To::kBytes == 4 ? 0xFF000000 : 0;

template <class From, class To>
uint32 loadConverted(const uint8* at, [[maybe_unused]] const uint8* palette) {
  if constexpr (std::is_same_v<From, Palette>) {
    const uint32 color = loadPixel<4>(entryAt(palette, *at));
    return kSameFields<Code32, To> ? color : convertColor<Code32, To>(color);
  } else {
    return convertColor<From, To>(loadPixel<From::kBytes>(at)) | kOpaque<To>;
  }
}

/// Pixel after pixel.
template <class From, class To> void convertRowsPlainly(const RowPair& rows, const uint8* palette) {
  const size_t pixels = rows.bytes / To::kBytes;
  uint8* HWY_RESTRICT dst = rows.dst;
  const uint8* HWY_RESTRICT src = rows.src;
  for (uint32 y = rows.rows; y != 0; --y) {
    for (size_t x = 0; x < pixels; ++x)
      storePixel<To::kBytes>(dst + x * To::kBytes,
                             loadConverted<From, To>(src + x * From::kBytes, palette));
    dst = nextRow(dst, rows.dstStep);
    src = nextRow(src, rows.srcStep);
  }
}

/// The least number of pixels that make up for converting a palette.
constexpr size_t kMinPixelsForTable = 256;

template <class To> void convertRowsByTable(const RowPair& rows, const uint8* palette) {
  ColorTable<To> table(palette);
  const size_t pixels = rows.bytes / To::kBytes;
  forRows(rows, [&](uint8* dst, const uint8* src) HWY_ATTR { table.convertRow(dst, src, pixels); });
}

#if HWY_TARGET == HWY_SCALAR

template <class From, class To> void convertRows(const RowPair& rows, const uint8* palette) {
  if constexpr (std::is_same_v<From, Palette> && ColorTable<To>::kPays) {
    const size_t pixels = rows.bytes / To::kBytes;
    if (pixels * rows.rows >= kMinPixelsForTable) return convertRowsByTable<To>(rows, palette);
  }
  convertRowsPlainly<From, To>(rows, palette);
}

#else

/// The palette's entries for four indices. They are loaded one by one, which takes no longer than
/// the instructions that gather them.
HWY_INLINE hn::Vec<Quad> loadEntries(const uint8* src, const uint8* palette) {
  const Quad d;
  const auto entry = [&](uint32 index) HWY_ATTR {
    return hn::Vec<Quad>{loadLanes(hn::CappedTag<uint32, 1>(), entryAt(palette, index & 0xFF)).raw};
  };
  const uint32 indices = loadPixel<4>(src);
  const auto low = hn::InterleaveLower(d, entry(indices), entry(indices >> 8));
  const auto high = hn::InterleaveLower(d, entry(indices >> 16), entry(indices >> 24));
  return hn::ConcatLowerLower(d, high, low);
}

/// Loads four pixels in the format To.
template <class From, class To>
HWY_INLINE hn::Vec<Quad> loadConvertedQuad(const uint8* src,
                                           [[maybe_unused]] const uint8* palette) {
  const Quad d;
  if constexpr (std::is_same_v<From, Palette>) {
    const auto colors = loadEntries(src, palette);
    if constexpr (kSameFields<Code32, To>) return colors;
    return convertLanes<Code32, To>(d, colors);
  } else {
    auto pixels = loadQuad<From::kBytes>(src);
    if constexpr (!kSameFields<From, To>) pixels = convertLanes<From, To>(d, pixels);
    if constexpr (kOpaque<To> != 0) pixels = hn::Or(pixels, hn::Set(d, kOpaque<To>));
    return pixels;
  }
}

/// Loads a block in the format To.
template <class From, class To, class D>
HWY_INLINE Block<D> loadConvertedBlock(D d, const uint8* src, const uint8* palette) {
  if constexpr (std::is_same_v<From, Palette>) {
    Block<D> block;
    for (auto& lanes : block.v) {
      lanes = loadConvertedQuad<Palette, To>(src, palette);
      src += 4;
    }
    return block;
  } else if constexpr (From::kBytes == 2 && To::kBytes >= 3) {
    static_assert(kSameFields<To, Code32>, "16-bit pixels are widened to codes 24 and 32 only");
    return loadWidened<From>(d, src);
  } else {
    Block<D> block = loadBlock<From::kBytes>(d, src);
    for (auto& lanes : block.v) {
      if constexpr (!kSameFields<From, To>) lanes = convertLanes<From, To>(d, lanes);
      if constexpr (kOpaque<To> != 0) lanes = hn::Or(lanes, hn::Set(d, kOpaque<To>));
    }
    return block;
  }
}

template <class From, class To, bool kStreams = false, class D>
HWY_INLINE void convertBlock(D d, uint8* dst, const uint8* src, const uint8* palette = nullptr) {
  storeBlock<To::kBytes, kStreams>(d, loadConvertedBlock<From, To>(d, src, palette), dst);
}

/// Rows that are shorter than any block: four pixels after four; the last four end with the row and
/// may do some pixels again.
template <class From, class To> void convertRowsByQuads(const RowPair& rows, const uint8* palette) {
  constexpr size_t kPixels = kLanes<Quad>;
  const size_t pixels = rows.bytes / To::kBytes;
  if (pixels < kPixels) return convertRowsPlainly<From, To>(rows, palette);
  const size_t last = pixels - kPixels;
  const auto convertQuad = [palette](uint8* dst, const uint8* src, size_t x) HWY_ATTR {
    storeQuad<To::kBytes>(loadConvertedQuad<From, To>(src + x * From::kBytes, palette),
                          dst + x * To::kBytes);
  };
  forRows(rows, [&](uint8* dst, const uint8* src) HWY_ATTR {
    for (size_t x = 0; x < last; x += kPixels) convertQuad(dst, src, x);
    convertQuad(dst, src, last);
  });
}

/// Block after block; the last one ends with the row and may do some pixels again. Rows that are
/// shorter than a block take smaller ones.
template <class From, class To, class D>
void convertRowsByBlocks(D d, const RowPair& rows, const uint8* palette) {
  constexpr size_t kPixels = kBlockPixels<D>;
  const size_t pixels = rows.bytes / To::kBytes;
  if (pixels < kPixels) {
    if constexpr (kPixels > 16) {
      convertRowsByBlocks<From, To>(hn::Half<D>(), rows, palette);
    } else {
      convertRowsByQuads<From, To>(rows, palette);
    }
    return;
  }
  const size_t last = pixels - kPixels;
  // Not through forRows: the constants of a conversion would be made for every row.
  uint8* dst = rows.dst;
  const uint8* src = rows.src;
  for (uint32 y = rows.rows; y != 0; --y) {
    for (size_t x = 0; x < last; x += kPixels)
      convertBlock<From, To>(d, dst + x * To::kBytes, src + x * From::kBytes, palette);
    convertBlock<From, To>(d, dst + last * To::kBytes, src + last * From::kBytes, palette);
    dst = nextRow(dst, rows.dstStep);
    src = nextRow(src, rows.srcStep);
  }
}

/// How many pixels after `at`, at least one, is an address that is a multiple of kAlignment, a
/// power of two. `at` is a multiple of the pixel size where that is a power of two.
template <unsigned kBytes, size_t kAlignment> HWY_INLINE size_t pixelsToAlignment(const uint8* at) {
  constexpr size_t kThird = 43;  // times 3 it is 1, modulo the alignment
  static_assert(kThird * 3 % kAlignment == 1);
  const size_t missing = 0 - reinterpret_cast<uintptr_t>(at);
  if constexpr (kBytes == 3) {
    return (missing * kThird - 1) % kAlignment + 1;
  } else {
    return (missing - kBytes) % kAlignment / kBytes + 1;
  }
}

/// Rows of some blocks, stored past the caches: the first block and the last one, which are not,
/// may do some pixels again.
template <class From, class To, class D> void streamRowsByBlocks(D d, const RowPair& rows) {
  constexpr size_t kPixels = kBlockPixels<D>;
  const size_t last = rows.bytes / To::kBytes - kPixels;
  uint8* dst = rows.dst;
  const uint8* src = rows.src;
  for (uint32 y = rows.rows; y != 0; --y) {
    convertBlock<From, To>(d, dst, src);
    for (size_t x = pixelsToAlignment<To::kBytes, kPixels>(dst); x < last; x += kPixels)
      convertBlock<From, To, true>(d, dst + x * To::kBytes, src + x * From::kBytes);
    convertBlock<From, To>(d, dst + last * To::kBytes, src + last * From::kBytes);
    dst = nextRow(dst, rows.dstStep);
    src = nextRow(src, rows.srcStep);
  }
  endStreams();
}

/// Whether rows go past the caches. Pixels that do not lie at multiples of their size never meet a
/// vector's boundary; their steps are such multiples (rowStep).
template <class From, class To> HWY_INLINE bool areStreamed(const RowPair& rows) {
  constexpr size_t kPart = To::kBytes == 3 ? 1 : To::kBytes;
  return isStreamed(rows.bytes, rows.bytes / To::kBytes * (From::kBytes + To::kBytes), rows.rows) &&
         reinterpret_cast<uintptr_t>(rows.dst) % kPart == 0;
}

/// Rows of palette indices: large ones through a table where vectors hold it.
template <class To> void convertPaletteRows(const RowPair& rows, const uint8* palette) {
#if HWY_TARGET == HWY_AVX3
  const size_t pixels = rows.bytes / To::kBytes;
  if (pixels >= ColorTable<To>::kMinRow && pixels * rows.rows >= kMinPixelsForTable)
    return convertRowsByTable<To>(rows, palette);
#endif
  convertRowsByBlocks<Palette, To>(hn::CappedTag<uint32, 4>(), rows, palette);
}

template <class From, class To> void convertRows(const RowPair& rows, const uint8* palette) {
  if constexpr (std::is_same_v<From, Palette>) {
    convertPaletteRows<To>(rows, palette);
  } else {
    constexpr bool kShort = From::kBytes <= 2 && To::kBytes <= 2;
    // Between 3 and 4 bytes a pixel there is nothing to compute, and half a cache line at a time
    // was measured to be faster than a whole one.
    constexpr size_t kMaxLanes = From::kBytes + To::kBytes == 7 ? 8 : 64;
    using Lane = std::conditional_t<kShort, uint16, uint32>;
    const hn::CappedTag<Lane, kMaxLanes> d;
    if constexpr (To::kBytes > 1) {
      if (areStreamed<From, To>(rows)) return streamRowsByBlocks<From, To>(d, rows);
    }
    convertRowsByBlocks<From, To>(d, rows, palette);
  }
}

#endif

template <class From, class To> constexpr ConvertKernel kernel() {
  if constexpr (std::is_same_v<From, To>) {
    return nullptr;
  } else {
    return convertRows<From, To>;
  }
}
template <class From, size_t... kTo>
constexpr ConvertKernelsFrom kernelsFrom(std::index_sequence<kTo...>) {
  return {kernel<From, std::tuple_element_t<kTo, DestinationFormats>>()...};
}
template <class From> constexpr ConvertKernelsFrom kernelsFrom() {
  return kernelsFrom<From>(std::make_index_sequence<std::tuple_size_v<DestinationFormats>>());
}
template <size_t... kFrom> constexpr ConvertKernels allKernels(std::index_sequence<kFrom...>) {
  return {kernelsFrom<std::tuple_element_t<kFrom, SourceFormats>>()..., kernelsFrom<Palette>()};
}
constexpr ConvertKernels kKernels = allKernels(std::make_index_sequence<kPaletteSource>());

}  // namespace

const ConvertKernels* convertKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(convertKernels);

}  // namespace

const ConvertKernels* lookUpConvert() { return HWY_DYNAMIC_DISPATCH(convertKernels)(); }

}  // namespace raster

#endif
