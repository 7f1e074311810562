// SPDX-License-Identifier: MIT
//
// Cairo's names of our pixel formats.

#include <cairo.h>

#include "formatNames.h"

namespace {

void expectName(int32 code, cairo_format_t name) {
  expectReads(code, [name](uint8* bytes) {
    uint32 result = 0;
    cairo_surface_t* from = cairo_image_surface_create_for_data(bytes, name, 1, 1, 16);
    cairo_surface_t* to = cairo_image_surface_create_for_data(
        static_cast<uint8*>(static_cast<void*>(&result)), CAIRO_FORMAT_ARGB32, 1, 1, 4);
    cairo_t* cairo = cairo_create(to);
    cairo_set_source_surface(cairo, from, 0, 0);
    cairo_paint(cairo);
    EXPECT_EQ(cairo_status(cairo), CAIRO_STATUS_SUCCESS);
    cairo_destroy(cairo);
    cairo_surface_destroy(from);
    cairo_surface_destroy(to);
    return result;
  });
}

TEST(CairoFormats, Names) {
  expectName(16, CAIRO_FORMAT_RGB16_565);
  expectName(32, CAIRO_FORMAT_ARGB32);
  expectName(32, CAIRO_FORMAT_RGB24);
}

}  // namespace
