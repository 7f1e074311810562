// SPDX-License-Identifier: MIT
//
// A program that owns a frame buffer draws into it and saves it: once as it is, and once its
// middle, in half the size. usage: screenshot WHOLE.png MIDDLE.png

#include <imageUtil.h>
#include <raster.h>
#include <stdio.h>
#include <stdlib.h>

enum { kWidth = 640, kHeight = 400, kBytesPerPixel = 2, kPitch = kWidth * kBytesPerPixel };

/// Pixels of 16 bits: five of red, six of green, five of blue.
static uint32 color(uint32 rgb) { return Raster_ConvertOnePixel(rgb, 32, 16, false, NULL); }

static void draw(uint8* frame) {
  Raster_RectFill(frame, kPitch, kBytesPerPixel, color(0x204060), 0, 0, kWidth, kHeight);
  for (uint32 i = 0; i < 8; ++i)
    Raster_RectFill(frame, kPitch, kBytesPerPixel, color(0x2020FF + i * 0x1A1A00), 40 + 60 * i,
                    40 + 30 * i, 100, 70);
  // Inverted by exclusive or with white: drawing it twice would take it away again.
  Raster_RectROPfill(frame, kPitch, kBytesPerPixel, color(0xFFFFFF), 6, 160, 100, 320, 200);
}

int main(int argc, char** argv) {
  if (argc != 3) {
    fprintf(stderr, "usage: %s WHOLE.png MIDDLE.png\n", argv[0]);
    return 2;
  }
  ImageUtilImage screen = {.width = kWidth,
                           .height = kHeight,
                           .depth = 16,
                           .bpp = 16,
                           .bytesPerLine = kPitch,
                           .data = calloc(kHeight, kPitch)};
  if (screen.data == NULL) return 1;
  draw(screen.data);

  ImageUtilImage middle;
  bool saved = ImageUtil_WriteImage(&screen, argv[1], IMAGE_UTIL_TYPE_PNG);
  if (ImageUtil_CropAndScaleImage(&screen, 160, 100, 480, 300, 0, 0, 160, -1, &middle)) {
    saved = ImageUtil_WriteImage(&middle, argv[2], IMAGE_UTIL_TYPE_PNG) && saved;
    ImageUtil_FreeImageData(&middle);
  }
  ImageUtil_FreeImageData(&screen);
  return saved ? 0 : 1;
}
