// SPDX-License-Identifier: MIT
//
// Writing BMP: an image record as a bitmap file with a 40-byte information header.
//
// The pixels pass through a strip of rows that stays in the cache, so the file's own bytes are
// written once and nothing else of the picture's size is allocated.

#include "imageUtil.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "frameBuffer.h"
#include "imageUtilPriv.h"
#include "raster.h"

namespace raster {
namespace {

constexpr uint32 kFileHeaderBytes = 14;
constexpr uint32 kInfoHeaderBytes = 40;
constexpr int32 kColorDepth = 24;      // of every bitmap without a palette
constexpr size_t kStripBytes = 32768;  // unless a single row is longer

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

/// Works out the layout; false when the record is not valid or the file would be over 4 GiB.
/// Deliberate: below 8 bits per pixel a row has no bytes.
bool layOut(const ImageUtilImage& image, Layout* layout) {
  const bool palette = isPaletteImage(image);
  const uint32 bytesPerPixel = palette ? image.bpp / 8 : 3;
  if (hasTooManyColors(image) || !paddedRowBytes(image.width, bytesPerPixel, &layout->rowBytes))
    return false;
  layout->bitsPerPixel = palette ? image.bpp : kColorDepth;
  layout->colorsUsed = palette ? image.numColors : 0;
  layout->rows = bytesPerPixel == 0 ? 0 : image.height;
  layout->dataOffset = kFileHeaderBytes + kInfoHeaderBytes + 4 * layout->colorsUsed;
  return !__builtin_mul_overflow(layout->rowBytes, image.height, &layout->imageBytes) &&
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

/// Brings one row of the image into the form of the file. Rows of 8 and 24 bits are copied with
/// their padding.
void convertRow(uint8* dst, const ImageUtilImage& image, uint32 sourceRow, uint32 rowBytes) {
  const uint8* src = rowAt<const uint8>(image.data, pitchOf(image.bytesPerLine), sourceRow, 0, 0);
  if (image.bpp == 24 || image.bpp == 8) {
    memcpy(dst, src, rowBytes);
    return;
  }
  const uint32 depth = Raster_GetBPPDepth(image.depth, image.bpp);
  Raster_ConvertPixels(dst, rowBytes, kColorDepth, src, image.bytesPerLine,
                       static_cast<int32>(depth), false, nullptr, 0, 0, 0, 0, image.width, 1);
}

/// Appends the rows, the picture's bottom row first, through a strip of `stripRows` rows.
bool appendPixels(DynBuf* out, const ImageUtilImage& image, const Layout& layout, uint8* strip,
                  uint32 stripRows) {
  const bool bottomUp = (image.flags & IMAGE_FLAG_BOTTOM_UP) != 0;
  uint32 done = 0;
  do {
    const uint32 count = std::min(stripRows, layout.rows - done);
    for (uint32 i = 0; i < count; ++i) {
      const uint32 row = bottomUp ? done + i : layout.rows - 1 - (done + i);
      convertRow(strip + size_t{i} * layout.rowBytes, image, row, layout.rowBytes);
    }
    if (!DynBuf_Append(out, strip, size_t{count} * layout.rowBytes)) return false;
    done += count;
  } while (done < layout.rows);
  return true;
}

}  // namespace

bool constructBmpBuffer(const ImageUtilImage* image, DynBuf* out) {
  Layout layout{};
  if (out == nullptr || image == nullptr || !layOut(*image, &layout)) return false;
  const size_t fitting = kStripBytes / std::max(layout.rowBytes, 1u);
  const uint32 stripRows = std::min(std::max(static_cast<uint32>(fitting), 1u), layout.rows);
  // Zeroed, because a converted row leaves its padding alone.
  auto* strip = static_cast<uint8*>(calloc(std::max(stripRows, 1u), std::max(layout.rowBytes, 1u)));
  if (strip == nullptr) return false;
  DynBuf_Init(out);
  const bool appended =
      appendHead(out, *image, layout) && appendPixels(out, *image, layout, strip, stripRows);
  free(strip);
  if (!appended) DynBuf_Destroy(out);
  return appended;
}

}  // namespace raster

extern "C" {

bool ImageUtil_ConstructBMPBuffer(const ImageUtilImage* image, DynBuf* out) {
  return raster::constructBmpBuffer(image, out);
}

}  // extern "C"
