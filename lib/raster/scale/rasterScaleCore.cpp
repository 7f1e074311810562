// SPDX-License-Identifier: MIT
//
// The scaler: destination rows from source rows that are resampled horizontally and kept for as
// long as further destination rows need them.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/scale/rasterScaleCore.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "rasterScaleAverage-inl.h"
#include "rasterScaleDirect-inl.h"
#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "rasterScaleMix-inl.h"
#include "rasterScaleNearest-inl.h"
#include "rasterScaleRows-inl.h"
#include "rasterScaleShort-inl.h"
#include "rasterScaleWhole-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// No source row: their numbers are below 32768.
constexpr uint32 kNoRow = ~0u;

/// Source rows resampled to the width of the destination, as 4-byte pixels. There are slots for the
/// rows that one destination row needs; a row's number, modulo theirs, tells its slot.
template <class Sampler> class RowCache {
 public:
  static size_t memoryFor(const ScaleJob& job) {
    return slotsOf(job) * ScaleMemory::sizeOf<uint32>(blockPixels(job));
  }

  RowCache(const ScaleJob& job, const Sampler& sampler, ScaleMemory& memory)
      : job_(job), sampler_(sampler), slots_(slotsOf(job)) {
    const size_t pitch = blockPixels(job);
    for (uint32 slot = 0; slot < slots_; ++slot) {
      slot_[slot] = {memory.take<uint32>(pitch), kNoRow};
    }
  }

  /// The row at a vertical position.
  HWY_INLINE const uint32* at(uint32 position) {
    const uint32 row = job_.rowOf(position);
    // Slots are mostly a power of two, whose remainder needs no division.
    const uint32 mask = slots_ - 1;
    Slot& slot = slot_[(slots_ & mask) == 0 ? row & mask : row % slots_];
    if (slot.row != row) fill(slot, row);
    return slot.pixels;
  }

 private:
  struct Slot {
    uint32* pixels;
    uint32 row;
  };

  HWY_NOINLINE void fill(Slot& slot, uint32 row) {
    slot.row = row;
    sampler_.resample(job_.srcRow(row), slot.pixels);
  }

  static uint32 slotsOf(const ScaleJob& job) {
    if (!job.smooth) return 1;
    return std::min(((job.stepY + kOnePixel - 1) >> 16) + 1, kMaxRows);
  }

  const ScaleJob& job_;
  const Sampler& sampler_;
  const uint32 slots_;
  Slot slot_[kMaxRows];
};

/// The rows that the destination row at `y` averages: at most kMaxRows, a partial first one
/// included.
template <class Cache> WeightedRows rowsOfStep(Cache& cache, uint32 y, uint32 step) {
  WeightedRows rows;
  rows.count = 0;
  const auto add = [&](uint32 weight) {
    rows.row[rows.count] = cache.at(y);
    rows.weight[rows.count++] = weight;
  };
  uint32 remaining = step;
  if (fractionOf(y) != 0) {
    const uint32 part = kOnePixel - fractionOf(y);
    add(part >> 8);
    remaining -= part;
    y += part;
  }
  for (; remaining >= kOnePixel && rows.count < kMaxRows; y += kOnePixel, remaining -= kOnePixel)
    add(kWholeRow);
  if (remaining != 0 && rows.count < kMaxRows) add(fractionOf(remaining) >> 8);
  return rows;
}

/// Mixed or averaged rows.
template <unsigned kBytes, bool kStreams, class Cache>
void drawSmoothRows(const ScaleJob& job, Cache& cache) {
  const bool enlarges = job.stepY < kOnePixel;
  uint32 y = job.startY - (enlarges ? kHalfPixel : 0);
  uint8* dst = job.dst;
  for (uint32 i = 0; i < job.height; ++i, y += job.stepY, dst = nextRow(dst, job.dstPitch)) {
    if (enlarges) {
      const uint32* upper = cache.at(y);
      mixRows<kBytes, kStreams>(dst, upper, cache.at(y + kOnePixel), mixWeights(y), job.width);
    } else {
      averageRows<kBytes, kStreams>(dst, rowsOfStep(cache, y, job.stepY), job.stepY, job.width);
    }
  }
  if (kStreams) endStreams();
}

/// 24-bit pixels from a row of 32-bit ones. Deliberate: the walk takes every fourth pixel (16 bytes
/// a step), zeros once the row is used up, and the last pixel of the destination stays as it was.
void storeSparseRow(uint8* dst, const uint32* row, uint32 width, size_t bytesPerPixel) {
  for (uint32 i = 0; i + 1 < width; ++i, dst += bytesPerPixel)
    storePixel<3>(dst, size_t{4} * i < width ? row[size_t{4} * i] : 0);
}

/// One destination row from one source row without mixing.
void storePlainRow(const ScaleJob& job, uint8* dst, const uint32* row) {
  if (job.depthsDiffer && job.dstBytesPerPixel == 2) {
    storeRow565(dst, row, job.width);
  } else if (job.depthsDiffer) {
    for (uint32 i = 0; i < job.width; ++i, dst += job.dstBytesPerPixel)
      storePixel<2>(dst, convertColor<Code32, Code16>(row[i]));
  } else if (job.sizesDiffer) {
    storeSparseRow(dst, row, job.width, job.dstBytesPerPixel);
  } else if (job.dstBytesPerPixel == 4) {
    storeRow<4>(dst, row, job.width);
  } else {
    storeRow<3>(dst, row, job.width);
  }
}

/// Destination rows that are one source row each, made by drawRow(dst, row number, position). Rows
/// that show the same one are copied where they are whole pixels.
template <class DrawRow>
HWY_INLINE void drawPlainRows(const ScaleJob& job, bool wholePixels, const DrawRow& drawRow) {
  const size_t bytes = job.rowBytes();
  uint32 y = job.startY;
  uint32 shown = 0;
  uint8* dst = job.dst;
  for (uint32 i = 0; i < job.height; ++i, y += job.stepY, dst = nextRow(dst, job.dstPitch)) {
    const uint32 row = job.rowOf(y);
    if (wholePixels && i != 0 && row == shown) {
      copyRow(dst, nextRow(dst, -job.dstPitch), bytes);
    } else {
      drawRow(dst, row, y);
    }
    shown = row;
  }
}

/// Destination rows that are one source row each, in the same format: made by sample(source row,
/// pixels) in `sampled`, and copied from there.
template <class Sample>
void drawSampledRows(const ScaleJob& job, uint8* sampled, const Sample& sample) {
  uint32 held = kNoRow;
  drawPlainRows(job, false, [&](uint8* dst, uint32 row, uint32) {
    if (row != held) sample(job.srcRow(row), sampled);
    held = row;
    memcpy(dst, sampled, job.rowBytes());
  });
}

template <unsigned kBytes> void drawShortPixels(const ScaleJob& job) {
  ScaleMemory memory(ShortColumns<kBytes>::memoryFor(job) +
                     ScaleMemory::sizeOf<uint8>(job.rowBytes()));
  const ShortColumns<kBytes> columns(job, memory);
  if (job.isApart()) {
    drawPlainRows(job, true,
                  [&](uint8* dst, uint32 row, uint32) { columns.sample(job.srcRow(row), dst); });
  } else {
    drawSampledRows(job, memory.take<uint8>(job.rowBytes()),
                    [&](const uint8* row, uint8* out) { columns.sample(row, out); });
  }
}

/// Nearest sampling of pixels of any size.
void drawWidePixels(const ScaleJob& job) {
  const size_t size = job.srcBytesPerPixel;
  ScaleMemory memory(ScaleMemory::sizeOf<uint8>(job.rowBytes()));
  drawSampledRows(job, memory.take<uint8>(job.rowBytes()), [&](const uint8* row, uint8* out) {
    uint32 x = job.startX;
    for (uint32 j = 0; j < job.width; ++j) {
      const bool inside = x < job.xLimit();
      memcpy(out + j * size, row + (inside ? x >> 16 : job.srcWidth - 1) * size, size);
      if (inside) x += job.stepX;
    }
  });
}

/// Nearest sampling of 4-byte pixels that are written where they belong at once.
template <class Sampler, bool kStreams> HWY_NOINLINE void drawNearestTo(const ScaleJob& job) {
  ScaleMemory memory(Sampler::memoryFor(job));
  Sampler(job, memory).template draw<kStreams>();
}
void drawNearest(const ScaleJob& job) {
  constexpr size_t kFewPixels = 32;
  if (size_t{job.width} * job.height <= kFewPixels) return drawNearestTo<PlainNearest, false>(job);
  if (drawDirect<EachTwice>(job) || drawDirect<EveryOther>(job)) return;
  (areStreamed(job) ? drawNearestTo<Nearest, true> : drawNearestTo<Nearest, false>)(job);
}

/// Whether mixed and averaged rows may go past the caches. In vectors of 16 bytes, with as much to
/// compute between them, that takes longer.
constexpr bool kStreamsSmooth = 4 * kBlock >= 32;

/// Everything else: source rows are resampled and kept, and made into destination rows.
template <class Sampler> void drawWith(const ScaleJob& job, bool apart) {
  ScaleMemory memory(Sampler::memoryFor(job) + RowCache<Sampler>::memoryFor(job));
  const Sampler sampler(job, memory);
  RowCache<Sampler> cache(job, sampler, memory);
  if (job.smoothRows()) {
    if (job.dstBytesPerPixel == 3) {
      drawSmoothRows<3, false>(job, cache);
    } else if (kStreamsSmooth && areStreamed(job)) {
      drawSmoothRows<4, true>(job, cache);
    } else {
      drawSmoothRows<4, false>(job, cache);
    }
  } else {
    const bool wholePixels = !job.converts() || (job.depthsDiffer && job.dstBytesPerPixel == 2);
    drawPlainRows(job, apart && wholePixels,
                  [&](uint8* dst, uint32, uint32 y) { storePlainRow(job, dst, cache.at(y)); });
  }
}

void drawScaled(const ScaleJob& job) {
  if (job.srcBytesPerPixel == 0) return;
  if (job.srcBytesPerPixel > 4) return drawWidePixels(job);
  if (job.srcBytesPerPixel == 1) return drawShortPixels<1>(job);
  if (job.srcBytesPerPixel == 2) return drawShortPixels<2>(job);
  const bool apart = job.isApart();
  if (apart && drawWholeSteps(job)) return;
  if (apart && !job.smooth && !job.converts() && job.dstBytesPerPixel == 4) return drawNearest(job);
  if (!job.smoothColumns()) return drawWith<Nearest>(job, apart);
  if (job.stepX < kOnePixel) return drawWith<Mix>(job, apart);
  drawWith<Average>(job, apart);
}

constexpr ScaleKernels kKernels = {drawScaled};

}  // namespace

const ScaleKernels* scaleKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(scaleKernels);

}  // namespace

const ScaleKernels* lookUpScale() { return HWY_DYNAMIC_DISPATCH(scaleKernels)(); }

}  // namespace raster

#endif
