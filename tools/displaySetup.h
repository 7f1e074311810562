// SPDX-License-Identifier: MIT
//
// What an X display says of its screens when a program connects. XCB's own iterators believe every
// count in it; here nothing is read beyond its end.

#ifndef RASTER_TOOLS_DISPLAY_SETUP_H
#define RASTER_TOOLS_DISPLAY_SETUP_H

#include <xcb/xcb.h>

#include "baseTypes.h"

namespace tool {

/// One screen, and how its pixels lie in memory.
struct ScreenSetup {
  const xcb_screen_t* screen = nullptr;
  const xcb_visualtype_t* visual = nullptr;  ///< of the root window, null when it is not there
  uint32 bitsPerPixel = 0;                   ///< 0 when the display has no format of this depth
  uint32 scanlinePad = 0;
};

/// Fails when there is no screen of this number, or when the setup is not what it says to be.
ScreenSetup readSetup(const xcb_setup_t* setup, int screenNumber);

}  // namespace tool

#endif
