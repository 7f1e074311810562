// SPDX-License-Identifier: MIT
//
// Pictures and rectangles without pixels have no address: every function that takes pixels, with
// null pointers, and no C library function is told of them (the sanitizers look).

#include <gtest/gtest.h>

#include <cstdlib>

#include "raster.h"

namespace {

struct Size {
  uint32 width, height;
};
constexpr Size kEmpty[] = {{0, 0}, {0, 3}, {5, 0}};
constexpr uint32 kPixel = 0x12345678;

TEST(EmptyPictures, AreFilledAndCopied) {
  for (const Size& s : kEmpty) {
    for (uint32 size = 1; size <= 4; ++size) {
      for (const uint32 pixel : {0u, kPixel})
        Raster_RectFill(nullptr, 0, size, pixel, 0, 0, s.width, s.height);
      for (const uint32 mmx : {0u, 1u}) {
        rasterops_mmx = mmx;
        Raster_RectCopy(nullptr, 0, nullptr, 0, size, 0, 0, 0, 0, s.width, s.height);
      }
      rasterops_mmx = 0;
      for (uint32 rop = 0; rop < 16; ++rop) {
        Raster_RectROPfill(nullptr, 0, size, kPixel, rop, 0, 0, s.width, s.height);
        Raster_RectROPcopy(nullptr, 0, nullptr, 0, size, 0, 0, rop, 0, 0, s.width, s.height);
        Raster_RectPixmapROPcopy(nullptr, 0, nullptr, 0, static_cast<int32>(size), 0, 0, 2, 2, rop,
                                 0, 0, s.width, s.height);
      }
      Raster_RectPixmapCopy(nullptr, 0, nullptr, 0, static_cast<int32>(size), 0, 0, 2, 2, 0, 0,
                            s.width, s.height);
    }
    Raster_RectFillAlpha(nullptr, 0, 7, 0, 0, s.width, s.height);
  }
}

TEST(EmptyPictures, AreMadeOfBitsAndConverted) {
  for (const Size& s : kEmpty) {
    const auto width = static_cast<int32>(s.width);
    const auto height = static_cast<int32>(s.height);
    for (int32 size = 1; size <= 4; ++size) {
      Raster_BitsToPixels(nullptr, 0, nullptr, 0, size, width, height, kPixel, 0);
      Raster_BitsToPixelsStencil(nullptr, 0, nullptr, 0, size, width, height, kPixel);
    }
    for (const int32 from : {15, 16, 24, 32})
      for (const int32 to : {15, 16, 24, 32})
        Raster_ConvertPixels(nullptr, 0, to, nullptr, 0, from, false, nullptr, 0, 0, 0, 0, s.width,
                             s.height);
    for (const int32 depth : {8, 16, 24, 32})
      Raster_CopyPixels(nullptr, 0, nullptr, 0, depth, 0, 0, 0, 0, s.width, s.height);
  }
}

TEST(EmptyPictures, AreEqual) {
  for (const Size& s : kEmpty) {
    for (const int32 bpp : {8, 16, 24, 32}) {
      EXPECT_EQ(
          Raster_ComparePixels(nullptr, 0, bpp, nullptr, 0, bpp, 0, 0, 0, 0, s.width, s.height), 0);
      const uint32 pitch = s.width * static_cast<uint32>(bpp) / 8;
      EXPECT_TRUE(Raster_CompareMasked(nullptr, pitch, bpp, nullptr, pitch, bpp, nullptr, pitch,
                                       bpp, 0, 0, s.width, s.height, 0));
    }
  }
}

TEST(EmptyPictures, AreBlendedAndScaled) {
  struct Format {
    uint32 depth, bpp;
  };
  for (const Size& s : kEmpty) {
    for (const Format& format : {Format{8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}}) {
      for (uint32 op = 0; op < 14; ++op)
        for (const uint8 staged : {uint8{0}, uint8{1}})
          Raster_AlphaBlend(nullptr, 0, 0, 0, nullptr, 0, 0, 0, s.width, s.height, format.depth,
                            format.bpp, op, 0, 0, 0, staged);
      const auto depth = static_cast<int32>(format.depth);
      for (const int32 smooth : {0, 1})
        Raster_Scale(nullptr, 0, format.bpp, format.depth, s.width, s.height, 0, 0, 0,
                     static_cast<int32>(s.width), static_cast<int32>(s.height), nullptr, 0,
                     format.bpp, depth, 0, s.width, s.height, 0, 1, 1, smooth);
    }
  }
}

TEST(EmptyPictures, AreConvertedFromVideo) {
  for (const Size& s : {Size{0, 0}, Size{0, 4}, Size{6, 0}})
    for (const uint32 format : {RASTER_VIDEO_YV12, RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY})
      for (const int32 code : {15, 16, 24, 32})
        Raster_YUVtoRGB(nullptr, nullptr, s.width, s.height, format, code);
}

TEST(EmptyPictures, AreCompressedToTheirHeader) {
  for (const Size& s : kEmpty) {
    for (const uint32 bpp : {16, 32}) {
      uint8* block = nullptr;
      uint32 size = 0;
      Raster_Compress(nullptr, s.width * bpp / 8, bpp, s.width, s.height, &block, &size);
      EXPECT_EQ(size, 20u);
      free(block);
    }
  }
}

}  // namespace
