// SPDX-License-Identifier: MIT
//
// RASTER_CPU_LEVEL: a name that no level has is told once, and the drawing goes on.

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "raster.h"
#include "support/ownProcess.h"

namespace {

/// Functions of several modules, each of which looks up its level by itself.
void draw() {
  constexpr uint32 kPitch = 64;
  uint8 frame[2 * kPitch] = {};
  Raster_RectFill(frame, kPitch, 4, 0xFF123456, 0, 0, 16, 2);
  Raster_RectROPfill(frame, kPitch, 4, 0x00FFFFFF, 6, 0, 0, 16, 2);
  Raster_AlphaBlendOver(frame, 0, 0, kPitch, frame, 0, 1, kPitch, 16, 1, 24, 32, 0);
  if (frame[0] != 0xA9) abort();
}

/// What drawing says in a process that is told this level.
std::string logAt(const char* level) {
  return tests::logOfOwnProcess([level] {
    setenv("RASTER_CPU_LEVEL", level, 1);
    draw();
    draw();
  });
}

std::string complaintAbout(const std::string& name) {
  return "Raster: RASTER_CPU_LEVEL is '" + name +
         "', which is none of scalar, ssse3, sse4, avx2, avx3; the best level is used.\n";
}

TEST(RASTER_CPU_LEVEL, AnUnknownNameIsToldOnce) {
  EXPECT_EQ(logAt("avx4"), complaintAbout("avx4"));
  EXPECT_EQ(logAt("AVX2"), complaintAbout("AVX2"));
  EXPECT_EQ(logAt("avx"), complaintAbout("avx"));
}

TEST(RASTER_CPU_LEVEL, KnownNamesAndNoNameAreNoNews) {
  for (const char* level : {"scalar", "ssse3", "sse4", "avx2", "avx3", ""})
    EXPECT_EQ(logAt(level), "") << level;
}

}  // namespace
