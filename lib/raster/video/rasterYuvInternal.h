// SPDX-License-Identifier: MIT
//
// What the video conversion's front hands to its kernels.

#ifndef RASTER_RASTER_YUV_INTERNAL_H
#define RASTER_RASTER_YUV_INTERNAL_H

#include <cstddef>

#include "baseTypes.h"

namespace raster {

/// One plane of a frame: its first byte, and the bytes from one set of rows to the next.
struct YuvPlane {
  const uint8* first = nullptr;
  size_t step = 0;
};

/// A frame as sets of rows that share their chroma: the rows of a packed frame are one long row,
/// those of a planar frame come in pairs. A group is two pixels of each row of a set.
struct YuvFrame {
  YuvPlane luma{};  // of a packed frame, all of it
  YuvPlane cb{};    // of a planar frame only
  YuvPlane cr{};
  size_t lumaPitch = 0;  // from one row of a set to the other
  size_t groups = 0;     // of a set
  uint32 rowSets = 0;
  uint8* dst = nullptr;
  size_t dstPitch = 0;
  size_t dstStep = 0;  // from one set of rows to the next
};

using ConvertYuv = void (*)(const YuvFrame& frame);

/// The kernels of one instruction-set level, one for each source layout and packing.
struct YuvKernels {
  ConvertYuv convert[3][4];  // YUY2, UYVY, YV12; 15, 16, 24, 32 bits
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const YuvKernels* lookUpYuv();

}  // namespace raster

#endif
