// SPDX-License-Identifier: MIT
//
// Rectangles filled with a repeated pixmap, by plain copy or through a raster operation.

#include <algorithm>

#include "frameBuffer.h"
#include "panicPlace.h"
#include "raster.h"
#include "rasteropsRopInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterpix";

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

void tile(const Tiling& t, uint32 tileX, uint32 tileY, uint32 rop) {
  const uint32 phaseX = tileX % t.pixmapWidth;  // first of all: a size of 0 faults here
  const uint32 phaseY = tileY % t.pixmapHeight;
  if (t.bytesPerPixel < 1 || t.bytesPerPixel > 4) unsupportedPixelSize(kSource);
  tileBlocks(t, phaseX, phaseY, rop);
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
