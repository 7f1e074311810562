// SPDX-License-Identifier: MIT
//
// Rect lists beside pixman's regions: the same random unions and differences give the same set of
// pixels as long as the list does not reach its limit.

#include <gtest/gtest.h>

#include <string>

#include "raster.h"
#include "peers/pixmanRegion.h"
#include "support/random.h"

namespace {

using tests::PixmanRegion;
using tests::Random;

uint32 usedEntries(const RectList& list) {
  uint32 count = 0;
  while (count < RASTER_RECT_LIST_SIZE && list.rects[count].width > 0) ++count;
  return count;
}

/// One random sequence, up to the limit of the list or `steps`; returns how far it came.
int runSequence(Random& random, int32 size, int steps) {
  RectList list = {};
  PixmanRegion peer;
  for (int step = 0; step < steps; ++step) {
    const RectListEntry rect = {random.between(-size, size), random.between(-size, size),
                                random.between(1, size), random.between(1, size)};
    // A difference adds at most as many rectangles as are there: stay clear of the limit.
    const bool subtracts = random.below(3) == 0 && usedEntries(list) <= 4;
    if (subtracts) {
      peer.subtract(rect);
    } else {
      peer.add(rect);
    }
    const uint32 area = subtracts ? Raster_SubRect(&list, rect.x, rect.y, rect.width, rect.height)
                                  : Raster_AddRect(&list, rect.x, rect.y, rect.width, rect.height);
    if (!subtracts && usedEntries(list) == 1 && area != peer.area()) return step;  // at the limit
    PixmanRegion ours;
    for (uint32 i = 0; i < usedEntries(list); ++i) ours.add(list.rects[i]);
    EXPECT_TRUE(ours.equals(peer)) << "step " << step;
    EXPECT_EQ(area, peer.area()) << "step " << step;
    if (testing::Test::HasFailure()) return step;
  }
  return steps;
}

TEST(Raster_RectList, HoldsThePixelsOfPixmansRegion) {
  Random random(21);
  int64 total = 0;
  const int rounds = tests::rounds(5000);
  for (int round = 0; round < rounds; ++round) {
    const int32 size = random.oneOf({4, 12, 100, 5000});
    total += runSequence(random, size, 30);
    ASSERT_FALSE(HasFailure()) << "round " << round << " size " << size;
  }
  EXPECT_GT(total, rounds * 5);
}

}  // namespace
