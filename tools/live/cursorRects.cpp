// SPDX-License-Identifier: MIT

#include "cursorRects.h"

#include <algorithm>

#include "encodings.h"

namespace tool::live {
namespace {

void putHeader(const LiveCursor& cursor, Encoding encoding, Bytes& out) {
  putRectHeader(out, static_cast<uint32>(cursor.hotSpot.x), static_cast<uint32>(cursor.hotSpot.y),
                cursor.width, cursor.height, encoding);
}

uint32 alphaOf(uint32 pixel) { return pixel >> 24; }

/// The colour that was multiplied by its alpha.
uint32 ownColor(uint32 pixel) {
  const uint32 alpha = alphaOf(pixel);
  if (alpha == 0) return 0;
  uint32 color = 0;
  for (const uint32 shift : {0u, 8u, 16u})
    color |= std::min(255u, (pixel >> shift & 255) * 255 / alpha) << shift;
  return color;
}

}  // namespace

void putCursor(const LiveCursor& cursor, const ViewerFormat& format, Bytes& out) {
  constexpr uint32 kHalf = 128;
  putHeader(cursor, kCursor, out);
  for (const uint32 pixel : cursor.pixels)
    format.convert(out.extend(format.bytesPerPixel()), ownColor(pixel));
  const uint32 maskPitch = (cursor.width + 7) / 8;
  const size_t maskBytes = size_t{maskPitch} * cursor.height;
  uint8* mask = out.extend(maskBytes);
  std::fill_n(mask, maskBytes, uint8{0});
  for (uint32 y = 0; y < cursor.height; ++y)
    for (uint32 x = 0; x < cursor.width; ++x)
      if (alphaOf(cursor.pixels[size_t{y} * cursor.width + x]) >= kHalf)
        mask[size_t{maskPitch} * y + x / 8] |= static_cast<uint8>(0x80 >> x % 8);
}

void putCursorWithAlpha(const LiveCursor& cursor, Bytes& out) {
  putHeader(cursor, kCursorWithAlpha, out);
  out.put32(kRaw);
  for (const uint32 pixel : cursor.pixels) {
    out.put8(pixel >> 16);
    out.put8(pixel >> 8);
    out.put8(pixel);
    out.put8(alphaOf(pixel));
  }
}

}  // namespace tool::live
