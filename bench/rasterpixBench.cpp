// SPDX-License-Identifier: MIT
//
// Tiling against memset and the public libraries that repeat a picture.

#include <cstring>
#include <memory>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr uint32 kTileX = 3;
constexpr uint32 kTileY = 5;

/// The bytes of a tile's row; a multiple of 4, as the peers want it.
uint32 tilePitch(uint32 size, uint32 bytes) { return (size * bytes + 3) / 4 * 4; }

#ifdef HAVE_PIXMAN
void addPixman(Contenders& c, uint8* dst, uint8* tile, uint32 bytes, uint32 size, Extent e) {
  const int w = static_cast<int>(e.width);
  const int h = static_cast<int>(e.height);
  const auto format = bench::kPixmanFormats[bytes];
  auto* to = bench::pixmanImage(format, dst, e, e.width * bytes);
  auto* from = bench::pixmanImage(format, tile, {size, size}, tilePitch(size, bytes));
  pixman_image_set_repeat(from, PIXMAN_REPEAT_NORMAL);
  c.add("pixman", [=] {
    pixman_image_composite32(PIXMAN_OP_SRC, from, nullptr, to, kTileX, kTileY, 0, 0, 0, 0, w, h);
  });
}
#endif

#ifdef HAVE_QT6
/// A picture with an open painter. The engine sets the top byte of a 4-byte pixel, hence "~x".
struct Canvas {
  Canvas(const QImage& of, const QImage& tile) : picture(of), painter(&picture), brush(tile) {
    painter.setBrushOrigin(-static_cast<int>(kTileX), -static_cast<int>(kTileY));
  }
  QImage picture;
  QPainter painter;
  QBrush brush;
};

void addQt(Contenders& c, uint8* dst, uint8* tile, uint32 bytes, uint32 size, uint32 rop,
           Extent e) {
  const auto format = bytes == 4 ? QImage::Format_RGB32 : QImage::Format_RGB16;
  const auto canvas =
      std::make_shared<Canvas>(bench::qImage(format, dst, e, e.width * bytes),
                               bench::qImage(format, tile, {size, size}, tilePitch(size, bytes)));
  canvas->painter.setCompositionMode(rop == RASTER_ROP_XOR ? QPainter::RasterOp_SourceXorDestination
                                                           : QPainter::CompositionMode_Source);
  c.add("Qt6~x", [=] { canvas->painter.fillRect(canvas->picture.rect(), canvas->brush); });
}
#endif

void tileJob(const std::string& name, uint32 bytes, uint32 size, uint32 rop) {
  bench::job("tile/" + name, [=](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    uint8* tile = bench::buffer(1);
    const uint32 pitch = e.width * bytes;
    c.add("raster", [=] {
      Raster_RectPixmapROPcopy(dst, pitch, tile, tilePitch(size, bytes), static_cast<int32>(bytes),
                               kTileX, kTileY, size, size, rop, 0, 0, e.width, e.height);
    });
    c.add("limit", [=] { memset(dst, 0x5A, size_t{pitch} * e.height); });
#ifdef HAVE_PIXMAN
    if (rop == RASTER_ROP_COPY) addPixman(c, dst, tile, bytes, size, e);
#endif
#ifdef HAVE_QT6
    if (bytes == 4 || (bytes == 2 && rop == RASTER_ROP_COPY))
      addQt(c, dst, tile, bytes, size, rop, e);
#endif
  });
}

}  // namespace

int main(int argc, char** argv) {
  tileJob("32-copy-64x64", 4, 64, RASTER_ROP_COPY);
  tileJob("32-copy-8x8", 4, 8, RASTER_ROP_COPY);
  tileJob("24-copy-16x16", 3, 16, RASTER_ROP_COPY);
  tileJob("16-copy-8x8", 2, 8, RASTER_ROP_COPY);
  tileJob("8-copy-8x8", 1, 8, RASTER_ROP_COPY);
  tileJob("32-xor-64x64", 4, 64, RASTER_ROP_XOR);
  tileJob("32-xor-8x8", 4, 8, RASTER_ROP_XOR);
  tileJob("24-xor-16x16", 3, 16, RASTER_ROP_XOR);
  tileJob("16-xor-8x8", 2, 8, RASTER_ROP_XOR);
  return bench::run(argc, argv);
}
