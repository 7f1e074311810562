// SPDX-License-Identifier: MIT
//
// The C++ face of the library, as C++17: clipping, and that each function calls the one it names.

#include <gtest/gtest.h>

#include <limits>
#include <raster.hpp>
#include <vector>

namespace {

using raster::area;
using raster::Format;
using raster::FrameView;

constexpr uint32 kWidth = 7;
constexpr uint32 kHeight = 5;

/// A frame buffer with a margin of three rows before and after it, which must stay as it was.
struct Frame {
  explicit Frame(Format format, uint8 value = 0)
      : pitch((kWidth + 2) * raster::bytesPerPixel(format)),
        bytes((kHeight + 6) * pitch, value),
        view(bytes.data() + 3 * pitch, kWidth, kHeight, format, pitch) {}

  std::vector<uint8> pixel(uint32 x, uint32 y) const {
    const auto* p = view.pixels() + y * pitch + x * view.pixelSize();
    return {p, p + view.pixelSize()};
  }

  /// The bytes that are not `value`.
  size_t touched(uint8 value = 0) const {
    size_t count = 0;
    for (const uint8 byte : bytes) count += byte != value ? 1 : 0;
    return count;
  }

  uint32 pitch;
  std::vector<uint8> bytes;
  FrameView view;
};

TEST(RasterHpp, SizesOfFormats) {
  EXPECT_EQ(raster::bytesPerPixel(Format::k111), 1U);
  EXPECT_EQ(raster::bytesPerPixel(Format::k233), 1U);
  EXPECT_EQ(raster::bytesPerPixel(Format::k555), 2U);
  EXPECT_EQ(raster::bytesPerPixel(Format::k565), 2U);
  EXPECT_EQ(raster::bytesPerPixel(Format::k888), 3U);
  EXPECT_EQ(raster::bytesPerPixel(Format::k8888), 4U);
  EXPECT_EQ(raster::depth(Format::k8888), 24U);
  EXPECT_EQ(raster::depth(Format::k555), 15U);
  EXPECT_EQ(raster::pixel(Format::k565, 0xFF0000), 0xF800U);
}

TEST(RasterHpp, FillIsClippedOnEverySide) {
  constexpr int32 kFar = std::numeric_limits<int32>::max();
  for (const Format format : {Format::k233, Format::k565, Format::k888, Format::k8888}) {
    Frame frame(format);
    const uint32 size = frame.view.pixelSize();
    fill(frame.view, area(-2, -3, 4, 5), 0xFFFFFFFF);
    EXPECT_EQ(frame.touched(), 4U * size);
    fill(frame.view, area(6, 4, kFar, kFar), 0xFFFFFFFF);
    EXPECT_EQ(frame.touched(), 5U * size);
    fill(frame.view, area(7, 0, 5, 5), 0xFFFFFFFF);
    fill(frame.view, area(3, -5, 2, 5), 0xFFFFFFFF);
    fill(frame.view, area(3, 3, 0, 2), 0xFFFFFFFF);
    fill(frame.view, area(-kFar, 3, 5, 2), 0xFFFFFFFF);
    EXPECT_EQ(frame.touched(), 5U * size);
    fill(frame.view, frame.view.bounds(), 0xFFFFFFFF, raster::Rop::kXor);
    EXPECT_EQ(frame.touched(), (kWidth * kHeight - 5U) * size);
  }
}

TEST(RasterHpp, CopiesKeepTheirPlaceWhenClipped) {
  Frame from(Format::k565);
  for (uint32 y = 0; y < kHeight; ++y)
    for (uint32 x = 0; x < kWidth; ++x)
      fill(from.view, area(int32(x), int32(y), 1, 1), 0x100 + 16 * y + x);
  for (int32 dy = -6; dy <= 6; ++dy) {
    for (int32 dx = -8; dx <= 8; ++dx) {
      Frame to(Format::k565);
      copy(to.view, {dx, dy}, from.view, area(-1, -1, 30, 30));
      for (int32 y = 0; y < int32(kHeight); ++y) {
        for (int32 x = 0; x < int32(kWidth); ++x) {
          const int32 fromX = x - dx - 1, fromY = y - dy - 1;
          const bool inside =
              fromX >= 0 && fromY >= 0 && fromX < int32(kWidth) && fromY < int32(kHeight);
          const uint32 expected = inside ? 0x100U + 16U * uint32(fromY) + uint32(fromX) : 0U;
          const auto got = to.pixel(uint32(x), uint32(y));
          ASSERT_EQ(got[0] + 256U * got[1], expected) << dx << ',' << dy << " at " << x << ',' << y;
        }
      }
    }
  }
}

TEST(RasterHpp, CoordinatesAtTheEndsOfTheirRange) {
  constexpr int32 kLow = std::numeric_limits<int32>::min();
  constexpr int32 kHigh = std::numeric_limits<int32>::max();
  Frame from(Format::k8888, 0x55);
  Frame to(Format::k8888);
  for (const int32 a : {kLow, -1, kHigh})
    for (const int32 b : {kLow, kHigh}) {
      copy(to.view, {a, b}, from.view, area(0, 0, 7, 5));
      copy(to.view, {b, a}, from.view, area(a, b, 7, 5));
    }
  EXPECT_EQ(to.touched(), 0U);
  copy(to.view, {kLow, kLow}, from.view, {kLow, kLow, kHigh, kHigh});
  EXPECT_EQ(to.touched(), 4U * kWidth * kHeight);
}

TEST(RasterHpp, ConvertBlendScaleEqual) {
  Frame wide(Format::k8888);
  fill(wide.view, wide.view.bounds(), 0x80008000);  // green, half there
  Frame narrow(Format::k565);
  convert(narrow.view, {1, 1}, wide.view, wide.view.bounds());
  EXPECT_EQ(narrow.pixel(0, 0), (std::vector<uint8>{0, 0}));
  EXPECT_EQ(narrow.pixel(1, 1), (std::vector<uint8>{0x00, 0x04}));

  Frame screen(Format::k888, 0);
  fill(screen.view, screen.view.bounds(), 0xFFFFFF);
  blend(screen.view, {6, 4}, wide.view, wide.view.bounds());
  EXPECT_EQ(screen.pixel(5, 4), (std::vector<uint8>{255, 255, 255}));
  EXPECT_EQ(screen.pixel(6, 4), (std::vector<uint8>{127, 255, 127}));
  blend(screen.view, {0, 0}, wide.view, area(0, 0, 1, 1), raster::Blend::kSource, 127);
  EXPECT_EQ(screen.pixel(0, 0), (std::vector<uint8>{0, 128 * 127 / 255, 0}));

  Frame scaled(Format::k8888);
  EXPECT_TRUE(scale(scaled.view, wide.view, false));
  EXPECT_TRUE(equal(scaled.view, wide.view));
  fill(scaled.view, area(6, 4, 1, 1), 0x80018000);
  EXPECT_FALSE(equal(scaled.view, wide.view));
  EXPECT_FALSE(equal(scaled.view, screen.view));
  EXPECT_FALSE(scale(narrow.view, screen.view));  // no such pair
}

}  // namespace
