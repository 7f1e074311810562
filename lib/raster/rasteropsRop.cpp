// SPDX-License-Identifier: MIT
//
// The sixteen raster operations with a constant (ROP fill) or a source rectangle (ROP copy).
//
// Source and destination may overlap in any way. The order of the pixels is defined, and what a
// wide step does differently from it follows from the distance between the rows: ropRows looks at
// the real addresses and then takes the kernel or the pixel-by-pixel walk.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasteropsRop.cpp"
#include "hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "pixelPattern-inl.h"
#include "rasteropsRopInternal.h"
#include "rop-inl.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Bytes = hn::ScalableTag<uint8>;

/// Runs row(dst, src, bytes) from the first row to the last one. The steps of several rows are
/// equal: one register less.
template <class Row> HWY_INLINE void forRows(const RopRows& rows, const Row& row) {
  const size_t bytes = rows.bytes;
  const intptr_t step = rows.dstStep;
  uint8* dst = rows.dst;
  const uint8* src = rows.src;
  for (uint32 y = rows.height; y != 0; --y, dst = nextRow(dst, step), src = nextRow(src, step))
    row(dst, src, bytes);
}

#if HWY_TARGET == HWY_SCALAR

template <class Rop> void freshRowsToRight(const RopRows& rows) {
  forRows(rows, combineToRight<Rop>);
}
template <class Rop> void freshRowsToLeft(const RopRows& rows) {
  forRows(rows, combineToLeft<Rop>);
}

#else

/// Where no step of a row reads what an earlier one stored: short rows in a loop of their own.
template <class Rop, class LongRow>
HWY_INLINE void freshRows(const RopRows& rows, const LongRow& combineLong) {
  if (rows.bytes > 2 * kLanes<Bytes>) {
    forRows(rows, combineLong);
  } else {
    withShortRow(Bytes(), rows.bytes, CombinedAt<Rop>(),
                 [&](auto row) HWY_ATTR { forRows(rows, row); });
  }
}
template <class Rop> HWY_INLINE void freshRowsToRight(const RopRows& rows) {
  freshRows<Rop>(rows, combineLongToRight<Rop>);
}
template <class Rop> HWY_INLINE void freshRowsToLeft(const RopRows& rows) {
  freshRows<Rop>(rows, combineLongToLeft<Rop>);
}

#endif

/// Whether no step of a row reads what an earlier one stored, `ahead` bytes in the direction of the
/// walk from where it read.
template <class Rop> bool staysFresh(uintptr_t ahead, size_t bytes) {
  return !kReadsSrc<Rop> || ahead == 0 || ahead >= bytes;
}

template <class Rop> void rowsToRight(const RopRows& rows) {
  const uintptr_t ahead =
      reinterpret_cast<uintptr_t>(rows.dst) - reinterpret_cast<uintptr_t>(rows.src);
  if (staysFresh<Rop>(ahead, rows.bytes)) {
    freshRowsToRight<Rop>(rows);
  } else {
    forRows(rows, combineToRight<Rop>);
  }
}

template <class Rop> void rowsToLeft(const RopRows& rows) {
  const uintptr_t ahead =
      reinterpret_cast<uintptr_t>(rows.src) - reinterpret_cast<uintptr_t>(rows.dst);
  if (staysFresh<Rop>(ahead, rows.bytes)) {
    freshRowsToLeft<Rop>(rows);
  } else {
    forRows(rows, combineToLeft<Rop>);
  }
}

#if HWY_TARGET == HWY_SCALAR

void fillRows(uint8* row, intptr_t step, size_t bytes, uint32 height, const PixelWords& keep,
              const PixelWords& flip) {
  for (; height != 0; --height, row = nextRow(row, step)) {
    for (size_t i = 0; i < bytes; i += sizeof keep) {
      const size_t count = bytes - i < sizeof keep ? bytes - i : sizeof keep;
      PixelWords d = {};
      memcpy(&d, row + i, count);
      for (size_t k = 0; k < 3; ++k) d.word[k] = (d.word[k] & keep.word[k]) ^ flip.word[k];
      memcpy(row + i, &d, count);
    }
  }
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
HWY_NOINLINE void fillLongRows(uint8* row, intptr_t step, size_t bytes, uint32 height,
                               const PixelWords& keep, const PixelWords& flip) {
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  const auto fill = [&](auto tag, uint8* dst, size_t at)
                        HWY_ATTR { storeLanes(tag, filledAt(tag, nullptr, dst, at), dst + at); };
  for (; height != 0; --height, row = nextRow(row, step)) {
    size_t i = 0;
    for (; bytes - i >= 3 * n; i += 3 * n) {
      for (size_t k = 0; k < 3 * n; k += kCacheLine) fetchAhead(row + i + k);
      fill(d, row + i, 0);
      fill(d, row + i, n);
      fill(d, row + i, 2 * n);
    }
    forLanes(d, bytes - i, [&](auto tag, size_t k) HWY_ATTR { fill(tag, row + i, k); });
  }
}

void fillRows(uint8* row, intptr_t step, size_t bytes, uint32 height, const PixelWords& keep,
              const PixelWords& flip) {
  if (bytes > 2 * kLanes<Bytes>) {
    fillLongRows(row, step, bytes, height, keep, flip);
    return;
  }
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  withShortRow(Bytes(), bytes, filledAt, [&](auto shortRow) HWY_ATTR {
    for (uint32 y = height; y != 0; --y, row = nextRow(row, step)) shortRow(row, nullptr, bytes);
  });
}

#endif

constexpr auto kToRight =
    ropTable([](auto rop) -> RopRowsKernel { return rowsToRight<decltype(rop)>; });
constexpr auto kToLeft =
    ropTable([](auto rop) -> RopRowsKernel { return rowsToLeft<decltype(rop)>; });
constexpr RopKernels kKernels = {kLanes<Bytes>, fillRows, kToRight.data(), kToLeft.data()};

}  // namespace

const RopKernels* ropKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include <algorithm>

#include "kernelChoice.h"
#include "panicPlace.h"
#include "raster.h"
#include "rasteropsInternal.h"

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

/// The walk as it is defined: units of 1, 2 or 4 bytes, each read, combined and stored before the
/// next one is looked at.
template <class Rop, unsigned kUnit> void walkUnits(const RopRows& rows, RopWalk walk) {
  const intptr_t advance = walk == RopWalk::kToRight ? intptr_t{kUnit} : -intptr_t{kUnit};
  const size_t first = walk == RopWalk::kToRight ? 0 : rows.bytes - kUnit;
  uint8* dstRow = rows.dst + first;
  const uint8* srcRow = rows.src + first;
  for (uint32 y = rows.height; y != 0;
       --y, dstRow = nextRow(dstRow, rows.dstStep), srcRow = nextRow(srcRow, rows.srcStep)) {
    uint8* dst = dstRow;
    const uint8* src = srcRow;
    for (size_t i = rows.bytes / kUnit; i != 0;
         --i, dst = nextRow(dst, advance), src = nextRow(src, advance)) {
      const uint32 s = HWY_NAMESPACE::kReadsSrc<Rop> ? loadPixel<kUnit>(src) : 0;
      const uint32 d = HWY_NAMESPACE::kReadsDst<Rop> ? loadPixel<kUnit>(dst) : 0;
      storePixel<kUnit>(dst, Rop{}(s, d));
    }
  }
}

using RopWalker = void (*)(const RopRows& rows, RopWalk walk);
template <unsigned kUnit>
constexpr auto kWalkers = HWY_NAMESPACE::ropTable([](auto rop) -> RopWalker {
  return walkUnits<decltype(rop), kUnit>;
});

/// Pixels of three bytes are combined byte by byte.
uint32 unitOf(uint32 bytesPerPixel) { return bytesPerPixel == 3 ? 1 : bytesPerPixel; }

void walkRows(const RopRows& rows, uint32 unit, uint32 rop, RopWalk walk) {
  if (rows.bytes == 0) return;
  const auto& walkers = unit == 1 ? kWalkers<1> : unit == 2 ? kWalkers<2> : kWalkers<4>;
  walkers[rop](rows, walk);
}

/// Whether a kernel gives the result of the walk on the first row: nothing that it stores is to be
/// read again within the next step. Steps to the right write ahead of the source where the
/// destination lies at a higher address, steps to the left where it lies at a lower one.
bool kernelEqualsWalk(const RopRows& rows, uint32 unit, RopWalk walk) {
  const uintptr_t right =
      reinterpret_cast<uintptr_t>(rows.dst) - reinterpret_cast<uintptr_t>(rows.src);
  const uintptr_t ahead = walk == RopWalk::kToRight ? right : 0 - right;
  return ahead == 0 || ahead >= std::max(kernels().stepBytes, size_t{unit}) || ahead >= rows.bytes;
}

/// The rows from the last one up.
RopRows upwards(const RopRows& rows) {
  const intptr_t dstStep = rows.dstStep;
  const intptr_t srcStep = rows.srcStep;
  return {.dst = rowAt(rows.dst, dstStep, rows.height - 1, 0, 0),
          .dstStep = -dstStep,
          .src = rowAt(rows.src, srcStep, rows.height - 1, 0, 0),
          .srcStep = -srcStep,
          .bytes = rows.bytes,
          .height = rows.height};
}

/// Whether rows that are walked to the left may be walked from the last one up: memory is read
/// fastest in one direction throughout. Allowed while no row meets another one.
bool gainsFromUpwards(const RopRows& rows) {
  const uintptr_t distance =
      reinterpret_cast<uintptr_t>(rows.dst) - reinterpret_cast<uintptr_t>(rows.src);
  return rows.height != 0 && rows.dstStep > 0 && distance < rows.bytes &&
         distance + rows.bytes <= static_cast<uintptr_t>(rows.dstStep);
}

/// What ropRows does where the distance between source and destination is the same in every row.
void evenRopRows(const RopRows& rows, uint32 unit, uint32 rop, RopWalk walk) {
  if (!kernelEqualsWalk(rows, unit, walk)) {
    walkRows(rows, unit, rop, walk);
  } else if (walk == RopWalk::kToRight) {
    kernels().toRight[rop](rows);
  } else {
    kernels().toLeft[rop](gainsFromUpwards(rows) ? upwards(rows) : rows);
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

/// The pitch of rows that are walked upwards.
int32 negated(int32 pitch) { return static_cast<int32>(0 - static_cast<uint32>(pitch)); }

}  // namespace

void ropRows(const RopRows& rows, uint32 bytesPerPixel, uint32 rop, RopWalk walk) {
  const uint32 unit = unitOf(bytesPerPixel);
  if (rows.dstStep == rows.srcStep) {
    evenRopRows(rows, unit, rop, walk);
    return;
  }
  RopRows row = rows;
  row.height = 1;
  for (uint32 y = 0; y < rows.height; ++y) {
    evenRopRows(row, unit, rop, walk);
    row.dst = nextRow(row.dst, rows.dstStep);
    row.src = nextRow(row.src, rows.srcStep);
  }
}

void rectRopCopy(uint8* dst, int32 dstPitch, const uint8* src, int32 srcPitch, uint32 bytesPerPixel,
                 uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY, uint32 width,
                 uint32 height) {
  if (rop == kRopCopy) {
    rectCopy(dst, pitchOf(dstPitch), src, pitchOf(srcPitch), bytesPerPixel, srcX, srcY, dstX, dstY,
             width, height);
    return;
  }
  const bool unsupported = bytesPerPixel < 1 || bytesPerPixel > 4;
  RopWalk walk = RopWalk::kToRight;
  if (srcY == dstY && dstX > srcX) {
    if (unsupported) unsupportedPixelSize(kSource);
    walk = RopWalk::kToLeft;
  } else if (unsupported) {
    unsupportedPixelSize(kSource);
  }
  if (rop >= kRopCount || rop == kRopNoop) return;
  const bool bottomUp = srcY < dstY;
  const uint32 firstRow = bottomUp ? height - 1 : 0;
  const int32 dstWalked = bottomUp ? negated(dstPitch) : dstPitch;
  const int32 srcWalked = bottomUp ? negated(srcPitch) : srcPitch;
  ropRows({.dst = rowAt(dst, pitchOf(dstPitch), dstY + firstRow, dstX, bytesPerPixel),
           .dstStep = rowStep(dstWalked, bytesPerPixel),
           .src = rowAt(src, pitchOf(srcPitch), srcY + firstRow, srcX, bytesPerPixel),
           .srcStep = rowStep(srcWalked, bytesPerPixel),
           .bytes = size_t{width} * bytesPerPixel,
           .height = height},
          bytesPerPixel, rop, walk);
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
  const RowRun run = joinRows(step, size_t{width} * bytesPerPixel, height);
  kernels().fillRows(rowAt(fb, pitchOf(pitch), y, x, bytesPerPixel), step, run.bytes, run.rows,
                     repeatPixel(constant.keep, bytesPerPixel),
                     repeatPixel(constant.flip, bytesPerPixel));
}

void Raster_RectROPcopy(uint8* dst, int32 dstPitch, const uint8* src, int32 srcPitch,
                        uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                        uint32 dstY, uint32 width, uint32 height) {
  raster::rectRopCopy(dst, dstPitch, src, srcPitch, bytesPerPixel, srcX, srcY, rop, dstX, dstY,
                      width, height);
}

}  // extern "C"

#endif
