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

/// The rest that captures of a cost come to when one follows the other.
Pace::Clock::duration restOfMany(Pace::Clock::duration cost) {
  Pace pace(50, 20);
  Time now = kStart;
  for (int i = 1; i <= 100; ++i) {
    pace.captured(now, i * cost);
    now = pace.restsUntil();
  }
  return now - pace.lastCapture();
}

TEST(Pace, RestsBetweenTheTwoInProportionWhereChangesGoOn) {
  const auto rest = restOfMany(microseconds(400));
  const auto longer = restOfMany(microseconds(500));
  EXPECT_GT(rest, milliseconds(20));
  EXPECT_LT(longer, milliseconds(50));
  EXPECT_EQ(rest * 5, longer * 4);
}

TEST(Pace, RestsAsShortAsItMayWhereChangesAreFew) {
  Pace pace(50, 20);
  Time now = kStart;
  for (int i = 1; i <= 20; ++i, now += milliseconds(40)) {
    pace.captured(now, i * microseconds(500));  // 40 ms of rest each
    EXPECT_EQ(pace.restsUntil(), now + milliseconds(20)) << i;
  }
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
