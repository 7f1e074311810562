// SPDX-License-Identifier: MIT
//
// Rectangles filled with a repeated pixmap, by plain copy or through a raster operation.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasterpix.cpp"
#include "hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <algorithm>

#include "rasterpixInternal.h"
#include "rop-inl.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Bytes = hn::ScalableTag<uint8>;

template <class Rop> void tileRows(const TileRows& t) {
  uint8* dst = t.dst;
  uint32 srcY = t.srcY;
  for (uint32 y = t.height; y != 0; --y, dst = nextRow(dst, t.dstStep)) {
    const uint8* src = rowAt(t.src, t.srcStep, srcY, 0, 0);
    srcY = srcY + 1 == t.srcRows ? 0 : srcY + 1;
    size_t i = std::min(t.bytes, t.period - t.phase);
    combineToRight<Rop>(dst, src + t.phase, i);
    for (; i != t.bytes; i += std::min(t.bytes - i, t.period))
      combineToRight<Rop>(dst + i, src, std::min(t.bytes - i, t.period));
  }
}

void copyBytes(uint8* dst, const uint8* src, size_t bytes) {
  forLanes(Bytes(), bytes,
           [&](auto d, size_t i) { storeLanes(d, loadLanes(d, src + i), dst + i); });
}

/// Writes the period once and then doubles what is there.
void widenRows(const TileRows& t, uint8* wide, size_t wideBytes) {
  uint32 srcY = t.srcY;
  for (uint32 y = std::min(t.height, t.srcRows); y != 0; --y, wide += wideBytes) {
    const uint8* src = rowAt(t.src, t.srcStep, srcY, 0, 0);
    srcY = srcY + 1 == t.srcRows ? 0 : srcY + 1;
    const size_t head = std::min(t.period - t.phase, wideBytes);
    copyBytes(wide, src + t.phase, head);
    copyBytes(wide + head, src, std::min(t.phase, wideBytes - head));
    for (size_t i = t.period; i < wideBytes; i += std::min(i, wideBytes - i))
      copyBytes(wide + i, wide, std::min(i, wideBytes - i));
  }
}

constexpr auto kTileRows = ropTable([](auto rop) { return &tileRows<decltype(rop)>; });
constexpr TileKernels kKernels = {kTileRows.data(), widenRows};

}  // namespace

const TileKernels* tileKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include <numeric>

#include "kernelChoice.h"
#include "panicPlace.h"
#include "raster.h"
#include "rasteropsRopInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterpix";

HWY_EXPORT(tileKernels);

const TileKernels* lookUpKernels() { return HWY_DYNAMIC_DISPATCH(tileKernels)(); }
const TileKernels& kernels() { return chosenKernels<lookUpKernels>(); }

// Rows of a pixmap that are shorter than kNarrow bytes are first widened, to kWide bytes or less,
// in a buffer on the stack.
constexpr size_t kNarrow = 256;
constexpr size_t kWide = 1024;
constexpr size_t kBufferBytes = 16384;
constexpr size_t kVectorBytes = 64;

/// A picture as the tiling functions are given it.
template <class Byte> struct Picture {
  Byte* base;
  intptr_t pitch;

  Byte* pixel(uint32 x, uint32 y, uint32 bytesPerPixel) const {
    return rowAt(base, pitch, y, x, bytesPerPixel);
  }
};

/// A rectangle of the destination that is to be filled with a pixmap.
struct Tiling {
  Picture<uint8> dst;
  Picture<const uint8> pixmap;
  uint32 bytesPerPixel;
  uint32 pixmapWidth, pixmapHeight;
  uint32 x, y, width, height;

  /// The rows of the whole rectangle, when the pitches step by whole pixels.
  TileRows rows(uint32 tileX, uint32 tileY) const {
    return {.dst = dst.pixel(x, y, bytesPerPixel),
            .dstStep = dst.pitch,
            .bytes = size_t{width} * bytesPerPixel,
            .height = height,
            .src = pixmap.base,
            .srcStep = pixmap.pitch,
            .srcRows = pixmapHeight,
            .srcY = tileY,
            .period = size_t{pixmapWidth} * bytesPerPixel,
            .phase = size_t{tileX} * bytesPerPixel};
  }
};

/// Combines a rectangle of `src` into one of `dst`, top down and left to right.
void ropBlock(const Picture<uint8>& dst, const Picture<const uint8>& src, uint32 bytesPerPixel,
              uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY, uint32 width,
              uint32 height) {
  if (rop >= kRopCount || rop == kRopNoop) return;
  ropRows({.dst = dst.pixel(dstX, dstY, bytesPerPixel),
           .dstStep = rowStep(dst.pitch, bytesPerPixel),
           .src = src.pixel(srcX, srcY, bytesPerPixel),
           .srcStep = rowStep(src.pitch, bytesPerPixel),
           .bytes = size_t{width} * bytesPerPixel,
           .height = height},
          bytesPerPixel, rop, RopWalk::kToRight);
}

/// Cuts the rectangle into blocks that do not cross an edge of the pixmap. Pixmap pixel
/// (tileX, tileY) lands on the rectangle's first one.
void tileBlocks(const Tiling& t, uint32 tileX, uint32 tileY, uint32 rop) {
  uint32 sy = tileY;
  for (uint32 y = t.y, h = t.height; h != 0; sy = 0) {
    const uint32 band = std::min(t.pixmapHeight - sy, h);
    uint32 sx = tileX;
    for (uint32 x = t.x, w = t.width; w != 0; sx = 0) {
      const uint32 chunk = std::min(t.pixmapWidth - sx, w);
      ropBlock(t.dst, t.pixmap, t.bytesPerPixel, sx, sy, rop, x, y, chunk, band);
      x += chunk;
      w -= chunk;
    }
    y += band;
    h -= band;
  }
}

/// How far rows are widened, with `most` bytes for each: as far as a destination row needs, or else
/// to whole periods, and to whole vectors of them where that fits.
size_t wideBytesOf(const TileRows& t, size_t most) {
  if (t.bytes <= most) return t.bytes;
  const size_t whole = std::lcm(t.period, kVectorBytes);
  return most / whole != 0 ? most / whole * whole : most / t.period * t.period;
}

/// Tiles slices of rows, each with its pixmap rows widened. All pixmap rows fit the buffer at once
/// unless there are very many of them.
void tileWidened(TileRows t, uint32 rop) {
  uint8 buffer[kBufferBytes];
  const auto rowsThatFit = static_cast<uint32>(kBufferBytes / (2 * kNarrow));
  const uint32 slice = t.srcRows <= rowsThatFit ? t.height : rowsThatFit;
  while (t.height != 0) {
    TileRows part = t;
    part.height = std::min(t.height, slice);
    const uint32 wideRows = std::min(part.height, t.srcRows);
    const size_t wideBytes = wideBytesOf(part, std::min(kWide, kBufferBytes / wideRows));
    kernels().widen(part, buffer, wideBytes);
    part.src = buffer;
    part.srcStep = static_cast<intptr_t>(wideBytes);
    part.srcRows = wideRows;
    part.srcY = 0;
    part.period = wideBytes;
    part.phase = 0;
    kernels().tile[rop](part);
    t.dst = rowAt(t.dst, t.dstStep, part.height, 0, 0);
    t.srcY = (t.srcY + part.height) % t.srcRows;
    t.height -= part.height;
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

void tile(const Tiling& t, uint32 tileX, uint32 tileY, uint32 rop) {
  const uint32 phaseX = tileX % t.pixmapWidth;  // first of all: a size of 0 faults here
  const uint32 phaseY = tileY % t.pixmapHeight;
  if (t.bytesPerPixel < 1 || t.bytesPerPixel > 4) unsupportedPixelSize(kSource);
  if (rop >= kRopCount || rop == kRopNoop || t.width == 0 || t.height == 0) return;
  const TileRows rows = t.rows(phaseX, phaseY);
  const bool steady = rows.dstStep == rowStep(rows.dstStep, t.bytesPerPixel) &&
                      rows.srcStep == rowStep(rows.srcStep, t.bytesPerPixel);
  if (!steady || !isOrderFree(rows) || !ropReadsSource(rop)) {
    tileBlocks(t, phaseX, phaseY, rop);
  } else if (rows.period < kNarrow && rows.bytes > rows.period - rows.phase) {
    tileWidened(rows, rop);
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
  raster::tile({{dst, pitchOf(dstPitch)},
                {pixmap, pitchOf(pixmapPitch)},
                static_cast<uint32>(bytesPerPixel),
                pixmapWidth,
                pixmapHeight,
                dstX,
                dstY,
                width,
                height},
               tileX, tileY, raster::kRopCopy);
}

void Raster_RectPixmapROPcopy(uint8* dst, uint32 dstPitch, const uint8* pixmap, uint32 pixmapPitch,
                              int32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                              uint32 pixmapHeight, uint32 rop, uint32 dstX, uint32 dstY,
                              uint32 width, uint32 height) {
  raster::tile({{dst, pitchOf(dstPitch)},
                {pixmap, pitchOf(pixmapPitch)},
                static_cast<uint32>(bytesPerPixel),
                pixmapWidth,
                pixmapHeight,
                dstX,
                dstY,
                width,
                height},
               tileX, tileY, rop);
}

void RasterRectPixmapROPcopy8(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                              uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                              uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch)}, {src, pitchOf(srcPitch)}, 1, srcX, srcY, rop, dstX,
                   dstY, width, height);
}

void RasterRectPixmapROPcopy16(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch)}, {src, pitchOf(srcPitch)}, 2, srcX, srcY, rop, dstX,
                   dstY, width, height);
}

void RasterRectPixmapROPcopy24(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch)}, {src, pitchOf(srcPitch)}, 3, srcX, srcY, rop, dstX,
                   dstY, width, height);
}

void RasterRectPixmapROPcopy32(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                               uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX, uint32 dstY,
                               uint32 width, uint32 height) {
  raster::ropBlock({dst, pitchOf(dstPitch)}, {src, pitchOf(srcPitch)}, 4, srcX, srcY, rop, dstX,
                   dstY, width, height);
}

}  // extern "C"

#endif
