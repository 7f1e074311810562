// SPDX-License-Identifier: MIT
//
// A rectangle cut out of an image, scaled on request.

#include <cstring>

#include "frame/frameBuffer.h"
#include "imageUtil.h"
#include "imageUtilPriv.h"
#include "raster.h"
#include "utilAlloc.h"

namespace raster {
namespace {

constexpr int32 kNotGiven = -1;
constexpr int32 kSmooth = 2;  // any number but 0 asks Raster_Scale for smoothing

struct Size {
  uint32 width;
  uint32 height;
};

/// Finds the far edge of the crop along one axis. False when the crop would be negative or reach
/// past the image.
bool resolveEdge(uint32 imageSize, int32 nearEdge, int32 farEdge, uint32* size) {
  if (farEdge != kNotGiven && farEdge <= nearEdge) return false;
  const uint32 start = static_cast<uint32>(nearEdge);
  const uint32 end = farEdge == kNotGiven ? imageSize : static_cast<uint32>(farEdge);
  if (end > imageSize || start > end) return false;
  *size = end - start;
  return true;
}

/// The size of the result: as given, or following from the crop's shape. False when there is no
/// shape to follow. Deliberate: the product comes first and is 32 bits wide.
bool resolveSize(Size crop, int32 newWidth, int32 newHeight, Size* size) {
  *size = {static_cast<uint32>(newWidth), static_cast<uint32>(newHeight)};
  if (newWidth == kNotGiven && newHeight == kNotGiven) {
    *size = crop;
  } else if (newWidth == kNotGiven) {
    if (crop.height == 0) return false;
    size->width = size->height * crop.width / crop.height;
  } else if (newHeight == kNotGiven) {
    if (crop.width == 0) return false;
    size->height = crop.height * size->width / crop.width;
  }
  return true;
}

void zeroPadding(const ImageUtilImage& image, size_t rowBytes) {
  for (size_t y = 0; y < image.height; ++y)
    memset(image.data + y * image.bytesPerLine + rowBytes, 0, image.bytesPerLine - rowBytes);
}

/// Deliberate: the scaler may refuse (15-bit colour, very large sizes); the pixels are zero then.
void drawScaled(const ImageUtilImage& result, const ImageUtilImage& src, uint8* from, Size crop) {
  const bool drawn = Raster_Scale(
      result.data, result.bytesPerLine, src.bpp, src.depth, result.width, result.height, 0, 0, 0,
      static_cast<int32>(result.width), static_cast<int32>(result.height), from,
      static_cast<int32>(src.bytesPerLine), src.bpp, static_cast<int32>(src.depth), 0, crop.width,
      crop.height, 0, static_cast<double>(result.width) / crop.width,
      static_cast<double>(result.height) / crop.height, kSmooth);
  const bool empty = crop.width == 0 || crop.height == 0;
  const size_t rowBytes = size_t{result.width} * (src.bpp / 8);
  zeroPadding(result, drawn && !empty ? rowBytes : 0);
}

void drawUnscaled(const ImageUtilImage& result, const ImageUtilImage& src, const uint8* from) {
  const size_t rowBytes = size_t{result.width} * (src.bpp / 8);
  const size_t pitch = result.bytesPerLine;
  if (rowBytes == 0 || result.height == 0) return;
  if (result.width == src.width) {
    // Deliberate: the source's pitch is taken to be the result's.
    memcpy(result.data, from, pitch * result.height);
    return;
  }
  for (size_t y = 0; y < result.height; ++y)
    memcpy(result.data + y * pitch, from + y * src.bytesPerLine, rowBytes);
  zeroPadding(result, rowBytes);
}

}  // namespace
}  // namespace raster

extern "C" {

bool ImageUtil_CropAndScaleImage(const ImageUtilImage* src, int32 left, int32 top, int32 right,
                                 int32 bottom, int32 dstX, int32 dstY, int32 newWidth,
                                 int32 newHeight, ImageUtilImage* result) {
  raster::Size crop{};
  raster::Size size{};
  size_t bytes = 0;
  ImageUtilImage made{};
  if (left < 0 || top < 0 || dstX != 0 || dstY != 0 || newWidth == 0 || newHeight == 0)
    return false;
  if (!raster::resolveEdge(src->width, left, right, &crop.width) ||
      !raster::resolveEdge(src->height, top, bottom, &crop.height) ||
      !raster::resolveSize(crop, newWidth, newHeight, &size))
    return false;
  const uint32 bytesPerPixel = src->bpp / 8;
  const bool scaled = size.width != crop.width || size.height != crop.height;
  if (scaled && src->bytesPerLine > INT32_MAX) return false;  // the scaler's pitches have a sign
  if (!raster::paddedRowBytes(size.width, bytesPerPixel, &made.bytesPerLine) ||
      !raster::blockBytes(size.height, made.bytesPerLine, &bytes))
    return false;

  made.width = size.width;
  made.height = size.height;
  made.depth = src->depth;
  made.bpp = src->bpp;
  made.data = static_cast<uint8*>(UtilSafeMalloc0(bytes));
  uint8* from = raster::rowAt(src->data, raster::pitchOf(src->bytesPerLine),
                              static_cast<uint32>(top), static_cast<uint32>(left), bytesPerPixel);
  if (scaled) {
    raster::drawScaled(made, *src, from, crop);
  } else {
    raster::drawUnscaled(made, *src, from);
  }
  *result = made;
  return true;
}

}  // extern "C"
