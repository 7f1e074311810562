// SPDX-License-Identifier: MIT
//
// Images to files, several images into one, and a part out of one.

#include <gtest/gtest.h>

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "fileIO.h"
#include "imageUtil.h"
#include "raster.h"
#include "support/failingCalloc.h"
#include "support/nextFunction.h"
#include "support/random.h"
#include "support/recordedMessages.h"

namespace {

using Bytes = std::vector<uint8>;
using tests::Messages;
using tests::Random;

// What FileIO_Write and calloc, which stand in front of the libraries' here, do next.
struct Interposed {
  size_t missingBytes = 0;
  FileIOResult writeResult = FILEIO_SUCCESS;
} interposed;

}  // namespace

extern "C" {

FileIOResult FileIO_Write(const FileIODescriptor* file, const void* bytes, size_t size,
                          size_t* actual) {
  static auto* const next = tests::next<decltype(&FileIO_Write)>("FileIO_Write");
  const FileIOResult result = next(file, bytes, size - interposed.missingBytes, actual);
  return interposed.writeResult != FILEIO_SUCCESS ? interposed.writeResult : result;
}

}  // extern "C"

namespace {

class Images : public testing::Test {
 protected:
  Images() { interposed = Interposed{}; }
  ~Images() override { interposed = Interposed{}; }
};
using ImageUtil_WriteImage = Images;
using ImageUtil_WritePNG = Images;
using ImageUtil_Combine = Images;
using ImageUtil_CropAndScaleImage = Images;

/// A path that is free, and is so again in the end.
struct TemporaryPath {
  std::string path;
  TemporaryPath() {
    char name[] = "/tmp/imageUtilTest.XXXXXX";
    close(mkstemp(name));
    path = name;
  }
  ~TemporaryPath() { unlink(path.c_str()); }
  TemporaryPath(const TemporaryPath&) = delete;
  TemporaryPath& operator=(const TemporaryPath&) = delete;

  Bytes contents() const {
    Bytes bytes(1 << 20);
    FILE* file = fopen(path.c_str(), "rb");
    if (file == nullptr) return {};
    bytes.resize(fread(bytes.data(), 1, bytes.size(), file));
    fclose(file);
    return bytes;
  }
};

/// An image that owns its pixels; `flags` and the palette are noise, to show that they are ignored.
struct Picture {
  ImageUtilImage image{};
  Bytes pixels;

  Picture() = default;
  Picture(uint32 width, uint32 height, uint32 depth, uint32 bpp, uint32 extraPitch = 0) {
    image.width = width;
    image.height = height;
    image.depth = depth;
    image.bpp = bpp;
    image.bytesPerLine = (width * (bpp / 8) + 3) / 4 * 4 + extraPitch;
    pixels.resize(size_t{height} * image.bytesPerLine + 4);
    image.data = pixels.data();
    image.flags = IMAGE_FLAG_BOTTOM_UP;
    image.numColors = 3;
    memset(image.palette, 0x77, sizeof image.palette);
  }
  Picture(Picture&&) = default;
  Picture& operator=(Picture&&) = default;
};

Picture noise(Random& random, uint32 width, uint32 height, uint32 depth, uint32 bpp,
              uint32 extraPitch = 0) {
  Picture picture(width, height, depth, bpp, extraPitch);
  picture.pixels = random.bytes(picture.pixels.size());
  picture.image.data = picture.pixels.data();
  return picture;
}

/// A result with its pixels, released in the end.
struct Result {
  ImageUtilImage image{};
  bool ok = false;
  Result() { memset(&image, 0xA5, sizeof image); }
  ~Result() {
    if (ok) ImageUtil_FreeImageData(&image);
  }
  Result(const Result&) = delete;
  Result& operator=(const Result&) = delete;

  Bytes bytes() const {
    return {image.data, image.data + size_t{image.height} * image.bytesPerLine};
  }
  bool untouched() const {
    ImageUtilImage fresh;
    memset(&fresh, 0xA5, sizeof fresh);
    return memcmp(&fresh, &image, sizeof fresh) == 0;
  }
};

void expectForm(const ImageUtilImage& image, uint32 width, uint32 height, uint32 depth,
                uint32 bpp) {
  ImageUtilImage expected{};  // no flags, no colours, no palette
  expected.width = width;
  expected.height = height;
  expected.depth = depth;
  expected.bpp = bpp;
  expected.bytesPerLine = (width * (bpp / 8) + 3) / 4 * 4;
  expected.data = image.data;
  EXPECT_EQ(0, memcmp(&image, &expected, sizeof image))
      << image.width << "x" << image.height << " " << image.depth << "/" << image.bpp << " pitch "
      << image.bytesPerLine;
}

// ---- Files ----

TEST_F(ImageUtil_WriteImage, WritesWhatTheEncodersMake) {
  Random random(1);
  const Picture picture = noise(random, 30, 20, 24, 32);
  const TemporaryPath file;
  DynBuf expected;
  ASSERT_TRUE(::ImageUtil_WriteImage(&picture.image, file.path.c_str(), IMAGE_UTIL_TYPE_PNG));
  ASSERT_TRUE(ImageUtil_ConstructPNGBuffer(&picture.image, nullptr, &expected));
  EXPECT_EQ(file.contents(), Bytes(expected.data, expected.data + expected.size));
  DynBuf_Destroy(&expected);
  ASSERT_TRUE(::ImageUtil_WriteImage(&picture.image, file.path.c_str(), IMAGE_UTIL_TYPE_BMP));
  ASSERT_TRUE(ImageUtil_ConstructBMPBuffer(&picture.image, &expected));
  EXPECT_EQ(file.contents(), Bytes(expected.data, expected.data + expected.size));
  DynBuf_Destroy(&expected);
}

TEST_F(ImageUtil_WritePNG, TakesParameters) {
  Random random(2);
  const Picture picture = noise(random, 30, 20, 24, 32);
  const TemporaryPath file;
  const ImageUtilPNGWriteParams params = {0, false};
  DynBuf expected;
  ASSERT_TRUE(::ImageUtil_WritePNG(&picture.image, file.path.c_str(), &params));
  ASSERT_TRUE(ImageUtil_ConstructPNGBuffer(&picture.image, &params, &expected));
  EXPECT_EQ(file.contents(), Bytes(expected.data, expected.data + expected.size));
  DynBuf_Destroy(&expected);
}

TEST_F(ImageUtil_WriteImage, PanicsForTypeTwo) {
  const Picture picture(1, 1, 24, 24);
  for (const uint32 type : {2u, 0xFFFFFFFFu}) {
    const Messages said =
        tests::messagesOf([&] { ::ImageUtil_WriteImage(&picture.image, "/tmp/never", type); });
    EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/image/imageUtil")) << said.panic;
    EXPECT_EQ(said.warning, "");
  }
}

TEST_F(ImageUtil_WriteImage, LeavesTheFileAloneWhenTheImageCannotBeEncoded) {
  const TemporaryPath file;
  unlink(file.path.c_str());
  Picture picture(1, 1, 8, 8);
  picture.image.numColors = 257;
  for (const uint32 type : {0u, 1u}) {
    const Messages said = tests::messagesOf([&] {
      EXPECT_FALSE(::ImageUtil_WriteImage(nullptr, file.path.c_str(), type));
      EXPECT_FALSE(::ImageUtil_WriteImage(&picture.image, file.path.c_str(), type));
      EXPECT_FALSE(::ImageUtil_WritePNG(&picture.image, file.path.c_str(), nullptr));
    });
    EXPECT_EQ(said.log, "");
  }
  EXPECT_NE(access(file.path.c_str(), F_OK), 0);
}

/// What the two writers say about a path.
std::vector<std::string> logsOf(const ImageUtilImage& image, const char* path) {
  std::vector<std::string> logs;
  for (const uint32 type : {0u, 1u}) {
    logs.push_back(
        tests::messagesOf([&] { EXPECT_FALSE(::ImageUtil_WriteImage(&image, path, type)); }).log);
  }
  logs.push_back(
      tests::messagesOf([&] { EXPECT_FALSE(::ImageUtil_WritePNG(&image, path, nullptr)); }).log);
  return logs;
}

TEST_F(ImageUtil_WriteImage, LogsAFileThatCannotBeOpened) {
  const Picture picture(1, 1, 24, 24);
  for (const std::string& log : logsOf(picture.image, "/tmp/no such folder/x"))
    EXPECT_EQ(log,
              "ImageUtilWriteBuf: Failed open file '/tmp/no such folder/x': File not found (2)\n");
  for (const std::string& log : logsOf(picture.image, "/tmp"))
    EXPECT_EQ(log, "ImageUtilWriteBuf: Failed open file '/tmp': Path is a directory (4)\n");
}

TEST_F(ImageUtil_WriteImage, LogsAWriteThatFailsAndLeavesTheFile) {
  const Picture picture(1, 1, 24, 24);
  const TemporaryPath file;
  interposed.missingBytes = 5;
  interposed.writeResult = FILEIO_NO_SPACE;
  for (const std::string& log : logsOf(picture.image, file.path.c_str()))
    EXPECT_EQ(log, "ImageUtilWriteBuf: Failed to write file '" + file.path +
                       "': No space left on device (6)\n");
  EXPECT_FALSE(file.contents().empty());
}

TEST_F(ImageUtil_WriteImage, LogsAShortWriteWithTheTextOfSuccess) {
  const Picture picture(1, 1, 24, 24);
  const TemporaryPath file;
  interposed.missingBytes = 1;
  for (const std::string& log : logsOf(picture.image, file.path.c_str()))
    EXPECT_EQ(log, "ImageUtilWriteBuf: Wrong number of image bytes written to '" + file.path +
                       "': Success (0)\n");
  EXPECT_FALSE(file.contents().empty());
}

// ---- Combine ----

struct Placed {
  Picture picture;
  int32 x, y;
};

void combine(const std::vector<Placed>& placed, Result* result) {
  std::vector<ImageUtilImage> images;
  std::vector<int32> positions;
  for (const Placed& p : placed) {
    images.push_back(p.picture.image);
    positions.insert(positions.end(), {p.x, p.y});
  }
  result->ok = ::ImageUtil_Combine(images.data(), positions.data(),
                                   static_cast<uint32>(images.size()), &result->image);
}

/// Images of one height beside each other, of these widths at these columns.
std::vector<Placed> inARow(uint64 seed, uint32 height, uint32 bpp,
                           std::initializer_list<std::pair<uint32, int32>> widthsAndColumns) {
  Random random(seed);
  std::vector<Placed> placed;
  for (const auto& [width, column] : widthsAndColumns)
    placed.push_back({noise(random, width, height, std::min(bpp, 24u), bpp), column, 0});
  return placed;
}

/// A pixel of a 15-, 16-, 24- or 32-bit image as an opaque 32-bit one.
uint32 opaquePixel(const ImageUtilImage& image, uint32 x, uint32 y) {
  uint32 pixel = 0;
  const uint32 bytes = image.bpp / 8;
  memcpy(&pixel, image.data + size_t{y} * image.bytesPerLine + size_t{x} * bytes, bytes);
  return Raster_ConvertOnePixel(pixel, int32(image.depth), 32, false, nullptr) | 0xFF000000u;
}

/// The combination, laid out pixel by pixel on a grid that reaches from -64 to 127.
struct Grid {
  static constexpr int32 kLow = -64;
  static constexpr int32 kSize = 192;
  struct Cell {
    uint32 covers = 0;
    Bytes pixel;
    uint32 opaque = 0;
  };
  std::vector<Cell> cells{size_t{kSize} * kSize};
  int32 left = kSize, top = kSize, right = kLow, bottom = kLow;

  Cell& at(int32 x, int32 y) { return cells[size_t(y - kLow) * kSize + size_t(x - kLow)]; }

  void draw(const Placed& p) {
    const ImageUtilImage& image = p.picture.image;
    const size_t bytes = image.bpp / 8;
    for (uint32 y = 0; y < image.height; ++y) {
      for (uint32 x = 0; x < image.width; ++x) {
        Cell& cell = at(p.x + int32(x), p.y + int32(y));
        ++cell.covers;
        left = std::min(left, p.x + int32(x));
        top = std::min(top, p.y + int32(y));
        right = std::max(right, p.x + int32(x) + 1);
        bottom = std::max(bottom, p.y + int32(y) + 1);
        if (image.data == nullptr) continue;
        const uint8* from = image.data + y * image.bytesPerLine + x * bytes;
        cell.pixel.assign(from, from + bytes);
        if (bytes < 4) cell.opaque = opaquePixel(image, x, y);
      }
    }
  }

  Bytes pixels(bool alpha, size_t bytesPerPixel) {
    Bytes all;
    for (int32 y = top; y < bottom; ++y) {
      for (int32 x = left; x < right; ++x) {
        Bytes pixel = at(x, y).pixel;
        pixel.resize(bytesPerPixel);
        if (alpha) memcpy(pixel.data(), &at(x, y).opaque, 4);
        all.insert(all.end(), pixel.begin(), pixel.end());
      }
      all.resize((all.size() + 3) / 4 * 4);  // rows start at multiples of 4 in `all` as well
    }
    return all;
  }
};

TEST_F(ImageUtil_Combine, EqualsTheModel) {
  struct Format {
    uint32 depth, bpp;
  };
  const Format formats[] = {{15, 16}, {16, 16}, {24, 24}, {24, 32}};
  Random random(3);
  for (int round = 0; round < tests::rounds(500); ++round) {
    const Format f = formats[random.below(4)];
    std::vector<Placed> placed;
    Grid grid;
    uint64 area = 0;
    for (uint32 i = 1 + random.below(4); i != 0; --i) {
      placed.push_back({noise(random, 1 + random.below(20), 1 + random.below(20), f.depth, f.bpp,
                              4 * random.below(3)),
                        random.between(-40, 40), random.between(-40, 40)});
      if (random.below(5) == 0) placed.back().picture.image.data = nullptr;
      if (random.below(3) == 0 && placed.size() > 1) {  // side by side: no gap
        placed.back().x = placed[0].x + int32(placed[0].picture.image.width);
        placed.back().y = placed[0].y;
      }
      grid.draw(placed.back());
      area += placed.back().picture.image.width * placed.back().picture.image.height;
    }
    const uint32 width = uint32(grid.right - grid.left);
    const uint32 height = uint32(grid.bottom - grid.top);
    const bool alpha = uint64{width} * height != area && f.bpp != 32;
    Result result;
    combine(placed, &result);
    ASSERT_TRUE(result.ok);
    expectForm(result.image, width, height, alpha ? 24 : f.depth, alpha ? 32 : f.bpp);
    ASSERT_EQ(result.bytes(), grid.pixels(alpha, alpha ? 4 : f.bpp / 8))
        << "round " << round << ": " << placed.size() << " images of " << f.depth << "/" << f.bpp;
  }
}

TEST_F(ImageUtil_Combine, CopiesTwoNeighboursOf32Bits) {
  const std::vector<Placed> placed = inARow(4, 10, 32, {{10, 0}, {10, 10}});
  Result result;
  combine(placed, &result);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 20, 10, 24, 32);
  EXPECT_EQ(0, memcmp(result.image.data, placed[0].picture.image.data, 40));  // alpha included
  EXPECT_EQ(0, memcmp(result.image.data + 40, placed[1].picture.image.data, 40));
}

TEST_F(ImageUtil_Combine, MarksGapsOf24BitsTransparent) {
  Random random(5);
  std::vector<Placed> placed;
  placed.push_back({noise(random, 2, 2, 24, 24), -1, 5});
  placed.push_back({noise(random, 2, 2, 24, 24), 2, 5});
  Result result;
  combine(placed, &result);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 5, 2, 24, 32);
  const uint8* row = result.image.data;
  const uint8* source = placed[0].picture.image.data;
  EXPECT_EQ(Bytes(row, row + 4), (Bytes{source[0], source[1], source[2], 0xFF}));
  EXPECT_EQ(Bytes(row + 8, row + 12), (Bytes{0, 0, 0, 0}));
  EXPECT_EQ(row[15], 0xFF);
}

// Deliberate: only the areas are compared.
TEST_F(ImageUtil_Combine, TakesAGapAndAnOverlapOfEqualAreaForACover) {
  const std::vector<Placed> placed = inARow(6, 1, 24, {{2, 0}, {2, 0}, {2, 4}});
  Result result;
  combine(placed, &result);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 6, 1, 24, 24);
  EXPECT_EQ(Bytes(result.image.data + 6, result.image.data + 12), Bytes(6));
}

TEST_F(ImageUtil_Combine, GivesAZeroedRecordForNoImages) {
  Result result;
  result.ok = ::ImageUtil_Combine(nullptr, nullptr, 0, &result.image);
  EXPECT_TRUE(result.ok);
  expectForm(result.image, 0, 0, 0, 0);
  EXPECT_EQ(result.image.data, nullptr);
}

TEST_F(ImageUtil_Combine, CountsImagesWithoutData) {
  std::vector<Placed> placed = inARow(7, 1, 16, {{2, 0}, {3, 2}});
  placed[1].picture.image.data = nullptr;
  Result result;
  combine(placed, &result);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 5, 1, 16, 16);
  EXPECT_EQ(Bytes(result.image.data + 4, result.image.data + 12), Bytes(8));
}

TEST_F(ImageUtil_Combine, AllowsTheResultToBeOneOfTheImages) {
  Random random(8);
  const Picture first = noise(random, 2, 1, 24, 32);
  const Picture second = noise(random, 2, 1, 24, 32);
  ImageUtilImage images[] = {first.image, second.image};
  const int32 positions[] = {0, 0, 2, 0};
  ASSERT_TRUE(::ImageUtil_Combine(images, positions, 2, &images[0]));
  expectForm(images[0], 4, 1, 24, 32);
  EXPECT_EQ(0, memcmp(images[0].data + 8, second.image.data, 8));
  ImageUtil_FreeImageData(&images[0]);
}

TEST_F(ImageUtil_Combine, FailsWithTheResultUntouchedWithoutMemory) {
  std::vector<Placed> placed;
  placed.push_back({Picture(1, 1, 24, 32), INT32_MIN, 0});
  placed.push_back({Picture(1, 1, 24, 32), INT32_MAX - 1, 0});  // 2^32 - 1 pixels wide
  Result result;
  combine(placed, &result);
  EXPECT_FALSE(result.ok);
  EXPECT_TRUE(result.untouched());
#ifndef __SANITIZE_ADDRESS__
  placed[0].x = placed[1].x = 0;
  tests::callocFails = true;
  const bool ok = ::ImageUtil_Combine(&placed[0].picture.image, &placed[0].x, 1, &result.image);
  tests::callocFails = false;
  EXPECT_FALSE(ok);
  EXPECT_TRUE(result.untouched());
#endif
}

TEST_F(ImageUtil_Combine, StaysInsideTheResultWhereARectangleSaturates) {
  Random random(9);
  const Picture wide = noise(random, 100, 1, 24, 32);
  const int32 position[] = {INT32_MAX - 10, 7};
  Result result;
  result.ok = ::ImageUtil_Combine(&wide.image, position, 1, &result.image);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 10, 1, 24, 32);
  EXPECT_EQ(0, memcmp(result.image.data, wide.image.data, 40));
}

// ---- Crop and scale ----

struct Crop {
  int32 left = 0, top = 0, right = -1, bottom = -1;
  int32 dstX = 0, dstY = 0;
  int32 newWidth = -1, newHeight = -1;
};

void cropAndScale(const ImageUtilImage& image, const Crop& c, Result* result) {
  result->ok = ::ImageUtil_CropAndScaleImage(&image, c.left, c.top, c.right, c.bottom, c.dstX,
                                             c.dstY, c.newWidth, c.newHeight, &result->image);
}

TEST_F(ImageUtil_CropAndScaleImage, CopiesTheWholeImageIntoAFreshBuffer) {
  Random random(10);
  for (const uint32 bpp : {8u, 16u, 24u, 32u}) {
    const Picture picture = noise(random, 13, 7, bpp == 32 ? 24 : bpp, bpp);
    Result result;
    cropAndScale(picture.image, {}, &result);
    ASSERT_TRUE(result.ok);
    expectForm(result.image, 13, 7, picture.image.depth, bpp);
    EXPECT_NE(result.image.data, picture.image.data);
    EXPECT_EQ(result.bytes(), Bytes(picture.pixels.begin(), picture.pixels.end() - 4));
  }
}

TEST_F(ImageUtil_CropAndScaleImage, CutsPixelByPixelAndZeroesThePadding) {
  Random random(11);
  for (int round = 0; round < tests::rounds(400); ++round) {
    const uint32 bpp = random.oneOf({8u, 16u, 24u, 32u});
    const Picture picture = noise(random, 2 + random.below(30), 1 + random.below(20),
                                  bpp == 32 ? 24 : bpp, bpp, random.below(7));
    const int32 imageWidth = int32(picture.image.width);
    const int32 imageHeight = int32(picture.image.height);
    Crop c;
    c.left = random.between(1, imageWidth - 1);  // never the full width
    c.top = random.between(0, imageHeight - 1);
    c.right = random.between(c.left + 1, imageWidth);
    c.bottom = random.between(c.top + 1, imageHeight);
    Result result;
    cropAndScale(picture.image, c, &result);
    ASSERT_TRUE(result.ok);
    const uint32 width = uint32(c.right - c.left);
    expectForm(result.image, width, uint32(c.bottom - c.top), picture.image.depth, bpp);
    Bytes expected;
    for (int32 y = c.top; y < c.bottom; ++y) {
      const uint8* from = picture.image.data + size_t(y) * picture.image.bytesPerLine;
      expected.insert(expected.end(), from + size_t(c.left) * (bpp / 8),
                      from + size_t(c.right) * (bpp / 8));
      expected.resize((expected.size() + 3) / 4 * 4);
    }
    ASSERT_EQ(result.bytes(), expected) << "round " << round;
  }
}

// Deliberate: the source's pitch is taken to be the result's.
TEST_F(ImageUtil_CropAndScaleImage, RefusesToScaleRowsOfTwoGibibytes) {
  uint8 pixels[4] = {1, 2, 3, 4};
  ImageUtilImage src{};
  src.width = src.height = 2;
  src.depth = 24;
  src.bpp = 32;
  src.bytesPerLine = 0x80000000;
  src.data = pixels;
  ImageUtilImage result{};
  EXPECT_FALSE(::ImageUtil_CropAndScaleImage(&src, 0, 0, 1, 2, 0, 0, 3, 3, &result));
  EXPECT_EQ(result.data, nullptr);
  // Without scaling there is no such limit.
  EXPECT_TRUE(::ImageUtil_CropAndScaleImage(&src, 0, 0, 1, 1, 0, 0, -1, -1, &result));
  EXPECT_EQ(0, memcmp(result.data, pixels, 4));
  ImageUtil_FreeImageData(&result);
}

TEST_F(ImageUtil_CropAndScaleImage, CopiesAFullWidthAsOneBlock) {
  Random random(12);
  const Picture picture = noise(random, 5, 6, 24, 24, 8);  // a pitch of 24, not 16
  Crop c;
  c.top = 1;
  c.bottom = 4;
  Result result;
  cropAndScale(picture.image, c, &result);
  ASSERT_TRUE(result.ok);
  expectForm(result.image, 5, 3, 24, 24);
  EXPECT_EQ(result.bytes(), Bytes(&picture.pixels[24], &picture.pixels[24] + 48));
}

TEST_F(ImageUtil_CropAndScaleImage, ScalesAsTheScalerDoes) {
  Random random(13);
  for (int round = 0; round < tests::rounds(100); ++round) {
    const uint32 bpp = random.oneOf({8u, 16u, 24u, 32u});
    const Picture picture =
        noise(random, 2 + random.below(30), 2 + random.below(20), bpp == 32 ? 24 : bpp, bpp);
    Crop c;
    c.left = random.between(0, int32(picture.image.width) - 1);
    c.top = random.between(0, int32(picture.image.height) - 1);
    c.newWidth = random.between(1, 50);
    c.newHeight = random.between(1, 50);
    const uint32 cropWidth = picture.image.width - uint32(c.left);
    const uint32 cropHeight = picture.image.height - uint32(c.top);
    if (cropWidth == uint32(c.newWidth) && cropHeight == uint32(c.newHeight)) continue;
    Result result;
    cropAndScale(picture.image, c, &result);
    ASSERT_TRUE(result.ok);
    const uint32 width = uint32(c.newWidth);
    const uint32 height = uint32(c.newHeight);
    expectForm(result.image, width, height, picture.image.depth, bpp);
    const uint32 pitch = result.image.bytesPerLine;
    const uint32 depth = picture.image.depth;
    Bytes expected(size_t{pitch} * height);
    ASSERT_TRUE(Raster_Scale(
        expected.data(), pitch, bpp, depth, width, height, 0, 0, 0, c.newWidth, c.newHeight,
        picture.image.data + size_t(c.top) * picture.image.bytesPerLine +
            size_t(c.left) * (bpp / 8),
        int32(picture.image.bytesPerLine), bpp, int32(depth), 0, cropWidth, cropHeight, 0,
        double(width) / cropWidth, double(height) / cropHeight, 2));
    ASSERT_EQ(result.bytes(), expected) << "round " << round << ": " << bpp << " bpp";
  }
}

TEST_F(ImageUtil_CropAndScaleImage, KeepsTheShapeWhenOneSizeIsGiven) {
  Random random(14);
  const Picture picture = noise(random, 100, 50, 24, 32);
  const auto expectSize = [&](int32 Crop::*given, int32 value, uint32 width, uint32 height) {
    Crop c;
    c.*given = value;
    Result result;
    cropAndScale(picture.image, c, &result);
    ASSERT_TRUE(result.ok);
    expectForm(result.image, width, height, 24, 32);
    EXPECT_NE(result.image.data, nullptr);
  };
  expectSize(&Crop::newWidth, 50, 50, 25);
  expectSize(&Crop::newHeight, 20, 40, 20);
  expectSize(&Crop::newWidth, 1, 1, 0);  // a height of half a pixel
}

// Deliberate: the scaler's refusal is not reported.
TEST_F(ImageUtil_CropAndScaleImage, GivesZeroesWhereTheScalerRefuses) {
  Random random(15);
  const Picture picture = noise(random, 10, 10, 15, 16);
  Crop c;
  c.newWidth = c.newHeight = 7;
  Result result;
  const Messages said = tests::messagesOf([&] { cropAndScale(picture.image, c, &result); });
  ASSERT_TRUE(result.ok);
  EXPECT_EQ(said.log, "Raster_Scale: Dest depth 15 is not supported.\n");
  expectForm(result.image, 7, 7, 15, 16);
  EXPECT_EQ(result.bytes(), Bytes(7 * 16));
}

TEST_F(ImageUtil_CropAndScaleImage, GivesAnEmptyImageAtTheRightEdge) {
  Random random(16);
  const Picture picture = noise(random, 10, 10, 24, 32);
  Crop c;
  c.left = 10;
  Result result;
  cropAndScale(picture.image, c, &result);
  EXPECT_TRUE(result.ok);
  expectForm(result.image, 0, 10, 24, 32);
  c.newWidth = c.newHeight = 3;  // scaled from nothing: nothing is drawn
  Result scaled;
  cropAndScale(picture.image, c, &scaled);
  ASSERT_TRUE(scaled.ok);
  EXPECT_EQ(scaled.bytes(), Bytes(36));
}

TEST_F(ImageUtil_CropAndScaleImage, RefusesWhatIsNotACropOfTheImage) {
  const Picture picture(10, 8, 24, 32);
  std::vector<Crop> wrong;
  const auto with = [&](int32 Crop::*field, int32 value, Crop c = {}) {
    c.*field = value;
    wrong.push_back(c);
  };
  for (const int32 value : {-1, INT32_MIN}) with(&Crop::left, value), with(&Crop::top, value);
  Crop at;
  at.left = at.top = 3;
  for (const int32 value : {3, 2, 0, -2, 11, INT32_MIN}) with(&Crop::right, value, at);
  for (const int32 value : {3, 2, 0, -2, 9, INT32_MIN}) with(&Crop::bottom, value, at);
  for (const int32 value : {1, -1}) with(&Crop::dstX, value), with(&Crop::dstY, value);
  with(&Crop::newWidth, 0);
  with(&Crop::newHeight, 0);
  with(&Crop::left, 11);  // beyond the image, to its own far edge
  with(&Crop::top, 9);
  at.left = 10;
  with(&Crop::newWidth, 5, at);  // no shape to keep
  with(&Crop::newWidth, -2);     // 2^32 - 2 pixels of 4 bytes
  for (const Crop& c : wrong) {
    Result result;
    cropAndScale(picture.image, c, &result);
    EXPECT_FALSE(result.ok) << c.left << "," << c.top << " " << c.right << "," << c.bottom << " "
                            << c.dstX << "," << c.dstY << " " << c.newWidth << "x" << c.newHeight;
    EXPECT_TRUE(result.untouched());
    result.ok = false;
  }
}

}  // namespace
