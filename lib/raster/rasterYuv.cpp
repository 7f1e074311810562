// SPDX-License-Identifier: MIT
//
// YUV video frames to packed RGB.

#include <cassert>

#include "firstTime.h"
#include "frameBuffer.h"
#include "message.h"
#include "raster.h"
#include "videoAttributes.h"

namespace raster {
namespace {

struct Rgb {
  uint32 r, g, b;
};

uint32 clampToByte(int32 v) { return static_cast<uint32>(v < 0 ? 0 : v > 255 ? 255 : v); }

/// BT.601, limited range, in 8 bits of fraction; `rounding` is added before they are dropped.
Rgb toRgb(int32 y, int32 cb, int32 cr, int32 rounding) {
  const int32 luma = 298 * (y - 16) + rounding;
  return {clampToByte((luma + 409 * (cr - 128)) >> 8),
          clampToByte((luma - 100 * (cb - 128) - 208 * (cr - 128)) >> 8),
          clampToByte((luma + 516 * (cb - 128)) >> 8)};
}

template <unsigned kSize, unsigned kRs, unsigned kGs, unsigned kGw, unsigned kBw, unsigned kFs>
struct Packing {
  static constexpr unsigned kBytes = kSize;
  static uint32 pack(Rgb c) {
    return ((((c.r >> kRs) << kGw | c.g >> kGs) << kBw) | c.b >> kRs) << kFs;
  }
};
using Packing15 = Packing<2, 3, 3, 5, 5, 1>;
using Packing16 = Packing<2, 3, 2, 6, 5, 0>;
using Packing24 = Packing<3, 0, 0, 8, 8, 0>;
using Packing32 = Packing<4, 0, 0, 8, 8, 0>;

template <class P> void convertPixel(uint8* dst, uint8 y, uint8 cb, uint8 cr) {
  storePixel<P::kBytes>(dst, P::pack(toRgb(y, cb, cr, 128)));
}

template <class P, unsigned kLuma> void packedGroups(const uint8* src, uint8* dst, size_t groups) {
  for (; groups != 0; --groups, src += 4, dst += 2 * P::kBytes) {
    const uint8 cr = src[1 - kLuma];
    const uint8 cb = src[3 - kLuma];
    convertPixel<P>(dst, src[kLuma], cb, cr);
    convertPixel<P>(dst + P::kBytes, src[kLuma + 2], cb, cr);
  }
}

template <class P>
void planarRows(const uint8* src, uint8* dst, uint32 width, uint32 height, const uint32* pitches,
                const uint32* offsets) {
  const uint8* luma = src;
  const uint8* cb = src + offsets[1];
  const uint8* cr = src + offsets[2];
  const size_t dstPitch = size_t{width} * P::kBytes;
  for (uint32 rows = height / 2; rows != 0; --rows) {
    for (uint32 i = 0; i < width / 2; ++i) {
      for (uint32 x = 2 * i; x < 2 * i + 2; ++x) {
        convertPixel<P>(dst + size_t{x} * P::kBytes, luma[x], cb[i], cr[i]);
        convertPixel<P>(dst + dstPitch + size_t{x} * P::kBytes, luma[pitches[0] + x], cb[i], cr[i]);
      }
    }
    luma += 2 * size_t{pitches[0]};
    cb += pitches[1];
    cr += pitches[2];
    dst += dstPitch + size_t{width / 2 * 2} * P::kBytes;
  }
}

template <class P>
void convertFrame(const uint8* src, uint8* dst, uint32 width, uint32 height, uint32 format) {
  uint32 size = 0;
  uint32 pitches[3];
  uint32 offsets[3];
  const size_t groups = size_t{width} * height / 2;
  switch (format) {
    case kFormatYuy2:
      return packedGroups<P, 0>(src, dst, groups);
    case kFormatUyvy:
      return packedGroups<P, 1>(src, dst, groups);
    case kFormatYv12:
      RasterComputeVideoAttributes(format, width, height, &size, pitches, offsets);
      return planarRows<P>(src, dst, width, height, pitches, offsets);
    default:
      break;
  }
  static constinit std::atomic<bool> said{false};
  if (firstTime(said)) Log("%s: format:%u not supported.\n", "Raster_YUVtoRGB", format);
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_YUVtoRGB(const uint8* src, uint8* dst, uint32 width, uint32 height, uint32 format,
                     int32 bppdepth) {
  using namespace raster;
  switch (bppdepth) {
    case 15:
      return convertFrame<Packing15>(src, dst, width, height, format);
    case 16:
      return convertFrame<Packing16>(src, dst, width, height, format);
    case 24:
      return convertFrame<Packing24>(src, dst, width, height, format);
    case 32:
      return convertFrame<Packing32>(src, dst, width, height, format);
    default:
      break;
  }
  static constinit std::atomic<bool> said{false};
  if (firstTime(said)) Log("%s: bppdepth:%d not supported.\n", "Raster_YUVtoRGB", bppdepth);
}

uint32 RasterRGB_YUVtoBGRX(uint8 y, uint8 u, uint8 v) {
  return raster::Packing32::pack(raster::toRgb(y, u, v, 0));
}

uint32 RasterRGB_MakeRGBParam(RasterRGBParam* param, uint32 bits, uint32 mask) {
  assert(bits != 0 && mask != 0);
  const int32 low = __builtin_ctz(mask);
  const uint32 field = mask >> low;
  const int32 run = ~field == 0 ? 32 : __builtin_ctz(~field);
  const int32 step = static_cast<int32>(bits);
  const int32 total = (run + step - 1) / step * step;
  // Up to 2^63: a total of more than 63 bits comes of components over 32 bits wide.
  const uint64 multiplier = ((uint64{1} << total) - 1) / ((uint64{1} << bits) - 1);
  const int32 shift = total - run - low;
  param->multiplier = static_cast<uint32>(shift < 0 ? multiplier << -shift : multiplier);
  param->shift = static_cast<uint32>(shift < 0 ? 0 : shift);
  param->mask = mask;
  return param->multiplier;
}

}  // extern "C"
