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

/// Fills a row of at least one vector. `pattern` is three vectors of pixels and the start of a
/// fourth; the end of the row is stored as one vector that overlaps what is there already.
HWY_INLINE void fillLongRow(uint8* row, size_t bytes, const uint8* pattern) {
  const Bytes d;
  const size_t step = hn::Lanes(d);
  const auto first = hn::LoadU(d, pattern);
  const auto second = hn::LoadU(d, pattern + step);
  const auto third = hn::LoadU(d, pattern + 2 * step);
  size_t i = 0;
  for (; bytes - i >= 3 * step; i += 3 * step) {
    hn::StoreU(first, d, row + i);
    hn::StoreU(second, d, row + i + step);
    hn::StoreU(third, d, row + i + 2 * step);
  }
  if (bytes - i >= step) hn::StoreU(first, d, row + i);
  if (bytes - i >= 2 * step) hn::StoreU(second, d, row + i + step);
  const size_t last = bytes - step;
  hn::StoreU(hn::LoadU(d, pattern + last % sizeof(PixelWords)), d, row + last);
}

void fillRows(uint8* row, intptr_t step, size_t bytes, uint32 height, PixelWords pixels) {
  const hn::ScalableTag<uint32> d32;
  uint32 pattern[4 * kLanes<decltype(d32)>];
  hn::StoreInterleaved3(hn::Set(d32, pixels.word[0]), hn::Set(d32, pixels.word[1]),
                        hn::Set(d32, pixels.word[2]), d32, pattern);
  hn::StoreU(hn::LoadU(d32, pattern), d32, pattern + 3 * hn::Lanes(d32));
  const auto* from = reinterpret_cast<const uint8*>(pattern);
  const bool isLong = bytes >= hn::Lanes(Bytes());
  for (; height != 0; --height, row = nextRow(row, step)) {
    if (isLong) {
      fillLongRow(row, bytes, from);
    } else {
      forLanes(Bytes(), bytes,
               [&](auto d, size_t i) { hn::StoreU(hn::LoadU(d, from + i), d, row + i); });
    }
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

const RasteropsKernels& kernels() { return *HWY_DYNAMIC_DISPATCH(rasteropsKernels)(); }

/// Whether a row of `bytes` bytes at `dst` overlaps one at `src`.
bool rowsOverlap(const uint8* dst, const uint8* src, size_t bytes) {
  const uintptr_t d = reinterpret_cast<uintptr_t>(dst);
  const uintptr_t s = reinterpret_cast<uintptr_t>(src);
  return s - bytes < d && d < s + bytes;
}

}  // namespace

void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height) {
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  kernels().fillRows(rowAt(fb, pitch, y, x, bytesPerPixel), rowStep(pitch, bytesPerPixel),
                     size_t{width} * bytesPerPixel, height, repeatPixel(pixel, bytesPerPixel));
}

void rectCopy(uint8* dst, intptr_t dstPitch, const uint8* src, intptr_t srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height) {
  const bool bottomUp = dstY > srcY;
  const uint32 firstRow = bottomUp ? height - 1 : 0;
  const uint8* s = rowAt(src, srcPitch, srcY + firstRow, srcX, bytesPerPixel);
  uint8* d = rowAt(dst, dstPitch, dstY + firstRow, dstX, bytesPerPixel);
  const intptr_t srcStep = bottomUp ? -srcPitch : srcPitch;
  const intptr_t dstStep = bottomUp ? -dstPitch : dstPitch;
  const size_t bytes = size_t{width} * bytesPerPixel;
  const bool streams = rasterops_mmx != 0 && bytes >= kMmxMinBytes && height >= kMmxMinRows;
  if (streams && !rowsOverlap(d, s, bytes)) {
    mmxCopyRows(d, dstStep, s, srcStep, bytes, height);
  } else {
    kernels().copyRows(d, dstStep, s, srcStep, bytes, height);
  }
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
  const intptr_t step = raster::pitchOf(pitch);
  raster::kernels().fillAlphaRows(raster::rowAt(fb, step, y, x, 4), step, width, height,
                                  uint32{alpha} << 24);
}

}  // extern "C"

#endif
