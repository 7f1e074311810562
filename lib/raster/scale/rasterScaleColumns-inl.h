// SPDX-License-Identifier: MIT
//
// Horizontal resampling: from a source row to a row of 4-byte pixels with the width of the
// destination. Included once per instruction set.
//
// Which source pixels make a destination pixel, and with which weights, is the same for every row.
// It is worked out once per call, as tables with one entry per destination pixel; a row is then a
// walk over vectors of destination pixels. The level without vectors walks the positions
// themselves.

#if defined(RASTER_SCALE_COLUMNS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_COLUMNS_INL_H
#undef RASTER_SCALE_COLUMNS_INL_H
#else
#define RASTER_SCALE_COLUMNS_INL_H
#endif

#include <algorithm>

#include "rasterScaleDivide-inl.h"
#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "vector/rows-inl.h"
#include "vector/triples-inl.h"

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

/// The number of positions start, start + step, ... below `end`, at most `most`.
inline uint32 positionsBelow(uint32 end, uint32 start, uint32 step, uint32 most) {
  if (start >= end) return 0;
  return step == 0 ? most : std::min(most, (end - start - 1) / step + 1);
}

#if HWY_TARGET == HWY_SCALAR

inline void copyRow(uint8* dst, const uint8* src, size_t bytes) { memcpy(dst, src, bytes); }

/// The horizontal resampler of one call.
class Columns {
 public:
  static size_t memoryFor(const ScaleJob&) { return 0; }
  static size_t rowPixels(const ScaleJob& job) { return job.width; }

  Columns(const ScaleJob& job, ScaleMemory&) : job_(job) {}

  /// Resamples a source row of 3- or 4-byte pixels.
  void resample(const uint8* row, uint32* out) const {
    if (job_.srcBytesPerPixel == 4) {
      resampleAs<4>(row, out);
    } else {
      resampleAs<3>(row, out);
    }
  }

  /// Nearest sampling of a row of 4-byte pixels, written where it belongs: not a byte beyond.
  void sample(const uint8* row, uint8* out) const {
    for (uint32 i = 0, x = job_.startX; i < job_.width; ++i, out += 4) {
      const bool inside = x < job_.xLimit();
      const size_t column = inside ? x >> 16 : job_.srcWidth - 1;
      storePixel<4>(out, loadPixel<4>(row + 4 * column));
      if (inside) x += job_.stepX;
    }
  }

 private:
  template <unsigned kBytes> void resampleAs(const uint8* row, uint32* out) const {
    const auto pixelAt = [row](uint32 column) { return loadPixel<kBytes>(row + column * kBytes); };
    uint32* const end = out + job_.width;
    const uint32 step = job_.stepX;
    const uint32 limit = job_.xLimit();
    uint32 x = job_.startX;
    if (!job_.smoothColumns()) {
      for (; out != end && x < limit; x += step) *out++ = pixelAt(x >> 16);
    } else if (step < kOnePixel) {
      x -= kHalfPixel;
      for (; out != end && static_cast<int32>(x) < 0; x += step) *out++ = pixelAt(0);
      for (; out != end && x < limit; x += step)
        *out++ = mixPixels(pixelAt(x >> 16), pixelAt((x >> 16) + 1), mixWeights(x));
    } else {
      while (out != end && x < limit) *out++ = averageColumns(pixelAt, x, step, limit);
    }
    std::fill(out, end, pixelAt(job_.srcWidth - 1));
  }

  const ScaleJob& job_;
};

#else

/// How far the source pixels of one vector of destination pixels lie apart: within one vector, two,
/// or anywhere.
enum class Reach { kOne, kTwo, kAny };

inline Reach reachOf(uint32 step) {
  if (step <= kOnePixel) return Reach::kOne;
  return step <= 2 * kOnePixel ? Reach::kTwo : Reach::kAny;
}

/// The pixels at `index`, counted from `row`. For kAny these are whole columns; otherwise they are
/// below one or two times kBlock.
template <Reach kReach> HWY_INLINE PixelVec pickPixels(const uint8* row, PixelVec index) {
  const Pixels d;
  if constexpr (kReach == Reach::kOne) {
    return hn::TableLookupLanes(loadLanes(d, row), hn::IndicesFromVec(d, index));
  } else if constexpr (kReach == Reach::kTwo) {
    const PixelVec low = loadLanes(d, row);
    const PixelVec high = loadLanes(d, row + 4 * kBlock);
#if HWY_TARGET == HWY_AVX3
    return PixelVec{_mm512_permutex2var_epi32(low.raw, index.raw, high.raw)};
#else
    const auto within = [&](PixelVec i) {
      return hn::IndicesFromVec(d, hn::And(i, hn::Set(d, uint32{kBlock - 1})));
    };
    const auto inHigh = hn::Gt(hn::BitCast(hn::RebindToSigned<Pixels>(), index),
                               hn::Set(hn::RebindToSigned<Pixels>(), int32{kBlock - 1}));
    return hn::IfThenElse(hn::RebindMask(d, inHigh), hn::TableLookupLanes(high, within(index)),
                          hn::TableLookupLanes(low, within(index)));
#endif
  } else {
#if HWY_TARGET <= HWY_AVX2
    const void* base = row;
    return hn::GatherIndex(d, static_cast<const uint32*>(base),
                           hn::BitCast(hn::RebindToSigned<Pixels>(), index));
#else
    alignas(16) uint32 pixels[kBlock];
    hn::Store(index, d, pixels);
    for (uint32& pixel : pixels) pixel = loadPixel<4>(row + size_t{4} * pixel);
    return hn::Load(d, pixels);
#endif
  }
}

/// The mix of two vectors of pixels; weights fill both halves of their pixel.
HWY_INLINE PixelVec mixLanes(PixelVec p0, PixelVec p1, HalvesVec w0, HalvesVec w1) {
  const Halves d;
  const HalvesVec v0 = hn::BitCast(d, p0);
  const HalvesVec v1 = hn::BitCast(d, p1);
  const HalvesVec even = hn::Set(d, uint16{255});
  const HalvesVec low = hn::Add(hn::Mul(hn::And(v0, even), w0), hn::Mul(hn::And(v1, even), w1));
  const HalvesVec high =
      hn::Add(hn::Mul(hn::ShiftRight<8>(v0), w0), hn::Mul(hn::ShiftRight<8>(v1), w1));
  return hn::BitCast(Pixels(), hn::Or(hn::ShiftRight<8>(low), hn::AndNot(even, high)));
}

/// A vector of 3-byte pixels as 4-byte ones, the fourth byte being 0. Reads 4 * kBlock bytes.
HWY_INLINE PixelVec widenPixels(const uint8* at) {
  return spreadTriples(Pixels(), loadLanes(Pixels(), at));
}

/// Copies a run of a few vectors at most, without a call.
HWY_INLINE void copyShort(uint8* dst, const uint8* src, size_t bytes) {
  forLanes(hn::Repartition<uint8, Pixels>(), bytes,
           [=](auto d, size_t i) { hn::StoreU(hn::LoadU(d, src + i), d, dst + i); });
}

/// Copies a row. Small rectangles have many short ones.
HWY_INLINE void copyRow(uint8* dst, const uint8* src, size_t bytes) {
  if (bytes > 16 * kBlock) {
    memcpy(dst, src, bytes);
  } else {
    copyShort(dst, src, bytes);
  }
}

/// Widens a row of 3-byte pixels; reads exactly that. `out` has room for a vector more.
HWY_INLINE void widenRow(const uint8* row, uint32 count, uint8* out) {
  const Pixels d;
  uint32 i = 0;
  for (; size_t{3} * (count - i) >= 4 * kBlock; i += kBlock)
    storeLanes(d, widenPixels(row + size_t{3} * i), out + size_t{4} * i);
  for (; i < count; i += kBlock) {
    uint8 rest[4 * kBlock] = {};
    copyShort(rest, row + size_t{3} * i, size_t{3} * std::min<size_t>(count - i, kBlock));
    storeLanes(d, widenPixels(rest), out + size_t{4} * i);
  }
}

/// Stores the first `count` lanes.
HWY_INLINE void storeSome(PixelVec pixels, size_t count, uint8* at) {
  const Pixels d;
  if (count == kBlock) {
    storeLanes(d, pixels, at);
  } else {
#if HWY_TARGET <= HWY_AVX2
    void* to = at;
    hn::BlendedStore(pixels, hn::FirstN(d, count), d, static_cast<uint32*>(to));
#else
    uint8 all[4 * kBlock];
    storeLanes(d, pixels, all);
    copyShort(at, all, 4 * count);
#endif
  }
}

/// The horizontal resampler of one call.
class Columns {
 public:
  static size_t memoryFor(const ScaleJob& job) {
    return kTables * ScaleMemory::sizeOf<uint32>(rowPixels(job)) +
           ScaleMemory::sizeOf<uint32>(stagedPixels(job));
  }
  /// The room of a resampled row: whole vectors.
  static size_t rowPixels(const ScaleJob& job) {
    return (job.width + kBlock - 1) / kBlock * kBlock;
  }

  Columns(const ScaleJob& job, ScaleMemory& memory) : job_(job) {
    taps_ = tapsOf(job);
    const bool narrow = job.srcWidth < 2 * kBlock + taps_;
    if (job.srcBytesPerPixel != 4 || narrow) {
      staged_ = memory.take<uint32>(stagedPixels(job));
      std::fill_n(staged_, stagedPixels(job), 0);
    }
    reach_ = reachOf(job.stepX);
    lastBase_ = (staged_ != nullptr ? static_cast<uint32>(stagedPixels(job)) : job.srcWidth) -
                taps_ + 1 - (reach_ == Reach::kOne ? 1 : 2) * kBlock;
    for (uint32*& table : tables_) table = memory.take<uint32>(rowPixels(job));
    if (!job.smoothColumns()) {
      prepareNearest();
    } else if (job.stepX < kOnePixel) {
      prepareMix();
    } else {
      prepareAverage();
    }
  }

  /// Resamples a source row of 3- or 4-byte pixels. `out` has room for whole vectors.
  void resample(const uint8* row, uint32* out) const {
    const uint8* pixels = stage(row);
    auto* to = reinterpret_cast<uint8*>(out);
    if (!job_.smoothColumns()) {
      withReach([&](auto reach) { nearest<decltype(reach)::value>(pixels, to, rowPixels(job_)); });
    } else if (job_.stepX < kOnePixel) {
      mix(pixels, to);
    } else {
      average(pixels, out);
    }
  }

  /// Nearest sampling of a row of 4-byte pixels, written where it belongs: not a byte beyond.
  void sample(const uint8* row, uint8* out) const {
    const uint8* pixels = stage(row);
    withReach([&](auto reach) { nearest<decltype(reach)::value>(pixels, out, job_.width); });
  }

 private:
  static constexpr int kTables = 5;
  /// Averages of more source pixels are summed along the source row.
  static constexpr uint32 kMaxTaps = 10;

  /// How many neighbouring source pixels a destination pixel is made of, at most.
  static uint32 tapsOf(const ScaleJob& job) {
    if (!job.smoothColumns()) return 1;
    if (job.stepX < kOnePixel) return 2;
    const bool whole = fractionOf(job.stepX) == 0 && fractionOf(job.startX) == 0;
    const uint32 taps = whole ? job.stepX >> 16 : ((job.stepX - 1) >> 16) + 2;
    return std::min(taps, kMaxTaps + 1);
  }
  static size_t stagedPixels(const ScaleJob& job) { return job.srcWidth + 2 * kBlock + kMaxTaps; }

  template <class Body> HWY_INLINE void withReach(const Body& body) const {
    switch (reach_) {
      case Reach::kOne:
        return body(std::integral_constant<Reach, Reach::kOne>());
      case Reach::kTwo:
        return body(std::integral_constant<Reach, Reach::kTwo>());
      case Reach::kAny:
        return body(std::integral_constant<Reach, Reach::kAny>());
    }
  }

  /// The row as 4-byte pixels with room to read whole vectors.
  const uint8* stage(const uint8* row) const {
    if (staged_ == nullptr) return row;
    auto* to = reinterpret_cast<uint8*>(staged_);
    if (job_.srcBytesPerPixel == 3) {
      widenRow(row, job_.srcWidth, to);
    } else {
      copyRow(to, row, size_t{4} * job_.srcWidth);
    }
    return to;
  }

  /// The distances of a block's pixels from its first one, at most 2^32 - 1.
  PixelVec laneSteps() const {
    const Pixels d;
    if (job_.stepX < 0xFFFFFFFF / kBlock) return hn::Mul(hn::Iota(d, 0), hn::Set(d, job_.stepX));
    uint32 steps[kBlock];
    for (size_t i = 0; i < kBlock; ++i)
      steps[i] = static_cast<uint32>(std::min<uint64>(uint64{job_.stepX} * i, 0xFFFFFFFF));
    return hn::LoadU(d, steps);
  }

  /// Calls body(block, positions) for the blocks of the first `count` columns, from the position
  /// `start` on. Positions beyond the last column are taken back to it, those before -2^30 to
  /// there.
  template <class Body>
  HWY_INLINE void forBlocks(int64 start, size_t count, const Body& body) const {
    constexpr int64 kLow = -(int64{1} << 30);
    const Pixels d;
    const PixelVec steps = laneSteps();
    const auto limit = int64{job_.xLimit()};
    const int64 blockStep = int64{job_.stepX} * static_cast<int64>(kBlock);
    for (size_t block = 0; block < count; block += kBlock, start += blockStep) {
      const int64 x = std::clamp(start, kLow, limit);
      body(block, hn::Add(hn::Set(d, static_cast<uint32>(x)),
                          hn::Min(steps, hn::Set(d, static_cast<uint32>(limit - x)))));
    }
  }

  /// Stores where a block's source pixels are: a first column from which whole vectors can be read,
  /// and the pixels' places from there.
  HWY_INLINE void place(size_t block, PixelVec columns) {
    const Pixels d;
    const uint32 first = reach_ == Reach::kAny ? 0 : std::min(hn::GetLane(columns), lastBase_);
    base_[block / kBlock] = first;
    hn::StoreU(hn::Sub(columns, hn::Set(d, first)), d, index_ + block);
  }

  /// A weight of each lane in both halves.
  HWY_INLINE static PixelVec inBothHalves(PixelVec weight) {
    return hn::Or(weight, hn::ShiftLeft<16>(weight));
  }

  void prepareNearest() {
    forBlocks(job_.startX, rowPixels(job_),
              [&](size_t block, PixelVec at) { place(block, hn::ShiftRight<16>(at)); });
  }

  /// Both edges are part of the tables: the outer pixels get the full weight of their only
  /// neighbour.
  void prepareMix() {
    const Pixels d;
    const hn::RebindToSigned<Pixels> di;
    const auto limit = hn::Set(di, static_cast<int32>(job_.xLimit()));
    const uint32 lastPair = job_.srcWidth < 2 ? 0 : job_.srcWidth - 2;
    const bool single = job_.srcWidth < 2;
    const auto whole = hn::Set(di, int32{256});
    forBlocks(static_cast<int32>(job_.startX - kHalfPixel), rowPixels(job_),
              [&](size_t block, PixelVec position) {
                const auto at = hn::BitCast(di, position);
                const auto before = single ? hn::Eq(at, at) : hn::Lt(at, hn::Zero(di));
                const auto beyond = hn::Eq(at, limit);
                const auto inside = hn::Max(at, hn::Zero(di));
                place(block,
                      hn::Min(hn::ShiftRight<16>(hn::BitCast(d, inside)), hn::Set(d, lastPair)));
                auto w1 = hn::And(hn::ShiftRight<8>(at), hn::Set(di, int32{255}));
                auto w0 = hn::Sub(hn::Set(di, int32{255}), w1);
                w1 = hn::IfThenZeroElse(before, hn::IfThenElse(beyond, whole, w1));
                w0 = hn::IfThenElse(before, whole, hn::IfThenZeroElse(beyond, w0));
                hn::StoreU(inBothHalves(hn::BitCast(d, w0)), d, weights_[0] + block);
                hn::StoreU(inBothHalves(hn::BitCast(d, w1)), d, weights_[1] + block);
              });
  }

  void prepareAverage() {
    const uint32 step = job_.stepX;
    if (taps_ > kMaxTaps) return;
    // Deliberate: the last source column is no part of an average. Pixels that meet it, or whose
    // neighbours would lie outside the row, are left to averageColumns.
    const uint32 whole = positionsBelow(job_.xLimit(), job_.startX, step, job_.width);
    const uint32 lastFirst = job_.srcWidth < taps_ ? 0 : (job_.srcWidth - taps_ + 1) * kOnePixel;
    averaged_ = positionsBelow(lastFirst, job_.startX, step, whole);
    if (averaged_ != 0 && job_.startX + uint64{averaged_} * step > job_.xLimit()) --averaged_;
    weighted_ = taps_ != step >> 16;
    const Pixels d;
    forBlocks(job_.startX, averaged_, [&](size_t block, PixelVec at) {
      place(block, hn::Min(hn::ShiftRight<16>(at), hn::Set(d, job_.srcWidth - taps_)));
      const PixelVec first = hn::Sub(hn::Set(d, kOnePixel), hn::And(at, hn::Set(d, kOnePixel - 1)));
      const PixelVec rest = hn::Sub(hn::Set(d, step), first);
      const PixelVec last = hn::ShiftRight<8>(hn::And(rest, hn::Set(d, kOnePixel - 1)));
      // Whether the pixel takes all of the tap before the last one.
      const auto full = hn::Eq(hn::ShiftRight<16>(rest), hn::Set(d, taps_ - 2));
      const PixelVec one = hn::Set(d, kWholeColumn);
      const auto store = [&](int tap, PixelVec weight) {
        hn::StoreU(inBothHalves(weight), d, weights_[tap] + block);
      };
      store(0, hn::ShiftRight<8>(first));
      store(1, hn::IfThenElse(full, one, last));
      store(2, hn::IfThenElseZero(full, last));
    });
  }

  template <Reach kReach> void nearest(const uint8* row, uint8* out, size_t count) const {
    const Pixels d;
    for (size_t i = 0; i < count; i += kBlock) {
      const uint8* from = row + size_t{4} * base_[i / kBlock];
      storeSome(pickPixels<kReach>(from, hn::LoadU(d, index_ + i)), std::min(count - i, kBlock),
                out + 4 * i);
    }
  }

  void mix(const uint8* row, uint8* out) const {
    const Pixels d;
    for (size_t i = 0; i < job_.width; i += kBlock) {
      const uint8* from = row + size_t{4} * base_[i / kBlock];
      const PixelVec index = hn::LoadU(d, index_ + i);
      storeLanes(d,
                 mixLanes(pickPixels<Reach::kOne>(from, index),
                          pickPixels<Reach::kOne>(from + 4, index), weight(0, i), weight(1, i)),
                 out + 4 * i);
    }
  }

  HWY_INLINE HalvesVec weight(int tap, size_t i) const {
    return hn::BitCast(Halves(), hn::LoadU(Pixels(), weights_[tap] + i));
  }

  void average(const uint8* row, uint32* out) const {
    if (averaged_ != 0) {
      withDivider(job_.stepX, taps_, [&](const auto& divider) {
        withReach([&](auto reach) {
          constexpr Reach kReach = decltype(reach)::value;
          if (weighted_) {
            averageWeighted<kReach>(row, reinterpret_cast<uint8*>(out), divider);
          } else {
            averageWhole<kReach>(row, reinterpret_cast<uint8*>(out), divider);
          }
        });
      });
    }
    const auto pixelAt = [row](uint32 column) { return loadPixel<4>(row + size_t{4} * column); };
    uint32 i = averaged_;
    for (uint32 x = job_.startX + i * job_.stepX; i < job_.width && x < job_.xLimit(); ++i)
      out[i] = averageColumns(pixelAt, x, job_.stepX, job_.xLimit());
    std::fill(out + i, out + job_.width, pixelAt(job_.srcWidth - 1));
  }

  template <Reach kReach, class Divider>
  void averageWeighted(const uint8* row, uint8* out, const Divider& divider) const {
    const Pixels d;
    for (size_t i = 0; i < averaged_; i += kBlock) {
      const uint8* from = row + size_t{4} * base_[i / kBlock];
      const PixelVec index = hn::LoadU(d, index_ + i);
      LaneSums sums = noSums();
      sums.add(pickPixels<kReach>(from, index), weight(0, i));
      for (uint32 tap = 1; tap < taps_ - 2; ++tap)
        sums.add(pickPixels<kReach>(from + size_t{4} * tap, index));
      sums.add(pickPixels<kReach>(from + size_t{4} * (taps_ - 2), index), weight(1, i));
      sums.add(pickPixels<kReach>(from + size_t{4} * (taps_ - 1), index), weight(2, i));
      storeLanes(d, divider.average(sums.br, sums.ga), out + 4 * i);
    }
  }

  template <Reach kReach, class Divider>
  void averageWhole(const uint8* row, uint8* out, const Divider& divider) const {
    const Pixels d;
    for (size_t i = 0; i < averaged_; i += kBlock) {
      const uint8* from = row + size_t{4} * base_[i / kBlock];
      const PixelVec index = hn::LoadU(d, index_ + i);
      LaneSums sums = noSums();
      for (uint32 tap = 0; tap < taps_; ++tap)
        sums.add(pickPixels<kReach>(from + size_t{4} * tap, index));
      storeLanes(d, divider.average(sums.br, sums.ga), out + 4 * i);
    }
  }

  const ScaleJob& job_;
  uint32 taps_;
  Reach reach_;
  uint32 lastBase_;        ///< the last column from which whole vectors can be read
  uint32 averaged_ = 0;    ///< leading destination pixels that vectors average
  bool weighted_ = false;  ///< whether an average has partial source pixels
  uint32* staged_ = nullptr;
  uint32* tables_[kTables];
  uint32*& base_ = tables_[0];
  uint32*& index_ = tables_[1];
  uint32** const weights_ = tables_ + 2;
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
