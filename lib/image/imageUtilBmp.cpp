// SPDX-License-Identifier: MIT
//
// Writing BMP: an image record as a bitmap file with a 40-byte information header.
//
// Rows that need converting, and small pictures, pass through a strip of rows that stays in the
// cache; others are appended as they lie. So the file's own bytes are written once and nothing else
// of the picture's size is allocated.

#include "imageUtil.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "frame/frameBuffer.h"
#include "imageUtilPriv.h"
#include "raster.h"

namespace raster {
namespace {

constexpr uint32 kFileHeaderBytes = 14;
constexpr uint32 kInfoHeaderBytes = 40;
constexpr int32 kColorDepth = 24;      // of every bitmap without a palette
constexpr size_t kStripBytes = 16384;  // unless a single row is longer

/// The numbers that the file's parts follow from.
struct Layout {
  uint32 bitsPerPixel;
  uint32 colorsUsed;
  uint32 rowBytes;
  uint32 rows;  ///< with pixels: none below 8 bits per pixel
  uint32 imageBytes;
  uint32 dataOffset;
  uint32 fileBytes;
};

/// Works out the layout; false when the record is not valid, the file would have 4 GiB or more, or
/// the pixels would be more than any block of memory.
/// Deliberate: below 8 bits per pixel a row has no bytes. Rows without bytes are not walked.
bool layOut(const ImageUtilImage& image, Layout* layout) {
  const bool palette = isPaletteImage(image);
  const uint32 bytesPerPixel = palette ? image.bpp / 8 : 3;
  if (hasTooManyColors(image) || !paddedRowBytes(image.width, bytesPerPixel, &layout->rowBytes))
    return false;
  ptrdiff_t block = 0;  // the type of the largest block's size
  layout->bitsPerPixel = palette ? image.bpp : kColorDepth;
  layout->colorsUsed = palette ? image.numColors : 0;
  layout->rows = layout->rowBytes == 0 ? 0 : image.height;
  layout->dataOffset = kFileHeaderBytes + kInfoHeaderBytes + 4 * layout->colorsUsed;
  return !__builtin_mul_overflow(layout->rowBytes, image.height, &layout->imageBytes) &&
         !__builtin_add_overflow(layout->imageBytes, 0, &block) &&
         !__builtin_add_overflow(layout->dataOffset, layout->imageBytes, &layout->fileBytes);
}

/// Appends the two headers and the palette.
bool appendHead(DynBuf* out, const ImageUtilImage& image, const Layout& layout) {
  uint8 file[kFileHeaderBytes] = {'B', 'M'};
  storePixel<4>(file + 2, layout.fileBytes);
  storePixel<4>(file + 10, layout.dataOffset);
  uint8 info[kInfoHeaderBytes] = {};
  storePixel<4>(info, kInfoHeaderBytes);
  storePixel<4>(info + 4, image.width);
  storePixel<4>(info + 8, image.height);
  storePixel<2>(info + 12, 1);
  storePixel<2>(info + 14, layout.bitsPerPixel);
  storePixel<4>(info + 20, layout.imageBytes);
  storePixel<4>(info + 32, layout.colorsUsed);
  return DynBuf_Append(out, file, sizeof file) && DynBuf_Append(out, info, sizeof info) &&
         (layout.colorsUsed == 0 || DynBuf_Append(out, image.palette, 4 * layout.colorsUsed));
}

/// Whether the image has the file's own pixel format, so that rows are copied with their padding.
bool hasFileFormat(const ImageUtilImage& image) { return image.bpp == 24 || image.bpp == 8; }

/// The image's row that becomes the file's row number `fileRow`, counted from the bottom.
const uint8* sourceRow(const ImageUtilImage& image, uint32 fileRow) {
  const bool bottomUp = (image.flags & IMAGE_FLAG_BOTTOM_UP) != 0;
  const uint32 row = bottomUp ? fileRow : image.height - 1 - fileRow;
  return rowAt<const uint8>(image.data, pitchOf(image.bytesPerLine), row, 0, 0);
}

void convertRow(uint8* dst, const ImageUtilImage& image, const uint8* src, uint32 rowBytes) {
  const uint32 depth = Raster_GetBPPDepth(image.depth, image.bpp);
  Raster_ConvertPixels(dst, rowBytes, kColorDepth, src, image.bytesPerLine,
                       static_cast<int32>(depth), false, nullptr, 0, 0, 0, 0, image.width, 1);
}

/// Appends the rows as they are, one by one.
bool appendRows(DynBuf* out, const ImageUtilImage& image, const Layout& layout) {
  for (uint32 row = 0; row < layout.rows; ++row) {
    if (!DynBuf_Append(out, sourceRow(image, row), layout.rowBytes)) return false;
  }
  return true;
}

/// Appends the rows through a strip of `stripRows` rows.
bool appendStrips(DynBuf* out, const ImageUtilImage& image, const Layout& layout, uint8* strip,
                  uint32 stripRows) {
  uint32 done = 0;
  do {
    const uint32 count = std::min(stripRows, layout.rows - done);
    for (uint32 i = 0; i < count; ++i) {
      uint8* dst = strip + size_t{i} * layout.rowBytes;
      const uint8* src = sourceRow(image, done + i);
      if (hasFileFormat(image)) {
        memcpy(dst, src, layout.rowBytes);
      } else {
        convertRow(dst, image, src, layout.rowBytes);
      }
    }
    if (!DynBuf_Append(out, strip, size_t{count} * layout.rowBytes)) return false;
    done += count;
  } while (done < layout.rows);
  return true;
}

/// Initialises `out` and appends the file, through `strip` unless it is null.
bool appendFile(DynBuf* out, const ImageUtilImage& image, const Layout& layout, uint8* strip,
                uint32 stripRows) {
  DynBuf_Init(out);
  const bool appended = appendHead(out, image, layout) &&
                        (strip != nullptr ? appendStrips(out, image, layout, strip, stripRows)
                                          : appendRows(out, image, layout));
  if (!appended) DynBuf_Destroy(out);
  return appended;
}

}  // namespace

bool constructBmpBuffer(const ImageUtilImage* image, DynBuf* out) {
  Layout layout{};
  if (out == nullptr || image == nullptr || !layOut(*image, &layout)) return false;
  if (hasFileFormat(*image) && layout.imageBytes > kStripBytes)
    return appendFile(out, *image, layout, nullptr, 0);
  const size_t rowBytes = std::max(layout.rowBytes, 1u);
  const size_t stripRows = std::clamp(kStripBytes / rowBytes, size_t{1}, size_t{layout.rows} + 1);
  // Zeroed, because a converted row leaves its padding alone.
  auto* strip = static_cast<uint8*>(calloc(stripRows, rowBytes));
  if (strip == nullptr) return false;
  const bool appended = appendFile(out, *image, layout, strip, static_cast<uint32>(stripRows));
  free(strip);
  return appended;
}

}  // namespace raster

extern "C" {

bool ImageUtil_ConstructBMPBuffer(const ImageUtilImage* image, DynBuf* out) {
  return raster::constructBmpBuffer(image, out);
}

}  // extern "C"
