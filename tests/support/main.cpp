// SPDX-License-Identifier: MIT
//
// The main function of every test program. With RASTER_CPU_LEVEL set to a level that the machine
// lacks it says so and ends with the status that CTest counts as skipped.

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>

#include "support/level.h"

#ifdef __SANITIZE_ADDRESS__
// Requests that no memory can meet are part of the tests.
extern "C" const char* __asan_default_options() { return "allocator_may_return_null=1"; }
#endif

namespace {

constexpr int kSkipped = 77;

}  // namespace

int main(int argc, char** argv) {
  const char* level = getenv("RASTER_CPU_LEVEL");
  if (level != nullptr && !tests::machineHas(level)) {
    printf("skipped: this machine has no level \"%s\"\n", level);
    return kSkipped;
  }
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
