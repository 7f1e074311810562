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

#include "rasterScaleAverage-inl.h"
#include "rasterScaleInternal.h"
#include "rasterScaleRows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET != HWY_SCALAR

/// The rows of one square of kSide x kSide source pixels.
template <unsigned kSide> using SquareRows = const uint8* [kSide];

/// Sums of neighbouring bytes, and of neighbouring 16-bit lanes. Highway names the first one only
/// from a later version on.
HWY_INLINE __m128i pairSums(__m128i bytes) {
  return _mm_madd_epi16(_mm_maddubs_epi16(bytes, _mm_set1_epi8(1)), _mm_set1_epi16(1));
}
HWY_INLINE __m128i packSums(__m128i a, __m128i b) { return _mm_packs_epi32(a, b); }
HWY_INLINE __m128i packBytes(__m128i a, __m128i b) { return _mm_packus_epi16(a, b); }
#if HWY_TARGET <= HWY_AVX2
HWY_INLINE __m256i pairSums(__m256i bytes) {
  return _mm256_madd_epi16(_mm256_maddubs_epi16(bytes, _mm256_set1_epi8(1)), _mm256_set1_epi16(1));
}
HWY_INLINE __m256i packSums(__m256i a, __m256i b) { return _mm256_packs_epi32(a, b); }
HWY_INLINE __m256i packBytes(__m256i a, __m256i b) { return _mm256_packus_epi16(a, b); }
#endif
#if HWY_TARGET <= HWY_AVX3
HWY_INLINE __m512i pairSums(__m512i bytes) {
  return _mm512_madd_epi16(_mm512_maddubs_epi16(bytes, _mm512_set1_epi8(1)), _mm512_set1_epi16(1));
}
HWY_INLINE __m512i packSums(__m512i a, __m512i b) { return _mm512_packs_epi32(a, b); }
HWY_INLINE __m512i packBytes(__m512i a, __m512i b) { return _mm512_packus_epi16(a, b); }
#endif

/// Half size: truncated means of bytes. The instruction rounds up, so it works on complements.
template <class D, class Load>
HWY_INLINE hn::Vec<D> averageSquares(D d, std::integral_constant<unsigned, 2>, const Load& load) {
  const hn::Repartition<uint8, D> d8;
  const auto rowMean = [&](unsigned row) HWY_ATTR {  // the complement of the weighted row
    const auto left = load(row, 0);
    const auto right = load(row, 1);
    const auto even = hn::BitCast(d8, hn::Not(everyOther<0>(left, right)));
    const auto odd = hn::BitCast(d8, hn::Not(everyOther<1>(left, right)));
    return hn::SaturatedAdd(hn::AverageRound(even, odd), hn::Set(d8, uint8{1}));
  };
  return inOrder<2>(d, hn::BitCast(d, hn::Not(hn::AverageRound(rowMean(0), rowMean(1)))));
}

/// Quarter size: a part's four pixels are put channel by channel, and the sums of bytes are then
/// sums of channels.
template <class D, class Load>
HWY_INLINE hn::Vec<D> averageSquares(D d, std::integral_constant<unsigned, 4>, const Load& load) {
  static constexpr BytesOfPart kByChannel = {0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15};
  using Words = hn::Repartition<uint16, D>;
  const Words d16;
  const auto one = hn::Set(d16, uint16{1});
  const auto sums = [&](unsigned row, unsigned part) HWY_ATTR {
    return pairSums(chooseBytes(d, load(row, part), kByChannel).raw);
  };
  const auto rowMean = [&](unsigned row, unsigned half) HWY_ATTR {
    const hn::Vec<Words> sum{packSums(sums(row, 2 * half), sums(row, 2 * half + 1))};
    return hn::SaturatedSub(hn::ShiftRight<2>(sum), one);
  };
  auto first = hn::Zero(d16), second = hn::Zero(d16);
  for (unsigned row = 0; row < 4; ++row) {
    first = hn::Add(first, rowMean(row, 0));
    second = hn::Add(second, rowMean(row, 1));
  }
  return inOrder<1>(
      d, hn::Vec<D>{packBytes(hn::ShiftRight<2>(first).raw, hn::ShiftRight<2>(second).raw)});
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
  const auto squares = [&](unsigned row, size_t part) HWY_ATTR {
    const auto pixels = load(last, row, part);
    if (part != kSide - 1) return pixels;  // the last column is the last one of all
    return columnsBelow(d, pixels, run.column + kSide * last + part * lanes, run.end);
  };
  storeLanes(d, averageSquares(d, side, squares), dst + 4 * last);
}

#if HWY_TARGET <= HWY_AVX2

/// The same for a run of less than a vector of squares.
template <unsigned kSide, class D>
HWY_INLINE void averageFew(D d, const SquareRows<kSide>& rows, const Run& run, uint8* dst) {
  const std::integral_constant<unsigned, kSide> side;
  const size_t end = std::min(run.end, run.column + kSide * run.count);
  const auto squares = [&](unsigned row, size_t part) HWY_ATTR {
    const size_t first = run.column + part * kLanes<D>;
    if (first >= end) return hn::Zero(d);
    return loadFirst(d, rows[row] + 4 * first, std::min(end - first, kLanes<D>));
  };
  storeFirst(d, averageSquares(d, side, squares), run.count, dst);
}

#endif

/// The same for pixels of 3 bytes and any number of squares.
template <unsigned kSide>
HWY_INLINE void averageRun24(const SquareRows<kSide>& rows, const Run& run, uint8* dst) {
  const Pixels d;
  const std::integral_constant<unsigned, kSide> side;
  size_t i = 0;
  // A whole vector is stored while its excess lies within the run, and is then overwritten.
  for (; run.count - i >= 2 * kBlock; i += kBlock) {
    const auto squares = [&](unsigned row, size_t part) HWY_ATTR {
      return widenWithin(rows[row] + 3 * (run.column + kSide * i + part * kBlock));
    };
    storeLanes(d, gatherTriples(d, averageSquares(d, side, squares)), dst + 3 * i);
  }
  for (; i < run.count; i += kBlock) {
    const size_t count = std::min(run.count - i, kBlock);
    const size_t columns = kSide * count;
    const size_t column = run.column + kSide * i;
    const auto squares = [&](unsigned row, size_t part) HWY_ATTR {
      const size_t before = std::min(part * kBlock, columns);
      const size_t first = column + before;
      return columnsBelow(d, widenFirst(rows[row] + 3 * first, std::min(columns - before, kBlock)),
                          first, run.end);
    };
    storeFirstTriples(averageSquares(d, side, squares), count, dst + 3 * i);
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
    if (kBytes == 4 && !kLoadsParts && squares_ < 4) squares_ = 0;
  }

  void draw() const {
    for (Band band{0, 0}; band.first < job_.height; band.first += band.count) {
      band.count = std::clamp(wholeRowsFrom(positionOf(band)), 1u, job_.height - band.first);
      drawSquares(band);
      if (squares_ != job_.width)
        forRows(band, [this](const auto& rows, uint8* dst) { drawEdge(rows, dst); });
    }
  }

 private:
  static constexpr uint32 kStep = kSide * kOnePixel;

  /// Destination rows whose source rows follow one another.
  struct Band {
    uint32 first;
    uint32 count;
  };

  uint32 positionOf(const Band& band) const { return job_.startY + band.first * kStep; }

  /// The number of rows of squares from a vertical position on that lie within the source.
  uint32 wholeRowsFrom(uint32 y) const {
    const uint32 row = y >> 16;
    return row < job_.srcHeight ? (job_.srcHeight - row) / kSide : 0;
  }

  /// Runs draw(rows, dst) for every row of a band.
  template <class Draw> HWY_INLINE void forRows(const Band& band, const Draw& draw) const {
    const uint32 y = positionOf(band);
    const intptr_t srcPitch = job_.srcPitch, dstPitch = job_.dstPitch;
    SquareRows<kSide> rows;
    for (uint32 r = 0; r < kSide; ++r) rows[r] = job_.srcRow(job_.rowOf(y + r * kOnePixel));
    uint8* dst = rowAt(job_.dst, dstPitch, band.first, 0, 0);
    for (uint32 left = band.count; left != 0; --left, dst = nextRow(dst, dstPitch)) {
      draw(rows, dst);
      for (const uint8*& row : rows) row = rowAt(row, srcPitch, kSide, 0, 0);
    }
  }

  void drawSquares(const Band& band) const {
    const Run run = {job_.startX >> 16, job_.srcWidth - 1, squares_};
    if constexpr (kBytes == 3) {
      forRows(band,
              [&](const auto& rows, uint8* dst) HWY_ATTR { averageRun24<kSide>(rows, run, dst); });
    } else {
      averageRunOf(Pixels(), band, run);
    }
  }
  /// Takes vectors as wide as the run.
  template <class D> HWY_INLINE void averageRunOf(D d, const Band& band, const Run& run) const {
    if (run.count >= hn::Lanes(d)) {
      forRows(band,
              [&](const auto& rows, uint8* dst) HWY_ATTR { averageRun<kSide>(d, rows, run, dst); });
    } else if constexpr (kLanes<D> > 4) {
      averageRunOf(hn::Half<D>(), band, run);
#if HWY_TARGET <= HWY_AVX2
    } else if (run.count != 0) {
      forRows(band,
              [&](const auto& rows, uint8* dst) HWY_ATTR { averageFew<kSide>(d, rows, run, dst); });
#endif
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

template <unsigned kSide, unsigned kBytes> bool drawIfWhole(const ScaleJob& job) {
  if (!WholeSteps<kSide, kBytes>::fits(job)) return false;
  WholeSteps<kSide, kBytes>(job).draw();
  return true;
}

/// Draws the job and returns true if it is one for WholeSteps.
inline bool drawWholeSteps(const ScaleJob& job) {
  return drawIfWhole<2, 4>(job) || drawIfWhole<4, 4>(job) || drawIfWhole<2, 3>(job) ||
         drawIfWhole<4, 3>(job);
}

#else

inline bool drawWholeSteps(const ScaleJob&) { return false; }

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
