// SPDX-License-Identifier: MIT

#include "reference/rasteropsReference.h"

#include <algorithm>

namespace reference {

void rectFill(Bytes& fb, size_t base, uint32 pitch, uint32 bytesPerPixel, uint32 pixel, uint32 x,
              uint32 y, uint32 width, uint32 height) {
  size_t row = base + size_t{y} * pitch + size_t{x} * bytesPerPixel;
  size_t step = pitch;
  if (bytesPerPixel == 2) step = pitch / 2 * 2;
  if (bytesPerPixel == 4) step = pitch / 4 * 4;
  for (uint32 j = 0; j < height; ++j, row += step) {
    for (uint32 i = 0; i < width; ++i) {
      for (uint32 k = 0; k < bytesPerPixel; ++k)
        fb.at(row + size_t{i} * bytesPerPixel + k) = static_cast<uint8>(pixel >> (8 * k));
    }
  }
}

void rectCopy(Bytes& memory, size_t dst, uint32 dstPitch, size_t src, uint32 srcPitch,
              uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
              uint32 width, uint32 height) {
  const size_t bytes = size_t{width} * bytesPerPixel;
  Bytes row(bytes);
  for (uint32 j = 0; j < height; ++j) {
    const uint32 r = dstY > srcY ? height - 1 - j : j;
    const size_t s = src + size_t{srcY + r} * srcPitch + size_t{srcX} * bytesPerPixel;
    const size_t d = dst + size_t{dstY + r} * dstPitch + size_t{dstX} * bytesPerPixel;
    for (size_t i = 0; i < bytes; ++i) row[i] = memory.at(s + i);
    for (size_t i = 0; i < bytes; ++i) memory.at(d + i) = row[i];
  }
}

void rectFillAlpha(Bytes& fb, size_t base, uint32 pitch, uint8 alpha, uint32 x, uint32 y,
                   uint32 width, uint32 height) {
  for (uint32 j = 0; j < height; ++j) {
    for (uint32 i = 0; i < width; ++i)
      fb.at(base + size_t{y + j} * pitch + size_t{x + i} * 4 + 3) = alpha;
  }
}

}  // namespace reference
