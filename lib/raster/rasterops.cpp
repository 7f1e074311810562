// SPDX-License-Identifier: MIT
//
// Fill and copy of rectangles.
//
// A public function turns its arguments into rows (frameBuffer.h) and hands them to one kernel per
// call, chosen for the processor; a kernel walks the rows and runs one row loop (rows-inl.h).

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasterops.cpp"
#include "hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "pixelPattern-inl.h"
#include "rasteropsInternal.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

void fillRows(const FillRows& job) {
  uint8* row = job.row;
  for (uint32 y = job.height; y != 0; --y, row = nextRow(row, job.step)) {
    size_t i = 0;
    for (; job.bytes - i >= sizeof job.pixels; i += sizeof job.pixels)
      memcpy(row + i, &job.pixels, sizeof job.pixels);
    memcpy(row + i, &job.pixels, job.bytes - i);
  }
}

void copyRows(const CopyRows& job) {
  uint8* dst = job.dst;
  const uint8* src = job.src;
  for (uint32 y = job.height; y != 0;
       --y, dst = nextRow(dst, job.dstStep), src = nextRow(src, job.srcStep))
    memmove(dst, src, job.bytes);
}

#else

using Bytes = hn::ScalableTag<uint8>;
using Words = hn::ScalableTag<uint32>;

/// Fills rows of at least one vector with the three vectors that start the pattern, over and over.
/// The end of a row is stored as one vector that overlaps what is there already.
template <class D, class V = hn::Vec<D>>
HWY_INLINE void fillLongRows(D d, const FillRows& job, V first, V second, V third, V last) {
  constexpr size_t n = kLanes<D>;
  const size_t bytes = job.bytes;
  const intptr_t step = job.step;  // read here, as a store to a pixel might change it
  uint8* row = job.row;
  for (uint32 y = job.height; y != 0; --y, row = nextRow(row, step)) {
    size_t i = 0;
    for (; bytes - i >= 3 * n; i += 3 * n) {
      hn::StoreU(first, d, row + i);
      hn::StoreU(second, d, row + i + n);
      hn::StoreU(third, d, row + i + 2 * n);
    }
    if (bytes - i >= n) hn::StoreU(first, d, row + i);
    if (bytes - i >= 2 * n) hn::StoreU(second, d, row + i + n);
    hn::StoreU(last, d, row + bytes - n);
  }
}

/// Fills with words that are all the same: in vectors of `d`, or smaller ones for short rows.
template <class D> HWY_INLINE void fillWithWord(D d, const FillRows& job) {
  if (job.bytes >= kLanes<D>) {
    const auto same = hn::BitCast(d, hn::Set(hn::Repartition<uint32, D>(), job.pixels.word[0]));
    fillLongRows(d, job, same, same, same, same);
  } else if constexpr (kLanes < D >> sizeof(uint32)) {
    fillWithWord(hn::Half<D>(), job);
  } else {
    uint8* row = job.row;
    for (uint32 y = job.height; y != 0; --y, row = nextRow(row, job.step))
      memcpy(row, &job.pixels, job.bytes);
  }
}

HWY_NOINLINE void fillWithPattern(const FillRows& job) {
  const Bytes d;
  const size_t n = hn::Lanes(d);
  const PixelPattern pattern = patternOf(job.pixels);
  if (job.bytes >= n) {
    const size_t lastPhase = (job.bytes - n) % sizeof job.pixels;
    fillLongRows(d, job, hn::LoadU(d, pattern.bytes), hn::LoadU(d, pattern.bytes + n),
                 hn::LoadU(d, pattern.bytes + 2 * n), hn::LoadU(d, pattern.bytes + lastPhase));
    return;
  }
  uint8* row = job.row;
  for (uint32 y = job.height; y != 0; --y, row = nextRow(row, job.step)) {
    forLanes(d, job.bytes, [&](auto tag, size_t i) {
      storeLanes(tag, loadLanes(tag, pattern.bytes + i), row + i);
    });
  }
}

void fillRows(const FillRows& job) {
  const uint32* const word = job.pixels.word;
  if (word[0] != word[1] || word[1] != word[2]) return fillWithPattern(job);
  fillWithWord(Bytes(), job);
}

/// Copies rows of one to two blocks of `d`. A row is loaded whole before it is stored, so source
/// and destination may overlap.
template <class D> HWY_INLINE void copyShortRows(D d, const CopyRows& job) {
  if (job.bytes < kLanes<D>) {
    if constexpr (kLanes < D >> 1) copyShortRows(hn::Half<D>(), job);
    return;
  }
  const size_t last = job.bytes - kLanes<D>;
  uint8* dst = job.dst;
  const uint8* src = job.src;
  const intptr_t dstStep = job.dstStep;  // as above
  const intptr_t srcStep = job.srcStep;
  for (uint32 y = job.height; y != 0;
       --y, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep)) {
    const auto head = hn::LoadU(d, src);
    const auto tail = hn::LoadU(d, src + last);
    hn::StoreU(head, d, dst);
    hn::StoreU(tail, d, dst + last);
  }
}

constexpr Bytes kBytes;
constexpr size_t kStep = kLanes<Bytes>;

/// Moves four vectors, loaded before they are stored.
HWY_INLINE void moveFour(uint8* dst, const uint8* src) {
  const auto a = hn::LoadU(kBytes, src);
  const auto b = hn::LoadU(kBytes, src + kStep);
  const auto c = hn::LoadU(kBytes, src + 2 * kStep);
  const auto d = hn::LoadU(kBytes, src + 3 * kStep);
  hn::StoreU(a, kBytes, dst);
  hn::StoreU(b, kBytes, dst + kStep);
  hn::StoreU(c, kBytes, dst + 2 * kStep);
  hn::StoreU(d, kBytes, dst + 3 * kStep);
}
HWY_INLINE void moveOne(uint8* dst, const uint8* src) {
  hn::StoreU(hn::LoadU(kBytes, src), kBytes, dst);
}

/// As memmove, of more than a vector. Both ends are loaded first and stored last, so that what lies
/// between them is stored aligned.
void moveRow(uint8* dst, const uint8* src, size_t bytes) {
  const auto head = hn::LoadU(kBytes, src);
  const auto tail = hn::LoadU(kBytes, src + bytes - kStep);
  const uintptr_t ahead = reinterpret_cast<uintptr_t>(dst) - reinterpret_cast<uintptr_t>(src);
  if (ahead >= bytes) {
    size_t i = kStep - reinterpret_cast<uintptr_t>(dst) % kStep;
    for (; i + 4 * kStep < bytes; i += 4 * kStep) moveFour(dst + i, src + i);
    for (; i + kStep < bytes; i += kStep) moveOne(dst + i, src + i);
  } else {
    size_t end = bytes - reinterpret_cast<uintptr_t>(dst + bytes) % kStep;
    for (; end > 4 * kStep; end -= 4 * kStep)
      moveFour(dst + end - 4 * kStep, src + end - 4 * kStep);
    for (; end > kStep; end -= kStep) moveOne(dst + end - kStep, src + end - kStep);
  }
  hn::StoreU(head, kBytes, dst);
  hn::StoreU(tail, kBytes, dst + bytes - kStep);
}

// Rows up to here are moved by moveRow, which is faster than the C library's memmove for them: in
// the nearest cache, and on 32-bit x86, for which few are written, in the next one too.
constexpr size_t kMaxOwnBytes = sizeof(void*) == 4 ? 256 * 1024 : 32 * 1024;

HWY_NOINLINE void copyLongRows(const CopyRows& job) {
  uint8* dst = job.dst;
  const uint8* src = job.src;
  const intptr_t dstStep = job.dstStep;
  const intptr_t srcStep = job.srcStep;
  const size_t bytes = job.bytes;
  for (uint32 y = job.height; y != 0;
       --y, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep)) {
    if (bytes <= kMaxOwnBytes) {
      moveRow(dst, src, bytes);
    } else {
      memmove(dst, src, bytes);
    }
  }
}

// Two functions, as the short rows need nothing from the stack and so no alignment of it.
void copyRows(const CopyRows& job) {
  if (job.bytes > 2 * kStep) return copyLongRows(job);
  copyShortRows(kBytes, job);
}

#endif

void fillAlphaRows(uint8* row, intptr_t step, size_t pixels, uint32 height, uint32 alphaBits) {
  for (; height != 0; --height, row = nextRow(row, step)) {
    forLanes(hn::ScalableTag<uint32>(), pixels, [&](auto d, size_t x) {
      const auto color = hn::And(loadLanes(d, row + 4 * x), hn::Set(d, 0x00FFFFFFu));
      storeLanes(d, hn::Or(color, hn::Set(d, alphaBits)), row + 4 * x);
    });
  }
}

constexpr RasteropsKernels kKernels = {fillRows, copyRows, fillAlphaRows};

}  // namespace

const RasteropsKernels* rasteropsKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "kernelChoice.h"
#include "mmxCopy.h"
#include "panicPlace.h"
#include "raster.h"

uint32 rasterops_mmx = 0;  // C linkage: raster.h

namespace raster {
namespace {

HWY_EXPORT(rasteropsKernels);

constexpr char kSource[] = "lib/raster/rasterops";

// The least size of a copy that bypasses the cache.
constexpr size_t kMmxMinBytes = 32;
constexpr uint32 kMmxMinRows = 16;

const RasteropsKernels* lookUpKernels() { return HWY_DYNAMIC_DISPATCH(rasteropsKernels)(); }
const RasteropsKernels& kernels() { return chosenKernels<lookUpKernels>(); }

/// Whether `bytes` bytes at `dst` overlap as many at `src`.
bool overlap(const uint8* dst, const uint8* src, size_t bytes) {
  const uintptr_t d = reinterpret_cast<uintptr_t>(dst);
  const uintptr_t s = reinterpret_cast<uintptr_t>(src);
  return s - bytes < d && d < s + bytes;
}

/// A copy of rows: the top row of both sides, and whether the rows are walked from the last one up.
struct RowCopy {
  uint8* dst;
  intptr_t dstPitch;
  const uint8* src;
  intptr_t srcPitch;
  size_t bytes;
  uint32 height;
  bool bottomUp;

  /// Whether one move of all bytes does the same: the rows follow each other without a gap, and
  /// where they overlap they are walked away from each other, as memmove does.
  bool isOneMove() const {
    if (dstPitch != srcPitch || joinRows(dstPitch, bytes, height).rows == height) return false;
    if (!overlap(dst, src, bytes * height)) return true;
    const bool movesUp = reinterpret_cast<uintptr_t>(dst) > reinterpret_cast<uintptr_t>(src);
    return movesUp == bottomUp;
  }

  /// Whether the rows may be walked from the last one up and gain from it: a row that moves right
  /// within itself is moved from its end, and memory is read fastest in one direction throughout.
  /// Allowed while no row meets another one.
  bool gainsFromBottomUp() const {
    const uintptr_t distance = reinterpret_cast<uintptr_t>(dst) - reinterpret_cast<uintptr_t>(src);
    return dstPitch == srcPitch && dstPitch > 0 && distance != 0 && distance < bytes &&
           distance + bytes <= static_cast<uintptr_t>(dstPitch);
  }
};

void copyRectangle(const RowCopy& copy) {
  const bool bottomUp = copy.bottomUp || copy.gainsFromBottomUp();
  const uint32 first = bottomUp ? copy.height - 1 : 0;
  uint8* const d = rowAt(copy.dst, copy.dstPitch, first, 0, 0);
  const uint8* const s = rowAt(copy.src, copy.srcPitch, first, 0, 0);
  const intptr_t dstStep = bottomUp ? -copy.dstPitch : copy.dstPitch;
  const intptr_t srcStep = bottomUp ? -copy.srcPitch : copy.srcPitch;
  const bool streams =
      rasterops_mmx != 0 && copy.bytes >= kMmxMinBytes && copy.height >= kMmxMinRows;
  if (streams && !overlap(d, s, copy.bytes)) {
    mmxCopyRows(d, dstStep, s, srcStep, copy.bytes, copy.height);
  } else if (copy.isOneMove()) {
    kernels().copyRows({copy.dst, 0, copy.src, 0, copy.bytes * copy.height, 1});
  } else {
    kernels().copyRows({d, dstStep, s, srcStep, copy.bytes, copy.height});
  }
}

}  // namespace

void copyRows(const CopyRows& rows) { kernels().copyRows(rows); }

void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height) {
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  const intptr_t step = rowStep(pitch, bytesPerPixel);
  const RowRun run = joinRows(step, size_t{width} * bytesPerPixel, height);
  kernels().fillRows({rowAt(fb, pitch, y, x, bytesPerPixel), step, run.bytes, run.rows,
                      repeatPixel(pixel, bytesPerPixel)});
}

void rectCopy(uint8* dst, intptr_t dstPitch, const uint8* src, intptr_t srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height) {
  if (height == 0) return;
  copyRectangle({.dst = rowAt(dst, dstPitch, dstY, dstX, bytesPerPixel),
                 .dstPitch = dstPitch,
                 .src = rowAt(src, srcPitch, srcY, srcX, bytesPerPixel),
                 .srcPitch = srcPitch,
                 .bytes = size_t{width} * bytesPerPixel,
                 .height = height,
                 .bottomUp = dstY > srcY});
}

}  // namespace raster

extern "C" {

void Raster_RectFill(uint8* fb, uint32 pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x,
                     uint32 y, uint32 width, uint32 height) {
  raster::rectFill(fb, raster::pitchOf(pitch), bytesPerPixel, pixel, x, y, width, height);
}

void Raster_RectCopy(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                     uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
                     uint32 width, uint32 height) {
  raster::rectCopy(dst, raster::pitchOf(dstPitch), src, raster::pitchOf(srcPitch), bytesPerPixel,
                   srcX, srcY, dstX, dstY, width, height);
}

void Raster_RectFillAlpha(uint8* fb, uint32 pitch, uint8 alpha, uint32 x, uint32 y, uint32 width,
                          uint32 height) {
  using namespace raster;
  const intptr_t step = pitchOf(pitch);
  const RowRun run = joinRows(step, size_t{width} * 4, height);
  kernels().fillAlphaRows(rowAt(fb, step, y, x, 4), step, run.bytes / 4, run.rows,
                          uint32{alpha} << 24);
}

}  // extern "C"

#endif
