// SPDX-License-Identifier: MIT
//
// Sequences of changes to a rect list against a bitmap, and lists of any bytes.

#include <cstring>

#include "fuzzing.h"
#include "support/listBitmap.h"

using fuzz::require;

namespace {

constexpr int32 kSide = 32;
using Bitmap = tests::Bitmap<kSide>;

void change(fuzz::Choices& c, RectList& list) {
  const RectListEntry r = {c.between(0, 23), c.between(0, 23), c.between(0, 8), c.between(0, 8)};
  Bitmap expected = tests::bitmapOf<kSide>(list);
  uint32 area = 0;
  const bool adds = c.below(3) != 0;
  tests::paint<kSide>(expected, r, adds);
  if (adds) {
    require(RasterChecked_AddRect(&list, r.x, r.y, r.width, r.height, &area) == RASTER_STATUS_OK);
    const Bitmap made = tests::bitmapOf<kSide>(list);
    require((made & expected) == expected);  // or the box around it
    require(made == expected || list.rects[1].width == 0);
  } else if (RasterChecked_SubRect(&list, r.x, r.y, r.width, r.height, &area) == RASTER_STATUS_OK) {
    require(tests::bitmapOf<kSide>(list) == expected);
  }
  const bool nothing = r.width == 0 || r.height == 0;
  require(nothing || area == 0 || area == tests::bitmapOf<kSide>(list).count());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  fuzz::Choices c(bytes, size);
  RectList list = {};
  for (uint32 steps = c.below(40); steps != 0; --steps) change(c, list);
  RectList any;
  for (RectListEntry& entry : any.rects)
    entry = {fuzz::coordinate(c), fuzz::coordinate(c), fuzz::coordinate(c), fuzz::coordinate(c)};
  const RectListEntry r = {fuzz::coordinate(c), fuzz::coordinate(c), fuzz::coordinate(c),
                           fuzz::coordinate(c)};
  RectList before = any;
  if (RasterChecked_SubRect(&any, r.x, r.y, r.width, r.height, nullptr) != RASTER_STATUS_OK)
    require(memcmp(&any, &before, sizeof any) == 0);
  before = any;
  if (RasterChecked_AddRect(&any, r.x, r.y, r.width, r.height, nullptr) != RASTER_STATUS_OK)
    require(memcmp(&any, &before, sizeof any) == 0);
  return 0;
}
