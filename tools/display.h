// SPDX-License-Identifier: MIT
//
// An X display: its screen as pictures, and its cursor.

#ifndef RASTER_TOOLS_DISPLAY_H
#define RASTER_TOOLS_DISPLAY_H

#include <xcb/xcb.h>

#include <memory>
#include <string>
#include <vector>

#include "displaySetup.h"
#include "picture.h"

namespace tool {

/// A cursor as XFIXES tells it: premultiplied pixels of 32 bits.
struct LiveCursor {
  Point hotSpotOnScreen;
  Point hotSpot;
  uint32 width;
  uint32 height;
  std::vector<uint32> pixels;
};

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
  LiveCursor cursor();

 private:
  class SharedMemory;

  void checkFormat();
  uint32 rowPitchOf(const Picture& picture) const;
  void readPalette();
  bool captureShared(Picture& picture, const Rect& region);
  void captureInBands(Picture& picture, const Rect& region);

  std::unique_ptr<xcb_connection_t, void (*)(xcb_connection_t*)> connection;
  ScreenSetup format;
  Rect area = {};
  std::unique_ptr<SharedMemory> sharedMemory;
  ImageUtilColor palette[256] = {};
};

}  // namespace tool

#endif
