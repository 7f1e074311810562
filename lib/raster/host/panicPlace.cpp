// SPDX-License-Identifier: MIT

#include "panicPlace.h"

#include "message.h"
#include "panicOrTrap.h"

namespace raster {

void notImplemented(PanicPlace at) {
  tarnlibs::panicOrTrap("NOT_IMPLEMENTED %s:%d\n", at.source, at.line);
}

void notReached(PanicPlace at) { tarnlibs::panicOrTrap("NOT_REACHED %s:%d\n", at.source, at.line); }

void assertFailed(PanicPlace at, int bugNr) {
  tarnlibs::panicOrTrap("ASSERT %s:%d bugNr=%d\n", at.source, at.line, bugNr);
}

void unsupportedPixelSize(PanicPlace at) {
  Warning("Raster: Unsupported frame buffer depth\n");
  notImplemented(at);
}

void unsupportedNumber(const char* format, int32 number, PanicPlace at) {
  Warning(format, number);
  notImplemented(at);
}

}  // namespace raster
