// SPDX-License-Identifier: MIT

#include "viewerFormat.h"

#include <bit>

#include "raster.h"

namespace tool::live {
namespace {

struct KnownFormat {
  uint32 code;
  uint32 bitsPerPixel;
  uint32 redMask;
  uint32 greenMask;
  uint32 blueMask;
};

constexpr KnownFormat kKnown[] = {
    {32, 32, 0xFF0000, 0xFF00, 0xFF}, {24, 24, 0xFF0000, 0xFF00, 0xFF},
    {16, 16, 0xF800, 0x07E0, 0x001F}, {15, 16, 0x7C00, 0x03E0, 0x001F},
    {8, 8, 0x07, 0x38, 0xC0},         {6, 8, 0x30, 0x0C, 0x03},
    {3, 8, 0x04, 0x20, 0x80},
};

/// The true-colour format that stands behind a colour map.
constexpr PixelFormat kMapped = {8, 8, false, false, 7, 7, 3, 0, 3, 6};

uint32 redMask(const PixelFormat& format) { return format.redMax << format.redShift; }
uint32 greenMask(const PixelFormat& format) { return format.greenMax << format.greenShift; }
uint32 blueMask(const PixelFormat& format) { return format.blueMax << format.blueShift; }

uint32 codeOf(const PixelFormat& format) {
  if (format.bigEndian && format.bitsPerPixel > 8) return 0;
  for (const KnownFormat& known : kKnown)
    if (known.bitsPerPixel == format.bitsPerPixel && known.redMask == redMask(format) &&
        known.greenMask == greenMask(format) && known.blueMask == blueMask(format))
      return known.code;
  return 0;
}

bool isChannel(uint32 max, uint32 shift, uint32 bitsPerPixel) {
  return max != 0 && (max & (max + 1)) == 0 &&
         static_cast<uint32>(std::bit_width(max)) + shift <= bitsPerPixel;
}

bool isPossible(const PixelFormat& format) {
  const uint32 bits = format.bitsPerPixel;
  if (bits != 8 && bits != 16 && bits != 24 && bits != 32) return false;
  if (!format.trueColor) return bits == 8;
  if (!isChannel(format.redMax, format.redShift, bits) ||
      !isChannel(format.greenMax, format.greenShift, bits) ||
      !isChannel(format.blueMax, format.blueShift, bits))
    return false;
  const uint32 red = redMask(format);
  const uint32 green = greenMask(format);
  const uint32 blue = blueMask(format);
  return (red & green) == 0 && (green & blue) == 0 && (red & blue) == 0;
}

/// A value so that its low bytes, lowest first, are the pixel in memory.
uint32 inMemoryOrder(uint32 value, const PixelFormat& format) {
  return format.bigEndian ? __builtin_bswap32(value) >> (32 - format.bitsPerPixel) : value;
}

std::vector<uint32> channelTable(uint32 mask, const PixelFormat& format) {
  RasterRGBParam param;
  RasterRGB_MakeRGBParam(&param, 8, mask);
  std::vector<uint32> table(256);
  for (uint32 i = 0; i < 256; ++i)
    table[i] = inMemoryOrder((i * param.multiplier >> param.shift) & param.mask, format);
  return table;
}

}  // namespace

PixelFormat standardFormat() { return {32, 24, false, true, 255, 255, 255, 16, 8, 0}; }

std::optional<PixelFormat> readPixelFormat(const uint8* bytes) {
  PixelFormat format = {bytes[0],
                        bytes[1],
                        bytes[2] != 0,
                        bytes[3] != 0,
                        bigEndian16(bytes + 4),
                        bigEndian16(bytes + 6),
                        bigEndian16(bytes + 8),
                        bytes[10],
                        bytes[11],
                        bytes[12]};
  if (!isPossible(format)) return std::nullopt;
  return format.trueColor ? format : kMapped;
}

void putPixelFormat(Bytes& out, const PixelFormat& format) {
  out.put8(format.bitsPerPixel);
  out.put8(format.depth);
  out.put8(format.bigEndian);
  out.put8(format.trueColor);
  for (const uint32 max : {format.redMax, format.greenMax, format.blueMax}) out.put16(max);
  for (const uint32 shift : {format.redShift, format.greenShift, format.blueShift}) out.put8(shift);
  for (int padding = 0; padding < 3; ++padding) out.put8(0);
}

ViewerFormat::ViewerFormat(const PixelFormat& wanted)
    : format(wanted),
      pixelBytes(wanted.bitsPerPixel / 8),
      code(codeOf(wanted)),
      packedBytes(pixelBytes) {
  if (code == 0) fillTables();
  findPacking();
}

void ViewerFormat::fillTables() {
  channels[0] = channelTable(redMask(format), format);
  channels[1] = channelTable(greenMask(format), format);
  channels[2] = channelTable(blueMask(format), format);
}

void ViewerFormat::findPacking() {
  if (format.bitsPerPixel != 32 || format.depth > 24) return;
  const uint32 used = redMask(format) | greenMask(format) | blueMask(format);
  const bool isLow = (used & 0xFF000000) == 0;
  if (!isLow && (used & 0xFF) != 0) return;
  packedBytes = 3;
  packedOffset = isLow == format.bigEndian ? 1 : 0;
}

template <uint32 kBytes>
void ViewerFormat::convertRows(uint8* to, uint32 toPitch, const PixelView& from,
                               const Rect& area) const {
  const uint32 width = widthOf(area);
  for (int32 y = area.top; y < area.bottom; ++y, to += toPitch) {
    const uint8* source = from.at(area.left, y);
    uint8* pixel = to;
    for (uint32 x = 0; x < width; ++x, source += 4, pixel += kBytes) {
      const uint32 value = valueOf(source);
      memcpy(pixel, &value, kBytes);
    }
  }
}

void ViewerFormat::convert(uint8* to, uint32 toPitch, const PixelView& from,
                           const Rect& area) const {
  const auto x = static_cast<uint32>(area.left);
  const auto y = static_cast<uint32>(area.top);
  if (code == 32) {
    Raster_RectCopy(to, toPitch, from.data, from.pitch, 4, x, y, 0, 0, widthOf(area),
                    heightOf(area));
  } else if (code != 0) {
    // The library counts in whole pixels and takes any alignment.
    Raster_ConvertPixels(to, toPitch, static_cast<int32>(code), from.data, from.pitch, 32, false,
                         nullptr, x, y, 0, 0, widthOf(area), heightOf(area));
  } else if (pixelBytes == 1) {
    convertRows<1>(to, toPitch, from, area);
  } else if (pixelBytes == 2) {
    convertRows<2>(to, toPitch, from, area);
  } else if (pixelBytes == 3) {
    convertRows<3>(to, toPitch, from, area);
  } else {
    convertRows<4>(to, toPitch, from, area);
  }
}

void ViewerFormat::convert(uint8* to, uint32 color) const {
  uint8 pixel[4];
  memcpy(pixel, &color, sizeof pixel);
  convert(to, pixelBytes, {pixel, sizeof pixel, 1, 1}, {0, 0, 1, 1});
}

void ViewerFormat::putColorMap(Bytes& out) {
  constexpr uint32 kSetColorMapEntries = 1;
  constexpr uint32 kEntries = 256;
  out.put8(kSetColorMapEntries);
  out.put8(0);
  out.put16(0);
  out.put16(kEntries);
  for (uint32 i = 0; i < kEntries; ++i) {
    out.put16((i & 7) * 0xFFFF / 7);
    out.put16((i >> 3 & 7) * 0xFFFF / 7);
    out.put16((i >> 6) * 0xFFFF / 3);
  }
}

}  // namespace tool::live
