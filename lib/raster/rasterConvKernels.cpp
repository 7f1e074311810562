// SPDX-License-Identifier: MIT
//
// The row loops of format conversion, one for each pair of a source and a destination format.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasterConvKernels.cpp"
#include "hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <type_traits>
#include <utility>

#include "rasterConvInternal.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// The source that looks its pixels up in a palette.
struct Palette {
  static constexpr unsigned kBytes = 1;
};

constexpr uint32 kOpaque = 0xFF000000;

template <class From, class To> uint32 loadConverted(const uint8* at, const uint8* palette) {
  if constexpr (std::is_same_v<From, Palette>) {
    const uint32 color = loadPixel<4>(entryAt(palette, *at));
    return std::is_same_v<To, Code32> ? color : convertColor<Code32, To>(color);
  } else {
    const uint32 color = convertColor<From, To>(loadPixel<From::kBytes>(at));
    return std::is_same_v<To, Code32> ? color | kOpaque : color;
  }
}

template <class From, class To> void convertRows(const ConvertJob& job) {
  uint8* dst = job.dst;
  const uint8* src = job.src;
  for (uint32 y = 0; y < job.height; ++y) {
    for (size_t x = 0; x < job.pixels; ++x)
      storePixel<To::kBytes>(dst + x * To::kBytes,
                             loadConverted<From, To>(src + x * From::kBytes, job.palette));
    dst = nextRow(dst, job.dstStep);
    src = nextRow(src, job.srcStep);
  }
}

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

const ConvertKernels* levelConvertKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "kernelChoice.h"

namespace raster {
namespace {

HWY_EXPORT(levelConvertKernels);

const ConvertKernels* lookUpKernels() { return HWY_DYNAMIC_DISPATCH(levelConvertKernels)(); }

}  // namespace

const ConvertKernels& convertKernels() { return chosenKernels<lookUpKernels>(); }

}  // namespace raster

#endif
