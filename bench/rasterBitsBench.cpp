// SPDX-License-Identifier: MIT
//
// Bit-plane expansion against memset and the public libraries that draw 1-bit pictures.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr uint32 kForeground = 0x5A3C21F7;
constexpr uint32 kBackground = 0x00C0FFEE;

/// The bytes of a row of bits; a multiple of 4, as the peers want it.
uint32 bitsPitch(Extent e) { return (e.width + 31) / 32 * 4; }

#ifdef HAVE_SDL2
void addSdl(Contenders& c, uint8* bits, uint8* dst, uint32 bytes, Extent e, bool stencil) {
  SDL_Surface* from = bench::surface(SDL_PIXELFORMAT_INDEX1MSB, bits, e, bitsPitch(e));
  SDL_Surface* to = bench::surface(bench::kSdlFormats[bytes], dst, e, e.width * bytes);
  const SDL_Color colors[] = {{0xC0, 0xFF, 0xEE, 255}, {0x3C, 0x21, 0xF7, 255}};
  SDL_SetPaletteColors(from->format->palette, colors, 0, 2);
  if (bytes == 1) SDL_SetPaletteColors(to->format->palette, colors, 0, 2);
  if (stencil) SDL_SetColorKey(from, SDL_TRUE, 0);
  c.add("SDL2", [=] { SDL_BlitSurface(from, nullptr, to, nullptr); });
}
#endif

#ifdef HAVE_PIXMAN
/// pixman takes the bits of a byte from the least significant one up.
void addPixman(Contenders& c, uint8* bits, uint8* dst, uint32 bytes, Extent e) {
  const int w = static_cast<int>(e.width);
  const int h = static_cast<int>(e.height);
  auto* mask = bench::pixmanImage(PIXMAN_a1, bits, e, bitsPitch(e));
  auto* to = bench::pixmanImage(bench::kPixmanFormats[bytes], dst, e, e.width * bytes);
  const pixman_color_t color = {0x3C3C, 0x2121, 0xF7F7, 0xFFFF};
  auto* solid = pixman_image_create_solid_fill(&color);
  c.add("pixman~lsb",
        [=] { pixman_image_composite32(PIXMAN_OP_OVER, solid, mask, to, 0, 0, 0, 0, 0, 0, w, h); });
}
#endif

void bitsJob(uint32 bytes, bool stencil) {
  const std::string name = (stencil ? "bits/stencil" : "bits/") + std::to_string(8 * bytes);
  bench::job(name, [=](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    uint8* bits = bench::buffer(1);
    const uint32 pitch = e.width * bytes;
    const auto size = static_cast<int32>(bytes);
    const auto w = static_cast<int32>(e.width);
    const auto h = static_cast<int32>(e.height);
    c.add("raster", [=] {
      if (stencil) {
        Raster_BitsToPixelsStencil(bits, bitsPitch(e), dst, pitch, size, w, h, kForeground);
      } else {
        Raster_BitsToPixels(bits, bitsPitch(e), dst, pitch, size, w, h, kForeground, kBackground);
      }
    });
    c.add("limit", [=] { memset(dst, 0x5A, size_t{pitch} * e.height); });
#ifdef HAVE_SDL2
    addSdl(c, bits, dst, bytes, e, stencil);
#endif
#ifdef HAVE_PIXMAN
    if (stencil) addPixman(c, bits, dst, bytes, e);
#endif
  });
}

}  // namespace

int main(int argc, char** argv) {
  for (const bool stencil : {false, true}) {
    for (const uint32 bytes : {4u, 3u, 2u, 1u}) bitsJob(bytes, stencil);
  }
  return bench::run(argc, argv);
}
