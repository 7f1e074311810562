// SPDX-License-Identifier: MIT
//
// Moves that are found make the new picture out of the old one, and none that saves much is missed.

#include "moves.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "support/guardedBuffer.h"
#include "support/random.h"
#include "tiles.h"

namespace tool::live {
namespace {

using tests::GuardedBuffer;
using tests::Random;

constexpr int32 kWidth = 210;
constexpr int32 kHeight = 170;

/// A picture, one word a pixel.
class Picture {
 public:
  Picture() : pixels(static_cast<size_t>(kWidth) * kHeight) {}

  uint32& at(int32 x, int32 y) { return pixels[static_cast<size_t>(y * kWidth + x)]; }
  uint32 at(int32 x, int32 y) const { return pixels[static_cast<size_t>(y * kWidth + x)]; }
  const uint32* data() const { return pixels.data(); }

  template <class Color> void draw(const Rect& rect, Color color) {
    for (int32 y = rect.top; y < rect.bottom; ++y)
      for (int32 x = rect.left; x < rect.right; ++x) at(x, y) = color();
  }
  void make(const Move& move) {
    const Picture before = *this;
    for (int32 y = move.to.top; y < move.to.bottom; ++y)
      std::copy_n(before.pixels.begin() + (y - move.down) * kWidth + move.to.left,
                  move.to.right - move.to.left, pixels.begin() + y * kWidth + move.to.left);
  }
  /// Moves what is in a rectangle within it; what is uncovered stays as it is.
  void scroll(const Rect& rect, int32 down) {
    Rect to = {rect.left, rect.top + down, rect.right, rect.bottom + down};
    if (Rect_Intersect(&to, &to, &rect)) make({to, down});
  }

 private:
  std::vector<uint32> pixels;
};

/// A picture beside which nothing can be read.
class Guarded {
 public:
  explicit Guarded(const Picture& picture) : memory(kPitch * kHeight) {
    memcpy(memory.data(), picture.data(), memory.size());
  }
  PixelView view() const { return {memory.data(), kPitch, kWidth, kHeight}; }

 private:
  static constexpr uint32 kPitch = 4 * kWidth;
  GuardedBuffer memory;
};

std::vector<Move> movesOf(const Picture& before, const Picture& now, const ChangeList& damage) {
  const Guarded guardedNow(now);
  const Guarded guardedBefore(before);
  std::vector<Rect> runs;
  findChanges(guardedNow.view(), guardedBefore.view(), damage, runs);
  return findMoves(guardedNow.view(), guardedBefore.view(), runs, damage);
}

std::vector<Move> movesOf(const Picture& before, const Picture& now, const Rect& damaged) {
  ChangeList damage(kWidth, kHeight);
  damage.add(damaged);
  return movesOf(before, now, damage);
}

Picture noise(Random& random) {
  Picture picture;
  picture.draw({0, 0, kWidth, kHeight}, [&] { return random.word(); });
  return picture;
}

/// Lines of a few words on a ground of one colour, each of them 13 rows high.
void write(Picture& picture, const Rect& page, Random& random) {
  picture.draw(page, [] { return 0xFFFFFF; });
  for (int32 y = page.top; y + 13 <= page.bottom; y += 13)
    for (int32 x = page.left; x + 6 <= page.right && random.below(20) != 0; x += 6)
      if (random.below(4) != 0)
        picture.draw({x + 1, y + 2, x + 5, y + 11},
                     [&] { return random.below(3) == 0 ? 0x202020u : 0xFFFFFFu; });
}

Rect randomRect(Random& random, int32 leastWidth, int32 leastHeight) {
  const int32 x = random.between(0, kWidth - leastWidth);
  const int32 y = random.between(0, kHeight - leastHeight);
  return {x, y, random.between(x + leastWidth, kWidth), random.between(y + leastHeight, kHeight)};
}

TEST(Moves, FindsAllThatScrolled) {
  Random random(1);
  for (int round = 0; round < tests::rounds(200); ++round) {
    const Picture before = noise(random);
    Picture now = before;
    const Rect page = randomRect(random, 140, 130);
    const int32 distance = random.between(1, 40);
    const bool up = random.below(2) == 0;
    now.scroll(page, up ? -distance : distance);
    const Rect uncovered = up ? Rect{page.left, page.bottom - distance, page.right, page.bottom}
                              : Rect{page.left, page.top, page.right, page.top + distance};
    now.draw(uncovered, [&] { return random.word(); });
    const std::vector<Move> moves = movesOf(before, now, page);
    ASSERT_EQ(moves.size(), 1u);
    EXPECT_EQ(moves[0].down, up ? -distance : distance);
    const Rect wanted = up ? Rect{page.left, page.top, page.right, uncovered.top}
                           : Rect{page.left, uncovered.bottom, page.right, page.bottom};
    EXPECT_TRUE(Rect_IsEqual(&moves[0].to, &wanted));
  }
}

TEST(Moves, FindsAPageOfTextByLines) {
  Random random(2);
  const int rounds = tests::rounds(100);
  int unseen = 0;  // such a page costs no more than its bytes
  for (int round = 0; round < rounds; ++round) {
    Picture before = noise(random);
    const Rect page = {5, 8, 200, 8 + 12 * 13};
    write(before, page, random);
    Picture now = before;
    const int32 lines = random.between(1, 3);
    now.scroll(page, -13 * lines);
    Rect last = page;
    last.top = page.bottom - 13 * lines;
    write(now, last, random);
    const std::vector<Move> moves = movesOf(before, now, page);
    if (moves.empty()) {
      ++unseen;
      continue;
    }
    uint64 area = 0;
    for (const Move& move : moves) {
      EXPECT_EQ(move.down, -13 * lines);
      area += areaOf(move.to);
    }
    EXPECT_GT(area, uint64{100} * 80);
  }
  EXPECT_LE(unseen, rounds / 100);
}

bool isMoved(const std::vector<Move>& moves, int32 x, int32 y) {
  const Point point = {x, y};
  return std::any_of(moves.begin(), moves.end(),
                     [&](const Move& move) { return Rect_ContainsPoint(&move.to, &point); });
}

void expectMovesToBe(const Picture& before, const Picture& now, const std::vector<Move>& moves) {
  const Rect whole = {0, 0, kWidth, kHeight};
  Picture made = before;
  for (size_t i = 0; i < moves.size(); ++i) {
    const Rect from = moves[i].from();
    ASSERT_TRUE(Rect_ContainsRect(&whole, &moves[i].to) && Rect_ContainsRect(&whole, &from));
    for (size_t k = 0; k < i; ++k)
      ASSERT_FALSE(Rect_Intersect(nullptr, &moves[i].to, &moves[k].to));
    made.make(moves[i]);
  }
  for (int32 y = 0; y < kHeight; ++y)
    for (int32 x = 0; x < kWidth; ++x)
      if (isMoved(moves, x, y)) {
        ASSERT_EQ((made.at(x, y) ^ now.at(x, y)) & 0xFFFFFF, 0u) << x << ',' << y;
      }
}

TEST(Moves, AreExactWhateverElseWasDrawn) {
  Random random(3);
  int found = 0;
  for (int round = 0; round < tests::rounds(1000); ++round) {
    Picture before;
    const Rect page = randomRect(random, 120, 120);
    const uint32 colors = random.oneOf({2u, 3u, 0xFFFFFFFFu});
    before.draw({0, 0, kWidth, kHeight}, [&] { return random.below(colors); });
    if (random.below(2) == 0) write(before, page, random);
    Picture now = before;
    ChangeList damage(kWidth, kHeight);
    now.scroll(page, random.between(-60, 60));
    damage.add(page);
    for (uint32 i = random.below(4); i != 0; --i) {
      const Rect rect = randomRect(random, 1, 1);
      const uint32 color = random.below(colors);
      now.draw(rect, [&] { return random.below(2) == 0 ? color : random.below(colors); });
      damage.add(rect);
    }
    const std::vector<Move> moves = movesOf(before, now, damage);
    found += moves.empty() ? 0 : 1;
    expectMovesToBe(before, now, moves);
    if (HasFatalFailure()) return;
  }
  EXPECT_GT(found, tests::rounds(1000) / 4);
}

TEST(Moves, AreSeveralAroundWhatStaysInItsPlace) {
  Random random(4);
  for (const int32 down : {-10, 10}) {
    const Picture before = noise(random);
    Picture now = before;
    const Rect page = {10, 0, 200, kHeight};
    now.scroll(page, down);
    now.draw({50, 80, 60, 82}, [&] { return random.word(); });
    const std::vector<Move> moves = movesOf(before, now, page);
    ASSERT_EQ(moves.size(), 2u);
    EXPECT_EQ(moves[0].to.top < moves[1].to.top, down < 0);
    expectMovesToBe(before, now, moves);
  }
}

TEST(Moves, LooksAtTheMainPartOfWhatChanged) {
  Random random(5);
  const Picture before = noise(random);
  Picture now = before;
  const Rect page = {40, 0, 200, kHeight};
  now.scroll(page, -5);
  const Rect clock = {0, 100, 20, 120};
  now.draw(clock, [&] { return random.word(); });
  ChangeList damage(kWidth, kHeight);
  damage.add(clock);
  damage.add(page);
  const std::vector<Move> moves = movesOf(before, now, damage);
  ASSERT_EQ(moves.size(), 1u);
  const Rect wanted = {40, 0, 200, kHeight - 5};
  EXPECT_TRUE(Rect_IsEqual(&moves[0].to, &wanted));
}

TEST(Moves, LeavesOutWhatStandsBesideIt) {
  Random random(8);
  const Picture before = noise(random);
  Picture now = before;
  now.scroll({64, 0, kWidth, kHeight}, -7);
  const std::vector<Move> moves = movesOf(before, now, Rect{0, 0, kWidth, kHeight});
  ASSERT_EQ(moves.size(), 1u);
  EXPECT_EQ(moves[0].to.left, 64);
}

TEST(Moves, JoinsWhatWasDamagedInPieces) {
  Random random(9);
  Picture before;
  const Rect page = {60, 0, 180, kHeight};
  before.draw(page, [&] { return random.word(); });
  Picture now = before;
  now.scroll(page, -5);
  ChangeList damage(kWidth, kHeight);
  for (int32 i = 0; i < 5; ++i) damage.add({50 - 4 * i, 34 * i, 190 + 4 * i, 34 * i + 34});
  const std::vector<Move> moves = movesOf(before, now, damage);
  ASSERT_EQ(moves.size(), 1u);
  EXPECT_EQ(moves[0].to.top, 0);
  EXPECT_EQ(moves[0].to.bottom, kHeight - 5);
}

TEST(Moves, CountsNoTopBytes) {
  Random random(6);
  const Picture before = noise(random);
  Picture now = before;
  const Rect page = {0, 0, kWidth, kHeight};
  now.scroll(page, -20);
  for (int32 y = 0; y < kHeight; ++y)
    for (int32 x = 0; x < kWidth; ++x) now.at(x, y) ^= 0xA5000000;
  const std::vector<Move> moves = movesOf(before, now, page);
  ASSERT_EQ(moves.size(), 1u);
  EXPECT_EQ(moves[0].down, -20);
}

TEST(Moves, FindsNothingWhereNothingMoved) {
  Random random(7);
  const Rect whole = {0, 0, kWidth, kHeight};
  const Picture before = noise(random);
  EXPECT_TRUE(movesOf(before, before, whole).empty());
  EXPECT_TRUE(movesOf(before, noise(random), whole).empty());
  Picture filled;
  filled.draw(whole, [] { return 0x808080; });
  EXPECT_TRUE(movesOf(before, filled, whole).empty());
  EXPECT_TRUE(movesOf(filled, Picture(), whole).empty());
}

}  // namespace
}  // namespace tool::live
