// SPDX-License-Identifier: MIT
//
// An X screen that is watched: what it says has changed, and the pixels of that.

#ifndef RASTER_TOOLS_LIVE_SCREEN_WATCH_H
#define RASTER_TOOLS_LIVE_SCREEN_WATCH_H

#include <xcb/damage.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "changeList.h"
#include "display.h"
#include "pixelView.h"

namespace tool::live {

/// What the server has said since it was last listened to.
struct ScreenNews {
  bool any = false;
  bool resized = false;
  bool cursorChanged = false;
  bool pointerMoved = false;
  uint64 rectangles = 0;
  uint64 pixels = 0;
};

class ScreenWatch {
 public:
  /// Watches a region of a screen, or all of it. Nothing is shown of the hidden rectangles, which
  /// are given in pixels of the screen.
  ScreenWatch(const std::string& displayName, const std::optional<Rect>& region,
              const std::vector<Rect>& hiddenRects);
  ~ScreenWatch();
  ScreenWatch(const ScreenWatch&) = delete;
  ScreenWatch& operator=(const ScreenWatch&) = delete;

  const Display& display() const { return screen; }
  int descriptor() const { return xcb_get_file_descriptor(screen.handle()); }
  /// The watched part in pixels of the screen; coordinates below are relative to it.
  const Rect& part() const { return shown; }
  uint32 width() const { return widthOf(shown); }
  uint32 height() const { return heightOf(shown); }
  /// Whether the server says what changes.
  bool tellsDamage() const { return hasDamage; }
  bool tellsCursor() const { return hasCursor; }
  /// Whether pixels are indices into a palette, whose changes the server never tells.
  bool hasPalette() const { return screen.isIndexed(); }
  bool refreshPalette() { return hasPalette() && screen.refreshColors(); }

  /// From here on the server says what changes; before, and after end(), it says nothing.
  void begin();
  void end();

  /// Whether the server is to say that the pointer moves.
  void followPointer(bool wanted);
  Point pointer();
  std::optional<LiveCursor> cursor() { return screen.cursor(); }

  /// Listens to the server without waiting, and adds the damage that it tells.
  ScreenNews listen(ChangeList& damage);
  /// Measures the screen again after it was resized.
  void resize();

  /// Captures the damaged rows. The picture holds earlier pixels elsewhere. Nothing when the screen
  /// has just become another one, of which news will come.
  std::optional<PixelView> capture(const ChangeList& damage);

 private:
  struct Rows {
    int32 top;
    int32 bottom;
  };
  static std::vector<Rows> damagedRows(const ChangeList& damage);
  void makeMemory();
  bool captureShared(const std::vector<Rows>& bands);
  bool captureRows(const Rows& band);
  void hide(const Rows& band);
  PixelView converted(const ChangeList& damage);
  void take(const xcb_generic_event_t& event, ChangeList& damage, ScreenNews& news);

  Display screen;
  std::optional<Rect> wantedPart;
  std::vector<Rect> hidden;
  Rect shown = {};
  bool hasDamage = false;
  bool hasCursor = false;
  uint8 inputOpcode = 0;  // of the extension that tells the pointer's way, if there is one
  xcb_damage_damage_t damageId = XCB_NONE;
  std::unique_ptr<SharedMemory> shared;
  std::vector<uint8> ownRows;  // where no memory can be shared
  uint8* rows = nullptr;       // one of the two
  uint32 rowPitch = 0;
  Picture asTrueColor;  // for screens of other formats
};

}  // namespace tool::live

#endif
