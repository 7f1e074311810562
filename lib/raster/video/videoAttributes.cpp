// SPDX-License-Identifier: MIT

#include "videoAttributes.h"

#include "host/firstTime.h"
#include "message.h"
#include "raster.h"

namespace {

constexpr uint32 roundUpToEven(uint32 n) { return n + (n & 1); }

/// Half of `n`, rounded up.
constexpr uint32 halfUp(uint32 n) { return n / 2 + (n & 1); }

}  // namespace

extern "C" {

bool RasterComputeVideoAttributes(uint32 format, uint32 width, uint32 height, uint32* size,
                                  uint32* pitches, uint32* offsets) {
  using namespace raster;
  if (offsets != nullptr) offsets[0] = 0;
  const uint32 evenWidth = roundUpToEven(width);
  if (format == RASTER_VIDEO_YUY2 || format == RASTER_VIDEO_UYVY) {
    *size = height * 2 * evenWidth;
    return true;
  }
  if (format != RASTER_VIDEO_YV12) {
    static constinit std::atomic<bool> said{false};
    *size = 0;
    if (firstTime(said))
      Log("%s: format :%u not supported.\n", "RasterComputeVideoAttributes", format);
    return false;
  }
  const uint32 lumaSize = evenWidth * roundUpToEven(height);
  const uint32 chromaSize = halfUp(height) * halfUp(width);
  if (pitches != nullptr) {
    pitches[0] = evenWidth;
    pitches[1] = pitches[2] = halfUp(width);
  }
  if (offsets != nullptr) {
    offsets[1] = lumaSize;
    offsets[2] = lumaSize + chromaSize;
  }
  *size = lumaSize + 2 * chromaSize;
  return true;
}

}  // extern "C"
