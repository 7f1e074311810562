// SPDX-License-Identifier: MIT

#include "reference/rasterCursorReference.h"

namespace reference {

uint32 cursorSize(uint64 width, uint64 height, uint64 bitsPerPixel) {
  constexpr uint64 kMost = 0xFFFFFFFF;
  if (width * bitsPerPixel > kMost) return kMost;
  if (width * bitsPerPixel + 31 > kMost) return kMost;
  const uint64 row = (width * bitsPerPixel + 31) / 32 * 4;
  return row * height > kMost ? uint32{kMost} : static_cast<uint32>(row * height);
}

void expandBitPlane(Bytes& dst, size_t at, const Bytes& bits, uint32 width, uint32 height,
                    uint32 bitsPerPixel) {
  const size_t bytes = bitsPerPixel / 8;
  for (uint32 y = 0; y < height; ++y) {
    const size_t row = at + size_t{y} * cursorSize(width, 1, bitsPerPixel);
    for (uint32 x = 0; x < width; ++x) {
      const uint8 byte = bits.at(y * size_t{cursorSize(width, 1, 1)} + x / 8);
      const bool set = (byte >> (7 - x % 8) & 1) != 0;
      for (size_t k = 0; k < bytes; ++k) dst.at(row + x * bytes + k) = set ? 0xFF : 0;
    }
  }
}

bool cursorBox(const RasterFrameBufferDesc& fb, const RasterCursor& cursor, int32 x, int32 y,
               RasterCursorBox* box) {
  bool visible = false;
  for (int64 row = 0; row < int64{cursor.height}; ++row) {
    for (int64 column = 0; column < int64{cursor.width}; ++column) {
      const int64 atX = int64{x} - cursor.hotX + column;
      const int64 atY = int64{y} - cursor.hotY + row;
      if (atX < 0 || atY < 0 || atX >= int64{fb.width} || atY >= int64{fb.height}) continue;
      if (!visible) {
        *box = {static_cast<int32>(atX),    static_cast<int32>(atY), 0, 0,
                static_cast<int32>(column), static_cast<int32>(row)};
      }
      visible = true;
      box->width = static_cast<int32>(column) - box->srcX + 1;
      box->height = static_cast<int32>(row) - box->srcY + 1;
    }
  }
  return visible;
}

void drawMaskCursor(Bytes& fb, size_t pitch, uint32 bytes, size_t x, size_t y, const Bytes& andMask,
                    const Bytes& xorMask, uint32 cursorWidth, const RasterCursorBox& box) {
  for (size_t row = 0; row < static_cast<size_t>(box.height); ++row) {
    for (size_t i = 0; i < static_cast<size_t>(box.width) * bytes; ++i) {
      const size_t in = (static_cast<size_t>(box.srcY) + row) * cursorWidth * bytes +
                        static_cast<size_t>(box.srcX) * bytes + i;
      uint8& out = fb.at((y + row) * pitch + x * bytes + i);
      out = static_cast<uint8>((out & andMask.at(in)) ^ xorMask.at(in));
    }
  }
}

}  // namespace reference
