// SPDX-License-Identifier: MIT
//
// The way of a pixel up to the viewers: damage, capture, comparison, and what is done with the
// picture before it is shown.

#ifndef RASTER_TOOLS_LIVE_LIVE_SCREEN_H
#define RASTER_TOOLS_LIVE_LIVE_SCREEN_H

#include <chrono>
#include <optional>

#include "moves.h"
#include "pace.h"
#include "scaledPicture.h"
#include "screenWatch.h"
#include "serveOptions.h"
#include "session.h"
#include "tiles.h"
#include "tintedPicture.h"

namespace tool::live {

class LiveScreen {
 public:
  using Clock = Pace::Clock;

  explicit LiveScreen(const ServeOptions& chosen);

  int descriptor() const { return watch.descriptor(); }
  uint32 width() const { return shownPicture().width; }
  uint32 height() const { return shownPicture().height; }

  /// Somebody looks from now on, or nobody.
  void begin(Clock::time_point now);
  void end();
  /// Whether anybody needs to know where the pointer is.
  void followPointer(bool wanted);

  /// Whether anybody can move what has only gone up or down.
  void seekMoves(bool wanted) { seeksMoves = wanted && !scaled && !tinted; }

  /// Listens to the display without waiting. True when the picture has another size now.
  bool listen(Clock::time_point now);
  /// Whether the display said anything when it was last listened to.
  bool hasHeard() const { return heard; }
  /// Whether it may have said more since, so that it is to be listened to again soon.
  bool mayHaveMore() const { return hasMore; }

  /// Whether there is damage to be captured, or may be some that is not told; and from when on.
  bool needsCapture() const { return isDamaged() || !watch.tellsDamage() || watch.hasPalette(); }
  bool isDamaged() const { return !damage.isEmpty(); }
  Clock::time_point captureTime() const;
  /// No capture is due before that, and so what the display says may wait.
  Clock::time_point restsUntil() const { return pace.restsUntil(); }
  /// Brings the picture up to date and adds to `changes` what of it is another one.
  void capture(Clock::time_point now, Changes& changes);
  /// What came of a capture has been sent to the viewers that waited.
  void rest(Clock::time_point captured);

  /// When a tint is to go, and the going of it.
  std::optional<Clock::time_point> nextExpiry() const;
  void expire(Clock::time_point now, ChangeList& changed);

  /// Whether the picture has been captured since somebody looks.
  bool hasPicture() const { return isCaptured; }
  Scene scene() const;
  /// The shown picture's pixels, to draw the cursor into for a moment.
  uint8* pixels();

  /// A place in the shown picture, in pixels of the screen.
  Point onScreen(const Point& shown) const;
  const Display& display() const { return watch.display(); }

  uint64 damagedRects() const { return rectCount; }
  uint64 damagedPixels() const { return pixelCount; }
  const TileCount& tiles() const { return tileCount; }

 private:
  bool follow(const ScreenNews& news);
  void changeSize();
  void fetchCursor();
  void fetchPointer();
  PixelView seenPicture() const;
  PixelView shownPicture() const;
  PixelView beforeTint() const;
  void show(const ChangeList& differing, Clock::time_point now, ChangeList& changed);

  const ServeOptions& options;
  ScreenWatch watch;
  Pace pace;
  Picture seen;  // what viewers have or will get
  std::optional<ScaledPicture> scaled;
  std::optional<TintedPicture> tinted;
  ChangeList damage;
  LiveCursor cursor = {};
  uint32 cursorSerial = 0;
  Point pointer = {-1, -1};
  bool followsPointer = false;
  bool seeksMoves = false;
  bool isWatched = false;
  bool isCaptured = false;
  bool heard = false;
  bool hasMore = false;
  Clock::time_point damagedSince;
  uint64 rectCount = 0;
  uint64 pixelCount = 0;
  TileCount tileCount;
};

}  // namespace tool::live

#endif
