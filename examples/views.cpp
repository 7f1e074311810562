// SPDX-License-Identifier: MIT
//
// The library from C++: views of frame buffers that clip. usage: views PICTURE.png

#include <imageUtil.h>

#include <cstdio>
#include <raster.hpp>
#include <vector>

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s PICTURE.png\n", argv[0]);
    return 2;
  }
  std::vector<uint8> memory(320 * 200 * 4);
  const raster::FrameView screen(memory.data(), 320, 200, raster::Format::k8888);

  fill(screen, screen.bounds(), 0xFF204060);
  for (int32 i = 0; i < 12; ++i)  // the last ones lie partly outside
    fill(screen, raster::area(40 * i - 60, 20 * i - 30, 90, 60),
         0xFFE0A030 + 0x100000U * uint32(i % 2));
  copy(screen, {200, -20}, screen, raster::area(0, 0, 90, 60), raster::Rop::kXor);

  ImageUtilImage image = {};
  image.width = screen.width();
  image.height = screen.height();
  image.depth = 24;
  image.bpp = 32;
  image.bytesPerLine = screen.pitch();
  image.data = screen.pixels();
  return ImageUtil_WriteImage(&image, argv[1], IMAGE_UTIL_TYPE_PNG) ? 0 : 1;
}
