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
#include <type_traits>

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
  uint32 next = job.rowOf(y);
  for (uint32 left = job.height; left != 0;) {
    const uint32 row = next;
    uint32 rows = 0;
    do {
      y += job.stepY;
      next = job.rowOf(y);
      ++rows;
    } while (rows != left && next == row);
    body(job.srcRow(row), dst, rows);
    dst = rowAt(dst, job.dstPitch, rows, 0, 0);
    left -= rows;
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
  template <bool /*kPastCaches*/> void draw() const {
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

/// How pixels are written: into how many destination rows at once, and whether past the caches.
template <unsigned kRowsAtOnce, bool kPastCaches> struct Writing {
  static constexpr bool kTwice = kRowsAtOnce == 2;

  uint8* first;
  uint8* second;  ///< if there are two

  HWY_INLINE void pixel(size_t i, uint32 value) const {
    storePixel<4>(first + 4 * i, value);
    if constexpr (kTwice) storePixel<4>(second + 4 * i, value);
  }
  template <class D> HWY_INLINE void lanes(D d, size_t i, hn::Vec<D> pixels) const {
    putLanes<kPastCaches>(d, pixels, first + 4 * i);
    if constexpr (kTwice) putLanes<kPastCaches>(d, pixels, second + 4 * i);
  }
  HWY_INLINE void firstOf(size_t i, PixelVec pixels, size_t count) const {
    storeFirst(Pixels(), pixels, count, first + 4 * i);
    if constexpr (kTwice) storeFirst(Pixels(), pixels, count, second + 4 * i);
  }
};

/// Calls sample(row, writing) for the source rows that are shown, until all rows are drawn.
template <bool kPastCaches, class Sample>
HWY_INLINE void drawShownRows(const ScaleJob& job, const Sample& sample) {
  const intptr_t pitch = job.dstPitch;
  forShownRows(job, [&](const uint8* row, uint8* dst, uint32 rows) HWY_ATTR {
    for (; rows >= 2; rows -= 2, dst = rowAt(dst, pitch, 2, 0, 0))
      sample(row, Writing<2, kPastCaches>{dst, nextRow(dst, pitch)});
    if (rows != 0) sample(row, Writing<1, kPastCaches>{dst, dst});
  });
  if (kPastCaches) endStreams();
}

class Nearest {
 public:
  static size_t memoryFor(const ScaleJob& job) { return SourcePlaces::memoryFor(job); }

  Nearest(const ScaleJob& job, ScaleMemory& memory) : job_(job), places_(job, 1, memory) {
    places_.forBlocks(job.startX, blockPixels(job), [&](size_t block, PixelVec at) HWY_ATTR {
      places_.place(block, hn::ShiftRight<16>(at));
    });
  }

  /// `out` has room for whole vectors.
  void resample(const uint8* row, uint32* out) const {
    places_.withReader([&](const auto& read) HWY_ATTR {
      auto* const pixels = reinterpret_cast<uint8*>(out);
      sample(read, row, Writing<1, false>{pixels, pixels}, blockPixels(job_));
    });
  }

  /// Draws the job's rectangle, of 4-byte pixels: not a byte beyond.
  template <bool kPastCaches> void draw() const {
    places_.withReader([&](const auto& read) HWY_ATTR {
      drawShownRows<kPastCaches>(job_, [&](const uint8* row, auto writing)
                                           HWY_ATTR { sample(read, row, writing, job_.width); });
    });
  }

 private:
  /// Writes the first `count` pixels of a row.
  template <class Read, class Writing>
  HWY_INLINE void sample(const Read& read, const uint8* row, const Writing& to,
                         size_t count) const {
    const auto pixels = read(row);
    const auto block = [&](size_t at)
                           HWY_ATTR { return pixels.pick(places_.base(at), places_.index(at)); };
    size_t i = 0;
    for (; count - i >= kBlock; i += kBlock) to.lanes(Pixels(), i, block(i));
    if (i != count) to.firstOf(i, block(i), count - i);
  }

  const ScaleJob& job_;
  SourcePlaces places_;
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
