// SPDX-License-Identifier: MIT
//
// pixman's counterpart of a rect list.

#ifndef TESTS_PIXMAN_REGION_H
#define TESTS_PIXMAN_REGION_H

#include <pixman.h>

#include "raster.h"

namespace tests {

/// A region, empty at first and released at the end of its scope.
class PixmanRegion {
 public:
  PixmanRegion() { pixman_region32_init(&region_); }
  ~PixmanRegion() { pixman_region32_fini(&region_); }
  PixmanRegion(const PixmanRegion&) = delete;
  PixmanRegion& operator=(const PixmanRegion&) = delete;

  void add(const RectListEntry& r) {
    pixman_region32_union_rect(&region_, &region_, r.x, r.y, static_cast<unsigned>(r.width),
                               static_cast<unsigned>(r.height));
  }
  void subtract(const RectListEntry& r) {
    pixman_region32_t hole;
    pixman_region32_init_rect(&hole, r.x, r.y, static_cast<unsigned>(r.width),
                              static_cast<unsigned>(r.height));
    pixman_region32_subtract(&region_, &region_, &hole);
    pixman_region32_fini(&hole);
  }
  /// Empty regions may differ in their extents, which pixman compares too.
  bool equals(PixmanRegion& other) {
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

}  // namespace tests

#endif
