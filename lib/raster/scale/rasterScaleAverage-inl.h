// SPDX-License-Identifier: MIT
//
// The sampler that averages source pixels, to reduce. Included once per instruction set.

#if defined(RASTER_SCALE_AVERAGE_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_AVERAGE_INL_H
#undef RASTER_SCALE_AVERAGE_INL_H
#else
#define RASTER_SCALE_AVERAGE_INL_H
#endif

#include <algorithm>

#include "rasterScaleDivide-inl.h"
#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "rasterScaleSource-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// The average of the source pixels from `x` on, for one destination pixel. Steps to the position
/// of the next one. `pixelAt(column)` reads the row.
template <class PixelAt>
HWY_INLINE uint32 averageColumns(const PixelAt& pixelAt, uint32& x, uint32 step, uint32 limit) {
  ChannelSums sums;
  uint32 remaining = step;
  if (fractionOf(x) != 0) {
    const uint32 part = kOnePixel - fractionOf(x);
    sums.add(pixelAt(x >> 16), part >> 8);
    remaining -= part;
    x += part;
  }
  const uint32 whole = std::min(remaining, limit - x) >> 16;
  const uint32 column = x >> 16;
  for (uint32 i = 0; i < whole; ++i) sums.add(pixelAt(column + i));
  remaining -= whole * kOnePixel;
  x += whole * kOnePixel;
  if (remaining != 0 && x < limit) {
    sums.add(pixelAt(x >> 16), fractionOf(remaining) >> 8);
    x += remaining;
  }
  // Deliberate: the divisor is the whole step even where the source ended before, so the pixel at
  // the right edge is darker.
  return sums.average(step);
}

/// Averages what is left of a row, from pixel `i` on, one pixel after the other.
template <unsigned kBytes>
void averageRest(const ScaleJob& job, const uint8* row, uint32* out, uint32 i) {
  const auto pixelAt = [row](uint32 column) {
    return loadPixel<kBytes>(row + size_t{kBytes} * column);
  };
  for (uint32 x = job.startX + i * job.stepX; i < job.width && x < job.xLimit(); ++i)
    out[i] = averageColumns(pixelAt, x, job.stepX, job.xLimit());
  std::fill(out + i, out + job.width, pixelAt(job.srcWidth - 1));
}
inline void averageRest(const ScaleJob& job, const uint8* row, uint32* out, uint32 i) {
  (job.srcBytesPerPixel == 4 ? averageRest<4> : averageRest<3>)(job, row, out, i);
}

/// The number of positions start, start + step, ... below `end`, at most `most`.
inline uint32 positionsBelow(uint32 end, uint32 start, uint32 step, uint32 most) {
  if (start >= end) return 0;
  return step == 0 ? most : std::min(most, (end - start - 1) / step + 1);
}

#if HWY_TARGET == HWY_SCALAR

class Average {
 public:
  static size_t memoryFor(const ScaleJob&) { return 0; }
  Average(const ScaleJob& job, ScaleMemory&) : job_(job) {}

  void resample(const uint8* row, uint32* out) const { averageRest(job_, row, out, 0); }

 private:
  const ScaleJob& job_;
};

#else

class Average {
 public:
  static size_t memoryFor(const ScaleJob& job) {
    return SourcePlaces::memoryFor(job) + 3 * ScaleMemory::sizeOf<uint32>(blockPixels(job));
  }

  Average(const ScaleJob& job, ScaleMemory& memory)
      : job_(job), taps_(tapsOf(job)), places_(job, taps_, memory) {
    for (uint32*& weights : weights_) weights = memory.take<uint32>(blockPixels(job));
    if (taps_ <= SourcePlaces::kMaxTaps) prepare();
  }

  /// `out` has room for whole vectors.
  void resample(const uint8* row, uint32* out) const {
    if (averaged_ != 0) {
      withDivider(job_.stepX, taps_, [&](const auto& divider) HWY_ATTR {
        places_.withReader([&](const auto& read) HWY_ATTR {
          const auto pixels = read(row);
          if (weighted_) {
            averageWeighted(pixels, out, divider);
          } else {
            averageWhole(pixels, out, divider);
          }
        });
      });
    }
    averageRest(job_, row, out, averaged_);
  }

 private:
  /// How many neighbouring source pixels a destination pixel is made of, at most. Averages of more
  /// than kMaxTaps are summed along the source row.
  static uint32 tapsOf(const ScaleJob& job) {
    const bool whole = fractionOf(job.stepX) == 0 && fractionOf(job.startX) == 0;
    const uint32 taps = whole ? job.stepX >> 16 : ((job.stepX - 1) >> 16) + 2;
    return std::min(taps, SourcePlaces::kMaxTaps + 1);
  }

  void prepare() {
    const uint32 step = job_.stepX;
    // Deliberate: the last source column is no part of an average. Pixels that meet it, or whose
    // neighbours would lie outside the row, are left to averageColumns.
    const uint32 whole = positionsBelow(job_.xLimit(), job_.startX, step, job_.width);
    const uint32 lastFirst = job_.srcWidth < taps_ ? 0 : (job_.srcWidth - taps_ + 1) * kOnePixel;
    averaged_ = positionsBelow(lastFirst, job_.startX, step, whole);
    if (averaged_ != 0 && job_.startX + uint64{averaged_} * step > job_.xLimit()) --averaged_;
    weighted_ = taps_ != step >> 16;
    const Pixels d;
    places_.forBlocks(job_.startX, averaged_, [&](size_t block, PixelVec at) HWY_ATTR {
      places_.place(block, hn::Min(hn::ShiftRight<16>(at), hn::Set(d, job_.srcWidth - taps_)));
      const PixelVec first = hn::Sub(hn::Set(d, kOnePixel), hn::And(at, hn::Set(d, kOnePixel - 1)));
      const PixelVec rest = hn::Sub(hn::Set(d, step), first);
      const PixelVec last = hn::ShiftRight<8>(hn::And(rest, hn::Set(d, kOnePixel - 1)));
      // Whether the pixel takes all of the tap before the last one.
      const auto full = hn::Eq(hn::ShiftRight<16>(rest), hn::Set(d, taps_ - 2));
      const PixelVec one = hn::Set(d, kWholeColumn);
      const auto store = [&](int tap, PixelVec weight) HWY_ATTR {
        hn::StoreU(inBothHalves(weight), d, weights_[tap] + block);
      };
      store(0, hn::ShiftRight<8>(first));
      store(1, hn::IfThenElse(full, one, last));
      store(2, hn::IfThenElseZero(full, last));
    });
  }

  HWY_INLINE HalvesVec weight(int tap, size_t i) const {
    return hn::BitCast(Halves(), hn::LoadU(Pixels(), weights_[tap] + i));
  }

  template <class Row, class Divider>
  HWY_INLINE void averageWeighted(const Row& row, uint32* out, const Divider& divider) const {
    const Pixels d;
    for (size_t i = 0; i < averaged_; i += kBlock) {
      const uint32 base = places_.base(i);
      const PixelVec index = places_.index(i);
      LaneSums sums = noSums();
      sums.add(row.pick(base, index), weight(0, i));
      for (uint32 tap = 1; tap < taps_ - 2; ++tap) sums.add(row.pick(base, index, tap));
      sums.add(row.pick(base, index, taps_ - 2), weight(1, i));
      sums.add(row.pick(base, index, taps_ - 1), weight(2, i));
      hn::StoreU(divider.average(sums.br, sums.ga), d, out + i);
    }
  }

  template <class Row, class Divider>
  HWY_INLINE void averageWhole(const Row& row, uint32* out, const Divider& divider) const {
    const Pixels d;
    for (size_t i = 0; i < averaged_; i += kBlock) {
      const uint32 base = places_.base(i);
      const PixelVec index = places_.index(i);
      LaneSums sums = noSums();
      for (uint32 tap = 0; tap < taps_; ++tap) sums.add(row.pick(base, index, tap));
      hn::StoreU(divider.average(sums.br, sums.ga), d, out + i);
    }
  }

  const ScaleJob& job_;
  const uint32 taps_;
  SourcePlaces places_;
  uint32 averaged_ = 0;    ///< leading destination pixels that vectors average
  bool weighted_ = false;  ///< whether an average has partial source pixels
  uint32* weights_[3];
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
