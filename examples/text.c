// SPDX-License-Identifier: MIT
//
// Text onto a screen of 5-6-5 pixels: cairo draws it into a picture of its own, whose pixels
// (CAIRO_FORMAT_ARGB32) are what the blends of this library take, and the library puts it onto the
// screen, twice: in a colour, and as a shadow of half the strength. usage: text PICTURE.png

#include <cairo.h>
#include <imageUtil.h>
#include <raster.h>
#include <stdio.h>

enum { kWidth = 320, kHeight = 120, kPitch = 2 * kWidth };

static uint8 screen[kHeight * kPitch];

/// A picture as large as the screen with text of the given colour, clear everywhere else.
static cairo_surface_t* drawText(double red, double green, double blue) {
  cairo_surface_t* picture = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, kWidth, kHeight);
  cairo_t* cairo = cairo_create(picture);
  cairo_set_font_size(cairo, 48);
  cairo_move_to(cairo, 24, 76);
  cairo_set_source_rgb(cairo, red, green, blue);
  cairo_show_text(cairo, "0 of 786432");
  cairo_destroy(cairo);
  cairo_surface_flush(picture);
  return picture;
}

/// Puts the picture onto the screen, moved by some pixels to the lower right.
static void blend(cairo_surface_t* picture, uint32 by, uint32 strength) {
  Raster_AlphaBlend(screen, by, by, kPitch, cairo_image_surface_get_data(picture), 0, 0,
                    (uint32)cairo_image_surface_get_stride(picture), kWidth - by, kHeight - by, 16,
                    16, RASTER_BLEND_OVER, RASTER_BLEND_USE_SRC_ALPHA, strength, 0, 0);
  cairo_surface_destroy(picture);
}

int main(int argc, char** argv) {
  if (argc != 2) {
    fprintf(stderr, "usage: %s PICTURE.png\n", argv[0]);
    return 2;
  }
  for (uint32 y = 0; y < kHeight; ++y)
    Raster_RectFill(screen, kPitch, 2, 0x1000 + (y / 8) * 0x0021, 0, y, kWidth, 1);
  blend(drawText(0, 0, 0), 3, 128);
  blend(drawText(1, 0.8, 0.3), 0, 255);

  const ImageUtilImage picture = {.width = kWidth,
                                  .height = kHeight,
                                  .depth = 16,
                                  .bpp = 16,
                                  .bytesPerLine = kPitch,
                                  .data = screen};
  return ImageUtil_WriteImage(&picture, argv[1], IMAGE_UTIL_TYPE_PNG) ? 0 : 1;
}
