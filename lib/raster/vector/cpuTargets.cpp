// SPDX-License-Identifier: MIT
//
// Which instruction-set level the vector code runs at (cpuLevel.h). That is decided when the first
// vector function of a module runs; a name that no level has is told once.
//
// This takes the place of Highway's run-time library, of which the dispatch needs two functions and
// its assertions, in builds that have them, a third one.

#include <cstdarg>
#include <cstdio>
#include <iterator>

#include "cpuLevel.h"
#include "host/firstTime.h"
#include "hwySetup.h"
#include "hwy/highway.h"
#include "message.h"
#include "panicOrTrap.h"

namespace {

/// The Highway targets of the levels.
constexpr int64_t kTargets[] = {HWY_SCALAR, HWY_SSSE3, HWY_SSE4, HWY_AVX2, HWY_AVX3};
static_assert(std::size(kTargets) == raster::kCpuLevelCount);

void complainOf(const char* wanted) {
  static std::atomic<bool> said;
  if (raster::firstTime(said))
    Log("Raster: RASTER_CPU_LEVEL is '%s', which is none of scalar, ssse3, sse4, avx2, avx3; "
        "the best level is used.\n",
        wanted);
}

}  // namespace

namespace hwy {

ChosenTarget& GetChosenTarget() {
  static constinit ChosenTarget chosen;
  return chosen;
}

int64_t SupportedTargets() {
  const char* wanted = raster::wantedCpuLevel();
  if (wanted != nullptr && !raster::isCpuLevel(wanted)) complainOf(wanted);
  const size_t best = raster::usableCpuLevel(wanted);
  int64_t targets = 0;
  for (size_t i = 0; i <= best; ++i) targets |= kTargets[i];
  return targets;
}

void Abort(const char* file, int line, const char* format, ...) {
  char text[256];
  va_list arguments;
  va_start(arguments, format);
  // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): a false alarm, it was started
  vsnprintf(text, sizeof text, format, arguments);
  va_end(arguments);
  tarnlibs::panicOrTrap("Highway %s:%d: %s\n", file, line, text);
}

}  // namespace hwy
