// SPDX-License-Identifier: MIT
//
// Fill and copy of rectangles.
//
// A public function turns its arguments into rows (frameBuffer.h) and hands them to one kernel per
// call, chosen for the processor; a kernel walks the rows and runs one row loop (rows-inl.h).

#include "vector/kernelChoice.h"
#include "ops/mmxCopy.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "ops/rasteropsInternal.h"

uint32 rasterops_mmx = 0;  // C linkage: raster.h

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterops";

// The least size of a copy that bypasses the cache.
constexpr size_t kMmxMinBytes = 32;
constexpr uint32 kMmxMinRows = 16;

const RasteropsKernels& kernels() { return chosenKernels<lookUpRasterops>(); }

/// Whether one move of all bytes does what a walk of the rows does: there is nothing between them,
/// and where both sides overlap the rows are walked away from each other, as memmove does.
bool isOneMove(const RowPair& joined, bool bottomUp) {
  if (joined.rows != 1) return false;
  const bool movesUp =
      reinterpret_cast<uintptr_t>(joined.dst) > reinterpret_cast<uintptr_t>(joined.src);
  return !joined.overlap() || movesUp == bottomUp;
}

}  // namespace

void copyRows(const RowPair& rows) { kernels().copyRows(rows); }

void rectFill(uint8* fb, intptr_t pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x, uint32 y,
              uint32 width, uint32 height) {
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  const intptr_t step = rowStep(pitch, bytesPerPixel);
  const Rows rows = {rowAt(fb, pitch, y, x, bytesPerPixel), step, size_t{width} * bytesPerPixel,
                     height};
  kernels().fillRows(rows.joined(), repeatPixel(pixel, bytesPerPixel));
}

void copyInOrder(const RowPair& rows, bool bottomUp) {
  const bool streams = rasterops_mmx != 0 && rows.bytes >= kMmxMinBytes && rows.rows >= kMmxMinRows;
  if (!streams) {
    const RowPair joined = rows.joined();
    if (isOneMove(joined, bottomUp)) return copyRows(joined);
  }
  const RowPair walked = rows.inOrder(bottomUp || rows.gainFromLast());
  if (streams && !walked.overlap()) return mmxCopyRows(walked);
  copyRows(walked);
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
  using namespace raster;
  rectCopy({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY},
           bytesPerPixel, width, height);
}

void Raster_RectFillAlpha(uint8* fb, uint32 pitch, uint8 alpha, uint32 x, uint32 y, uint32 width,
                          uint32 height) {
  using namespace raster;
  const intptr_t step = pitchOf(pitch);
  const Rows rows = {rowAt(fb, step, y, x, 4), step, size_t{width} * 4, height};
  kernels().fillAlphaRows(rows.joined(), uint32{alpha} << 24);
}

}  // extern "C"
