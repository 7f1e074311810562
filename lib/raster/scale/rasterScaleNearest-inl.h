// SPDX-License-Identifier: MIT
//
// The sampler that takes the nearest source pixel. Included once per instruction set.
//
// A sampler resamples source rows of 3- or 4-byte pixels to the width of the destination, as
// 4-byte pixels: what it needs for that is made once per call.

#if defined(RASTER_SCALE_NEAREST_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_NEAREST_INL_H
#undef RASTER_SCALE_NEAREST_INL_H
#else
#define RASTER_SCALE_NEAREST_INL_H
#endif

#include <algorithm>

#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "rasterScaleSource-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// Calls body(row, dst, rows) for each source row that is shown, with the first destination row
/// that shows it and how many of them do.
template <class Body> HWY_INLINE void forShownRows(const ScaleJob& job, const Body& body) {
  uint32 y = job.startY;
  uint8* dst = job.dst;
  for (uint32 left = job.height, rows = 1; left != 0; left -= rows) {
    const uint32 row = job.rowOf(y);
    y += job.stepY;
    for (rows = 1; rows != left && job.rowOf(y) == row; ++rows) y += job.stepY;
    body(job.srcRow(row), dst, rows);
    dst = rowAt(dst, job.dstPitch, rows, 0, 0);
  }
}

/// Pixel after pixel, without a table of places: quicker for a few pixels.
class PlainNearest {
 public:
  static size_t memoryFor(const ScaleJob&) { return 0; }
  PlainNearest(const ScaleJob& job, ScaleMemory&) : job_(job) {}

  void resample(const uint8* row, uint32* out) const {
    if (job_.srcBytesPerPixel == 4) {
      sampleAs<4>(row, reinterpret_cast<uint8*>(out));
    } else {
      sampleAs<3>(row, reinterpret_cast<uint8*>(out));
    }
  }

  /// Draws the job's rectangle, of 4-byte pixels: not a byte beyond.
  void draw() const {
    forShownRows(job_, [&](const uint8* row, uint8* dst, uint32 rows) {
      sampleAs<4>(row, dst);
      for (uint8* next = nextRow(dst, job_.dstPitch); --rows != 0;
           next = nextRow(next, job_.dstPitch))
        memcpy(next, dst, job_.rowBytes());
    });
  }

 private:
  template <unsigned kBytes> void sampleAs(const uint8* row, uint8* out) const {
    for (uint32 i = 0, x = job_.startX; i < job_.width; ++i, out += 4) {
      const bool inside = x < job_.xLimit();
      const size_t column = inside ? x >> 16 : job_.srcWidth - 1;
      storePixel<4>(out, loadPixel<kBytes>(row + kBytes * column));
      if (inside) x += job_.stepX;
    }
  }

  const ScaleJob& job_;
};

#if HWY_TARGET == HWY_SCALAR

using Nearest = PlainNearest;

#else

class Nearest {
 public:
  static size_t memoryFor(const ScaleJob& job) { return SourcePlaces::memoryFor(job); }

  Nearest(const ScaleJob& job, ScaleMemory& memory)
      : job_(job), everyOther_(everyOtherOf(job)), places_(job, 1, memory) {
    const int64 start = job.startX + int64{job.stepX} * static_cast<int64>(everyOther_);
    places_.forBlocks(start, blockPixels(job) - everyOther_,
                      [&](size_t block, PixelVec at)
                          HWY_ATTR { places_.place(everyOther_ + block, hn::ShiftRight<16>(at)); });
  }

  /// `out` has room for whole vectors.
  void resample(const uint8* row, uint32* out) const {
    places_.withReader([&](const auto& read) HWY_ATTR {
      sample<1>(read, row, reinterpret_cast<uint8*>(out), 0, blockPixels(job_));
    });
  }

  /// Draws the job's rectangle, of 4-byte pixels: not a byte beyond.
  void draw() const {
    const intptr_t pitch = job_.dstPitch;
    places_.withReader([&](const auto& read) HWY_ATTR {
      forShownRows(job_, [&](const uint8* row, uint8* dst, uint32 rows) HWY_ATTR {
        for (; rows >= 2; rows -= 2, dst = rowAt(dst, pitch, 2, 0, 0))
          sample<2>(read, row, dst, pitch, job_.width);
        if (rows != 0) sample<1>(read, row, dst, pitch, job_.width);
      });
    });
  }

 private:
  /// How many of the pixels are every other one of the row, in whole vectors.
  static size_t everyOtherOf(const ScaleJob& job) {
    const uint32 first = job.startX >> 16;
    const bool every = job.stepX == 2 * kOnePixel && job.srcBytesPerPixel == 4;
    if (!every || first >= job.srcWidth) return 0;
    return std::min(job.width, (job.srcWidth - first) / 2) / kBlock * kBlock;
  }

  /// Writes the first `count` pixels of a row into kRows rows.
  template <unsigned kRows, class Read>
  HWY_INLINE void sample(const Read& read, const uint8* row, uint8* out, intptr_t pitch,
                         size_t count) const {
    const Pixels d;
    uint8* const second = nextRow(out, pitch);
    const auto store = [&](PixelVec pixels, size_t i) HWY_ATTR {
      storeLanes(d, pixels, out + 4 * i);
      if constexpr (kRows == 2) storeLanes(d, pixels, second + 4 * i);
    };
    const uint8* from = row + size_t{4} * (job_.startX >> 16);
    size_t i = 0;
    for (; i < everyOther_; i += kBlock, from += 8 * kBlock)
      store(inOrder<2>(d, everyOther<0>(loadLanes(d, from), loadLanes(d, from + 4 * kBlock))), i);
    if (i == count) return;
    const auto pixels = read(row);
    const auto block = [&](size_t at)
                           HWY_ATTR { return pixels.pick(places_.base(at), places_.index(at)); };
    for (; count - i >= kBlock; i += kBlock) store(block(i), i);
    if (i == count) return;
    const PixelVec rest = block(i);
    storeFirst(d, rest, count - i, out + 4 * i);
    if constexpr (kRows == 2) storeFirst(d, rest, count - i, second + 4 * i);
  }

  const ScaleJob& job_;
  const size_t everyOther_;
  SourcePlaces places_;
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
