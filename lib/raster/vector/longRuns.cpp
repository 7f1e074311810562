// SPDX-License-Identifier: MIT

#include "longRuns.h"

#include <cpuid.h>

#include <atomic>

namespace raster {
namespace {

bool askForFastStringInstructions() {
  constexpr unsigned kLeaf = 7;
  constexpr unsigned kEnhancedStrings = 1u << 9;  // of ebx
  unsigned a = 0;
  unsigned b = 0;
  unsigned c = 0;
  unsigned d = 0;
  return __get_cpuid_count(kLeaf, 0, &a, &b, &c, &d) != 0 && (b & kEnhancedStrings) != 0;
}

}  // namespace

bool hasFastStringInstructions() {
  enum : uint8 { kUnknown, kNo, kYes };
  static constinit std::atomic<uint8> known{kUnknown};
  uint8 answer = known.load(std::memory_order_relaxed);
  if (answer == kUnknown) {
    answer = askForFastStringInstructions() ? kYes : kNo;
    known.store(answer, std::memory_order_relaxed);
  }
  return answer == kYes;
}

}  // namespace raster
