// SPDX-License-Identifier: MIT
//
// The scaler: destination rows from source rows that are resampled horizontally and kept for as
// long as further destination rows need them.

#include <algorithm>
#include <cstdlib>

#include "rasterScaleInternal.h"
#include "utilAlloc.h"

namespace raster {
namespace {

constexpr uint32 kMaxRows = 32;
constexpr uint32 kEvenBytes = 0x00FF00FF;
constexpr uint32 kNoRow = ~0u;

uint32 load(const uint8* at, uint32 bytesPerPixel) {
  uint32 pixel = 0;
  memcpy(&pixel, at, std::min<uint32>(bytesPerPixel, 4));
  return pixel;
}

/// Two pixels mixed with byte weights: each channel is (c0 * w0 + c1 * w1) / 256, truncated.
uint32 mix(uint32 p0, uint32 p1, uint32 w0, uint32 w1) {
  const uint32 high = (p0 >> 8 & kEvenBytes) * w0 + (p1 >> 8 & kEvenBytes) * w1;
  const uint32 low = (p0 & kEvenBytes) * w0 + (p1 & kEvenBytes) * w1;
  return (high & ~kEvenBytes) | (low & ~kEvenBytes) >> 8;
}

/// Deliberate: the weights of a fraction add up to 255, so smoothed pixels are a shade darker.
uint32 mixAt(uint32 p0, uint32 p1, uint32 position) {
  const uint32 fraction = position & 0xFFFF;
  return mix(p0, p1, (65535 - fraction) >> 8, fraction >> 8);
}

/// Sums of the four channels of weighted pixels, two to a word.
struct Sums {
  uint32 br = 0;
  uint32 ga = 0;

  void add(uint32 pixel) {
    br += pixel & kEvenBytes;
    ga += pixel >> 8 & kEvenBytes;
  }
  void add(uint32 pixel, uint32 weight) { add(mix(pixel, 0, weight, 0)); }

  uint32 average(uint32 step) const {
    const uint32 red = br / step & 255;
    const uint32 blue = (br << 16) / step & 255;
    const uint32 green = (ga << 16) / step & 255;
    return ga / step << 24 | red << 16 | green << 8 | blue;
  }
};

/// The source rows, resampled to the width of the destination, as 4-byte pixels.
class RowCache {
 public:
  explicit RowCache(const ScaleJob& job) : job_(job) {
    if (job.smooth) slots_ = std::min(((job.stepY + 65535) >> 16) + 1, kMaxRows);
    // Deliberate: a 24-bit row made from 32-bit pixels is read at 16 bytes a pixel.
    pitch_ = job.width * (job.sizesDiffer && !job.depthsDiffer ? 4 : 1);
    rows_ = static_cast<uint32*>(UtilSafeCalloc0(size_t{pitch_} * slots_, sizeof(uint32)));
    std::fill_n(held_, slots_, kNoRow);
  }
  ~RowCache() { free(rows_); }
  RowCache(const RowCache&) = delete;
  RowCache& operator=(const RowCache&) = delete;

  /// The source row at a vertical position, which counts as signed.
  const uint32* at(uint32 position) {
    const auto y = static_cast<int32>(position);
    const uint32 row = std::min(job_.srcHeight - 1, y < 0 ? 0 : position >> 16);
    uint32* pixels = rows_ + size_t{row % slots_} * pitch_;
    if (held_[row % slots_] != row) {
      held_[row % slots_] = row;
      resample(rowAt(job_.src, job_.srcPitch, row, 0, 0), pixels);
    }
    return pixels;
  }

 private:
  uint32 pixel(const uint8* row, uint32 column) const {
    return load(row + size_t{column} * job_.srcBytesPerPixel, job_.srcBytesPerPixel);
  }

  void resample(const uint8* row, uint32* out) const {
    uint32* const end = out + job_.width;
    if (!job_.smooth || job_.stepX == kOnePixel) {
      out = nearest(row, out, end);
    } else if (job_.stepX < kOnePixel) {
      out = enlarge(row, out, end);
    } else {
      out = reduce(row, out, end);
    }
    std::fill(out, end, pixel(row, job_.srcWidth - 1));
  }

  uint32* nearest(const uint8* row, uint32* out, const uint32* end) const {
    for (uint32 x = job_.startX; out != end && x < job_.xLimit(); x += job_.stepX)
      *out++ = pixel(row, x >> 16);
    return out;
  }

  uint32* enlarge(const uint8* row, uint32* out, const uint32* end) const {
    uint32 x = job_.startX - kOnePixel / 2;
    for (; out != end && static_cast<int32>(x) < 0; x += job_.stepX) *out++ = pixel(row, 0);
    for (; out != end && x < job_.xLimit(); x += job_.stepX)
      *out++ = mixAt(pixel(row, x >> 16), pixel(row, (x >> 16) + 1), x);
    return out;
  }

  uint32* reduce(const uint8* row, uint32* out, const uint32* end) const {
    const uint32 limit = job_.xLimit();
    for (uint32 x = job_.startX; out != end && x < limit;) {
      Sums sums;
      uint32 remaining = job_.stepX;
      if ((x & 0xFFFF) != 0) {
        const uint32 part = kOnePixel - (x & 0xFFFF);
        sums.add(pixel(row, x >> 16), part >> 8);
        remaining -= part;
        x += part;
      }
      for (; x < limit && remaining >= kOnePixel; x += kOnePixel, remaining -= kOnePixel)
        sums.add(pixel(row, x >> 16));
      if (remaining != 0 && x < limit) {
        sums.add(pixel(row, x >> 16), (remaining & 0xFFFF) >> 8);
        x += remaining;
      }
      // Deliberate: the divisor is the whole step even where the source ended before.
      *out++ = sums.average(job_.stepX);
    }
    return out;
  }

  const ScaleJob& job_;
  uint32 slots_ = 1;
  uint32 pitch_ = 0;
  uint32* rows_ = nullptr;
  uint32 held_[kMaxRows];
};

/// The source rows that one destination row averages, and their weights.
struct WeightedRows {
  const uint32* row[kMaxRows];
  uint32 weight[kMaxRows];
  uint32 count = 0;

  void add(const uint32* pixels, uint32 rowWeight) {
    row[count] = pixels;
    weight[count++] = rowWeight;
  }
};

WeightedRows rowsOfStep(RowCache& cache, uint32 y, uint32 step) {
  WeightedRows rows;
  uint32 remaining = step;
  if ((y & 0xFFFF) != 0) {
    const uint32 part = kOnePixel - (y & 0xFFFF);
    rows.add(cache.at(y), part >> 8);
    remaining -= part;
    y += part;
  }
  for (; remaining >= kOnePixel && rows.count < kMaxRows; y += kOnePixel, remaining -= kOnePixel)
    rows.add(cache.at(y), 255);  // Deliberate: a whole row weighs 255/256, a whole pixel 1.
  if (remaining != 0 && rows.count < kMaxRows) rows.add(cache.at(y), (remaining & 0xFFFF) >> 8);
  return rows;
}

class Scaler {
 public:
  explicit Scaler(const ScaleJob& job) : job_(job), cache_(job) {}

  void draw() {
    uint8* dst = job_.dst;
    uint32 y = job_.startY;
    const bool mixes = job_.smooth && job_.stepY != kOnePixel;
    if (mixes && job_.stepY < kOnePixel) y -= kOnePixel / 2;
    for (uint32 i = 0; i < job_.height; ++i, y += job_.stepY, dst = nextRow(dst, job_.dstPitch)) {
      if (!mixes) {
        plainRow(dst, cache_.at(y));
      } else if (job_.stepY < kOnePixel) {
        mixedRow(dst, y);
      } else {
        averagedRow(dst, y);
      }
    }
  }

 private:
  uint8* pixelAt(uint8* row, uint32 i) const { return row + size_t{i} * job_.dstBytesPerPixel; }
  void store(uint8* row, uint32 i, uint32 pixel) const {
    memcpy(pixelAt(row, i), &pixel, std::min<uint32>(job_.dstBytesPerPixel, 4));
  }

  void plainRow(uint8* dst, const uint32* row) const {
    if (job_.depthsDiffer) {
      for (uint32 i = 0; i < job_.width; ++i) {
        const uint32 v = row[i];
        storePixel<2>(pixelAt(dst, i), (v & 0xF8) >> 3 | (v & 0xFC00) >> 5 | (v & 0xF80000) >> 8);
      }
    } else if (job_.sizesDiffer) {
      for (uint32 i = 0; i + 1 < job_.width; ++i) storePixel<3>(pixelAt(dst, i), row[4 * i]);
    } else {
      for (uint32 i = 0; i < job_.width; ++i) store(dst, i, row[i]);
    }
  }

  void mixedRow(uint8* dst, uint32 y) {
    const uint32* upper = cache_.at(y);
    const uint32* lower = cache_.at(y + kOnePixel);
    for (uint32 i = 0; i < job_.width; ++i) store(dst, i, mixAt(upper[i], lower[i], y));
  }

  void averagedRow(uint8* dst, uint32 y) {
    const WeightedRows rows = rowsOfStep(cache_, y, job_.stepY);
    for (uint32 i = 0; i < job_.width; ++i) {
      Sums sums;
      for (uint32 r = 0; r < rows.count; ++r) sums.add(rows.row[r][i], rows.weight[r]);
      store(dst, i, sums.average(job_.stepY));
    }
  }

  const ScaleJob& job_;
  RowCache cache_;
};

/// Pixels of more than four bytes: nearest sampling, whole pixels.
void copyWidePixels(const ScaleJob& job) {
  const size_t size = job.srcBytesPerPixel;
  for (uint32 i = 0; i < job.height; ++i) {
    const uint32 y = job.startY + i * job.stepY;
    const uint32 row = std::min(job.srcHeight - 1, static_cast<int32>(y) < 0 ? 0 : y >> 16);
    const uint8* src = rowAt(job.src, job.srcPitch, row, 0, 0);
    uint8* dst = rowAt(job.dst, job.dstPitch, i, 0, 0);
    uint32 x = job.startX;
    for (uint32 j = 0; j < job.width; ++j) {
      const uint32 column = x < job.xLimit() ? x >> 16 : job.srcWidth - 1;
      memcpy(dst + j * size, src + column * size, size);
      if (x < job.xLimit()) x += job.stepX;
    }
  }
}

}  // namespace

void scaleCore(const ScaleJob& job) {
  if (job.srcBytesPerPixel > 4) {
    copyWidePixels(job);
  } else if (job.dstBytesPerPixel != 0) {
    Scaler(job).draw();
  }
}

}  // namespace raster
