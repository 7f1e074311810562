// SPDX-License-Identifier: MIT
//
// Reading PNG: a stream in memory or in a file, decoded by libpng into an image record.
//
// Streams in memory are trusted to be whole; files are not, and are read through a callback that
// knows where they end.

#include "imageUtil.h"

#include <cstdlib>
#include <cstring>

#include "fileIO.h"
#include "imageUtilPriv.h"
#include "pngErrors.h"
#include "utilAlloc.h"

namespace raster {
namespace {

constexpr size_t kSignatureBytes = 8;
constexpr uint32 kDecodedPaletteDepth = 8;
constexpr uint32 kDecodedColorDepth = 24;

/// A stream that ends. It begins with what the exported callback expects.
struct BoundedStream {
  ImageUtilReadPngCtx read;
  uint32 size;
};

/// One decoding: what the steps share, and what has to be released however it ends.
struct Reader {
  ImageUtilImage* image;
  bool keepAlpha;
  png_rw_ptr readFn;
  void* stream;
  png_structp png;
  png_infop info;
  png_bytep* rows;
};

/// The pixel format of a decoded image.
struct Format {
  uint32 depth;
  uint32 bpp;
};

void begin(ImageUtilReadPngCtx& stream, const uint8* png, uint32 /*size*/) { stream.start = png; }

void begin(BoundedStream& stream, const uint8* png, uint32 size) {
  stream.read.start = png;
  stream.size = size;
}

void take(ImageUtilReadPngCtx* stream, uint8* dest, size_t length) {
  memcpy(dest, stream->start + stream->consumed, length);
  stream->consumed += static_cast<uint32>(length);
}

void readBounded(png_structp png, png_bytep dest, size_t length) {
  auto* stream = static_cast<BoundedStream*>(png_get_io_ptr(png));
  if (length > stream->size - stream->read.consumed)
    png_error(png, "Read past the end of the file");
  take(&stream->read, dest, length);
}

/// Makes libpng apply the transformations asked for so far, once.
void updateInfo(const Reader& reader) {
  png_set_interlace_handling(reader.png);  // or libpng warns when it meets an interlaced image
  png_read_update_info(reader.png, reader.info);
}

/// Asks libpng for rows that an image record can hold. Deliberate: grey images are not decoded, and
/// 16-bit samples stay 16 bits wide although the format says 8.
bool chooseFormat(const Reader& reader, int colorType, int bitDepth, Format* format) {
  switch (colorType) {
    case PNG_COLOR_TYPE_RGB_ALPHA:
      *format = {kDecodedColorDepth, reader.keepAlpha ? 32u : 24u};
      if (!reader.keepAlpha) {
        png_set_strip_alpha(reader.png);
        updateInfo(reader);
      }
      return true;
    case PNG_COLOR_TYPE_RGB:
      *format = {kDecodedColorDepth, 24};
      return true;
    case PNG_COLOR_TYPE_PALETTE:
      *format = {kDecodedPaletteDepth, 8};
      if (bitDepth < 8) {
        png_set_packing(reader.png);
        updateInfo(reader);
      }
      return true;
    default:
      return false;
  }
}

void copyPalette(const Reader& reader) {
  png_colorp colors = nullptr;
  int count = 0;
  if (png_get_PLTE(reader.png, reader.info, &colors, &count) == 0) return;
  for (int i = 0; i < count; ++i)
    reader.image->palette[i] = {colors[i].blue, colors[i].green, colors[i].red, 0};
  reader.image->numColors = static_cast<uint32>(count);
}

/// Reads what comes before the pixels and fills all fields but `data`.
bool readHeader(const Reader& reader) {
  ImageUtilImage* image = reader.image;
  png_uint_32 width = 0;
  png_uint_32 height = 0;
  int bitDepth = 0;
  int colorType = 0;
  Format format{};
  png_read_info(reader.png, reader.info);
  png_get_IHDR(reader.png, reader.info, &width, &height, &bitDepth, &colorType, nullptr, nullptr,
               nullptr);
  if (!chooseFormat(reader, colorType, bitDepth, &format)) return false;
  if (colorType == PNG_COLOR_TYPE_PALETTE) copyPalette(reader);
  image->width = width;
  image->height = height;
  image->depth = format.depth;
  image->bpp = format.bpp;
  return paddedRowBytes(png_get_rowbytes(reader.png, reader.info), 1, &image->bytesPerLine);
}

/// Allocates the pixels and the pointers to their rows, and touches none of the pixels: a header of
/// a few bytes may promise rows that never come.
bool allocateRows(Reader& reader) {
  ImageUtilImage* image = reader.image;
  size_t dataBytes = 0;
  size_t pointerBytes = 0;
  if (!blockBytes(image->height, image->bytesPerLine, &dataBytes) ||
      !blockBytes(image->height, sizeof *reader.rows, &pointerBytes))
    return false;
  image->data = static_cast<uint8*>(UtilSafeMalloc0(dataBytes));
  reader.rows = static_cast<png_bytep*>(UtilSafeMalloc0(pointerBytes));
  for (size_t y = 0; y < image->height; ++y) reader.rows[y] = image->data + y * image->bytesPerLine;
  return true;
}

/// Reads the rows, every pass of an interlaced image, and zeroes their padding as they arrive.
void readRows(const Reader& reader) {
  const size_t rowBytes = png_get_rowbytes(reader.png, reader.info);
  const size_t padding = reader.image->bytesPerLine - rowBytes;
  for (int pass = png_set_interlace_handling(reader.png); pass > 0; --pass) {
    for (size_t y = 0; y < reader.image->height; ++y) {
      png_read_row(reader.png, reader.rows[y], nullptr);
      memset(reader.rows[y] + rowBytes, 0, padding);
    }
  }
}

bool readImage(Reader& reader) {
  png_set_read_fn(reader.png, reader.stream, reader.readFn);
  if (!readHeader(reader)) return false;
  png_set_bgr(reader.png);
  if (!allocateRows(reader)) return false;
  readRows(reader);
  png_read_end(reader.png, reader.info);
  return true;
}

bool runReader(Reader& reader) {
  reader.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  if (reader.png == nullptr) return false;
  reader.info = png_create_info_struct(reader.png);
  const bool read = reader.info != nullptr && withoutPngError(reader.png, readImage, reader);
  png_destroy_read_struct(&reader.png, &reader.info, nullptr);
  free(reader.rows);
  return read;
}

/// Decodes the stream in `png` with a callback whose context is a `Stream`.
template <class Stream>
bool decode(ImageUtilImage* image, const uint8* png, uint32 size, uint8 readFlags,
            png_rw_ptr readFn) {
  if (png == nullptr || image == nullptr || size == 0) return false;
  memset(image, 0, sizeof *image);
  auto* stream = static_cast<Stream*>(UtilSafeCalloc0(1, sizeof(Stream)));
  begin(*stream, png, size);
  Reader reader{};
  reader.image = image;
  reader.keepAlpha = (readFlags & IMAGE_UTIL_READ_KEEP_ALPHA) != 0;
  reader.readFn = readFn;
  reader.stream = stream;
  const bool isPng = size >= kSignatureBytes && png_sig_cmp(png, 0, kSignatureBytes) == 0;
  const bool read = isPng && runReader(reader);
  free(stream);
  return read;
}

/// Reads the rest of an open file into a new block. Null when that fails or when the file is larger
/// than the decoder can be told.
uint8* readWhole(const FileIODescriptor* file, uint32* size) {
  const int64 fileSize = FileIO_GetSize(file);
  if (fileSize < 0 || fileSize > int64{UINT32_MAX}) return nullptr;
  auto* bytes = static_cast<uint8*>(UtilSafeCalloc0(1, static_cast<size_t>(fileSize)));
  size_t actual = 0;
  if (FileIO_Read(file, bytes, static_cast<size_t>(fileSize), &actual) != FILEIO_SUCCESS) {
    free(bytes);
    return nullptr;
  }
  *size = static_cast<uint32>(actual);
  return bytes;
}

}  // namespace

void freeImageData(ImageUtilImage* image) {
  free(image->data);
  image->data = nullptr;
}

}  // namespace raster

extern "C" {

bool ImageUtil_ReadPNGBuffer(ImageUtilImage* image, const uint8* png, uint32 size,
                             uint8 readFlags) {
  return raster::decode<ImageUtilReadPngCtx>(image, png, size, readFlags, ImageUtilReadPngCallback);
}

bool ImageUtil_ReadPNG(ImageUtilImage* image, const char* pathName, uint8 readFlags) {
  FileIODescriptor file;
  FileIO_Invalidate(&file);
  if (FileIO_Open(&file, pathName, FILEIO_ACCESS_READ, FILEIO_OPEN) != FILEIO_SUCCESS) return false;
  uint32 size = 0;
  uint8* bytes = raster::readWhole(&file, &size);
  FileIO_Close(&file);
  const bool read =
      raster::decode<raster::BoundedStream>(image, bytes, size, readFlags, raster::readBounded);
  free(bytes);
  return read;
}

void ImageUtil_FreeImageData(ImageUtilImage* image) { raster::freeImageData(image); }

// Deliberate: nothing is checked against the end of the stream.
void ImageUtilReadPngCallback(png_structp png, uint8* dest, size_t length) {
  raster::take(static_cast<ImageUtilReadPngCtx*>(png_get_io_ptr(png)), dest, length);
}

}  // extern "C"
