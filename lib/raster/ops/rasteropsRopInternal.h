// SPDX-License-Identifier: MIT
//
// Raster operations for the other modules of the library: on rows that are found already, and as
// the exported function does them.

#ifndef RASTER_RASTEROPS_ROP_INTERNAL_H
#define RASTER_RASTEROPS_ROP_INTERNAL_H

#include "frame/frameBuffer.h"

namespace raster {

inline constexpr uint32 kRopCount = 16;
inline constexpr uint32 kRopCopy = 3;
inline constexpr uint32 kRopNoop = 5;

/// Whether an operation (0 to 15) depends on the source. A code is the operation's truth table.
constexpr bool ropReadsSource(uint32 rop) { return (rop & 3) != rop >> 2; }

/// What a row that is its own source, or lies in it, meets of what it stored itself. Ahead is the
/// direction of the walk.
enum class Overlap {
  kNone,  ///< nothing
  kFar,   ///< it stores a vector or more ahead of where it reads: vectors in order give the walk
  kNear   ///< nearer: only pixels in order do
};

/// Runs over rows of one instruction-set level, from the first row to the last one. Where there is
/// more than one row, both steps are equal.
using RopRowsKernel = void (*)(const RowPair& rows);

/// What the kernels of one instruction-set level offer.
struct RopKernels {
  /// A kernel handles at most so many bytes of a row before it stores them.
  size_t stepBytes;
  /// d = d & keep ^ flip.
  void (*fillRows)(const Rows& rows, const PixelWords& keep, const PixelWords& flip);
  /// By walk, overlap (kNone, kFar) and operation.
  const RopRowsKernel* rows[2][2];
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const RopKernels* lookUpRop();

/// An operation (0 to 15) on one pixel.
uint32 ropOnPixel(uint32 rop, uint32 s, uint32 d);

/// The walk as it is defined, of an operation that reads the source: units of 1, 2 or 4 bytes, one
/// after the other.
void walkRopRows(const RowPair& rows, uint32 unit, uint32 rop, Walk walk);

/// Applies operation `rop` (0 to 15) to rows of pixels of `bytesPerPixel` (1 to 4) bytes, given
/// from the leftmost byte of the first row to be processed. The result is that of reading,
/// combining and storing one pixel after the other (one byte after the other in pixels of three),
/// wherever source and destination lie.
void ropRows(const RowPair& rows, uint32 bytesPerPixel, uint32 rop, Walk walk);

/// As Raster_RectROPcopy.
void rectRopCopy(const Corner<uint8>& dst, const Corner<const uint8>& src, uint32 bytesPerPixel,
                 uint32 rop, uint32 width, uint32 height);

}  // namespace raster

#endif
