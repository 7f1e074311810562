// SPDX-License-Identifier: MIT
//
// A host that takes the library's messages and survives its fatal errors: what is logged goes into
// the host's own log, and a call that would end the process is left by longjmp.

#include <message.h>
#include <raster.h>
#include <setjmp.h>
#include <stdio.h>
#include <string.h>

static jmp_buf afterPanic;
static char lastWarning[1024];

static void onLog(const char* message) { printf("[raster] %s", message); }

static void onWarning(const char* message) {
  snprintf(lastWarning, sizeof lastWarning, "%s", message);
}

/// May not return: the process would end. Memory of the call that is left is not released, so this
/// is for calls that allocate none.
static void onPanic(const char* message) {
  printf("[raster] fatal: %s", message);
  longjmp(afterPanic, 1);
}

int main(void) {
  Log_SetSink(onLog);
  Warning_SetSink(onWarning);
  Panic_SetSink(onPanic);

  uint8 pixels[64] = {0};
  volatile bool panicked = false;
  if (setjmp(afterPanic) == 0)
    Raster_RectFill(pixels, 8, 5, 0xFF, 0, 0, 1, 1);  // there are no pixels of five bytes
  else
    panicked = true;

  // A format that the video converter does not know is no fatal error, but logged, once.
  Raster_YUVtoRGB(pixels, pixels + 32, 2, 2, 0, RASTER_FORMAT_8888);
  return panicked && strcmp(lastWarning, "Raster: Unsupported frame buffer depth\n") == 0 ? 0 : 1;
}
