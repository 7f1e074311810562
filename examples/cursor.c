// SPDX-License-Identifier: MIT
//
// A cursor of two bit planes, drawn into a frame buffer and taken away again.

#include <raster.h>
#include <stdio.h>
#include <string.h>

enum { kWidth = 40, kHeight = 12, kPitch = 4 * kWidth, kSide = 8 };

static uint8 frame[kHeight * kPitch];

static void show(const char* title) {
  printf("%s\n", title);
  for (int y = 0; y < kHeight; ++y) {
    for (int x = 0; x < kWidth; ++x) {
      const uint8 blue = frame[y * kPitch + 4 * x];
      putchar(blue == 0 ? '#' : blue == 0xFF ? ' ' : '.');
    }
    putchar('\n');
  }
}

int main(void) {
  // One bit a pixel, rows padded to four bytes. The screen stays where the first plane is set and
  // is inverted where the second one is set as well; else the second plane is black or white.
  static const uint8 andBits[kSide * 4] = {0x7F, 0,    0,    0, 0x3F, 0,    0,    0, 0x1F, 0,    0,
                                           0,    0x0F, 0,    0, 0,    0x07, 0,    0, 0,    0x1F, 0,
                                           0,    0,    0x9F, 0, 0,    0,    0xFF, 0, 0,    0};
  static const uint8 xorBits[kSide * 4] = {[3 * 4] = 0x01, [4 * 4] = 0x03, [7 * 4] = 0xFF};
  uint8 planes[2 * kSide * kSide * 4];
  Raster_ExpandPlanarCursorData(kSide, kSide, 1, andBits, 1, xorBits, 32, planes, sizeof planes);

  RasterCursor cursor = {RASTER_CURSOR_MASK, 0, 0, kSide, kSide, {0}};
  cursor.depth = 24;
  cursor.bpp = 32;
  cursor.andMask = planes;
  cursor.xorMask = planes + sizeof planes / 2;
  const RasterFrameBufferDesc screen = {kWidth, kHeight, 24, 32, kPitch};

  Raster_RectFill(frame, kPitch, 4, 0x00808080, 0, 0, kWidth, kHeight);
  uint8 save[kSide * kSide * 4];
  RasterCursorBox box;
  if (!Raster_ComputeCursorBox(&screen, &cursor, 36, 2, &box)) return 1;  // partly off the screen
  const uint32 x = (uint32)box.x, y = (uint32)box.y;
  const uint32 width = (uint32)box.width, height = (uint32)box.height;
  Raster_RectCopy(save, kSide * 4, frame, kPitch, 4, x, y, 0, 0, width, height);
  Raster_DrawCursor(frame, &screen, NULL, 0, &cursor, &box);
  show("with the cursor:");
  const bool drawn = frame[y * kPitch + 4 * x] == 0;
  Raster_RectCopy(frame, kPitch, save, kSide * 4, 4, 0, 0, x, y, width, height);
  return drawn && frame[y * kPitch + 4 * x] == 0x80 ? 0 : 1;
}
