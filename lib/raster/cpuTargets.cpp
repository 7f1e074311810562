// SPDX-License-Identifier: MIT
//
// Which instruction-set level the vector code runs at: the best one of the processor, or less when
// the environment variable RASTER_CPU_LEVEL names one of scalar, ssse3, sse4, avx2, avx3. It is
// read once, when the first vector function runs.
//
// This takes the place of Highway's run-time library, of which the dispatch needs two functions.

#include <cstdlib>
#include <cstring>

#include "hwySetup.h"
#include "hwy/highway.h"

namespace {

/// A level in ascending order, with the Highway target that it stands for.
struct Level {
  const char* name;
  int64_t target;
};
constexpr Level kLevels[] = {{"scalar", HWY_SCALAR},
                             {"ssse3", HWY_SSSE3},
                             {"sse4", HWY_SSE4},
                             {"avx2", HWY_AVX2},
                             {"avx3", HWY_AVX3}};

#define RASTER_CPU_HAS(feature) (__builtin_cpu_supports(feature) != 0)

/// Whether processor and operating system have all that Highway's target uses.
bool supports(int64_t target) {
  switch (target) {
    case HWY_SCALAR:
      return true;
    case HWY_SSSE3:
      return RASTER_CPU_HAS("ssse3");
    case HWY_SSE4:
      return RASTER_CPU_HAS("sse4.1") && RASTER_CPU_HAS("sse4.2") && RASTER_CPU_HAS("pclmul") &&
             RASTER_CPU_HAS("aes");
    case HWY_AVX2:
      return RASTER_CPU_HAS("avx2") && RASTER_CPU_HAS("bmi") && RASTER_CPU_HAS("bmi2") &&
             RASTER_CPU_HAS("fma");
    case HWY_AVX3:
      return RASTER_CPU_HAS("avx512f") && RASTER_CPU_HAS("avx512vl") &&
             RASTER_CPU_HAS("avx512dq") && RASTER_CPU_HAS("avx512bw") && RASTER_CPU_HAS("avx512cd");
    default:
      return false;
  }
}

}  // namespace

namespace hwy {

ChosenTarget& GetChosenTarget() {
  static constinit ChosenTarget chosen;
  return chosen;
}

int64_t SupportedTargets() {
  __builtin_cpu_init();
  const char* cap = getenv("RASTER_CPU_LEVEL");
  int64_t targets = 0;
  for (const Level& level : kLevels) {
    if (!supports(level.target)) break;
    targets |= level.target;
    if (cap != nullptr && strcmp(cap, level.name) == 0) break;
  }
  return targets;
}

}  // namespace hwy
