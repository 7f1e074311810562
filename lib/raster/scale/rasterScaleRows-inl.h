// SPDX-License-Identifier: MIT
//
// From resampled rows of 4-byte pixels to a row of the destination: as they are, mixed, or
// averaged. Included once per instruction set.

#if defined(RASTER_SCALE_ROWS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_ROWS_INL_H
#undef RASTER_SCALE_ROWS_INL_H
#else
#define RASTER_SCALE_ROWS_INL_H
#endif

#include "rasterScaleDivide-inl.h"
#include "rasterScaleInternal.h"
#include "vector/fields-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

/// Calls pixel(i) for a row of `width` pixels and stores what it returns in pixels of kBytes.
template <unsigned kBytes, class Pixel> void makeRow(uint8* dst, uint32 width, const Pixel& pixel) {
  for (uint32 i = 0; i < width; ++i) storePixel<kBytes>(dst + size_t{i} * kBytes, pixel(i));
}

template <unsigned kBytes> void storeRow(uint8* dst, const uint32* row, uint32 width) {
  makeRow<kBytes>(dst, width, [=](uint32 i) { return row[i]; });
}

void storeRow565(uint8* dst, const uint32* row, uint32 width) {
  makeRow<2>(dst, width, [=](uint32 i) { return convertColor<Code32, Code16>(row[i]); });
}

template <unsigned kBytes, bool /*kStreams*/>
void mixRows(uint8* dst, const uint32* upper, const uint32* lower, MixWeights weights,
             uint32 width) {
  makeRow<kBytes>(dst, width, [=](uint32 i) { return mixPixels(upper[i], lower[i], weights); });
}

template <unsigned kBytes, bool /*kStreams*/>
void averageRows(uint8* dst, const WeightedRows& rows, uint32 step, uint32 width) {
  makeRow<kBytes>(dst, width, [&](uint32 i) {
    ChannelSums sums;
    for (uint32 r = 0; r < rows.count; ++r) sums.add(rows.row[r][i], rows.weight[r]);
    return sums.average(step);
  });
}

#else

/// Makes block(i) for each block of a row and stores the `width` results in pixels of kBytes, those
/// of four bytes past the caches if kStreams.
template <unsigned kBytes, bool kStreams, class Block>
HWY_INLINE void makeRow(uint8* dst, size_t width, const Block& block) {
  static_assert(kBytes == 3 || kBytes == 4);
  const Pixels d;
  size_t i = 0;
  if constexpr (kBytes == 4) {
    for (; width - i >= kBlock; i += kBlock) putLanes<kStreams>(d, block(i), dst + 4 * i);
    if (i != width) storeFirst(d, block(i), width - i, dst + 4 * i);
  } else {
    // A whole vector is stored while its excess lies within the row, and is then overwritten.
    for (; width - i >= 2 * kBlock; i += kBlock)
      storeLanes(d, gatherTriples(d, block(i)), dst + 3 * i);
    for (; i < width; i += kBlock)
      storeFirstTriples(block(i), std::min(width - i, kBlock), dst + 3 * i);
  }
}

template <unsigned kBytes> void storeRow(uint8* dst, const uint32* row, uint32 width) {
  makeRow<kBytes, false>(dst, width, [=](size_t i) { return hn::LoadU(Pixels(), row + i); });
}

void storeRow565(uint8* dst, const uint32* row, uint32 width) {
  const Pixels d;
  const hn::Rebind<uint16, Pixels> d16;
  uint32 i = 0;
  for (; width - i >= kBlock; i += kBlock) {
    const PixelVec packed = convertLanes<Code32, Code16>(d, hn::LoadU(d, row + i));
    storeLanes(d16, hn::TruncateTo(d16, packed), dst + size_t{2} * i);
  }
  for (; i < width; ++i) storePixel<2>(dst + size_t{2} * i, convertColor<Code32, Code16>(row[i]));
}

template <unsigned kBytes, bool kStreams>
void mixRows(uint8* dst, const uint32* upper, const uint32* lower, MixWeights weights,
             uint32 width) {
  const HalvesVec w0 = hn::Set(Halves(), static_cast<uint16>(weights.first));
  const HalvesVec w1 = hn::Set(Halves(), static_cast<uint16>(weights.second));
  makeRow<kBytes, kStreams>(dst, width, [&](size_t i) {
    return mixLanes(hn::LoadU(Pixels(), upper + i), hn::LoadU(Pixels(), lower + i), w0, w1);
  });
}

template <unsigned kBytes, bool kStreams>
void averageRows(uint8* dst, const WeightedRows& rows, uint32 step, uint32 width) {
  withDivider(step, rows.count, [&](const auto& divider) {
    makeRow<kBytes, kStreams>(dst, width, [&](size_t i) {
      LaneSums sums = noSums();
      for (uint32 r = 0; r < rows.count; ++r) {
        sums.add(hn::LoadU(Pixels(), rows.row[r] + i),
                 hn::Set(Halves(), static_cast<uint16>(rows.weight[r])));
      }
      return divider.average(sums.br, sums.ga);
    });
  });
}

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
