// SPDX-License-Identifier: MIT
//
// Comparison of pixel rectangles: plain, over a rect list, and under a mask with a tolerance.
//
// Pixels of 1, 2 or 3 bytes are compared as bytes. The fourth byte of a 4-byte pixel never counts;
// such rows, and everything under a mask, are compared by kernels.

#include "vector/kernelChoice.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "compare/rasterCompInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterComp";

const RasterCompKernels& kernels() { return chosenKernels<lookUpComp>(); }

/// A frame buffer to compare.
struct Picture {
  const uint8* base;
  uint32 pitch;
  int32 bpp;
};

/// Compares rows that are not empty as memcmp does. The C library's own is good where programs have
/// 64 bits; for 32-bit ones few know wide vectors.
int32 compareBytes(const uint8* a, intptr_t aStep, const uint8* b, intptr_t bStep, RowRun run) {
  if constexpr (sizeof(void*) == 4)
    return kernels().compareBytes(a, aStep, b, bStep, run.bytes, run.rows);
  for (; run.rows != 0; --run.rows, a = nextRow(a, aStep), b = nextRow(b, bStep)) {
    const int32 order = memcmp(a, b, run.bytes);
    if (order != 0) return order;
  }
  return 0;
}

int32 comparePixels(const Picture& a, const Picture& b, uint32 aX, uint32 aY, uint32 bX, uint32 bY,
                    uint32 width, uint32 height) {
  if (a.bpp % 8 != 0 || b.bpp % 8 != 0) notImplemented(kSource);
  if (a.bpp != b.bpp) notImplemented(kSource);
  if (height == 0) return 0;
  const uint32 bytesPerPixel = static_cast<uint32>(a.bpp / 8);
  const uint8* firstA = rowAt(a.base, pitchOf(a.pitch), aY, aX, bytesPerPixel);
  const uint8* firstB = rowAt(b.base, pitchOf(b.pitch), bY, bX, bytesPerPixel);
  const intptr_t aStep = pitchOf(a.pitch);
  const intptr_t bStep = pitchOf(b.pitch);
  RowRun run = {size_t{width} * bytesPerPixel, height};
  if (aStep == bStep) run = joinRows(aStep, run.bytes, run.rows);
  if (run.bytes == 0) return 0;
  if (bytesPerPixel != 4) return compareBytes(firstA, aStep, firstB, bStep, run);
  return kernels().compareColors(firstA, aStep, firstB, bStep, run.bytes / 4, run.rows);
}

/// Deliberate: the walk ends at an empty entry and nowhere else, after the list's end too.
int32 compareRects(const Picture& a, const Picture& b, const RectListEntry* entry) {
  for (; entry->height > 0 && entry->width > 0; ++entry) {
    const auto x = static_cast<uint32>(entry->x);
    const auto y = static_cast<uint32>(entry->y);
    const int32 order = comparePixels(a, b, x, y, x, y, static_cast<uint32>(entry->width),
                                      static_cast<uint32>(entry->height));
    if (order != 0) return order;
  }
  return 0;
}

CompareUnderMask kernelOf(uint32 bytesPerPixel) {
  if (bytesPerPixel == 1) return kernels().wholeBytes;
  return bytesPerPixel == 4 ? kernels().colorBits : kernels().bits;
}

/// How many bytes may differ. Deliberate: bytes are counted, but `maxDiffs` is in pixels of all
/// their bytes. A negative number allows none.
size_t byteLimit(int32 maxDiffs, uint32 bytesPerPixel) {
  if (maxDiffs < 0) return 0;
  const uint64 limit = uint64{static_cast<uint32>(maxDiffs)} * bytesPerPixel;
  return limit < SIZE_MAX ? static_cast<size_t>(limit) : SIZE_MAX;
}

}  // namespace
}  // namespace raster

extern "C" {

int32 Raster_ComparePixels(const void* a, uint32 aPitch, int32 aBpp, const void* b, uint32 bPitch,
                           int32 bBpp, uint32 aX, uint32 aY, uint32 bX, uint32 bY, uint32 width,
                           uint32 height) {
  return raster::comparePixels({static_cast<const uint8*>(a), aPitch, aBpp},
                               {static_cast<const uint8*>(b), bPitch, bBpp}, aX, aY, bX, bY, width,
                               height);
}

int32 Raster_CompareRects(const void* a, uint32 aPitch, int32 aBpp, const void* b, uint32 bPitch,
                          int32 bBpp, const RectList* rects) {
  return raster::compareRects({static_cast<const uint8*>(a), aPitch, aBpp},
                              {static_cast<const uint8*>(b), bPitch, bBpp}, rects->rects);
}

bool Raster_CompareMasked(const uint8* a, uint32 aPitch, int32 aBpp, const uint8* b, uint32 bPitch,
                          int32 bBpp, const uint8* mask, uint32 maskPitch, int32 maskBpp, int32 x,
                          int32 y, uint32 width, uint32 height, int32 maxDiffs) {
  using namespace raster;
  if (aBpp != bBpp || aBpp != maskBpp) notImplemented(kSource);
  if (aPitch != bPitch || aPitch != maskPitch) notImplemented(kSource);
  if (x != 0 || y != 0) notImplemented(kSource);
  const uint32 bytesPerPixel = (static_cast<uint32>(aBpp) + 7) / 8;
  if (aPitch != uint64{width} * bytesPerPixel) notImplemented(kSource);
  return kernelOf(bytesPerPixel)(a, b, mask, size_t{aPitch} * height,
                                 byteLimit(maxDiffs, bytesPerPixel));
}

}  // extern "C"
