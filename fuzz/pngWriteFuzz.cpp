// SPDX-License-Identifier: MIT
//
// Images with any fields as PNG and BMP: what is encoded is what the exact encoder makes, and a PNG
// is read again.

#include <cstdlib>
#include <cstring>

#include "fuzzing.h"
#include "imageUtil.h"
#include "support/viewImages.h"

using fuzz::Choices;
using fuzz::require;

namespace {

ImageUtilImage imageOf(Choices& c, const RasterView& view) {
  ImageUtilImage image = tests::imageOn(view);
  image.flags = c.below(4);
  image.numColors = c.chance(4) ? c.below(300) : 256;
  for (ImageUtilColor& color : image.palette) color.red = c.byte();
  return image;
}

void checkPng(const ImageUtilImage& image, size_t bytes, const ImageUtilPNGWriteParams& params) {
  uint8* file = nullptr;
  size_t size = 0;
  if (RasterChecked_EncodePng(&image, bytes, &params, &file, &size) != RASTER_STATUS_OK) {
    require(file == nullptr);
    return;
  }
  DynBuf exact;
  require(ImageUtil_ConstructPNGBuffer(&image, &params, &exact));
  require(exact.size == size && memcmp(exact.data, file, size) == 0);
  DynBuf_Destroy(&exact);
  ImageUtilImage back = {};
  require(RasterChecked_ReadPngBuffer(file, size, RASTER_CHECKED_KEEP_ALPHA, nullptr, &back,
                                      nullptr, 0) == RASTER_STATUS_OK);
  require(back.width == image.width && back.height == image.height);
  free(back.data);
  free(file);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  Choices c(bytes, size);
  const fuzz::FuzzedView own(c);
  const ImageUtilImage image = imageOf(c, own.view);
  const ImageUtilPNGWriteParams params = {c.between(-2, 11), c.chance(2)};
  checkPng(image, own.view.bytes, params);
  uint8* file = nullptr;
  size_t fileSize = 0;
  const RasterStatus status = RasterChecked_EncodeBmp(&image, own.view.bytes, &file, &fileSize);
  require((status == RASTER_STATUS_OK) == (file != nullptr));
  require(file == nullptr || fileSize >= 54);
  free(file);
  return 0;
}
