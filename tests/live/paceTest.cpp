// SPDX-License-Identifier: MIT
//
// The pace of captures: what costs little is shown often, what costs much less often.

#include "pace.h"

#include <gtest/gtest.h>

namespace tool::live {
namespace {

using std::chrono::microseconds;
using std::chrono::milliseconds;
using std::chrono::seconds;

using Time = Pace::Clock::time_point;

constexpr Time kStart = Time(seconds(1000));

TEST(Pace, LetsTheFirstCaptureBeAtOnce) { EXPECT_LT(Pace(50, 20).restsUntil(), kStart); }

TEST(Pace, RestsTheLongerTheMoreACaptureCosts) {
  Pace pace(50, 20);
  Pace::Clock::duration spent = {};
  Time now = kStart;
  Pace::Clock::duration before = {};
  for (const int cost : {0, 1, 100, 200, 400, 500, 600, 620, 1000, 100000}) {
    now += seconds(1);
    spent += microseconds(cost);
    pace.captured(now, spent);
    const auto rest = pace.restsUntil() - now;
    EXPECT_EQ(pace.lastCapture(), now);
    EXPECT_GE(rest, milliseconds(20));
    EXPECT_LE(rest, milliseconds(50));
    EXPECT_GE(rest, before);
    before = rest;
  }
  EXPECT_EQ(before, milliseconds(50));
}

TEST(Pace, ForgetsWhatEarlierCapturesCost) {
  Pace pace(50, 20);
  pace.captured(kStart, seconds(1));
  EXPECT_EQ(pace.restsUntil(), kStart + milliseconds(50));
  pace.captured(kStart + seconds(1), seconds(1) + microseconds(10));
  EXPECT_EQ(pace.restsUntil(), kStart + seconds(1) + milliseconds(20));
}

TEST(Pace, RestsBetweenTheTwoInProportion) {
  Pace pace(50, 20);
  pace.captured(kStart, microseconds(400));
  const auto rest = pace.restsUntil() - kStart;
  pace.captured(kStart, microseconds(400 + 500));
  const auto longer = pace.restsUntil() - kStart;
  EXPECT_GT(rest, milliseconds(20));
  EXPECT_LT(longer, milliseconds(50));
  EXPECT_EQ(rest * 5, longer * 4);
}

TEST(Pace, KeepsToTheLowerRateWhenThatIsTheGreatest) {
  Pace pace(5, 20);
  for (const auto cost : {seconds(0), seconds(1)}) {
    pace.captured(kStart, cost);
    EXPECT_EQ(pace.restsUntil(), kStart + milliseconds(200));
  }
}

}  // namespace
}  // namespace tool::live
