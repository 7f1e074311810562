// SPDX-License-Identifier: MIT
//
// Run-length blocks of any bytes: what is accepted comes back when it is packed again.

#include <cstdlib>
#include <cstring>

#include "fuzzing.h"

using fuzz::require;

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  const RasterLimits limits = {4096, 4096, 1 << 18, 1 << 20, 1 << 20, 100};
  const fuzz::Bytes copy(bytes, bytes + size);  // a block that ends with the input
  RasterView pixels = {};
  if (RasterChecked_Decompress(copy.data(), size, &limits, &pixels) != RASTER_STATUS_OK) {
    require(pixels.data == nullptr);
    return 0;
  }
  require(RasterChecked_View(&pixels) == RASTER_STATUS_OK);
  uint8* block = nullptr;
  size_t blockSize = 0;
  require(RasterChecked_Compress(&pixels, &block, &blockSize) == RASTER_STATUS_OK);
  RasterView again = {};
  require(RasterChecked_Decompress(block, blockSize, nullptr, &again) == RASTER_STATUS_OK);
  require(again.bytes == pixels.bytes && again.pitch == pixels.pitch);
  require(pixels.bytes == 0 || memcmp(again.data, pixels.data, pixels.bytes) == 0);
  free(again.data);
  free(block);
  free(pixels.data);
  return 0;
}
