// SPDX-License-Identifier: MIT
//
// Rectangles: the cases that the interface names, and full-range values against 64-bit sums.

#include "rect.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "support/rectValues.h"

namespace {

using tests::kMax;
using tests::kMin;
using tests::Random;

struct Sum {
  int32 value;
  bool exact;
};
Sum saturatedSum(int32 a, int32 b) {
  const int64 sum = int64{a} + b;
  const int64 clamped = std::clamp<int64>(sum, kMin, kMax);
  return {static_cast<int32>(clamped), clamped == sum};
}

bool isEmpty(const Rect& r) { return r.right <= r.left || r.bottom <= r.top; }

TEST(Rect_SetFromXYWH, SaturatesAtTheLargestCoordinate) {
  Rect r = {};
  EXPECT_FALSE(Rect_SetFromXYWH(&r, 0x7FFFFFF0, 0, 0x20, 5));
  EXPECT_EQ(r, (Rect{0x7FFFFFF0, 0, kMax, 5}));
}

TEST(Rect_SetFromXYWH, TakesASizeOfZeroAsValid) {
  Rect r = {};
  EXPECT_TRUE(Rect_SetFromXYWH(&r, 10, 20, 0, 0));
  EXPECT_EQ(r, (Rect{10, 20, 10, 20}));
}

TEST(Rect_SetFromXYWH, CollapsesASideOfNegativeSize) {
  Rect r = {};
  EXPECT_FALSE(Rect_SetFromXYWH(&r, 10, 20, -5, 3));
  EXPECT_EQ(r, (Rect{10, 20, 10, 23}));
  EXPECT_FALSE(Rect_SetFromXYWH(&r, kMin, kMin, kMin, kMin));
  EXPECT_EQ(r, (Rect{kMin, kMin, kMin, kMin}));
}

TEST(Rect_SetFromXYWH, EqualsTheExactSums) {
  Random random(1);
  for (int round = 0; round < tests::rounds(50000); ++round) {
    const Rect in = tests::someRect(random);  // x, y, width, height
    const Sum right = in.right < 0 ? Sum{in.left, false} : saturatedSum(in.left, in.right);
    const Sum bottom = in.bottom < 0 ? Sum{in.top, false} : saturatedSum(in.top, in.bottom);
    Rect r = {};
    ASSERT_EQ(Rect_SetFromXYWH(&r, in.left, in.top, in.right, in.bottom),
              right.exact && bottom.exact)
        << in;
    ASSERT_EQ(r, (Rect{in.left, in.top, right.value, bottom.value})) << in;
  }
}

TEST(Rect_IsEqual, TakesAnyTwoEmptyRectanglesAsEqual) {
  const Rect none = {0, 0, 0, 0};
  const Rect otherEmpty = {5, 5, 1, 1};
  const Rect some = {0, 0, 2, 2};
  const Rect same = {0, 0, 2, 2};
  EXPECT_TRUE(Rect_IsEqual(&none, &otherEmpty));
  EXPECT_TRUE(Rect_IsEqual(&some, &same));
  EXPECT_FALSE(Rect_IsEqual(&some, &none));
  EXPECT_FALSE(Rect_IsEqual(&none, &some));
}

TEST(Rect_IsEqual, LooksAtEveryField) {
  const Rect some = {1, 2, 30, 40};
  for (const Rect other :
       {Rect{0, 2, 30, 40}, Rect{1, 0, 30, 40}, Rect{1, 2, 31, 40}, Rect{1, 2, 30, 41}}) {
    EXPECT_FALSE(Rect_IsEqual(&some, &other)) << other;
  }
}

TEST(Rect_IsSizeEqual, ComparesWidthAndHeight) {
  const Rect a = {0, 0, 3, 4};
  const Rect moved = {10, -10, 13, -6};
  const Rect wider = {0, 0, 4, 4};
  const Rect higher = {0, 0, 3, 5};
  const Rect empty = {7, 7, 7, 9};
  const Rect otherEmpty = {1, 1, 0, 0};
  EXPECT_TRUE(Rect_IsSizeEqual(&a, &moved));
  EXPECT_FALSE(Rect_IsSizeEqual(&a, &wider));
  EXPECT_FALSE(Rect_IsSizeEqual(&a, &higher));
  EXPECT_FALSE(Rect_IsSizeEqual(&a, &empty));
  EXPECT_TRUE(Rect_IsSizeEqual(&empty, &otherEmpty));
}

TEST(Rect_IsSizeEqual, WrapsAroundAtThirtyTwoBits) {
  const Rect widest = {kMin, 0, kMax, 1};  // the width wraps around to -1
  const Rect emptyByWidth = {1, 0, 0, 1};  // and so is this one's
  EXPECT_TRUE(Rect_IsSizeEqual(&widest, &emptyByWidth));
}

TEST(Rect_Translate, SaturatesEachSumByItself) {
  const Rect r = {0, 0, 10, 10};
  const Point far = {kMax, 0};
  const Point back = {-5, -5};
  Rect out = {};
  EXPECT_FALSE(Rect_Translate(&out, &r, &far));
  EXPECT_EQ(out, (Rect{kMax, 0, kMax, 10}));
  EXPECT_TRUE(Rect_Translate(&out, &r, &back));
  EXPECT_EQ(out, (Rect{-5, -5, 5, 5}));
}

TEST(Rect_Translate, EqualsTheExactSumsInPlaceToo) {
  Random random(2);
  for (int round = 0; round < tests::rounds(50000); ++round) {
    const Rect r = tests::someRect(random);
    const Point by = tests::somePoint(random);
    const Sum sums[] = {saturatedSum(r.left, by.x), saturatedSum(r.top, by.y),
                        saturatedSum(r.right, by.x), saturatedSum(r.bottom, by.y)};
    Rect out = r;
    ASSERT_EQ(Rect_Translate(&out, &out, &by),
              std::all_of(sums, sums + 4, [](const Sum& s) { return s.exact; }))
        << r << " by " << by;
    ASSERT_EQ(out, (Rect{sums[0].value, sums[1].value, sums[2].value, sums[3].value}))
        << r << " by " << by;
  }
}

// Deliberate: the smallest offset has no negation in 32 bits.
TEST(Rect_TranslateInv, MovesTheSameWayByTheSmallestOffset) {
  const Rect r = {0, 10, 1, 11};
  const Point smallest = {kMin, kMin};
  Rect out = {};
  EXPECT_TRUE(Rect_TranslateInv(&out, &r, &smallest));
  EXPECT_EQ(out, (Rect{kMin, kMin + 10, kMin + 1, kMin + 11}));
  const Rect negative = {-1, -1, 0, 0};
  EXPECT_FALSE(Rect_TranslateInv(&out, &negative, &smallest));
  EXPECT_EQ(out, (Rect{kMin, kMin, kMin, kMin}));
}

TEST(Rect_TranslateInv, IsTheInverseOfTranslateInPlaceToo) {
  Random random(3);
  for (int round = 0; round < tests::rounds(50000); ++round) {
    const Rect r = tests::someRect(random);
    Point by = tests::somePoint(random);
    if (by.x == kMin || by.y == kMin) by = {1, 1};
    const Point minus = {-by.x, -by.y};
    Rect expected = {};
    const bool exact = Rect_Translate(&expected, &r, &minus);
    Rect out = r;
    ASSERT_EQ(Rect_TranslateInv(&out, &out, &by), exact);
    ASSERT_EQ(out, expected) << r << " by minus " << by;
  }
}

TEST(Rect_Intersect, StoresAnEmptyIntersectionToo) {
  const Rect a = {0, 0, 10, 10};
  const Rect b = {20, 20, 30, 30};
  Rect out = {};
  EXPECT_FALSE(Rect_Intersect(&out, &a, &b));
  EXPECT_EQ(out, (Rect{20, 20, 10, 10}));
}

TEST(Rect_Intersect, TakesANullOutput) {
  const Rect a = {0, 0, 10, 10};
  const Rect b = {9, 9, 30, 30};
  const Rect touching = {10, 0, 20, 10};
  EXPECT_TRUE(Rect_Intersect(nullptr, &a, &b));
  EXPECT_FALSE(Rect_Intersect(nullptr, &a, &touching));
}

TEST(Rect_Intersect, MayStoreInEitherInput) {
  const Rect a = {0, 1, 10, 11};
  const Rect b = {5, -5, 15, 5};
  const Rect common = {5, 1, 10, 5};
  Rect out = a;
  EXPECT_TRUE(Rect_Intersect(&out, &out, &b));
  EXPECT_EQ(out, common);
  out = b;
  EXPECT_TRUE(Rect_Intersect(&out, &a, &out));
  EXPECT_EQ(out, common);
}

TEST(Rect_Union, CopiesIntoAnEmptyAccumulator) {
  Rect acc = {9, 9, 9, 20};
  const Rect r = {1, 2, 3, 4};
  Rect_Union(&acc, &r);
  EXPECT_EQ(acc, r);
  acc = {};
  const Rect empty = {7, 8, 6, 9};
  Rect_Union(&acc, &empty);
  EXPECT_EQ(acc, empty);
}

TEST(Rect_Union, LeavesTheAccumulatorForAnEmptyRectangle) {
  Rect acc = {0, 0, 5, 5};
  const Rect empty = {100, 100, 100, 200};
  Rect_Union(&acc, &empty);
  EXPECT_EQ(acc, (Rect{0, 0, 5, 5}));
}

TEST(Rect_Union, GrowsToTheBoundingBox) {
  Rect acc = {0, 0, 5, 5};
  const Rect r = {-3, 2, 4, 9};
  Rect_Union(&acc, &r);
  EXPECT_EQ(acc, (Rect{-3, 0, 5, 9}));
}

TEST(Rect_ContainsRect, IncludesTheEdges) {
  const Rect outer = {0, 0, 10, 10};
  EXPECT_TRUE(Rect_ContainsRect(&outer, &outer));
  for (const Rect inner :
       {Rect{-1, 0, 10, 10}, Rect{0, -1, 10, 10}, Rect{0, 0, 11, 10}, Rect{0, 0, 10, 11}}) {
    EXPECT_FALSE(Rect_ContainsRect(&outer, &inner)) << inner;
  }
}

// Deliberate: emptiness plays no part here.
TEST(Rect_ContainsRect, JudgesEmptyRectanglesByTheirCoordinates) {
  const Rect outer = {0, 0, 10, 10};
  const Rect emptyWithin = {5, 5, 5, 5};
  const Rect emptyOutside = {20, 20, 20, 20};
  const Rect emptyOuter = {3, 3, 3, 3};
  EXPECT_TRUE(Rect_ContainsRect(&outer, &emptyWithin));
  EXPECT_FALSE(Rect_ContainsRect(&outer, &emptyOutside));
  EXPECT_TRUE(Rect_ContainsRect(&emptyOuter, &emptyOuter));
}

TEST(Rect_ContainsPoint, ExcludesRightAndBottom) {
  const Rect r = {0, 0, 10, 10};
  const Point right = {10, 5};
  const Point left = {0, 5};
  const Point bottom = {5, 10};
  const Point last = {9, 9};
  EXPECT_FALSE(Rect_ContainsPoint(&r, &right));
  EXPECT_TRUE(Rect_ContainsPoint(&r, &left));
  EXPECT_FALSE(Rect_ContainsPoint(&r, &bottom));
  EXPECT_TRUE(Rect_ContainsPoint(&r, &last));
}

TEST(Rect_ContainsPoint, AgreesWithTheOtherFunctionsOnFullRangeValues) {
  Random random(4);
  for (int round = 0; round < tests::rounds(50000); ++round) {
    const Rect r = tests::someRect(random);
    const Point p = tests::somePoint(random);
    if (p.x == kMax || p.y == kMax) continue;
    const Rect pixel = {p.x, p.y, p.x + 1, p.y + 1};
    ASSERT_EQ(Rect_ContainsPoint(&r, &p), !isEmpty(r) && Rect_Intersect(nullptr, &r, &pixel))
        << r << " and " << p;
  }
}

TEST(Rect_Test, DoesNothing) { Rect_Test(); }

}  // namespace
