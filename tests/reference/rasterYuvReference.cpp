// SPDX-License-Identifier: MIT

#include "reference/rasterYuvReference.h"

#include <cstdlib>

namespace reference {
namespace {

/// The quotient by 256, toward minus infinity, limited to a byte.
uint32 toByte(int sum) {
  int quotient = sum / 256;
  if (sum % 256 < 0) --quotient;
  if (quotient < 0) return 0;
  return quotient > 255 ? 255 : static_cast<uint32>(quotient);
}

void store(Bytes& dst, size_t pixelIndex, int bppdepth, uint32 pixel) {
  for (size_t k = 0; k < bytesOf(bppdepth); ++k)
    dst.at(pixelIndex * bytesOf(bppdepth) + k) = static_cast<uint8>(pixel >> (8 * k));
}

/// The bytes of a group by format: two lumas, then the red- and the blue-difference.
struct GroupOrder {
  size_t y0, y1, cr, cb;
};

void packedToRgb(const Bytes& src, Bytes& dst, size_t groups, GroupOrder at, int bppdepth) {
  for (size_t g = 0; g < groups; ++g) {
    const uint8 cr = src.at(4 * g + at.cr);
    const uint8 cb = src.at(4 * g + at.cb);
    store(dst, 2 * g, bppdepth,
          packPixel(yuvToPixel(src.at(4 * g + at.y0), cb, cr, 128), bppdepth));
    store(dst, 2 * g + 1, bppdepth,
          packPixel(yuvToPixel(src.at(4 * g + at.y1), cb, cr, 128), bppdepth));
  }
}

void planarToRgb(const Bytes& src, Bytes& dst, uint32 width, uint32 height, int bppdepth) {
  const VideoAttributes frame = videoAttributes(RASTER_VIDEO_YV12, width, height);
  size_t out = 0;  // the top left pixel of the row pair
  for (uint32 j = 0; j < height / 2; ++j) {
    for (uint32 i = 0; i < width / 2; ++i) {
      const uint8 cb = src.at(frame.offsets[1] + size_t{j} * frame.pitches[1] + i);
      const uint8 cr = src.at(frame.offsets[2] + size_t{j} * frame.pitches[2] + i);
      for (uint32 dy = 0; dy < 2; ++dy) {
        for (uint32 dx = 0; dx < 2; ++dx) {
          const uint8 y = src.at(size_t{2 * j + dy} * frame.pitches[0] + 2 * i + dx);
          store(dst, out + size_t{dy} * width + 2 * i + dx, bppdepth,
                packPixel(yuvToPixel(y, cb, cr, 128), bppdepth));
        }
      }
    }
    out += 2 * (width / 2) + width;
  }
}

}  // namespace

VideoAttributes videoAttributes(uint32 format, uint32 width, uint32 height) {
  VideoAttributes frame;
  const uint32 evenWidth = (width + 1) / 2 * 2;
  const uint32 evenHeight = (height + 1) / 2 * 2;
  if (format != RASTER_VIDEO_YV12) {
    frame.size = height * 2 * evenWidth;
    return frame;
  }
  const uint32 chroma = (height + 1) / 2 * ((width + 1) / 2);
  frame.pitches = {evenWidth, (width + 1) / 2, (width + 1) / 2};
  frame.offsets = {0, evenWidth * evenHeight, evenWidth * evenHeight + chroma};
  frame.size = evenWidth * evenHeight + 2 * chroma;
  return frame;
}

uint32 yuvToPixel(int y, int cb, int cr, int rounding) {
  const uint32 r = toByte(298 * (y - 16) + 409 * (cr - 128) + rounding);
  const uint32 g = toByte(298 * (y - 16) - 100 * (cb - 128) - 208 * (cr - 128) + rounding);
  const uint32 b = toByte(298 * (y - 16) + 516 * (cb - 128) + rounding);
  return r * 65536 + g * 256 + b;
}

uint32 packPixel(uint32 rgb, int bppdepth) {
  const uint32 r = rgb / 65536;
  const uint32 g = rgb / 256 % 256;
  const uint32 b = rgb % 256;
  if (bppdepth == 15) return r / 8 * 2048 + g / 8 * 64 + b / 8 * 2;
  if (bppdepth == 16) return r / 8 * 2048 + g / 4 * 32 + b / 8;
  return rgb;
}

uint32 bytesOf(int bppdepth) { return static_cast<uint32>(bppdepth + 1) / 8; }

void yuvToRgb(const Bytes& src, Bytes& dst, uint32 width, uint32 height, uint32 format,
              int bppdepth) {
  const size_t groups = size_t{width} * height / 2;
  if (format == RASTER_VIDEO_YUY2) {
    packedToRgb(src, dst, groups, {.y0 = 0, .y1 = 2, .cr = 1, .cb = 3}, bppdepth);
  } else if (format == RASTER_VIDEO_UYVY) {
    packedToRgb(src, dst, groups, {.y0 = 1, .y1 = 3, .cr = 0, .cb = 2}, bppdepth);
  } else if (format == RASTER_VIDEO_YV12) {
    planarToRgb(src, dst, width, height, bppdepth);
  } else {
    abort();
  }
}

RgbParam makeRgbParam(uint32 bits, uint32 mask) {
  uint32 low = 0;
  while ((mask >> low) % 2 == 0) ++low;
  uint32 run = 0;
  while (low + run < 32 && (mask >> (low + run)) % 2 == 1) ++run;
  uint32 total = 0;
  while (total < run) total += bits;
  // (2^total - 1) / (2^bits - 1) has a set bit at every multiple of `bits` below `total`.
  uint64 multiplier = 0;
  for (uint32 at = 0; at < total; at += bits) multiplier |= uint64{1} << at;
  RgbParam param{0, 0, mask};
  if (total >= run + low) {
    param.shift = total - run - low;
  } else {
    multiplier <<= low - (total - run);
  }
  param.multiplier = static_cast<uint32>(multiplier);
  return param;
}

}  // namespace reference
