// SPDX-License-Identifier: MIT
//
// The comparison of tiles: what differs is found and taken over, and nothing else is touched.

#include "tiles.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "support/guardedBuffer.h"
#include "support/random.h"

namespace tool::live {
namespace {

using tests::GuardedBuffer;
using tests::Random;

constexpr uint32 kWidth = 143;
constexpr uint32 kHeight = 90;
constexpr uint32 kPitch = kWidth * 4;
constexpr size_t kSize = size_t{kPitch} * kHeight;

bool isInside(const std::vector<Rect>& rects, int32 x, int32 y) {
  const Point point = {x, y};
  return std::any_of(rects.begin(), rects.end(),
                     [&](const Rect& rect) { return Rect_ContainsPoint(&rect, &point); });
}

bool sameColor(const uint8* a, const uint8* b) { return memcmp(a, b, 3) == 0; }

TEST(Tiles, TakesOverWhatDiffersWithinTheDamage) {
  Random random(1);
  for (int round = 0; round < tests::rounds(200); ++round) {
    GuardedBuffer now(kSize);
    GuardedBuffer seen(kSize);
    seen.assign(random.bytes(kSize));
    memcpy(now.data(), seen.data(), kSize);
    ChangeList damage(kWidth, kHeight);
    for (int i = 0; i < 4; ++i) {
      const int32 x = random.between(0, kWidth - 30);
      const int32 y = random.between(0, kHeight - 20);
      damage.add({x, y, x + random.between(1, 30), y + random.between(1, 20)});
    }
    for (int i = 0; i < 100; ++i) now.data()[random.below(kSize)] ^= 0x10;
    const std::vector<uint8> before = seen.bytes();
    std::vector<Rect> told;
    const PixelView view = {now.data(), kPitch, kWidth, kHeight};
    findChanges(view, {seen.data(), kPitch, kWidth, kHeight}, damage, told);
    ASSERT_EQ(seen.bytes(), before);
    takeOver(view, seen.data(), kPitch, told);
    const std::vector<Rect> damaged = damage.all();
    for (int32 y = 0; y < static_cast<int32>(kHeight); ++y) {
      for (int32 x = 0; x < static_cast<int32>(kWidth); ++x) {
        const size_t at = (static_cast<size_t>(y) * kWidth + static_cast<size_t>(x)) * 4;
        const bool wasDamaged = isInside(damaged, x, y);
        const uint8* pixel = seen.data() + at;
        ASSERT_TRUE(wasDamaged ? sameColor(pixel, now.data() + at)
                               : memcmp(pixel, before.data() + at, 4) == 0);
        ASSERT_TRUE(sameColor(pixel, before.data() + at) || isInside(told, x, y));
      }
    }
  }
}

TEST(Tiles, TellsTilesOnlyThatDiffer) {
  std::vector<uint8> now(kSize);
  std::vector<uint8> seen(kSize);
  now[kPitch * 20 + 4 * 40] = 1;
  ChangeList damage(kWidth, kHeight);
  damage.addAll();
  std::vector<Rect> runs;
  const TileCount count = findChanges({now.data(), kPitch, kWidth, kHeight},
                                      {seen.data(), kPitch, kWidth, kHeight}, damage, runs);
  EXPECT_EQ(count.equal + 1, count.compared);
  ASSERT_EQ(runs.size(), 1u);
  const Rect rect = runs[0];
  const Point differs = {40, 20};
  EXPECT_TRUE(Rect_ContainsPoint(&rect, &differs));
  EXPECT_LE(rect.right - rect.left, 64);
  EXPECT_LE(rect.bottom - rect.top, 32);
}

TEST(Tiles, CountsNoTopBytes) {
  std::vector<uint8> now(kSize);
  std::vector<uint8> seen(kSize);
  for (size_t i = 3; i < kSize; i += 4) now[i] = 0xFF;
  ChangeList damage(kWidth, kHeight);
  damage.addAll();
  std::vector<Rect> runs;
  const TileCount count = findChanges({now.data(), kPitch, kWidth, kHeight},
                                      {seen.data(), kPitch, kWidth, kHeight}, damage, runs);
  EXPECT_EQ(count.equal, count.compared);
  EXPECT_GT(count.compared, 0u);
  EXPECT_TRUE(runs.empty());
}

}  // namespace
}  // namespace tool::live
