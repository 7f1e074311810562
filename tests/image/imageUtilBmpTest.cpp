// SPDX-License-Identifier: MIT
//
// Encoding BMP: whole files against a naive writer, and every way that an encoding can fail.

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "imageUtil.h"
#include "raster.h"
#include "support/failingCalloc.h"
#include "support/guardedBuffer.h"
#include "support/nextFunction.h"
#include "support/random.h"

namespace {

using Bytes = std::vector<uint8>;
using tests::GuardedBuffer;
using tests::Random;

// What the functions below, which stand in front of those of the libraries, do next.
struct Interposed {
  std::vector<size_t> appends;
  int failingAppend = -1;  // counted from 0
} interposed;

}  // namespace

extern "C" {

bool DynBuf_Append(DynBuf* buffer, const void* bytes, size_t length) {
  static auto* const next = tests::next<decltype(&DynBuf_Append)>("DynBuf_Append");
  interposed.appends.push_back(length);
  if (int(interposed.appends.size()) - 1 == interposed.failingAppend) return false;
  return next(buffer, bytes, length);
}

}  // extern "C"

namespace {

class ImageUtil_ConstructBMPBuffer : public testing::Test {
 protected:
  ImageUtil_ConstructBMPBuffer() { interposed = Interposed{}; }
  ~ImageUtil_ConstructBMPBuffer() override { interposed = Interposed{}; }
};

struct Picture {
  ImageUtilImage image{};
  GuardedBuffer pixels;

  Picture(uint32 width, uint32 height, uint32 depth, uint32 bpp, uint32 pitch)
      : pixels(size_t{height} * pitch) {
    image.width = width;
    image.height = height;
    image.depth = depth;
    image.bpp = bpp;
    image.bytesPerLine = pitch;
    image.data = pixels.data();
  }

  void turnOver() {
    const Bytes upright = pixels.bytes();
    const uint32 pitch = image.bytesPerLine;
    if (upright.empty()) return;
    for (uint32 y = 0; y < image.height; ++y)
      memcpy(pixels.data() + size_t{y} * pitch,
             upright.data() + size_t{image.height - 1 - y} * pitch, pitch);
    image.flags ^= IMAGE_FLAG_BOTTOM_UP;
  }
};

Bytes encode(const ImageUtilImage& image) {
  DynBuf out;
  if (!::ImageUtil_ConstructBMPBuffer(&image, &out)) return {};
  Bytes file(out.data, out.data + out.size);
  DynBuf_Destroy(&out);
  return file;
}

void put(Bytes& file, uint64 value, int bytes) {
  for (int i = 0; i < bytes; ++i) file.push_back(uint8(value >> (8 * i)));
}

/// The file, written from the format's description one pixel at a time.
Bytes model(const ImageUtilImage& image) {
  const bool palette = image.bpp <= 8;
  const uint32 colors = palette ? image.numColors : 0;
  const uint32 bytesPerPixel = palette ? image.bpp / 8 : 3;
  const uint32 rowBytes = (bytesPerPixel * image.width + 3) / 4 * 4;
  const uint32 offset = 14 + 40 + 4 * colors;
  Bytes file = {'B', 'M'};
  put(file, offset + rowBytes * image.height, 4);
  put(file, 0, 4);
  put(file, offset, 4);
  put(file, 40, 4);
  put(file, image.width, 4);
  put(file, image.height, 4);
  put(file, 1, 2);
  put(file, palette ? image.bpp : 24, 2);
  put(file, 0, 4);
  put(file, rowBytes * image.height, 4);
  put(file, 0, 8);
  put(file, colors, 4);
  put(file, 0, 4);
  for (uint32 i = 0; i < colors; ++i) {
    const ImageUtilColor c = image.palette[i];
    file.insert(file.end(), {c.blue, c.green, c.red, c.reserved});
  }
  for (uint32 i = 0; rowBytes != 0 && i < image.height; ++i) {
    const bool bottomUp = (image.flags & 1) != 0;
    const uint8* row =
        image.data + size_t{bottomUp ? i : image.height - 1 - i} * image.bytesPerLine;
    if (image.bpp == 8 || image.bpp == 24) {
      file.insert(file.end(), row, row + rowBytes);
      continue;
    }
    for (uint32 x = 0; x < image.width; ++x) {
      uint32 pixel = 0;
      memcpy(&pixel, row + size_t{x} * (image.bpp / 8), image.bpp / 8);
      const int32 depth = image.bpp == 32 ? 32 : int32(image.depth);
      put(file, Raster_ConvertOnePixel(pixel, depth, 24, false, nullptr) & 0xFFFFFF, 3);
    }
    file.resize(file.size() + rowBytes - 3 * image.width);
  }
  return file;
}

TEST_F(ImageUtil_ConstructBMPBuffer, EqualsTheModelInBothDirections) {
  struct Format {
    uint32 depth, bpp;
  };
  const Format formats[] = {{1, 1}, {4, 4}, {8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}};
  Random random(1);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    const Format f = formats[random.below(7)];
    const uint32 width = random.below(20) == 0 ? 3000 + random.below(20000) : random.below(70);
    const uint32 height = random.below(30);
    const uint32 padded = (width * ((f.bpp + 7) / 8) + 3) / 4 * 4;
    Picture picture(width, height, f.depth, f.bpp, padded + random.below(7));
    picture.pixels.assign(random.bytes(picture.pixels.size()));
    picture.image.numColors = random.below(257);
    const Bytes palette = random.bytes(1024);
    memcpy(picture.image.palette, palette.data(), palette.size());
    const Bytes expected = model(picture.image);
    ASSERT_EQ(encode(picture.image), expected)
        << "round " << round << ": " << f.depth << "/" << f.bpp << " " << width << "x" << height;
    picture.image.flags = 0xFFFFFFFE;  // other bits are ignored
    picture.turnOver();
    ASSERT_EQ(encode(picture.image), expected) << "round " << round << ", bottom-up";
  }
}

TEST_F(ImageUtil_ConstructBMPBuffer, WritesSeventyEightBytesForThreeByTwo) {
  Picture picture(3, 2, 24, 32, 12);
  for (size_t i = 0; i < 24; ++i) picture.pixels.data()[i] = uint8(i + 1);
  const Bytes file = encode(picture.image);
  const Bytes expected = {
      'B', 'M', 78, 0,  0,  0,  0,  0,  0,  0, 54, 0, 0, 0,                     //
      40,  0,   0,  0,  3,  0,  0,  0,  2,  0, 0,  0, 1, 0, 24, 0, 0, 0, 0, 0,  //
      24,  0,   0,  0,  0,  0,  0,  0,  0,  0, 0,  0, 0, 0, 0,  0, 0, 0, 0, 0,  //
      13,  14,  15, 17, 18, 19, 21, 22, 23, 0, 0,  0,                           //
      1,   2,   3,  5,  6,  7,  9,  10, 11, 0, 0,  0};
  EXPECT_EQ(file, expected);
}

TEST_F(ImageUtil_ConstructBMPBuffer, PutsThePixelsOf256ColorsAt1078) {
  Picture picture(5, 3, 8, 8, 8);
  picture.image.numColors = 256;
  picture.image.palette[255] = {1, 2, 3, 4};
  const Bytes file = encode(picture.image);
  ASSERT_EQ(file.size(), 1078u + 24);
  EXPECT_EQ(file[10] | file[11] << 8, 1078);
  EXPECT_EQ(file[46] | file[47] << 8, 256);
  EXPECT_EQ(Bytes(&file[1074], &file[1074] + 4), (Bytes{1, 2, 3, 4}));
}

TEST_F(ImageUtil_ConstructBMPBuffer, ConvertsSixteenBitsFromExactRows) {
  Picture picture(1, 3, 16, 16, 3);  // an odd pitch, which is not rounded here
  const uint8 rows[] = {0x1F, 0, 0x55, 0xE0, 7, 0x55, 0, 0xF8, 0x55};
  memcpy(picture.pixels.data(), rows, sizeof rows);
  const Bytes file = encode(picture.image);
  EXPECT_EQ(file[28], 24);
  EXPECT_EQ(Bytes(&file[54], &file[54] + 12), (Bytes{0, 0, 255, 0, 0, 255, 0, 0, 255, 0, 0, 0}));
}

// Deliberate: a row of fewer than 8 bits per pixel has no bytes.
TEST_F(ImageUtil_ConstructBMPBuffer, WritesHeadersAndPaletteOnlyBelowEightBits) {
  for (const uint32 bpp : {1u, 4u}) {
    Picture picture(100, 50, bpp, bpp, 100);
    picture.image.numColors = 2;
    picture.pixels.forbid();  // not read
    const Bytes file = encode(picture.image);
    ASSERT_EQ(file.size(), 54u + 8);
    EXPECT_EQ(file[28], bpp);
    EXPECT_EQ(file[34] | file[35] | file[36] | file[37], 0);
  }
}

TEST_F(ImageUtil_ConstructBMPBuffer, WritesNoPixelsForAHeightOfZero) {
  Picture picture(100, 0, 24, 32, 400);
  EXPECT_EQ(encode(picture.image), model(picture.image));
  EXPECT_EQ(encode(picture.image).size(), 54u);
  Picture withPalette(100, 0, 8, 8, 100);
  withPalette.image.numColors = 3;
  EXPECT_EQ(encode(withPalette.image).size(), 66u);
}

TEST_F(ImageUtil_ConstructBMPBuffer, AppendsHeadersPaletteAndPixelsInOrder) {
  Picture picture(5, 3, 8, 8, 8);
  picture.image.numColors = 7;
  encode(picture.image);
  EXPECT_EQ(interposed.appends, (std::vector<size_t>{14, 40, 28, 24}));
  interposed = Interposed{};
  picture.image.numColors = 0;
  encode(picture.image);
  EXPECT_EQ(interposed.appends, (std::vector<size_t>{14, 40, 24}));
}

TEST_F(ImageUtil_ConstructBMPBuffer, RefusesPixelsThatNoBlockOfMemoryHolds) {
  if (sizeof(size_t) > 4) GTEST_SKIP() << "64-bit memory holds whatever a file can";
  Picture picture(1, 1, 24, 32, 4);
  picture.image.width = 30000;
  picture.image.height = 30000;
  picture.pixels.forbid();  // not read
  DynBuf out = {nullptr, 123, 456};
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, &out));
  EXPECT_EQ(out.size, 123u);
  EXPECT_TRUE(interposed.appends.empty());
}

TEST_F(ImageUtil_ConstructBMPBuffer, TouchesNothingWithoutImageOrOutput) {
  DynBuf out = {nullptr, 123, 456};
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(nullptr, &out));
  EXPECT_EQ(out.size, 123u);
  EXPECT_EQ(out.allocated, 456u);
  const Picture picture(1, 1, 24, 24, 4);
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, nullptr));
}

TEST_F(ImageUtil_ConstructBMPBuffer, DestroysTheBufferWhenAnAppendFails) {
  Picture picture(300, 400, 24, 32, 1200);
  picture.image.flags = 0;
  encode(picture.image);
  const size_t appends = interposed.appends.size();
  ASSERT_GE(appends, 3u);
  for (size_t i = 0; i < appends; ++i) {
    interposed = Interposed{};
    interposed.failingAppend = int(i);
    DynBuf out = {nullptr, 123, 456};
    EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, &out));
    EXPECT_EQ(interposed.appends.size(), i + 1) << "went on after the failure";
    EXPECT_EQ(out.data, nullptr);
    EXPECT_EQ(out.size, 0u);
  }
}

#ifndef __SANITIZE_ADDRESS__
TEST_F(ImageUtil_ConstructBMPBuffer, TouchesNothingWhenThereIsNoWorkingMemory) {
  for (const uint32 bpp : {8u, 24u, 32u}) {
    const Picture picture(10, 10, bpp == 8 ? 8 : 24, bpp, 40);
    DynBuf out = {nullptr, 123, 456};
    tests::callocFails = true;
    const bool built = ::ImageUtil_ConstructBMPBuffer(&picture.image, &out);
    tests::callocFails = false;
    EXPECT_FALSE(built);
    EXPECT_EQ(out.size, 123u);
    EXPECT_EQ(out.allocated, 456u);
    EXPECT_TRUE(interposed.appends.empty());
  }
}
#endif

TEST_F(ImageUtil_ConstructBMPBuffer, RefusesWhatAFileCannotHold) {
  DynBuf out = {nullptr, 123, 456};
  Picture picture(1, 1, 24, 24, 4);
  picture.image.width = 0xFFFFFFFF;
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, &out));
  picture.image.width = picture.image.height = 0x10000;
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, &out));
  picture.image.width = 357913939;  // four rows of these are just below 4 GiB, the file is not
  picture.image.height = 4;
  EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&picture.image, &out));
  Picture colors(1, 1, 8, 8, 4);
  for (const uint32 count : {257u, 0xFFFFFFFFu}) {
    colors.image.numColors = count;
    EXPECT_FALSE(::ImageUtil_ConstructBMPBuffer(&colors.image, &out));
  }
  EXPECT_EQ(out.size, 123u);
  EXPECT_TRUE(interposed.appends.empty());
}

TEST_F(ImageUtil_ConstructBMPBuffer, IsFatalForAFormatThatCannotBeConverted) {
  const Picture picture(1, 1, 17, 32, 4);
  DynBuf out{};
  // In a process of its own: what the call holds when it ends is not released.
  EXPECT_DEATH(::ImageUtil_ConstructBMPBuffer(&picture.image, &out),
               "Raster convert pixels invalid source depth 17\nNOT_IMPLEMENTED "
               "lib/raster/rasterConv:[0-9]+\n");
}

}  // namespace
