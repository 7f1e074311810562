// SPDX-License-Identifier: MIT
//
// The main function of every test program. With RASTER_CPU_LEVEL set to a level that the machine
// lacks it says so and ends with the status that CTest counts as skipped. Of a test that fails it
// prints what runs just that test with the same random numbers (random.h).

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

/// Prints the settings that a failed test depends on, and its name, as a shell takes them.
class TellsHowToRepeat : public testing::EmptyTestEventListener {
 public:
  explicit TellsHowToRepeat(const char* program) : program_(program) {}

  void OnTestEnd(const testing::TestInfo& info) override {
    if (!info.result()->Failed()) return;
    printf("to repeat it:");
    print("RASTER_CPU_LEVEL", nullptr);
    print("RASTER_TEST_SEED", "0");
    print("RASTER_TEST_ROUNDS", nullptr);
    printf(" %s --gtest_filter=%s.%s\n", program_, info.test_suite_name(), info.name());
  }

 private:
  static void print(const char* name, const char* otherwise) {
    const char* const value = getenv(name);
    if (value != nullptr || otherwise != nullptr)
      printf(" %s=%s", name, value != nullptr ? value : otherwise);
  }
  const char* program_;
};

}  // namespace

int main(int argc, char** argv) {
  const char* level = getenv("RASTER_CPU_LEVEL");
  if (level != nullptr && !tests::machineHas(level)) {
    printf("skipped: this machine has no level \"%s\"\n", level);
    return kSkipped;
  }
  testing::InitGoogleTest(&argc, argv);
  testing::UnitTest::GetInstance()->listeners().Append(
      new TellsHowToRepeat(argv[0]));  // which owns it
  return RUN_ALL_TESTS();
}
