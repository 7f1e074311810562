// SPDX-License-Identifier: MIT
//
// The sixteen raster operations: the kernels, and the walk that they must equal.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/ops/rasteropsRopKernels.cpp"
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

template <class Rop, Walk kWalk> HWY_NOINLINE void combineLongRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  const CombinedAt<Rop> combinedAt;
  if (bytes <= 4 * kLanes<Bytes>) {
    return forRowsInStep(rows, [&](uint8* dst, const uint8* src) HWY_ATTR {
      storeFourVectors(Bytes(), dst, src, 0, bytes, combinedAt);
    });
  }
  forRowsInStep(rows, [&](uint8* dst, const uint8* src)
                          HWY_ATTR { storeLongRow<kWalk>(dst, src, bytes, combinedAt); });
}

template <class Rop, Walk kWalk> void combineRows(const RowPair& rows) {
  if (rows.bytes <= 2 * kLanes<Bytes>) return combineShortRows<Rop>(rows);
  // Rows without a gap are one, unless it stores ahead of where it reads.
  const RowPair joined = rows.joined();
  const bool isOne = joined.ahead() == 0 || joined.ahead() >= joined.bytes;
  combineLongRows<Rop, kWalk>(kWalk == Walk::kToRight && isOne ? joined : rows);
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

/// Fills long rows with patterns that repeat after three vectors.
template <bool kFetches>
HWY_INLINE void fillWithPatterns(const Rows& rows, const FillPatterns& filledAt) {
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  const size_t bytes = rows.bytes;
  const auto fill = [&](auto tag, uint8* dst, size_t at)
                        HWY_ATTR { storeLanes(tag, filledAt(tag, nullptr, dst, at), dst + at); };
  forRows(rows, [&](uint8* row) HWY_ATTR {
    size_t i = 0;
    for (; bytes - i >= 3 * n; i += 3 * n) {
      for (size_t k = 0; kFetches && k < 3 * n; k += kCacheLine) fetchAhead(row + i + k);
      fill(d, row + i, 0);
      fill(d, row + i, n);
      fill(d, row + i, 2 * n);
    }
    forLanes(d, bytes - i, [&](auto tag, size_t k) HWY_ATTR { fill(tag, row + i, k); });
  });
}

/// Fills long rows with words that are all the same.
template <bool kFetches>
HWY_INLINE void fillWithWords(const Rows& rows, const FillPatterns& filledAt) {
  const size_t bytes = rows.bytes;
  const auto fill = [&](auto tag, uint8* dst)
                        HWY_ATTR { storeLanes(tag, filledAt(tag, nullptr, dst, 0), dst); };
  forRows(rows,
          [&](uint8* row) HWY_ATTR { forLanesOfLongRow<kFetches>(Bytes(), bytes, row, fill); });
}

bool areSame(const PixelWords& words) {
  return words.word[0] == words.word[1] && words.word[1] == words.word[2];
}

HWY_NOINLINE void fillLongRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  const bool fetches = isFetchedAhead(rows.bytes, rows.rows);
  if (areSame(keep) && areSame(flip)) {
    fetches ? fillWithWords<true>(rows, filledAt) : fillWithWords<false>(rows, filledAt);
  } else {
    fetches ? fillWithPatterns<true>(rows, filledAt) : fillWithPatterns<false>(rows, filledAt);
  }
}

/// Fills rows of two to four vectors.
HWY_NOINLINE void fillMediumRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  const size_t bytes = rows.bytes;
  const FillPatterns filledAt = {patternOf(keep), patternOf(flip)};
  forRows(rows, [&](uint8* row)
                    HWY_ATTR { storeFourVectors(Bytes(), row, nullptr, 0, bytes, filledAt); });
}

void fillRows(const Rows& rows, const PixelWords& keep, const PixelWords& flip) {
  const size_t bytes = rows.bytes;
  if (bytes > 4 * kLanes<Bytes>) return fillLongRows(rows, keep, flip);
  if (bytes > 2 * kLanes<Bytes>) return fillMediumRows(rows, keep, flip);
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

namespace raster {
namespace {

HWY_EXPORT(ropKernels);

/// The operations on single pixels, by code.
using RopOnPixel = uint32 (*)(uint32 s, uint32 d);
constexpr auto kOnPixel = HWY_NAMESPACE::ropTable([](auto rop) -> RopOnPixel {
  return [](uint32 s, uint32 d) { return decltype(rop){}(s, d); };
});

/// Units of 1, 2 or 4 bytes, each read, combined and stored before the next one is looked at.
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

}  // namespace

const RopKernels* lookUpRop() { return HWY_DYNAMIC_DISPATCH(ropKernels)(); }

uint32 ropOnPixel(uint32 rop, uint32 s, uint32 d) { return kOnPixel[rop](s, d); }

void walkRopRows(const RowPair& rows, uint32 unit, uint32 rop, Walk walk) {
  const auto& walkers = unit == 1 ? kWalkers<1> : unit == 2 ? kWalkers<2> : kWalkers<4>;
  walkers[rop](rows, walk);
}

}  // namespace raster

#endif
