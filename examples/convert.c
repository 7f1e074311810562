// SPDX-License-Identifier: MIT
//
// One picture in every pixel format, and back again: what each format keeps of 16 colours.

#include <raster.h>
#include <stdio.h>

enum { kColors = 16 };

static void show(const char* name, const uint8* pixels) {
  printf("%-6s", name);
  for (int i = 0; i < kColors; ++i)
    printf(" %02x%02x%02x", pixels[4 * i + 2], pixels[4 * i + 1], pixels[4 * i]);
  putchar('\n');
}

int main(void) {
  static const struct {
    const char* name;
    int32 code;
  } formats[] = {
      {"5-5-5", RASTER_FORMAT_555}, {"5-6-5", RASTER_FORMAT_565}, {"8-8-8", RASTER_FORMAT_888}};
  uint32 colors[kColors];
  for (uint32 i = 0; i < kColors; ++i) colors[i] = 0xFF000000U | (i * 0x111111 + (i & 4) * 0x3000);
  show("source", (const uint8*)colors);

  bool whole = false;
  for (int i = 0; i < 3; ++i) {
    uint8 packed[kColors * 4], back[kColors * 4];
    // A row of pixels has no pitch that matters, and no palette.
    Raster_ConvertPixels(packed, sizeof packed, formats[i].code, colors, sizeof colors,
                         RASTER_FORMAT_8888, false, NULL, 0, 0, 0, 0, kColors, 1);
    Raster_ConvertPixels(back, sizeof back, RASTER_FORMAT_8888, packed, sizeof packed,
                         formats[i].code, false, NULL, 0, 0, 0, 0, kColors, 1);
    show(formats[i].name, back);
    whole = Raster_ComparePixels(back, sizeof back, 32, colors, sizeof colors, 32, 0, 0, 0, 0,
                                 kColors, 1) == 0;
  }
  return whole ? 0 : 1;  // three bytes a pixel keep everything
}
