// SPDX-License-Identifier: MIT

#include "reference/rasteropsRopReference.h"

#include "reference/unknown.h"

namespace reference {
namespace {

uint32 loadWord(const Bytes& memory, int64 at, uint32 bytes) {
  uint32 word = 0;
  for (uint32 k = 0; k < bytes; ++k)
    word |= uint32{memory.at(static_cast<size_t>(at + k))} << (8 * k);
  return word;
}

void storeWord(Bytes& memory, int64 at, uint32 bytes, uint32 word) {
  for (uint32 k = 0; k < bytes; ++k)
    memory.at(static_cast<size_t>(at + k)) = static_cast<uint8>(word >> (8 * k));
}

void combineWord(Bytes& memory, int64 dst, int64 src, uint32 bytes, uint32 rop) {
  storeWord(memory, dst, bytes,
            combine(rop, loadWord(memory, src, bytes), loadWord(memory, dst, bytes)));
}

}  // namespace

uint32 combine(uint32 rop, uint32 s, uint32 d) {
  switch (rop) {
    case 0:
      return 0;
    case 1:
      return s & d;
    case 2:
      return s & ~d;
    case 3:
      return s;
    case 4:
      return ~s & d;
    case 5:
      return d;
    case 6:
      return s ^ d;
    case 7:
      return s | d;
    case 8:
      return ~(s | d);
    case 9:
      return ~(s ^ d);
    case 10:
      return ~d;
    case 11:
      return s | ~d;
    case 12:
      return ~s;
    case 13:
      return ~s | d;
    case 14:
      return ~(s & d);
    case 15:
      return 0xFFFFFFFF;
    default:
      unknown("raster operation", rop);
  }
}

void combinePixel(Bytes& memory, int64 dst, int64 src, uint32 bytesPerPixel, uint32 rop,
                  bool fallingBytes) {
  if (bytesPerPixel != 3) {
    combineWord(memory, dst, src, bytesPerPixel, rop);
    return;
  }
  for (uint32 step = 0; step < 3; ++step) {
    const uint32 k = fallingBytes ? 2 - step : step;
    combineWord(memory, dst + k, src + k, 1, rop);
  }
}

int64 rowStep(int64 pitch, uint32 bytesPerPixel) {
  if (bytesPerPixel == 2) return (pitch >> 1) * 2;
  if (bytesPerPixel == 4) return (pitch >> 2) * 4;
  return pitch;
}

void rectRopFill(Bytes& memory, int64 fb, int32 pitch, uint32 bytesPerPixel, uint32 pixel,
                 uint32 rop, uint32 x, uint32 y, uint32 width, uint32 height) {
  if (rop > 15 || rop == 5) return;
  int64 row = fb + int64{y} * pitch + int64{x} * bytesPerPixel;
  for (uint32 j = 0; j < height; ++j, row += rowStep(pitch, bytesPerPixel)) {
    for (uint32 i = 0; i < width; ++i) {
      const int64 at = row + int64{i} * bytesPerPixel;
      storeWord(memory, at, bytesPerPixel,
                combine(rop, pixel, loadWord(memory, at, bytesPerPixel)));
    }
  }
}

void rectRopCopy(Bytes& memory, int64 dst, int32 dstPitch, int64 src, int32 srcPitch,
                 uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                 uint32 dstY, uint32 width, uint32 height) {
  if (rop > 15 || rop == 5) return;
  const bool bottomUp = srcY < dstY;
  const bool toLeft = srcY == dstY && dstX > srcX;
  const int64 firstRow = bottomUp ? int64{height} - 1 : 0;
  const int64 firstPixel = toLeft ? int64{width} - 1 : 0;
  int64 s = src + (srcY + firstRow) * srcPitch + (srcX + firstPixel) * bytesPerPixel;
  int64 d = dst + (dstY + firstRow) * dstPitch + (dstX + firstPixel) * bytesPerPixel;
  const int64 srcStep = rowStep(bottomUp ? -int64{srcPitch} : srcPitch, bytesPerPixel);
  const int64 dstStep = rowStep(bottomUp ? -int64{dstPitch} : dstPitch, bytesPerPixel);
  const int64 pixelStep = toLeft ? -int64{bytesPerPixel} : bytesPerPixel;
  for (uint32 j = 0; j < height; ++j, s += srcStep, d += dstStep) {
    for (uint32 i = 0; i < width; ++i)
      combinePixel(memory, d + i * pixelStep, s + i * pixelStep, bytesPerPixel, rop, toLeft);
  }
}

}  // namespace reference
