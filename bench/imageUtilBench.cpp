// SPDX-License-Identifier: MIT
//
// Image files against libpng driven directly with the same settings, and other libraries. The limit
// is a memcpy of as many bytes as are read and written.

#include <png.h>
#include <sys/mman.h>

#include <cstdlib>
#include <cstring>

#include "imageUtil.h"
#include "raster.h"
#include "support/desktop.h"
#include "support/jobs.h"
#include "support/peers.h"

#ifdef HAVE_SPNG
#include <spng.h>
#endif

namespace {

using bench::Contenders;
using bench::Extent;

/// Memory of its own, so that what the contenders allocate and release finds the heap as a program
/// without pictures in it would have it.
uint8* pages(size_t bytes) {
  void* memory = mmap(nullptr, bytes, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (memory == MAP_FAILED) abort();
  return static_cast<uint8*>(memory);
}

/// An image of the desktop in one of the pixel formats.
ImageUtilImage desktop(Extent e, uint32 depth, uint32 bpp) {
  uint8* drawing = bench::buffer(2);
  bench::Desktop(bench::words(drawing), e);
  ImageUtilImage image{};
  image.width = e.width;
  image.height = e.height;
  image.depth = depth;
  image.bpp = bpp;
  image.bytesPerLine = (e.width * (bpp / 8) + 3) & ~3u;
  image.data = pages(size_t{e.height} * image.bytesPerLine);
  const auto code = static_cast<int32>(Raster_GetBPPDepth(depth, bpp));
  Raster_ConvertPixels(image.data, image.bytesPerLine, code, drawing, e.width * 4, 32, false,
                       nullptr, 0, 0, 0, 0, e.width, e.height);
  if (bpp == 8) {
    image.numColors = 256;
    for (uint32 i = 0; i < 256; ++i)
      image.palette[i] = {static_cast<uint8>(i & 0xC0), static_cast<uint8>(i << 2 & 0xE0),
                          static_cast<uint8>(i << 5), 0};
  }
  return image;
}

/// Adds the limit: a memcpy of half of all bytes that a pixel costs, to and from.
void addLimit(Contenders& c, Extent e, double bytesPerPixel) {
  const auto bytes = static_cast<size_t>(e.pixels() * bytesPerPixel / 2);
  c.add("limit", [=] { memcpy(bench::buffer(0), bench::buffer(1), bytes); });
}

void append(png_structp png, png_bytep data, size_t length) {
  if (!DynBuf_Append(static_cast<DynBuf*>(png_get_io_ptr(png)), data, length))
    png_error(png, "no memory");
}

/// What ImageUtil_ConstructPNGBuffer asks of libpng, and nothing else.
void encodeDirectly(const ImageUtilImage& image, int level) {
  DynBuf out;
  DynBuf_Init(&out);
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  if (setjmp(png_jmpbuf(png)) != 0) abort();
  png_set_write_fn(png, &out, append, nullptr);
  png_set_IHDR(png, info, image.width, image.height, 8, image.bpp == 8 ? 3 : 2, 0, 0, 0);
  if (level >= 0) png_set_compression_level(png, level);
  png_set_bgr(png);
  if (image.bpp == 8) {
    png_color colors[256];
    for (int i = 0; i < 256; ++i)
      colors[i] = {image.palette[i].red, image.palette[i].green, image.palette[i].blue};
    png_set_PLTE(png, info, colors, 256);
  }
  png_write_info(png, info);
  if (image.bpp == 32) png_set_filler(png, 0, PNG_FILLER_AFTER);
  for (uint32 y = 0; y < image.height; ++y)
    png_write_row(png, image.data + size_t{y} * image.bytesPerLine);
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  DynBuf_Destroy(&out);
}

struct Position {
  const uint8* at;
};

void take(png_structp png, png_bytep data, size_t length) {
  auto* position = static_cast<Position*>(png_get_io_ptr(png));
  memcpy(data, position->at, length);
  position->at += length;
}

void decodeDirectly(const DynBuf& file) {
  Position position = {file.data};
  png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  if (setjmp(png_jmpbuf(png)) != 0) abort();
  png_set_read_fn(png, &position, take);
  png_read_info(png, info);
  png_set_bgr(png);
  const uint32 height = png_get_image_height(png, info);
  const size_t rowBytes = png_get_rowbytes(png, info);
  auto* pixels = static_cast<uint8*>(malloc(height * rowBytes));
  for (uint32 y = 0; y < height; ++y) png_read_row(png, pixels + y * rowBytes, nullptr);
  png_read_end(png, info);
  png_destroy_read_struct(&png, &info, nullptr);
  free(pixels);
}

#ifdef HAVE_SPNG
void decodeBySpng(const DynBuf& file, int format) {
  spng_ctx* spng = spng_ctx_new(0);
  size_t bytes = 0;
  spng_set_png_buffer(spng, file.data, file.size);
  spng_decoded_image_size(spng, format, &bytes);
  void* pixels = malloc(bytes);
  spng_decode_image(spng, pixels, bytes, format, 0);
  spng_ctx_free(spng);
  free(pixels);
}

void encodeBySpng(const ImageUtilImage& image) {
  spng_ctx* spng = spng_ctx_new(SPNG_CTX_ENCODER);
  spng_set_option(spng, SPNG_ENCODE_TO_BUFFER, 1);
  spng_ihdr header{};
  header.width = image.width;
  header.height = image.height;
  header.bit_depth = 8;
  header.color_type = SPNG_COLOR_TYPE_TRUECOLOR;
  spng_set_ihdr(spng, &header);
  spng_encode_image(spng, image.data, size_t{image.height} * image.width * 3, SPNG_FMT_PNG,
                    SPNG_ENCODE_FINALIZE);
  size_t size = 0;
  int error = 0;
  free(spng_get_png_buffer(spng, &size, &error));
  spng_ctx_free(spng);
}
#endif

void encodePngJob(const std::string& name, uint32 depth, uint32 bpp, int level = -1) {
  bench::job("png/encode-" + name, bench::kFileExtents, [=](Contenders& c, Extent e) {
    const ImageUtilImage image = desktop(e, depth, bpp);
    const ImageUtilPNGWriteParams params = {level, true};
    c.add("raster", [=] {
      DynBuf out;
      if (!ImageUtil_ConstructPNGBuffer(&image, &params, &out)) abort();
      DynBuf_Destroy(&out);
    });
    addLimit(c, e, bpp / 8 + (bpp == 8 ? 1 : 3));
    if (bpp != 16) {
      c.add("libpng", [=] { encodeDirectly(image, level); });
    } else {
      // The same colours, already converted.
      ImageUtilImage converted = desktop(e, 24, 24);
      Raster_ConvertPixels(converted.data, converted.bytesPerLine, 24, image.data,
                           image.bytesPerLine, static_cast<int32>(depth), false, nullptr, 0, 0, 0,
                           0, e.width, e.height);
      c.add("libpng of 24", [=] { encodeDirectly(converted, level); });
    }
#ifdef HAVE_SPNG
    if (bpp == 24 && level < 0) c.add("spng~rgb", [=] { encodeBySpng(image); });
#endif
  });
}

void decodePngJob(const std::string& name, bool alpha) {
  bench::job("png/decode-" + name, bench::kFileExtents, [=](Contenders& c, Extent e) {
    const ImageUtilImage image = desktop(e, 24, alpha ? 32 : 24);
    const ImageUtilPNGWriteParams params = {-1, !alpha};
    DynBuf file;
    if (!ImageUtil_ConstructPNGBuffer(&image, &params, &file)) abort();
    c.add("raster", [=] {
      ImageUtilImage decoded;
      if (!ImageUtil_ReadPNGBuffer(&decoded, file.data, static_cast<uint32>(file.size),
                                   IMAGE_UTIL_READ_KEEP_ALPHA))
        abort();
      ImageUtil_FreeImageData(&decoded);
    });
    addLimit(c, e, alpha ? 8 : 6);
    c.add("libpng", [=] { decodeDirectly(file); });
#ifdef HAVE_SPNG
    c.add("spng~rgb", [=] { decodeBySpng(file, alpha ? SPNG_FMT_RGBA8 : SPNG_FMT_RGB8); });
#endif
  });
}

void encodeBmpJob(const std::string& name, uint32 depth, uint32 bpp) {
  bench::job("bmp/encode-" + name, bench::kFileExtents, [=](Contenders& c, Extent e) {
    const ImageUtilImage image = desktop(e, depth, bpp);
    c.add("raster", [=] {
      DynBuf out;
      if (!ImageUtil_ConstructBMPBuffer(&image, &out)) abort();
      DynBuf_Destroy(&out);
    });
    addLimit(c, e, bpp / 8 + 3);
#ifdef HAVE_SDL2
    SDL_Surface* surface =
        bench::surface(bench::kSdlFormats[bpp / 8], image.data, e, image.bytesPerLine);
    c.add("SDL2", [=] {
      SDL_RWops* file = SDL_RWFromMem(bench::buffer(0), bench::kBufferBytes);
      if (SDL_SaveBMP_RW(surface, file, 1) != 0) abort();
    });
#endif
  });
}

}  // namespace

int main(int argc, char** argv) {
  encodePngJob("32", 24, 32);
  encodePngJob("32-level1", 24, 32, 1);
  encodePngJob("32-level0", 24, 32, 0);
  encodePngJob("24", 24, 24);
  encodePngJob("16", 16, 16);
  encodePngJob("8pal", 8, 8);
  decodePngJob("24", false);
  decodePngJob("32", true);
  encodeBmpJob("32", 24, 32);
  encodeBmpJob("24", 24, 24);
  encodeBmpJob("16", 16, 16);
  return bench::run(argc, argv);
}
