// SPDX-License-Identifier: MIT
//
// Where the pixels of a destination row come from in a source row, and how vectors of them are
// picked from it. Included once per instruction set.
//
// The places are the same for every row. They are worked out once per call, as a table with an
// entry for each destination pixel; a row is then a walk over vectors of destination pixels.

#if defined(RASTER_SCALE_SOURCE_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_SOURCE_INL_H
#undef RASTER_SCALE_SOURCE_INL_H
#else
#define RASTER_SCALE_SOURCE_INL_H
#endif

#include <algorithm>

#include "rasterScaleInternal.h"
#include "rasterScaleLanes-inl.h"
#include "rasterScaleMemory.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET != HWY_SCALAR

/// Where the source pixels of a vector of destination pixels lie: within one vector or two of the
/// row, or anywhere in it; or the row is that short that one vector or two hold all of it.
enum class Reach { kOne, kTwo, kAny, kAllInOne, kAllInTwo };

inline Reach reachOf(const ScaleJob& job) {
  if (kLoadsParts && job.srcBytesPerPixel == 4 && job.srcWidth <= 2 * kBlock)
    return job.srcWidth <= kBlock ? Reach::kAllInOne : Reach::kAllInTwo;
  if (job.stepX <= kOnePixel) return Reach::kOne;
  return job.stepX <= 2 * kOnePixel ? Reach::kTwo : Reach::kAny;
}

#if HWY_TARGET <= HWY_AVX2

/// An entry of the table of places that lookUp takes.
HWY_INLINE PixelVec entryOf(PixelVec index) { return index; }

HWY_INLINE PixelVec lookUp(PixelVec pixels, PixelVec index) {
  return hn::TableLookupLanes(pixels, hn::IndicesFromVec(Pixels(), index));
}

/// The lanes at `index` of two vectors, one behind the other.
HWY_INLINE PixelVec lookUp(PixelVec low, PixelVec high, PixelVec index) {
#if HWY_TARGET == HWY_AVX3
  return PixelVec{_mm512_permutex2var_epi32(low.raw, index.raw, high.raw)};
#else
  const Pixels d;
  const hn::RebindToSigned<Pixels> di;
  const auto inHigh = hn::Gt(hn::BitCast(di, index), hn::Set(di, int32{kBlock - 1}));
  const PixelVec within = hn::And(index, hn::Set(d, uint32{kBlock - 1}));
  return hn::IfThenElse(hn::RebindMask(d, inHigh), lookUp(high, within), lookUp(low, within));
#endif
}

#else

/// Four pixels are looked up as bytes: the entry has the places of a pixel's bytes.
HWY_INLINE PixelVec entryOf(PixelVec index) {
  const Pixels d;
  return hn::Add(hn::Mul(index, hn::Set(d, 0x04040404u)), hn::Set(d, 0x03020100u));
}

HWY_INLINE PixelVec lookUp(PixelVec pixels, PixelVec entry) {
  const hn::Repartition<uint8, Pixels> d8;
  return hn::BitCast(Pixels(),
                     hn::TableLookupBytes(hn::BitCast(d8, pixels), hn::BitCast(d8, entry)));
}

/// The same in two vectors, one behind the other. A place with its top bit set gives 0.
HWY_INLINE PixelVec lookUp(PixelVec low, PixelVec high, PixelVec entry) {
  const hn::Repartition<uint8, Pixels> d8;
  const auto at = hn::BitCast(d8, entry);
  const auto inLow = hn::SaturatedAdd(at, hn::Set(d8, uint8{0x80 - 16}));
  const auto inHigh = hn::Sub(at, hn::Set(d8, uint8{16}));
  return hn::BitCast(Pixels(), hn::Or(hn::TableLookupBytesOr0(hn::BitCast(d8, low), inLow),
                                      hn::TableLookupBytesOr0(hn::BitCast(d8, high), inHigh)));
}

#endif

/// The pixels of the columns at `index`.
HWY_INLINE PixelVec gather(const uint8* row, PixelVec index) {
  const Pixels d;
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

/// A row in memory. pick(base, index, tap) gives the pixels `tap` columns behind those at `index`,
/// which are counted from the column `base`.
template <Reach kReach> struct SourceRow {
  const uint8* pixels;

  HWY_INLINE PixelVec pick(uint32 base, PixelVec index, uint32 tap = 0) const {
    const Pixels d;
    const uint8* from = pixels + size_t{4} * (base + tap);
    if constexpr (kReach == Reach::kAny) return gather(from, index);
    const PixelVec low = loadLanes(d, from);
    if constexpr (kReach == Reach::kOne) return lookUp(low, index);
    return lookUp(low, loadLanes(d, from + 4 * kBlock), index);
  }
};

#if HWY_TARGET <= HWY_AVX2

/// A short row, in registers; its base is 0.
template <bool kTwo> struct ShortSourceRow {
  PixelVec low, high;

  HWY_INLINE ShortSourceRow(const uint8* row, uint32 width)
      : low(loadFirst(Pixels(), row, std::min<size_t>(width, kBlock))),
        high(kTwo ? loadFirst(Pixels(), row + 4 * kBlock, width - kBlock) : low) {}

  HWY_INLINE PixelVec pick(uint32 /*base*/, PixelVec index, uint32 tap = 0) const {
    const PixelVec at = hn::Add(index, hn::Set(Pixels(), tap));
    if constexpr (kTwo) return lookUp(low, high, at);
    return lookUp(low, at);
  }
};
template <bool kTwo> struct ShortRowReader {
  uint32 width;
  HWY_INLINE ShortSourceRow<kTwo> operator()(const uint8* row) const { return {row, width}; }
};

#endif

/// The rows of a source as 4-byte pixels of which whole vectors can be read, and the places of the
/// destination's pixels in them. A destination pixel is made of up to `taps` neighbours.
class SourcePlaces {
 public:
  static constexpr uint32 kMaxTaps = 10;

  static size_t memoryFor(const ScaleJob& job) {
    return 2 * ScaleMemory::sizeOf<uint32>(blockPixels(job)) +
           ScaleMemory::sizeOf<uint32>(stagedPixels(job));
  }

  SourcePlaces(const ScaleJob& job, uint32 taps, ScaleMemory& memory)
      : job_(job), reach_(reachOf(job)) {
    if (reach_ <= Reach::kAny) {
      const bool narrow = job.srcWidth < 2 * kBlock + taps;
      if (job.srcBytesPerPixel != 4 || narrow) {
        staged_ = memory.take<uint32>(stagedPixels(job));
        // What no row fills: vectors that are read from the last columns on have it behind them.
        std::fill_n(staged_ + job.srcWidth, 2 * kBlock + kMaxTaps, 0);
      }
      lastBase_ = (staged_ != nullptr ? static_cast<uint32>(stagedPixels(job)) : job.srcWidth) -
                  taps + 1 - (reach_ == Reach::kOne ? 1 : 2) * kBlock;
    }
    base_ = memory.take<uint32>(blockPixels(job));
    index_ = memory.take<uint32>(blockPixels(job));
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

  /// Notes where a block's source pixels are: a first column from which whole vectors can be read,
  /// and the pixels' places from there.
  HWY_INLINE void place(size_t block, PixelVec columns) {
    const Pixels d;
    const uint32 first = reach_ >= Reach::kAny ? 0 : std::min(hn::GetLane(columns), lastBase_);
    base_[block / kBlock] = first;
    const PixelVec index = hn::Sub(columns, hn::Set(d, first));
    hn::StoreU(reach_ == Reach::kAny ? index : entryOf(index), d, index_ + block);
  }

  /// Calls body(read), where read(row).pick(base(block), index(block), tap) gives a block's pixels.
  template <class Body> HWY_INLINE void withReader(const Body& body) const {
    switch (reach_) {
#if HWY_TARGET <= HWY_AVX2
      case Reach::kAllInOne:
        return body(ShortRowReader<false>{job_.srcWidth});
      case Reach::kAllInTwo:
        return body(ShortRowReader<true>{job_.srcWidth});
#endif
      case Reach::kOne:
        return body(RowReader<Reach::kOne>{*this});
      case Reach::kTwo:
        return body(RowReader<Reach::kTwo>{*this});
      default:
        return body(RowReader<Reach::kAny>{*this});
    }
  }
  HWY_INLINE uint32 base(size_t block) const { return base_[block / kBlock]; }
  HWY_INLINE PixelVec index(size_t block) const { return hn::LoadU(Pixels(), index_ + block); }

 private:
  template <Reach kReach> struct RowReader {
    const SourcePlaces& places;
    HWY_INLINE SourceRow<kReach> operator()(const uint8* row) const { return {places.stage(row)}; }
  };

  static size_t stagedPixels(const ScaleJob& job) { return job.srcWidth + 2 * kBlock + kMaxTaps; }

  /// The distances of a block's pixels from its first one, at most 2^32 - 1.
  PixelVec laneSteps() const {
    const Pixels d;
    if (job_.stepX < 0xFFFFFFFF / kBlock) return hn::Mul(hn::Iota(d, 0), hn::Set(d, job_.stepX));
    uint32 steps[kBlock];
    for (size_t i = 0; i < kBlock; ++i)
      steps[i] = static_cast<uint32>(std::min<uint64>(uint64{job_.stepX} * i, 0xFFFFFFFF));
    return hn::LoadU(d, steps);
  }

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

  const ScaleJob& job_;
  const Reach reach_;
  uint32 lastBase_ = 0;  ///< the last column from which whole vectors can be read
  uint32* staged_ = nullptr;
  uint32* base_;
  uint32* index_;
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
