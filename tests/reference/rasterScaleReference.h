// SPDX-License-Identifier: MIT
//
// The naive model of scaling: whole rows, one pixel at a time, plain division. It shares nothing
// with the library.

#ifndef TESTS_RASTER_SCALE_REFERENCE_H
#define TESTS_RASTER_SCALE_REFERENCE_H

#include <string>
#include <vector>

#include "baseTypes.h"

namespace reference {

/// The arguments of Raster_Scale; the frame buffers are byte vectors and a base within them.
struct ScaleCall {
  size_t dstBase = 0;
  uint32 dstPitch = 0, dstBpp = 0, dstDepth = 0, dstWidth = 0, dstHeight = 0;
  int32 x1 = 0, y1 = 0, x2 = 0, y2 = 0;
  size_t srcBase = 0;
  int32 srcPitch = 0;
  uint32 srcBpp = 0;
  int32 srcDepth = 0;
  uint32 srcWidth = 0, srcHeight = 0;
  double scaleX = 1, scaleY = 1;
  int32 smooth = 0;
};

/// What the call answers, and the message that it would log if nothing had been logged before.
struct ScaleAnswer {
  bool result;
  std::string message;
};

ScaleAnswer scale(std::vector<uint8>& dst, const std::vector<uint8>& src, const ScaleCall& call);

}  // namespace reference

#endif
