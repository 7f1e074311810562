// SPDX-License-Identifier: MIT
//
// The sixteen raster operations with a constant (ROP fill) or a source rectangle (ROP copy).
//
// Source and destination may overlap in any way. The order of the pixels is defined, and what a
// wide step does differently from it follows from the distance between the rows: ropRows looks at
// the real addresses and then takes the kernel or the pixel-by-pixel walk.

#include <algorithm>

#include "vector/kernelChoice.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "ops/rasteropsInternal.h"
#include "ops/rasteropsRopInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterops";

const RopKernels& kernels() { return chosenKernels<lookUpRop>(); }

/// Steps to the right store ahead of where they read where the destination lies at a higher
/// address, steps to the left where it lies at a lower one.
Overlap overlapOf(const RowPair& rows, uint32 unit, uint32 rop, Walk walk) {
  const uintptr_t ahead = walk == Walk::kToRight ? rows.ahead() : 0 - rows.ahead();
  if (!ropReadsSource(rop) || ahead == 0 || ahead >= rows.bytes) return Overlap::kNone;
  return ahead >= std::max(kernels().stepBytes, size_t{unit}) ? Overlap::kFar : Overlap::kNear;
}

/// Where the distance between source and destination changes from row to row.
[[gnu::noinline]] void ropRowByRow(const RowPair& rows, uint32 bytesPerPixel, uint32 rop,
                                   Walk walk) {
  RowPair row = {rows.dst, 0, rows.src, 0, rows.bytes, 1};
  for (uint32 y = rows.rows; y != 0; --y) {
    ropRows(row, bytesPerPixel, rop, walk);
    row.dst = nextRow(row.dst, rows.dstStep);
    row.src = nextRow(row.src, rows.srcStep);
  }
}

/// What remains of every destination bit, and what is then flipped: with a constant source every
/// operation is d & keep ^ flip.
struct KeepAndFlip {
  uint32 keep;
  uint32 flip;
};
KeepAndFlip withConstant(uint32 rop, uint32 pixel) {
  const uint32 ofZeros = ropOnPixel(rop, pixel, 0);
  const uint32 ofOnes = ropOnPixel(rop, pixel, ~uint32{0});
  return {ofZeros ^ ofOnes, ofZeros};
}

/// The pitch of rows that are walked upwards: a number of 32 bits, as the given one is.
int32 negated(intptr_t pitch) { return static_cast<int32>(0 - static_cast<uint32>(pitch)); }

}  // namespace

void ropRows(const RowPair& rows, uint32 bytesPerPixel, uint32 rop, Walk walk) {
  if (rows.dstStep != rows.srcStep) return ropRowByRow(rows, bytesPerPixel, rop, walk);
  const uint32 unit = bytesPerPixel == 3 ? 1 : bytesPerPixel;  // three bytes are three operations
  const Overlap overlap = overlapOf(rows, unit, rop, walk);
  if (overlap == Overlap::kNear) return walkRopRows(rows, unit, rop, walk);
  const RopRowsKernel* const kernel =
      kernels().rows[static_cast<size_t>(walk)][static_cast<size_t>(overlap)];
  if (walk == Walk::kToLeft && rows.gainFromLast()) return kernel[rop](rows.inOrder(true));
  kernel[rop](rows);
}

/// Raster_RectROPcopy, to be part of its callers: the corners then need no memory.
[[gnu::always_inline]] inline void ropCopy(const Corner<uint8>& dst, const Corner<const uint8>& src,
                                           uint32 bytesPerPixel, uint32 rop, uint32 width,
                                           uint32 height) {
  if (rop == kRopCopy) return rectCopy(dst, src, bytesPerPixel, width, height);
  const bool unsupported = bytesPerPixel < 1 || bytesPerPixel > 4;
  // Two calls, as each walk has a line of its own in the message.
  Walk walk = Walk::kToRight;
  if (src.y == dst.y && dst.x > src.x) {
    if (unsupported) unsupportedPixelSize(kSource);
    walk = Walk::kToLeft;
  } else if (unsupported) {
    unsupportedPixelSize(kSource);
  }
  if (rop >= kRopCount || rop == kRopNoop) return;
  const bool bottomUp = src.y < dst.y;
  const uint32 firstRow = bottomUp ? height - 1 : 0;
  const intptr_t dstWalked = bottomUp ? negated(dst.pitch) : dst.pitch;
  const intptr_t srcWalked = bottomUp ? negated(src.pitch) : src.pitch;
  ropRows({.dst = rowAt(dst.base, dst.pitch, dst.y + firstRow, dst.x, bytesPerPixel),
           .dstStep = rowStep(dstWalked, bytesPerPixel),
           .src = rowAt(src.base, src.pitch, src.y + firstRow, src.x, bytesPerPixel),
           .srcStep = rowStep(srcWalked, bytesPerPixel),
           .bytes = size_t{width} * bytesPerPixel,
           .rows = height},
          bytesPerPixel, rop, walk);
}

void rectRopCopy(const Corner<uint8>& dst, const Corner<const uint8>& src, uint32 bytesPerPixel,
                 uint32 rop, uint32 width, uint32 height) {
  ropCopy(dst, src, bytesPerPixel, rop, width, height);
}

}  // namespace raster

extern "C" {

void Raster_RectROPfill(uint8* fb, int32 pitch, uint32 bytesPerPixel, uint32 pixel, uint32 rop,
                        uint32 x, uint32 y, uint32 width, uint32 height) {
  using namespace raster;
  if (rop == kRopCopy) {
    rectFill(fb, pitchOf(pitch), bytesPerPixel, pixel, x, y, width, height);
    return;
  }
  if (bytesPerPixel < 1 || bytesPerPixel > 4) unsupportedPixelSize(kSource);
  if (rop >= kRopCount || rop == kRopNoop) return;
  const KeepAndFlip constant = withConstant(rop, pixel);
  if (constant.keep == 0) {
    rectFill(fb, pitchOf(pitch), bytesPerPixel, constant.flip, x, y, width, height);
    return;
  }
  const intptr_t step = rowStep(pitchOf(pitch), bytesPerPixel);
  const Rows rows = {rowAt(fb, pitchOf(pitch), y, x, bytesPerPixel), step,
                     size_t{width} * bytesPerPixel, height};
  kernels().fillRows(rows.joined(), repeatPixel(constant.keep, bytesPerPixel),
                     repeatPixel(constant.flip, bytesPerPixel));
}

void Raster_RectROPcopy(uint8* dst, int32 dstPitch, const uint8* src, int32 srcPitch,
                        uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop, uint32 dstX,
                        uint32 dstY, uint32 width, uint32 height) {
  using namespace raster;
  ropCopy({dst, pitchOf(dstPitch), dstX, dstY}, {src, pitchOf(srcPitch), srcX, srcY}, bytesPerPixel,
          rop, width, height);
}

}  // extern "C"
