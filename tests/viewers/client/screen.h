// SPDX-License-Identifier: MIT
//
// What an X server itself says is on its screen: xwd's dump, and the cursor's image over it.

#ifndef VIEWERS_SCREEN_H
#define VIEWERS_SCREEN_H

#include <string>
#include <vector>

#include "picture.h"
#include "pixelFormat.h"
#include "session.h"

namespace viewers {

struct Screen {
  int width = 0, height = 0;
  std::vector<Color> colors;  // row by row

  Color& at(int x, int y) { return colors[static_cast<size_t>(y * width + x)]; }
};

/// Runs xwd on the display's root window. Throws Broken.
Screen dumpOf(const std::string& display);

/// The cursor's image and the position of its left upper corner on the screen.
struct Pointer {
  CursorImage image;
  int left = 0, top = 0;

  Box box() const { return {left, top, image.width, image.height}; }
};
Pointer pointerOf(const std::string& display);
/// Draws the pointer where it is, each channel as source + destination * (255 - alpha) / 255.
void drawPointer(const Pointer& pointer, Screen& screen);

/// How many pixels of the picture, outside the box, are not the screen's, cut to the format; all of
/// them where the sizes differ.
size_t differences(const Screen& screen, const Picture& picture, const PixelFormat& format,
                   Box without = {});
/// The same for a cursor that a viewer got, its hot spot included. A mask of one bit a pixel shows
/// of half transparent pixels what it likes.
size_t differences(const CursorImage& wanted, const CursorImage& got, const PixelFormat& format);

}  // namespace viewers

#endif
