// SPDX-License-Identifier: MIT
//
// The forms of a fatal fault. A place is a module's fixed source path and, unless a number is part
// of the message, the line of the call.
//
// The functions are in a source of their own because they call the host: see lib/CMakeLists.txt on
// the stack's alignment.

#ifndef RASTER_PANIC_PLACE_H
#define RASTER_PANIC_PLACE_H

#include "baseTypes.h"

namespace raster {

/// The place that a panic names: by default the line of the call itself.
struct PanicPlace {
  const char* source;
  int line;
  // Implicit, so that a call site names its module only.
  constexpr PanicPlace(const char* path,
                       int at = __builtin_LINE())  // NOLINT(google-explicit-constructor)
      : source(path), line(at) {}
};

[[noreturn]] void notImplemented(PanicPlace at);
[[noreturn]] void notReached(PanicPlace at);
[[noreturn]] void assertFailed(PanicPlace at, int bugNr);

/// The common end of a raster operation with a pixel size other than 1, 2, 3 or 4.
[[noreturn]] void unsupportedPixelSize(PanicPlace at);

/// A warning about a number, for which `format` has a %d, and then notImplemented.
[[noreturn]] void unsupportedNumber(const char* format, int32 number, PanicPlace at);

}  // namespace raster

#endif
