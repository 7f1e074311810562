// SPDX-License-Identifier: MIT

#include "support/level.h"

#include <cstdlib>

namespace tests {

bool machineHas(const std::string& level) {
  if (level == "ssse3") return __builtin_cpu_supports("ssse3") != 0;
  if (level == "sse4") return __builtin_cpu_supports("sse4.2") != 0;
  if (level == "avx2") return __builtin_cpu_supports("avx2") != 0;
  if (level == "avx3") return __builtin_cpu_supports("avx512bw") != 0;
  return level == "scalar";
}

std::string levelInUse() {
  const char* level = getenv("RASTER_CPU_LEVEL");
  if (level != nullptr) return level;
  for (const char* const best : {"avx3", "avx2", "sse4", "ssse3"})
    if (machineHas(best)) return best;
  return "scalar";
}

}  // namespace tests
