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

/// Whether the destination's pixels may lie apart from where the results go. Portable kernels find
/// them there: told that they are the same memory, the compiler vectorises the loop.
inline constexpr bool kReadsApart = HWY_TARGET != HWY_SCALAR;

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
constexpr bool kReadsDestination = (Format::kKeepsBytes && !kMasksColors) ||
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
  if constexpr (Format::kKeepsBytes) {
    if (pixels == kLanes<typename Format::Lanes>)
      return blendBlock<Format, kOperator, kFlags>(rect, at, AllButLastByte());
  }
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

#endif

/// How many source pixels are looked at at once, whether they are all clear: sprites are clear in
/// runs, so it is a cache line.
constexpr size_t kRun = 16;

/// Whether to look: where they are, the destination is neither read nor written. Sums without a
/// product take no longer than to look, and with AVX-512 nothing does.
template <auto kOperator, uint32 kFlags>
constexpr bool kLooksForClear =
    kClearKeeps<kOperator, kFlags>&& kUsesSrcAlpha<kOperator, kFlags>&& HWY_TARGET != HWY_AVX3;

/// Whether a run of source pixels is 0 in all bytes. Most of those that are not are known by their
/// first pixel.
HWY_INLINE bool isClear(const uint8* src) {
  if (loadPixel<4>(src) != 0) return false;
  const hn::ScalableTag<uint32> d;
  auto all = loadLanes(d, src);
  for (size_t i = kLanes<decltype(d)>; i < kRun; i += kLanes<decltype(d)>)
    all = hn::Or(all, loadLanes(d, src + 4 * i));
  return hn::AllTrue(d, hn::Eq(all, hn::Zero(d)));
}

/// Blends the `whole` pixels of a row, a multiple of a block.
template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendBlocks(const BlendRect& rect, const Block& row, size_t whole) {
  constexpr size_t kBlock = kLanes<typename Format::Lanes>;
  size_t x = 0;
  if constexpr (Format::kKeepsBytes && kLooksForClear<kOperator, kFlags>) {
    // What is blended from elsewhere is to be stored in any case.
    while (row.before == row.dst && whole - x >= kRun) {
      const size_t end = x + kRun;
      if (isClear(row.src + 4 * x)) x = end;
      for (; x != end; x += kBlock)
        blendBlock<Format, kOperator, kFlags>(rect, row.pixel<Format>(x), WholeBlock());
    }
  }
  for (; x != whole; x += kBlock)
    blendBlock<Format, kOperator, kFlags>(rect, row.pixel<Format>(x), WholeBlock());
}

template <class Format, auto kOperator, uint32 kFlags> void blendRect(const BlendRect& call) {
  const BlendRect rect = call;  // a local that no store to pixels can change
  Block row{rect.dst, kReadsApart ? rect.before : rect.dst, rect.src};
  constexpr size_t kBlock = kLanes<typename Format::Lanes>;
  const size_t whole = (rect.width - (Format::kKeepsBytes ? 1 : 0)) / kBlock * kBlock;
  for (uint32 y = 0; y < rect.height; ++y) {
    blendBlocks<Format, kOperator, kFlags>(rect, row, whole);
#if HWY_TARGET != HWY_SCALAR
    if (whole != rect.width)
      blendEnd<Format, kOperator, kFlags>(rect, row.pixel<Format>(whole), rect.width - whole);
#endif
    // The steps come from memory: 32-bit x86 has no registers left for them.
    uint8* const dst = nextRow(row.dst, call.dstStep);
    row = {dst, kReadsApart ? nextRow(row.before, call.beforeStep) : dst,
           nextRow(row.src, call.srcStep)};
  }
}

#if HWY_TARGET == HWY_SCALAR

/// Blends some pixels, at most a run, of which three bytes are read and written. They go by way of
/// words: the compiler vectorises the loop over these.
template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendThrees(const BlendRect& rect, uint8* dst, const uint8* src, size_t pixels) {
  uint8 words[4 * kRun] = {};
  if constexpr ((kInputs<kOperator, kFlags> & kUsesDestination) != 0) {
    for (size_t i = 0; i < pixels; ++i)
      storePixel<4>(words + 4 * i, loadPixel<3>(dst + Format::kBytes * i));
  }
  blendBlocks<PixelWord, kOperator, kFlags>(rect, {words, words, src}, pixels);
  for (size_t i = 0; i < pixels; ++i)
    storePixel<3>(dst + Format::kBytes * i, loadPixel<4>(words + 4 * i));
}

template <class Format, auto kOperator, uint32 kFlags>
void blendRectOfThrees(const BlendRect& call) {
  const BlendRect rect = call;
  for (uint32 y = 0; y < rect.height; ++y) {
    uint8* dst = rowAt(rect.dst, rect.dstStep, y, 0, 0);
    const uint8* src = rowAt(rect.src, rect.srcStep, y, 0, 0);
    size_t x = 0;
    for (; rect.width - x >= kRun; x += kRun, dst += kRun * Format::kBytes, src += kRun * 4) {
      if (!kLooksForClear<kOperator, kFlags> || !isClear(src))
        blendThrees<Format, kOperator, kFlags>(rect, dst, src, kRun);
    }
    if (x != rect.width) blendThrees<Format, kOperator, kFlags>(rect, dst, src, rect.width - x);
  }
}

#endif

/// The flags that make a difference to an operator.
template <auto kOperator> constexpr uint32 effective(uint32 flags) {
  constexpr uint32 kInputsWith = kInputs<kOperator, RASTER_BLEND_USE_DST_ALPHA>;
  constexpr uint32 kInputsWithout = kInputs<kOperator, 0>;
  if ((kInputsWith & (kUsesDestination | kUsesDstAlpha)) == 0) flags &= ~RASTER_BLEND_USE_DST_ALPHA;
  const uint32 inputs = (flags & RASTER_BLEND_USE_DST_ALPHA) != 0 ? kInputsWith : kInputsWithout;
  if ((inputs & kUsesSource) == 0) flags &= ~RASTER_BLEND_USE_SRC_ALPHA;
  return flags;
}

template <class Format, auto kOperator, uint32 kFlags>
constexpr BlendKernel kKernel = {blendRect<Format, kOperator, kFlags>,
                                 kReadsApart&& kReadsDestination<Format, kOperator, kFlags>};
#if HWY_TARGET == HWY_SCALAR
template <size_t kPixel, auto kOperator, uint32 kFlags>
constexpr BlendKernel kKernel<ThreeOf<kPixel>, kOperator, kFlags> = {
    blendRectOfThrees<ThreeOf<kPixel>, kOperator, kFlags>, false};
#endif

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
