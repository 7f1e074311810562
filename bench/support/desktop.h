// SPDX-License-Identifier: MIT
//
// A synthetic screen, for work whose speed depends on the content: a plain background, windows with
// a title bar and lines of text, and a patch of photograph in each.

#ifndef BENCH_DESKTOP_H
#define BENCH_DESKTOP_H

#include <algorithm>

#include "support/jobs.h"

namespace bench {

/// Draws a picture of 32-bit pixels, 0xFFRRGGBB, without gaps between the rows.
class Desktop {
 public:
  Desktop(uint32* pixels, Extent extent) : pixels_(pixels), extent_(extent) {
    fill(0, 0, extent.width, extent.height, 0xFF3A6EA5u);
    const uint32 w = extent.width;
    const uint32 h = extent.height;
    window(w / 12, h / 12, w / 2, h * 2 / 3, 0xFFFFFFFFu);
    window(w / 3, h / 4, w / 2, h * 2 / 3, 0xFFF4F0E8u);
    window(w * 5 / 8, h / 10, w / 3, h / 3, 0xFF202428u);
    fill(0, h - h / 30, w, h / 30, 0xFFD4D0C8u);
  }

 private:
  void fill(uint32 x, uint32 y, uint32 width, uint32 height, uint32 color) {
    for (uint32 row = y; row < std::min(y + height, extent_.height); ++row)
      std::fill_n(pixels_ + size_t{row} * extent_.width + x, std::min(width, extent_.width - x),
                  color);
  }

  void window(uint32 x, uint32 y, uint32 width, uint32 height, uint32 paper) {
    fill(x, y, width, height, paper);
    for (uint32 i = 0; i < std::min(width, 512u); ++i)  // a title bar of many blues
      fill(x + i * width / 512, y, 1 + width / 512, 20, 0xFF0A246Au + (i / 3 << 8) + i / 4);
    for (uint32 line = y + 28; line + 8 < y + height; line += 16) text(x + 6, line, width * 3 / 5);
    photo(x + width * 5 / 8, y + height / 4, width / 3, height / 3);
  }

  void text(uint32 x, uint32 y, uint32 width) {
    const uint32 length = width / 3 + random() % (width / 2 + 1);
    const uint32 ink = random() % 4 == 0 ? 0xFF0000C0u : 0xFF404040u;
    for (uint32 i = 0; i + 8 < length; i += 8) {
      if (random() % 6 == 0) continue;  // between words
      const uint32 letter = random() % 40;
      for (uint32 bit = 0; bit < 48; ++bit) {
        const uint32 px = x + i + bit % 6;
        const uint32 py = y + bit / 6;
        if ((letter * 0x9E3779B1u >> (bit % 30) & 3) == 1 && px < extent_.width &&
            py < extent_.height)
          pixels_[size_t{py} * extent_.width + px] = ink;
      }
    }
  }

  void photo(uint32 x, uint32 y, uint32 width, uint32 height) {
    for (uint32 j = 0; j < height && y + j < extent_.height; ++j) {
      for (uint32 i = 0; i < width && x + i < extent_.width; ++i) {
        const uint32 grain = random() & 0x070707;
        const uint32 light = 40 + 100 * i / width + 80 * j / height;
        pixels_[size_t{y + j} * extent_.width + x + i] =
            0xFF000000u | (light * 0x010100 + (light / 2) + grain);
      }
    }
  }

  uint32 random() {
    state_ = state_ * 6364136223846793005u + 1442695040888963407u;
    return static_cast<uint32>(state_ >> 40);
  }

  uint32* pixels_;
  Extent extent_;
  uint64 state_ = 1;
};

}  // namespace bench

#endif
