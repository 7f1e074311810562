// SPDX-License-Identifier: MIT

#include "reference/rasterConvReference.h"

#include "reference/unknown.h"

namespace reference {
namespace {

struct Color {
  uint32 red, green, blue;
};

/// The masks of a one-byte format.
Color lowDepthMasks(int32 depth) {
  if (depth == 3) return {0x04, 0x20, 0x80};
  if (depth == 6) return {0x30, 0x0C, 0x03};
  if (depth == 8) return {0x07, 0x38, 0xC0};
  unknown("destination format", static_cast<uint32>(depth));
}

uint32 widen5(uint32 v) { return (v << 3) | (v >> 2); }
uint32 widen6(uint32 v) { return (v << 2) | (v >> 4); }

uint32 join(const Color& c) { return (c.red << 16) | (c.green << 8) | c.blue; }

uint32 widen16(uint32 p) {
  return join({widen5((p >> 11) & 31), widen6((p >> 5) & 63), widen5(p & 31)});
}
uint32 widen15(uint32 p) {
  return join({widen5((p >> 10) & 31), widen5((p >> 5) & 31), widen5(p & 31)});
}

uint32 narrowTo16(uint32 c) {
  return ((c >> 8) & 0xF800) | ((c >> 5) & 0x07E0) | ((c >> 3) & 0x001F);
}
uint32 narrowTo15(uint32 c) {
  return ((c >> 9) & 0x7C00) | ((c >> 6) & 0x03E0) | ((c >> 3) & 0x001F);
}
uint32 from16To15(uint32 p) { return (p & 0x001F) | ((p >> 1) & 0x7FE0); }
uint32 from15To16(uint32 p) { return ((p & 0x7FE0) << 1) | ((p & 0x0200) >> 4) | (p & 0x001F); }

uint32 oneFrom32(uint32 p, int32 dstDepth) {
  if (dstDepth == 24 || dstDepth == 32) return p;
  if (dstDepth == 16) return narrowTo16(p);
  if (dstDepth == 15) return narrowTo15(p);
  const Color masks = lowDepthMasks(dstDepth);
  return ((p >> 21) & masks.red) | ((p >> 10) & masks.green) | (p & masks.blue);
}

uint32 oneFrom16(uint32 p, int32 dstDepth) {
  if (dstDepth == 24 || dstDepth == 32) return widen16(p);
  if (dstDepth == 16) return p;
  if (dstDepth == 15) return from16To15(p);
  const Color masks = lowDepthMasks(dstDepth);
  return ((p >> 13) & masks.red) | ((p >> 5) & masks.green) | ((p << 3) & masks.blue);
}

uint32 oneFrom15(uint32 p, int32 dstDepth) {
  if (dstDepth == 24 || dstDepth == 32) return widen15(p);
  if (dstDepth == 16) return from15To16(p);
  if (dstDepth == 15) return p;
  const Color masks = lowDepthMasks(dstDepth);
  return ((p >> 12) & masks.red) | ((p >> 4) & masks.green) | ((p << 3) & masks.blue);
}

/// A channel whose top bit is bit top - 1 of `source`, under the mask of a one-byte format.
uint32 underMask(uint32 source, int top, uint32 mask) {
  int length = 0;
  for (uint32 m = mask; m != 0; m >>= 1) ++length;
  const int shift = top - length;
  return (shift >= 0 ? source >> shift : source << -shift) & mask;
}

uint32 toLowDepth(const Color& source, const Color& tops, int32 dstDepth) {
  const Color masks = lowDepthMasks(dstDepth);
  return underMask(source.red, static_cast<int>(tops.red), masks.red) |
         underMask(source.green, static_cast<int>(tops.green), masks.green) |
         underMask(source.blue, static_cast<int>(tops.blue), masks.blue);
}

bool isLowDepth(int32 depth) { return depth == 3 || depth == 6 || depth == 8; }

uint32 bulkFrom32(uint32 c, int32 dstDepth) {
  if (isLowDepth(dstDepth)) return toLowDepth({c, c, c}, {24, 16, 8}, dstDepth);
  if (dstDepth == 15) return narrowTo15(c);
  if (dstDepth == 16) return narrowTo16(c);
  if (dstDepth == 24 || dstDepth == 32) return c;
  unknown("destination format", static_cast<uint32>(dstDepth));
}

uint32 bulkFrom24(uint32 p, int32 dstDepth) {
  const Color c = {p >> 16, (p >> 8) & 0xFF, p & 0xFF};
  if (isLowDepth(dstDepth)) return toLowDepth(c, {8, 8, 8}, dstDepth);
  if (dstDepth == 15) return ((c.red << 7) & 0x7C00) | ((c.green << 2) & 0x3E0) | (c.blue >> 3);
  if (dstDepth == 16) return ((c.red << 8) & 0xF800) | ((c.green << 3) & 0x7E0) | (c.blue >> 3);
  if (dstDepth == 32) return 0xFF000000u | p;
  unknown("destination format", static_cast<uint32>(dstDepth));
}

uint32 bulkFrom16(uint32 p, int32 dstDepth) {
  if (isLowDepth(dstDepth)) return toLowDepth({p, p, p}, {16, 11, 5}, dstDepth);
  if (dstDepth == 15) return from16To15(p);
  if (dstDepth == 24 || dstDepth == 32) return 0xFF000000u | widen16(p);
  unknown("destination format", static_cast<uint32>(dstDepth));
}

uint32 bulkFrom15(uint32 p, int32 dstDepth) {
  if (isLowDepth(dstDepth)) return toLowDepth({p, p, p}, {15, 10, 5}, dstDepth);
  if (dstDepth == 16) return from15To16(p);
  if (dstDepth == 24 || dstDepth == 32) return 0xFF000000u | widen15(p);
  unknown("destination format", static_cast<uint32>(dstDepth));
}

uint32 bulk(uint32 pixel, int32 srcDepth, int32 dstDepth) {
  if (srcDepth == 15) return bulkFrom15(pixel, dstDepth);
  if (srcDepth == 16) return bulkFrom16(pixel, dstDepth);
  if (srcDepth == 24) return bulkFrom24(pixel, dstDepth);
  if (srcDepth == 32) return bulkFrom32(pixel, dstDepth);
  unknown("source format", static_cast<uint32>(srcDepth));
}

uint32 bytesOf(int32 depth) {
  if (depth == 15) return 2;
  if (depth == 3 || depth == 6) return 1;
  return static_cast<uint32>(depth) / 8;
}

/// The byte index of a pixel when pixels of 2 and 4 bytes are counted in whole pixels.
size_t pixelIndex(const Spot& spot, uint32 x, uint32 y, uint32 bytes) {
  if (bytes == 2 || bytes == 4)
    return spot.base + (size_t{spot.pitch / bytes} * (spot.y + y) + spot.x + x) * bytes;
  return spot.base + size_t{spot.pitch} * (spot.y + y) + size_t{spot.x + x} * bytes;
}

}  // namespace

uint32 convertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth, bool pseudoColor,
                       const std::vector<uint32>& palette) {
  if (pseudoColor) return oneFrom32(palette.at(pixel), dstDepth);
  if (srcDepth == 15) return oneFrom15(pixel, dstDepth);
  if (srcDepth == 16) return oneFrom16(pixel, dstDepth);
  if (srcDepth == 24 || srcDepth == 32) return oneFrom32(pixel, dstDepth);
  unknown("source format", static_cast<uint32>(srcDepth));
}

void copyPixels(Bytes& dst, const Spot& to, const Bytes& src, const Spot& from, int32 depth,
                uint32 width, uint32 height) {
  const uint32 bytes = bytesOf(depth);
  for (uint32 y = 0; y < height; ++y) {
    for (uint32 i = 0; i < width * bytes; ++i)
      dst.at(to.base + size_t{to.pitch} * (to.y + y) + size_t{to.x} * bytes + i) =
          src.at(from.base + size_t{from.pitch} * (from.y + y) + size_t{from.x} * bytes + i);
  }
}

void convertPixels(Bytes& dst, const Spot& to, int32 dstDepth, const Bytes& src, const Spot& from,
                   int32 srcDepth, bool pseudoColor, const std::vector<uint32>& palette,
                   uint32 width, uint32 height) {
  if (!pseudoColor && srcDepth == dstDepth) {
    copyPixels(dst, to, src, from, dstDepth, width, height);
    return;
  }
  const uint32 srcBytes = pseudoColor ? 1 : bytesOf(srcDepth);
  const uint32 dstBytes = bytesOf(dstDepth);
  for (uint32 y = 0; y < height; ++y) {
    for (uint32 x = 0; x < width; ++x) {
      uint32 pixel = 0;
      for (uint32 i = 0; i < srcBytes; ++i)
        pixel |= static_cast<uint32>(src.at(pixelIndex(from, x, y, srcBytes) + i)) << (8 * i);
      const uint32 result =
          pseudoColor ? bulkFrom32(palette.at(pixel), dstDepth) : bulk(pixel, srcDepth, dstDepth);
      for (uint32 i = 0; i < dstBytes; ++i)
        dst.at(pixelIndex(to, x, y, dstBytes) + i) = static_cast<uint8>(result >> (8 * i));
    }
  }
}

}  // namespace reference
