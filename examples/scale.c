// SPDX-License-Identifier: MIT
//
// A disc enlarged and reduced, smoothly and to the nearest pixel, drawn as text.

#include <raster.h>
#include <stdio.h>

enum { kSide = 24 };

/// Scales a square picture of grey 4-byte pixels and shows it. Returns whether it could be scaled.
static bool show(const uint32* picture, uint32 from, uint32 to, int32 smooth) {
  static uint32 scaled[2 * kSide * kSide * 2];
  const double factor = (double)to / from;
  if (!Raster_Scale(scaled, 4 * to, 32, 24, to, to, 0, 0, 0, (int32)to, (int32)to, picture,
                    (int32)(4 * from), 32, 24, 0, from, from, 0, factor, factor, smooth))
    return false;
  printf("%s, %u by %u:\n", smooth ? "smoothed" : "nearest", to, to);
  for (uint32 y = 0; y < to; ++y) {
    for (uint32 x = 0; x < to; ++x) putchar(" .:-=+*#%@"[(scaled[y * to + x] & 0xFF) * 10 / 256]);
    putchar('\n');
  }
  return true;
}

int main(void) {
  uint32 disc[kSide * kSide];
  for (int y = 0; y < kSide; ++y)
    for (int x = 0; x < kSide; ++x) {
      const int dx = 2 * x - kSide + 1, dy = 2 * y - kSide + 1;
      disc[y * kSide + x] = dx * dx + dy * dy < kSide * kSide ? 0xFFFFFF : 0;
    }
  bool drawn = true;
  for (int32 smooth = 0; smooth <= 1; ++smooth)
    drawn = show(disc, kSide, 10, smooth) && show(disc, kSide, 36, smooth) && drawn;
  return drawn ? 0 : 1;
}
