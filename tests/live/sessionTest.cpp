// SPDX-License-Identifier: MIT
//
// A viewer's side of a session: what it has drawn after an update is what there was to be seen.

#include "session.h"

#include <gtest/gtest.h>

#include <cstring>
#include <list>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "drawnCursor.h"
#include "support/random.h"

namespace tool::live {
namespace {

using tests::Random;

constexpr uint32 kWidth = 100;
constexpr uint32 kHeight = 90;

constexpr PixelFormat kStandard = {32, 24, false, true, 255, 255, 255, 16, 8, 0};
constexpr PixelFormat kSixteen = {16, 16, true, true, 31, 63, 31, 11, 5, 0};
constexpr PixelFormat kEight = {8, 8, false, true, 7, 7, 3, 0, 3, 6};

class Messages {
 public:
  Messages& start() {
    bytes.append("RFB 003.008\n", 12);
    bytes.put8(1);
    bytes.put8(1);
    return *this;
  }
  Messages& format(const PixelFormat& wanted) {
    bytes.put32(0);
    putPixelFormat(bytes, wanted);
    return *this;
  }
  Messages& encodings(const std::vector<int32>& list) {
    bytes.put16(0x0200);
    bytes.put16(static_cast<uint32>(list.size()));
    for (const int32 encoding : list) bytes.put32(static_cast<uint32>(encoding));
    return *this;
  }
  Messages& request(bool incremental, const Rect& area) {
    bytes.put8(3);
    bytes.put8(incremental);
    for (const int32 number : {area.left, area.top, area.right - area.left, area.bottom - area.top})
      bytes.put16(static_cast<uint32>(number));
    return *this;
  }

  Bytes bytes;
};

/// A viewer that understands Raw, and what it was sent besides.
class Viewer {
 public:
  Viewer() : session(kWidth, kHeight, "a name", nullptr), picture(kWidth * kHeight * 4) {
    EXPECT_TRUE(say(Messages().start()));
    // The offer, the result, and 24 bytes and the name.
    EXPECT_EQ(answers.size(), 2 + 4 + 24 + 6u);
    EXPECT_EQ(bigEndian16(answers.data() + 6), kWidth);
    EXPECT_EQ(bigEndian16(answers.data() + 8), kHeight);
    EXPECT_EQ(memcmp(answers.data() + 30, "a name", 6), 0);
    answers.clear();
  }

  bool say(const Messages& messages) {
    return session.receive(messages.bytes.data(), messages.bytes.size(), answers);
  }
  bool say(const Messages& messages, const PixelFormat& wanted) {
    format = wanted;
    picture.assign(picture.size(), 0);
    return say(messages);
  }

  void lose(const Rect& area) {
    const size_t bytes = format.bitsPerPixel / 8;
    for (auto y = static_cast<size_t>(area.top); y < static_cast<size_t>(area.bottom); ++y)
      memset(picture.data() + (y * kWidth + static_cast<size_t>(area.left)) * bytes, 0xA7,
             static_cast<size_t>(area.right - area.left) * bytes);
  }

  /// Takes an update, if there is one.
  bool update(const Scene& scene) {
    Bytes out;
    if (!session.putUpdate(scene, out)) {
      EXPECT_EQ(out.size(), 0u);
      return false;
    }
    take(out);
    return true;
  }

  Session session;
  PixelFormat format = kStandard;
  std::vector<uint8> picture;
  std::vector<Rect> drawn;
  std::vector<int32> others;
  bool gotColorMap = false;
  bool moves = true;  // whether it says that it can

 private:
  void take(const Bytes& out) {
    const uint8* at = out.data();
    if (*at == 1) {
      gotColorMap = true;
      at += 6 + 256 * 6;
    }
    ASSERT_EQ(*at, 0);
    const uint32 count = bigEndian16(at + 2);
    ASSERT_GT(count, 0u);
    at += 4;
    drawn.clear();
    others.clear();
    for (uint32 i = 0; i < count; ++i) at = takeRect(at);
    EXPECT_EQ(at, out.data() + out.size());
  }

  const uint8* takeRect(const uint8* at) {
    const uint32 x = bigEndian16(at);
    const uint32 y = bigEndian16(at + 2);
    const uint32 width = bigEndian16(at + 4);
    const uint32 height = bigEndian16(at + 6);
    const auto encoding = static_cast<int32>(bigEndian32(at + 8));
    const uint32 bytes = format.bitsPerPixel / 8;
    at += 12;
    if (encoding != 0) others.push_back(encoding);
    if (encoding == -239) return at + size_t{width} * height * bytes + (width + 7) / 8 * height;
    if (encoding == -314) return at + 4 + size_t{width} * height * 4;
    if (encoding == 1) return move(at, {x, y, width, height});
    if (encoding != 0) return at;
    drawn.push_back({static_cast<int32>(x), static_cast<int32>(y), static_cast<int32>(x + width),
                     static_cast<int32>(y + height)});
    for (uint32 row = 0; row < height; ++row, at += size_t{width} * bytes)
      memcpy(picture.data() + (size_t{y + row} * kWidth + x) * bytes, at, size_t{width} * bytes);
    return at;
  }

  struct Box {
    uint32 x, y, width, height;
  };
  const uint8* move(const uint8* at, const Box& to) {
    const size_t bytes = format.bitsPerPixel / 8;
    const size_t fromX = bigEndian16(at);
    const size_t fromY = bigEndian16(at + 2);
    EXPECT_TRUE(moves);
    EXPECT_TRUE(fromX + to.width <= kWidth && fromY + to.height <= kHeight);
    const std::vector<uint8> before = picture;
    for (size_t row = 0; row < to.height; ++row)
      memcpy(picture.data() + ((to.y + row) * kWidth + to.x) * bytes,
             before.data() + ((fromY + row) * kWidth + fromX) * bytes, to.width * bytes);
    return at + 4;
  }

  Bytes answers;
};

/// A screen that changes.
class Screen {
 public:
  explicit Screen(uint64 seed) : random(seed), pixels(random.bytes(kWidth * kHeight * 4)) {}

  PixelView view() const { return {pixels.data(), 4 * kWidth, kWidth, kHeight}; }
  Scene scene() const { return {view(), nullptr, 0, {}, {-1, -1}}; }

  Changes change() {
    Changes changed(kWidth, kHeight);
    for (uint32 i = random.below(5); i != 0; --i) {
      const int32 x = random.between(0, kWidth - 1);
      const int32 y = random.between(0, kHeight - 1);
      const Rect rect = {x, y, random.between(x + 1, kWidth), random.between(y + 1, kHeight)};
      for (int32 row = rect.top; row < rect.bottom; ++row)
        for (int32 column = rect.left; column < rect.right; ++column)
          pixels[byteOf(column, row)] ^= 0x5A;
      changed.all.add(rect);
    }
    return changed;
  }

  /// Something goes up or down, and what it uncovers is new. Elsewhere something else changes.
  Changes scroll() {
    const std::vector<uint8> before = pixels;
    Changes changed = change();
    const int32 x = random.between(0, kWidth - 1);
    const int32 y = random.between(0, kHeight - 2);
    const Rect page = {x, y, random.between(x + 1, kWidth), random.between(y + 2, kHeight)};
    const int32 most = page.bottom - page.top - 1;
    const int32 down = random.below(2) == 0 ? random.between(1, most) : -random.between(1, most);
    Move move = {{page.left, page.top + down, page.right, page.bottom + down}, down};
    Rect_Intersect(&move.to, &move.to, &page);
    for (int32 row = page.top; row < page.bottom; ++row)
      for (int32 column = page.left; column < page.right; ++column) {
        const bool isMoved = row >= move.to.top && row < move.to.bottom;
        for (int32 byte = 0; byte < 4; ++byte)
          pixels[byteOf(column, row) + static_cast<size_t>(byte)] =
              isMoved ? before[byteOf(column, row - down) + static_cast<size_t>(byte)]
                      : static_cast<uint8>(random.word());
      }
    changed.all.add(page);
    changed.moves.push_back(move);
    return changed;
  }

  Random random;
  std::vector<uint8> pixels;

 private:
  static size_t byteOf(int32 x, int32 y) {
    return static_cast<size_t>((y * static_cast<int32>(kWidth) + x) * 4);
  }
};

std::vector<uint8> expectedPicture(const Screen& screen, const PixelFormat& wanted) {
  const ViewerFormat format(wanted);
  std::vector<uint8> rows(size_t{kWidth} * kHeight * format.bytesPerPixel());
  const PixelView view = screen.view();
  format.convert(rows.data(), kWidth * format.bytesPerPixel(), view, view.bounds());
  return rows;
}

void expectSeesScreen(const Viewer& viewer, const Screen& screen) {
  const std::vector<uint8> expected = expectedPicture(screen, viewer.format);
  ASSERT_EQ(memcmp(viewer.picture.data(), expected.data(), expected.size()), 0);
}

constexpr Rect kWhole = {0, 0, kWidth, kHeight};

LiveCursor someCursor() { return {{0, 0}, {1, 2}, 9, 5, std::vector<uint32>(45, 0xFF00FF00)}; }

TEST(Session, SaysNothingUnasked) {
  Screen screen(1);
  Viewer viewer;
  EXPECT_FALSE(viewer.session.isWaiting());
  EXPECT_FALSE(viewer.update(screen.scene()));
  ASSERT_TRUE(viewer.say(Messages().request(false, kWhole)));
  EXPECT_TRUE(viewer.session.isWaiting());
  EXPECT_TRUE(viewer.update(screen.scene()));
  expectSeesScreen(viewer, screen);
  EXPECT_FALSE(viewer.session.isWaiting());
  EXPECT_FALSE(viewer.update(screen.scene()));
  ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
  EXPECT_FALSE(viewer.update(screen.scene()));  // nothing has changed
  EXPECT_TRUE(viewer.session.isWaiting());
}

TEST(Session, KeepsUpWithChangesAndFormats) {
  Screen screen(2);
  Viewer viewer;
  for (int round = 0; round < 400; ++round) {
    viewer.session.addChanges(screen.change());
    if (screen.random.below(3) == 0) viewer.session.addChanges(screen.change());
    bool incremental = round != 0;
    if (screen.random.below(10) == 0) {
      const auto wanted = screen.random.oneOf({kStandard, kSixteen, kEight});
      ASSERT_TRUE(viewer.say(Messages().format(wanted), wanted));
      incremental = false;
    }
    ASSERT_TRUE(viewer.say(Messages().request(incremental, kWhole)));
    viewer.update(screen.scene());
    expectSeesScreen(viewer, screen);
    if (HasFatalFailure()) return;
  }
}

/// A viewer that may understand moves, that draws the cursor or has it drawn, and that asks when it
/// likes, for what it likes.
struct Reader {
  Reader(Random& chosen, bool drawsCursor) : random(chosen), ownCursor(drawsCursor) {
    const auto wanted = random.oneOf({kStandard, kSixteen, kEight});
    EXPECT_TRUE(viewer.say(Messages().format(wanted), wanted));
    setEncodings();
  }

  void setEncodings() {
    std::vector<int32> list = {0};
    viewer.moves = random.below(4) != 0;
    if (viewer.moves) list.push_back(1);
    if (ownCursor) list.push_back(-239);
    ASSERT_TRUE(viewer.say(Messages().encodings(list)));
  }
  /// What it does not ask for incrementally it has lost.
  void ask() {
    Rect area = kWhole;
    if (random.below(4) == 0) area = {0, 0, random.between(1, kWidth), random.between(1, kHeight)};
    bool incremental = random.below(10) != 0;
    if (random.below(30) == 0) {
      const auto wanted = random.oneOf({kStandard, kSixteen, kEight});
      ASSERT_TRUE(viewer.say(Messages().format(wanted), wanted));
      area = kWhole;
      incremental = false;
    }
    if (random.below(30) == 0) setEncodings();
    if (!incremental) viewer.lose(area);
    ASSERT_TRUE(viewer.say(Messages().request(incremental, area)));
    Rect_Union(&asked, &area);
  }
  /// Whether it then has the whole picture.
  bool update(const Scene& scene) {
    viewer.update(scene);
    const bool hasAll = Rect_IsEqual(&asked, &kWhole);
    if (!viewer.session.isWaiting()) asked = {};
    return hasAll;
  }

  Random& random;
  bool ownCursor;
  Viewer viewer;
  Rect asked = {};
};

TEST(Session, MovesWhatEachViewerHas) {
  Screen screen(10);
  const LiveCursor cursor = someCursor();
  std::list<Reader> readers;
  for (int i = 0; i < 6; ++i) readers.emplace_back(screen.random, i % 2 == 0);
  Point pointer = {20, 20};
  const int rounds = tests::rounds(2000);
  for (int round = 0; round < rounds; ++round) {
    const Changes changes = screen.random.below(3) == 0 ? screen.change() : screen.scroll();
    for (Reader& reader : readers) reader.viewer.session.addChanges(changes);
    if (screen.random.below(4) == 0)
      pointer = {screen.random.between(0, kWidth - 1), screen.random.between(0, kHeight - 1)};
    uint32 pace = 1;
    for (Reader& reader : readers) {
      pace = pace * 3 / 2 + 1;
      if (screen.random.below(pace) != 0) continue;
      do {
        reader.ask();
      } while (screen.random.below(4) == 0);
      Scene scene = screen.scene();
      scene.cursor = &cursor;
      scene.cursorSerial = 1;
      scene.cursorBox = live::cursorBox(cursor, pointer, kWidth, kHeight);
      std::optional<DrawnCursor> drawn;
      if (!reader.ownCursor)
        drawn.emplace(screen.pixels.data(), 4 * kWidth, kWidth, kHeight, cursor, pointer);
      if (reader.update(scene)) expectSeesScreen(reader.viewer, screen);
      if (HasFailure()) return;
    }
  }
  uint64 moved = 0;
  for (const Reader& reader : readers) moved += reader.viewer.session.movedPixels();
  EXPECT_GT(moved, 50u * static_cast<uint32>(rounds));
}

/// A viewer that has the picture, of which all but the last ten rows then goes up by ten rows.
struct Scrolled {
  explicit Scrolled(bool understands) : screen(11) {
    viewer.moves = understands;
    const std::vector<int32> list = understands ? std::vector<int32>{0, 1} : std::vector<int32>{0};
    EXPECT_TRUE(viewer.say(Messages().encodings(list).request(false, kWhole)));
    EXPECT_TRUE(viewer.update(screen.scene()));
    Changes changes(kWidth, kHeight);
    changes.all.addAll();
    changes.moves.push_back({{0, 0, kWidth, kHeight - 10}, -10});
    screen.pixels.erase(screen.pixels.begin(), screen.pixels.begin() + 10 * 4 * kWidth);
    screen.pixels.resize(size_t{4} * kWidth * kHeight, 7);
    viewer.session.addChanges(changes);
  }

  Screen screen;
  Viewer viewer;
};

TEST(Session, LeavesAMoveToThoseWhoCan) {
  for (const bool understands : {false, true}) {
    Scrolled scrolled(understands);
    Viewer& viewer = scrolled.viewer;
    EXPECT_EQ(viewer.session.takesMoves(), understands);
    ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
    ASSERT_TRUE(viewer.update(scrolled.screen.scene()));
    expectSeesScreen(viewer, scrolled.screen);
    ASSERT_EQ(viewer.drawn.size(), 1u);
    EXPECT_EQ(viewer.drawn[0].top, understands ? 80 : 0);
    EXPECT_EQ(viewer.others, understands ? std::vector<int32>{1} : std::vector<int32>{});
  }
}

TEST(Session, MovesNothingBeyondWhatWasAskedFor) {
  for (const Rect& part : {Rect{0, 0, 40, kHeight}, Rect{0, 0, kWidth, kHeight - 10}}) {
    Scrolled scrolled(true);
    Viewer& viewer = scrolled.viewer;
    ASSERT_TRUE(viewer.say(Messages().request(true, part)));
    ASSERT_TRUE(viewer.update(scrolled.screen.scene()));
    EXPECT_TRUE(viewer.others.empty());
    for (const Rect& rect : viewer.drawn) EXPECT_TRUE(Rect_ContainsRect(&part, &rect));
    ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
    ASSERT_TRUE(viewer.update(scrolled.screen.scene()));
    expectSeesScreen(viewer, scrolled.screen);
  }
}

TEST(Session, MovesNothingThatTheViewerHasLost) {
  Scrolled scrolled(true);
  Viewer& viewer = scrolled.viewer;
  const Rect lost = {20, 40, 60, 60};
  viewer.lose(lost);
  ASSERT_TRUE(viewer.say(Messages().request(true, kWhole).request(false, lost)));
  ASSERT_TRUE(viewer.update(scrolled.screen.scene()));
  expectSeesScreen(viewer, scrolled.screen);
}

TEST(Session, SendsWhatWasAskedForAndKeepsTheRest) {
  Screen screen(3);
  Viewer viewer;
  const Rect left = {0, 0, 40, kHeight};
  const Rect right = {40, 0, kWidth, kHeight};
  ASSERT_TRUE(viewer.say(Messages().request(true, left)));
  ASSERT_TRUE(viewer.update(screen.scene()));
  for (const Rect& rect : viewer.drawn) EXPECT_TRUE(Rect_ContainsRect(&left, &rect));
  ASSERT_TRUE(viewer.say(Messages().request(true, right)));
  ASSERT_TRUE(viewer.update(screen.scene()));
  for (const Rect& rect : viewer.drawn) EXPECT_TRUE(Rect_ContainsRect(&right, &rect));
  expectSeesScreen(viewer, screen);
}

TEST(Session, DropsThoseWhoAskForNothingOrForTooMuch) {
  for (const Rect& area : {Rect{0, 0, 0, 0}, Rect{5, 5, 5, 10}, Rect{0, 0, kWidth + 1, kHeight},
                           Rect{90, 80, 101, 90}, Rect{200, 200, 210, 210}}) {
    Viewer viewer;
    EXPECT_FALSE(viewer.say(Messages().request(true, area)));
    EXPECT_EQ(viewer.session.fault(), "a request for pixels that do not exist");
  }
}

TEST(Session, AnswersManyRequestsWithOneUpdate) {
  Screen screen(4);
  Viewer viewer;
  Messages many;
  for (int i = 0; i < 1000; ++i) many.request(false, kWhole);
  ASSERT_TRUE(viewer.say(many));
  EXPECT_TRUE(viewer.update(screen.scene()));
  EXPECT_FALSE(viewer.update(screen.scene()));
}

TEST(Session, TellsANewSizeBeforeAnythingElse) {
  Screen screen(5);
  Viewer viewer;
  ASSERT_TRUE(viewer.say(Messages().encodings({0, -223}).request(false, kWhole)));
  EXPECT_TRUE(viewer.session.resize(50, 60));
  ASSERT_TRUE(viewer.update(screen.scene()));
  EXPECT_EQ(viewer.others, std::vector<int32>{-223});
  EXPECT_TRUE(viewer.drawn.empty());
  // A request from before it knew is no mistake.
  ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
  ASSERT_TRUE(viewer.update(screen.scene()));
  const Rect now = {0, 0, 50, 60};
  for (const Rect& rect : viewer.drawn) EXPECT_TRUE(Rect_ContainsRect(&now, &rect));
}

TEST(Session, CannotTellANewSizeToEveryViewer) {
  Viewer viewer;
  ASSERT_TRUE(viewer.say(Messages().encodings({0})));
  EXPECT_FALSE(viewer.session.resize(50, 60));
}

TEST(Session, SendsACursorWheneverItIsAnotherOne) {
  Screen screen(6);
  const LiveCursor cursor = someCursor();
  for (const int32 encoding : {-239, -314}) {
    Viewer viewer;
    Scene scene = screen.scene();
    scene.cursor = &cursor;
    scene.cursorSerial = 1;
    ASSERT_TRUE(viewer.say(Messages().encodings({0, encoding}).request(false, kWhole)));
    EXPECT_FALSE(viewer.session.needsDrawnCursor());
    ASSERT_TRUE(viewer.update(scene));
    EXPECT_EQ(viewer.others, std::vector<int32>{encoding});
    expectSeesScreen(viewer, screen);
    ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
    EXPECT_FALSE(viewer.update(scene));
    scene.cursorSerial = 2;
    ASSERT_TRUE(viewer.update(scene));
    EXPECT_TRUE(viewer.drawn.empty());
  }
}

TEST(Session, RenewsWhatTheDrawnCursorCovered) {
  Screen screen(7);
  const LiveCursor cursor = someCursor();
  Viewer viewer;
  EXPECT_TRUE(viewer.session.needsDrawnCursor());
  Scene scene = screen.scene();
  scene.cursor = &cursor;
  scene.cursorSerial = 1;
  scene.cursorBox = {10, 10, 19, 15};
  ASSERT_TRUE(viewer.say(Messages().request(false, kWhole)));
  ASSERT_TRUE(viewer.update(scene));
  ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
  EXPECT_FALSE(viewer.update(scene));
  scene.cursorBox = {60, 70, 69, 75};
  ASSERT_TRUE(viewer.update(scene));
  ASSERT_EQ(viewer.drawn.size(), 2u);
  EXPECT_TRUE(Rect_IsEqual(&viewer.drawn[1], &scene.cursorBox));
}

TEST(Session, TellsWhereThePointerIs) {
  Screen screen(8);
  Viewer viewer;
  Scene scene = screen.scene();
  scene.pointer = {20, 30};
  ASSERT_TRUE(viewer.say(Messages().encodings({0, -232, -239}).request(false, kWhole)));
  ASSERT_TRUE(viewer.update(scene));
  EXPECT_EQ(viewer.others, std::vector<int32>{-232});
  ASSERT_TRUE(viewer.say(Messages().request(true, kWhole)));
  EXPECT_FALSE(viewer.update(scene));
  scene.pointer = {-5, 30};  // on another part of the screen
  EXPECT_FALSE(viewer.update(scene));
  scene.pointer = {21, 30};
  EXPECT_TRUE(viewer.update(scene));
}

TEST(Session, SendsAColorMapBeforeIndices) {
  Screen screen(9);
  Viewer viewer;
  PixelFormat indexed = kEight;
  indexed.trueColor = false;
  ASSERT_TRUE(viewer.say(Messages().format(indexed).request(false, kWhole), kEight));
  ASSERT_TRUE(viewer.update(screen.scene()));
  EXPECT_TRUE(viewer.gotColorMap);
  expectSeesScreen(viewer, screen);
}

}  // namespace
}  // namespace tool::live
