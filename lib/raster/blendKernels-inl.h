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

using Lanes = hn::ScalableTag<uint32>;
using Alpha = Factor<Lanes>;

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

template <uint32 kFlags, uint32 kReads>
HWY_INLINE auto loadSource(const BlendRect& rect, const uint8* src) {
  const Lanes lanes;
  if constexpr ((kReads & kUsesSource) == 0) {
    return Nothing();
  } else if constexpr ((kFlags & kFlagSrcAlpha) == 0) {
    return Bytes<Lanes>{loadOnce(lanes, src)};
  } else {
    return mul(Bytes<Lanes>{loadOnce(lanes, src)}, factor(lanes, rect.srcAlpha));
  }
}

template <class Format, uint32 kReads> HWY_INLINE auto loadDestination(const uint8* dst) {
  if constexpr ((kReads & kUsesDestination) == 0 && !Format::kKeepsBytes) {
    return Nothing();
  } else {
    return Format::load(Lanes(), dst);
  }
}

template <uint32 kFlags, uint32 kReads, class P>
HWY_INLINE auto scaleDestination(const BlendRect& rect, P before) {
  if constexpr ((kReads & kUsesDestination) == 0) {
    return Nothing();
  } else if constexpr ((kFlags & kFlagDstAlpha) == 0) {
    return before;
  } else {
    return mul(before, factor(Lanes(), rect.dstAlpha));
  }
}

template <uint32 kFlags, class Opaque> HWY_INLINE auto constantFactor(uint8 value, Opaque opaque) {
  if constexpr ((kFlags & kFlagDstAlpha) == 0) {
    return opaque;
  } else {
    return factor(Lanes(), value);
  }
}

HWY_INLINE Bytes<Lanes> pixelsOf(Nothing /*zero*/) { return {hn::Zero(Lanes())}; }
template <class P> HWY_INLINE P pixelsOf(P p) { return p; }

/// Blends kLanes<Lanes> pixels, reading only what the operator needs.
template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendBlock(const BlendRect& rect, uint8* dst, const uint8* src) {
  constexpr uint32 kReads = kInputs<kOperator, kFlags>;
  const auto s = loadSource<kFlags, kReads>(rect, src);
  const auto before = loadDestination<Format, kReads>(dst);
  const auto d = scaleDestination<kFlags, kReads>(rect, before);
  const auto da = constantFactor<kFlags>(rect.dstAlpha, One());
  const auto f = constantFactor<kFlags>(rect.saturateShare, Zero());
  const auto sa = alphaOf(s);
  const Channels<decltype(s), decltype(sa), decltype(d), decltype(da), decltype(f)> c{s,  sa, d,
                                                                                      da, f,  {}};
  Format::store(Lanes(), pixelsOf(kOperator(c)), before, dst);
}

#if HWY_TARGET != HWY_SCALAR
/// Copies less than a vector of bytes.
HWY_NOINLINE void copyBytes(uint8* dst, const uint8* src, size_t bytes) {
  forLanes(hn::ScalableTag<uint8>(), bytes,
           [&](auto d, size_t i) HWY_ATTR { hn::StoreU(hn::LoadU(d, src + i), d, dst + i); });
}

/// Copies less than a vector of bytes to the front of a whole one.
HWY_INLINE void copyToBlock(uint8* block, const uint8* src, size_t bytes) {
#if HWY_TARGET == HWY_AVX3
  const hn::ScalableTag<uint8> d;
  hn::StoreU(hn::MaskedLoad(hn::FirstN(d, bytes), d, src), d, block);
#else
  copyBytes(block, src, bytes);
#endif
}

/// Blends the end of a row, shorter than a block, by way of a whole block of its own.
template <class Format, auto kOperator, uint32 kFlags>
HWY_INLINE void blendEnd(const BlendRect& rect, uint8* dst, const uint8* src, size_t pixels) {
  constexpr uint32 kReads = kInputs<kOperator, kFlags>;
  uint8 source[4 * kLanes<Lanes>] = {};
  uint8 destination[4 * kLanes<Lanes>] = {};
  if constexpr ((kReads & kUsesSource) != 0) copyToBlock(source, src, pixels * 4);
  if constexpr ((kReads & kUsesDestination) != 0 || Format::kKeepsBytes)
    copyToBlock(destination, dst, pixels * Format::kBytes);
  blendBlock<Format, kOperator, kFlags>(rect, destination, source);
  copyBytes(dst, destination, pixels * Format::kBytes);
}
#endif

template <class Format, auto kOperator, uint32 kFlags> void blendRect(const BlendRect& call) {
  const BlendRect rect = call;  // a local that no store to pixels can change
  uint8* dstRow = rect.dst;
  const uint8* srcRow = rect.src;
  constexpr size_t kBlock = kLanes<Lanes>;
  for (uint32 y = 0; y < rect.height; ++y) {
    size_t x = 0;
    for (; rect.width - x >= kBlock; x += kBlock)
      blendBlock<Format, kOperator, kFlags>(rect, dstRow + x * Format::kBytes, srcRow + x * 4);
#if HWY_TARGET != HWY_SCALAR
    if (x != rect.width) {
      blendEnd<Format, kOperator, kFlags>(rect, dstRow + x * Format::kBytes, srcRow + x * 4,
                                          rect.width - x);
    }
#endif
    dstRow = nextRow(dstRow, rect.dstStep);
    srcRow = nextRow(srcRow, rect.srcStep);
  }
}

/// The flags that make a difference to an operator. One pixel at a time, the constants are always
/// applied (255 where there is none), for the size of the code.
template <auto kOperator> constexpr uint32 effective(uint32 flags) {
  constexpr uint32 kInputsWith = kInputs<kOperator, kFlagDstAlpha>;
  constexpr uint32 kInputsWithout = kInputs<kOperator, 0>;
  if (HWY_TARGET == HWY_SCALAR) flags = kFlagSrcAlpha | kFlagDstAlpha;
  if ((kInputsWith & (kUsesDestination | kUsesDstAlpha)) == 0) flags &= ~kFlagDstAlpha;
  const uint32 inputs = (flags & kFlagDstAlpha) != 0 ? kInputsWith : kInputsWithout;
  if ((inputs & kUsesSource) == 0) flags &= ~kFlagSrcAlpha;
  return flags;
}

/// The kernels of an operator onto a format, by flags.
template <class Format, auto kOperator> constexpr BlendVariants variantsOf() {
  return {blendRect<Format, kOperator, effective<kOperator>(0)>,
          blendRect<Format, kOperator, effective<kOperator>(1)>,
          blendRect<Format, kOperator, effective<kOperator>(2)>,
          blendRect<Format, kOperator, effective<kOperator>(3)>};
}

/// The kernels of a format, by operator.
template <class Format, size_t... kOps>
constexpr FormatKernels kernelsOf(std::index_sequence<kOps...> /*operators*/) {
  return {variantsOf<Format, std::get<kOps>(kOperators)>()...};
}
template <class Format>
constexpr FormatKernels kKernelsOf = kernelsOf<Format>(std::make_index_sequence<kBlendOperators>());

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
