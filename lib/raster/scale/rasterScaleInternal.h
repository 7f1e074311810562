// SPDX-License-Identifier: MIT
//
// The scaler behind Raster_Scale: what one call asks for once its arguments are checked, and the
// arithmetic of single pixels.

#ifndef RASTER_RASTER_SCALE_INTERNAL_H
#define RASTER_RASTER_SCALE_INTERNAL_H

#include <algorithm>

#include "frame/frameBuffer.h"

namespace raster {

/// One source pixel in 16.16 fixed point, the unit of steps and positions.
inline constexpr uint32 kOnePixel = 0x10000;
inline constexpr uint32 kHalfPixel = kOnePixel / 2;

/// At most this many source rows make one destination row.
inline constexpr uint32 kMaxRows = 32;

/// Deliberate: a whole source row weighs 255/256 in an average, a whole source column 256/256.
inline constexpr uint32 kWholeRow = 255;
inline constexpr uint32 kWholeColumn = 256;

constexpr uint32 fractionOf(uint32 position) { return position & (kOnePixel - 1); }

/// One scaling call. The destination rectangle is not empty and neither is the source; sizes are
/// below 32768, steps below 2^31.
struct ScaleJob {
  uint8* dst;  ///< the rectangle's first pixel
  intptr_t dstPitch;
  uint32 dstBytesPerPixel;
  uint32 width;  ///< of the destination rectangle
  uint32 height;
  const uint8* src;
  intptr_t srcPitch;
  uint32 srcBytesPerPixel;
  uint32 srcWidth;
  uint32 srcHeight;
  uint32 stepX;  ///< source pixels per destination pixel, 16.16
  uint32 stepY;
  uint32 startX;  ///< source position of the rectangle's first pixel, 16.16, wrapped to 32 bits
  uint32 startY;
  bool smooth;
  bool depthsDiffer;
  bool sizesDiffer;

  /// The position of the last source column. No average reaches into it.
  uint32 xLimit() const { return (srcWidth - 1) * kOnePixel; }

  bool smoothColumns() const { return smooth && stepX != kOnePixel; }
  bool smoothRows() const { return smooth && stepY != kOnePixel; }
  bool converts() const { return depthsDiffer || sizesDiffer; }

  /// The row that holds a vertical position. Deliberate: positions count as signed, so one that
  /// wrapped past 2^31 means row 0.
  uint32 rowOf(uint32 position) const {
    const uint32 row = static_cast<int32>(position) < 0 ? 0 : position >> 16;
    return row < srcHeight ? row : srcHeight - 1;
  }
  size_t rowBytes() const { return size_t{width} * dstBytesPerPixel; }
  /// What is read and written for a destination row, at most.
  size_t touchedBytes() const {
    const uint64 columns = std::min<uint64>(uint64{width} * stepX >> 16, srcWidth);
    const uint32 rows = std::min(stepY, (smooth ? kMaxRows : 1) * kOnePixel);
    return rowBytes() + static_cast<size_t>(columns * srcBytesPerPixel * rows >> 16);
  }

  /// Whether no byte of the destination is a byte of the source or of two rows. Otherwise a source
  /// row is to be kept as it was when it was first needed, and resampled whole before it is drawn.
  bool isApart() const {
    const RowSpan to(dst, dstPitch, rowBytes(), height);
    const RowSpan from(src, srcPitch, size_t{srcWidth} * srcBytesPerPixel, srcHeight);
    const auto gap = static_cast<intptr_t>(rowBytes());
    return to.isApartFrom(from) && (height == 1 || dstPitch >= gap || dstPitch <= -gap);
  }
  const uint8* srcRow(uint32 row) const { return rowAt(src, srcPitch, row, 0, 0); }
};

/// The byte weights of a fraction in a mix of two neighbours. Deliberate: they add up to 255, not
/// 256, so smoothed pixels are a shade darker.
struct MixWeights {
  uint32 first;
  uint32 second;
};
constexpr MixWeights mixWeights(uint32 position) {
  const uint32 fraction = fractionOf(position);
  return {(65535 - fraction) >> 8, fraction >> 8};
}

inline constexpr uint32 kEvenBytes = 0x00FF00FF;

/// Two pixels mixed: each channel is (c0 * w0 + c1 * w1) / 256, truncated.
constexpr uint32 mixPixels(uint32 p0, uint32 p1, MixWeights w) {
  const uint32 high = (p0 >> 8 & kEvenBytes) * w.first + (p1 >> 8 & kEvenBytes) * w.second;
  const uint32 low = (p0 & kEvenBytes) * w.first + (p1 & kEvenBytes) * w.second;
  return (high & ~kEvenBytes) | (low & ~kEvenBytes) >> 8;
}

/// Sums of the channels of weighted pixels, two to a word, with the wrap of 32 bits.
struct ChannelSums {
  uint32 br = 0;  ///< blue from bit 0, red from bit 16
  uint32 ga = 0;  ///< green from bit 0, the fourth byte from bit 16

  constexpr void add(uint32 pixel) {
    br += pixel & kEvenBytes;
    ga += pixel >> 8 & kEvenBytes;
  }
  constexpr void add(uint32 pixel, uint32 weight) { add(mixPixels(pixel, 0, {weight, 0})); }

  constexpr uint32 average(uint32 step) const {
    const uint32 red = br / step & 255;
    const uint32 blue = (br << 16) / step & 255;
    const uint32 green = (ga << 16) / step & 255;
    return ga / step << 24 | red << 16 | green << 8 | blue;
  }
};

/// The source rows that one destination row is made of.
struct WeightedRows {
  const uint32* row[kMaxRows];
  uint32 weight[kMaxRows];
  uint32 count;
};

/// What the scaler of one instruction-set level offers.
struct ScaleKernels {
  void (*draw)(const ScaleJob& job);  ///< the job's rectangle
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const ScaleKernels* lookUpScale();

}  // namespace raster

#endif
