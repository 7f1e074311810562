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

/// Pixels of source columns, `first` and following, without those from `end` on.
template <class D>
HWY_INLINE hn::Vec<D> columnsBelow(D d, hn::Vec<D> pixels, size_t first, size_t end) {
  const hn::RebindToSigned<D> di;
  const auto lane = hn::Iota(di, 0);
  const auto count = hn::Set(di, static_cast<int32>(end) - static_cast<int32>(first));
  return hn::IfThenElseZero(hn::RebindMask(d, hn::Lt(lane, count)), pixels);
}

/// A run of squares: its first source column, the column where averages end, and the number.
struct Run {
  size_t column;
  size_t end;
  size_t count;
};

/// Averages a run of at least a vector of squares. The last vector overlaps the one before; it may
/// reach the last column, which counts as 0.
template <unsigned kSide, class D>
HWY_INLINE void averageRun(D d, const SquareRows<kSide>& rows, const Run& run, uint8* dst) {
  const size_t lanes = hn::Lanes(d);
  const std::integral_constant<unsigned, kSide> side;
  const auto load = [&](size_t at, unsigned row, size_t part) {
    return loadLanes(d, rows[row] + 4 * (run.column + kSide * at + part * lanes));
  };
  for (size_t i = 0; run.count - i > lanes; i += lanes) {
    const auto squares = [&](unsigned row, size_t part) { return load(i, row, part); };
    storeLanes(d, averageSquares(d, side, squares), dst + 4 * i);
  }
  const size_t last = run.count - lanes;
  const auto squares = [&](unsigned row, size_t part) {
    return columnsBelow(d, load(last, row, part), run.column + kSide * last + part * lanes,
                        run.end);
  };
  storeLanes(d, averageSquares(d, side, squares), dst + 4 * last);
}

/// The same for pixels of 3 bytes and any number of squares. The end of the run is averaged from a
/// copy, because loads reach past its pixels.
template <unsigned kSide>
HWY_INLINE void averageRun24(const SquareRows<kSide>& rows, const Run& run, uint8* dst) {
  const Pixels d;
  const std::integral_constant<unsigned, kSide> side;
  size_t i = 0;
  for (; run.count - i >= 2 * kBlock; i += kBlock) {
    const auto squares = [&](unsigned row, size_t part) {
      return widenPixels(rows[row] + 3 * (run.column + kSide * i + part * kBlock));
    };
    storeLanes(d, gatherTriples(d, averageSquares(d, side, squares)), dst + 3 * i);
  }
  for (; i < run.count; i += kBlock) {
    const size_t count = std::min(run.count - i, kBlock);
    const size_t column = run.column + kSide * i;
    uint8 copies[kSide][(3 * kSide + 1) * kBlock] = {};
    for (unsigned row = 0; row < kSide; ++row)
      copyShort(copies[row], rows[row] + 3 * column, 3 * kSide * count);
    const auto squares = [&](unsigned row, size_t part) {
      return columnsBelow(d, widenPixels(copies[row] + 3 * part * kBlock), column + part * kBlock,
                          run.end);
    };
    uint8 packed[4 * kBlock];
    storeLanes(d, gatherTriples(d, averageSquares(d, side, squares)), packed);
    copyShort(dst + 3 * i, packed, 3 * count);
  }
}

/// Draws a job whose steps are kSide whole pixels both ways, in pixels of kBytes.
template <unsigned kSide, unsigned kBytes> class WholeSteps {
 public:
  static bool fits(const ScaleJob& job) {
    return job.smooth && job.stepX == kStep && job.stepY == kStep &&
           job.srcBytesPerPixel == kBytes && job.dstBytesPerPixel == kBytes;
  }

  explicit WholeSteps(const ScaleJob& job) : job_(job) {
    // Squares that lie within the source row.
    const uint32 column = std::min(job.startX >> 16, job.srcWidth);
    squares_ = std::min(positionsBelow(job.xLimit(), job.startX, kStep, job.width),
                        (job.srcWidth - column) / kSide);
    if (kBytes == 4 && squares_ < 4) squares_ = 0;
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
    const Run run = {job_.startX >> 16, job_.srcWidth - 1, squares_};
    if constexpr (kBytes == 3) {
      averageRun24<kSide>(rows, run, dst);
    } else {
      averageRunOf(Pixels(), rows, run, dst);
    }
  }
  /// Takes vectors as wide as the run.
  template <class D>
  HWY_INLINE static void averageRunOf(D d, const SquareRows<kSide>& rows, const Run& run,
                                      uint8* dst) {
    if (run.count >= hn::Lanes(d)) {
      averageRun<kSide>(d, rows, run, dst);
    } else if constexpr (kLanes<D> > 4) {
      averageRunOf(hn::Half<D>(), rows, run, dst);
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
