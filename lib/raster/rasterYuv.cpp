// SPDX-License-Identifier: MIT
//
// YUV video frames to packed RGB.

#include <atomic>
#include <cassert>

#include "host/firstTime.h"
#include "vector/kernelChoice.h"
#include "raster.h"
#include "video/videoAttributes.h"
#include "video/rasterYuvInternal.h"
#include "video/videoColor.h"

namespace raster {
namespace {

/// An output format: its place in the kernel table and its pixel size.
struct Output {
  uint32 index;
  uint32 bytes;
};
constexpr Output kNoOutput = {4, 0};

constexpr Output outputOf(int32 bppdepth) {
  switch (bppdepth) {
    case 15:
      return {0, 2};
    case 16:
      return {1, 2};
    case 24:
      return {2, 3};
    case 32:
      return {3, 4};
    default:
      return kNoOutput;
  }
}

YuvFrame packedFrame(const uint8* src, uint8* dst, uint32 width, uint32 height) {
  const size_t groups = static_cast<size_t>(uint64{width} * height / 2);
  return {.luma = {src, 0}, .groups = groups, .rowSets = 1, .dst = dst};
}

/// Deliberate: with an odd width the output of every row pair begins one pixel earlier than its
/// row does, as the pairs before it moved on by whole groups.
YuvFrame planarFrame(const uint8* src, uint8* dst, uint32 width, uint32 height, uint32 bytes) {
  uint32 size = 0;
  uint32 pitches[3];
  uint32 offsets[3];
  RasterComputeVideoAttributes(RASTER_VIDEO_YV12, width, height, &size, pitches, offsets);
  const size_t dstPitch = size_t{width} * bytes;
  return {.luma = {src + offsets[0], 2 * size_t{pitches[0]}},
          .cb = {src + offsets[1], pitches[1]},
          .cr = {src + offsets[2], pitches[2]},
          .lumaPitch = pitches[0],
          .groups = width / 2,
          .rowSets = height / 2,
          .dst = dst,
          .dstPitch = dstPitch,
          .dstStep = dstPitch + size_t{width / 2 * 2} * bytes};
}

void yuvToRgb(const uint8* src, uint8* dst, uint32 width, uint32 height, uint32 format,
              Output output) {
  const YuvKernels& kernels = chosenKernels<lookUpYuv>();
  switch (format) {
    case RASTER_VIDEO_YUY2:
      return kernels.convert[0][output.index](packedFrame(src, dst, width, height));
    case RASTER_VIDEO_UYVY:
      return kernels.convert[1][output.index](packedFrame(src, dst, width, height));
    case RASTER_VIDEO_YV12:
      return kernels.convert[2][output.index](planarFrame(src, dst, width, height, output.bytes));
    default:
      break;
  }
  static constinit std::atomic<bool> said{false};
  logOnce(said, "%s: format:%u not supported.\n", "Raster_YUVtoRGB", format);
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_YUVtoRGB(const uint8* src, uint8* dst, uint32 width, uint32 height, uint32 format,
                     int32 bppdepth) {
  using namespace raster;
  const Output output = outputOf(bppdepth);
  if (output.bytes != 0) return yuvToRgb(src, dst, width, height, format, output);
  static constinit std::atomic<bool> said{false};
  logOnce(said, "%s: bppdepth:%d not supported.\n", "Raster_YUVtoRGB",
          static_cast<uint32>(bppdepth));
}

uint32 RasterRGB_YUVtoBGRX(uint8 y, uint8 u, uint8 v) {
  const raster::Rgb c = raster::colorOf(y, u, v, 0);
  return c.r << 16 | c.g << 8 | c.b;
}

uint32 RasterRGB_MakeRGBParam(RasterRGBParam* param, uint32 bits, uint32 mask) {
  assert(bits != 0 && bits <= 32 && mask != 0);
  const uint32 low = static_cast<uint32>(__builtin_ctz(mask));
  const uint32 field = mask >> low;
  const uint32 run = field == ~0u ? 32 : static_cast<uint32>(__builtin_ctz(~field));
  const uint32 total = (run + bits - 1) / bits * bits;  // at most 62
  const uint64 multiplier = ((uint64{1} << total) - 1) / ((uint64{1} << bits) - 1);
  const int32 shift = static_cast<int32>(total - run) - static_cast<int32>(low);
  param->multiplier = static_cast<uint32>(shift < 0 ? multiplier << -shift : multiplier);
  param->shift = static_cast<uint32>(shift < 0 ? 0 : shift);
  param->mask = mask;
  return param->multiplier;
}

}  // extern "C"
