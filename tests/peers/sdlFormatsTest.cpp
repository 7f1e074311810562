// SPDX-License-Identifier: MIT
//
// SDL's names of our pixel formats.

#include <SDL_pixels.h>

#include <cstring>

#include "formatNames.h"

namespace {

void expectName(int32 code, Uint32 name) {
  // By the format's own tables: SDL's copies widen 5-6-5 to a little less than white.
  SDL_PixelFormat* format = SDL_AllocFormat(name);
  ASSERT_NE(format, nullptr);
  expectReads(code, [format](const uint8* bytes) {
    Uint32 pixel = 0;
    std::memcpy(&pixel, bytes, format->BytesPerPixel);
    Uint8 red = 0, green = 0, blue = 0;
    SDL_GetRGB(pixel, format, &red, &green, &blue);
    return static_cast<uint32>(red << 16 | green << 8 | blue);
  });
  SDL_FreeFormat(format);
}

TEST(SdlFormats, Names) {
  expectName(15, SDL_PIXELFORMAT_XRGB1555);
  expectName(16, SDL_PIXELFORMAT_RGB565);
  expectName(24, SDL_PIXELFORMAT_BGR24);
  expectName(32, SDL_PIXELFORMAT_ARGB8888);
  expectName(32, SDL_PIXELFORMAT_BGRA32);
  expectName(32, SDL_PIXELFORMAT_XRGB8888);
}

}  // namespace
