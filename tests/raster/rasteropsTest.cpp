// SPDX-License-Identifier: MIT
//
// Fill and copy against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "raster.h"
#include "reference/rasteropsReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;

/// Sets rasterops_mmx for a scope.
class MmxSwitch {
 public:
  explicit MmxSwitch(uint32 value) { rasterops_mmx = value; }
  ~MmxSwitch() { rasterops_mmx = 0; }
  MmxSwitch(const MmxSwitch&) = delete;
  MmxSwitch& operator=(const MmxSwitch&) = delete;
};

/// Where a rectangle lies in a buffer that holds it exactly, guard to guard.
struct Place {
  size_t base;  // may be beyond the first byte, so that the base is unaligned
  uint32 pitch;
  uint32 x, y, width, height;
  uint32 bytesPerPixel;

  size_t end() const {
    const size_t lastRow = height == 0 ? 0 : height - 1;
    return base + (y + lastRow) * size_t{pitch} + (x + size_t{width}) * bytesPerPixel;
  }
};

Place somePlace(Random& random, uint32 bytesPerPixel) {
  Place place{};
  place.bytesPerPixel = bytesPerPixel;
  place.base = random.below(70);
  place.x = random.below(9);
  place.y = random.below(4);
  place.width = tests::someWidth(random);
  place.height = random.below(place.width > 100 ? 4 : 20);
  place.pitch = (place.x + place.width) * bytesPerPixel + random.below(40);
  return place;
}

std::string describe(const Place& p) {
  return "base " + std::to_string(p.base) + " pitch " + std::to_string(p.pitch) + " at " +
         std::to_string(p.x) + "," + std::to_string(p.y) + " size " + std::to_string(p.width) +
         "x" + std::to_string(p.height) + " bytes " + std::to_string(p.bytesPerPixel);
}

TEST(Raster_RectFill, EqualsTheModelAndTouchesNothingElse) {
  Random random(1);
  for (int round = 0; round < tests::rounds(4000); ++round) {
    const Place p = somePlace(random, 1 + random.below(4));
    const uint32 pixel = random.word();
    Bytes expected = random.bytes(p.end());
    GuardedBuffer actual(expected.size(), tests::someGuard(random));
    actual.assign(expected);

    reference::rectFill(expected, p.base, p.pitch, p.bytesPerPixel, pixel, p.x, p.y, p.width,
                        p.height);
    Raster_RectFill(actual.data() + p.base, p.pitch, p.bytesPerPixel, pixel, p.x, p.y, p.width,
                    p.height);
    ASSERT_EQ(actual.bytes(), expected) << "round " << round << ": " << describe(p);
  }
}

TEST(Raster_RectFill, StoresThreeBytePixelsLowestByteFirst) {
  uint8 fb[4] = {0, 0, 0, 0x77};
  Raster_RectFill(fb, 3, 3, 0x00AABBCC, 0, 0, 1, 1);
  EXPECT_EQ(0, memcmp(fb, "\xCC\xBB\xAA\x77", 4));
}

TEST(Raster_RectFill, WritesNothingForAWidthOrHeightOfZero) {
  for (uint32 bytesPerPixel = 1; bytesPerPixel <= 4; ++bytesPerPixel) {
    GuardedBuffer nothing(0);
    Raster_RectFill(nothing.data(), 64, bytesPerPixel, 1, 0, 0, 0, 5);
    Raster_RectFill(nothing.data(), 64, bytesPerPixel, 1, 0, 0, 5, 0);
  }
}

// Deliberate: rows after the first drift with a pitch that is no multiple of the pixel size.
TEST(Raster_RectFill, StepsByTheRoundedPitchButStartsWithTheFullOne) {
  uint8 fb[32] = {};
  Raster_RectFill(fb, 7, 4, 0xFFFFFFFF, 0, 1, 1, 2);
  Bytes expected(32);
  for (size_t i : {7, 8, 9, 10, 11, 12, 13, 14}) expected[i] = 0xFF;
  EXPECT_EQ(Bytes(fb, fb + 32), expected);
}

TEST(Raster_RectFill, PanicsForAPixelSizeOfFiveAfterAWarning) {
  for (uint32 bytesPerPixel : {0u, 5u, 0xFFFFFFFFu}) {
    const Messages said =
        tests::messagesOf([&] { Raster_RectFill(nullptr, 0, bytesPerPixel, 0, 0, 0, 0, 0); });
    EXPECT_EQ(said.warning, "Raster: Unsupported frame buffer depth\n");
    EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterops"))
        << said.panic;
  }
}

/// Copies within one buffer, from one place to another, and compares with the model.
void checkCopy(Random& random, uint32 bytesPerPixel, int32 farthest) {
  const Place to = somePlace(random, bytesPerPixel);
  Place from = to;
  from.base = static_cast<size_t>(random.between(0, 100));
  from.x = random.below(9);
  from.y = random.below(4);
  if (farthest > 0) from.y = to.y + random.below(static_cast<uint32>(farthest));
  from.pitch += 9 * bytesPerPixel;
  Place shifted = to;
  shifted.pitch = from.pitch;

  Bytes expected = random.bytes(std::max(from.end(), shifted.end()));
  GuardedBuffer actual(expected.size(), tests::someGuard(random));
  actual.assign(expected);
  reference::rectCopy(expected, shifted.base, shifted.pitch, from.base, from.pitch, bytesPerPixel,
                      from.x, from.y, to.x, to.y, to.width, to.height);
  Raster_RectCopy(actual.data() + shifted.base, shifted.pitch, actual.data() + from.base,
                  from.pitch, bytesPerPixel, from.x, from.y, to.x, to.y, to.width, to.height);
  ASSERT_EQ(actual.bytes(), expected) << "from " << describe(from) << ", to " << describe(shifted);
}

TEST(Raster_RectCopy, EqualsTheModelWithinOneBuffer) {
  Random random(2);
  for (int round = 0; round < tests::rounds(4000); ++round)
    checkCopy(random, 1 + random.below(5), round % 3);
}

TEST(Raster_RectCopy, EqualsTheModelBetweenBuffers) {
  for (const uint32 mmx : {0u, 1u}) {
    const MmxSwitch with(mmx);
    Random random(3);
    for (int round = 0; round < tests::rounds(3000); ++round) {
      const uint32 bytesPerPixel = 1 + random.below(4);
      const Place to = somePlace(random, bytesPerPixel);
      Place from = to;
      from.x = random.below(5);
      from.pitch = (from.x + from.width) * bytesPerPixel + random.below(30);
      // One memory for the model, two guarded buffers for the library.
      const Bytes source = random.bytes(from.end());
      Bytes expected = random.bytes(to.end());
      GuardedBuffer src(source.size(), tests::someGuard(random));
      GuardedBuffer dst(expected.size(), tests::someGuard(random));
      src.assign(source);
      dst.assign(expected);
      Bytes joined = expected;
      joined.insert(joined.end(), source.begin(), source.end());
      reference::rectCopy(joined, to.base, to.pitch, expected.size() + from.base, from.pitch,
                          bytesPerPixel, from.x, from.y, to.x, to.y, to.width, to.height);
      expected.assign(joined.begin(), joined.begin() + static_cast<std::ptrdiff_t>(to.end()));

      Raster_RectCopy(dst.data() + to.base, to.pitch, src.data() + from.base, from.pitch,
                      bytesPerPixel, from.x, from.y, to.x, to.y, to.width, to.height);
      ASSERT_EQ(dst.bytes(), expected)
          << "round " << round << " mmx " << mmx << ": " << describe(to);
      ASSERT_EQ(src.bytes(), source);
    }
  }
}

TEST(Raster_RectCopy, ShiftsOneRowDownUpAndOnePixelRight) {
  constexpr uint32 kPitch = 40;
  const Bytes before = Random(4).bytes(size_t{kPitch} * 10);
  for (const auto& [srcX, srcY, dstX, dstY] :
       {std::array{0u, 0u, 0u, 1u}, std::array{0u, 1u, 0u, 0u}, std::array{0u, 0u, 1u, 0u}}) {
    Bytes fb = before;
    Raster_RectCopy(fb.data(), kPitch, fb.data(), kPitch, 4, srcX, srcY, dstX, dstY, 9, 9);
    for (uint32 y = 0; y < 9; ++y) {
      EXPECT_EQ(0, memcmp(&fb[(dstY + y) * kPitch + dstX * 4],
                          &before[(srcY + y) * kPitch + srcX * 4], 36));
    }
  }
}

TEST(Raster_RectCopy, MovesRowsOfAnyLengthWithinThemselvesAndApart) {
  Random random(7);
  for (const uint32 bytes :
       {129u, 200u, 257u, 1000u, 4095u, 4096u, 5003u, 32767u, 32768u, 32769u, 262144u, 262145u}) {
    for (const uint32 distance : {1u, 15u, 64u, 65u, 256u, 300u, bytes - 1, bytes, bytes + 77}) {
      for (const bool right : {false, true}) {
        const uint32 from = random.below(64) + (right ? 0 : distance);
        const uint32 to = right ? from + distance : from - distance;
        Bytes expected = random.bytes(std::max(from, to) + bytes);
        GuardedBuffer actual(expected.size(), tests::someGuard(random));
        actual.assign(expected);
        memmove(&expected[to], &expected[from], bytes);
        Raster_RectCopy(actual.data(), 0, actual.data(), 0, 1, from, 0, to, 0, bytes, 1);
        ASSERT_EQ(actual.bytes(), expected) << bytes << " bytes from " << from << " to " << to;
      }
    }
  }
}

TEST(Raster_RectCopy, CopiesSeveralLongRowsBetweenTheirGaps) {
  Random random(8);
  for (const uint32 bytes : {4095u, 4096u, 9001u, 32768u, 40000u}) {
    const uint32 pitch = bytes + 1 + random.below(100);
    const uint32 srcPitch = bytes + 1 + random.below(100);
    const uint32 x = random.below(64);
    constexpr uint32 kRows = 3;
    const Bytes source = random.bytes(size_t{srcPitch} * kRows);
    Bytes expected = random.bytes(size_t{pitch} * (kRows - 1) + x + bytes);
    GuardedBuffer actual(expected.size(), tests::someGuard(random));
    actual.assign(expected);
    for (size_t y = 0; y < kRows; ++y)
      memcpy(&expected[y * pitch + x], &source[y * srcPitch], bytes);
    Raster_RectCopy(actual.data(), pitch, source.data(), srcPitch, 1, 0, 0, x, 0, bytes, kRows);
    ASSERT_TRUE(actual.bytes() == expected) << bytes << " bytes at " << x;
  }
}

TEST(Raster_RectCopy, GivesTheSamePixelsAroundTheLimitsOfTheCacheBypass) {
  for (const auto& [bytes, rows] :
       {std::array{32u, 16u}, std::array{32u, 15u}, std::array{31u, 16u}, std::array{39u, 40u}}) {
    const Bytes source = Random(5).bytes(size_t{bytes} * rows);
    Bytes plain(source.size());
    Bytes bypass(source.size());
    Raster_RectCopy(plain.data(), bytes, source.data(), bytes, 1, 0, 0, 0, 0, bytes, rows);
    {
      const MmxSwitch on(1);
      Raster_RectCopy(bypass.data(), bytes, source.data(), bytes, 1, 0, 0, 0, 0, bytes, rows);
    }
    EXPECT_EQ(plain, source);
    EXPECT_EQ(bypass, source);
  }
}

TEST(Raster_RectCopy, LeavesFloatingPointUsableAfterTheCacheBypass) {
  const MmxSwitch on(1);
  Bytes source(64 * 16, 1);
  Bytes target(64 * 16);
  Raster_RectCopy(target.data(), 64, source.data(), 64, 1, 0, 0, 0, 0, 64, 16);
  // x87 loads give a NaN when the MMX state was not cleared.
  volatile long double third = 1.0L;
  third = third / 3.0L;
  EXPECT_EQ(static_cast<double>(third), 1.0 / 3.0);
}

TEST(Raster_RectFillAlpha, EqualsTheModelAndTouchesNothingElse) {
  Random random(6);
  for (int round = 0; round < tests::rounds(2000); ++round) {
    const Place p = somePlace(random, 4);
    const auto alpha = static_cast<uint8>(random.word());
    Bytes expected = random.bytes(p.end());
    GuardedBuffer actual(expected.size(), tests::someGuard(random));
    actual.assign(expected);
    reference::rectFillAlpha(expected, p.base, p.pitch, alpha, p.x, p.y, p.width, p.height);
    Raster_RectFillAlpha(actual.data() + p.base, p.pitch, alpha, p.x, p.y, p.width, p.height);
    ASSERT_EQ(actual.bytes(), expected) << "round " << round << ": " << describe(p);
  }
}

TEST(Raster_RectFillAlpha, ReplacesTheTopByte) {
  uint8 fb[4] = {0x78, 0x56, 0x34, 0x12};
  Raster_RectFillAlpha(fb, 4, 0x80, 0, 0, 1, 1);
  EXPECT_EQ(0, memcmp(fb, "\x78\x56\x34\x80", 4));
}

}  // namespace
