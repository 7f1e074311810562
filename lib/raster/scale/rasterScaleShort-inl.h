// SPDX-License-Identifier: MIT
//
// Nearest sampling of rows of 1- and 2-byte pixels. Included once per instruction set.

#if defined(RASTER_SCALE_SHORT_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_SHORT_INL_H
#undef RASTER_SCALE_SHORT_INL_H
#else
#define RASTER_SCALE_SHORT_INL_H
#endif

#include <algorithm>

#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// The sampler of one call. When enlarging, 16 bytes of a row come from 16 neighbouring bytes of
/// the source at most: a table says which, and one shuffle makes them.
template <unsigned kBytes> class ShortColumns {
 public:
  static size_t memoryFor(const ScaleJob& job) {
    return ScaleMemory::sizeOf<uint32>(blocksOf(job)) + ScaleMemory::sizeOf<Shuffle>(blocksOf(job));
  }

  ShortColumns(const ScaleJob& job, ScaleMemory& memory)
      : job_(job),
        blocks_(blocksOf(job)),
        base_(memory.take<uint32>(blocks_)),
        shuffle_(memory.take<Shuffle>(blocks_)) {
    uint64 x = job.startX;
    for (size_t block = 0; block < blocks_; ++block, x += uint64{job.stepX} * kPixels)
      prepare(block, static_cast<uint32>(std::min<uint64>(x, job.xLimit())));
  }

  /// Writes the `width` pixels of a row.
  void sample(const uint8* row, uint8* out) const {
#if HWY_TARGET != HWY_SCALAR
    const hn::CappedTag<uint8, 16> d8;
    for (size_t block = 0; block < blocks_; ++block) {
      const auto pixels = hn::LoadU(d8, row + size_t{kBytes} * base_[block]);
      hn::StoreU(hn::TableLookupBytes(pixels, hn::LoadU(d8, shuffle_[block].from)), d8,
                 out + 16 * block);
    }
#endif
    uint64 x = job_.startX + uint64{job_.stepX} * kPixels * uint64{blocks_};
    for (size_t i = blocks_ * kPixels; i < job_.width; ++i, x += job_.stepX) {
      const auto column = static_cast<size_t>(std::min<uint64>(x, job_.xLimit()) >> 16);
      storePixel<kBytes>(out + kBytes * i, loadPixel<kBytes>(row + kBytes * column));
    }
  }

 private:
  static constexpr uint32 kPixels = 16 / kBytes;
  struct Shuffle {
    uint8 from[16];
  };

  /// How many vectors of a row are made by shuffles; the rest goes pixel by pixel.
  static size_t blocksOf(const ScaleJob& job) {
    const bool shuffles =
        HWY_TARGET != HWY_SCALAR && job.stepX <= kOnePixel && job.srcWidth >= kPixels;
    return shuffles ? job.width / kPixels : 0;
  }

  void prepare(size_t block, uint32 x) {
    const uint32 limit = job_.xLimit();
    const uint32 base = std::min(x >> 16, job_.srcWidth - kPixels);
    uint8* from = shuffle_[block].from;
    base_[block] = base;
    for (uint32 i = 0; i < kPixels; ++i) {
      const uint32 column = (std::min(limit - x, i * job_.stepX) + x) >> 16;
      for (uint32 byte = 0; byte < kBytes; ++byte)
        from[kBytes * i + byte] = static_cast<uint8>((column - base) * kBytes + byte);
    }
  }

  const ScaleJob& job_;
  const size_t blocks_;
  uint32* const base_;
  Shuffle* const shuffle_;
};

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
