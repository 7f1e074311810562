// SPDX-License-Identifier: MIT
//
// Drawing a cursor, clipping included: what counts is the cost of a call.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr uint32 kScreenWidth = 256;
constexpr uint32 kScreenHeight = 256;
constexpr int32 kAt = 37;

/// A cursor of `size` x `size` pixels on a screen of the given format. `passes` pixels are read and
/// written for each one of the cursor.
void cursorJob(const std::string& name, uint32 size, uint32 type, uint32 depth, uint32 bpp,
               uint32 passes) {
  const Extent extent = {size, size};
  Contenders c("cursor/" + name, extent, extent.pixels());
  uint8* screen = bench::buffer(0);
  uint8* planes = bench::buffer(1);
  const uint32 bytes = bpp / 8;
  const RasterFrameBufferDesc fb = {kScreenWidth, kScreenHeight, depth, bpp, kScreenWidth * bytes};
  RasterCursor cursor{type, 0, 0, size, size, {}};
  if (type == RASTER_CURSOR_ALPHA) {
    cursor.pixels = planes;
  } else {
    cursor.depth = depth;
    cursor.bpp = bpp;
    cursor.andMask = planes;
    cursor.xorMask = planes + size_t{size} * size * bytes;
  }
  c.add("raster", [=] {
    RasterCursorBox box;
    if (Raster_ComputeCursorBox(&fb, &cursor, kAt, kAt, &box))
      Raster_DrawCursor(screen, &fb, nullptr, 0, &cursor, &box);
  });
  const size_t copied =
      size_t{size} * size * passes * (type == RASTER_CURSOR_ALPHA ? (4 + bytes) / 2 : bytes);
  c.add("limit", [=] { memcpy(screen, planes, copied); });
#ifdef HAVE_PIXMAN
  if (type != RASTER_CURSOR_ALPHA) return;
  auto* to = bench::pixmanImage(bpp == 16 ? PIXMAN_r5g6b5 : PIXMAN_x8r8g8b8, screen,
                                {kScreenWidth, kScreenHeight}, fb.pitch);
  auto* from = bench::pixmanImage(PIXMAN_a8r8g8b8, planes, {size, size}, size * 4);
  c.add("pixman", [=] {
    const int side = static_cast<int>(size);
    pixman_image_composite32(PIXMAN_OP_OVER, from, nullptr, to, 0, 0, 0, 0, kAt, kAt, side, side);
  });
#endif
}

}  // namespace

int main(int argc, char** argv) {
  cursorJob("alpha-32x32-on-32", 32, RASTER_CURSOR_ALPHA, 24, 32, 1);
  cursorJob("alpha-64x64-on-32", 64, RASTER_CURSOR_ALPHA, 24, 32, 1);
  cursorJob("alpha-32x32-on-16", 32, RASTER_CURSOR_ALPHA, 16, 16, 1);
  cursorJob("mask-32x32-on-32", 32, RASTER_CURSOR_MASK, 24, 32, 2);
  return bench::run(argc, argv);
}
