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

void fillRows(uint8* row, intptr_t step, size_t bytes, uint32 height, PixelWords pixels) {
  for (; height != 0; --height, row = nextRow(row, step)) {
    size_t i = 0;
    for (; bytes - i >= sizeof pixels; i += sizeof pixels) memcpy(row + i, &pixels, sizeof pixels);
    memcpy(row + i, &pixels, bytes - i);
  }
}

void copyRows(uint8* dst, intptr_t dstStep, const uint8* src, intptr_t srcStep, size_t bytes,
              uint32 height) {
  for (; height != 0; --height, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep))
    memmove(dst, src, bytes);
}

#else

using Bytes = hn::ScalableTag<uint8>;
using Words = hn::ScalableTag<uint32>;

/// Fills rows of at least one vector with the three vectors that start the pattern, over and over.
/// The end of a row is stored as one vector that overlaps what is there already.
template <class V>
HWY_INLINE void fillLongRows(uint8* row, intptr_t step, size_t bytes, uint32 height, V first,
                             V second, V third, V last) {
  const Bytes d;
  const size_t n = hn::Lanes(d);
  for (; height != 0; --height, row = nextRow(row, step)) {
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

void fillShortRows(uint8* row, intptr_t step, size_t bytes, uint32 height, PixelWords pixels) {
  const PixelPattern pattern = patternOf(pixels);
  for (; height != 0; --height, row = nextRow(row, step)) {
    forLanes(Bytes(), bytes,
             [&](auto d, size_t i) { hn::StoreU(hn::LoadU(d, pattern.bytes + i), d, row + i); });
  }
}

void fillRows(uint8* row, intptr_t step, size_t bytes, uint32 height, PixelWords pixels) {
  const Bytes d;
  const size_t n = hn::Lanes(d);
  if (bytes < n) {
    fillShortRows(row, step, bytes, height, pixels);
  } else if (pixels.word[0] == pixels.word[1] && pixels.word[1] == pixels.word[2]) {
    const auto same = hn::BitCast(d, hn::Set(Words(), pixels.word[0]));
    fillLongRows(row, step, bytes, height, same, same, same, same);
  } else {
    const PixelPattern pattern = patternOf(pixels);
    const size_t lastPhase = (bytes - n) % sizeof pixels;
    fillLongRows(row, step, bytes, height, hn::LoadU(d, pattern.bytes),
                 hn::LoadU(d, pattern.bytes + n), hn::LoadU(d, pattern.bytes + 2 * n),
                 hn::LoadU(d, pattern.bytes + lastPhase));
  }
}

/// Copies rows of one to two blocks of `d`. A row is loaded whole before it is stored, so source
/// and destination may overlap.
template <class D>
void copyShortRows(D d, uint8* dst, intptr_t dstStep, const uint8* src, intptr_t srcStep,
                   size_t bytes, uint32 height) {
  if (bytes < hn::Lanes(d)) {
    if constexpr (kLanes < D >> 1)
      copyShortRows(hn::Half<D>(), dst, dstStep, src, srcStep, bytes, height);
    return;
  }
  const size_t last = bytes - hn::Lanes(d);
  for (; height != 0; --height, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep)) {
    const auto head = hn::LoadU(d, src);
    const auto tail = hn::LoadU(d, src + last);
    hn::StoreU(head, d, dst);
    hn::StoreU(tail, d, dst + last);
  }
}

void copyRows(uint8* dst, intptr_t dstStep, const uint8* src, intptr_t srcStep, size_t bytes,
              uint32 height) {
  if (bytes <= 2 * hn::Lanes(Bytes())) {
    copyShortRows(Bytes(), dst, dstStep, src, srcStep, bytes, height);
    return;
  }
  for (; height != 0; --height, dst = nextRow(dst, dstStep), src = nextRow(src, srcStep))
    memmove(dst, src, bytes);
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

void copyRows(const RowCopy& copy) {
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
    kernels().copyRows(copy.dst, 0, copy.src, 0, copy.bytes * copy.height, 1);
  } else {
    kernels().copyRows(d, dstStep, s, srcStep, copy.bytes, copy.height);
  }
}

}  // namespace

void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height) {
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  const intptr_t step = rowStep(pitch, bytesPerPixel);
  const RowRun run = joinRows(step, size_t{width} * bytesPerPixel, height);
  kernels().fillRows(rowAt(fb, pitch, y, x, bytesPerPixel), step, run.bytes, run.rows,
                     repeatPixel(pixel, bytesPerPixel));
}

void rectCopy(uint8* dst, intptr_t dstPitch, const uint8* src, intptr_t srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height) {
  if (height == 0) return;
  copyRows({.dst = rowAt(dst, dstPitch, dstY, dstX, bytesPerPixel),
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
