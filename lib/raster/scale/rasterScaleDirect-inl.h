// SPDX-License-Identifier: MIT
//
// Nearest sampling of 4-byte pixels by a factor of two: whole vectors are made of whole vectors, so
// no table of places is needed. Included once per instruction set.

#if defined(RASTER_SCALE_DIRECT_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_DIRECT_INL_H
#undef RASTER_SCALE_DIRECT_INL_H
#else
#define RASTER_SCALE_DIRECT_INL_H
#endif

#include <algorithm>

#include "rasterScaleInternal.h"
#include "rasterScaleLanes-inl.h"
#include "rasterScaleNearest-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET != HWY_SCALAR

/// Every other pixel of a row, to reduce.
struct EveryOther {
  static constexpr uint32 kSourceBytes = 8;  ///< from one pixel to the next

  /// A vector of pixels from the columns at `from` on.
  template <class D> static HWY_INLINE hn::Vec<D> pixels(D d, const uint8* from) {
    const auto left = loadLanes(d, from);
    return inOrder<2>(d, everyOther<0>(left, loadLanes(d, from + 4 * kLanes<D>)));
  }
};

/// Each pixel of a row twice, to enlarge.
struct EachTwice {
  static constexpr uint32 kSourceBytes = 2;

  template <class D> static HWY_INLINE hn::Vec<D> pixels(D d, const uint8* from) {
    const hn::Repartition<uint64, D> pairs;
    const hn::Half<D> half;
    return hn::DupEven(hn::BitCast(d, hn::PromoteTo(pairs, loadLanes(half, from))));
  }
};

template <class Way> class DirectNearest {
 public:
  /// The job is one of 4-byte pixels.
  static bool fits(const ScaleJob& job) {
    return job.stepX == kOnePixel * Way::kSourceBytes / 4 && fractionOf(job.startX) == 0 &&
           job.width >= kLeast;
  }

  explicit DirectNearest(const ScaleJob& job)
      : job_(job),
        first_(std::min(job.startX >> 16, job.srcWidth)),
        direct_(std::min(job.width, (job.srcWidth - first_) * 4 / Way::kSourceBytes)) {}

  /// Draws the job's rectangle: not a byte beyond.
  template <bool kPastCaches> void draw() const {
    drawShownRows<kPastCaches>(
        job_, [this](const uint8* row, auto writing) HWY_ATTR { sample(row, writing); });
  }

 private:
  static constexpr size_t kLeast = 4;  ///< pixels in a vector

  template <class Writing> HWY_INLINE void sample(const uint8* row, const Writing& to) const {
    const uint8* from = row + size_t{4} * first_;
    forLanes(Pixels(), direct_, [&](auto d, size_t i) HWY_ATTR {
      constexpr size_t kCount = kLanes<decltype(d)>;
      if constexpr (kCount >= kLeast) {
        to.lanes(d, i, Way::pixels(d, from + Way::kSourceBytes * i));
      } else {
        for (const size_t end = i + kCount; i < end; ++i)
          to.pixel(i, loadPixel<4>(from + Way::kSourceBytes * i / 4 * 4));
      }
    });
    for (size_t i = direct_; i < job_.width; ++i)
      to.pixel(i, loadPixel<4>(row + size_t{4} * (job_.srcWidth - 1)));
  }

  const ScaleJob& job_;
  const uint32 first_;   ///< the first pixel's column
  const uint32 direct_;  ///< pixels before those that are the last column again
};

template <class Way, bool kPastCaches> HWY_NOINLINE void drawDirectTo(const ScaleJob& job) {
  DirectNearest<Way>(job).template draw<kPastCaches>();
}

/// Draws the job and returns true if it is one for DirectNearest.
template <class Way> bool drawDirect(const ScaleJob& job) {
  if (!DirectNearest<Way>::fits(job)) return false;
  (areStreamed(job) ? drawDirectTo<Way, true> : drawDirectTo<Way, false>)(job);
  return true;
}

#else

struct EveryOther;
struct EachTwice;
template <class Way> bool drawDirect(const ScaleJob&) { return false; }

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
