// SPDX-License-Identifier: MIT
//
// Reducing to one half and one quarter: averages over squares of whole pixels, in one pass from the
// source to the destination. Included once per instruction set.
//
// The pixels are those of the general way: a row's average first, truncated; then each row's weight
// of 255/256, which takes 1 from a channel that is not 0; then the average of the rows, truncated.

#if defined(RASTER_SCALE_WHOLE_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_WHOLE_INL_H
#undef RASTER_SCALE_WHOLE_INL_H
#else
#define RASTER_SCALE_WHOLE_INL_H
#endif

#include "rasterScaleColumns-inl.h"
#include "rasterScaleInternal.h"
#include "rasterScaleRows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET != HWY_SCALAR

/// The rows of one square of kSide x kSide source pixels.
template <unsigned kSide> using SquareRows = const uint8* [kSide];

/// Half size: truncated means of bytes. The instruction rounds up, so it works on complements.
template <class D, class Load>
HWY_INLINE hn::Vec<D> averageSquares(D d, std::integral_constant<unsigned, 2>, const Load& load) {
  const hn::Repartition<uint8, D> d8;
  const auto rowMean = [&](unsigned row) {  // the complement of the weighted row
    const auto left = load(row, 0);
    const auto right = load(row, 1);
    const auto even = hn::BitCast(d8, hn::Not(hn::ConcatEven(d, right, left)));
    const auto odd = hn::BitCast(d8, hn::Not(hn::ConcatOdd(d, right, left)));
    return hn::SaturatedAdd(hn::AverageRound(even, odd), hn::Set(d8, uint8{1}));
  };
  return hn::BitCast(d, hn::Not(hn::AverageRound(rowMean(0), rowMean(1))));
}

/// Quarter size: sums in 16-bit lanes.
template <class D, class Load>
HWY_INLINE hn::Vec<D> averageSquares(D d, std::integral_constant<unsigned, 4>, const Load& load) {
  const hn::Repartition<uint16, D> d16;
  const auto even = hn::Set(d16, uint16{255});
  const auto one = hn::Set(d16, uint16{1});
  auto br = hn::Zero(d16);
  auto ga = hn::Zero(d16);
  for (unsigned row = 0; row < 4; ++row) {
    const auto p0 = load(row, 0), p1 = load(row, 1), p2 = load(row, 2), p3 = load(row, 3);
    const auto even01 = hn::ConcatEven(d, p1, p0), even23 = hn::ConcatEven(d, p3, p2);
    const auto odd01 = hn::ConcatOdd(d, p1, p0), odd23 = hn::ConcatOdd(d, p3, p2);
    const auto a = hn::BitCast(d16, hn::ConcatEven(d, even23, even01));
    const auto b = hn::BitCast(d16, hn::ConcatOdd(d, even23, even01));
    const auto c = hn::BitCast(d16, hn::ConcatEven(d, odd23, odd01));
    const auto e = hn::BitCast(d16, hn::ConcatOdd(d, odd23, odd01));
    const auto rowBR = hn::Add(hn::Add(hn::And(a, even), hn::And(b, even)),
                               hn::Add(hn::And(c, even), hn::And(e, even)));
    const auto rowGA = hn::Add(hn::Add(hn::ShiftRight<8>(a), hn::ShiftRight<8>(b)),
                               hn::Add(hn::ShiftRight<8>(c), hn::ShiftRight<8>(e)));
    br = hn::Add(br, hn::SaturatedSub(hn::ShiftRight<2>(rowBR), one));
    ga = hn::Add(ga, hn::SaturatedSub(hn::ShiftRight<2>(rowGA), one));
  }
  return hn::BitCast(d, hn::Or(hn::ShiftRight<2>(br), hn::ShiftLeft<8>(hn::ShiftRight<2>(ga))));
}

/// Averages `count` squares, at least a vector of them; the last vector overlaps the one before.
template <unsigned kSide, class D>
HWY_INLINE void averageRun(D d, const SquareRows<kSide>& rows, size_t column, size_t count,
                           uint8* dst) {
  const size_t lanes = hn::Lanes(d);
  const auto averageAt = [&](size_t at) {
    const auto load = [&](unsigned row, size_t part) {
      return loadLanes(d, rows[row] + 4 * (column + kSide * at + part * lanes));
    };
    storeLanes(d, averageSquares(d, std::integral_constant<unsigned, kSide>(), load), dst + 4 * at);
  };
  size_t i = 0;
  for (; count - i >= lanes; i += lanes) averageAt(i);
  if (i != count) averageAt(count - lanes);
}

/// The same for pixels of 3 bytes and whole vectors. The last one averages a copy, because loads
/// reach past its pixels.
template <unsigned kSide>
HWY_INLINE void averageRun24(const SquareRows<kSide>& rows, size_t column, size_t count,
                             uint8* dst) {
  constexpr size_t kRunBytes = 3 * kSide * kBlock;
  const auto averageAt = [&](const auto& rowAt, size_t at) {
    const auto load = [&](unsigned row, size_t part) {
      return widenPixels(rowAt(row) + 3 * (kSide * at + part * kBlock));
    };
    return packThreeBytes(
        averageSquares(Pixels(), std::integral_constant<unsigned, kSide>(), load));
  };
  const auto inPlace = [&](unsigned row) { return rows[row] + 3 * column; };
  size_t i = 0;
  for (; count - i >= 2 * kBlock; i += kBlock)
    storeLanes(Pixels(), averageAt(inPlace, i), dst + 3 * i);
  const auto last = [&](size_t at) {
    uint8 copies[kSide][kRunBytes + kBlock];
    for (unsigned row = 0; row < kSide; ++row) {
      memcpy(copies[row], inPlace(row) + 3 * kSide * at, kRunBytes);
      memset(copies[row] + kRunBytes, 0, kBlock);
    }
    uint32 packed[kBlock];
    hn::StoreU(averageAt([&](unsigned row) { return copies[row]; }, 0), Pixels(), packed);
    memcpy(dst + 3 * at, packed, 3 * kBlock);
  };
  last(i);
  if (i + kBlock != count) last(count - kBlock);
}

/// Draws a job whose steps are kSide whole pixels both ways, in pixels of kBytes.
template <unsigned kSide, unsigned kBytes> class WholeSteps {
 public:
  static bool fits(const ScaleJob& job) {
    return job.smooth && job.stepX == kStep && job.stepY == kStep &&
           job.srcBytesPerPixel == kBytes && job.dstBytesPerPixel == kBytes;
  }

  explicit WholeSteps(const ScaleJob& job) : job_(job) {
    // Squares that end before the last column, which no average reaches.
    squares_ = positionsBelow(job.xLimit(), job.startX, kStep, job.width);
    if (squares_ != 0 && job.startX + uint64{squares_} * kStep > job.xLimit()) --squares_;
    if (squares_ < (kBytes == 3 ? kBlock : 4)) squares_ = 0;
  }

  void draw() const {
    uint32 y = job_.startY;
    uint8* dst = job_.dst;
    for (uint32 i = 0; i < job_.height; ++i, y += kStep, dst = nextRow(dst, job_.dstPitch)) {
      SquareRows<kSide> rows;
      for (uint32 r = 0; r < kSide; ++r) rows[r] = job_.srcRow(job_.rowOf(y + r * kOnePixel));
      drawSquares(rows, dst);
      drawEdge(rows, dst);
    }
  }

 private:
  static constexpr uint32 kStep = kSide * kOnePixel;

  void drawSquares(const SquareRows<kSide>& rows, uint8* dst) const {
    const size_t column = job_.startX >> 16;
    if constexpr (kBytes == 3) {
      if (squares_ != 0) averageRun24<kSide>(rows, column, squares_, dst);
    } else {
      averageRunOf(Pixels(), rows, column, dst);
    }
  }
  /// Takes vectors as wide as the run.
  template <class D>
  HWY_INLINE void averageRunOf(D d, const SquareRows<kSide>& rows, size_t column,
                               uint8* dst) const {
    if (squares_ >= hn::Lanes(d)) {
      averageRun<kSide>(d, rows, column, squares_, dst);
    } else if constexpr (kLanes<D> > 4) {
      averageRunOf(hn::Half<D>(), rows, column, dst);
    }
  }

  /// The pixels that are not whole squares: what is left before the last column, over the whole
  /// step, and then the last column.
  void drawEdge(const SquareRows<kSide>& rows, uint8* dst) const {
    const uint32 limit = job_.xLimit();
    uint32 i = squares_;
    uint32 x = job_.startX + i * kStep;
    for (; i < job_.width && x < limit; ++i, x += kStep) {
      const uint32 columns = std::min(kSide, (limit - x) >> 16);
      storeAverage(dst, i, rows, [&](const uint8* row) {
        ChannelSums sums;
        for (uint32 c = 0; c < columns; ++c) sums.add(pixel(row, (x >> 16) + c));
        return sums.average(kStep);
      });
    }
    for (; i < job_.width; ++i)
      storeAverage(dst, i, rows, [&](const uint8* row) { return pixel(row, limit >> 16); });
  }

  static uint32 pixel(const uint8* row, uint32 column) {
    return loadPixel<kBytes>(row + size_t{column} * kBytes);
  }

  template <class RowPixel>
  HWY_INLINE static void storeAverage(uint8* dst, uint32 i, const SquareRows<kSide>& rows,
                                      const RowPixel& rowPixel) {
    ChannelSums sums;
    for (const uint8* row : rows) sums.add(rowPixel(row), kWholeRow);
    storePixel<kBytes>(dst + size_t{i} * kBytes, sums.average(kStep));
  }

  const ScaleJob& job_;
  uint32 squares_;
};

/// Draws the job and returns true if it is one for WholeSteps.
inline bool drawWholeSteps(const ScaleJob& job) {
  const auto drawAs = [&]<unsigned kSide, unsigned kBytes>(WholeSteps<kSide, kBytes>*) {
    if (!WholeSteps<kSide, kBytes>::fits(job)) return false;
    WholeSteps<kSide, kBytes>(job).draw();
    return true;
  };
  return drawAs(static_cast<WholeSteps<2, 4>*>(nullptr)) ||
         drawAs(static_cast<WholeSteps<4, 4>*>(nullptr)) ||
         drawAs(static_cast<WholeSteps<2, 3>*>(nullptr)) ||
         drawAs(static_cast<WholeSteps<4, 3>*>(nullptr));
}

#else

inline bool drawWholeSteps(const ScaleJob&) { return false; }

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
