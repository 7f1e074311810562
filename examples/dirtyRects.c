// SPDX-License-Identifier: MIT
//
// How a remote screen is kept up to date: the parts that changed are collected as a list of
// disjoint rectangles, and only these are copied to the other side.

#include <raster.h>
#include <stdio.h>
#include <string.h>

enum { kWidth = 320, kHeight = 200, kPitch = 4 * kWidth, kTile = 16 };

static uint8 screen[kHeight * kPitch];
static uint8 remote[kHeight * kPitch];

static void addChangedTiles(RectList* dirty) {
  for (int32 y = 0; y < kHeight; y += kTile) {
    for (int32 x = 0; x < kWidth; x += kTile) {
      const int32 height = y + kTile < kHeight ? kTile : kHeight - y;
      if (Raster_ComparePixels(screen, kPitch, 32, remote, kPitch, 32, (uint32)x, (uint32)y,
                               (uint32)x, (uint32)y, kTile, (uint32)height) != 0)
        Raster_AddRect(dirty, x, y, kTile, height);
    }
  }
}

static void send(const RectListEntry* rect) {
  printf("  %dx%d at %d,%d\n", rect->width, rect->height, rect->x, rect->y);
  Raster_RectCopy(remote, kPitch, screen, kPitch, 4, (uint32)rect->x, (uint32)rect->y,
                  (uint32)rect->x, (uint32)rect->y, (uint32)rect->width, (uint32)rect->height);
}

int main(void) {
  Raster_RectFill(screen, kPitch, 4, 0xFF3060C0, 100, 50, 60, 40);
  Raster_RectFill(screen, kPitch, 4, 0xFFFFFFFF, 300, 190, 5, 5);

  RectList dirty;
  Raster_ClearRectList(&dirty);
  addChangedTiles(&dirty);
  Raster_SubRect(&dirty, 288, 176, 32, 24);  // that part of the screen is private

  printf("changed:\n");
  for (int i = 0; i < RASTER_RECT_LIST_SIZE && dirty.rects[i].width > 0; ++i) send(&dirty.rects[i]);

  const bool privateStays = remote[192 * kPitch + 4 * 302] == 0;
  Raster_RectCopy(remote, kPitch, screen, kPitch, 4, 288, 176, 288, 176, 32, 24);
  return privateStays && memcmp(screen, remote, sizeof screen) == 0 ? 0 : 1;
}
