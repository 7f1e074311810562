// SPDX-License-Identifier: MIT

#include "liveScreen.h"

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <utility>

#include "cursorImage.h"
#include "drawnCursor.h"

namespace tool::live {
namespace {

using std::chrono::milliseconds;

constexpr milliseconds kGathering(2);        // from the first damage on, so that drawing ends
constexpr milliseconds kBlindInterval(250);  // for what no display, or not this one, tells

LiveCursor scaledCursor(LiveCursor cursor, double scale) {
  CursorImage image =
      CursorImage::ofPixels(cursor.width, cursor.height, cursor.hotSpot, std::move(cursor.pixels));
  image.scaleBy(scale);
  const RasterCursor& shape = image.shape();
  return {
      cursor.hotSpotOnScreen, {shape.hotX, shape.hotY}, shape.width, shape.height, image.pixels()};
}

/// What this process has had so far.
Pace::Clock::duration cpuTime() {
  timespec spent;
  clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &spent);
  return std::chrono::seconds(spent.tv_sec) + std::chrono::nanoseconds(spent.tv_nsec);
}

}  // namespace

LiveScreen::LiveScreen(const ServeOptions& chosen)
    : options(chosen),
      watch(chosen.display, chosen.region, chosen.hidden),
      pace(chosen.maxRate, chosen.busyRate) {
  if (!watch.tellsDamage())
    fputs("the display does not tell what changes: comparing four times a second\n", stderr);
  changeSize();
}

void LiveScreen::changeSize() {
  const uint32 width = watch.width();
  const uint32 height = watch.height();
  seen = Picture(width, height, 32);
  damage = ChangeList(width, height);
  scaled.reset();
  tinted.reset();
  if (options.scale != 1) scaled.emplace(width, height, options.scale);
  const PixelView plain = beforeTint();
  if (options.showChanges) tinted.emplace(plain.width, plain.height);
  isCaptured = false;
  if (isWatched) damage.addAll();
}

PixelView LiveScreen::seenPicture() const {
  return {seen.data(), seen.pitch(), seen.width(), seen.height()};
}

PixelView LiveScreen::beforeTint() const { return scaled ? scaled->view() : seenPicture(); }

PixelView LiveScreen::shownPicture() const { return tinted ? tinted->view() : beforeTint(); }

uint8* LiveScreen::pixels() {
  if (tinted) return tinted->data();
  return scaled ? scaled->data() : seen.data();
}

void LiveScreen::begin(Clock::time_point now) {
  watch.begin();
  isWatched = true;
  damage.addAll();
  damagedSince = now;
  if (watch.tellsCursor()) fetchCursor();
}

void LiveScreen::end() {
  watch.end();
  isWatched = isCaptured = followsPointer = heard = hasMore = false;
  damage.clear();
}

void LiveScreen::followPointer(bool wanted) {
  if (wanted == followsPointer) return;
  followsPointer = wanted;
  watch.followPointer(wanted);
  if (wanted) fetchPointer();
}

void LiveScreen::fetchCursor() {
  std::optional<LiveCursor> shape = watch.cursor();
  if (!shape) return;  // between two shapes there may be none: the old one stays
  cursor = std::move(*shape);
  if (scaled) cursor = scaledCursor(std::move(cursor), options.scale);
  ++cursorSerial;
}

void LiveScreen::fetchPointer() {
  pointer = watch.pointer();
  if (scaled) pointer = scaled->shownOf(pointer);
}

/// Does what the news asks for. True when that waited for the display, which may have said more.
bool LiveScreen::follow(const ScreenNews& news) {
  if (news.resized) {
    watch.resize();
    changeSize();
  }
  const bool isOtherCursor = isWatched && news.cursorChanged;
  const bool mayHaveMoved = followsPointer && news.any;
  if (isOtherCursor) fetchCursor();
  if (mayHaveMoved) fetchPointer();
  return news.resized || isOtherCursor || mayHaveMoved;
}

bool LiveScreen::listen(Clock::time_point now) {
  constexpr int kMostTurns = 3;  // a display that is busy is listened to again later
  const bool wasWhole = damage.isEmpty();
  bool hasResized = false;
  heard = false;
  hasMore = true;
  for (int i = 0; hasMore && i < kMostTurns; ++i) {
    const ScreenNews news = watch.listen(damage);
    rectCount += news.rectangles;
    pixelCount += news.pixels;
    heard = heard || news.any;
    hasResized = hasResized || news.resized;
    hasMore = follow(news);
  }
  if (wasWhole && !damage.isEmpty()) damagedSince = now;
  return hasResized;
}

LiveScreen::Clock::time_point LiveScreen::captureTime() const {
  if (isDamaged()) return std::max(restsUntil(), damagedSince + kGathering);
  return std::max(restsUntil(), pace.lastCapture() + kBlindInterval);
}

void LiveScreen::rest(Clock::time_point captured) { pace.captured(captured, cpuTime()); }

void LiveScreen::capture(Clock::time_point now, Changes& changes) {
  if (!watch.tellsDamage() || watch.refreshPalette()) damage.addAll();
  const std::optional<PixelView> captured = watch.capture(damage);
  if (!captured) return;
  std::vector<Rect> runs;
  const TileCount count = findChanges(*captured, seenPicture(), damage, runs);
  tileCount.compared += count.compared;
  tileCount.equal += count.equal;
  if (seeksMoves) changes.moves = findMoves(*captured, seenPicture(), runs, damage);
  takeOver(*captured, seen.data(), seen.pitch(), runs);
  damage.clear();
  ChangeList differing(watch.width(), watch.height());
  for (const Rect& run : runs) differing.add(run);
  show(differing, now, changes.all);
  isCaptured = true;
}

void LiveScreen::show(const ChangeList& differing, Clock::time_point now, ChangeList& changed) {
  ChangeList inScale;
  const ChangeList* plain = &differing;
  if (scaled) {
    inScale = ChangeList(scaled->view().width, scaled->view().height);
    scaled->draw(seenPicture(), differing, inScale);
    plain = &inScale;
  }
  if (tinted && !isCaptured) {
    tinted->takeAll(beforeTint());
    changed.addAll();
  } else if (tinted) {
    tinted->draw(beforeTint(), *plain, now, changed);
  } else {
    changed.add(*plain);
  }
}

std::optional<LiveScreen::Clock::time_point> LiveScreen::nextExpiry() const {
  return tinted ? tinted->nextExpiry() : std::nullopt;
}

void LiveScreen::expire(Clock::time_point now, ChangeList& changed) {
  if (tinted) tinted->expire(beforeTint(), now, changed);
}

Scene LiveScreen::scene() const {
  const PixelView picture = shownPicture();
  if (!watch.tellsCursor() || cursor.width == 0) return {picture, nullptr, 0, {}, pointer};
  const Rect box =
      followsPointer ? cursorBox(cursor, pointer, picture.width, picture.height) : Rect{};
  return {picture, &cursor, cursorSerial, box, pointer};
}

Point LiveScreen::onScreen(const Point& shown) const {
  const Point point = scaled ? scaled->sourceOf(shown) : shown;
  return {point.x + watch.part().left, point.y + watch.part().top};
}

}  // namespace tool::live
