// SPDX-License-Identifier: MIT
//
// Reading PNG streams that may be anything, with memory that grows with the rows.

#include <cstring>

#include "checkedMemory.h"
#include "checkedPng.h"
#include "checkedPngChunks.h"
#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr uint32 kAllFlags =
    RASTER_CHECKED_KEEP_ALPHA | RASTER_CHECKED_EXPAND_GREY | RASTER_CHECKED_REDUCE_16;
constexpr size_t kFirstGrowth = size_t{1} << 18;

/// One decoding: what the steps share, and what has to be released however it ends.
struct Reader {
  PngUse use;
  const uint8* bytes;
  size_t size;
  size_t at;
  RasterPngInfo header;
  png_structp png;
  png_infop info;
  ImageUtilImage* image;
  size_t capacity;  ///< bytes of the image's data
};

bool isGrey(const RasterPngInfo& header) {
  return header.colorType == kGrey || header.colorType == kGreyAlpha;
}
bool hasAlpha(const RasterPngInfo& header) {
  return header.colorType == kGreyAlpha || header.colorType == kRgba;
}

// ---- Before libpng -----------------------------------------------------------------------------

/// Fills the format and the size of the image, if the flags and limits let it be read.
RasterStatus describe(const RasterPngInfo& header, uint32 flags, const RasterLimits& limits,
                      ImageUtilImage* image) {
  if (header.width > limits.width || header.height > limits.height) return RASTER_STATUS_LIMIT;
  if ((isGrey(header) && (flags & RASTER_CHECKED_EXPAND_GREY) == 0) ||
      (header.bitDepth == 16 && (flags & RASTER_CHECKED_REDUCE_16) == 0))
    return RASTER_STATUS_UNSUPPORTED;
  const bool palette = header.colorType == kPalette;
  const bool withAlpha = hasAlpha(header) && (flags & RASTER_CHECKED_KEEP_ALPHA) != 0;
  image->width = header.width;
  image->height = header.height;
  image->depth = palette ? 8 : 24;
  image->bpp = withAlpha ? 32 : image->depth;
  const uint64 pitch = (rowBytes(image->width, image->bpp) + 3) & ~uint64{3};
  uint64 bytes = 0;
  if (pitch > INT32_MAX || __builtin_mul_overflow(pitch, uint64{image->height}, &bytes) ||
      bytes > std::min<uint64>(limits.pixelBytes, PTRDIFF_MAX))
    return RASTER_STATUS_LIMIT;
  image->bytesPerLine = static_cast<uint32>(pitch);
  return RASTER_STATUS_OK;
}

// ---- libpng ------------------------------------------------------------------------------------

void readBytes(png_structp png, png_bytep dest, size_t length) {
  auto* reader = static_cast<Reader*>(png_get_io_ptr(png));
  if (length > reader->size - reader->at) {
    reader->use.failure = RASTER_STATUS_TRUNCATED;
    png_error(png, "The stream ends too early");
  }
  memcpy(dest, reader->bytes + reader->at, length);
  reader->at += length;
}

void chooseTransforms(const Reader& reader) {
  const RasterPngInfo& header = reader.header;
  if (header.colorType == kPalette && header.bitDepth < 8) png_set_packing(reader.png);
  if (header.bitDepth == 16) png_set_strip_16(reader.png);
  if (isGrey(header)) png_set_gray_to_rgb(reader.png);
  if (hasAlpha(header) && reader.image->bpp == 24) png_set_strip_alpha(reader.png);
  png_set_bgr(reader.png);
}

void takePalette(const Reader& reader) {
  png_colorp colors = nullptr;
  int count = 0;
  if (png_get_PLTE(reader.png, reader.info, &colors, &count) == 0) return;
  for (int i = 0; i < count; ++i)
    reader.image->palette[i] = {colors[i].blue, colors[i].green, colors[i].red, 0};
  reader.image->numColors = static_cast<uint32>(count);
}

[[noreturn]] void failForMemory(Reader& reader) {
  reader.use.failure = RASTER_STATUS_NO_MEMORY;
  png_error(reader.png, "Out of memory");
}

/// Makes room for one more row behind `used` bytes, and for as many again.
void growFor(Reader& reader, size_t used) {
  const size_t whole = size_t{reader.image->bytesPerLine} * reader.image->height;
  const size_t wanted = used + reader.image->bytesPerLine;
  if (wanted <= reader.capacity) return;
  const size_t capacity = std::min(whole, std::max({wanted, 2 * used, kFirstGrowth}));
  auto* grown = static_cast<uint8*>(realloc(reader.image->data, capacity));
  if (grown == nullptr) failForMemory(reader);
  reader.image->data = grown;
  reader.capacity = capacity;
}

void readRowsInOrder(Reader& reader) {
  const ImageUtilImage& image = *reader.image;
  const size_t rowBytes = png_get_rowbytes(reader.png, reader.info);
  for (size_t y = 0; y < image.height; ++y) {
    const size_t offset = y * image.bytesPerLine;
    growFor(reader, offset);
    png_read_row(reader.png, image.data + offset, nullptr);
    memset(image.data + offset + rowBytes, 0, image.bytesPerLine - rowBytes);
  }
}

void readInterlacedRows(Reader& reader, int passes) {
  ImageUtilImage& image = *reader.image;
  image.data = static_cast<uint8*>(calloc(image.height, image.bytesPerLine));
  if (image.data == nullptr) failForMemory(reader);
  for (int pass = 0; pass < passes; ++pass)
    for (size_t y = 0; y < image.height; ++y)
      png_read_row(reader.png, image.data + y * image.bytesPerLine, nullptr);
}

bool readImage(Reader& reader) {
  png_set_read_fn(reader.png, &reader, readBytes);
  png_set_user_limits(reader.png, reader.header.width, reader.header.height);
  // Chunks that make no pixels are passed over, whatever they would unpack to.
  png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_NEVER, nullptr, -1);
  png_read_info(reader.png, reader.info);
  if (reader.header.colorType == kPalette) takePalette(reader);
  chooseTransforms(reader);
  const int passes = png_set_interlace_handling(reader.png);
  png_read_update_info(reader.png, reader.info);
  if (png_get_rowbytes(reader.png, reader.info) != rowBytes(reader.image->width, reader.image->bpp))
    png_error(reader.png, "Rows of an unexpected length");
  if (passes == 1) {
    readRowsInOrder(reader);
  } else {
    readInterlacedRows(reader, passes);
  }
  png_read_end(reader.png, reader.info);  // with null it takes unknown critical chunks
  return true;
}

RasterStatus decode(Reader& reader) {
  reader.png = createPngReader(&reader.use);
  const RasterStatus status = runPng(reader, readImage, [](png_structpp png, png_infopp info) {
    png_destroy_read_struct(png, info, nullptr);
  });
  if (status != RASTER_STATUS_OK) free(reader.image->data);
  return status;
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_ReadPngBuffer(const uint8* png, size_t size, uint32 flags,
                                         const RasterLimits* limits, ImageUtilImage* image,
                                         char* message, size_t messageBytes) {
  using namespace raster::checked;
  Reader reader = {};
  reader.use = {RASTER_STATUS_DAMAGED, message, messageBytes};
  setMessage(reader.use, "");
  if (image == nullptr) return RASTER_STATUS_NULL;
  if ((flags & ~kAllFlags) != 0) return RASTER_STATUS_BAD_ARGUMENT;
  const RasterLimits within = limitsOf(limits);
  if (size > within.inputBytes) return RASTER_STATUS_LIMIT;
  ImageUtilImage made = {};
  RasterStatus status = RasterChecked_PngInfo(png, size, &reader.header);
  if (status == RASTER_STATUS_OK) status = describe(reader.header, flags, within, &made);
  if (status == RASTER_STATUS_OK) status = checkChunks(png, size, reader.header, within);
  if (status != RASTER_STATUS_OK) return status;
  reader.bytes = png;
  reader.size = size;
  reader.image = &made;
  status = decode(reader);
  if (status == RASTER_STATUS_OK) *image = made;
  return status;
}

RasterStatus RasterChecked_ReadPng(const char* path, uint32 flags, const RasterLimits* limits,
                                   ImageUtilImage* image, char* message, size_t messageBytes) {
  using namespace raster::checked;
  setMessage({RASTER_STATUS_OK, message, messageBytes}, "");
  uint8* bytes = nullptr;
  size_t size = 0;
  const RasterStatus status = RasterChecked_ReadFile(path, limits, &bytes, &size);
  if (status != RASTER_STATUS_OK) return status;
  const OwnedBytes file(bytes);
  return RasterChecked_ReadPngBuffer(bytes, size, flags, limits, image, message, messageBytes);
}

}  // extern "C"
