// SPDX-License-Identifier: MIT
//
// Rect lists beside pixman's regions: the same random unions and differences give the same set of
// pixels as long as the list does not reach its limit.

#include <gtest/gtest.h>
#include <pixman.h>

#include <string>

#include "raster.h"
#include "support/random.h"

namespace {

using tests::Random;

/// A pixman region, released at the end of its scope.
class Region {
 public:
  Region() { pixman_region32_init(&region_); }
  ~Region() { pixman_region32_fini(&region_); }
  Region(const Region&) = delete;
  Region& operator=(const Region&) = delete;

  void add(const RectListEntry& r) {
    pixman_region32_union_rect(&region_, &region_, r.x, r.y, static_cast<unsigned>(r.width),
                               static_cast<unsigned>(r.height));
  }
  void subtract(const RectListEntry& r) {
    Region other;
    other.add(r);
    pixman_region32_subtract(&region_, &region_, &other.region_);
  }
  /// Empty regions may differ in their extents, which pixman compares too.
  bool equals(Region& other) {
    const bool bothEmpty = area() == 0 && other.area() == 0;
    return bothEmpty || pixman_region32_equal(&region_, &other.region_) != 0;
  }

  uint32 area() {
    int count = 0;
    const pixman_box32_t* box = pixman_region32_rectangles(&region_, &count);
    uint32 sum = 0;
    for (; count != 0; --count, ++box)
      sum += static_cast<uint32>(box->x2 - box->x1) * static_cast<uint32>(box->y2 - box->y1);
    return sum;
  }

 private:
  pixman_region32_t region_;
};

uint32 usedEntries(const RectList& list) {
  uint32 count = 0;
  while (count < RASTER_RECT_LIST_SIZE && list.rects[count].width > 0) ++count;
  return count;
}

/// One random sequence, up to the limit of the list or `steps`; returns how far it came.
int runSequence(Random& random, int32 size, int steps) {
  RectList list = {};
  Region peer;
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
    Region ours;
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
  for (int round = 0; round < tests::rounds(5000); ++round) {
    const int32 size = random.oneOf({4, 12, 100, 5000});
    total += runSequence(random, size, 30);
    ASSERT_FALSE(HasFailure()) << "round " << round << " size " << size;
  }
  EXPECT_GT(total, 5000 * 5);
}

}  // namespace
