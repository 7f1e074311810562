// SPDX-License-Identifier: MIT
//
// Rectangle transforms: the cases that the interface names, and full-range values against a model
// in wide arithmetic.

#include <gtest/gtest.h>

#include <csignal>

#include "rect.h"
#include "reference/rectTransformReference.h"
#include "support/ownProcess.h"
#include "support/rectValues.h"

namespace {

using tests::kMax;
using tests::kMin;
using tests::Random;

constexpr int kRounds = 50000;

/// A frame that can be scaled from: not empty.
Rect someFrame(Random& random) {
  for (;;) {
    const Rect r = tests::someRect(random);
    if (r.left < r.right && r.top < r.bottom) return r;
  }
}

TEST(Rect_ApplyDiff, MovesEachEdgeByItsOwnDifference) {
  const Rect r = {10, 10, 20, 20};
  const Rect from = {0, 0, 10, 10};
  const Rect moved = {5, 5, 15, 15};
  const Rect larger = {0, 0, 20, 20};
  Rect out = {};
  EXPECT_TRUE(Rect_ApplyDiff(&out, &moved, &from, &r));
  EXPECT_EQ(out, (Rect{15, 15, 25, 25}));
  EXPECT_TRUE(Rect_ApplyDiff(&out, &larger, &from, &r));
  EXPECT_EQ(out, (Rect{10, 10, 30, 30}));
}

TEST(Rect_ApplyDiff, StoresTheOtherFieldsWhenOneSaturates) {
  const Rect r = {1, 2, kMax, 4};
  const Rect to = {10, 20, 1, 40};
  const Rect from = {};
  Rect out = {};
  EXPECT_FALSE(Rect_ApplyDiff(&out, &to, &from, &r));
  EXPECT_EQ(out, (Rect{11, 22, kMax, 44}));
}

TEST(Rect_ApplyDiff, IsExactOverAllThreeTerms) {
  // The first sum alone would overflow, the whole does not.
  const Rect r = {kMax, 0, kMin, 0};
  const Rect to = {kMax, 0, kMin, 0};
  const Rect from = {kMax, 0, kMin, 0};
  Rect out = {};
  EXPECT_TRUE(Rect_ApplyDiff(&out, &to, &from, &r));
  EXPECT_EQ(out, r);
}

TEST(Rect_ApplyDiff, EqualsTheModelWithAnyInputAsOutput) {
  Random random(11);
  for (int round = 0; round < kRounds; ++round) {
    const Rect in[] = {tests::someRect(random), tests::someRect(random), tests::someRect(random)};
    const reference::Carried expected = reference::applyDiff(in[0], in[1], in[2]);
    for (int output = 0; output < 4; ++output) {
      Rect r[] = {in[0], in[1], in[2], Rect{}};
      ASSERT_EQ(Rect_ApplyDiff(&r[output], &r[0], &r[1], &r[2]), expected.exact);
      ASSERT_EQ(r[output], expected.rect)
          << in[2] << " to " << in[0] << " from " << in[1] << " output " << output;
    }
  }
}

TEST(Rect_ApplyDiffToPoint, AddsTheDifference) {
  const Point to = {10, 20};
  const Point from = {3, 4};
  const Point p = {1, 2};
  Point out = {};
  EXPECT_TRUE(Rect_ApplyDiffToPoint(&out, &to, &from, &p));
  EXPECT_EQ(out, (Point{8, 18}));
}

TEST(Rect_ApplyDiffToPoint, EqualsTheModelWithAnyInputAsOutput) {
  Random random(12);
  for (int round = 0; round < kRounds; ++round) {
    const Point in[] = {tests::somePoint(random), tests::somePoint(random),
                        tests::somePoint(random)};
    const reference::Carried expected = reference::applyDiff(
        {in[0].x, in[0].y, 0, 0}, {in[1].x, in[1].y, 0, 0}, {in[2].x, in[2].y, 0, 0});
    for (int output = 0; output < 4; ++output) {
      Point p[] = {in[0], in[1], in[2], Point{}};
      ASSERT_EQ(Rect_ApplyDiffToPoint(&p[output], &p[0], &p[1], &p[2]), expected.exact);
      ASSERT_EQ(p[output], (Point{expected.rect.left, expected.rect.top}))
          << in[2] << " to " << in[0] << " from " << in[1];
    }
  }
}

TEST(Rect_ApplyDiffEx, ScalesByTheRatioOfTheSizes) {
  const Rect r = {10, 10, 20, 20};
  const Rect from = {0, 0, 100, 100};
  const Rect to = {0, 0, 200, 50};
  Rect out = {};
  EXPECT_TRUE(Rect_ApplyDiffEx(&out, &to, &from, &r));
  // Right and bottom are measured from the right and the bottom of the frames.
  EXPECT_EQ(out, (Rect{20, 5, 40, 10}));
}

TEST(Rect_ApplyDiffEx, TruncatesTowardZero) {
  const Rect from = {0, 0, 2, 2};
  const Rect to = {0, 0, 1, 1};
  const Rect r = {-1, 1, 1, 3};  // offsets -1, 1, -1, 1, halved
  Rect out = {};
  EXPECT_TRUE(Rect_ApplyDiffEx(&out, &to, &from, &r));
  EXPECT_EQ(out, (Rect{0, 0, 1, 1}));
}

TEST(Rect_ApplyDiffEx, EqualsApplyDiffForEqualSizes) {
  Random random(13);
  for (int round = 0; round < kRounds; ++round) {
    const Rect from = {0, 0, random.between(1, 1000), random.between(1, 1000)};
    const int32 x = random.between(-1000000, 1000000);
    const int32 y = random.between(-1000000, 1000000);
    const Rect to = {x, y, x + from.right, y + from.bottom};
    const Rect r = tests::someRect(random);
    Rect plain = {};
    Rect scaled = {};
    ASSERT_EQ(Rect_ApplyDiff(&plain, &to, &from, &r), Rect_ApplyDiffEx(&scaled, &to, &from, &r));
    ASSERT_EQ(scaled, plain);
  }
}

TEST(Rect_ApplyDiffEx, DoesNotScaleBetweenEmptyFrames) {
  const Rect from = {5, 5, 5, 5};
  const Rect to = {9, 8, 7, 6};
  const Rect r = {1, 2, 3, 4};
  Rect out = {};
  EXPECT_TRUE(Rect_ApplyDiffEx(&out, &to, &from, &r));
  EXPECT_EQ(out, (Rect{5, 5, 5, 5}));
}

TEST(Rect_ApplyDiffEx, DividesByTheSizeOfAnEmptyFrame) {
  const Rect one = {0, 0, 1, 1};
  const Rect frame = {0, 0, 5, 5};
  for (const Rect& empty : {Rect{0, 0, 0, 5}, Rect{0, 0, 5, 0}, Rect{9, 0, 3, 5}, Rect{}}) {
    EXPECT_EQ(tests::signalOfOwnProcess([&] {
                Rect out = {};
                Rect_ApplyDiffEx(&out, &frame, &empty, &one);
              }),
              SIGFPE)
        << empty;
  }
}

TEST(Rect_ApplyDiffEx, EqualsTheModelWithAnyInputAsOutput) {
  Random random(14);
  for (int round = 0; round < kRounds; ++round) {
    const Rect in[] = {tests::someRect(random), someFrame(random), tests::someRect(random)};
    const reference::Carried expected = reference::applyDiffEx(in[0], in[1], in[2]);
    for (int output = 0; output < 4; ++output) {
      Rect r[] = {in[0], in[1], in[2], Rect{}};
      ASSERT_EQ(Rect_ApplyDiffEx(&r[output], &r[0], &r[1], &r[2]), expected.exact);
      ASSERT_EQ(r[output], expected.rect)
          << in[2] << " to " << in[0] << " from " << in[1] << " output " << output;
    }
  }
}

TEST(Rect_IntersectPair, CarriesTheIntersection) {
  const Rect a = {0, 0, 100, 100};
  const Rect b = {50, 50, 150, 150};
  const Rect c = {0, 0, 200, 200};
  Rect common = {};
  Rect mapped = {};
  EXPECT_TRUE(Rect_IntersectPair(&common, &a, &b, &mapped, &c));
  EXPECT_EQ(common, (Rect{50, 50, 100, 100}));
  EXPECT_EQ(mapped, (Rect{100, 100, 200, 200}));
}

TEST(Rect_IntersectPair, ZeroesBothOutputsWhenSomethingIsEmpty) {
  struct {
    Rect a, b, c;
  } const cases[] = {
      {{0, 0, 100, 100}, {200, 0, 300, 100}, {0, 0, 100, 100}},    // nothing in common
      {{0, 0, 100, 100}, {0, 0, 1, 1}, {5, 5, 5, 9}},              // no frame to carry it into
      {{kMin, 0, kMax, 9}, {kMax - 1, 0, kMax, 9}, {0, 0, 10, 9}}  // carried beyond its own right
  };
  for (const auto& [a, b, c] : cases) {
    Rect common = {1, 2, 3, 4};
    Rect mapped = {5, 6, 7, 8};
    EXPECT_FALSE(Rect_IntersectPair(&common, &a, &b, &mapped, &c));
    EXPECT_EQ(common, Rect{});
    EXPECT_EQ(mapped, Rect{});
  }
}

TEST(Rect_IntersectPair, EqualsTheModelWithNullOutputsAndAnyInputAsOutput) {
  Random random(15);
  for (int round = 0; round < kRounds; ++round) {
    const Rect in[] = {tests::someRect(random), tests::someRect(random), someFrame(random)};
    const reference::Pair expected = reference::intersectPair(in[0], in[1], in[2]);
    for (int output = 0; output < 4; ++output) {
      Rect r[] = {in[0], in[1], in[2], Rect{}};
      ASSERT_EQ(Rect_IntersectPair(&r[output], &r[0], &r[1], nullptr, &r[2]), expected.any);
      ASSERT_EQ(r[output], expected.intersection) << in[0] << in[1] << in[2];
      Rect s[] = {in[0], in[1], in[2], Rect{}};
      ASSERT_EQ(Rect_IntersectPair(nullptr, &s[0], &s[1], &s[output], &s[2]), expected.any);
      ASSERT_EQ(s[output], expected.mapped) << in[0] << in[1] << in[2];
    }
    ASSERT_EQ(Rect_IntersectPair(nullptr, &in[0], &in[1], nullptr, &in[2]), expected.any);
  }
}

TEST(Rect_ScalePoint, MapsFirstAndLastPixelWhenEnlarging) {
  const Rect from = {0, 0, 10, 10};
  const Rect to = {0, 0, 20, 20};
  Point out = {};
  const Point last = {9, 9};
  const Point first = {0, 0};
  Rect_ScalePoint(&from, &to, &last, &out);
  EXPECT_EQ(out, (Point{19, 19}));
  Rect_ScalePoint(&from, &to, &first, &out);
  EXPECT_EQ(out, (Point{0, 0}));
}

TEST(Rect_ScalePoint, ScalesPlainlyWhenReducing) {
  const Rect from = {0, 0, 20, 20};
  const Rect to = {0, 0, 10, 10};
  const Point last = {19, 19};
  Point out = {};
  Rect_ScalePoint(&from, &to, &last, &out);
  EXPECT_EQ(out, (Point{9, 9}));
}

TEST(Rect_ScalePoint, RoundsDown) {
  const Rect from = {0, 0, 10, 10};
  const Rect to = {0, 0, 20, 20};
  const Point left = {-1, 0};
  Point out = {};
  Rect_ScalePoint(&from, &to, &left, &out);
  EXPECT_EQ(out, (Point{-3, 0}));
}

// Deliberate: the distance from the edge wraps around at 32 bits.
TEST(Rect_ScalePoint, TakesItsDifferenceWithWrapAround) {
  const Rect from = {-2, 0, 8, 10};
  const Rect to = {0, 0, 10, 10};
  const Point p = {kMax, 0};
  Point out = {};
  Rect_ScalePoint(&from, &to, &p, &out);
  EXPECT_EQ(out, (Point{kMin + 1, 0}));
}

TEST(Rect_ScalePoint, DividesByOneWhereTheFrameIsTooSmall) {
  const Rect onePixel = {0, 0, 1, 1};
  const Rect empty = {3, 3, 3, 3};
  const Rect to = {0, 0, 10, 10};
  const Point p = {5, 2};
  Point out = {};
  Rect_ScalePoint(&onePixel, &to, &p, &out);
  EXPECT_EQ(out, (Point{45, 18}));
  Rect_ScalePoint(&empty, &to, &p, &out);
  EXPECT_EQ(out, (Point{18, -9}));
}

TEST(Rect_ScalePoint, EqualsTheModelInPlaceToo) {
  Random random(16);
  for (int round = 0; round < 4 * kRounds; ++round) {
    const Rect from = tests::someRect(random);
    const Rect to = tests::someRect(random);
    const Point p = tests::somePoint(random);
    Point out = p;
    Rect_ScalePoint(&from, &to, &out, &out);
    ASSERT_EQ(out, reference::scalePoint(from, to, p)) << p << " from " << from << " to " << to;
  }
}

TEST(Rect_PointDistance, IsZeroOnTheOutermostPixels) {
  const Rect r = {0, 0, 10, 10};
  const std::pair<Point, int32> cases[] = {
      {{0, 0}, 0}, {{9, 9}, 0}, {{5, 5}, -4}, {{-3, 5}, 3}, {{12, 15}, 6}};
  for (const auto& [p, distance] : cases) EXPECT_EQ(Rect_PointDistance(&r, &p), distance) << p;
}

TEST(Rect_PointDistance, EqualsTheModelForFullRangeValues) {
  Random random(17);
  for (int round = 0; round < 4 * kRounds; ++round) {
    const Rect r = tests::someRect(random);
    const Point p = tests::somePoint(random);
    ASSERT_EQ(Rect_PointDistance(&r, &p), reference::pointDistance(r, p)) << r << " and " << p;
  }
}

}  // namespace
