// SPDX-License-Identifier: MIT
//
// Views, limits and words: what is refused before anything is drawn.

#include <gtest/gtest.h>

#include <set>
#include <string>

#include "checked/checkedScenes.h"
#include "rasterChecked.h"

namespace {

using tests::GuardedView;
using tests::Random;

RasterView plainView() {
  static uint8 bytes[4 * 8 * 4];
  return {bytes, sizeof bytes, 32, 8, 4, 24, 32};
}

TEST(RasterChecked_Text, IsDifferentForEveryStatus) {
  std::set<std::string> texts;
  for (int status = RASTER_STATUS_OK; status <= RASTER_STATUS_FILE; ++status) {
    const std::string text = RasterChecked_Text(static_cast<RasterStatus>(status));
    EXPECT_FALSE(text.empty());
    EXPECT_NE(text, "unknown status");
    EXPECT_TRUE(texts.insert(text).second) << text;
  }
}

TEST(RasterChecked_Text, KnowsNoOtherNumber) {
  EXPECT_STREQ(RasterChecked_Text(static_cast<RasterStatus>(20)), "unknown status");
  EXPECT_STREQ(RasterChecked_Text(static_cast<RasterStatus>(31)), "unknown status");
}

TEST(RasterChecked_DefaultLimits, AreThoseOfTheHeader) {
  RasterLimits limits = {};
  RasterChecked_DefaultLimits(&limits);
  EXPECT_EQ(limits.width, 16384u);
  EXPECT_EQ(limits.height, 16384u);
  EXPECT_EQ(limits.pixelBytes, 268435456u);
  EXPECT_EQ(limits.inputBytes, 268435456u);
  EXPECT_EQ(limits.chunkBytes, 8388608u);
  EXPECT_EQ(limits.chunks, 1000u);
  RasterChecked_DefaultLimits(nullptr);
}

TEST(RasterChecked_View, TakesTheFormatsOfTheHeaderAndNoOthers) {
  const std::set<std::pair<uint32, uint32>> known = {{3, 8},   {6, 8},   {8, 8},   {15, 16},
                                                     {16, 16}, {24, 24}, {24, 32}, {1, 1}};
  for (uint32 depth = 0; depth <= 66; ++depth) {
    for (uint32 bpp = 0; bpp <= 66; ++bpp) {
      RasterView view = plainView();
      view.depth = depth;
      view.bpp = bpp;
      const bool is = known.count({depth, bpp}) != 0;
      EXPECT_EQ(RasterChecked_View(&view), is ? RASTER_STATUS_OK : RASTER_STATUS_BAD_FORMAT)
          << depth << "/" << bpp;
    }
  }
}

TEST(RasterChecked_View, WantsARowInEveryPitch) {
  for (const tests::PixelFormat format : tests::kFormats) {
    RasterView view = plainView();
    view.depth = format.depth;
    view.bpp = format.bpp;
    view.pitch = 8 * format.bpp / 8;
    EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_OK);
    view.pitch -= format.bpp / 8;
    EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
  }
  RasterView plane = plainView();
  plane.depth = plane.bpp = 1;
  plane.width = 9;
  plane.pitch = 2;
  EXPECT_EQ(RasterChecked_View(&plane), RASTER_STATUS_OK);
  plane.pitch = 1;
  EXPECT_EQ(RasterChecked_View(&plane), RASTER_STATUS_BAD_VIEW);
}

TEST(RasterChecked_View, WantsWholePixelsInAPitch) {
  for (uint32 more = 0; more < 9; ++more) {
    RasterView view = plainView();
    view.height = 2;
    view.pitch = 32 + more;
    EXPECT_EQ(RasterChecked_View(&view), more % 4 == 0 ? RASTER_STATUS_OK : RASTER_STATUS_BAD_VIEW);
    view.depth = view.bpp = 16;
    EXPECT_EQ(RasterChecked_View(&view), more % 2 == 0 ? RASTER_STATUS_OK : RASTER_STATUS_BAD_VIEW);
    view.depth = view.bpp = 24;
    EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_OK);
  }
}

TEST(RasterChecked_View, WantsAllRowsInItsBytesButTheLastGap) {
  RasterView view = plainView();
  view.pitch = 36;
  view.bytes = 3 * 36 + 32;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_OK);
  --view.bytes;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
}

TEST(RasterChecked_View, CountsBeyond32Bits) {
  // Rows that wrap around 2^32 to a few bytes.
  RasterView view = plainView();
  view.pitch = 0x40000000;
  view.height = 5;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
  view = plainView();
  view.width = 0x40000002;  // 8 bytes, modulo 2^32
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
  view = plainView();
  view.height = 0x80000000;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
  view = plainView();
  view.width = 0x80000000;
  view.height = 0;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
  view = plainView();
  view.pitch = 0x80000000;
  view.height = 1;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_BAD_VIEW);
}

TEST(RasterChecked_View, TakesNoDataForNoPixelsOnly) {
  EXPECT_EQ(RasterChecked_View(nullptr), RASTER_STATUS_NULL);
  RasterView view = plainView();
  view.data = nullptr;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_NULL);
  view.height = 0;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_OK);
  view.height = 4;
  view.width = 0;
  EXPECT_EQ(RasterChecked_View(&view), RASTER_STATUS_OK);
  EXPECT_EQ(RasterChecked_Fill(&view, nullptr, 0, 0), RASTER_STATUS_OK);
}

TEST(RasterChecked_ImageView, DescribesAnImage) {
  uint8 bytes[60];
  ImageUtilImage image = {};
  image.width = 4;
  image.height = 5;
  image.depth = image.bpp = 24;
  image.bytesPerLine = 12;
  image.data = bytes;
  RasterView view = {};
  ASSERT_EQ(RasterChecked_ImageView(&image, sizeof bytes, &view), RASTER_STATUS_OK);
  EXPECT_EQ(view.data, bytes);
  EXPECT_EQ(view.bytes, sizeof bytes);
  EXPECT_EQ(view.pitch, 12u);
  EXPECT_EQ(view.width, 4u);
  EXPECT_EQ(view.height, 5u);
  EXPECT_EQ(view.depth, 24u);
  EXPECT_EQ(view.bpp, 24u);
  view.width = 77;
  EXPECT_EQ(RasterChecked_ImageView(&image, sizeof bytes - 1, &view), RASTER_STATUS_BAD_VIEW);
  image.depth = image.bpp = 1;
  EXPECT_EQ(RasterChecked_ImageView(&image, sizeof bytes, &view), RASTER_STATUS_BAD_FORMAT);
  EXPECT_EQ(RasterChecked_ImageView(nullptr, sizeof bytes, &view), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_ImageView(&image, sizeof bytes, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(view.width, 77u);
}

// ---- Rectangles --------------------------------------------------------------------------------

TEST(Rectangles, NullIsTheWholeView) {
  Random random(1);
  const GuardedView view(random, {24, 32}, 7, 5);
  ASSERT_EQ(RasterChecked_Fill(&view, nullptr, 0x11223344, 0), RASTER_STATUS_OK);
  const Rect all = {0, 0, 7, 5};
  const tests::Bytes once = view.bytes();
  ASSERT_EQ(RasterChecked_Fill(&view, &all, 0x11223344, 0), RASTER_STATUS_OK);
  EXPECT_EQ(view.bytes(), once);
  EXPECT_EQ(once.at(once.size() - 1), 0x11);
}

TEST(Rectangles, EmptyOnesAreDrawnAnywhere) {
  Random random(2);
  const GuardedView view(random, {8, 8}, 7, 5);
  const tests::Bytes before = view.bytes();
  for (const Rect& rect : {Rect{100, 100, 100, 200}, Rect{100, 100, 90, 200}, Rect{-5, 0, -5, 5},
                           Rect{tests::kMax, tests::kMax, tests::kMin, tests::kMin}})
    EXPECT_EQ(RasterChecked_Fill(&view, &rect, 1, 0), RASTER_STATUS_OK);
  EXPECT_EQ(view.bytes(), before);
}

TEST(Rectangles, ThoseThatReachOutAreRefusedOrClipped) {
  Random random(3);
  const GuardedView view(random, {8, 8}, 7, 5);
  const tests::Bytes before = view.bytes();
  for (const Rect& rect : {Rect{-1, 0, 1, 1}, Rect{0, -1, 1, 1}, Rect{6, 4, 8, 5}, Rect{6, 4, 7, 6},
                           Rect{tests::kMin, tests::kMin, tests::kMax, tests::kMax}}) {
    EXPECT_EQ(RasterChecked_Fill(&view, &rect, 1, 0), RASTER_STATUS_OUTSIDE);
    EXPECT_EQ(view.bytes(), before);
  }
  const Rect all = {tests::kMin, tests::kMin, tests::kMax, tests::kMax};
  EXPECT_EQ(RasterChecked_Fill(&view, &all, 1, RASTER_CHECKED_CLIP), RASTER_STATUS_OK);
  const tests::Bytes after = view.bytes();
  EXPECT_EQ(after.at(0), 1);
  EXPECT_EQ(after.at(after.size() - 1), 1);
}

TEST(Rectangles, NoOtherFlagIsKnown) {
  Random random(4);
  const GuardedView view(random, {8, 8}, 7, 5);
  for (int bit = 1; bit < 32; ++bit)
    EXPECT_EQ(RasterChecked_Fill(&view, nullptr, 1, uint32{1} << bit), RASTER_STATUS_BAD_ARGUMENT);
}

}  // namespace
