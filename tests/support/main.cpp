// SPDX-License-Identifier: MIT
//
// The main function of every test program. With RASTER_CPU_LEVEL set to a level that the machine
// lacks it says so and ends with the status that CTest counts as skipped.

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#ifdef __SANITIZE_ADDRESS__
// Requests that no memory can meet are part of the tests.
extern "C" const char* __asan_default_options() { return "allocator_may_return_null=1"; }
#endif

namespace {

constexpr int kSkipped = 77;

bool machineHas(const std::string& level) {
  if (level == "ssse3") return __builtin_cpu_supports("ssse3") != 0;
  if (level == "sse4") return __builtin_cpu_supports("sse4.2") != 0;
  if (level == "avx2") return __builtin_cpu_supports("avx2") != 0;
  if (level == "avx3") return __builtin_cpu_supports("avx512bw") != 0;
  return level == "scalar";
}

}  // namespace

int main(int argc, char** argv) {
  const char* level = getenv("RASTER_CPU_LEVEL");
  if (level != nullptr && !machineHas(level)) {
    printf("skipped: this machine has no level \"%s\"\n", level);
    return kSkipped;
  }
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
