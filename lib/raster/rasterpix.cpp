// SPDX-License-Identifier: MIT
//
// Rectangles filled with a repeated pixmap, by plain copy or through a raster operation.

#include <algorithm>

#include "divisionByZero.h"
#include "vector/kernelChoice.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "ops/rasteropsRopInternal.h"
#include "ops/rasterpixInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterpix";

const TileKernels& kernels() { return chosenKernels<lookUpTile>(); }

// Rows of a pixmap that are shorter are first widened.
constexpr size_t kNarrow = 1024;

/// A rectangle of the destination that is to be filled with a pixmap, whose corner is the pixel
/// that falls on the rectangle's.
struct Tiling {
  Corner<uint8> dst;
  Corner<const uint8> pixmap;
  uint32 pixmapWidth, pixmapHeight;
  uint32 width, height;
  uint32 bytesPerPixel;

  /// Whether the pitches step by whole pixels, and the bytes of a pixmap row fit a number.
  bool hasPlainRows() const {
    size_t period = 0;
    return dst.pitch == rowStep(dst.pitch, bytesPerPixel) &&
           pixmap.pitch == rowStep(pixmap.pitch, bytesPerPixel) &&
           !__builtin_mul_overflow(pixmapWidth, bytesPerPixel, &period);
  }

  /// The rows of the whole rectangle, where they are plain, from the pixmap pixel that falls on its
  /// first one.
  TileRows rows(uint32 phaseX, uint32 phaseY) const {
    return {.dst = dst.pixel(bytesPerPixel),
            .dstStep = dst.pitch,
            .bytes = size_t{width} * bytesPerPixel,
            .height = height,
            .src = pixmap.base,
            .srcStep = pixmap.pitch,
            .srcRows = pixmapHeight,
            .srcY = phaseY,
            .period = size_t{pixmapWidth} * bytesPerPixel,
            .phase = size_t{phaseX} * bytesPerPixel};
  }
};

/// Combines a rectangle of `src` into one of `dst`, top down and left to right.
void ropBlock(const Corner<uint8>& dst, const Corner<const uint8>& src, uint32 bytesPerPixel,
              uint32 rop, uint32 width, uint32 height) {
  if (rop >= kRopCount || rop == kRopNoop) return;
  ropRows({.dst = dst.pixel(bytesPerPixel),
           .dstStep = rowStep(dst.pitch, bytesPerPixel),
           .src = src.pixel(bytesPerPixel),
           .srcStep = rowStep(src.pitch, bytesPerPixel),
           .bytes = size_t{width} * bytesPerPixel,
           .rows = height},
          bytesPerPixel, rop, Walk::kToRight);
}

/// Cuts the rectangle into blocks that do not cross an edge of the pixmap. Pixmap pixel
/// (phaseX, phaseY) falls on the rectangle's first one.
void tileBlocks(const Tiling& t, uint32 phaseX, uint32 phaseY, uint32 rop) {
  Corner<uint8> dst = t.dst;
  Corner<const uint8> src = {t.pixmap.base, t.pixmap.pitch, phaseX, phaseY};
  for (uint32 h = t.height; h != 0; src.y = 0) {
    const uint32 band = std::min(t.pixmapHeight - src.y, h);
    dst.x = t.dst.x;
    src.x = phaseX;
    for (uint32 w = t.width; w != 0; src.x = 0) {
      const uint32 chunk = std::min(t.pixmapWidth - src.x, w);
      ropBlock(dst, src, t.bytesPerPixel, rop, chunk, band);
      dst.x += chunk;
      w -= chunk;
    }
    dst.y += band;
    h -= band;
  }
}

/// Whether the order of the pixels shows nowhere: every byte of the destination is written once,
/// and no byte of the pixmap is written.
bool isOrderFree(const TileRows& t) {
  const RowSpan dst(t.dst, t.dstStep, t.bytes, t.height);
  const RowSpan src(t.src, t.srcStep, t.period, t.srcRows);
  const intptr_t gap = static_cast<intptr_t>(t.bytes);
  return dst.isApartFrom(src) && (t.dstStep >= gap || t.dstStep <= -gap || t.height == 1);
}

/// Whether pixmap rows are better repeated before they are used: those that end within a row, are
/// short, and used more than once or twice.
bool isWorthWidening(const TileRows& t) {
  if (t.period >= kNarrow || t.bytes <= t.period - t.phase) return false;
  return t.height > t.srcRows || t.bytes > 2 * t.period;
}

/// In the order of the exported functions' arguments.
Tiling tilingOf(uint8* dst, uint32 dstPitch, const uint8* pixmap, uint32 pixmapPitch,
                int32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                uint32 pixmapHeight, uint32 dstX, uint32 dstY, uint32 width, uint32 height) {
  return {.dst = {dst, pitchOf(dstPitch), dstX, dstY},
          .pixmap = {pixmap, pitchOf(pixmapPitch), tileX, tileY},
          .pixmapWidth = pixmapWidth,
          .pixmapHeight = pixmapHeight,
          .width = width,
          .height = height,
          .bytesPerPixel = static_cast<uint32>(bytesPerPixel)};
}

void tile(const Tiling& t, uint32 rop) {
  // By a test of its own, first of all: a compiler may divide later, when the result is wanted.
  if (t.pixmapWidth == 0 || t.pixmapHeight == 0) divisionByZero();
  const uint32 phaseX = t.pixmap.x % t.pixmapWidth;
  const uint32 phaseY = t.pixmap.y % t.pixmapHeight;
  if (t.bytesPerPixel < 1 || t.bytesPerPixel > 4) unsupportedPixelSize(kSource);
  if (rop >= kRopCount || rop == kRopNoop || t.width == 0 || t.height == 0) return;
  const TileRows rows = t.rows(phaseX, phaseY);
  if (!t.hasPlainRows() || !isOrderFree(rows) || !ropReadsSource(rop)) {
    tileBlocks(t, phaseX, phaseY, rop);
  } else if (isWorthWidening(rows)) {
    kernels().tileWidened[rop](rows);
  } else {
    kernels().tile[rop](rows);
  }
}

}  // namespace
}  // namespace raster

using raster::pitchOf;

extern "C" {

void Raster_RectPixmapCopy(uint8* dst, uint32 dstPitch, const uint8* pixmap, uint32 pixmapPitch,
                           int32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                           uint32 pixmapHeight, uint32 dstX, uint32 dstY, uint32 width,
                           uint32 height) {
  raster::tile(raster::tilingOf(dst, dstPitch, pixmap, pixmapPitch, bytesPerPixel, tileX, tileY,
                                pixmapWidth, pixmapHeight, dstX, dstY, width, height),
               raster::kRopCopy);
}

void Raster_RectPixmapROPcopy(uint8* dst, uint32 dstPitch, const uint8* pixmap, uint32 pixmapPitch,
                              int32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                              uint32 pixmapHeight, uint32 rop, uint32 dstX, uint32 dstY,
                              uint32 width, uint32 height) {
  raster::tile(raster::tilingOf(dst, dstPitch, pixmap, pixmapPitch, bytesPerPixel, tileX, tileY,
                                pixmapWidth, pixmapHeight, dstX, dstY, width, height),
               rop);
}

void RasterRectPixmapROPcopy8(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                              uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                              uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, 1,
                   rop, width, height);
}

void RasterRectPixmapROPcopy16(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, 2,
                   rop, width, height);
}

void RasterRectPixmapROPcopy24(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, 3,
                   rop, width, height);
}

void RasterRectPixmapROPcopy32(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, 4,
                   rop, width, height);
}

}  // extern "C"
