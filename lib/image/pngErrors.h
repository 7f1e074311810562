// SPDX-License-Identifier: MIT
//
// Errors of libpng, which leaves the function that failed by a long jump.

#ifndef RASTER_PNG_ERRORS_H
#define RASTER_PNG_ERRORS_H

#include <csetjmp>

#include <png.h>

namespace raster {

/// Runs `body` on `record` and returns its result, or false when libpng reported an error in it.
///
/// The one place that a long jump lands. `body` and what it calls own nothing that a destructor
/// would have to release, and leave whatever the caller has to release in `record`: that is memory,
/// not a local variable of this function, so the jump cannot undo changes to it. Not inlined, so
/// that no caller's variable lives in a register across setjmp.
template <class Record>
[[gnu::noinline]] bool withoutPngError(png_structp png, bool (*body)(Record&), Record& record) {
  jmp_buf* landing = png_set_longjmp_fn(png, longjmp, sizeof(jmp_buf));
  if (landing == nullptr || setjmp(*landing) != 0) return false;
  return body(record);
}

}  // namespace raster

#endif
