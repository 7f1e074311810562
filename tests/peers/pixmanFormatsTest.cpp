// SPDX-License-Identifier: MIT
//
// Pixman's names of our pixel formats.

#include <pixman.h>

#include "formatNames.h"

namespace {

void expectName(int32 code, pixman_format_code_t name) {
  expectReads(code, [name](uint8* bytes) {
    uint32 result = 0;
    pixman_image_t* from =
        pixman_image_create_bits(name, 1, 1, static_cast<uint32*>(static_cast<void*>(bytes)), 16);
    pixman_image_t* to = pixman_image_create_bits(PIXMAN_a8r8g8b8, 1, 1, &result, 4);
    pixman_image_composite32(PIXMAN_OP_SRC, from, nullptr, to, 0, 0, 0, 0, 0, 0, 1, 1);
    pixman_image_unref(from);
    pixman_image_unref(to);
    return result;
  });
}

TEST(PixmanFormats, Names) {
  expectName(8, PIXMAN_b2g3r3);
  expectName(15, PIXMAN_x1r5g5b5);
  expectName(16, PIXMAN_r5g6b5);
  expectName(24, PIXMAN_r8g8b8);
  expectName(32, PIXMAN_a8r8g8b8);
  expectName(32, PIXMAN_x8r8g8b8);
}

}  // namespace
