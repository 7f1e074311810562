// SPDX-License-Identifier: MIT
//
// Fill and copy: the kernels. One walks rows (frameBuffer.h) and runs one row loop (rows-inl.h).

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/ops/rasteropsKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "vector/byteRows-inl.h"
#include "vector/pixelPattern-inl.h"
#include "ops/rasteropsInternal.h"
#include "vector/longRuns.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Bytes = hn::ScalableTag<uint8>;

#if HWY_TARGET == HWY_SCALAR

// Rows without bytes may have no address: the C library is not told of them.

void fillRows(const Rows& rows, const PixelWords& pixels) {
  if (rows.bytes == 0) return;
  forRows(rows, [&](uint8* row) {
    size_t i = 0;
    for (; rows.bytes - i >= sizeof pixels; i += sizeof pixels)
      memcpy(row + i, &pixels, sizeof pixels);
    memcpy(row + i, &pixels, rows.bytes - i);
  });
}

void copyRows(const RowPair& rows) {
  if (rows.bytes == 0) return;
  forRows(rows, [&](uint8* dst, const uint8* src) { memmove(dst, src, rows.bytes); });
}

#else

/// Fills rows of at least one vector with the three vectors that start the pattern, over and over.
/// The end of a row is stored as one vector that overlaps what is there already.
template <class D, class V = hn::Vec<D>>
HWY_INLINE void fillLongRows(D d, const Rows& rows, V first, V second, V third, V last) {
  constexpr size_t n = kLanes<D>;
  const size_t bytes = rows.bytes;  // read here, as a store to a pixel might change it
  forRows(rows, [&](uint8* row) HWY_ATTR {
    size_t i = 0;
    for (; bytes - i >= 3 * n; i += 3 * n) {
      hn::StoreU(first, d, row + i);
      hn::StoreU(second, d, row + i + n);
      hn::StoreU(third, d, row + i + 2 * n);
    }
    if (bytes - i >= n) hn::StoreU(first, d, row + i);
    if (bytes - i >= 2 * n) hn::StoreU(second, d, row + i + n);
    hn::StoreU(last, d, row + bytes - n);
  });
}

/// Fills with words that are all the same.
HWY_INLINE void fillWithWord(const Rows& rows, uint32 word) {
  const auto fill = [&](auto d) HWY_ATTR __attribute__((always_inline)) {
    const auto same = hn::BitCast(d, hn::Set(hn::Repartition<uint32, decltype(d)>(), word));
    fillLongRows(d, rows, same, same, same, same);
  };
  const bool filled = withLargestVector<sizeof word>(Bytes(), rows.bytes, fill);
  if (!filled && rows.bytes != 0)
    forRows(rows, [&](uint8* row) HWY_ATTR { memcpy(row, &word, rows.bytes); });
}

HWY_NOINLINE void fillWithPattern(const Rows& rows, const PixelWords& pixels) {
  const Bytes d;
  const size_t n = hn::Lanes(d);
  const size_t bytes = rows.bytes;
  const PixelPattern pattern = patternOf(pixels);
  if (bytes >= n) {
    const size_t lastPhase = (bytes - n) % sizeof pixels;
    fillLongRows(d, rows, hn::LoadU(d, pattern.bytes), hn::LoadU(d, pattern.bytes + n),
                 hn::LoadU(d, pattern.bytes + 2 * n), hn::LoadU(d, pattern.bytes + lastPhase));
    return;
  }
  const auto patternAt = [&](auto tag, const uint8* /*src*/, const uint8* /*dst*/, size_t at)
                             HWY_ATTR { return loadLanes(tag, pattern.bytes + at); };
  withShortRow(d, bytes, patternAt, [&](auto row) HWY_ATTR {
    forRows(rows, [&](uint8* dst) HWY_ATTR { row(dst, nullptr, bytes); });
  });
}

/// Fills rows of more than three vectors past the caches.
HWY_NOINLINE void fillFarRows(const Rows& rows, const PixelWords& pixels) {
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  const size_t bytes = rows.bytes;
  const PixelPattern pattern = patternOf(pixels);
  const uint8* const lastPixels = pattern.bytes + (bytes - n) % sizeof pixels;
  forRows(rows, [&](uint8* row) HWY_ATTR {
    size_t i = n - reinterpret_cast<uintptr_t>(row) % n;
    const uint8* const pixelsFromThere = pattern.bytes + i;
    const auto first = loadLanes(d, pixelsFromThere);
    const auto second = loadLanes(d, pixelsFromThere + n);
    const auto third = loadLanes(d, pixelsFromThere + 2 * n);
    storeLanes(d, loadLanes(d, pattern.bytes), row);
    for (; bytes - i >= 3 * n; i += 3 * n) {
      putLanes<true>(d, first, row + i);
      putLanes<true>(d, second, row + i + n);
      putLanes<true>(d, third, row + i + 2 * n);
    }
    if (bytes - i >= n) putLanes<true>(d, first, row + i);
    if (bytes - i >= 2 * n) putLanes<true>(d, second, row + i + n);
    storeLanes(d, loadLanes(d, lastPixels), row + bytes - n);
  });
  endStreams();
}

HWY_NOINLINE void fillLongRuns(const Rows& rows, uint32 word) {
  const size_t bytes = rows.bytes;
  forRows(rows, [=](uint8* row) { storeLongRun(row, word, bytes); });
}

/// Whether the processor's string instructions store more at once than vectors do.
constexpr bool kHasShortVectors = kLanes<Bytes> == 16;

/// The shortest row that is filled or copied as a long run; that is copied by the same instructions
/// in the inner caches, where it depends on the vectors that are the alternative; and for which
/// anything but these is thought of.
constexpr size_t kMinFilledRun = 2048;
constexpr size_t kMinCopiedRun = 256 * 1024;
constexpr size_t kMinNearRun = HWY_TARGET == HWY_AVX3 ? 32 * 1024 : 4096;
constexpr size_t kMinFarRow = 2048;

void fillRows(const Rows& rows, const PixelWords& pixels) {
  const uint32* const word = pixels.word;
  const bool isWord = word[0] == word[1] && word[1] == word[2];
  if (isWord && areLongRuns(rows.bytes, rows.rows, kMinFilledRun, kHasShortVectors))
    return fillLongRuns(rows, word[0]);
  if (isStreamed(rows.bytes, rows.bytes, rows.rows)) return fillFarRows(rows, pixels);
  isWord ? fillWithWord(rows, word[0]) : fillWithPattern(rows, pixels);
}

/// The lanes of the source.
constexpr auto kCopied = [](auto d, const uint8* src, const uint8* /*dst*/, size_t at)
                             HWY_ATTR { return loadLanes(d, src + at); };

/// As memmove, of more than two vectors.
void moveRow(uint8* dst, const uint8* src, size_t bytes) {
  const uintptr_t ahead = reinterpret_cast<uintptr_t>(dst) - reinterpret_cast<uintptr_t>(src);
  if (ahead >= bytes) {
    storeLongRow<Walk::kToRight>(dst, src, bytes, kCopied);
  } else {
    storeLongRow<Walk::kToLeft>(dst, src, bytes, kCopied);
  }
}

// Rows up to here are moved by moveRow, which is faster than the C library's memmove for them: in
// the nearest cache, and on 32-bit x86, for which few are written, in the next one too, or anywhere
// where vectors are longer than those few use.
constexpr size_t kMaxOwnBytes = sizeof(void*) == 8       ? 16 * 1024
                                : HWY_TARGET <= HWY_AVX2 ? SIZE_MAX
                                                         : 256 * 1024;
// The C library may know longer vectors; but it is slow with long rows from right to left.
constexpr size_t kMaxOwnCopied = kHasShortVectors && sizeof(void*) == 8 ? 128 : kMaxOwnBytes;

/// Whether no row shares bytes with any row of the source.
bool areApart(const RowPair& rows) {
  return RowSpan(rows.dst, rows.dstStep, rows.bytes, rows.rows)
      .isApartFrom(RowSpan(rows.src, rows.srcStep, rows.bytes, rows.rows));
}

/// Copies rows of at least kMinFarRow bytes where vectors in the caches are not the quickest, and
/// where no row shares bytes with the source. Returns whether it did.
HWY_NOINLINE bool copyFarRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  const bool longRuns = areLongRuns(bytes, rows.rows, kMinCopiedRun);
  const bool streamed = !longRuns && isStreamed(bytes, 2 * bytes, rows.rows);
  const bool runs = longRuns || (!streamed && bytes >= kMinNearRun && hasFastStringInstructions());
  if (!(runs || streamed) || !areApart(rows)) return false;
  if (runs) {
    forRows(rows, [=](uint8* dst, const uint8* src) { copyLongRun(dst, src, bytes); });
  } else {
    forRows(rows, [&](uint8* dst, const uint8* src)
                      HWY_ATTR { streamLongRow(dst, src, bytes, kCopied); });
    endStreams();
  }
  return true;
}

HWY_NOINLINE void copyLongRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  if (bytes >= kMinFarRow && copyFarRows(rows)) return;
  const size_t maxOwn = rows.overlap() ? kMaxOwnBytes : kMaxOwnCopied;
  forRows(rows, [&](uint8* dst, const uint8* src) HWY_ATTR {
    if (bytes <= maxOwn) {
      moveRow(dst, src, bytes);
    } else {
      memmove(dst, src, bytes);
    }
  });
}

/// Copies rows of two to four vectors.
HWY_NOINLINE void copyMediumRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  forRows(rows, [&](uint8* dst, const uint8* src)
                    HWY_ATTR { storeFourVectors(Bytes(), dst, src, 0, bytes, kCopied); });
}

// Functions of their own, as the short rows need nothing from the stack and so no alignment of it.
void copyRows(const RowPair& rows) {
  const size_t bytes = rows.bytes;
  if (bytes > 2 * kLanes<Bytes>)
    return bytes > 4 * kLanes<Bytes> ? copyLongRows(rows) : copyMediumRows(rows);
  withShortRow(Bytes(), bytes, kCopied, [&](auto copy) HWY_ATTR {
    forRows(rows, [&](uint8* dst, const uint8* src) HWY_ATTR { copy(dst, src, bytes); });
  });
}

#endif

/// Gives pixels an alpha.
struct AlphaFill {
  uint32 alphaBits;

  template <class D> HWY_INLINE void operator()(D d, uint8* at) const {
    const auto color = hn::And(loadLanes(d, at), hn::Set(d, 0x00FFFFFFu));
    storeLanes(d, hn::Or(color, hn::Set(d, alphaBits)), at);
  }
};

template <bool kFetches> HWY_INLINE void fillAlphaOfRows(const Rows& rows, AlphaFill fill) {
  const size_t pixels = rows.bytes / 4;
  forRows(rows, [&](uint8* row) HWY_ATTR {
    forLanesOfLongRow<kFetches>(hn::ScalableTag<uint32>(), pixels, row, fill);
  });
}

HWY_NOINLINE void fillAlphaOfLongRows(const Rows& rows, uint32 alphaBits) {
  isFetchedAhead(rows.bytes, rows.rows) ? fillAlphaOfRows<true>(rows, {alphaBits})
                                        : fillAlphaOfRows<false>(rows, {alphaBits});
}

// On its own: GCC would make something else of a loop that it knows to be short.
HWY_NOINLINE void fillAlphaOfShortRows(const Rows& rows, uint32 alphaBits) {
  const AlphaFill fill{alphaBits};
  const size_t pixels = rows.bytes / 4;
  forRows(rows, [&](uint8* row) HWY_ATTR {
    forLanes(hn::ScalableTag<uint32>(), pixels,
             [&](auto d, size_t x) HWY_ATTR { fill(d, row + 4 * x); });
  });
}

void fillAlphaRows(const Rows& rows, uint32 alphaBits) {
  rows.bytes > 16 * kLanes<Bytes> ? fillAlphaOfLongRows(rows, alphaBits)
                                  : fillAlphaOfShortRows(rows, alphaBits);
}

constexpr RasteropsKernels kKernels = {fillRows, copyRows, fillAlphaRows};

}  // namespace

const RasteropsKernels* rasteropsKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(rasteropsKernels);

}  // namespace

const RasteropsKernels* lookUpRasterops() { return HWY_DYNAMIC_DISPATCH(rasteropsKernels)(); }

}  // namespace raster

#endif
