// SPDX-License-Identifier: MIT
//
// ZRLE against a decoder that is written from RFC 6143.

#include "zrleEncoder.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "support/random.h"

namespace tool::live {
namespace {

using tests::Random;

/// The stream of a connection, inflated rectangle by rectangle.
class Inflater {
 public:
  Inflater() { inflateInit(&stream); }
  ~Inflater() { inflateEnd(&stream); }

  std::vector<uint8> inflateAll(const uint8* bytes, size_t size) {
    std::vector<uint8> plain(1 << 20);
    stream.next_in = const_cast<uint8*>(bytes);
    stream.avail_in = static_cast<uInt>(size);
    stream.next_out = plain.data();
    stream.avail_out = static_cast<uInt>(plain.size());
    EXPECT_EQ(inflate(&stream, Z_SYNC_FLUSH), Z_OK);
    EXPECT_EQ(stream.avail_in, 0u);
    return {plain.data(), stream.next_out};
  }

 private:
  z_stream stream = {};
};

/// Reads tiles; a pixel is the bytes that are sent of it.
class TileReader {
 public:
  TileReader(const std::vector<uint8>& plain, uint32 compactBytes)
      : at(plain.data()), end(plain.data() + plain.size()), pixelBytes(compactBytes) {}

  using Pixel = std::vector<uint8>;

  std::vector<Pixel> tile(uint32 width, uint32 height) {
    const uint32 type = byte();
    forms[type <= 1 ? type : type <= 16 ? 2 : type == 128 ? 3 : 4] = true;
    std::vector<Pixel> pixels;
    if (type == 0) {
      for (uint32 i = 0; i < width * height; ++i) pixels.push_back(pixel());
    } else if (type == 1) {
      pixels.assign(size_t{width} * height, pixel());
    } else if (type <= 16) {
      packed(type, width, height, pixels);
    } else {
      EXPECT_GE(type, 128u);
      EXPECT_NE(type, 129u);
      runs(type, size_t{width} * height, pixels);
    }
    EXPECT_EQ(pixels.size(), size_t{width} * height);
    return pixels;
  }
  bool isAtEnd() const { return at == end; }

  bool forms[5] = {};  // that were met: plain, one colour, packed, runs, runs with a palette

 private:
  uint32 byte() {
    EXPECT_LT(at, end);
    return at < end ? *at++ : 0;
  }
  Pixel pixel() {
    Pixel bytes;
    for (uint32 i = 0; i < pixelBytes; ++i) bytes.push_back(static_cast<uint8>(byte()));
    return bytes;
  }
  std::vector<Pixel> palette(uint32 count) {
    std::vector<Pixel> colors;
    for (uint32 i = 0; i < count; ++i) colors.push_back(pixel());
    return colors;
  }
  void packed(uint32 count, uint32 width, uint32 height, std::vector<Pixel>& pixels) {
    const std::vector<Pixel> colors = palette(count);
    const uint32 bits = count == 2 ? 1 : count <= 4 ? 2 : 4;
    for (uint32 y = 0; y < height; ++y) {
      uint32 held = 0;
      uint32 left = 0;
      for (uint32 x = 0; x < width; ++x) {
        if (left == 0) {
          held = byte();
          left = 8;
        }
        left -= bits;
        pixels.push_back(colors.at(held >> left & ((1u << bits) - 1)));
      }
    }
  }
  void runs(uint32 type, size_t count, std::vector<Pixel>& pixels) {
    const std::vector<Pixel> colors = palette(type - 128);
    while (pixels.size() < count && at < end) {
      const uint32 index = type == 128 ? 128 : byte();
      const Pixel color = type == 128 ? pixel() : colors.at(index & 127);
      size_t length = 1;
      if ((index & 128) != 0) {
        uint32 more = 255;
        while (more == 255) length += more = byte();
      }
      pixels.insert(pixels.end(), length, color);
    }
  }

  const uint8* at;
  const uint8* end;
  uint32 pixelBytes;
};

/// Decodes a rectangle and compares it with the pixels that the format makes of the picture.
void expectDecoded(const Bytes& out, Inflater& inflater, const PixelView& view, const Rect& rect,
                   const ViewerFormat& format, bool* forms) {
  ASSERT_EQ(bigEndian32(out.data()), out.size() - 4);
  const std::vector<uint8> plain = inflater.inflateAll(out.data() + 4, out.size() - 4);
  TileReader reader(plain, format.compactBytes());
  for (int32 y = rect.top; y < rect.bottom; y += 64) {
    for (int32 x = rect.left; x < rect.right; x += 64) {
      const Rect tile = {x, y, std::min(x + 64, rect.right), std::min(y + 64, rect.bottom)};
      const auto width = static_cast<uint32>(tile.right - tile.left);
      const auto height = static_cast<uint32>(tile.bottom - tile.top);
      const auto pixels = reader.tile(width, height);
      ASSERT_EQ(pixels.size(), size_t{width} * height);
      std::vector<uint8> expected(size_t{width} * height * format.bytesPerPixel());
      format.convert(expected.data(), width * format.bytesPerPixel(), view, tile);
      for (size_t i = 0; i < pixels.size(); ++i)
        ASSERT_EQ(memcmp(pixels[i].data(),
                         expected.data() + i * format.bytesPerPixel() + format.compactOffset(),
                         format.compactBytes()),
                  0)
            << "pixel " << i << " of the tile at " << x << ", " << y;
    }
  }
  EXPECT_TRUE(reader.isAtEnd());
  for (int i = 0; i < 5; ++i) forms[i] |= reader.forms[i];
}

/// A picture of some colours in runs of some length, with anything in the top bytes.
std::vector<uint32> randomPicture(Random& random, size_t count, uint32 colors, uint32 longest) {
  std::vector<uint32> palette(colors);
  for (uint32& color : palette) color = random.word();
  std::vector<uint32> pixels;
  while (pixels.size() < count) {
    const uint32 color = palette[random.below(colors)] & 0xFFFFFF;
    for (uint32 length = 1 + random.below(longest); length != 0; --length)
      pixels.push_back(color | random.word() << 24);
  }
  pixels.resize(count);
  return pixels;
}

constexpr PixelFormat kFormats[] = {
    {32, 24, false, true, 255, 255, 255, 16, 8, 0},   // 32
    {32, 24, false, true, 255, 255, 255, 0, 8, 16},   // red lowest
    {32, 24, true, true, 255, 255, 255, 16, 8, 0},    // big-endian
    {32, 24, false, true, 255, 255, 255, 24, 16, 8},  // in the high bytes
    {32, 30, false, true, 1023, 1023, 1023, 20, 10, 0},
    {24, 24, false, true, 255, 255, 255, 16, 8, 0},
    {16, 16, false, true, 31, 63, 31, 11, 5, 0},
    {16, 16, true, true, 31, 63, 31, 11, 5, 0},
    {16, 15, false, true, 31, 31, 31, 10, 5, 0},
    {8, 8, false, true, 7, 7, 3, 0, 3, 6},
    {8, 6, false, true, 3, 3, 3, 4, 2, 0},
    {8, 3, false, true, 1, 1, 1, 2, 1, 0},
};

TEST(ZrleEncoder, IsDecodedToTheSamePixelsInEveryFormat) {
  constexpr uint32 kWidth = 150;
  constexpr uint32 kHeight = 140;
  Random random(7);
  bool forms[5] = {};
  for (const PixelFormat& wanted : kFormats) {
    const ViewerFormat format(wanted);
    ZrleEncoder encoder;
    Inflater inflater;
    for (const uint32 colors : {1u, 2u, 3u, 5u, 16u, 17u, 127u, 128u, 5000u}) {
      for (const uint32 longest : {1u, 3u, 40u, 1000u}) {
        const auto pixels = randomPicture(random, size_t{kWidth} * kHeight, colors, longest);
        const PixelView view = {reinterpret_cast<const uint8*>(pixels.data()), 4 * kWidth, kWidth,
                                kHeight};
        const int32 x = random.between(0, kWidth - 1);
        const int32 y = random.between(0, kHeight - 1);
        const Rect rect = longest == 3 ? view.bounds()
                                       : Rect{x, y, random.between(x + 1, kWidth),
                                              random.between(y + 1, kHeight)};
        encoder.setLevel(static_cast<int>(random.below(10)));
        Bytes out;
        encoder.put(view, rect, format, out);
        expectDecoded(out, inflater, view, rect, format, forms);
        if (HasFatalFailure()) return;
      }
    }
  }
  for (const bool wasMet : forms) EXPECT_TRUE(wasMet);
}

TEST(ZrleEncoder, RepeatsAPatternBrieflyWhicheverColorItBeginsWith) {
  constexpr uint32 kSide = 64;
  const uint32 colors[] = {0xC0C0C0, 0x102030, 0xFFFFFF, 0x808080};
  Random random(8);
  std::vector<uint32> pixels;
  for (uint32 i = 0; i < kSide * kSide; ++i) pixels.push_back(colors[random.below(4)]);
  const PixelView view = {reinterpret_cast<const uint8*>(pixels.data()), 4 * kSide, kSide, kSide};
  ZrleEncoder encoder;
  Bytes out;
  encoder.put(view, view.bounds(), ViewerFormat(), out);
  EXPECT_GT(out.size(), kSide * kSide / 4);
  for (const uint32 color : colors) {
    pixels[0] = color;
    out.clear();
    encoder.put(view, view.bounds(), ViewerFormat(), out);
    EXPECT_LT(out.size(), kSide * kSide / 4 / 8);
  }
}

}  // namespace
}  // namespace tool::live
