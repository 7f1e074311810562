// SPDX-License-Identifier: MIT
//
// Alpha blending: fourteen operators onto six destination formats, in place and staged.

#include "blend/alphaBlendInternal.h"

#include <algorithm>
#include <utility>

#include "divisionByZero.h"
#include "host/panicPlace.h"
#include "vector/kernelChoice.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/alphaBlend";
constexpr int kBadFormatLine = 205;  // part of the message, whatever line the call stands on
constexpr int kBadFormatBug = 19864;

/// A destination format: the depth and the bits per pixel (0: any) that ask for it, the size of its
/// pixels, and its kernels.
struct DestinationFormat {
  uint32 depth;
  uint32 bpp;
  uint32 bytes;
  const FormatKernels& (*kernels)();
};
template <auto kLookUp, size_t kIndex> const FormatKernels& kernelsAt() {
  return (&chosenKernels<kLookUp>())[kIndex];
}

/// Formats by operators by flags. Deliberate: bits per pixel decide for depth 24 only.
constexpr DestinationFormat kFormats[] = {
    {6, 0, 1, kernelsAt<lookUpBlend8, 0>},    {8, 0, 1, kernelsAt<lookUpBlend8, 1>},
    {15, 0, 2, kernelsAt<lookUpBlend16, 0>},  {16, 0, 2, kernelsAt<lookUpBlend16, 1>},
    {24, 24, 3, kernelsAt<lookUpBlend32, 0>}, {24, 32, 4, kernelsAt<lookUpBlend32, 1>}};

const DestinationFormat& formatFor(uint32 depth, uint32 bpp) {
  for (const DestinationFormat& format : kFormats) {
    if (format.depth == depth && (format.bpp == 0 || format.bpp == bpp)) return format;
  }
  assertFailed({kSource, kBadFormatLine}, kBadFormatBug);
}

/// (255 - da) / da, at most 255. Deliberate: a destination alpha of 0 faults as the division does.
uint8 saturateShare(uint32 da) {
  if (da == 0) divisionByZero();
  return static_cast<uint8>(std::min(255u, (255 - da) / da));
}

BlendRect rowsOf(const BlendCall& call, uint32 bytes) {
  const bool scalesSrc = (call.flags & RASTER_BLEND_USE_SRC_ALPHA) != 0;
  const bool scalesDst = (call.flags & RASTER_BLEND_USE_DST_ALPHA) != 0;
  const auto dstAlpha = static_cast<uint8>(scalesDst ? call.dstAlpha : 255);
  BlendRect rect{};
  rect.dstStep = call.dst.pitch;
  rect.dst = call.dst.pixel(bytes);
  rect.srcStep = call.src.pitch;
  rect.before = rect.dst;
  rect.beforeStep = rect.dstStep;
  rect.src = call.src.pixel(4);
  rect.width = call.width;
  rect.height = call.height;
  rect.srcAlpha = static_cast<uint8>(scalesSrc ? call.srcAlpha : 255);
  rect.dstAlpha = dstAlpha;
  rect.saturateShare = call.op == RASTER_BLEND_SATURATE ? saturateShare(dstAlpha) : uint8{0};
  return rect;
}

/// Which constants of a call count: those of 255 change nothing.
uint32 flagsThatCount(const BlendRect& rect) {
  return (rect.srcAlpha != 255 ? RASTER_BLEND_USE_SRC_ALPHA : 0) |
         (rect.dstAlpha != 255 ? RASTER_BLEND_USE_DST_ALPHA : 0);
}

/// Whether destination and source, with what lies between their rows, share no byte.
bool isApart(const BlendRect& rect, uint32 bytes) {
  return RowSpan(rect.dst, rect.dstStep, rect.width * bytes, rect.height)
      .isApartFrom(RowSpan(rect.src, rect.srcStep, rect.width * 4, rect.height));
}

/// Whether a kernel, which reads some pixels ahead of those that it has written, gives what the
/// walk from pixel to pixel gives.
bool mayReadAhead(const BlendRect& r, uint32 bytes) {
  if (isApart(r, bytes)) return true;
  const auto dst = reinterpret_cast<uintptr_t>(r.dst);
  return bytes == 4 && r.height == 1 && dst <= reinterpret_cast<uintptr_t>(r.src);
}

/// Blends one pixel after the other.
void blendByPixels(BlendRect row, uint32 bytes, const BlendKernel& kernel) {
  const size_t width = std::exchange(row.width, 1);
  for (size_t x = 0; x < width; ++x, row.src += 4) {
    kernel.blend(row);
    row.dst += bytes;
    row.before = row.dst;
  }
}

/// Blends rows that overlap their sources, one by one and pixel by pixel where it matters.
void blendOverlapping(const BlendRect& all, uint32 bytes, const BlendKernel& kernel) {
  BlendRect row = all;
  row.height = 1;
  for (uint32 y = 0; y < all.height; ++y) {
    row.dst = rowAt(all.dst, all.dstStep, y, 0, 0);
    row.before = row.dst;
    row.src = rowAt(all.src, all.srcStep, y, 0, 0);
    if (mayReadAhead(row, bytes)) {
      kernel.blend(row);
    } else {
      blendByPixels(row, bytes, kernel);
    }
  }
}

/// Whether there is nothing between the rows.
bool isGapless(const BlendRect& rect, uint32 bytes) {
  return rect.dstStep == static_cast<intptr_t>(rect.width * bytes) &&
         rect.srcStep == static_cast<intptr_t>(rect.width * 4);
}

/// Rows without gaps as one long row.
BlendRect joined(BlendRect rect) {
  rect.width *= rect.height;
  rect.height = 1;
  return rect;
}

/// Blends rows that do not overlap their sources.
void blendRows(const BlendRect& rect, uint32 bytes, const BlendKernel& kernel) {
  if (isGapless(rect, bytes)) {
    kernel.blend(joined(rect));
  } else {
    kernel.blend(rect);
  }
}

void blendInPlace(const BlendRect& rect, uint32 bytes, const BlendKernel& kernel) {
  const auto blend = mayReadAhead(rect, bytes) ? blendRows : blendOverlapping;
  blend(rect, bytes, kernel);
}

/// How far apart the buffer holds rows: whole cache lines, so that what is stored at the end of one
/// is not waited for at the start of the next.
constexpr size_t stageStep(size_t span) {
  constexpr size_t kLine = 64;
  return (span + kLine - 1) & ~(kLine - 1);
}

/// Blends rows through a buffer that holds them. A kernel that reads rows as a block copy does
/// takes the place of the copy into the buffer.
void blendThrough(uint8* stage, BlendRect rect, uint32 bytes, const BlendKernel& kernel) {
  uint8* const dst = std::exchange(rect.dst, stage);
  const intptr_t dstStep = rect.dstStep;
  const StageKernels& stages = chosenKernels<lookUpBlendStage>();
  const auto copyRows = bytes == 4 ? stages.copyColors : stages.copyRows;
  const size_t span = rect.width * bytes;
  rect.dstStep = static_cast<intptr_t>(stageStep(span));
  if (!kernel.readsBlocks) {
    copyRows(stage, rect.dstStep, dst, dstStep, span, rect.height);
    rect.before = stage;
    rect.beforeStep = rect.dstStep;
  }
  kernel.blend(rect);
  copyRows(dst, dstStep, stage, rect.dstStep, span, rect.height);
}

/// How many rows, apart from their sources, the buffer may hold at once: one where they overlap
/// each other.
uint32 rowsAtOnce(const BlendRect& rect, uint32 bytes) {
  const size_t span = rect.width * bytes;
  const auto step = static_cast<size_t>(rect.dstStep < 0 ? -rect.dstStep : rect.dstStep);
  if (span == 0 || span > kStageBytes || step < span) return 1;
  return static_cast<uint32>(kStageBytes / stageStep(span));
}

/// Moves the destination through a buffer, so that frame-buffer memory is touched by block copies
/// only, of at most kStageBytes each.
void blendStaged(const BlendRect& rect, uint32 bytes, const BlendKernel& kernel) {
  alignas(64) uint8 stage[kStageBytes];
  const size_t pixels = kStageBytes / bytes;
  const bool apart = isApart(rect, bytes);
  const BlendRect all = apart && isGapless(rect, bytes) ? joined(rect) : rect;
  const uint32 rows = apart ? rowsAtOnce(all, bytes) : 1;
  for (uint32 y = 0; y < all.height; y += rows) {
    BlendRect part = all;
    part.height = std::min(rows, all.height - y);
    for (size_t x = 0; x < all.width; x += pixels) {
      part.dst = rowAt(all.dst, all.dstStep, y, 0, 0) + x * bytes;
      part.before = part.dst;
      part.src = rowAt(all.src, all.srcStep, y, 0, 0) + x * 4;
      part.width = std::min(pixels, all.width - x);
      blendThrough(stage, part, bytes, kernel);
    }
  }
}

}  // namespace

void alphaBlend(const BlendCall& call) {
  const DestinationFormat& format = formatFor(call.depth, call.bpp);
  if (call.width == 0 || call.height == 0) return;
  const BlendRect rect = rowsOf(call, format.bytes);
  const uint32 flags = flagsThatCount(rect);
  const BlendKernel& kernel = format.kernels()[call.op][flags];
  (call.staged ? blendStaged : blendInPlace)(rect, format.bytes, kernel);
}

}  // namespace raster

using raster::pitchOf;

extern "C" {

void Raster_AlphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                       uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                       uint32 depth, uint32 bpp, uint32 op, uint32 flags, uint32 srcAlpha,
                       uint32 dstAlpha, uint8 staged) {
  raster::alphaBlend({.dst = {dst, pitchOf(dstPitch), dstX, dstY},
                      .src = {src, pitchOf(srcPitch), srcX, srcY},
                      .width = width,
                      .height = height,
                      .depth = depth,
                      .bpp = bpp,
                      .op = op,
                      .flags = flags,
                      .srcAlpha = srcAlpha,
                      .dstAlpha = dstAlpha,
                      .staged = staged != 0});
}

void Raster_AlphaBlendOver(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                           uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                           uint32 depth, uint32 bpp, uint8 staged) {
  raster::alphaBlend({.dst = {dst, pitchOf(dstPitch), dstX, dstY},
                      .src = {src, pitchOf(srcPitch), srcX, srcY},
                      .width = width,
                      .height = height,
                      .depth = depth,
                      .bpp = bpp,
                      .op = RASTER_BLEND_OVER,
                      .staged = staged != 0});
}

}  // extern "C"
