// SPDX-License-Identifier: MIT
//
// Images to files.

#include "imageUtil.h"

#include "fileIO.h"
#include "imageUtilPriv.h"
#include "message.h"
#include "host/panicPlace.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/image/imageUtil";

/// Writes the buffer to a file, created or truncated. What fails is logged; the file stays.
bool ImageUtilWriteBuf(const DynBuf* buf, const char* pathName) {
  FileIODescriptor file;
  FileIO_Invalidate(&file);
  FileIOResult result = FileIO_Open(&file, pathName, FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
  if (result != FILEIO_SUCCESS) {
    Log("%s: Failed open file '%s': %s (%d)\n", "ImageUtilWriteBuf", pathName,
        FileIO_ErrorEnglish(result), result);
    return false;
  }
  size_t written = 0;
  result = FileIO_Write(&file, buf->data, buf->size, &written);
  FileIO_Close(&file);
  if (result != FILEIO_SUCCESS) {
    Log("%s: Failed to write file '%s': %s (%d)\n", "ImageUtilWriteBuf", pathName,
        FileIO_ErrorEnglish(result), result);
    return false;
  }
  if (written != buf->size) {
    // Deliberate: the text and the number of success, which is what the write reported.
    Log("%s: Wrong number of image bytes written to '%s': %s (%d)\n", "ImageUtilWriteBuf", pathName,
        FileIO_ErrorEnglish(FILEIO_SUCCESS), FILEIO_SUCCESS);
    return false;
  }
  return true;
}

/// Writes a buffer that was built or not, and releases it.
bool finish(bool built, DynBuf* buf, const char* pathName) {
  const bool written = built && ImageUtilWriteBuf(buf, pathName);
  DynBuf_Destroy(buf);
  return written;
}

}  // namespace
}  // namespace raster

extern "C" {

bool ImageUtil_WriteImage(const ImageUtilImage* image, const char* pathName, uint32 imageType) {
  DynBuf buf{};
  switch (imageType) {
    case IMAGE_UTIL_TYPE_PNG:
      return raster::finish(raster::constructPngBuffer(image, nullptr, &buf), &buf, pathName);
    case IMAGE_UTIL_TYPE_BMP:
      return raster::finish(raster::constructBmpBuffer(image, &buf), &buf, pathName);
    default:
      raster::notImplemented(raster::kSource);
  }
}

bool ImageUtil_WritePNG(const ImageUtilImage* image, const char* pathName,
                        const ImageUtilPNGWriteParams* params) {
  DynBuf buf{};
  return raster::finish(raster::constructPngBuffer(image, params, &buf), &buf, pathName);
}

}  // extern "C"
