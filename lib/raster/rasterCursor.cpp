// SPDX-License-Identifier: MIT
//
// Mouse cursors: the size of their planes, expansion of bit planes, clipping and drawing.

#include <algorithm>
#include <cstddef>

#include "blend/alphaBlendInternal.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "plane/rasterBitsInternal.h"
#include "ops/rasteropsInternal.h"
#include "ops/rasteropsRopInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterCursor";

// Five 32-bit words, then pointers at their natural alignment.
static_assert(offsetof(RasterCursor, height) == 16);
static_assert(offsetof(RasterCursor, pixels) == (sizeof(void*) == 4 ? 20 : 24));
static_assert(offsetof(RasterCursor, bpp) == (sizeof(void*) == 4 ? 24 : 28));
static_assert(offsetof(RasterCursor, andMask) == (sizeof(void*) == 4 ? 28 : 32));
static_assert(offsetof(RasterCursor, xorMask) == (sizeof(void*) == 4 ? 32 : 40));
static_assert(sizeof(RasterFrameBufferDesc) == 20 && sizeof(RasterCursorBox) == 24);

constexpr uint32 kTooLarge = 0xFFFFFFFF;

/// The bytes of a plane, or kTooLarge when a step on the way does not fit 32 bits.
uint32 planeSize(uint32 width, uint32 height, uint32 bitsPerPixel) {
  uint32 bits = 0;
  uint32 bytes = 0;
  if (__builtin_mul_overflow(width, bitsPerPixel, &bits) ||
      __builtin_add_overflow(bits, 31U, &bits) ||
      __builtin_mul_overflow((bits >> 5) * 4, height, &bytes))
    return kTooLarge;
  return bytes;
}

void expandBitPlane(uint32 width, uint32 height, uint32 bitsPerPixel, const uint8* bits, uint8* dst,
                    uint32 dstSize) {
  if (planeSize(width, height, bitsPerPixel) > dstSize) notImplemented(kSource);
  bitsToPixels(bits, planeSize(width, 1, 1), dst, planeSize(width, 1, bitsPerPixel),
               static_cast<int32>(bitsPerPixel / 8), static_cast<int32>(width),
               static_cast<int32>(height), 0xFFFFFFFF, 0);
}

/// A plane of depth 1 is expanded, one in the pixels' own depth copied with its row padding.
void takePlane(uint32 width, uint32 height, uint32 depth, const uint8* plane, uint32 bitsPerPixel,
               uint8* dst, uint32 size) {
  if (depth == 1) {
    expandBitPlane(width, height, bitsPerPixel, plane, dst, size);
  } else if (depth == bitsPerPixel) {
    if (size != 0) copyRows({dst, 0, plane, 0, size, 1});  // else it may be null
  } else {
    notImplemented(kSource);
  }
}

/// The visible part of a row or column of a cursor.
struct Visible {
  int64 at;     ///< in the frame buffer
  int64 size;   ///< not positive where nothing is visible
  int64 first;  ///< in the cursor
};

/// Clips `size` pixels at `at`. In 64 bits, where no sum of 32-bit numbers overflows. What begins
/// further right than a box can say is not visible, however wide the frame buffer.
Visible clip(int64 at, int64 size, int64 limit) {
  if (at > INT32_MAX) return {};
  Visible v = {at, size, 0};
  if (at < 0) v = {0, size + at, -at};
  v.size = std::min(v.size, limit - v.at);
  return v;
}

void drawAlpha(const Corner<uint8>& to, const RasterFrameBufferDesc& fb, const RasterCursor& cursor,
               const RasterCursorBox& box) {
  alphaBlend({.dst = to,
              .src = {cursor.pixels, pitchOf(4 * cursor.width), static_cast<uint32>(box.srcX),
                      static_cast<uint32>(box.srcY)},
              .width = static_cast<uint32>(box.width),
              .height = static_cast<uint32>(box.height),
              .depth = fb.depth,
              .bpp = fb.bpp,
              .op = RASTER_BLEND_OVER});
}

void drawMask(const Corner<uint8>& to, uint32 bytesPerPixel, const RasterCursor& cursor,
              const RasterCursorBox& box) {
  // The pitches of raster operations have a sign.
  const Corner<uint8> dst = {to.base, static_cast<int32>(to.pitch), to.x, to.y};
  const auto pitch = static_cast<int32>(cursor.width * bytesPerPixel);
  const auto combine = [&](const uint8* plane, uint32 rop) {
    const Corner<const uint8> src = {plane, pitch, static_cast<uint32>(box.srcX),
                                     static_cast<uint32>(box.srcY)};
    rectRopCopy(dst, src, bytesPerPixel, rop, static_cast<uint32>(box.width),
                static_cast<uint32>(box.height));
  };
  combine(cursor.andMask, RASTER_ROP_AND);
  combine(cursor.xorMask, RASTER_ROP_XOR);
}

}  // namespace
}  // namespace raster

extern "C" {

uint32 Raster_CalculateCursorSize(uint32 width, uint32 height, uint32 bitsPerPixel) {
  return raster::planeSize(width, height, bitsPerPixel);
}

void Raster_ExpandCursorBitPlane(uint32 width, uint32 height, uint32 bitsPerPixel,
                                 const uint8* bits, uint8* dst, uint32 dstSize) {
  raster::expandBitPlane(width, height, bitsPerPixel, bits, dst, dstSize);
}

void Raster_ExpandPlanarCursorData(uint32 width, uint32 height, uint32 andDepth,
                                   const uint8* andBits, uint32 xorDepth, const uint8* xorBits,
                                   uint32 bitsPerPixel, uint8* dst, uint32 dstSize) {
  const uint32 size = raster::planeSize(width, height, bitsPerPixel);
  const uint32 both = size > raster::kTooLarge / 2 ? raster::kTooLarge : 2 * size;
  if (dstSize < both) raster::notImplemented(raster::kSource);
  raster::takePlane(width, height, andDepth, andBits, bitsPerPixel, dst, size);
  raster::takePlane(width, height, xorDepth, xorBits, bitsPerPixel, dst + size, size);
}

bool Raster_ComputeCursorBox(const RasterFrameBufferDesc* fb, const RasterCursor* cursor, int32 x,
                             int32 y, RasterCursorBox* box) {
  const raster::Visible columns =
      raster::clip(int64{x} - cursor->hotX, static_cast<int32>(cursor->width), fb->width);
  const raster::Visible rows =
      raster::clip(int64{y} - cursor->hotY, static_cast<int32>(cursor->height), fb->height);
  if (columns.size <= 0 || rows.size <= 0) return false;
  *box = {static_cast<int32>(columns.at),    static_cast<int32>(rows.at),
          static_cast<int32>(columns.size),  static_cast<int32>(rows.size),
          static_cast<int32>(columns.first), static_cast<int32>(rows.first)};
  return true;
}

void Raster_DrawCursor(uint8* fbBits, const RasterFrameBufferDesc* fb, uint8* saveBits,
                       uint32 savePitch, const RasterCursor* cursor, const RasterCursorBox* box) {
  const uint32 bytesPerPixel = fb->bpp / 8;
  const auto x = static_cast<uint32>(box->x);
  const auto y = static_cast<uint32>(box->y);
  const raster::Corner<const uint8> below = {fbBits, raster::pitchOf(fb->pitch), x, y};
  raster::Corner<uint8> target = {fbBits, raster::pitchOf(fb->pitch), x, y};
  if (saveBits != nullptr) {
    target = {saveBits, raster::pitchOf(savePitch), 0, 0};
    raster::rectCopy(target, below, bytesPerPixel, static_cast<uint32>(box->width),
                     static_cast<uint32>(box->height));
  }
  if (cursor->type == RASTER_CURSOR_ALPHA) {
    raster::drawAlpha(target, *fb, *cursor, *box);
  } else if (cursor->type == RASTER_CURSOR_MASK) {
    if (cursor->depth != fb->depth || cursor->bpp != fb->bpp)
      raster::notImplemented(raster::kSource);
    raster::drawMask(target, bytesPerPixel, *cursor, *box);
  } else {
    raster::notImplemented(raster::kSource);
  }
}

}  // extern "C"
