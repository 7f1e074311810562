// SPDX-License-Identifier: MIT
//
// Bit planes.

#include "checkedView.h"

namespace raster::checked {
namespace {

/// What the pixels become.
struct Colors {
  bool stencil;
  uint32 foreground;
  uint32 background;
};

/// Bits from the first one of a byte on, and the pixels they are drawn to.
struct Job {
  const uint8* bits;
  uint32 bitsPitch;
  uint8* dst;
  uint32 dstPitch;
  int32 bytesPerPixel;
  uint32 width, height;
};

void draw(const Job& job, const Colors& colors) {
  const auto width = static_cast<int32>(job.width);
  const auto height = static_cast<int32>(job.height);
  if (colors.stencil) {
    Raster_BitsToPixelsStencil(job.bits, job.bitsPitch, job.dst, job.dstPitch, job.bytesPerPixel,
                               width, height, colors.foreground);
  } else {
    Raster_BitsToPixels(job.bits, job.bitsPitch, job.dst, job.dstPitch, job.bytesPerPixel, width,
                        height, colors.foreground, colors.background);
  }
}

constexpr uint32 kPieceBits = 4096;

/// Copies `count` bits from bit `shift` (1 to 7) of the first byte on. Not a byte is read that
/// holds none of them.
void shiftBits(const uint8* bits, uint32 shift, uint32 count, uint8* out) {
  const uint32 last = (shift + count - 1) / 8;
  for (uint32 i = 0; i < (count + 7) / 8; ++i) {
    const uint32 next = i < last ? bits[i + 1] : 0u;
    out[i] = static_cast<uint8>(uint32{bits[i]} << shift | next >> (8 - shift));
  }
}

/// Rows that begin within a byte are drawn in shifted pieces.
void drawShifted(const Job& job, uint32 shift, const Colors& colors) {
  uint8 piece[kPieceBits / 8];
  Job part = job;
  part.bits = piece;
  part.height = 1;
  for (size_t y = 0; y < job.height; ++y) {
    for (uint32 x = 0; x < job.width; x += kPieceBits) {
      part.width = std::min(kPieceBits, job.width - x);
      part.dst = job.dst + y * job.dstPitch + size_t{x} * static_cast<uint32>(job.bytesPerPixel);
      shiftBits(job.bits + y * job.bitsPitch + x / 8, shift, part.width, piece);
      draw(part, colors);
    }
  }
}

RasterStatus drawPlane(const RasterView* dst, const Rect* rect, const RasterView* plane, int32 srcX,
                       int32 srcY, const Colors& colors, uint32 flags) {
  Area area;
  const RasterStatus status = placeBoth(dst, rect, plane, srcX, srcY, flags, &area);
  if (status != RASTER_STATUS_OK) return status;
  if (!isPlane(*plane)) return RASTER_STATUS_BAD_FORMAT;
  if (area.isEmpty()) return RASTER_STATUS_OK;
  if (areNear(*dst, *plane) && area.inDst(*dst).overlaps(Span(*plane)))
    return RASTER_STATUS_OVERLAP;
  const uint32 bytesPerPixel = dst->bpp / 8;
  const Job job = {plane->data + size_t{area.srcY} * plane->pitch + area.srcX / 8,
                   plane->pitch,
                   dst->data + size_t{area.y} * dst->pitch + size_t{area.x} * bytesPerPixel,
                   dst->pitch,
                   static_cast<int32>(bytesPerPixel),
                   area.width,
                   area.height};
  if (area.srcX % 8 == 0) {
    draw(job, colors);
  } else {
    drawShifted(job, area.srcX % 8, colors);
  }
  return RASTER_STATUS_OK;
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_Bits(const RasterView* dst, const Rect* rect, const RasterView* plane,
                                int32 srcX, int32 srcY, uint32 foreground, uint32 background,
                                uint32 flags) {
  return raster::checked::drawPlane(dst, rect, plane, srcX, srcY, {false, foreground, background},
                                    flags);
}

RasterStatus RasterChecked_BitsStencil(const RasterView* dst, const Rect* rect,
                                       const RasterView* plane, int32 srcX, int32 srcY,
                                       uint32 foreground, uint32 flags) {
  return raster::checked::drawPlane(dst, rect, plane, srcX, srcY, {true, foreground, 0}, flags);
}

}  // extern "C"
