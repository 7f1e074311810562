// SPDX-License-Identifier: MIT
//
// An X display: its screen as pictures, and its cursor.

#ifndef RASTER_TOOLS_DISPLAY_H
#define RASTER_TOOLS_DISPLAY_H

#include <xcb/xcb.h>
#include <xcb/xfixes.h>

#include <chrono>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "displaySetup.h"
#include "liveCursor.h"
#include "picture.h"
#include "sharedMemory.h"
#include "xReply.h"

namespace tool {

class Display {
 public:
  /// Connects; an empty name stands for $DISPLAY.
  explicit Display(const std::string& name);
  ~Display();
  Display(const Display&) = delete;
  Display& operator=(const Display&) = delete;

  Rect bounds() const { return area; }
  /// "TrueColor, depth 24 in 32 bits per pixel"
  std::string description() const;
  /// The screen's pixels within a region of it, in the screen's own format.
  Picture capture(const Rect& region);
  /// Nothing when the server shows none at the moment.
  std::optional<LiveCursor> cursor();

  // For those who watch the screen over a longer time.
  xcb_connection_t* handle() const { return connection.get(); }
  xcb_window_t root() const { return format.screen->root; }
  /// Asks for the size of the screen again.
  void measure();
  /// The library's code of the screen's format; with 8, pixels are indices into colours().
  uint32 code() const;
  bool isIndexed() const { return format.screen->root_depth == 8; }
  const ImageUtilColor* colors() const { return palette; }
  /// Asks for the palette again, of whose changes no display tells; whether it is another one now.
  bool refreshColors();
  uint32 bytesPerPixel() const { return format.bitsPerPixel / 8; }
  /// The bytes from one row of the server's pixels to the next.
  uint32 rowBytes(uint32 width) const;

 private:
  using Connection = std::unique_ptr<xcb_connection_t, void (*)(xcb_connection_t*)>;
  using CursorReply = ReplyPointer<xcb_xfixes_get_cursor_image_reply_t>;

  void checkFormat();
  void readPalette();
  bool captureShared(Picture& picture, const Rect& region);
  void captureInBands(Picture& picture, const Rect& region);
  CursorReply cursorReply(bool& isRefused);
  CursorReply cursorOfAny();

  std::string displayName;
  Connection connection;
  Connection placeholder;  // has the number of the cursor's maker, who has left
  std::chrono::steady_clock::time_point nextSearch;  // for that number
  ScreenSetup format;
  Rect area = {};
  std::unique_ptr<SharedMemory> sharedMemory;
  ImageUtilColor palette[256] = {};
};

}  // namespace tool

#endif
