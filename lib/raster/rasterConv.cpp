// SPDX-License-Identifier: MIT
//
// Pixel formats: display modes, format codes, and the conversion of one pixel and of rectangles.

#include <type_traits>

#include "host/panicPlace.h"
#include "vector/kernelChoice.h"
#include "raster.h"
#include "convert/rasterConvInternal.h"
#include "ops/rasteropsInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterConv";

constexpr int32 kMaxPseudoColorDepth = 8;

const uint8* asBytes(const void* memory) { return static_cast<const uint8*>(memory); }
uint8* asBytes(void* memory) { return static_cast<uint8*>(memory); }

[[noreturn]] void badPseudoColorDepth(int32 depth, PanicPlace at) {
  unsupportedNumber("Raster convert pixels invalid depth for pseudo color %d\n", depth, at);
}

/// Deliberate: the shifts are those to code 8, so a single pixel of code 6 takes other bits than
/// the top ones of each channel (those of rectangles are right).
template <class From> constexpr uint32 convertOneToCode6(uint32 pixel) {
  using Move = ColorMove<From, Code8>;
  return (shiftedRight<Move::Red::kRight>(pixel) & Code6::Red::kMask) |
         (shiftedRight<Move::Green::kRight>(pixel) & Code6::Green::kMask) |
         (shiftedRight<Move::Blue::kRight>(pixel) & Code6::Blue::kMask);
}

/// A pixel value in another format. One whose channels lie there already stays whole, unused bits
/// included.
template <class From, class To> constexpr uint32 convertOne(uint32 pixel) {
  if constexpr (std::is_same_v<To, Code6>) {
    return convertOneToCode6<From>(pixel);
  } else if constexpr (kSameFields<From, To>) {
    return pixel;
  } else {
    return convertColor<From, To>(pixel);
  }
}

/// `read` gives the value; it is called only when the destination is known to be right.
template <class From, class Read> uint32 convertOneFrom(int32 dstDepth, Read read) {
  uint32 result = 0;
  const bool known = withFormat<DestinationFormats>(dstDepth, [&](auto to, size_t /*index*/) {
    result = convertOne<From, decltype(to)>(read());
  });
  if (!known) unsupportedNumber("Raster convert one pixel invalid depth %d\n", dstDepth, kSource);
  return result;
}

uint32 convertPaletteEntry(uint32 pixel, int32 srcDepth, int32 dstDepth, const uint32* palette) {
  if (srcDepth != kMaxPseudoColorDepth) badPseudoColorDepth(srcDepth, kSource);
  return convertOneFrom<Code32>(dstDepth,
                                [=] { return loadPixel<4>(entryAt(asBytes(palette), pixel)); });
}

uint32 convertColorPixel(uint32 pixel, int32 srcDepth, int32 dstDepth) {
  uint32 result = 0;
  const bool known = withFormat<SourceFormats>(srcDepth, [&](auto from, size_t /*index*/) {
    result = convertOneFrom<decltype(from)>(dstDepth, [=] { return pixel; });
  });
  if (!known)
    unsupportedNumber("Raster convert one pixel invalid source depth %d\n", srcDepth, kSource);
  return result;
}

uint32 convertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth, bool pseudoColor,
                       const uint32* palette) {
  return pseudoColor ? convertPaletteEntry(pixel, srcDepth, dstDepth, palette)
                     : convertColorPixel(pixel, srcDepth, dstDepth);
}

/// A rectangle to be converted: the buffers and the positions in them.
struct Rectangle {
  uint8* dst;
  uint32 dstPitch;
  const uint8* src;
  uint32 srcPitch;
  uint32 srcX, srcY, dstX, dstY, width, height;
};

/// Codes that are no formats are copied too, by their eighth.
uint32 bytesPerPixelOf(int32 depth) {
  uint32 bytes = static_cast<uint32>(depth / 8);
  withFormat<DestinationFormats>(
      depth, [&](auto format, size_t /*index*/) { bytes = decltype(format)::kBytes; });
  return bytes;
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
  const ConvertKernel kernel = chosenKernels<lookUpConvert>()[srcIndex][dstIndex];
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
  kernel(rows.joined(size_t{r.width} * srcBytes), asBytes(palette));
}

/// Converts to a destination format that is one of the list; returns false otherwise.
bool convertTo(const Rectangle& r, int32 dstDepth, size_t srcIndex, uint32 srcBytes,
               const uint32* palette) {
  return withFormat<DestinationFormats>(dstDepth, [&](auto to, size_t dstIndex) {
    convertRectangle(r, srcIndex, srcBytes, dstIndex, decltype(to)::kBytes, palette);
  });
}

[[noreturn]] void badSourceDepth(int32 depth, PanicPlace at) {
  unsupportedNumber("Raster convert pixels invalid source depth %d\n", depth, at);
}

[[noreturn]] void badDepth(int32 depth, PanicPlace at) {
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
  raster::convertPixels({raster::asBytes(dst), dstPitch, raster::asBytes(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        dstDepth, srcDepth, pseudoColor, palette);
}

void Raster_ConvertPixelsTo32(uint32* dst, uint32 dstPitch, const void* src, uint32 srcPitch,
                              int32 srcDepth, bool pseudoColor, const uint32* palette, uint32 srcX,
                              uint32 srcY, uint32 dstX, uint32 dstY, uint32 width, uint32 height) {
  raster::convertPixels({raster::asBytes(dst), dstPitch, raster::asBytes(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        raster::Code32::kCode, srcDepth, pseudoColor, palette);
}

void Raster_ConvertPixelsFrom32(void* dst, uint32 dstPitch, int32 dstDepth, const uint32* src,
                                uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY,
                                uint32 width, uint32 height) {
  raster::convertPixels({raster::asBytes(dst), dstPitch, raster::asBytes(src), srcPitch, srcX, srcY,
                         dstX, dstY, width, height},
                        dstDepth, raster::Code32::kCode, false, nullptr);
}

void Raster_CopyPixels(void* dst, uint32 dstPitch, const void* src, uint32 srcPitch, int32 depth,
                       uint32 srcX, uint32 srcY, uint32 dstX, uint32 dstY, uint32 width,
                       uint32 height) {
  raster::copyPixels({raster::asBytes(dst), dstPitch, raster::asBytes(src), srcPitch, srcX, srcY,
                      dstX, dstY, width, height},
                     depth);
}

}  // extern "C"
