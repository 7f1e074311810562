// SPDX-License-Identifier: MIT
//
// A picture with alpha blended onto a screen of 5-6-5 pixels, once as it is and once at half its
// strength. usage: blend PICTURE.png

#include <imageUtil.h>
#include <raster.h>
#include <stdio.h>
#include <stdlib.h>

enum { kWidth = 320, kHeight = 160, kPitch = 2 * kWidth, kSide = 120 };

static uint8 screen[kHeight * kPitch];
static uint32 disc[kSide * kSide];

/// A red disc that fades towards its rim. Colours are premultiplied: none is larger than alpha.
static void drawDisc(void) {
  for (int y = 0; y < kSide; ++y)
    for (int x = 0; x < kSide; ++x) {
      const int dx = 2 * x - kSide, dy = 2 * y - kSide;
      const int far = (dx * dx + dy * dy) * 255 / (kSide * kSide);
      const uint32 alpha = far < 255 ? (uint32)(255 - far) : 0;
      disc[y * kSide + x] = alpha << 24 | alpha << 16 | (alpha / 4) << 8;
    }
}

int main(int argc, char** argv) {
  if (argc != 2) {
    fprintf(stderr, "usage: %s PICTURE.png\n", argv[0]);
    return 2;
  }
  drawDisc();
  for (uint32 x = 0; x < kWidth; x += 20)
    Raster_RectFill(screen, kPitch, 2, (x / 20) % 2 != 0 ? 0xFFFF : 0x39E7, x, 0, 20, kHeight);
  Raster_AlphaBlendOver(screen, 20, 20, kPitch, (const uint8*)disc, 0, 0, 4 * kSide, kSide, kSide,
                        16, 16, 0);
  Raster_AlphaBlend(screen, 180, 20, kPitch, (const uint8*)disc, 0, 0, 4 * kSide, kSide, kSide, 16,
                    16, RASTER_BLEND_OVER, RASTER_BLEND_USE_SRC_ALPHA, 128, 0, 0);

  const ImageUtilImage picture = {.width = kWidth,
                                  .height = kHeight,
                                  .depth = 16,
                                  .bpp = 16,
                                  .bytesPerLine = kPitch,
                                  .data = screen};
  return ImageUtil_WriteImage(&picture, argv[1], IMAGE_UTIL_TYPE_PNG) ? 0 : 1;
}
