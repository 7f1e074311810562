// SPDX-License-Identifier: MIT

#include "pngEncoder.h"

#include <new>

#include "colorTable.h"
#include "dynBuf.h"

namespace tool::live {
namespace {

constexpr uint32 kPngControl = 0xA0;
/// Lengths have 7, 7 and 8 bits in one, two or three bytes.
void putCompactLength(size_t length, Bytes& out) {
  constexpr uint32 kMore = 0x80;
  const auto value = static_cast<uint32>(length);
  out.put8(value < 1u << 7 ? value : (value & 0x7F) | kMore);
  if (value >= 1u << 7) out.put8(value < 1u << 14 ? value >> 7 : (value >> 7 & 0x7F) | kMore);
  if (value >= 1u << 14) out.put8(value >> 14);
}

}  // namespace

/// Fills `indices` and the palette, or returns false when there are too many colours.
bool PngEncoder::findPalette(const PixelView& pixels, const Rect& rect) {
  using Table = ColorTable<256>;
  Table table;
  indices.resize(size_t{image.width} * image.height);
  uint8* to = indices.data();
  uint32 previous = ~0u;
  uint32 index = 0;
  for (int32 y = rect.top; y < rect.bottom; ++y) {
    const uint8* row = pixels.at(rect.left, y);
    for (uint32 x = 0; x < widthOf(rect); ++x, row += 4) {
      uint32 color;
      memcpy(&color, row, sizeof color);
      color &= 0xFFFFFF;
      if (color != previous) index = table.indexOf(previous = color);
      if (index == Table::kNone) return false;
      *to++ = static_cast<uint8>(index);
    }
  }
  image.numColors = table.size();
  for (uint32 i = 0; i < table.size(); ++i) {
    const uint32 color = table.color(i);
    image.palette[i] = {static_cast<uint8>(color), static_cast<uint8>(color >> 8),
                        static_cast<uint8>(color >> 16), 0};
  }
  return true;
}

void PngEncoder::put(const PixelView& pixels, const Rect& rect, Bytes& out) {
  image.width = widthOf(rect);
  image.height = heightOf(rect);
  if (findPalette(pixels, rect)) {
    image.depth = image.bpp = 8;
    image.bytesPerLine = image.width;
    image.data = indices.data();
  } else {
    image.depth = 24;
    image.bpp = 32;
    image.bytesPerLine = pixels.pitch;
    image.data = const_cast<uint8*>(pixels.at(rect.left, rect.top));  // it is only read
  }
  const ImageUtilPNGWriteParams params = {level, true};
  DynBuf file;
  if (!ImageUtil_ConstructPNGBuffer(&image, &params, &file)) throw std::bad_alloc();
  out.put8(kPngControl);
  putCompactLength(file.size, out);
  out.append(file.data, file.size);
  DynBuf_Destroy(&file);
}

}  // namespace tool::live
