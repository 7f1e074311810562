// SPDX-License-Identifier: MIT
//
// Writing PNG, row by row and without a word of libpng.

#include "checkedMemory.h"
#include "checkedPng.h"
#include "checkedView.h"
#include "dynBuf.h"

namespace raster::checked {
namespace {

constexpr uint32 kMaxColors = 256;
constexpr uint32 kMaxSide = 1000000;  // libpng's own limit
constexpr int kSampleBits = 8;
constexpr uint32 kMaxLevel = 9;

/// One encoding: what the steps share, and what has to be released however it ends.
struct Writer {
  PngUse use;
  const ImageUtilImage* image;
  RasterView view;
  ImageUtilPNGWriteParams params;
  DynBuf out;
  png_structp png;
  png_infop info;
  uint8* row;  ///< for rows that are converted
};

bool isIndexed(const Writer& writer) { return writer.view.bpp == 8; }
bool isConverted(const Writer& writer) { return writer.view.bpp == 16; }

RasterStatus checkImage(const ImageUtilImage* image, size_t bytes, RasterView* view) {
  const RasterStatus status = RasterChecked_ImageView(image, bytes, view);
  if (status != RASTER_STATUS_OK) return status;
  if (view->width == 0 || view->height == 0) return RASTER_STATUS_BAD_ARGUMENT;
  if (view->width > kMaxSide || view->height > kMaxSide) return RASTER_STATUS_TOO_BIG;
  if (view->bpp == 8 && (image->numColors == 0 || image->numColors > kMaxColors))
    return RASTER_STATUS_BAD_ARGUMENT;
  return RASTER_STATUS_OK;
}

void appendBytes(png_structp png, png_bytep bytes, size_t length) {
  auto* writer = static_cast<Writer*>(png_get_io_ptr(png));
  if (DynBuf_Append(&writer->out, bytes, length)) return;
  writer->use.failure = RASTER_STATUS_NO_MEMORY;
  png_error(png, "Out of memory");
}

int colorTypeOf(const Writer& writer) {
  if (isIndexed(writer)) return PNG_COLOR_TYPE_PALETTE;
  const bool withAlpha = writer.view.bpp == 32 && !writer.params.stripAlpha;
  return withAlpha ? PNG_COLOR_TYPE_RGB_ALPHA : PNG_COLOR_TYPE_RGB;
}

void writeHeader(const Writer& writer) {
  png_set_IHDR(writer.png, writer.info, writer.view.width, writer.view.height, kSampleBits,
               colorTypeOf(writer), PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_DEFAULT,
               PNG_FILTER_TYPE_DEFAULT);
  if (static_cast<uint32>(writer.params.compressionLevel) <= kMaxLevel)
    png_set_compression_level(writer.png, writer.params.compressionLevel);
  png_set_bgr(writer.png);
  if (isIndexed(writer)) {
    png_color colors[kMaxColors];
    for (uint32 i = 0; i < writer.image->numColors; ++i) {
      const ImageUtilColor& color = writer.image->palette[i];
      colors[i] = {color.red, color.green, color.blue};
    }
    png_set_PLTE(writer.png, writer.info, colors, static_cast<int>(writer.image->numColors));
  }
  png_write_info(writer.png, writer.info);
  if (writer.view.bpp == 32 && writer.params.stripAlpha)
    png_set_filler(writer.png, 0, PNG_FILLER_AFTER);
}

/// The picture's row `y`, from the top, in a format that PNG has.
const uint8* rowOf(const Writer& writer, uint32 y) {
  const RasterView& view = writer.view;
  const bool bottomUp = (writer.image->flags & IMAGE_FLAG_BOTTOM_UP) != 0;
  const uint32 row = bottomUp ? view.height - 1 - y : y;
  const uint8* const pixels = view.data + size_t{row} * view.pitch;
  if (!isConverted(writer)) return pixels;
  Raster_ConvertPixels(writer.row, 3 * view.width, 24, pixels, view.pitch, codeOf(view), false,
                       nullptr, 0, 0, 0, 0, view.width, 1);
  return writer.row;
}

/// Whether there were pixels beyond the palette, for which libpng has an eye.
bool hasStrayIndices(const Writer& writer) {
  return isIndexed(writer) &&
         png_get_palette_max(writer.png, writer.info) >= static_cast<int>(writer.image->numColors);
}

bool writeImage(Writer& writer) {
  png_set_write_fn(writer.png, &writer, appendBytes, nullptr);
  writeHeader(writer);
  for (uint32 y = 0; y < writer.view.height; ++y) png_write_row(writer.png, rowOf(writer, y));
  if (hasStrayIndices(writer)) {
    writer.use.failure = RASTER_STATUS_BAD_ARGUMENT;
    return false;
  }
  png_write_end(writer.png, writer.info);
  return true;
}

RasterStatus encode(Writer& writer) {
  writer.png = createPngWriter(&writer.use);
  const RasterStatus status = runPng(writer, writeImage, png_destroy_write_struct);
  if (status != RASTER_STATUS_OK) DynBuf_Destroy(&writer.out);
  return status;
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_EncodePng(const ImageUtilImage* image, size_t bytes,
                                     const ImageUtilPNGWriteParams* params, uint8** file,
                                     size_t* fileBytes) {
  using namespace raster::checked;
  if (file == nullptr || fileBytes == nullptr) return RASTER_STATUS_NULL;
  Writer writer = {};
  RasterStatus status = checkImage(image, bytes, &writer.view);
  if (status != RASTER_STATUS_OK) return status;
  const OwnedBytes row(
      isConverted(writer) ? OwnedBytes::ofSize(uint64{3} * writer.view.width).release() : nullptr);
  if (isConverted(writer) && !row) return RASTER_STATUS_NO_MEMORY;
  writer.use.failure = RASTER_STATUS_NO_MEMORY;
  writer.image = image;
  writer.params = params != nullptr ? *params : ImageUtilPNGWriteParams{-1, true};
  writer.row = row.get();
  DynBuf_Init(&writer.out);
  status = encode(writer);
  if (status != RASTER_STATUS_OK) return status;
  *file = writer.out.data;
  *fileBytes = writer.out.size;
  return RASTER_STATUS_OK;
}

}  // extern "C"
