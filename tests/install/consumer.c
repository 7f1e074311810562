// SPDX-License-Identifier: MIT
//
// A C program that uses the installed libraries: both of them, code and data.

#include <imageUtil.h>
#include <message.h>
#include <raster.h>
#include <stdlib.h>

int main(void) {
  uint8 pixels[4 * 4 * 4] = {0};
  Raster_RectFill(pixels, 16, 4, 0x00112233, 1, 1, 2, 2);
  if (pixels[0] != 0 || pixels[16 + 4] != 0x33 || rasterops_mmx != 0) return EXIT_FAILURE;
  Log("filled\n");
  return EXIT_SUCCESS;
}
