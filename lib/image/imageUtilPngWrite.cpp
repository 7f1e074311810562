// SPDX-License-Identifier: MIT
//
// Writing PNG: an image record encoded by libpng, appended to a DynBuf or to a buffer that grows
// through the caller's memory operations.

#include "imageUtil.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "imageUtilPriv.h"
#include "pngErrors.h"
#include "raster.h"

namespace raster {
namespace {

constexpr int32 kDefaultCompressionLevel = -1;
constexpr uint32 kMaxCompressionLevel = 9;
constexpr int kSampleBits = 8;
constexpr int32 kCopyDepth = 24;  // of the copy that formats unknown to PNG are written from

/// One encoding: what the steps share, and what has to be released however it ends.
struct Writer {
  const ImageUtilImage* image;
  int32 compressionLevel;
  bool stripAlpha;
  void* ioPtr;
  png_rw_ptr writeFn;
  const ImageUtilMemOps* memops;
  png_structp png;
  png_infop info;
  png_bytep* rows;
  uint8* copy;
};

/// Rows to be written, in the order of memory.
struct SourceRows {
  const uint8* pixels;
  size_t pitch;
};

void writeHeader(const Writer& writer) {
  const ImageUtilImage& image = *writer.image;
  const bool withAlpha = image.bpp == 32 && !writer.stripAlpha;
  const int rgb = withAlpha ? PNG_COLOR_TYPE_RGB_ALPHA : PNG_COLOR_TYPE_RGB;
  png_set_IHDR(writer.png, writer.info, image.width, image.height, kSampleBits,
               isPaletteImage(image) ? PNG_COLOR_TYPE_PALETTE : rgb, PNG_INTERLACE_NONE,
               PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
  if (static_cast<uint32>(writer.compressionLevel) <= kMaxCompressionLevel)
    png_set_compression_level(writer.png, writer.compressionLevel);
  png_set_bgr(writer.png);
}

void writePalette(const Writer& writer) {
  const ImageUtilImage& image = *writer.image;
  png_color colors[PNG_MAX_PALETTE_LENGTH];
  std::transform(image.palette, image.palette + image.numColors, colors,
                 [](const ImageUtilColor& c) {
                   return png_color{c.red, c.green, c.blue};
                 });
  png_set_PLTE(writer.png, writer.info, colors, static_cast<int>(image.numColors));
}

/// Converts the whole image to blue, green, red bytes. False when there is no memory for that.
bool convertToCopy(Writer& writer, SourceRows* source) {
  const ImageUtilImage& image = *writer.image;
  uint32 pitch = 0;
  size_t bytes = 0;
  if (!paddedRowBytes(png_get_rowbytes(writer.png, writer.info), 1, &pitch) ||
      !blockBytes(image.height, pitch, &bytes))
    return false;
  writer.copy = static_cast<uint8*>(writer.memops->alloc(writer.memops->context, bytes));
  if (writer.copy == nullptr) return false;
  const uint32 depth = Raster_GetBPPDepth(image.depth, image.bpp);
  Raster_ConvertPixels(writer.copy, pitch, kCopyDepth, image.data, image.bytesPerLine,
                       static_cast<int32>(depth), false, nullptr, 0, 0, 0, 0, image.width,
                       image.height);
  *source = {writer.copy, pitch};
  return true;
}

/// Deliberate: images of fewer than 8 bits per pixel are written as one byte per pixel too.
bool prepareSource(Writer& writer, SourceRows* source) {
  const ImageUtilImage& image = *writer.image;
  *source = {image.data, image.bytesPerLine};
  if (isPaletteImage(image)) {
    writePalette(writer);
  } else if (image.bpp != 24 && image.bpp != 32) {
    return convertToCopy(writer, source);
  }
  return true;
}

/// Points the rows at the source, the picture's top row first.
void pointRows(const Writer& writer, SourceRows source) {
  const size_t height = writer.image->height;
  const bool bottomUp = (writer.image->flags & IMAGE_FLAG_BOTTOM_UP) != 0;
  for (size_t i = 0; i < height; ++i) {
    const uint8* row = source.pixels + i * source.pitch;
    // libpng takes rows to write as mutable, and does not change them.
    writer.rows[bottomUp ? height - 1 - i : i] = const_cast<png_bytep>(row);
  }
}

void freeCopy(Writer& writer) {
  if (writer.copy != nullptr) writer.memops->free(writer.memops->context, writer.copy);
  writer.copy = nullptr;
}

bool writeImage(Writer& writer) {
  SourceRows source{};
  png_set_write_fn(writer.png, writer.ioPtr, writer.writeFn, nullptr);
  writeHeader(writer);
  if (!prepareSource(writer, &source)) return false;
  png_write_info(writer.png, writer.info);
  // After the header, because libpng would reject a filler in a header without alpha.
  if (writer.image->bpp == 32 && writer.stripAlpha) png_set_filler(writer.png, 0, PNG_FILLER_AFTER);
  pointRows(writer, source);
  png_write_image(writer.png, writer.rows);
  freeCopy(writer);
  png_write_end(writer.png, writer.info);
  return true;
}

bool runWriter(Writer& writer) {
  writer.png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  if (writer.png == nullptr) return false;
  writer.info = png_create_info_struct(writer.png);
  const bool written = writer.info != nullptr && withoutPngError(writer.png, writeImage, writer);
  png_destroy_write_struct(&writer.png, &writer.info);
  freeCopy(writer);
  return written;
}

bool ImageUtilPNGWriter(const ImageUtilImage* image, const ImageUtilPNGWriteParams* params,
                        void* ioPtr, png_rw_ptr writeFn, const ImageUtilMemOps* memops) {
  size_t pointerBytes = 0;
  Writer writer{};
  if (image == nullptr || hasTooManyColors(*image)) return false;
  if (!blockBytes(image->height, sizeof *writer.rows, &pointerBytes)) return false;
  writer.image = image;
  writer.compressionLevel = params != nullptr ? params->compressionLevel : kDefaultCompressionLevel;
  writer.stripAlpha = params == nullptr || params->stripAlpha;
  writer.ioPtr = ioPtr;
  writer.writeFn = writeFn;
  writer.memops = memops;
  writer.rows = static_cast<png_bytep*>(memops->alloc(memops->context, pointerBytes));
  if (writer.rows == nullptr) return false;
  const bool written = runWriter(writer);
  memops->free(memops->context, writer.rows);
  return written;
}

void* systemAlloc(void* /*context*/, size_t size) { return malloc(size); }
void systemFree(void* /*context*/, void* block) { free(block); }
void* systemRealloc(void* /*context*/, void* block, size_t size) { return realloc(block, size); }

constexpr ImageUtilMemOps kSystemMemory = {nullptr, systemAlloc, systemFree, systemRealloc};

/// Makes room for `end` bytes, and as many again and 1024 more. When there is none the buffer is
/// released, and the context has none.
void grow(ImageUtilBufferWriteCtx* ctx, uint64 end) {
  const ImageUtilMemOps& memory = *ctx->memops;
  const uint64 wanted = 2 * end + 1024;
  void* grown = nullptr;
  if (wanted <= UINT32_MAX)
    grown = memory.realloc(memory.context, ctx->buffer, static_cast<size_t>(wanted));
  if (grown == nullptr && ctx->buffer != nullptr) memory.free(memory.context, ctx->buffer);
  ctx->buffer = static_cast<uint8*>(grown);
  ctx->capacity = static_cast<uint32>(wanted);
}

}  // namespace

bool constructPngBuffer(const ImageUtilImage* image, const ImageUtilPNGWriteParams* params,
                        DynBuf* out) {
  if (out == nullptr || image == nullptr) return false;
  DynBuf_Init(out);
  const bool written =
      ImageUtilPNGWriter(image, params, out, ImageUtilDynBufWriteCallback, &kSystemMemory);
  if (!written) DynBuf_Destroy(out);
  return written;
}

}  // namespace raster

extern "C" {

bool ImageUtil_ConstructPNGBuffer(const ImageUtilImage* image,
                                  const ImageUtilPNGWriteParams* params, DynBuf* out) {
  return raster::constructPngBuffer(image, params, out);
}

bool ImageUtil_ConstructPNGBufferWithMemOps(const ImageUtilImage* image,
                                            const ImageUtilPNGWriteParams* params,
                                            uint8** outBuffer, uint32* outSize,
                                            const ImageUtilMemOps* memops) {
  if (outBuffer == nullptr || outSize == nullptr || memops == nullptr) return false;
  ImageUtilBufferWriteCtx ctx = {nullptr, 0, 0, memops};
  const bool written =
      raster::ImageUtilPNGWriter(image, params, &ctx, ImageUtilBufferWriteCallback, memops);
  if (written) {
    *outBuffer = ctx.buffer;
  } else {
    memops->free(memops->context, ctx.buffer);
  }
  *outSize = written ? ctx.used : 0;
  return written;
}

void ImageUtilBufferWriteCallback(png_structp png, uint8* data, size_t length) {
  auto* ctx = static_cast<ImageUtilBufferWriteCtx*>(png_get_io_ptr(png));
  const uint64 end = uint64{ctx->used} + length;
  if (end > ctx->capacity) raster::grow(ctx, end);
  if (ctx->buffer == nullptr) {
    ctx->capacity = 0;
    ctx->used = 0;
    png_error(png, "Unable to append data: Out of memory");
  }
  memcpy(ctx->buffer + ctx->used, data, length);
  ctx->used += static_cast<uint32>(length);
}

void ImageUtilDynBufWriteCallback(png_structp png, uint8* data, size_t length) {
  if (!DynBuf_Append(static_cast<DynBuf*>(png_get_io_ptr(png)), data, length))
    png_error(png, "Unable to append data");
}

}  // extern "C"
