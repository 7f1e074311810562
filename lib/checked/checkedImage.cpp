// SPDX-License-Identifier: MIT
//
// Whole images: as bitmap files, put together, cut and scaled, written to files.

#include <cstring>

#include "checkedMemory.h"
#include "checkedScale.h"
#include "dynBuf.h"

namespace raster::checked {
namespace {

constexpr uint32 kMaxColors = 256;
constexpr int32 kNotGiven = -1;

uint64 paddedRow(uint32 width, uint32 bpp) { return (rowBytes(width, bpp) + 3) & ~uint64{3}; }

RasterStatus checkSize(uint64 width, uint64 height, uint32 bpp, const RasterLimits& limits) {
  if (width > std::min<uint64>(limits.width, INT32_MAX) ||
      height > std::min<uint64>(limits.height, INT32_MAX))
    return RASTER_STATUS_LIMIT;
  const uint64 row = paddedRow(static_cast<uint32>(width), bpp);
  uint64 bytes = 0;
  const bool keeps = row <= INT32_MAX && !__builtin_mul_overflow(row, height, &bytes) &&
                     bytes <= std::min<uint64>(limits.pixelBytes, PTRDIFF_MAX);
  return keeps ? RASTER_STATUS_OK : RASTER_STATUS_LIMIT;
}

/// A new image, all zero; false when there is no memory.
bool makeImage(const RasterView& like, uint32 width, uint32 height, ImageUtilImage* image,
               RasterView* view) {
  const auto pitch = static_cast<uint32>(paddedRow(width, like.bpp));
  const size_t bytes = size_t{pitch} * height;
  uint8* const data = OwnedBytes::ofZeros(bytes).release();
  if (data == nullptr) return false;
  *view = {data, bytes, pitch, width, height, like.depth, like.bpp};
  *image = {};
  image->width = width;
  image->height = height;
  image->depth = like.depth;
  image->bpp = like.bpp;
  image->bytesPerLine = pitch;
  image->data = data;
  return true;
}

void copyRows(const RasterView& to, const RasterView& from) {
  Raster_RectCopy(to.data, to.pitch, from.data, from.pitch, from.bpp / 8, 0, 0, 0, 0, to.width,
                  to.height);
}

// ---- Bitmap files ------------------------------------------------------------------------------

/// Whether rows can be copied up to a multiple of four bytes.
bool hasPaddedRows(const RasterView& view) {
  const uint64 row = paddedRow(view.width, view.bpp);
  if (view.bpp == 16 || view.bpp == 32) return true;
  return view.pitch >= row && uint64{view.height - 1} * view.pitch + row <= view.bytes;
}

uint64 bitmapBytes(const ImageUtilImage& image) {
  const bool palette = image.bpp == 8;
  const uint64 headers = 14 + 40 + (palette ? uint64{4} * image.numColors : 0);
  return headers + paddedRow(image.width, palette ? 8 : 24) * image.height;
}

RasterStatus encodeBitmap(const ImageUtilImage& image, uint8** file, size_t* fileBytes) {
  DynBuf out;
  if (!ImageUtil_ConstructBMPBuffer(&image, &out)) return RASTER_STATUS_NO_MEMORY;
  *file = out.data;
  *fileBytes = out.size;
  return RASTER_STATUS_OK;
}

RasterStatus encodePadded(const ImageUtilImage& image, const RasterView& view, uint8** file,
                          size_t* fileBytes) {
  ImageUtilImage padded;
  RasterView to;
  if (!makeImage(view, view.width, view.height, &padded, &to)) return RASTER_STATUS_NO_MEMORY;
  const OwnedBytes owner(padded.data);
  copyRows(to, view);
  padded.flags = image.flags;
  padded.numColors = image.numColors;
  memcpy(padded.palette, image.palette, sizeof padded.palette);
  return encodeBitmap(padded, file, fileBytes);
}

// ---- Combining ---------------------------------------------------------------------------------

/// The images' bounding rectangle as Rect_Union makes it, and the sum of their areas.
struct Extent {
  Rect bounds;
  uint64 area;
};

RasterStatus checkInput(const ImageUtilImage& image, size_t bytes) {
  RasterView view;
  if (image.data != nullptr) return RasterChecked_ImageView(&image, bytes, &view);
  if (!isFormat(image.depth, image.bpp) || image.bpp == 1) return RASTER_STATUS_BAD_FORMAT;
  const bool valid = image.width <= INT32_MAX && image.height <= INT32_MAX;
  return valid ? RASTER_STATUS_OK : RASTER_STATUS_BAD_VIEW;
}

RasterStatus measure(const ImageUtilImage* images, const size_t* bytes, const int32* positions,
                     uint32 count, Extent* extent) {
  *extent = {};
  for (size_t i = 0; i < count; ++i) {
    const ImageUtilImage& image = images[i];
    if (image.depth != images[0].depth || image.bpp != images[0].bpp)
      return RASTER_STATUS_BAD_FORMAT;
    const RasterStatus status = checkInput(image, bytes[i]);
    if (status != RASTER_STATUS_OK) return status;
    Rect rect;
    if (!Rect_SetFromXYWH(&rect, positions[2 * i], positions[2 * i + 1],
                          static_cast<int32>(image.width), static_cast<int32>(image.height)))
      return RASTER_STATUS_TOO_BIG;
    Rect_Union(&extent->bounds, &rect);
    extent->area += uint64{image.width} * image.height;
  }
  return RASTER_STATUS_OK;
}

/// Whether ImageUtil_Combine can make the result, and within the limits.
RasterStatus checkResult(const ImageUtilImage& first, const Extent& extent,
                         const RasterLimits& limits) {
  const Rect& bounds = extent.bounds;
  const auto width = static_cast<uint64>(std::max<int64>(0, int64{bounds.right} - bounds.left));
  const auto height = static_cast<uint64>(std::max<int64>(0, int64{bounds.bottom} - bounds.top));
  // In 32 bits, as it is decided there.
  const bool covered = static_cast<uint32>(width * height) == extent.area;
  const bool converted = !covered && first.bpp != 32;
  if (converted && first.bpp == 8) return RASTER_STATUS_BAD_FORMAT;
  return checkSize(width, height, converted ? 32 : first.bpp, limits);
}

// ---- Cutting -----------------------------------------------------------------------------------

struct Size {
  uint32 width;
  uint32 height;
};

/// The crop along one axis. `size` is below 2^31.
RasterStatus resolveEdge(uint32 size, int32 nearEdge, int32 farEdge, uint32* crop) {
  const int64 end = farEdge == kNotGiven ? size : int64{farEdge};
  if (nearEdge < 0 || end > size || nearEdge > end) return RASTER_STATUS_OUTSIDE;
  *crop = static_cast<uint32>(end - nearEdge);
  return *crop != 0 ? RASTER_STATUS_OK : RASTER_STATUS_BAD_ARGUMENT;
}

/// One side of the result: as given, as the crop, or following from the other side.
uint64 resolveSide(int32 given, int32 otherGiven, uint32 crop, uint32 otherCrop) {
  if (given != kNotGiven) return static_cast<uint32>(given);
  if (otherGiven == kNotGiven) return crop;
  return uint64{crop} * static_cast<uint32>(otherGiven) / otherCrop;
}

RasterStatus resolveSize(Size crop, int32 newWidth, int32 newHeight, const RasterView& view,
                         const RasterLimits& limits, Size* size) {
  if ((newWidth <= 0 && newWidth != kNotGiven) || (newHeight <= 0 && newHeight != kNotGiven))
    return RASTER_STATUS_BAD_ARGUMENT;
  const uint64 width = resolveSide(newWidth, newHeight, crop.width, crop.height);
  const uint64 height = resolveSide(newHeight, newWidth, crop.height, crop.width);
  if (width == 0 || height == 0) return RASTER_STATUS_BAD_ARGUMENT;
  const RasterStatus status = checkSize(width, height, view.bpp, limits);
  if (status != RASTER_STATUS_OK) return status;
  *size = {static_cast<uint32>(width), static_cast<uint32>(height)};
  if (size->width == crop.width && size->height == crop.height) return RASTER_STATUS_OK;
  if (!scales(view, view)) return RASTER_STATUS_BAD_FORMAT;
  const bool scalable =
      isScaleSize(crop.width, crop.height) && isScaleSize(size->width, size->height);
  return scalable ? RASTER_STATUS_OK : RASTER_STATUS_TOO_BIG;
}

/// The view of a rectangle of another one.
RasterView viewOf(const RasterView& view, uint32 left, uint32 top, Size size) {
  const size_t offset = size_t{top} * view.pitch + size_t{left} * (view.bpp / 8);
  return {view.data + offset, view.bytes - offset, view.pitch, size.width,
          size.height,        view.depth,          view.bpp};
}

RasterStatus draw(const RasterView& to, const RasterView& from) {
  if (to.width == from.width && to.height == from.height) {
    copyRows(to, from);
    return RASTER_STATUS_OK;
  }
  const Factors factors = {static_cast<double>(to.width) / from.width,
                           static_cast<double>(to.height) / from.height};
  if (!isFactor(factors)) return RASTER_STATUS_TOO_BIG;
  return drawScaled(to, {0, 0, 0, 0, to.width, to.height}, from, factors, true);
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_EncodeBmp(const ImageUtilImage* image, size_t bytes, uint8** file,
                                     size_t* fileBytes) {
  using namespace raster::checked;
  if (file == nullptr || fileBytes == nullptr) return RASTER_STATUS_NULL;
  RasterView view;
  const RasterStatus status = RasterChecked_ImageView(image, bytes, &view);
  if (status != RASTER_STATUS_OK) return status;
  if (view.width == 0 || view.height == 0) return RASTER_STATUS_BAD_ARGUMENT;
  if (view.bpp == 8 && image->numColors > kMaxColors) return RASTER_STATUS_BAD_ARGUMENT;
  if (bitmapBytes(*image) > UINT32_MAX) return RASTER_STATUS_TOO_BIG;
  return hasPaddedRows(view) ? encodeBitmap(*image, file, fileBytes)
                             : encodePadded(*image, view, file, fileBytes);
}

RasterStatus RasterChecked_Combine(const ImageUtilImage* images, const size_t* bytes,
                                   const int32* positions, uint32 count, const RasterLimits* limits,
                                   ImageUtilImage* result) {
  using namespace raster::checked;
  if (result == nullptr) return RASTER_STATUS_NULL;
  if (count != 0) {
    if (images == nullptr || bytes == nullptr || positions == nullptr) return RASTER_STATUS_NULL;
    Extent extent;
    RasterStatus status = measure(images, bytes, positions, count, &extent);
    if (status == RASTER_STATUS_OK) status = checkResult(images[0], extent, limitsOf(limits));
    if (status != RASTER_STATUS_OK) return status;
  }
  return ImageUtil_Combine(images, positions, count, result) ? RASTER_STATUS_OK
                                                             : RASTER_STATUS_NO_MEMORY;
}

RasterStatus RasterChecked_CropAndScale(const ImageUtilImage* image, size_t bytes, int32 left,
                                        int32 top, int32 right, int32 bottom, int32 newWidth,
                                        int32 newHeight, const RasterLimits* limits,
                                        ImageUtilImage* result) {
  using namespace raster::checked;
  if (result == nullptr) return RASTER_STATUS_NULL;
  RasterView view;
  Size crop{};
  Size size{};
  RasterStatus status = RasterChecked_ImageView(image, bytes, &view);
  if (status == RASTER_STATUS_OK) status = resolveEdge(view.width, left, right, &crop.width);
  if (status == RASTER_STATUS_OK) status = resolveEdge(view.height, top, bottom, &crop.height);
  if (status == RASTER_STATUS_OK)
    status = resolveSize(crop, newWidth, newHeight, view, limitsOf(limits), &size);
  if (status != RASTER_STATUS_OK) return status;
  ImageUtilImage made;
  RasterView to;
  if (!makeImage(view, size.width, size.height, &made, &to)) return RASTER_STATUS_NO_MEMORY;
  OwnedBytes owner(made.data);
  status = draw(to, viewOf(view, static_cast<uint32>(left), static_cast<uint32>(top), crop));
  if (status != RASTER_STATUS_OK) return status;
  owner.release();
  *result = made;
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_WriteImage(const ImageUtilImage* image, size_t bytes, const char* path,
                                      uint32 imageType, const ImageUtilPNGWriteParams* params,
                                      uint32 flags) {
  using namespace raster::checked;
  if (imageType > IMAGE_UTIL_TYPE_BMP) return RASTER_STATUS_BAD_ARGUMENT;
  uint8* file = nullptr;
  size_t size = 0;
  const RasterStatus status = imageType == IMAGE_UTIL_TYPE_PNG
                                  ? RasterChecked_EncodePng(image, bytes, params, &file, &size)
                                  : RasterChecked_EncodeBmp(image, bytes, &file, &size);
  if (status != RASTER_STATUS_OK) return status;
  const OwnedBytes owner(file);
  return RasterChecked_WriteFile(path, file, size, flags);
}

}  // extern "C"
