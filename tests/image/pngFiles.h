// SPDX-License-Identifier: MIT
//
// PNG files made and taken apart by libpng itself, for tests of the code that drives it.

#ifndef TESTS_PNG_FILES_H
#define TESTS_PNG_FILES_H

#include <png.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "baseTypes.h"

namespace tests {

using Bytes = std::vector<uint8>;

/// What a PNG file says. `rows` are as the file has them: packed below 8 bits a sample, colours as
/// red, green, blue, 16-bit samples high byte first, no padding.
struct PngPicture {
  uint32 width = 0;
  uint32 height = 0;
  int bitDepth = 8;
  int colorType = PNG_COLOR_TYPE_RGB;
  int interlace = PNG_INTERLACE_NONE;
  std::vector<png_color> palette;
  Bytes rows;
};

/// What else a file may have that does not change its pixels.
struct PngExtras {
  int filters = PNG_ALL_FILTERS;
  int level = 6;
  Bytes paletteAlpha;
  bool texts = false;
  uint32 idatBytes = 0;  // of an IDAT chunk; 0 is libpng's default
};

inline size_t rowBytesOf(const PngPicture& p) {
  const size_t samples = p.colorType == PNG_COLOR_TYPE_RGB          ? 3
                         : p.colorType == PNG_COLOR_TYPE_RGB_ALPHA  ? 4
                         : p.colorType == PNG_COLOR_TYPE_GRAY_ALPHA ? 2
                                                                    : 1;
  return (p.width * samples * static_cast<size_t>(p.bitDepth) + 7) / 8;
}

inline void failOnPngError(png_structp /*png*/, png_const_charp message) {
  fprintf(stderr, "libpng, driven by a test: %s\n", message);
  abort();
}

inline void appendTo(png_structp png, png_bytep data, size_t length) {
  auto* file = static_cast<Bytes*>(png_get_io_ptr(png));
  file->insert(file->end(), data, data + length);
}

inline std::vector<png_bytep> rowPointers(Bytes& rows, size_t rowBytes, uint32 height) {
  std::vector<png_bytep> pointers(height);
  for (size_t y = 0; y < height; ++y) pointers[y] = rows.data() + y * rowBytes;
  return pointers;
}

inline Bytes makePng(const PngPicture& picture, const PngExtras& extras = {}) {
  Bytes file;
  Bytes rows = picture.rows;
  std::vector<png_bytep> pointers = rowPointers(rows, rowBytesOf(picture), picture.height);
  png_structp png =
      png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, failOnPngError, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_write_fn(png, &file, appendTo, nullptr);
  png_set_IHDR(png, info, picture.width, picture.height, picture.bitDepth, picture.colorType,
               picture.interlace, PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
  png_set_filter(png, 0, extras.filters);
  png_set_compression_level(png, extras.level);
  if (extras.idatBytes != 0) png_set_compression_buffer_size(png, extras.idatBytes);
  if (!picture.palette.empty())
    png_set_PLTE(png, info, picture.palette.data(), static_cast<int>(picture.palette.size()));
  if (!extras.paletteAlpha.empty())
    png_set_tRNS(png, info, extras.paletteAlpha.data(),
                 static_cast<int>(extras.paletteAlpha.size()), nullptr);
  if (extras.texts) {
    char key[] = "Comment";
    char words[] = "a picture of a test";
    png_text text{};
    text.compression = PNG_TEXT_COMPRESSION_NONE;
    text.key = key;
    text.text = words;
    png_set_text(png, info, &text, 1);
    png_set_gAMA(png, info, 0.45455);
    png_set_pHYs(png, info, 3000, 3000, PNG_RESOLUTION_METER);
  }
  png_write_info(png, info);
  png_write_image(png, pointers.data());
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  return file;
}

struct ReadPosition {
  const Bytes* file;
  size_t at;
};

inline void takeFrom(png_structp png, png_bytep data, size_t length) {
  auto* position = static_cast<ReadPosition*>(png_get_io_ptr(png));
  if (length > position->file->size() - position->at) png_error(png, "file too short");
  memcpy(data, position->file->data() + position->at, length);
  position->at += length;
}

inline PngPicture readPng(const Bytes& file) {
  PngPicture picture;
  ReadPosition position{&file, 0};
  png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, failOnPngError, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_read_fn(png, &position, takeFrom);
  png_read_info(png, info);
  png_get_IHDR(png, info, &picture.width, &picture.height, &picture.bitDepth, &picture.colorType,
               &picture.interlace, nullptr, nullptr);
  png_colorp palette = nullptr;
  int colors = 0;
  if (png_get_PLTE(png, info, &palette, &colors) != 0)
    picture.palette.assign(palette, palette + colors);
  picture.rows.resize(picture.height * png_get_rowbytes(png, info));
  std::vector<png_bytep> pointers =
      rowPointers(picture.rows, png_get_rowbytes(png, info), picture.height);
  png_read_image(png, pointers.data());
  png_read_end(png, info);
  png_destroy_read_struct(&png, &info, nullptr);
  return picture;
}

struct PngChunk {
  std::string name;
  size_t offset;  // of its data
  size_t length;
};

inline std::vector<PngChunk> chunksOf(const Bytes& file) {
  std::vector<PngChunk> chunks;
  for (size_t at = 8; at + 12 <= file.size();) {
    const size_t length = size_t{file[at]} << 24 | size_t{file[at + 1]} << 16 |
                          size_t{file[at + 2]} << 8 | size_t{file[at + 3]};
    chunks.push_back({std::string(file.begin() + static_cast<ptrdiff_t>(at) + 4,
                                  file.begin() + static_cast<ptrdiff_t>(at) + 8),
                      at + 8, length});
    at += length + 12;
  }
  return chunks;
}

/// The names of the chunks, several IDAT in a row as one.
inline std::string chunkNames(const Bytes& file) {
  std::string names;
  for (const PngChunk& chunk : chunksOf(file)) {
    if (chunk.name == "IDAT" && names.ends_with("IDAT ")) continue;
    names += chunk.name + " ";
  }
  return names;
}

}  // namespace tests

#endif
