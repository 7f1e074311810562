// SPDX-License-Identifier: MIT
//
// Pixel formats: display modes, format codes, and the conversion of one pixel and of rectangles.

#include "panicPlace.h"
#include "raster.h"
#include "rasterConvInternal.h"
#include "rasteropsInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterConv";

constexpr int32 kMaxPseudoColorDepth = 8;

const uint8* bytesOf(const void* memory) { return static_cast<const uint8*>(memory); }
uint8* bytesOf(void* memory) { return static_cast<uint8*>(memory); }

[[noreturn]] void badPseudoColorDepth(int32 depth, Place at) {
  unsupportedNumber("Raster convert pixels invalid depth for pseudo color %d\n", depth, at);
}

/// How far right the top bits of a channel are shifted into a one-byte pixel.
struct LowDepthShifts {
  int red, green, blue;
};
template <class From> constexpr LowDepthShifts kLowDepthShifts{21, 10, 0};
template <> constexpr LowDepthShifts kLowDepthShifts<Code16>{13, 5, -3};
template <> constexpr LowDepthShifts kLowDepthShifts<Code15>{12, 4, -3};

/// Deliberate: the shifts are those of the channels of codes 8 and 3 whatever the destination, so
/// code 6 takes other bits than the top ones of each channel (those of rectangles are right).
template <class From, class To> constexpr uint32 convertOneToByte(uint32 pixel) {
  constexpr LowDepthShifts kShifts = kLowDepthShifts<From>;
  return (shiftedRight<kShifts.red>(pixel) & To::Red::kMask) |
         (shiftedRight<kShifts.green>(pixel) & To::Green::kMask) |
         (shiftedRight<kShifts.blue>(pixel) & To::Blue::kMask);
}

/// A pixel value in another format. Values of codes 24 and 32 are the same here, and a value that
/// already has the format stays whole, unused bits included.
template <class From, class To> constexpr uint32 convertOne(uint32 pixel) {
  if constexpr (To::kBytes == 1) {
    return convertOneToByte<From, To>(pixel);
  } else if constexpr (From::kBytes == To::kBytes && From::Green::kBits == To::Green::kBits) {
    return pixel;
  } else {
    return convertColor<From, To>(pixel);
  }
}

/// `read` gives the value; it is called only when the destination is known to be right.
template <class From, class Read> uint32 convertOneFrom(int32 dstDepth, Read read) {
  switch (dstDepth) {
    case 3:
      return convertOne<From, Code3>(read());
    case 6:
      return convertOne<From, Code6>(read());
    case 8:
      return convertOne<From, Code8>(read());
    case 15:
      return convertOne<From, Code15>(read());
    case 16:
      return convertOne<From, Code16>(read());
    case 24:
    case 32:
      return convertOne<From, Code32>(read());
    default:
      unsupportedNumber("Raster convert one pixel invalid depth %d\n", dstDepth, kSource);
  }
}

uint32 convertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth, bool pseudoColor,
                       const uint32* palette) {
  if (pseudoColor) {
    if (srcDepth != kMaxPseudoColorDepth) badPseudoColorDepth(srcDepth, kSource);
    return convertOneFrom<Code32>(dstDepth,
                                  [=] { return loadPixel<4>(entryAt(bytesOf(palette), pixel)); });
  }
  const auto value = [=] { return pixel; };
  switch (srcDepth) {
    case 15:
      return convertOneFrom<Code15>(dstDepth, value);
    case 16:
      return convertOneFrom<Code16>(dstDepth, value);
    case 24:
    case 32:
      return convertOneFrom<Code32>(dstDepth, value);
    default:
      unsupportedNumber("Raster convert one pixel invalid source depth %d\n", srcDepth, kSource);
  }
}

/// A rectangle to be converted: the buffers and the positions in them.
struct Rectangle {
  uint8* dst;
  uint32 dstPitch;
  const uint8* src;
  uint32 srcPitch;
  uint32 srcX, srcY, dstX, dstY, width, height;
};

uint32 bytesPerPixelOf(int32 depth) {
  if (depth == 3 || depth == 6) return 1;
  return depth == 15 ? 2 : static_cast<uint32>(depth / 8);
}

void copyPixels(const Rectangle& r, int32 depth) {
  const uint32 bytesPerPixel = bytesPerPixelOf(depth);
  const size_t bytes = size_t{r.width} * bytesPerPixel;
  if (bytes == 0) return;
  const RowPair rows = {.dst = rowAt(r.dst, pitchOf(r.dstPitch), r.dstY, r.dstX, bytesPerPixel),
                        .dstStep = pitchOf(r.dstPitch),
                        .src = rowAt(r.src, pitchOf(r.srcPitch), r.srcY, r.srcX, bytesPerPixel),
                        .srcStep = pitchOf(r.srcPitch),
                        .bytes = bytes,
                        .rows = r.height};
  copyRows(rows.joined());
}

/// Runs the kernel for a pair of formats, given by their indices in the table.
void convertRectangle(const Rectangle& r, size_t srcIndex, uint32 srcBytes, size_t dstIndex,
                      uint32 dstBytes, const uint32* palette) {
  const ConvertKernel kernel = convertKernels()[srcIndex][dstIndex];
  if (kernel == nullptr) notReached(kSource);
  if (r.width == 0) return;
  // Deliberate: 2- and 4-byte pixels are indexed as whole pixels, so the rounded pitch counts for
  // the first row as well as for the steps (a fill takes the full one for the first row).
  const intptr_t dstStep = rowStep(pitchOf(r.dstPitch), dstBytes);
  const intptr_t srcStep = rowStep(pitchOf(r.srcPitch), srcBytes);
  const RowPair rows = {.dst = rowAt(r.dst, dstStep, r.dstY, r.dstX, dstBytes),
                        .dstStep = dstStep,
                        .src = rowAt(r.src, srcStep, r.srcY, r.srcX, srcBytes),
                        .srcStep = srcStep,
                        .bytes = size_t{r.width} * dstBytes,
                        .rows = r.height};
  kernel(rows.joined(size_t{r.width} * srcBytes), bytesOf(palette));
}

/// Converts to a destination format that is one of the list; returns false otherwise.
bool convertTo(const Rectangle& r, int32 dstDepth, size_t srcIndex, uint32 srcBytes,
               const uint32* palette) {
  return withFormat<DestinationFormats>(dstDepth, [&](auto to, size_t dstIndex) {
    convertRectangle(r, srcIndex, srcBytes, dstIndex, decltype(to)::kBytes, palette);
  });
}

[[noreturn]] void badSourceDepth(int32 depth, Place at) {
  unsupportedNumber("Raster convert pixels invalid source depth %d\n", depth, at);
}

[[noreturn]] void badDepth(int32 depth, Place at) {
  unsupportedNumber("Raster convert pixels invalid depth %d\n", depth, at);
}

void convertFromPalette(const Rectangle& r, int32 dstDepth, int32 srcDepth, const uint32* palette) {
  if (srcDepth > kMaxPseudoColorDepth) badPseudoColorDepth(srcDepth, kSource);
  if (!convertTo(r, dstDepth, kPaletteSource, 1, palette)) badDepth(dstDepth, kSource);
}

/// Converts between formats, the same ones too: a pair that is copied must not come here.
void convertColors(const Rectangle& r, int32 dstDepth, int32 srcDepth) {
  const bool known = withFormat<SourceFormats>(srcDepth, [&](auto from, size_t srcIndex) {
    if (!convertTo(r, dstDepth, srcIndex, decltype(from)::kBytes, nullptr))
      badDepth(dstDepth, kSource);
  });
  if (!known) badSourceDepth(srcDepth, kSource);
}

/// Equal codes are copied whatever they are: bytes are bytes.
void convertPixels(const Rectangle& r, int32 dstDepth, int32 srcDepth, bool pseudoColor,
                   const uint32* palette) {
  if (pseudoColor) {
    convertFromPalette(r, dstDepth, srcDepth, palette);
  } else if (srcDepth == dstDepth) {
    copyPixels(r, srcDepth);
  } else {
    convertColors(r, dstDepth, srcDepth);
  }
}

}  // namespace
}  // namespace raster

extern "C" {

bool Raster_IsModeReasonable(uint32 depth, uint32 bpp, bool pseudoColor) {
  if (pseudoColor) return bpp == 8;
  if (bpp == 16) return depth == 15 || depth == 16;
  // Deliberate: depth 32 is refused; a mode with an unused byte has depth 24.
  return (bpp == 24 || bpp == 32) && depth == 24;
}

uint32 Raster_GetBPPDepth(uint32 depth, uint32 bpp) {
  return depth == 24 && bpp == 32 ? 32 : depth;
}

uint32 Raster_ConvertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth, bool pseudoColor,
                              const uint32* palette) {
  return raster::convertOnePixel(pixel, srcDepth, dstDepth, pseudoColor, palette);
}

void Raster_ConvertPixels(void* dst, uint32 dstPitch, int32 dstDepth, const void* src,
                          uint32 srcPitch, int32 srcDepth, bool pseudoColor, const uint32* palette,
                          uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY, uint32 width,
                          uint32 height) {
  raster::convertPixels({raster::bytesOf(dst), dstPitch, raster::bytesOf(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        dstDepth, srcDepth, pseudoColor, palette);
}

void Raster_ConvertPixelsTo32(uint32* dst, uint32 dstPitch, const void* src, uint32 srcPitch,
                              int32 srcDepth, bool pseudoColor, const uint32* palette, uint32 srcX,
                              uint32 srcY, uint32 dstX, uint32 dstY, uint32 width, uint32 height) {
  raster::convertPixels({raster::bytesOf(dst), dstPitch, raster::bytesOf(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        raster::Code32::kCode, srcDepth, pseudoColor, palette);
}

void Raster_ConvertPixelsFrom32(void* dst, uint32 dstPitch, int32 dstDepth, const uint32* src,
                                uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
                                uint32 width, uint32 height) {
  raster::convertPixels({raster::bytesOf(dst), dstPitch, raster::bytesOf(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        dstDepth, raster::Code32::kCode, false, nullptr);
}

void Raster_CopyPixels(void* dst, uint32 dstPitch, const void* src, uint32 srcPitch, int32 depth,
                       uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY, uint32 width,
                       uint32 height) {
  raster::copyPixels({raster::bytesOf(dst), dstPitch, raster::bytesOf(src), srcPitch, srcX, srcY,
                      dstX, dstY, width, height},
                     depth);
}

}  // extern "C"
