// SPDX-License-Identifier: MIT
//
// Images in memory: read from PNG, written as PNG and BMP, combined, cropped and scaled.

#ifndef RASTER_IMAGE_UTIL_H
#define RASTER_IMAGE_UTIL_H

#include "baseTypes.h"
#include "dynBuf.h"

#ifdef __cplusplus
extern "C" {
#endif

struct png_struct_def;  // libpng's structure; png_structp is a pointer to it

// NOLINTBEGIN(modernize-use-using)

typedef struct ImageUtilColor {
  uint8 blue;
  uint8 green;
  uint8 red;
  uint8 reserved;
} ImageUtilColor;

enum { IMAGE_FLAG_BOTTOM_UP = 1 };

typedef struct ImageUtilImage {
  uint32 width;
  uint32 height;
  uint32 depth;
  uint32 bpp;
  uint32 bytesPerLine;
  uint32 flags;
  uint32 numColors;
  ImageUtilColor palette[256];
  uint8* data;
} ImageUtilImage;

enum { IMAGE_UTIL_READ_KEEP_ALPHA = 1 };

enum { IMAGE_UTIL_TYPE_PNG = 0, IMAGE_UTIL_TYPE_BMP = 1 };

typedef struct ImageUtilPNGWriteParams {
  int32 compressionLevel;
  bool stripAlpha;
} ImageUtilPNGWriteParams;

typedef struct ImageUtilMemOps {
  void* context;
  void* (*alloc)(void* context, size_t size);
  void (*free)(void* context, void* block);
  void* (*realloc)(void* context, void* block, size_t newSize);
} ImageUtilMemOps;

// NOLINTEND(modernize-use-using)

TARNLIBS_EXPORT bool ImageUtil_ReadPNGBuffer(ImageUtilImage* image, const uint8* png, uint32 size,
                                             uint8 readFlags);
TARNLIBS_EXPORT bool ImageUtil_ReadPNG(ImageUtilImage* image, const char* pathName,
                                       uint8 readFlags);
TARNLIBS_EXPORT void ImageUtil_FreeImageData(ImageUtilImage* image);
TARNLIBS_EXPORT void ImageUtilReadPngCallback(struct png_struct_def* png, uint8* dest,
                                              size_t length);

TARNLIBS_EXPORT bool ImageUtil_ConstructPNGBuffer(const ImageUtilImage* image,
                                                  const ImageUtilPNGWriteParams* params,
                                                  DynBuf* out);
TARNLIBS_EXPORT bool ImageUtil_ConstructPNGBufferWithMemOps(const ImageUtilImage* image,
                                                            const ImageUtilPNGWriteParams* params,
                                                            uint8** outBuffer, uint32* outSize,
                                                            const ImageUtilMemOps* memops);
TARNLIBS_EXPORT void ImageUtilBufferWriteCallback(struct png_struct_def* png, uint8* data,
                                                  size_t length);
TARNLIBS_EXPORT void ImageUtilDynBufWriteCallback(struct png_struct_def* png, uint8* data,
                                                  size_t length);

TARNLIBS_EXPORT bool ImageUtil_ConstructBMPBuffer(const ImageUtilImage* image, DynBuf* out);

TARNLIBS_EXPORT bool ImageUtil_WriteImage(const ImageUtilImage* image, const char* pathName,
                                          uint32 imageType);
TARNLIBS_EXPORT bool ImageUtil_WritePNG(const ImageUtilImage* image, const char* pathName,
                                        const ImageUtilPNGWriteParams* params);
TARNLIBS_EXPORT bool ImageUtil_Combine(const ImageUtilImage* images, const int32* positions,
                                       uint32 count, ImageUtilImage* result);
TARNLIBS_EXPORT bool ImageUtil_CropAndScaleImage(const ImageUtilImage* src, int32 left, int32 top,
                                                 int32 right, int32 bottom, int32 dstX, int32 dstY,
                                                 int32 newWidth, int32 newHeight,
                                                 ImageUtilImage* result);

#ifdef __cplusplus
}
#endif

#endif
