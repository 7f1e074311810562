// SPDX-License-Identifier: MIT
//
// A C program that uses the checked companion and nothing else by name.

#include <rasterChecked.h>
#include <stdlib.h>

int main(void) {
  uint8 pixels[4 * 4 * 4] = {0};
  const RasterView view = {pixels, sizeof pixels, 16, 4, 4, 24, 32};
  const Rect outside = {2, 2, 9, 9};
  if (RasterChecked_Fill(&view, &outside, 0x00112233, 0) != RASTER_STATUS_OUTSIDE)
    return EXIT_FAILURE;
  if (RasterChecked_Fill(&view, &outside, 0x00112233, RASTER_CHECKED_CLIP) != RASTER_STATUS_OK)
    return EXIT_FAILURE;
  return pixels[sizeof pixels - 4] == 0x33 ? EXIT_SUCCESS : EXIT_FAILURE;
}
