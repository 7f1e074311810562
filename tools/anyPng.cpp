// SPDX-License-Identifier: MIT
//
// libpng's simplified interface would do, but for 16-bit samples of interlaced files, which it gets
// wrong (1.6.39), and for its colour management.

#include "anyPng.h"

#include <png.h>

#include <algorithm>
#include <csetjmp>
#include <cstring>

#include "failure.h"

namespace tool {
namespace {

/// A decoding under way. What libpng leaves by a long jump owns nothing but this.
struct Decoding {
  const std::vector<uint8>& bytes;
  size_t at = 0;
  char message[128] = {};
  png_structp png = nullptr;
  png_infop info = nullptr;

  explicit Decoding(const std::vector<uint8>& from) : bytes(from) {}
  ~Decoding() { png_destroy_read_struct(&png, &info, nullptr); }
  Decoding(const Decoding&) = delete;
  Decoding& operator=(const Decoding&) = delete;
};

void keepError(png_structp png, png_const_charp message) {
  auto& decoding = *static_cast<Decoding*>(png_get_error_ptr(png));
  strncpy(decoding.message, message, sizeof decoding.message - 1);
  png_longjmp(png, 1);
}

void ignoreWarning(png_structp /*png*/, png_const_charp /*message*/) {}

void readBytes(png_structp png, png_bytep to, size_t size) {
  auto& decoding = *static_cast<Decoding*>(png_get_io_ptr(png));
  if (size > decoding.bytes.size() - decoding.at) png_error(png, "Read past the end of the file");
  std::copy_n(decoding.bytes.data() + decoding.at, size, to);
  decoding.at += size;
}

bool start(Decoding& decoding) {
  decoding.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, &decoding, keepError, ignoreWarning);
  if (decoding.png != nullptr) decoding.info = png_create_info_struct(decoding.png);
  return decoding.info != nullptr;
}

/// Asks for four bytes a pixel: blue, green, red, alpha.
void askForColors(png_structp png) {
  png_set_expand(png);
  png_set_scale_16(png);
  png_set_gray_to_rgb(png);
  png_set_bgr(png);
  png_set_add_alpha(png, 0xFF, PNG_FILLER_AFTER);
  png_set_interlace_handling(png);
}

bool decodeRows(Decoding& decoding, png_bytep* rows) {
  if (setjmp(png_jmpbuf(decoding.png)) != 0) return false;  // NOLINT(cert-err52-cpp)
  png_set_read_fn(decoding.png, &decoding, readBytes);
  png_read_info(decoding.png, decoding.info);
  askForColors(decoding.png);
  png_read_update_info(decoding.png, decoding.info);
  png_read_image(decoding.png, rows);
  png_read_end(decoding.png, nullptr);
  return true;
}

}  // namespace

Picture decodeAnyPng(const PngFile& png, const std::string& name) {
  Picture picture(png.width, png.height, 32);
  std::vector<png_bytep> rows(png.height);
  for (size_t y = 0; y < rows.size(); ++y) rows[y] = picture.data() + picture.pitch() * y;
  Decoding decoding(png.bytes);
  if (!start(decoding) || !decodeRows(decoding, rows.data()))
    throw Failure("cannot read the picture " + name + " (" + decoding.message + ")");
  return picture;
}

}  // namespace tool
