// SPDX-License-Identifier: MIT
//
// The naive model of the rect lists: the sweep step by step, with its tables in full, in the order
// in which the rules are stated. It shares nothing with the library but the records.

#ifndef TESTS_RASTER_RECT_REFERENCE_H
#define TESTS_RASTER_RECT_REFERENCE_H

#include "raster.h"

namespace reference {

/// How a call ends: with an area, or in a fatal fault.
struct ListResult {
  enum Fault { kNone, kNegativeSize, kTooManySpans, kTooManyRects };
  Fault fault;
  uint32 area;
};

ListResult addRect(RectList& list, int32 x, int32 y, int32 width, int32 height);
ListResult subRect(RectList& list, int32 x, int32 y, int32 width, int32 height);

}  // namespace reference

#endif
