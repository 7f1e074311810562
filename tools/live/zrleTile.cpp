// SPDX-License-Identifier: MIT

#include "zrleTile.h"

#include <algorithm>

#include "colorTable.h"

namespace tool::live {
namespace {

constexpr uint32 kMostPackedColors = 16;

enum Subencoding : uint8 { kPlain = 0, kSolid = 1, kPlainRuns = 128 };

using Palette = ColorTable<127>;  // as many as runs can have

/// What is known of a tile before its form is chosen.
struct Survey {
  Palette palette;
  bool fitsPalette = true;
  uint32 singles = 0;     // runs of one pixel
  uint32 runs = 0;        // longer ones
  uint32 extraBytes = 0;  // of lengths that do not fit one byte
};

template <class Body> void forRuns(const uint32* pixels, uint32 count, Body body) {
  for (uint32 at = 0; at < count;) {
    const uint32 color = pixels[at];
    uint32 end = at + 1;
    while (end < count && pixels[end] == color) ++end;
    body(color, end - at);
    at = end;
  }
}

Survey surveyOf(const uint32* pixels, uint32 count) {
  Survey survey;
  forRuns(pixels, count, [&](uint32 color, uint32 length) {
    ++(length == 1 ? survey.singles : survey.runs);
    survey.extraBytes += (length - 1) / 255;
    if (survey.fitsPalette) survey.fitsPalette = survey.palette.indexOf(color) != Palette::kNone;
  });
  return survey;
}

/// The same colours in the order of their values, whichever of them the tile began with: what looks
/// alike in two tiles then has the same bytes, and zlib finds it.
Palette sorted(const Palette& palette) {
  uint32 colors[Palette::kNone];
  for (uint32 i = 0; i < palette.size(); ++i) colors[i] = palette.color(i);
  std::sort(colors, colors + palette.size());
  Palette inOrder;
  for (uint32 i = 0; i < palette.size(); ++i) inOrder.indexOf(colors[i]);
  return inOrder;
}

uint32 bitsOfIndex(uint32 colors) { return colors <= 2 ? 1 : colors <= 4 ? 2 : 4; }

/// Writes into room that is known to be enough, and three bytes beyond.
class Writer {
 public:
  Writer(uint8* room, const PixelPacking& packing) : at(room), pixelBytes(packing) {}

  void put(uint32 byte) { *at++ = static_cast<uint8>(byte); }
  void putPixel(uint32 pixel) {
    const uint32 value = pixel >> 8 * pixelBytes.offset;
    memcpy(at, &value, sizeof value);
    at += pixelBytes.bytes;
  }
  void putLength(uint32 length) {
    for (--length; length >= 255; length -= 255) put(255);
    put(length);
  }
  const uint8* end() const { return at; }

 private:
  uint8* at;
  PixelPacking pixelBytes;
};

struct Tile {
  const uint32* pixels;
  uint32 width;
  uint32 height;
  uint32 count() const { return width * height; }
};

void writePlain(Writer& writer, const Tile& tile) {
  writer.put(kPlain);
  for (uint32 i = 0; i < tile.count(); ++i) writer.putPixel(tile.pixels[i]);
}

void writePlainRuns(Writer& writer, const Tile& tile) {
  writer.put(kPlainRuns);
  forRuns(tile.pixels, tile.count(), [&](uint32 color, uint32 length) {
    writer.putPixel(color);
    writer.putLength(length);
  });
}

void writePalette(Writer& writer, const Palette& palette) {
  for (uint32 i = 0; i < palette.size(); ++i) writer.putPixel(palette.color(i));
}

void writePaletteRuns(Writer& writer, const Tile& tile, Palette palette) {
  constexpr uint32 kIsRun = 128;
  writer.put(kPlainRuns + palette.size());
  writePalette(writer, palette);
  forRuns(tile.pixels, tile.count(), [&](uint32 color, uint32 length) {
    const uint32 index = palette.indexOf(color);
    writer.put(length == 1 ? index : index | kIsRun);
    if (length != 1) writer.putLength(length);
  });
}

void writePacked(Writer& writer, const Tile& tile, Palette palette) {
  const uint32 bits = bitsOfIndex(palette.size());
  writer.put(palette.size());
  writePalette(writer, palette);
  const uint32* pixel = tile.pixels;
  for (uint32 y = 0; y < tile.height; ++y) {
    uint32 byte = 0;
    uint32 used = 0;
    uint32 index = palette.indexOf(*pixel);
    uint32 previous = *pixel;
    for (uint32 x = 0; x < tile.width; ++x, ++pixel) {
      if (*pixel != previous) index = palette.indexOf(previous = *pixel);
      byte = byte << bits | index;
      used += bits;
      if (used < 8) continue;
      writer.put(byte);
      byte = used = 0;
    }
    if (used != 0) writer.put(byte << (8 - used));
  }
}

}  // namespace

void putZrleTile(const uint32* pixels, uint32 width, uint32 height, const PixelPacking& packing,
                 Bytes& out) {
  constexpr uint32 kNever = ~0u;
  const Tile tile = {pixels, width, height};
  Survey survey = surveyOf(pixels, tile.count());
  const uint32 colors = survey.palette.size();
  const uint32 paletteBytes = colors * packing.bytes;
  const uint32 plain = tile.count() * packing.bytes;
  const uint32 plainRuns = (survey.singles + survey.runs) * (packing.bytes + 1) + survey.extraBytes;
  const uint32 paletteRuns =
      survey.fitsPalette ? paletteBytes + survey.singles + 2 * survey.runs + survey.extraBytes
                         : kNever;
  const uint32 packed = survey.fitsPalette && colors <= kMostPackedColors
                            ? paletteBytes + height * ((width * bitsOfIndex(colors) + 7) / 8)
                            : kNever;
  const uint32 least = std::min({plain, plainRuns, paletteRuns, packed});
  constexpr uint32 kBeyond = 3;
  const size_t before = out.size();
  Writer writer(out.extend(1 + size_t{least} + packing.bytes + kBeyond), packing);
  if (survey.fitsPalette && colors == 1) {
    writer.put(kSolid);
    writer.putPixel(*pixels);
  } else if (packed == least) {
    writePacked(writer, tile, sorted(survey.palette));
  } else if (paletteRuns == least) {
    writePaletteRuns(writer, tile, sorted(survey.palette));
  } else if (plainRuns == least) {
    writePlainRuns(writer, tile);
  } else {
    writePlain(writer, tile);
  }
  out.truncate(before + static_cast<size_t>(writer.end() - (out.data() + before)));
}

}  // namespace tool::live
