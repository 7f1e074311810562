// SPDX-License-Identifier: MIT
//
// The instruction-set levels by name, and which of them this processor runs at: its best one, or
// less when the environment variable RASTER_CPU_LEVEL names a lower one.
//
// The vector dispatch asks this (cpuTargets.cpp), and so does a program that wants to say it.

#ifndef RASTER_CPU_LEVEL_H
#define RASTER_CPU_LEVEL_H

#include <cstddef>
#include <cstdlib>
#include <cstring>

namespace raster {

#define RASTER_CPU_HAS(feature) (__builtin_cpu_supports(feature) != 0)

struct CpuLevel {
  const char* name;
  /// Whether processor and operating system have all that code of the level uses.
  bool (*isThere)();
};

/// In ascending order: a processor that lacks one has none of the later ones.
inline constexpr CpuLevel kCpuLevels[] = {
    {"scalar", [] { return true; }},
    {"ssse3", [] { return RASTER_CPU_HAS("ssse3"); }},
    {"sse4",
     [] {
       return RASTER_CPU_HAS("sse4.1") && RASTER_CPU_HAS("sse4.2") && RASTER_CPU_HAS("pclmul") &&
              RASTER_CPU_HAS("aes");
     }},
    {"avx2",
     [] {
       return RASTER_CPU_HAS("avx2") && RASTER_CPU_HAS("bmi") && RASTER_CPU_HAS("bmi2") &&
              RASTER_CPU_HAS("fma");
     }},
    {"avx3", [] {
       return RASTER_CPU_HAS("avx512f") && RASTER_CPU_HAS("avx512vl") &&
              RASTER_CPU_HAS("avx512dq") && RASTER_CPU_HAS("avx512bw") &&
              RASTER_CPU_HAS("avx512cd");
     }}};

#undef RASTER_CPU_HAS

constexpr size_t kCpuLevelCount = sizeof kCpuLevels / sizeof *kCpuLevels;

/// The level that the environment asks for, or null when it asks for none. A program that runs with
/// more rights than its user does not ask the user.
inline const char* wantedCpuLevel() {
  const char* name = secure_getenv("RASTER_CPU_LEVEL");
  return name != nullptr && *name != '\0' ? name : nullptr;
}

/// Whether a level has this name.
inline bool isCpuLevel(const char* name) {
  for (const CpuLevel& level : kCpuLevels)
    if (strcmp(name, level.name) == 0) return true;
  return false;
}

/// The index of the best level of this processor up to the one that is wanted (null: any).
inline size_t usableCpuLevel(const char* wanted) {
  __builtin_cpu_init();
  size_t best = 0;
  for (size_t i = 0; i < kCpuLevelCount && kCpuLevels[i].isThere(); ++i) {
    best = i;
    if (wanted != nullptr && strcmp(wanted, kCpuLevels[i].name) == 0) break;
  }
  return best;
}

}  // namespace raster

#endif
