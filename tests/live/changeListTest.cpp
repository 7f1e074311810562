// SPDX-License-Identifier: MIT
//
// Lists of changes against a model that knows every pixel.

#include "changeList.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "rectSize.h"
#include "support/random.h"

namespace tool::live {
namespace {

using tests::Random;

constexpr int32 kWidth = 150;
constexpr int32 kHeight = 140;  // two strips and a piece of one

/// How many of the rectangles hold each pixel.
class Cover {
 public:
  void add(const Rect& rect) {
    for (int32 y = std::max(0, rect.top); y < std::min(kHeight, rect.bottom); ++y)
      for (int32 x = std::max(0, rect.left); x < std::min(kWidth, rect.right); ++x) ++at(x, y);
  }
  void remove(const Rect& rect) {
    for (int32 y = std::max(0, rect.top); y < std::min(kHeight, rect.bottom); ++y)
      for (int32 x = std::max(0, rect.left); x < std::min(kWidth, rect.right); ++x) at(x, y) = 0;
  }
  int& at(int32 x, int32 y) { return counts[static_cast<size_t>(y * kWidth + x)]; }
  const std::vector<int>& all() const { return counts; }

 private:
  std::vector<int> counts = std::vector<int>(size_t{kWidth} * kHeight);
};

Cover coverOf(const std::vector<Rect>& rects) {
  Cover cover;
  for (const Rect& rect : rects) cover.add(rect);
  return cover;
}

uint64 areaOf(const std::vector<Rect>& rects) {
  uint64 area = 0;
  for (const Rect& rect : rects) area += tool::areaOf(rect);
  return area;
}

Rect randomRect(Random& random, int32 largest) {
  const int32 x = random.between(-20, kWidth + 10);
  const int32 y = random.between(-20, kHeight + 10);
  return {x, y, x + random.between(1, largest), y + random.between(1, largest)};
}

void expectDisjointAndCovering(const std::vector<Rect>& rects, const Cover& wanted) {
  const Cover cover = coverOf(rects);
  for (size_t i = 0; i < cover.all().size(); ++i) {
    ASSERT_LE(cover.all()[i], 1);
    if (wanted.all()[i] != 0) {
      ASSERT_EQ(cover.all()[i], 1);
    }
  }
}

/// A list and what it should hold.
struct Modelled {
  void add(const Rect& rect) {
    list.add(rect);
    model.add(rect);
  }
  void subtract(const Rect& rect) {
    list.subtract(rect);
    model.remove(rect);
  }

  ChangeList list = ChangeList(kWidth, kHeight);
  Cover model;
};

TEST(ChangeList, IsExactWhileThereIsRoom) {
  Random random(1);
  for (int round = 0; round < tests::rounds(300); ++round) {
    Modelled both;
    for (int i = 0; i < 3; ++i) both.add(randomRect(random, 100));
    const Cover cover = coverOf(both.list.all());
    for (size_t i = 0; i < cover.all().size(); ++i)
      ASSERT_EQ(cover.all()[i], both.model.all()[i] != 0 ? 1 : 0);
  }
}

TEST(ChangeList, HoldsEverythingWhenItOverflows) {
  Random random(2);
  for (int round = 0; round < tests::rounds(100); ++round) {
    Modelled both;
    for (int i = 0; i < 60; ++i) both.add(randomRect(random, 12));
    expectDisjointAndCovering(both.list.all(), both.model);
  }
}

TEST(ChangeList, OverflowsInOneStripOnly) {
  ChangeList list(kWidth, kHeight);
  for (int32 i = 0; i < 40; ++i) list.add({3 * i, i, 3 * i + 1, i + 1});
  list.add({10, 100, 12, 101});
  Cover cover = coverOf(list.all());
  EXPECT_EQ(cover.at(10, 100), 1);
  EXPECT_EQ(cover.at(9, 100), 0);
  EXPECT_EQ(cover.at(50, 80), 0);
}

TEST(ChangeList, JoinsWhatGoesOnInTheNextStrip) {
  ChangeList list(kWidth, kHeight);
  list.add({10, 5, 20, 139});
  ASSERT_EQ(list.all().size(), 1u);
  EXPECT_EQ(list.all()[0].top, 5);
  EXPECT_EQ(list.all()[0].bottom, 139);
}

TEST(ChangeList, TakesOutNothingElse) {
  Random random(3);
  for (int round = 0; round < tests::rounds(500); ++round) {
    Modelled both;
    for (int i = 0; i < 12; ++i) {
      both.add(randomRect(random, 40));
      if (i % 3 != 2) continue;
      const Rect hole = randomRect(random, 60);
      both.subtract(hole);
      for (const Rect& left : both.list.all()) ASSERT_FALSE(Rect_Intersect(nullptr, &left, &hole));
    }
    expectDisjointAndCovering(both.list.all(), both.model);
  }
}

TEST(ChangeList, TakesOutExactlyWhatItHasRoomFor) {
  ChangeList list(kWidth, kHeight);
  list.addAll();
  list.subtract({20, 30, 100, 110});
  Cover cover = coverOf(list.all());
  EXPECT_EQ(cover.at(20, 30), 0);
  EXPECT_EQ(cover.at(99, 109), 0);
  EXPECT_EQ(cover.at(19, 30), 1);
  EXPECT_EQ(cover.at(100, 109), 1);
  EXPECT_EQ(cover.at(50, 110), 1);
}

TEST(ChangeList, IsEmptyOnceEverythingIsTakenOut) {
  Random random(4);
  ChangeList list(kWidth, kHeight);
  EXPECT_TRUE(list.isEmpty());
  for (int i = 0; i < 200; ++i) list.add(randomRect(random, 9));
  EXPECT_FALSE(list.isEmpty());
  list.subtract(list.bounds());
  EXPECT_TRUE(list.isEmpty());
}

TEST(ChangeList, TellsAPartOfThePicture) {
  ChangeList list(kWidth, kHeight);
  list.add({10, 10, 100, 100});
  const std::vector<Rect> rects = list.within({0, 0, 20, 70});
  Cover cover = coverOf(rects);
  EXPECT_EQ(cover.at(19, 69), 1);
  EXPECT_EQ(cover.at(20, 69), 0);
  EXPECT_EQ(cover.at(19, 70), 0);
  EXPECT_TRUE(list.within({110, 0, 150, 140}).empty());
}

TEST(ChangeList, JoinsWhatIsNear) {
  std::vector<Rect> rects = {{0, 0, 10, 10}, {40, 0, 50, 10}, {10, 0, 19, 10}, {20, 0, 40, 10}};
  tool::live::joinNear(rects, 9);
  ASSERT_EQ(rects.size(), 2u);
  tool::live::joinNear(rects, 10);
  ASSERT_EQ(rects.size(), 1u);
  const Rect all = {0, 0, 50, 10};
  EXPECT_TRUE(Rect_IsEqual(&rects.front(), &all));
}

TEST(ChangeList, JoinsAndLosesNothing) {
  Random random(5);
  for (int round = 0; round < tests::rounds(300); ++round) {
    std::vector<Rect> rects;
    for (uint32 i = random.below(20); i != 0; --i) rects.push_back(randomRect(random, 30));
    const std::vector<Rect> apart = rects;
    const uint64 slack = random.below(500);
    tool::live::joinNear(rects, slack);
    const Cover before = coverOf(apart);
    const Cover after = coverOf(rects);
    for (size_t i = 0; i < before.all().size(); ++i)
      ASSERT_TRUE(before.all()[i] == 0 || after.all()[i] != 0);
    ASSERT_LE(areaOf(rects), areaOf(apart) + slack * (apart.size() - rects.size()));
  }
}

TEST(ChangeList, IgnoresWhatLiesOutside) {
  ChangeList list(kWidth, kHeight);
  list.add({-50, -50, 0, 140});
  list.add({0, 140, 150, 300});
  list.add({20, 20, 20, 40});
  EXPECT_TRUE(list.isEmpty());
}

}  // namespace
}  // namespace tool::live
