// SPDX-License-Identifier: MIT

#include "reference/rasterpixReference.h"

namespace reference {
namespace {

/// The result of operation `rop` on one bit each. Written in binary, the code of an operation is
/// its column of results for (s, d) = 00, 01, 10, 11.
uint8 combineBit(uint32 rop, uint32 s, uint32 d) { return rop >> (3 - (2 * s + d)) & 1; }

uint8 combineByte(uint32 rop, uint8 s, uint8 d) {
  uint8 result = 0;
  for (uint32 bit = 0; bit < 8; ++bit)
    result = static_cast<uint8>(result | combineBit(rop, s >> bit & 1, d >> bit & 1) << bit);
  return result;
}

/// One word: all of it is read before any of it is stored.
void combineWord(Bytes& memory, int64 dst, int64 src, uint32 bytes, uint32 rop) {
  uint8 word[4];
  for (uint32 k = 0; k < bytes; ++k) {
    word[k] = combineByte(rop, memory.at(static_cast<size_t>(src + k)),
                          memory.at(static_cast<size_t>(dst + k)));
  }
  for (uint32 k = 0; k < bytes; ++k) memory.at(static_cast<size_t>(dst + k)) = word[k];
}

void combinePixel(Bytes& memory, int64 dst, int64 src, uint32 bytesPerPixel, uint32 rop) {
  if (bytesPerPixel != 3) {
    combineWord(memory, dst, src, bytesPerPixel, rop);
    return;
  }
  for (int64 k = 0; k < 3; ++k) combineWord(memory, dst + k, src + k, 1, rop);
}

}  // namespace

void pixmapBlock(Bytes& memory, int64 dst, uint32 dstPitch, int64 src, uint32 srcPitch,
                 uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                 uint32 dstY, uint32 width, uint32 height) {
  if (rop > 15 || rop == 5) return;
  const uint32 unit = bytesPerPixel == 3 ? 1 : bytesPerPixel;
  const int64 dstStep = dstPitch / unit * unit;
  const int64 srcStep = srcPitch / unit * unit;
  int64 s = src + int64{srcY} * srcPitch + int64{srcX} * bytesPerPixel;
  int64 d = dst + int64{dstY} * dstPitch + int64{dstX} * bytesPerPixel;
  for (uint32 j = 0; j < height; ++j, s += srcStep, d += dstStep) {
    for (int64 i = 0; i < width; ++i)
      combinePixel(memory, d + i * bytesPerPixel, s + i * bytesPerPixel, bytesPerPixel, rop);
  }
}

void rectPixmapRopCopy(Bytes& memory, int64 dst, uint32 dstPitch, int64 pixmap, uint32 pixmapPitch,
                       uint32 bytesPerPixel, uint32 tileX, uint32 tileY, uint32 pixmapWidth,
                       uint32 pixmapHeight, uint32 rop, uint32 dstX, uint32 dstY, uint32 width,
                       uint32 height) {
  uint32 sy = tileY % pixmapHeight;
  uint32 band = 0;
  for (uint32 done = 0; done < height; done += band, sy = 0) {
    band = pixmapHeight - sy < height - done ? pixmapHeight - sy : height - done;
    uint32 sx = tileX % pixmapWidth;
    uint32 chunk = 0;
    for (uint32 x = 0; x < width; x += chunk, sx = 0) {
      chunk = pixmapWidth - sx < width - x ? pixmapWidth - sx : width - x;
      pixmapBlock(memory, dst, dstPitch, pixmap, pixmapPitch, bytesPerPixel, sx, sy, rop, dstX + x,
                  dstY + done, chunk, band);
    }
  }
}

}  // namespace reference
