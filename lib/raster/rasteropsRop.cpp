// SPDX-License-Identifier: MIT
//
// The sixteen raster operations with a constant (ROP fill) or a source rectangle (ROP copy).
//
// Source and destination may overlap in any way. The order of the pixels is defined, and what a
// wide step does differently from it follows from the distance between the rows: ropRows looks at
// the real addresses and then takes the kernel or the pixel-by-pixel walk.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasteropsRop.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "vector/byteRows-inl.h"
#include "vector/pixelPattern-inl.h"
#include "ops/rasteropsRopInternal.h"
#include "ops/rop-inl.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Bytes = hn::ScalableTag<uint8>;

/// Vectors in order: for rows that overlap far.
template <class Rop, Walk kWalk> void combineRowsInOrder(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  forRowsInStep(rows, [&](uint8* dst, const uint8* src)
                          HWY_ATTR { combineInOrder<Rop, kWalk>(dst, src, bytes); });
}

#if HWY_TARGET == HWY_SCALAR

/// For rows that do not overlap.
template <class Rop, Walk kWalk> void combineRows(const RowPair& rows) {
  combineRowsInOrder<Rop, kWalk>(rows);
}

#else

/// Rows of at most two vectors are made as a whole before any of it is stored: they have no walk.
template <class Rop> HWY_NOINLINE void combineShortRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  withShortRow(Bytes(), bytes, CombinedAt<Rop>(), [&](auto row) HWY_ATTR {
    forRowsInStep(rows, [&](uint8* dst, const uint8* src) HWY_ATTR { row(dst, src, bytes); });
  });
}

template <class Rop, Walk kWalk> void combineRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  if (bytes <= 2 * kLanes<Bytes>) return combineShortRows<Rop>(rows);
  const CombinedAt<Rop> combinedAt;
  forRowsInStep(rows, [&](uint8* dst, const uint8* src)
                          HWY_ATTR { storeLongRow<kWalk>(dst, src, bytes, combinedAt); });
}

#endif

#if HWY_TARGET == HWY_SCALAR

void fillRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  forRows(rows, [&](uint8* row) {
    for (size_t i = 0; i < rows.bytes; i += sizeof keep) {
      const size_t count = rows.bytes - i < sizeof keep ? rows.bytes - i : sizeof keep;
      PixelWords d = {};
      memcpy(&d, row + i, count);
      for (size_t k = 0; k < 3; ++k) d.word[k] = (d.word[k] & keep.word[k]) ^ flip.word[k];
      memcpy(row + i, &d, count);
    }
  });
}

#else

/// d = d & keep ^ flip.
struct FillPatterns {
  PixelPattern keep;
  PixelPattern flip;

  /// The lanes at an offset of a row, and of the patterns.
  template <class D>
  HWY_INLINE hn::Vec<D> operator()(D d, const uint8* /*src*/, const uint8* dst, size_t at) const {
    const auto kept = hn::And(loadLanes(d, dst + at), loadLanes(d, keep.bytes + at));
    return hn::Xor(kept, loadLanes(d, flip.bytes + at));
  }
};

/// Fills rows of more than two vectors.
HWY_NOINLINE void fillLongRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  const size_t bytes = rows.bytes;
  const auto fill = [&](auto tag, uint8* dst, size_t at)
                        HWY_ATTR { storeLanes(tag, filledAt(tag, nullptr, dst, at), dst + at); };
  forRows(rows, [&](uint8* row) HWY_ATTR {
    size_t i = 0;
    for (; bytes - i >= 3 * n; i += 3 * n) {
      for (size_t k = 0; k < 3 * n; k += kCacheLine) fetchAhead(row + i + k);
      fill(d, row + i, 0);
      fill(d, row + i, n);
      fill(d, row + i, 2 * n);
    }
    forLanes(d, bytes - i, [&](auto tag, size_t k) HWY_ATTR { fill(tag, row + i, k); });
  });
}

void fillRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  const size_t bytes = rows.bytes;
  if (bytes > 2 * kLanes<Bytes>) return fillLongRows(rows, keep, flip);
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  withShortRow(Bytes(), bytes, filledAt, [&](auto shortRow) HWY_ATTR {
    forRows(rows, [&](uint8* row) HWY_ATTR { shortRow(row, nullptr, bytes); });
  });
}

#endif

// Nobody asks for Noop; and what does not read the source neither overlaps it nor has a walk.
template <class Rop> constexpr bool kIsAskedFor = kTruthTable<Rop> != kRopNoop;
template <Walk kWalk>
constexpr auto kRows = ropTable([](auto rop) -> RopRowsKernel {
  using Rop = decltype(rop);
  if constexpr (kIsAskedFor<Rop>)
    return combineRows < Rop, kReadsSrc<Rop> ? kWalk : Walk::kToRight > ;
  return nullptr;
});
template <Walk kWalk>
constexpr auto kRowsInOrder = ropTable([](auto rop) -> RopRowsKernel {
  if constexpr (kReadsSrc<decltype(rop)>) return combineRowsInOrder<decltype(rop), kWalk>;
  return nullptr;
});
constexpr RopKernels kKernels = {
    kLanes<Bytes>,
    fillRows,
    {{kRows<Walk::kToRight>.data(), kRowsInOrder<Walk::kToRight>.data()},
     {kRows<Walk::kToLeft>.data(), kRowsInOrder<Walk::kToLeft>.data()}}};

}  // namespace

const RopKernels* ropKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include <algorithm>

#include "vector/kernelChoice.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "ops/rasteropsInternal.h"

namespace raster {
namespace {

HWY_EXPORT(ropKernels);

constexpr char kSource[] = "lib/raster/rasterops";

const RopKernels* lookUpKernels() { return HWY_DYNAMIC_DISPATCH(ropKernels)(); }
const RopKernels& kernels() { return chosenKernels<lookUpKernels>(); }

/// The operations on single pixels, by code.
using RopOnPixel = uint32 (*)(uint32 s, uint32 d);
constexpr auto kOnPixel = HWY_NAMESPACE::ropTable([](auto rop) -> RopOnPixel {
  return [](uint32 s, uint32 d) { return decltype(rop){}(s, d); };
});

/// The walk as it is defined, of an operation that reads the source: units of 1, 2 or 4 bytes, each
/// read, combined and stored before the next one is looked at.
template <class Rop, unsigned kUnit> void walkUnits(const RowPair& rows, Walk walk) {
  const intptr_t advance = walk == Walk::kToRight ? intptr_t{kUnit} : -intptr_t{kUnit};
  const size_t first = walk == Walk::kToRight ? 0 : rows.bytes - kUnit;
  uint8* dstRow = rows.dst + first;
  const uint8* srcRow = rows.src + first;
  for (uint32 y = rows.rows; y != 0;
       --y, dstRow = nextRow(dstRow, rows.dstStep), srcRow = nextRow(srcRow, rows.srcStep)) {
    uint8* dst = dstRow;
    const uint8* src = srcRow;
    for (size_t i = rows.bytes / kUnit; i != 0;
         --i, dst = nextRow(dst, advance), src = nextRow(src, advance)) {
      const uint32 d = HWY_NAMESPACE::kReadsDst<Rop> ? loadPixel<kUnit>(dst) : 0;
      storePixel<kUnit>(dst, Rop{}(loadPixel<kUnit>(src), d));
    }
  }
}

using RopWalker = void (*)(const RowPair& rows, Walk walk);
template <unsigned kUnit>
constexpr auto kWalkers = HWY_NAMESPACE::ropTable([](auto rop) -> RopWalker {
  return walkUnits<decltype(rop), kUnit>;
});

void walkRows(const RowPair& rows, uint32 unit, uint32 rop, Walk walk) {
  const auto& walkers = unit == 1 ? kWalkers<1> : unit == 2 ? kWalkers<2> : kWalkers<4>;
  walkers[rop](rows, walk);
}

/// Steps to the right store ahead of where they read where the destination lies at a higher
/// address, steps to the left where it lies at a lower one.
Overlap overlapOf(const RowPair& rows, uint32 unit, uint32 rop, Walk walk) {
  const uintptr_t ahead = walk == Walk::kToRight ? rows.ahead() : 0 - rows.ahead();
  if (!ropReadsSource(rop) || ahead == 0 || ahead >= rows.bytes) return Overlap::kNone;
  return ahead >= std::max(kernels().stepBytes, size_t{unit}) ? Overlap::kFar : Overlap::kNear;
}

/// Where the distance between source and destination changes from row to row.
HWY_NOINLINE void ropRowByRow(const RowPair& rows, uint32 bytesPerPixel, uint32 rop, Walk walk) {
  RowPair row = {rows.dst, 0, rows.src, 0, rows.bytes, 1};
  for (uint32 y = rows.rows; y != 0; --y) {
    ropRows(row, bytesPerPixel, rop, walk);
    row.dst = nextRow(row.dst, rows.dstStep);
    row.src = nextRow(row.src, rows.srcStep);
  }
}

/// What remains of every destination bit, and what is then flipped: with a constant source every
/// operation is d & keep ^ flip.
struct KeepAndFlip {
  uint32 keep;
  uint32 flip;
};
KeepAndFlip withConstant(uint32 rop, uint32 pixel) {
  const uint32 ofZeros = kOnPixel[rop](pixel, 0);
  const uint32 ofOnes = kOnPixel[rop](pixel, ~uint32{0});
  return {ofZeros ^ ofOnes, ofZeros};
}

/// The pitch of rows that are walked upwards: a number of 32 bits, as the given one is.
int32 negated(intptr_t pitch) { return static_cast<int32>(0 - static_cast<uint32>(pitch)); }

}  // namespace

void ropRows(const RowPair& rows, uint32 bytesPerPixel, uint32 rop, Walk walk) {
  if (rows.dstStep != rows.srcStep) return ropRowByRow(rows, bytesPerPixel, rop, walk);
  const uint32 unit = bytesPerPixel == 3 ? 1 : bytesPerPixel;  // three bytes are three operations
  const Overlap overlap = overlapOf(rows, unit, rop, walk);
  if (overlap == Overlap::kNear) return walkRows(rows, unit, rop, walk);
  const RopRowsKernel* const kernel =
      kernels().rows[static_cast<size_t>(walk)][static_cast<size_t>(overlap)];
  if (walk == Walk::kToLeft && rows.gainFromLast()) return kernel[rop](rows.inOrder(true));
  kernel[rop](rows);
}

/// Raster_RectROPcopy, to be part of its callers: the corners then need no memory.
HWY_INLINE void ropCopy(const Corner<uint8>& dst, const Corner<const uint8>& src,
                        uint32 bytesPerPixel, uint32 rop, uint32 width, uint32 height) {
  if (rop == kRopCopy) return rectCopy(dst, src, bytesPerPixel, width, height);
  const bool unsupported = bytesPerPixel < 1 || bytesPerPixel > 4;
  // Two calls, as each walk has a line of its own in the message.
  Walk walk = Walk::kToRight;
  if (src.y == dst.y && dst.x > src.x) {
    if (unsupported) unsupportedPixelSize(kSource);
    walk = Walk::kToLeft;
  } else if (unsupported) {
    unsupportedPixelSize(kSource);
  }
  if (rop >= kRopCount || rop == kRopNoop) return;
  const bool bottomUp = src.y < dst.y;
  const uint32 firstRow = bottomUp ? height - 1 : 0;
  const intptr_t dstWalked = bottomUp ? negated(dst.pitch) : dst.pitch;
  const intptr_t srcWalked = bottomUp ? negated(src.pitch) : src.pitch;
  ropRows({.dst = rowAt(dst.base, dst.pitch, dst.y + firstRow, dst.x, bytesPerPixel),
           .dstStep = rowStep(dstWalked, bytesPerPixel),
           .src = rowAt(src.base, src.pitch, src.y + firstRow, src.x, bytesPerPixel),
           .srcStep = rowStep(srcWalked, bytesPerPixel),
           .bytes = size_t{width} * bytesPerPixel,
           .rows = height},
          bytesPerPixel, rop, walk);
}

void rectRopCopy(const Corner<uint8>& dst, const Corner<const uint8>& src, uint32 bytesPerPixel,
                 uint32 rop, uint32 width, uint32 height) {
  ropCopy(dst, src, bytesPerPixel, rop, width, height);
}

}  // namespace raster

extern "C" {

void Raster_RectROPfill(uint8* fb, int32 pitch, uint32 bytesPerPixel, uint32 pixel, uint32 rop,
                        uint32 x, uint32 y, uint32 width, uint32 height) {
  using namespace raster;
  if (rop == kRopCopy) {
    rectFill(fb, pitchOf(pitch), bytesPerPixel, pixel, x, y, width, height);
    return;
  }
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  if (rop >= kRopCount || rop == kRopNoop) return;
  const KeepAndFlip constant = withConstant(rop, pixel);
  if (constant.keep == 0) {
    rectFill(fb, pitchOf(pitch), bytesPerPixel, constant.flip, x, y, width, height);
    return;
  }
  const intptr_t step = rowStep(pitchOf(pitch), bytesPerPixel);
  const Rows rows = {rowAt(fb, pitchOf(pitch), y, x, bytesPerPixel), step,
                     size_t{width} * bytesPerPixel, height};
  kernels().fillRows(rows.joined(), repeatPixel(constant.keep, bytesPerPixel),
                     repeatPixel(constant.flip, bytesPerPixel));
}

void Raster_RectROPcopy(uint8* dst, int32 dstPitch, const uint8* src, int32 srcPitch,
                        uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                        uint32 dstY, uint32 width, uint32 height) {
  using namespace raster;
  ropCopy({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, bytesPerPixel,
          rop, width, height);
}

}  // extern "C"

#endif
