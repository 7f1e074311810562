// SPDX-License-Identifier: MIT
//
// The forms of a fatal fault. A place is a module's fixed source path and, unless a number is part
// of the message, the line of the call.

#ifndef RASTER_PANIC_PLACE_H
#define RASTER_PANIC_PLACE_H

#include "message.h"

namespace raster {

/// The place that a panic names: by default the line of the call itself.
struct Place {
  const char* source;
  int line;
  // Implicit, so that a call site names its module only.
  constexpr Place(const char* path,
                  int at = __builtin_LINE())  // NOLINT(google-explicit-constructor)
      : source(path), line(at) {}
};

[[noreturn]] inline void notImplemented(Place at) {
  Panic("NOT_IMPLEMENTED %s:%d\n", at.source, at.line);
}

[[noreturn]] inline void notReached(Place at) { Panic("NOT_REACHED %s:%d\n", at.source, at.line); }

[[noreturn]] inline void assertFailed(Place at, int bugNr) {
  Panic("ASSERT %s:%d bugNr=%d\n", at.source, at.line, bugNr);
}

/// The common end of a raster operation with a pixel size other than 1, 2, 3 or 4.
[[noreturn]] inline void unsupportedPixelSize(Place at) {
  Warning("Raster: Unsupported frame buffer depth\n");
  notImplemented(at);
}

}  // namespace raster

#endif
