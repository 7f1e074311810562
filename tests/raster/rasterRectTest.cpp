// SPDX-License-Identifier: MIT
//
// Rect lists against a bitmap of the region and against the step-by-step model, and the cases that
// the interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "raster.h"
#include "reference/rasterRectReference.h"
#include "support/random.h"
#include "support/recordedMessages.h"

namespace {

using reference::ListResult;
using tests::Messages;
using tests::Random;

using Entries = std::vector<std::array<int32, 4>>;

RectList listOf(const Entries& entries) {
  RectList list = {};
  for (size_t i = 0; i < entries.size(); ++i)
    list.rects[i] = {entries[i][0], entries[i][1], entries[i][2], entries[i][3]};
  return list;
}

/// All entries up to the last one that is not all zero, so that nothing goes unseen.
Entries entriesOf(const RectList& list) {
  Entries entries;
  for (const RectListEntry& r : list.rects) entries.push_back({r.x, r.y, r.width, r.height});
  while (!entries.empty() && entries.back() == std::array<int32, 4>{}) entries.pop_back();
  return entries;
}

/// What is in use: the entries before the terminating one.
Entries usedOf(const RectList& list) {
  Entries entries;
  for (const RectListEntry& r : list.rects) {
    if (r.width <= 0) break;
    entries.push_back({r.x, r.y, r.width, r.height});
  }
  return entries;
}

std::string describe(const Entries& entries) {
  std::string text;
  for (const auto& e : entries) {
    text += " (" + std::to_string(e[0]) + ", " + std::to_string(e[1]) + ", " +
            std::to_string(e[2]) + ", " + std::to_string(e[3]) + ")";
  }
  return text;
}

/// `count` rectangles in a row that do not touch.
RectList rowOf(int32 count) {
  RectList list = {};
  for (int32 i = 0; i < count; ++i) list.rects[i] = {10 * i, 0, 5, 10};
  return list;
}

bool isPlainPanic(const Messages& said) {
  return said.warning.empty() &&
         tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterRect");
}

// ---- The region as a bitmap --------------------------------------------------------------------

/// A region within a small square, one flag a pixel.
class Bitmap {
 public:
  static constexpr int32 kSize = 24;

  void set(int32 x, int32 y, int32 width, int32 height, bool value) {
    for (int32 j = std::max(y, 0); j < std::min(y + height, kSize); ++j)
      for (int32 i = std::max(x, 0); i < std::min(x + width, kSize); ++i) at(i, j) = value;
  }

  uint32 area() const {
    return static_cast<uint32>(std::count(pixels_.begin(), pixels_.end(), true));
  }

  /// The canonical rectangles: every run of a line goes on from the same run of the line above or
  /// begins a rectangle.
  Entries rectangles() const {
    Entries all;
    std::vector<size_t> above;
    for (int32 y = 0; y < kSize; ++y) {
      std::vector<size_t> here;
      for (const auto& run : runs(y)) {
        const int32 start = run.first;
        const int32 end = run.second;
        const auto same = std::find_if(above.begin(), above.end(), [&](size_t i) {
          return all[i][0] == start && all[i][2] == end - start;
        });
        if (same != above.end()) {
          here.push_back(*same);
        } else {
          here.push_back(all.size());
          all.push_back({start, y, end - start, 0});
        }
      }
      for (const size_t i : here) ++all[i][3];
      above = here;
    }
    return all;
  }

 private:
  bool get(int32 x, int32 y) const { return pixels_[static_cast<size_t>(y * kSize + x)]; }
  std::vector<bool>::reference at(int32 x, int32 y) {
    return pixels_[static_cast<size_t>(y * kSize + x)];
  }

  std::vector<std::pair<int32, int32>> runs(int32 y) const {
    std::vector<std::pair<int32, int32>> found;
    for (int32 x = 0; x < kSize; ++x) {
      if (!get(x, y)) continue;
      const int32 start = x;
      while (x < kSize && get(x, y)) ++x;
      found.emplace_back(start, x);
    }
    return found;
  }

  std::vector<bool> pixels_ = std::vector<bool>(size_t{kSize} * kSize);
};

/// A list and the bitmap of what it should hold.
struct Pair {
  RectList list = {};
  Bitmap bitmap;

  /// Adds to both; at the limit the bitmap takes over the box.
  void add(int32 x, int32 y, int32 width, int32 height) {
    int32 box[] = {x, y, x + width, y + height};
    for (const auto& e : usedOf(list)) {
      box[0] = std::min(box[0], e[0]);
      box[1] = std::min(box[1], e[1]);
      box[2] = std::max(box[2], e[0] + e[2]);
      box[3] = std::max(box[3], e[1] + e[3]);
    }
    bitmap.set(x, y, width, height, true);
    if (bitmap.rectangles().size() > 15)
      bitmap.set(box[0], box[1], box[2] - box[0], box[3] - box[1], true);
    ASSERT_EQ(Raster_AddRect(&list, x, y, width, height), bitmap.area());
  }

  /// Subtracts from both, or finds the call to be fatal and leaves both.
  void subtract(int32 x, int32 y, int32 width, int32 height) {
    Bitmap rest = bitmap;
    rest.set(x, y, width, height, false);
    if (rest.rectangles().size() > 15) {
      RectList copy = list;
      ASSERT_TRUE(
          isPlainPanic(tests::messagesOf([&] { Raster_SubRect(&copy, x, y, width, height); })));
      return;
    }
    bitmap = rest;
    ASSERT_EQ(Raster_SubRect(&list, x, y, width, height), bitmap.area());
  }
};

TEST(Raster_RectList, HoldsTheCanonicalRectanglesOfTheBitmap) {
  Random random(1);
  const int rounds = tests::rounds(1500);
  int boxes = 0;
  for (int round = 0; round < rounds; ++round) {
    Pair pair;
    const auto largest = static_cast<uint32>(random.oneOf({3, 8, 20}));
    for (int step = 0; step < 30; ++step) {
      const Entries before = usedOf(pair.list);
      const auto width = static_cast<int32>(1 + random.below(largest));
      const auto height = static_cast<int32>(1 + random.below(largest));
      const int32 x = random.between(0, Bitmap::kSize - width);
      const int32 y = random.between(0, Bitmap::kSize - height);
      const bool subtracts = random.below(3) == 0;
      if (subtracts) {
        pair.subtract(x, y, width, height);
      } else {
        pair.add(x, y, width, height);
      }
      ASSERT_EQ(entriesOf(pair.list), pair.bitmap.rectangles())
          << "round " << round << (subtracts ? ": subtracted" : ": added")
          << describe({{x, y, width, height}}) << " to" << describe(before);
      ASSERT_LE(usedOf(pair.list).size(), 15u);
      boxes += before.size() > 10 && usedOf(pair.list).size() == 1 ? 1 : 0;
    }
  }
  EXPECT_GT(boxes, rounds / 15);  // the limit was met often
}

TEST(Raster_RectList, IsEmptyAgainAfterAddingAndSubtractingTheSame) {
  Random random(2);
  for (int round = 0; round < tests::rounds(1000); ++round) {
    RectList list = {};
    Entries added;
    for (int i = 0; i < 4; ++i) {
      added.push_back({random.between(-50, 50), random.between(-50, 50), random.between(1, 60),
                       random.between(1, 60)});
      Raster_AddRect(&list, added[i][0], added[i][1], added[i][2], added[i][3]);
    }
    for (const auto& r : added) Raster_SubRect(&list, r[0], r[1], r[2], r[3]);
    ASSERT_EQ(entriesOf(list), Entries{}) << describe(added);
  }
}

// ---- Any list, against the step-by-step model --------------------------------------------------

/// A list as a caller may have made it by hand: overlapping, out of order, with entries of no
/// height, with leftovers behind its end, or full.
RectList someList(Random& random, int32 size) {
  RectList list = {};
  const uint32 filled = random.below(4) == 0 ? 16 : random.below(17);
  for (uint32 i = 0; i < filled; ++i) {
    RectListEntry& r = list.rects[i];
    r = {random.between(-size, size), random.between(-size, size), random.between(1, size),
         random.between(1, size)};
    if (random.below(12) == 0) r.height = random.between(-3, 0);
  }
  if (random.below(3) == 0) list.rects[random.below(16)].width = random.between(-2, 0);
  return list;
}

void checkAgainstModel(const RectList& before, const RectListEntry& r, bool subtracts) {
  RectList expected = before;
  RectList actual = before;
  const ListResult model = subtracts ? reference::subRect(expected, r.x, r.y, r.width, r.height)
                                     : reference::addRect(expected, r.x, r.y, r.width, r.height);
  uint32 area = 0;
  const Messages said = tests::messagesOf([&] {
    area = subtracts ? Raster_SubRect(&actual, r.x, r.y, r.width, r.height)
                     : Raster_AddRect(&actual, r.x, r.y, r.width, r.height);
  });
  const std::string call = (subtracts ? "subtract" : "add") +
                           describe({{r.x, r.y, r.width, r.height}}) + " of" +
                           describe(entriesOf(before));
  switch (model.fault) {
    case ListResult::kNone:
      ASSERT_EQ(said.panic, "") << call;
      ASSERT_EQ(entriesOf(actual), entriesOf(expected)) << call;
      ASSERT_EQ(area, model.area) << call;
      break;
    case ListResult::kNegativeSize:
      ASSERT_TRUE(tests::isPanic(said.panic, "ASSERT", "lib/raster/rasterRect", " bugNr=15740"))
          << call;
      break;
    default:
      ASSERT_TRUE(isPlainPanic(said)) << call;
  }
}

TEST(Raster_RectList, EqualsTheModelForAnyList) {
  Random random(3);
  for (int round = 0; round < tests::rounds(60000); ++round) {
    const int32 size = random.oneOf({3, 8, 30, 1000, 0x20000000});
    const RectList before = someList(random, size);
    const RectListEntry r = {random.between(-size, size), random.between(-size, size),
                             random.between(round % 8 == 0 ? -size : 1, size),
                             random.between(round % 8 == 1 ? -size : 1, size)};
    checkAgainstModel(before, r, random.below(2) == 0);
    ASSERT_FALSE(HasFailure()) << "round " << round;
  }
}

TEST(Raster_RectList, EqualsTheModelWhereRectanglesTouchAndCoincide) {
  Random random(4);
  for (int round = 0; round < tests::rounds(60000); ++round) {
    // A grid of a few lines, so that edges meet all the time.
    RectList before = {};
    const uint32 filled = 1 + random.below(16);
    for (uint32 i = 0; i < filled; ++i) {
      before.rects[i] = {random.between(0, 5), random.between(0, 5), random.between(1, 2),
                         random.between(1, 2)};
    }
    const RectListEntry r = {random.between(0, 5), random.between(0, 5), random.between(1, 4),
                             random.between(1, 4)};
    checkAgainstModel(before, r, random.below(2) == 0);
    ASSERT_FALSE(HasFailure()) << "round " << round;
  }
}

TEST(Raster_RectList, EqualsTheModelForBandsBelowOneAnother) {
  Random random(6);
  for (int round = 0; round < tests::rounds(60000); ++round) {
    // Bands of one rectangle each, some of which touch or continue, and some that spoil the order.
    RectList before = {};
    const uint32 filled = 1 + random.below(16);
    int32 y = 0;
    for (uint32 i = 0; i < filled; ++i) {
      const int32 height = random.between(random.below(20) == 0 ? -1 : 1, 3);
      before.rects[i] = {random.between(0, 2), y, random.between(1, 2), height};
      y += random.below(20) == 0 ? random.between(-9, 9) : height + random.between(0, 1);
    }
    if (random.below(4) == 0) before.rects[random.below(16)].width = 0;
    const RectListEntry r = {random.between(-1, 3), random.between(-2, std::max(y, 0) + 2),
                             random.between(1, 4), random.between(round % 8 == 0 ? -3 : 1, 9)};
    const bool subtracts = random.below(2) == 0 || r.height < 0;
    checkAgainstModel(before, r, subtracts);
    ASSERT_FALSE(HasFailure()) << "round " << round;
  }
}

TEST(Raster_RectList, EqualsTheModelOverLongSequences) {
  Random random(5);
  for (int round = 0; round < tests::rounds(2000); ++round) {
    const int32 size = random.oneOf({5, 20, 100});
    RectList list = {};
    for (int step = 0; step < 30; ++step) {
      const RectListEntry r = {random.between(-size, size), random.between(-size, size),
                               random.between(1, size), random.between(1, size)};
      const bool subtracts = random.below(3) == 0;
      checkAgainstModel(list, r, subtracts);
      ASSERT_FALSE(HasFailure()) << "round " << round << " step " << step;
      if (subtracts) {
        reference::subRect(list, r.x, r.y, r.width, r.height);
      } else {
        reference::addRect(list, r.x, r.y, r.width, r.height);
      }
    }
  }
}

// ---- Named cases -------------------------------------------------------------------------------

TEST(Raster_ClearRectList, ZeroesAllEntries) {
  RectList list = rowOf(16);
  Raster_ClearRectList(&list);
  EXPECT_EQ(entriesOf(list), Entries{});
}

TEST(Raster_AddRect, StoresTheFirstRectangle) {
  RectList list = {};
  EXPECT_EQ(Raster_AddRect(&list, 0, 0, 10, 10), 100u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 10}}));
}

TEST(Raster_AddRect, MergesNeighboursOfTheSameHeight) {
  RectList overlapping = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_AddRect(&overlapping, 5, 0, 10, 10), 150u);
  EXPECT_EQ(entriesOf(overlapping), (Entries{{0, 0, 15, 10}}));
  RectList touching = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_AddRect(&touching, 10, 0, 5, 10), 150u);
  EXPECT_EQ(entriesOf(touching), (Entries{{0, 0, 15, 10}}));
}

TEST(Raster_AddRect, MakesThreeBandsOfTwoOverlappingSquares) {
  RectList list = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_AddRect(&list, 5, 5, 10, 10), 175u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 5}, {0, 5, 15, 5}, {5, 10, 10, 5}}));
}

TEST(Raster_AddRect, IgnoresARectangleOfSizeZero) {
  RectList list = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_AddRect(&list, 1, 2, 0, 7), 0u);
  EXPECT_EQ(Raster_AddRect(&list, 1, 2, 7, 0), 0u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 10}}));
}

TEST(Raster_AddRect, TestsForZeroBeforeNegativeSizes) {
  RectList list = {};
  EXPECT_EQ(Raster_AddRect(&list, 0, 0, 0, -5), 0u);
  EXPECT_EQ(Raster_AddRect(&list, 0, 0, -5, 0), 0u);
}

TEST(Raster_AddRect, PanicsForANegativeSize) {
  for (const auto& [width, height] : {std::array{-1, 5}, std::array{5, -1}, std::array{-1, -1}}) {
    RectList list = {};
    const Messages said =
        tests::messagesOf([&, w = width, h = height] { Raster_AddRect(&list, 0, 0, w, h); });
    EXPECT_TRUE(tests::isPanic(said.panic, "ASSERT", "lib/raster/rasterRect", " bugNr=15740"))
        << said.panic;
    EXPECT_EQ(said.warning, "");
  }
}

TEST(Raster_AddRect, TouchesOnlyTheFirstEntryOfAListThatIsEmptyByWidthOrHeight) {
  for (const auto& [width, height] :
       {std::array{0, 5}, std::array{-3, 5}, std::array{5, 0}, std::array{5, -3}}) {
    RectList list = listOf({{9, 9, width, height}, {100, 100, 7, 7}});
    EXPECT_EQ(Raster_AddRect(&list, 1, 2, 3, 4), 12u);
    EXPECT_EQ(entriesOf(list), (Entries{{1, 2, 3, 4}, {100, 100, 7, 7}}));
  }
}

TEST(Raster_AddRect, ReturnsTheAreaWithWrapAround) {
  RectList list = {};
  EXPECT_EQ(Raster_AddRect(&list, 0, 0, 0x10000, 0x10000), 0u);
  EXPECT_EQ(Raster_AddRect(&list, 0x10000, 0, 1, 1), 1u);
}

// Deliberate: one entry of the list stays unused.
TEST(Raster_AddRect, FillsAtMostFifteenEntries) {
  RectList list = rowOf(14);
  EXPECT_EQ(Raster_AddRect(&list, 140, 0, 5, 10), 15u * 50);
  EXPECT_EQ(entriesOf(list), entriesOf(rowOf(15)));
}

TEST(Raster_AddRect, TurnsIntoTheBoundingBoxBeyondFifteenRectangles) {
  RectList list = rowOf(15);
  EXPECT_EQ(Raster_AddRect(&list, -10, 30, 5, 10), 155u * 40);
  EXPECT_EQ(entriesOf(list), (Entries{{-10, 0, 155, 40}}));
}

TEST(Raster_AddRect, CountsEntriesOfNoHeightInTheBoundingBox) {
  RectList list = rowOf(15);
  list.rects[14] = {1000, 500, 10, 0};
  EXPECT_EQ(Raster_AddRect(&list, -10, 7, 12, 1), 1020u * 500);  // splits one: 13 + 3
  EXPECT_EQ(entriesOf(list), (Entries{{-10, 0, 1020, 500}}));
}

// Deliberate: with all entries in use the new rectangle is dropped.
TEST(Raster_AddRect, OnlyRebuildsAFullList) {
  RectList list = {};
  for (int32 i = 0; i < 16; ++i) list.rects[i] = {5 * i, 0, 5, 10};
  EXPECT_EQ(Raster_AddRect(&list, 500, 500, 7, 7), 800u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 80, 10}}));
}

// Deliberate: not even the box of a full list includes the new rectangle.
TEST(Raster_AddRect, LeavesTheNewRectangleOutOfTheBoundingBoxOfAFullList) {
  RectList list = rowOf(16);
  EXPECT_EQ(Raster_AddRect(&list, 500, 500, 7, 7), 1550u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 155, 10}}));
}

// Deliberate: what lies behind the terminating entry comes to life when that entry is filled, but
// its top and bottom are no edges.
TEST(Raster_AddRect, RevivesTheEntriesBehindTheOneItFills) {
  RectList list = listOf({{0, 0, 10, 10}, {0, 0, 0, 0}, {50, 5, 10, 30}});
  // The edges are 0, 10 and 20: the old entry begins at 10 and never ends.
  EXPECT_EQ(Raster_AddRect(&list, 20, 0, 10, 20), 100u + 200u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 10}, {20, 0, 10, 20}, {50, 10, 10, 0}}));
}

// Deliberate: a region of two rectangles side by side can be too wide for one.
TEST(Raster_AddRect, WritesASpanTooWideForItsWidthBehindTheList) {
  constexpr int32 kMin = -0x7FFFFFFF - 1;
  RectList list = listOf({{kMin, 0, 0x7FFFFFFF, 10}});
  checkAgainstModel(list, {-1, 0, 0x7FFFFFFF, 10}, false);
  EXPECT_EQ(Raster_AddRect(&list, -1, 0, 0x7FFFFFFF, 10), 0u);
  EXPECT_EQ(usedOf(list), Entries{});
}

TEST(Raster_SubRect, CutsAHole) {
  RectList list = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_SubRect(&list, 2, 2, 6, 6), 64u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 2}, {0, 2, 2, 6}, {8, 2, 2, 6}, {0, 8, 10, 2}}));
}

TEST(Raster_SubRect, LeavesNothingOfACoveredRegion) {
  RectList list = rowOf(7);
  EXPECT_EQ(Raster_SubRect(&list, -1, -1, 1000, 12), 0u);
  EXPECT_EQ(entriesOf(list), Entries{});
}

TEST(Raster_SubRect, LeavesAListWhoseFirstEntryIsEmpty) {
  for (const auto& [width, height] : {std::array{0, 5}, std::array{5, 0}, std::array{5, -1}}) {
    RectList list = listOf({{1, 1, width, height}, {0, 0, 10, 10}});
    const Entries before = entriesOf(list);
    EXPECT_EQ(Raster_SubRect(&list, 0, 0, 100, 100), 0u);
    EXPECT_EQ(entriesOf(list), before);
  }
}

TEST(Raster_SubRect, IgnoresARectangleOfSizeZero) {
  RectList list = listOf({{0, 0, 10, 10}, {5, 5, 10, 10}});
  const Entries before = entriesOf(list);
  EXPECT_EQ(Raster_SubRect(&list, 0, 0, 0, 5), 0u);
  EXPECT_EQ(Raster_SubRect(&list, 0, 0, -5, 0), 0u);
  EXPECT_EQ(entriesOf(list), before);
}

TEST(Raster_SubRect, IgnoresEntriesBehindTheTerminatingOne) {
  RectList list = listOf({{0, 0, 10, 10}, {0, 0, -1, 0}, {50, 0, 10, 10}});
  EXPECT_EQ(Raster_SubRect(&list, 0, 5, 10, 100), 50u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 5}}));
}

TEST(Raster_SubRect, KeepsTheSpansOnBothSides) {
  RectList list = listOf({{0, 0, 10, 10}, {20, 0, 10, 10}, {40, 0, 10, 10}});
  EXPECT_EQ(Raster_SubRect(&list, 5, 0, 40, 10), 100u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 5, 10}, {45, 0, 5, 10}}));
}

// Deliberate: sizes are not checked. A negative height cuts nothing; a negative width leaves the
// two sides of the span that it lies in, overlapping.
TEST(Raster_SubRect, FollowsItsStepsForNegativeSizes) {
  RectList list = listOf({{0, 0, 10, 10}});
  EXPECT_EQ(Raster_SubRect(&list, 2, 8, 3, -4), 100u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 10}}));
  EXPECT_EQ(Raster_SubRect(&list, 8, 0, -6, 10), 160u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 8, 10}, {2, 0, 8, 10}}));
}

// Deliberate: the edges of the subtracted rectangle do not go into the table of a full list.
TEST(Raster_SubRect, CutsAFullListAtItsOwnEdgesOnly) {
  RectList list = {};
  for (int32 i = 0; i < 16; ++i) list.rects[i] = {0, 10 * i, 10, 10};
  // From 15 to 35: of the edges only 20 and 30 lie inside.
  EXPECT_EQ(Raster_SubRect(&list, 0, 15, 10, 20), 1400u);
  EXPECT_EQ(entriesOf(list), (Entries{{0, 0, 10, 20}, {0, 40, 10, 120}}));
}

TEST(Raster_SubRect, PanicsWhenMoreThanFifteenRectanglesWouldBeLeft) {
  RectList list = rowOf(15);
  const Messages said = tests::messagesOf([&] { Raster_SubRect(&list, 2, 0, 1, 10); });
  EXPECT_TRUE(isPlainPanic(said)) << said.panic;
}

TEST(Raster_SubRect, PanicsWhenASplitFindsSixteenSpansInUse) {
  RectList list = rowOf(16);
  const Messages said = tests::messagesOf([&] { Raster_SubRect(&list, 2, 0, 1, 10); });
  EXPECT_TRUE(isPlainPanic(said)) << said.panic;
  RectList other = rowOf(15);
  const Messages tooMany = tests::messagesOf([&] { Raster_SubRect(&other, 2, 0, 1, 10); });
  EXPECT_NE(said.panic, tooMany.panic);  // two faults, two lines
}

}  // namespace
