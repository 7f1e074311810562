// SPDX-License-Identifier: MIT
//
// What the sources of the image module share.

#ifndef RASTER_IMAGE_UTIL_PRIV_H
#define RASTER_IMAGE_UTIL_PRIV_H

#include "imageUtil.h"

namespace raster {

/// The bytes of a row of `width` pixels, padded to a multiple of 4; false when they do not fit.
inline bool paddedRowBytes(size_t width, size_t bytesPerPixel, uint32* bytes) {
  size_t exact = 0;
  if (__builtin_mul_overflow(width, bytesPerPixel, &exact) || exact > UINT32_MAX - 3) return false;
  *bytes = static_cast<uint32>(exact + 3) & ~3u;
  return true;
}

/// The product of a count and a size; false when it does not fit size_t.
inline bool blockBytes(size_t count, size_t size, size_t* bytes) {
  return !__builtin_mul_overflow(count, size, bytes);
}

/// Whether the image is one of palette indices, with a palette that its record can hold.
inline bool isPaletteImage(const ImageUtilImage& image) { return image.bpp <= 8; }
inline bool hasTooManyColors(const ImageUtilImage& image) {
  return isPaletteImage(image) && image.numColors > sizeof image.palette / sizeof image.palette[0];
}

/// As ImageUtil_FreeImageData.
void freeImageData(ImageUtilImage* image);

/// As ImageUtil_ConstructPNGBuffer and ImageUtil_ConstructBMPBuffer.
bool constructPngBuffer(const ImageUtilImage* image, const ImageUtilPNGWriteParams* params,
                        DynBuf* out);
bool constructBmpBuffer(const ImageUtilImage* image, DynBuf* out);

}  // namespace raster

#endif
