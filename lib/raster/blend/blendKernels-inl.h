// SPDX-License-Identifier: MIT
//
// The one blend loop, and the table of its instances for a format. Included once per instruction
// set.

#if defined(RASTER_BLEND_KERNELS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_KERNELS_INL_H
#undef RASTER_BLEND_KERNELS_INL_H
#else
#define RASTER_BLEND_KERNELS_INL_H
#endif

#include <utility>

#include "blendFormats-inl.h"
#include "blendOps-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// What an operator's formula is given. An input that it does not need is Nothing.
template <class Source, class SourceAlpha, class Destination, class DstAlpha, class Share>
struct Channels {
  Source s;
  SourceAlpha sa;
  Destination d;
  DstAlpha da;
  Share f;
  Nothing nothing;
};

template <class Format, uint32 kFlags, uint32 kReads, class Part>
HWY_INLINE auto loadSource(const BlendRect& rect, const uint8* src, Part part) {
  if constexpr ((kReads & kUsesSource) == 0) {
    return Nothing();
  } else if constexpr ((kFlags & RASTER_BLEND_USE_SRC_ALPHA) == 0) {
    return Format::loadSource(src, part);
  } else {
    return mul(Format::loadSource(src, part), Format::factorOf(rect.srcAlpha));
  }
}

template <class Format, bool kReads, class Part>
HWY_INLINE auto loadDestination(const uint8* at, Part part) {
  if constexpr (kReads) {
    return Format::load(at, part);
  } else {
    return Format::black();
  }
}

template <class Format, uint32 kFlags, uint32 kReads, class P>
HWY_INLINE auto scaleDestination(const BlendRect& rect, P before) {
  if constexpr ((kReads & kUsesDestination) == 0) {
    return Nothing();
  } else if constexpr ((kFlags & RASTER_BLEND_USE_DST_ALPHA) == 0) {
    return before;
  } else {
    return mul(before, Format::factorOf(rect.dstAlpha));
  }
}

template <class Format, uint32 kFlags, class Opaque>
HWY_INLINE auto constantFactor(uint8 value, Opaque opaque) {
  if constexpr ((kFlags & RASTER_BLEND_USE_DST_ALPHA) == 0) {
    return opaque;
  } else {
    return Format::factorOf(value);
  }
}

template <class Format> HWY_INLINE auto pixelsOf(Nothing /*zero*/) { return Format::black(); }
template <class Format, class P> HWY_INLINE P pixelsOf(P p) { return p; }

/// Where a block of pixels goes, where the destination's pixels are, and the source's.
struct Block {
  uint8* dst;
  const uint8* before;
  const uint8* src;

  template <class Format> Block pixel(size_t x) const {
    return {dst + x * Format::kBytes, before + x * Format::kBytes, src + x * 4};
  }
};

template <class Format, auto kOperator, uint32 kFlags>
constexpr bool kReadsDestination = Format::kKeepsBytes ||
                                   (kInputs<kOperator, kFlags> & kUsesDestination) != 0;

/// Blends a block of pixels, or the first of one, reading only what the operator needs.
template <class Format, auto kOperator, uint32 kFlags, class Part>
HWY_INLINE void blendBlock(const BlendRect& rect, Block at, Part part) {
  constexpr uint32 kReads = kInputs<kOperator, kFlags>;
  const auto s = loadSource<Format, kFlags, kReads>(rect, at.src, part);
  const auto before =
      loadDestination<Format, kReadsDestination<Format, kOperator, kFlags>>(at.before, part);
  const auto d = scaleDestination<Format, kFlags, kReads>(rect, before);
  const auto da = constantFactor<Format, kFlags>(rect.dstAlpha, One());
  const auto f = constantFactor<Format, kFlags>(rect.saturateShare, Zero());
  const auto sa = alphaOf(s);
  const Channels<decltype(s), decltype(sa), decltype(d), decltype(da), decltype(f)> c{s,  sa, d,
                                                                                      da, f,  {}};
  Format::store(pixelsOf<Format>(kOperator(c)), before, at.dst, part);
}

#if HWY_TARGET == HWY_AVX3

template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendEnd(const BlendRect& rect, Block at, size_t pixels) {
  blendBlock<Format, kOperator, kFlags>(rect, at, FirstPixels{pixels});
}

#elif HWY_TARGET != HWY_SCALAR

/// Copies less than two vectors of bytes.
HWY_NOINLINE void copyBytes(uint8* dst, const uint8* src, size_t bytes) {
  forLanes(hn::ScalableTag<uint8>(), bytes,
           [&](auto d, size_t i) HWY_ATTR { hn::StoreU(hn::LoadU(d, src + i), d, dst + i); });
}

/// Blends the end of a row. One that is shorter than a block goes by way of a whole block of its
/// own.
template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendEnd(const BlendRect& rect, Block at, size_t pixels) {
  constexpr size_t kBlock = kLanes<typename Format::Lanes>;
  if constexpr (Format::kKeepsBytes) {
    if (pixels == kBlock) {
      blendBlock<Format, kOperator, kFlags>(rect, at, AllButLastByte());
      return;
    }
  }
  const size_t bytes = pixels * Format::kBytes - (Format::kKeepsBytes ? 1 : 0);
  uint8 source[4 * kBlock] = {};
  uint8 destination[Format::kBytes * kBlock] = {};
  if constexpr ((kInputs<kOperator, kFlags> & kUsesSource) != 0)
    copyBytes(source, at.src, pixels * 4);
  if constexpr (kReadsDestination<Format, kOperator, kFlags>)
    copyBytes(destination, at.before, bytes);
  blendBlock<Format, kOperator, kFlags>(rect, {destination, destination, source}, WholeBlock());
  copyBytes(at.dst, destination, bytes);
}

#else

template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendEnd(const BlendRect& /*rect*/, Block /*at*/, size_t /*pixels*/) {}

#endif

template <class Format, auto kOperator, uint32 kFlags> void blendRect(const BlendRect& call) {
  const BlendRect rect = call;  // a local that no store to pixels can change
  Block row{rect.dst, rect.before, rect.src};
  constexpr size_t kBlock = kLanes<typename Format::Lanes>;
  const size_t whole = (rect.width - (Format::kKeepsBytes ? 1 : 0)) / kBlock * kBlock;
  for (uint32 y = 0; y < rect.height; ++y) {
    for (size_t x = 0; x != whole; x += kBlock)
      blendBlock<Format, kOperator, kFlags>(rect, row.pixel<Format>(x), WholeBlock());
    if (whole != rect.width)
      blendEnd<Format, kOperator, kFlags>(rect, row.pixel<Format>(whole), rect.width - whole);
    // The steps come from memory: 32-bit x86 has no registers left for them.
    row = {nextRow(row.dst, call.dstStep), nextRow(row.before, call.beforeStep),
           nextRow(row.src, call.srcStep)};
  }
}

/// The flags that make a difference to an operator. One pixel at a time, the constants are always
/// applied (255 where there is none), for the size of the code.
template <auto kOperator> constexpr uint32 effective(uint32 flags) {
  constexpr uint32 kInputsWith = kInputs<kOperator, RASTER_BLEND_USE_DST_ALPHA>;
  constexpr uint32 kInputsWithout = kInputs<kOperator, 0>;
  if (HWY_TARGET == HWY_SCALAR) flags = RASTER_BLEND_USE_SRC_ALPHA | RASTER_BLEND_USE_DST_ALPHA;
  if ((kInputsWith & (kUsesDestination | kUsesDstAlpha)) == 0) flags &= ~RASTER_BLEND_USE_DST_ALPHA;
  const uint32 inputs = (flags & RASTER_BLEND_USE_DST_ALPHA) != 0 ? kInputsWith : kInputsWithout;
  if ((inputs & kUsesSource) == 0) flags &= ~RASTER_BLEND_USE_SRC_ALPHA;
  return flags;
}

template <class Format, auto kOperator, uint32 kFlags>
constexpr BlendKernel kKernel = {
    blendRect<Format, kOperator, kFlags>,
    HWY_TARGET != HWY_SCALAR&& kReadsDestination<Format, kOperator, kFlags>};

/// The kernel of an operator onto a format: operators of the same formula share it.
template <class Format, size_t kOp, uint32 kFlags> constexpr const BlendKernel& kernelOf() {
  constexpr uint32 kEffective = effective<std::get<kOp>(kOperators)>(kFlags);
  return kKernel<Format, std::get<firstLike<kEffective, kOp>()>(kOperators), kEffective>;
}

/// The kernels of a format, by operator and flags.
template <class Format, size_t... kOps>
constexpr FormatKernels kernelsOf(std::index_sequence<kOps...> /*operators*/) {
  return {BlendVariants{kernelOf<Format, kOps, 0>(), kernelOf<Format, kOps, 1>(),
                        kernelOf<Format, kOps, 2>(), kernelOf<Format, kOps, 3>()}...};
}
template <class Format>
constexpr FormatKernels kKernelsOf =
    kernelsOf<Format>(std::make_index_sequence<RASTER_BLEND_COUNT>());

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
