// SPDX-License-Identifier: MIT
//
// Rect lists: any list is taken or refused, the region is that of a bitmap, and nothing ends the
// process.

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "rasterChecked.h"
#include "support/listBitmap.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/rectValues.h"

namespace {

using tests::kMax;
using tests::kMin;
using tests::Random;

constexpr int32 kSide = 24;
using Bitmap = tests::Bitmap<kSide>;

/// The rectangles that a region takes: runs of a row that the row above does not have just so.
int naiveRects(const Bitmap& bitmap) {
  const auto at = [&](int32 x, int32 y) {
    return x >= 0 && y >= 0 && x < kSide && bitmap[static_cast<size_t>(y * kSide + x)];
  };
  const auto isRun = [&](int32 y, int32 from, int32 to) {
    bool run = !at(from - 1, y) && !at(to, y);
    for (int32 x = from; x < to; ++x) run &= at(x, y);
    return run;
  };
  int count = 0;
  for (int32 y = 0; y < kSide; ++y) {
    for (int32 x = 0; x < kSide; ++x) {
      if (!at(x, y) || at(x - 1, y)) continue;
      int32 end = x;
      while (at(end, y)) ++end;
      count += !isRun(y - 1, x, end);
    }
  }
  return count;
}

RectListEntry someEntry(Random& random) {
  const int32 x = random.between(0, kSide - 1);
  const int32 y = random.between(0, kSide - 1);
  return {x, y, random.between(0, std::min(9, kSide - x)),
          random.between(0, std::min(9, kSide - y))};
}

bool sameLists(const RectList& a, const RectList& b) { return memcmp(&a, &b, sizeof a) == 0; }

TEST(RectLists, FollowABitmap) {
  Random random(41);
  int tooBig = 0;
  for (int sequence = 0; sequence < 3000; ++sequence) {
    RectList list = {};
    for (int step = 0; step < 20; ++step) {
      const RectListEntry r = someEntry(random);
      const bool adds = random.below(3) != 0;
      const RectList before = list;
      Bitmap expected = tests::bitmapOf<kSide>(list);
      tests::paint<kSide>(expected, r, adds);
      RectList exact = list;
      uint32 area = 77;
      if (adds) {
        ASSERT_EQ(RasterChecked_AddRect(&list, r.x, r.y, r.width, r.height, &area),
                  RASTER_STATUS_OK);
        ASSERT_EQ(area, Raster_AddRect(&exact, r.x, r.y, r.width, r.height));
        ASSERT_TRUE(sameLists(list, exact));
        if (naiveRects(expected) <= 15) {
          ASSERT_EQ(tests::bitmapOf<kSide>(list), expected);
        }
        continue;
      }
      const RasterStatus status = RasterChecked_SubRect(&list, r.x, r.y, r.width, r.height, &area);
      const bool nothing = r.width == 0 || r.height == 0;
      const bool fits = nothing || naiveRects(expected) <= 15;
      ASSERT_EQ(status, fits ? RASTER_STATUS_OK : RASTER_STATUS_TOO_BIG);
      if (!fits) {
        ++tooBig;
        ASSERT_TRUE(sameLists(list, before));
        ASSERT_EQ(area, 77u);
        continue;
      }
      ASSERT_EQ(area, Raster_SubRect(&exact, r.x, r.y, r.width, r.height));
      ASSERT_TRUE(sameLists(list, exact));
      ASSERT_EQ(tests::bitmapOf<kSide>(list), expected);
    }
  }
  EXPECT_GT(tooBig, 20);
}

TEST(RectLists, TakeListsThatOverlap) {
  Random random(42);
  for (int round = 0; round < 20000; ++round) {
    RectList list = {};
    const uint32 used = random.below(16);
    for (uint32 i = 0; i < used; ++i) {
      list.rects[i] = someEntry(random);
      list.rects[i].width += list.rects[i].width == 0;
      list.rects[i].height += list.rects[i].height == 0;
    }
    const RectListEntry r = someEntry(random);
    if (r.width == 0 || r.height == 0) continue;
    Bitmap expected = tests::bitmapOf<kSide>(list);
    tests::paint<kSide>(expected, r, false);
    const RasterStatus status = RasterChecked_SubRect(&list, r.x, r.y, r.width, r.height, nullptr);
    const bool fits = used == 0 || naiveRects(expected) <= 15;
    ASSERT_EQ(status, fits ? RASTER_STATUS_OK : RASTER_STATUS_TOO_BIG);
    if (fits) {
      ASSERT_EQ(tests::bitmapOf<kSide>(list), expected);
    }
  }
}

/// 16 columns that do not touch.
RectList fullList() {
  RectList list = {};
  for (int32 i = 0; i < 16; ++i) list.rects[i] = {3 * i, 0, 2, 10};
  return list;
}

TEST(RectLists, AreTooBigWhenFull) {
  RectList list = fullList();
  const RectList before = list;
  uint32 area = 77;
  const tests::Messages said = tests::messagesOf([&] {
    EXPECT_EQ(RasterChecked_AddRect(&list, 100, 0, 1, 1, &area), RASTER_STATUS_TOO_BIG);
    EXPECT_EQ(RasterChecked_SubRect(&list, 0, 3, 100, 1, &area), RASTER_STATUS_TOO_BIG);
  });
  EXPECT_EQ(said.log + said.warning + said.panic, "");
  EXPECT_TRUE(sameLists(list, before));
  EXPECT_EQ(area, 77u);
  list.rects[15].width = 0;
  EXPECT_EQ(RasterChecked_SubRect(&list, 0, 3, 100, 1, &area), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_SubRect(&list, 0, 0, 3, 10, &area), RASTER_STATUS_OK);
  EXPECT_EQ(area, 14u * 20);
}

TEST(RectLists, DoNotCountWhatStandsBehindTheEnd) {
  RectList list = {};
  list.rects[0] = {0, 0, 10, 10};
  list.rects[1] = {0, 0, 0, 5};
  list.rects[2] = {50, 50, 10, -10};
  uint32 area = 0;
  EXPECT_EQ(RasterChecked_AddRect(&list, 20, 0, 10, 10, &area), RASTER_STATUS_OK);
  EXPECT_EQ(area, 200u);
  EXPECT_EQ(list.rects[2].width, 0);
}

TEST(RectLists, RefuseNumbersThatDoNotFit) {
  const RectListEntry bad[] = {{0, 0, -1, 5},   {0, 0, 5, -1},   {kMax, 0, 1, 1},
                               {0, kMax, 1, 1}, {0, 0, kMin, 1}, {kMin, 0, kMax, 1}};
  for (const RectListEntry& r : bad) {
    RectList list = {};
    list.rects[0] = {0, 0, 10, 10};
    const RectList before = list;
    EXPECT_EQ(RasterChecked_AddRect(&list, r.x, r.y, r.width, r.height, nullptr),
              RASTER_STATUS_BAD_ARGUMENT);
    EXPECT_EQ(RasterChecked_SubRect(&list, r.x, r.y, r.width, r.height, nullptr),
              RASTER_STATUS_BAD_ARGUMENT);
    EXPECT_TRUE(sameLists(list, before));
    list.rects[0] = r;
    if (r.width <= 0) continue;  // an empty list
    EXPECT_EQ(RasterChecked_SubRect(&list, 1, 1, 2, 2, nullptr), RASTER_STATUS_BAD_ARGUMENT);
  }
  EXPECT_EQ(RasterChecked_AddRect(nullptr, 0, 0, 1, 1, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_SubRect(nullptr, 0, 0, 1, 1, nullptr), RASTER_STATUS_NULL);
}

TEST(RectLists, TakeAnyBytes) {
  Random random(43);
  for (int round = 0; round < 100000; ++round) {
    RectList list = {};
    for (RectListEntry& r : list.rects) {
      r = {tests::someCoordinate(random), tests::someCoordinate(random),
           tests::someCoordinate(random), tests::someCoordinate(random)};
      if (random.below(3) != 0) r.width &= 0xFF;
    }
    const int32 x = tests::someCoordinate(random);
    const int32 y = tests::someCoordinate(random);
    const int32 width = tests::someCoordinate(random);
    RasterChecked_AddRect(&list, x, y, width, tests::someCoordinate(random), nullptr);
    RasterChecked_SubRect(&list, x, y, width, tests::someCoordinate(random), nullptr);
  }
}

}  // namespace
