// SPDX-License-Identifier: MIT
//
// Video conversion against the naive model, for every colour and many sizes, and the cases that the
// interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>

#include "raster.h"
#include "reference/rasterYuvReference.h"
#include "support/guardedBuffer.h"
#include "support/ownProcess.h"
#include "support/random.h"
#include "support/someValues.h"
// Not exported by the library, so this program has a copy of its own.
#include "video/videoAttributes.cpp"  // NOLINT(bugprone-suspicious-include)

namespace {

using reference::Bytes;
using tests::GuardedBuffer;
using tests::Random;

constexpr uint32 kFormats[] = {RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY, RASTER_VIDEO_YV12};
constexpr int kDepths[] = {15, 16, 24, 32};

std::string describe(uint32 width, uint32 height, uint32 format, int bppdepth) {
  const char name[5] = {static_cast<char>(format), static_cast<char>(format >> 8),
                        static_cast<char>(format >> 16), static_cast<char>(format >> 24), 0};
  return std::to_string(width) + "x" + std::to_string(height) + " " + name + " to " +
         std::to_string(bppdepth);
}

/// The bytes of a frame that a conversion may read.
size_t frameBytes(uint32 width, uint32 height, uint32 format) {
  if (format != RASTER_VIDEO_YV12) return size_t{width} * height / 2 * 4;
  return reference::videoAttributes(format, width, height).size;
}

/// Converts noise between guard pages and compares all bytes of the output with the model's,
/// including those that are not written.
void checkSize(Random& random, uint32 width, uint32 height, uint32 format, int bppdepth) {
  const Bytes frame = random.bytes(frameBytes(width, height, format));
  Bytes expected = random.bytes(size_t{width} * height * reference::bytesOf(bppdepth));
  GuardedBuffer src(frame.size(), tests::someGuard(random));
  GuardedBuffer dst(expected.size(), tests::someGuard(random));
  src.assign(frame);
  dst.assign(expected);
  reference::yuvToRgb(frame, expected, width, height, format, bppdepth);
  Raster_YUVtoRGB(src.data(), dst.data(), width, height, format, bppdepth);
  ASSERT_EQ(dst.bytes(), expected) << describe(width, height, format, bppdepth);
}

TEST(Raster_YUVtoRGB, EqualsTheModelForAllSizesTo40AndWritesNothingElse) {
  Random random(1);
  for (const uint32 format : kFormats) {
    for (const int bppdepth : kDepths) {
      for (uint32 height = 0; height <= 40; ++height) {
        for (uint32 width = 0; width <= 40; ++width) {
          checkSize(random, width, height, format, bppdepth);
          if (HasFatalFailure()) return;
        }
      }
    }
  }
}

TEST(Raster_YUVtoRGB, EqualsTheModelForWideFrames) {
  Random random(2);
  for (const uint32 format : kFormats) {
    for (const int bppdepth : kDepths) {
      for (int round = 0; round < tests::rounds(40); ++round) {
        const uint32 width = round < 30 ? 40 + random.below(220) : 1000 + random.below(2000);
        checkSize(random, width, 2 + random.below(4), format, bppdepth);
        if (HasFatalFailure()) return;
      }
    }
  }
}

TEST(Raster_YUVtoRGB, TakesFramesAtEveryAlignment) {
  Random random(3);
  constexpr uint32 kWidth = 150;
  for (const uint32 format : kFormats) {
    for (const int bppdepth : kDepths) {
      const Bytes frame = random.bytes(frameBytes(kWidth, 2, format));
      Bytes expected(size_t{kWidth} * 2 * reference::bytesOf(bppdepth));
      reference::yuvToRgb(frame, expected, kWidth, 2, format, bppdepth);
      for (size_t shift = 0; shift < 64; ++shift) {
        GuardedBuffer src(frame.size() + shift);
        GuardedBuffer dst(expected.size() + 63 - shift);
        memcpy(src.data() + shift, frame.data(), frame.size());
        Raster_YUVtoRGB(src.data() + shift, dst.data() + (63 - shift), kWidth, 2, format, bppdepth);
        ASSERT_EQ(0, memcmp(dst.data() + (63 - shift), expected.data(), expected.size()))
            << describe(kWidth, 2, format, bppdepth) << " source shifted by " << shift;
      }
    }
  }
}

/// A group of 4 bytes becomes two pixels of 2: every group is read before its pixels are stored.
TEST(Raster_YUVtoRGB, ConvertsPackedFramesToShortPixelsInPlaceOrFurtherDown) {
  Random random(4);
  for (const uint32 format : std::initializer_list<uint32>{RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY}) {
    for (const int bppdepth : {15, 16}) {
      for (uint32 width = 2; width <= 150; width += 2) {
        for (const size_t down : {size_t{0}, size_t{1}, size_t{4}, size_t{1} + random.below(70)}) {
          const Bytes frame = random.bytes(frameBytes(width, 2, format));
          Bytes expected(frame.size());
          reference::yuvToRgb(frame, expected, width, 2, format, bppdepth);
          Bytes memory(down + frame.size());
          std::copy(frame.begin(), frame.end(), memory.begin() + static_cast<ptrdiff_t>(down));
          Raster_YUVtoRGB(memory.data() + down, memory.data(), width, 2, format, bppdepth);
          ASSERT_EQ(0, memcmp(memory.data(), expected.data(), expected.size()))
              << describe(width, 2, format, bppdepth) << " " << down << " bytes further down";
        }
      }
    }
  }
}

constexpr uint32 kWheelWidth = 512;
constexpr uint32 kWheelHeight = 128;

/// The colour of pixel (x, y) of a frame that holds every pair of luma and blue-difference: blocks
/// of 2 x 2 pixels have one blue-difference per column of blocks, and four lumas each.
struct WheelColor {
  uint8 y, cb;
};
WheelColor wheelColor(uint32 x, uint32 y) {
  return {static_cast<uint8>(y / 2 * 4 + y % 2 * 2 + x % 2), static_cast<uint8>(x / 2)};
}

/// The frame of all colours with one red-difference.
Bytes colorWheel(uint32 format, uint8 cr) {
  Bytes frame(frameBytes(kWheelWidth, kWheelHeight, format), cr);
  for (uint32 y = 0; y < kWheelHeight; ++y) {
    for (uint32 x = 0; x < kWheelWidth; ++x) {
      const WheelColor color = wheelColor(x, y);
      const size_t at = size_t{y} * kWheelWidth + x;
      if (format == RASTER_VIDEO_YV12) {
        frame[at] = color.y;
        frame[size_t{kWheelWidth} * kWheelHeight + y / 2 * (kWheelWidth / 2) + x / 2] = color.cb;
      } else {
        const bool lumaFirst = format == RASTER_VIDEO_YUY2;
        frame[2 * at + (lumaFirst ? 0 : 1)] = color.y;
        if (x % 2 == 1) frame[2 * at + (lumaFirst ? 1 : 0)] = color.cb;
      }
    }
  }
  return frame;
}

/// The pixels of the frame of all colours with one red-difference.
Bytes convertedWheel(int cr, int bppdepth) {
  const uint32 bytes = reference::bytesOf(bppdepth);
  Bytes pixels(size_t{kWheelWidth} * kWheelHeight * bytes);
  uint8* at = pixels.data();
  for (uint32 y = 0; y < kWheelHeight; ++y) {
    for (uint32 x = 0; x < kWheelWidth; ++x, at += bytes) {
      const WheelColor color = wheelColor(x, y);
      const uint32 pixel =
          reference::packPixel(reference::yuvToPixel(color.y, color.cb, cr, 128), bppdepth);
      memcpy(at, &pixel, bytes);
    }
  }
  return pixels;
}

TEST(Raster_YUVtoRGB, ConvertsEveryColorExactly) {
  for (int cr = 0; cr < 256; ++cr) {
    Bytes frames[3];
    for (size_t f = 0; f < 3; ++f) frames[f] = colorWheel(kFormats[f], static_cast<uint8>(cr));
    for (const int bppdepth : kDepths) {
      const Bytes expected = convertedWheel(cr, bppdepth);
      for (size_t f = 0; f < 3; ++f) {
        Bytes actual(expected.size());
        Raster_YUVtoRGB(frames[f].data(), actual.data(), kWheelWidth, kWheelHeight, kFormats[f],
                        bppdepth);
        if (actual == expected) continue;
        const auto at = std::mismatch(actual.begin(), actual.end(), expected.begin()).first;
        FAIL() << describe(kWheelWidth, kWheelHeight, kFormats[f], bppdepth) << ", Cr " << cr
               << ", first wrong pixel "
               << static_cast<size_t>(at - actual.begin()) / reference::bytesOf(bppdepth);
      }
    }
  }
}

/// The only pixels of a frame of two pixels.
std::pair<uint32, uint32> convertTwo(const Bytes& frame, uint32 format, int bppdepth) {
  uint8 pixels[8] = {};
  Raster_YUVtoRGB(frame.data(), pixels, 2, 1, format, bppdepth);
  const uint32 bytes = reference::bytesOf(bppdepth);
  uint32 first = 0;
  uint32 second = 0;
  memcpy(&first, pixels, bytes);
  memcpy(&second, pixels + bytes, bytes);
  return {first, second};
}

TEST(Raster_YUVtoRGB, MapsTheEndsOfTheLumaRangeToBlackAndWhite) {
  EXPECT_EQ(convertTwo({16, 128, 235, 128}, RASTER_VIDEO_YUY2, 32), std::pair(0u, 0x00FFFFFFu));
}

// Deliberate: the first chroma byte of a packed group is the red-difference.
TEST(Raster_YUVtoRGB, TakesTheFirstChromaByteOfAPackedGroupAsRedDifference) {
  constexpr uint32 kColor = 255 << 16 | 83 << 8 | 0;
  EXPECT_EQ(convertTwo({0x80, 0xF0, 0x80, 0x10}, RASTER_VIDEO_YUY2, 32), std::pair(kColor, kColor));
  EXPECT_EQ(convertTwo({0xF0, 0x80, 0x10, 0x80}, RASTER_VIDEO_UYVY, 32), std::pair(kColor, kColor));
}

// Deliberate: the plane after the luma plane is the blue-difference.
TEST(Raster_YUVtoRGB, TakesThePlaneAfterTheLumaPlaneAsBlueDifference) {
  const Bytes frame = {0x80, 0x80, 0x80, 0x80, 0x10, 0xF0};
  uint32 pixels[4] = {};
  Raster_YUVtoRGB(frame.data(), reinterpret_cast<uint8*>(pixels), 2, 2, RASTER_VIDEO_YV12, 32);
  for (const uint32 pixel : pixels) EXPECT_EQ(pixel, uint32{255 << 16 | 83 << 8 | 0});
}

// Deliberate: one bit higher than the 5-5-5 layout of the rest of the library.
TEST(Raster_YUVtoRGB, PacksFifteenBitsOneBitHigh) {
  EXPECT_EQ(convertTwo({235, 128, 16, 128}, RASTER_VIDEO_YUY2, 15), std::pair(0xFFFEu, 0u));
  EXPECT_EQ(convertTwo({235, 128, 16, 128}, RASTER_VIDEO_YUY2, 16), std::pair(0xFFFFu, 0u));
}

TEST(Raster_YUVtoRGB, WritesNothingForFramesWithoutAGroup) {
  struct {
    uint32 width, height, format;
  } const frames[] = {{1, 1, RASTER_VIDEO_YUY2}, {1, 1, RASTER_VIDEO_UYVY},
                      {2, 1, RASTER_VIDEO_YV12}, {1, 2, RASTER_VIDEO_YV12},
                      {0, 9, RASTER_VIDEO_YUY2}, {9, 0, RASTER_VIDEO_UYVY},
                      {0, 9, RASTER_VIDEO_YV12}, {9, 0, RASTER_VIDEO_YV12}};
  GuardedBuffer forbidden(16);
  forbidden.forbid();
  for (const auto& frame : frames) {
    for (const int bppdepth : kDepths)
      Raster_YUVtoRGB(forbidden.data(), forbidden.data(), frame.width, frame.height, frame.format,
                      bppdepth);
  }
}

// Deliberate: a packed frame is one flat run of groups, so an odd product leaves one pixel out.
TEST(Raster_YUVtoRGB, LeavesTheLastPixelOfAnOddPackedFrame) {
  const Bytes frame(16, 128);
  uint8 pixels[36];
  memset(pixels, 0x77, sizeof pixels);
  Raster_YUVtoRGB(frame.data(), pixels, 3, 3, RASTER_VIDEO_YUY2, 32);
  for (size_t i = 0; i < 36; ++i) EXPECT_EQ(pixels[i] == 0x77, i >= 32) << i;
}

// Deliberate: with an odd width the output of a row pair begins one pixel early for each one
// before.
TEST(Raster_YUVtoRGB, StartsLaterRowPairsOfAnOddPlanarFrameOnePixelEarlier) {
  Bytes frame(reference::videoAttributes(RASTER_VIDEO_YV12, 3, 4).size, 128);
  uint8 pixels[48];
  memset(pixels, 0x77, sizeof pixels);
  Raster_YUVtoRGB(frame.data(), pixels, 3, 4, RASTER_VIDEO_YV12, 32);
  const std::string written =
      "**.****.**..";  // rows of three: pair 0 at 0 and 3, pair 1 at 5 and 8
  for (size_t i = 0; i < 12; ++i) EXPECT_EQ(pixels[4 * i] != 0x77, written[i] == '*') << i;
}

TEST(Raster_YUVtoRGB, StoresThreeBytesOfA24BitPixel) {
  const Bytes frame = {235, 128, 235, 128};
  GuardedBuffer pixels(6);
  Raster_YUVtoRGB(frame.data(), pixels.data(), 2, 1, RASTER_VIDEO_YUY2, 24);
  EXPECT_EQ(pixels.bytes(), Bytes(6, 255));
}

TEST(Raster_YUVtoRGB, LogsAnUnsupportedDepthOnceAndTouchesNothing) {
  const std::string log = tests::logOfOwnProcess([] {
    GuardedBuffer forbidden(16);
    forbidden.forbid();
    for (const int bppdepth : {8, 8, 0, -1})
      Raster_YUVtoRGB(forbidden.data(), forbidden.data(), 2, 2, RASTER_VIDEO_YUY2, bppdepth);
  });
  EXPECT_EQ(log, "Raster_YUVtoRGB: bppdepth:8 not supported.\n");
}

TEST(Raster_YUVtoRGB, LogsAnUnsupportedFormatOnceAndTouchesNothing) {
  const std::string log = tests::logOfOwnProcess([] {
    GuardedBuffer forbidden(16);
    forbidden.forbid();
    for (const uint32 format : {0xFFFFFFFEu, 1u})
      Raster_YUVtoRGB(forbidden.data(), forbidden.data(), 2, 2, format, 32);
  });
  EXPECT_EQ(log, "Raster_YUVtoRGB: format:4294967294 not supported.\n");
}

TEST(Raster_YUVtoRGB, LooksAtTheDepthBeforeTheFormatAndHasAFlagForEach) {
  const std::string log = tests::logOfOwnProcess([] {
    for (int round = 0; round < tests::rounds(3); ++round) {
      Raster_YUVtoRGB(nullptr, nullptr, 2, 2, 5, -7);
      Raster_YUVtoRGB(nullptr, nullptr, 2, 2, 5, 16);
    }
  });
  EXPECT_EQ(log,
            "Raster_YUVtoRGB: bppdepth:-7 not supported.\n"
            "Raster_YUVtoRGB: format:5 not supported.\n");
}

TEST(RasterComputeVideoAttributes, GivesSizesPitchesAndOffsets) {
  for (const uint32 format : kFormats) {
    for (uint32 height = 0; height <= 9; ++height) {
      for (uint32 width = 0; width <= 9; ++width) {
        const reference::VideoAttributes expected =
            reference::videoAttributes(format, width, height);
        reference::VideoAttributes actual;
        actual.offsets[0] = 77;
        EXPECT_TRUE(RasterComputeVideoAttributes(format, width, height, &actual.size,
                                                 actual.pitches.data(), actual.offsets.data()));
        EXPECT_EQ(actual.size, expected.size) << describe(width, height, format, 0);
        EXPECT_EQ(actual.pitches, expected.pitches) << describe(width, height, format, 0);
        EXPECT_EQ(actual.offsets, expected.offsets) << describe(width, height, format, 0);
      }
    }
  }
}

TEST(RasterComputeVideoAttributes, TakesNullForPitchesAndOffsets) {
  for (const uint32 format : kFormats) {
    uint32 size = 0;
    EXPECT_TRUE(RasterComputeVideoAttributes(format, 3, 3, &size, nullptr, nullptr));
    EXPECT_EQ(size, 24u);
  }
}

TEST(RasterComputeVideoAttributes, RefusesAnUnknownFormatAndLogsOnce) {
  const std::string log = tests::logOfOwnProcess([] {
    for (const uint32 format : {0xFFFFFFFFu, 7u}) {
      uint32 size = 1;
      uint32 pitches[3] = {9, 9, 9};
      uint32 offsets[3] = {9, 9, 9};
      if (RasterComputeVideoAttributes(format, 2, 2, &size, pitches, offsets)) _exit(1);
      if (size != 0 || pitches[0] != 9 || offsets[0] != 0 || offsets[1] != 9) _exit(2);
    }
  });
  EXPECT_EQ(log, "RasterComputeVideoAttributes: format :4294967295 not supported.\n");
}

// Deliberate: no rounding term here.
TEST(RasterRGB_YUVtoBGRX, ConvertsEveryColorWithoutRounding) {
  EXPECT_EQ(RasterRGB_YUVtoBGRX(235, 128, 128), 0x00FEFEFEu);
  for (int y = 0; y < 256; ++y) {
    for (int u = 0; u < 256; ++u) {
      for (int v = 0; v < 256; ++v) {
        ASSERT_EQ(RasterRGB_YUVtoBGRX(static_cast<uint8>(y), static_cast<uint8>(u),
                                      static_cast<uint8>(v)),
                  reference::yuvToPixel(y, u, v, 0))
            << y << " " << u << " " << v;
      }
    }
  }
}

void checkParam(uint32 bits, uint32 mask) {
  const reference::RgbParam expected = reference::makeRgbParam(bits, mask);
  RasterRGBParam param{};
  EXPECT_EQ(RasterRGB_MakeRGBParam(&param, bits, mask), expected.multiplier)
      << bits << " bits, mask " << mask;
  EXPECT_EQ(param.multiplier, expected.multiplier) << bits << " bits, mask " << mask;
  EXPECT_EQ(param.shift, expected.shift) << bits << " bits, mask " << mask;
  EXPECT_EQ(param.mask, mask);
}

TEST(RasterRGB_MakeRGBParam, EqualsTheModelForAllWidthsAndMasks) {
  Random random(4);
  for (uint32 bits = 1; bits <= 32; ++bits) {
    for (uint32 low = 0; low < 32; ++low) {
      for (uint32 run = 1; low + run <= 32; ++run)
        checkParam(bits, (run == 32 ? 0xFFFFFFFF : (1u << run) - 1) << low);
    }
    for (int round = 0; round < tests::rounds(200); ++round)
      checkParam(bits, random.word() | 1u << 31);
  }
}

TEST(RasterRGB_MakeRGBParam, GivesTheNamedValues) {
  RasterRGBParam param{};
  EXPECT_EQ(RasterRGB_MakeRGBParam(&param, 8, 0xF800), 256u);
  EXPECT_EQ(param.shift, 0u);
  EXPECT_EQ(RasterRGB_MakeRGBParam(&param, 4, 0xFF), 17u);
  EXPECT_EQ(param.shift, 0u);
}

TEST(RasterRGB_MakeRGBParam, KeepsTopBitsOrRepeatsTheComponent) {
  for (uint32 bits = 1; bits <= 8; ++bits) {
    for (uint32 field = 1; field <= 8; ++field) {
      for (uint32 low = 0; low + field <= 16; ++low) {
        const uint32 mask = ((1u << field) - 1) << low;
        RasterRGBParam param{};
        RasterRGB_MakeRGBParam(&param, bits, mask);
        for (uint32 c = 0; c < 1u << bits; ++c) {
          uint32 wide = 0;  // the component repeated, from its top bit down
          for (uint32 i = 0; i < field; ++i) wide = wide << 1 | (c >> (bits - 1 - i % bits) & 1);
          ASSERT_EQ(((c * param.multiplier) >> param.shift) & param.mask, wide << low)
              << bits << " bits, mask " << mask << ", component " << c;
        }
      }
    }
  }
}

}  // namespace
