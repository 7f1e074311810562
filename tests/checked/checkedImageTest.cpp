// SPDX-License-Identifier: MIT
//
// Whole images: bitmap files, images put together, crops.

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <memory>

#include "checked/checkedImages.h"
#include "imageUtil.h"
#include "rasterChecked.h"
#include "support/recordedMessages.h"

namespace {

using tests::Bytes;
using tests::GuardedView;
using tests::PixelFormat;
using tests::Random;

ImageUtilImage imageOf(Random& random, const RasterView& view) {
  return tests::imageOf(random, view, random.below(257));
}

/// The same picture in rows that reach to the next multiple of four bytes, with zeros there.
struct PaddedCopy {
  explicit PaddedCopy(const ImageUtilImage& from) : image(from) {
    const size_t row = size_t{from.width} * from.bpp / 8;
    image.bytesPerLine = static_cast<uint32>((row + 3) / 4 * 4);
    bytes.resize(size_t{image.bytesPerLine} * from.height + 4);
    for (size_t y = 0; y < from.height && row != 0; ++y)
      memcpy(&bytes[y * image.bytesPerLine], from.data + y * from.bytesPerLine, row);
    image.data = bytes.data();
  }
  ImageUtilImage image;
  Bytes bytes;
};

TEST(RasterChecked_EncodeBmp, MakesTheFileOfTheExactEncoder) {
  Random random(101);
  for (int round = 0; round < 2000; ++round) {
    const GuardedView view = tests::somePicture(random);
    const ImageUtilImage image = imageOf(random, view.view());
    uint8* file = nullptr;
    size_t size = 0;
    ASSERT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes, &file, &size), RASTER_STATUS_OK);
    const PaddedCopy padded(image);
    DynBuf exact;
    ASSERT_TRUE(ImageUtil_ConstructBMPBuffer(&padded.image, &exact));
    Bytes made(file, file + size);
    // Padding within the memory of the image is copied as it lies there.
    const size_t row = (size_t{image.width} * std::min(24u, image.bpp) / 8 + 3) / 4 * 4;
    if ((image.bpp == 8 || image.bpp == 24) && size == exact.size) {
      const size_t start = size - row * image.height;
      for (size_t y = 0; y < image.height; ++y)
        for (size_t x = size_t{image.width} * image.bpp / 8; x < row; ++x)
          made[start + y * row + x] = 0;
    }
    ASSERT_EQ(made, Bytes(exact.data, exact.data + exact.size)) << "round " << round;
    DynBuf_Destroy(&exact);
    free(file);
  }
}

TEST(RasterChecked_EncodeBmp, RefusesWhatNoFileCanHold) {
  Random random(102);
  const GuardedView view(random, {8, 8}, 10, 10);
  ImageUtilImage image = imageOf(random, view.view());
  uint8* file = nullptr;
  size_t size = 77;
  image.numColors = 257;
  EXPECT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes, &file, &size),
            RASTER_STATUS_BAD_ARGUMENT);
  image.numColors = 256;
  EXPECT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes - 1, &file, &size),
            RASTER_STATUS_BAD_VIEW);
  image.width = 0;
  image.height = 0x7FFFFFFF;  // rows of nothing take time as well
  EXPECT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes, &file, &size),
            RASTER_STATUS_BAD_ARGUMENT);
  image.width = image.height = 10;
  EXPECT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes, nullptr, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_EncodeBmp(&image, view.view().bytes, &file, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_EncodeBmp(nullptr, 0, &file, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(file, nullptr);
  EXPECT_EQ(size, 77u);
}

// ---- Combining ---------------------------------------------------------------------------------

TEST(RasterChecked_Combine, EqualsTheExactCombination) {
  Random random(103);
  int made = 0;
  for (int round = 0; round < 3000; ++round) {
    const PixelFormat format = tests::someFormat(random);
    std::vector<std::unique_ptr<GuardedView>> views;
    std::vector<ImageUtilImage> images;
    std::vector<size_t> bytes;
    std::vector<int32> positions;
    const uint32 count = random.below(5);
    bool sameFormat = true;
    for (uint32 i = 0; i < count; ++i) {
      const PixelFormat own = random.below(12) == 0 ? tests::someFormat(random) : format;
      views.push_back(
          std::make_unique<GuardedView>(random, own, random.below(20), random.below(20)));
      images.push_back(imageOf(random, views.back()->view()));
      if (random.below(8) == 0) images.back().data = nullptr;
      bytes.push_back(views.back()->view().bytes);
      positions.push_back(random.between(-30, 30));
      positions.push_back(random.between(-30, 30));
      sameFormat &= images[i].depth == images[0].depth && images[i].bpp == images[0].bpp;
    }
    ImageUtilImage result = {};
    result.width = 77;
    const RasterStatus status = RasterChecked_Combine(images.data(), bytes.data(), positions.data(),
                                                      count, nullptr, &result);
    if (status != RASTER_STATUS_OK) {
      ASSERT_EQ(status, RASTER_STATUS_BAD_FORMAT);
      ASSERT_TRUE(!sameFormat || images[0].bpp == 8);
      ASSERT_EQ(result.width, 77u);
      continue;
    }
    ++made;
    ASSERT_TRUE(sameFormat);
    ImageUtilImage exact;
    ASSERT_TRUE(ImageUtil_Combine(images.data(), positions.data(), count, &exact));
    ASSERT_EQ(result.width, exact.width);
    ASSERT_EQ(result.height, exact.height);
    ASSERT_EQ(result.bpp, exact.bpp);
    ASSERT_EQ(result.depth, exact.depth);
    ASSERT_EQ(result.bytesPerLine, exact.bytesPerLine);
    const size_t size = size_t{exact.bytesPerLine} * exact.height;
    if (size != 0) {
      ASSERT_EQ(0, memcmp(result.data, exact.data, size));
    }
    free(result.data);
    free(exact.data);
  }
  EXPECT_GT(made, 1000);
}

TEST(RasterChecked_Combine, RefusesWhatDoesNotFit) {
  Random random(104);
  const GuardedView view(random, {24, 32}, 10, 10);
  const ImageUtilImage image = imageOf(random, view.view());
  ImageUtilImage images[2] = {image, image};
  size_t bytes[2] = {view.view().bytes, view.view().bytes};
  int32 positions[4] = {};
  ImageUtilImage result = {};
  const auto status = [&](const RasterLimits* limits = nullptr) {
    return RasterChecked_Combine(images, bytes, positions, 2, limits, &result);
  };
  positions[0] = tests::kMax - 5;
  EXPECT_EQ(status(), RASTER_STATUS_TOO_BIG);
  positions[0] = tests::kMax - 20;
  positions[2] = tests::kMin;
  EXPECT_EQ(status(), RASTER_STATUS_LIMIT);
  positions[0] = 20000;
  positions[2] = 0;
  EXPECT_EQ(status(), RASTER_STATUS_LIMIT);
  positions[0] = 10;
  const RasterLimits exact = {20, 10, 800, 0, 0, 0};
  const RasterLimits less = {20, 10, 799, 0, 0, 0};
  EXPECT_EQ(status(&less), RASTER_STATUS_LIMIT);
  ASSERT_EQ(status(&exact), RASTER_STATUS_OK);
  free(result.data);
  --bytes[1];
  EXPECT_EQ(status(), RASTER_STATUS_BAD_VIEW);
  images[1].data = nullptr;
  images[1].height = 0xFFFFFFFF;
  EXPECT_EQ(status(), RASTER_STATUS_BAD_VIEW);
  EXPECT_EQ(RasterChecked_Combine(images, bytes, nullptr, 2, nullptr, &result), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Combine(images, nullptr, positions, 2, nullptr, &result),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Combine(nullptr, bytes, positions, 2, nullptr, &result),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Combine(images, bytes, positions, 2, nullptr, nullptr),
            RASTER_STATUS_NULL);
  ASSERT_EQ(RasterChecked_Combine(nullptr, nullptr, nullptr, 0, nullptr, &result),
            RASTER_STATUS_OK);
  EXPECT_EQ(result.width, 0u);
  EXPECT_EQ(result.data, nullptr);
}

// ---- Cutting -----------------------------------------------------------------------------------

/// A row of a result without what lies behind its pixels.
Bytes pixelsOf(const ImageUtilImage& image) {
  Bytes pixels;
  const size_t row = size_t{image.width} * image.bpp / 8;
  for (size_t y = 0; y < image.height; ++y) {
    const uint8* at = image.data + y * image.bytesPerLine;
    pixels.insert(pixels.end(), at, at + row);
  }
  return pixels;
}

TEST(RasterChecked_CropAndScale, EqualsTheExactCrop) {
  Random random(105);
  int made = 0;
  for (int round = 0; round < 6000; ++round) {
    GuardedView view(random, tests::someFormat(random), random.below(40), random.below(40));
    const ImageUtilImage image = imageOf(random, view.view());
    const int32 left = random.between(-1, 20);
    const int32 top = random.between(-1, 20);
    const int32 right = random.between(-2, 40);
    const int32 bottom = random.between(-2, 40);
    const int32 newWidth = random.below(2) == 0 ? -1 : random.between(-2, 50);
    const int32 newHeight = random.below(2) == 0 ? -1 : random.between(-2, 50);
    ImageUtilImage result = {};
    result.width = 77;
    RasterStatus status = RASTER_STATUS_OK;
    const tests::Messages said = tests::messagesOf([&] {
      status = RasterChecked_CropAndScale(&image, view.view().bytes, left, top, right, bottom,
                                          newWidth, newHeight, nullptr, &result);
    });
    ASSERT_EQ(said.log + said.warning + said.panic, "");
    // The exact function takes the source's rows for those of the result.
    const PaddedCopy padded(image);
    ImageUtilImage exact = {};
    bool cut = false;
    tests::messagesOf([&] {
      cut = ImageUtil_CropAndScaleImage(&padded.image, left, top, right, bottom, 0, 0,
                                        newWidth < -1 ? 0 : newWidth,
                                        newHeight < -1 ? 0 : newHeight, &exact);
    });
    const bool empty = cut && (exact.width == 0 || exact.height == 0);
    const int32 cropWidth = (right == -1 ? static_cast<int32>(image.width) : right) - left;
    const int32 cropHeight = (bottom == -1 ? static_cast<int32>(image.height) : bottom) - top;
    const bool scaled = cut && (exact.width != static_cast<uint32>(cropWidth) ||
                                exact.height != static_cast<uint32>(cropHeight));
    const bool scalable = image.depth % 8 == 0;
    const bool emptyCrop = cropWidth <= 0 || cropHeight <= 0;
    ASSERT_EQ(status == RASTER_STATUS_OK, cut && !empty && !emptyCrop && (!scaled || scalable))
        << "round " << round << " " << RasterChecked_Text(status);
    if (status == RASTER_STATUS_OK) {
      ++made;
      ASSERT_EQ(result.width, exact.width);
      ASSERT_EQ(result.height, exact.height);
      ASSERT_EQ(result.depth, exact.depth);
      ASSERT_EQ(result.bpp, exact.bpp);
      ASSERT_EQ(result.bytesPerLine, exact.bytesPerLine);
      ASSERT_EQ(pixelsOf(result), pixelsOf(exact)) << "round " << round;
      for (size_t y = 0; y < result.height; ++y)
        for (size_t x = size_t{result.width} * result.bpp / 8; x < result.bytesPerLine; ++x)
          ASSERT_EQ(result.data[y * result.bytesPerLine + x], 0);
      free(result.data);
    } else {
      ASSERT_EQ(result.width, 77u);
    }
    free(exact.data);
  }
  EXPECT_GT(made, 200);
}

TEST(RasterChecked_CropAndScale, NamesWhatIsWrong) {
  Random random(106);
  const GuardedView view(random, {24, 24}, 30, 20);
  const GuardedView packed(random, {15, 16}, 30, 20);
  const ImageUtilImage image = imageOf(random, view.view());
  const ImageUtilImage other = imageOf(random, packed.view());
  ImageUtilImage result = {};
  const auto status = [&](int32 l, int32 t, int32 r, int32 b, int32 w, int32 h) {
    return RasterChecked_CropAndScale(&image, view.view().bytes, l, t, r, b, w, h, nullptr,
                                      &result);
  };
  EXPECT_EQ(status(-1, 0, 5, 5, -1, -1), RASTER_STATUS_OUTSIDE);
  EXPECT_EQ(status(0, 0, 31, 5, -1, -1), RASTER_STATUS_OUTSIDE);
  EXPECT_EQ(status(0, 0, 5, 21, -1, -1), RASTER_STATUS_OUTSIDE);
  EXPECT_EQ(status(7, 0, 5, 5, -1, -1), RASTER_STATUS_OUTSIDE);
  EXPECT_EQ(status(5, 0, 5, 5, -1, -1), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(status(0, 0, 5, 5, 0, -1), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(status(0, 0, 5, 5, -1, -2), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(status(0, 0, 1, 20, -1, 1), RASTER_STATUS_BAD_ARGUMENT);  // rounds to no width
  EXPECT_EQ(status(0, 0, 5, 5, 20000, 5), RASTER_STATUS_LIMIT);
  EXPECT_EQ(status(0, 0, 5, 5, tests::kMax, tests::kMax), RASTER_STATUS_LIMIT);
  EXPECT_EQ(
      RasterChecked_CropAndScale(&other, packed.view().bytes, 0, 0, -1, -1, 5, 5, nullptr, &result),
      RASTER_STATUS_BAD_FORMAT);
  const RasterLimits large = {~0u, ~0u, ~uint64{0}, 0, 0, 0};
  EXPECT_EQ(
      RasterChecked_CropAndScale(&image, view.view().bytes, 0, 0, 5, 5, 32768, 1, &large, &result),
      RASTER_STATUS_TOO_BIG);
  const GuardedView wide(random, {24, 24}, 40000, 1);
  const ImageUtilImage wideImage = imageOf(random, wide.view());
  EXPECT_EQ(RasterChecked_CropAndScale(&wideImage, wide.view().bytes, 0, 0, -1, -1, 5, 1, &large,
                                       &result),
            RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_CropAndScale(nullptr, 0, 0, 0, 5, 5, 5, 5, nullptr, &result),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_CropAndScale(&image, 0, 0, 0, 5, 5, 5, 5, nullptr, nullptr),
            RASTER_STATUS_NULL);
  EXPECT_EQ(result.data, nullptr);
}

}  // namespace
