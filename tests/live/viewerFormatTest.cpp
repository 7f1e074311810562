// SPDX-License-Identifier: MIT
//
// Pixels in the formats that viewers ask for, against a model of one channel at a time.

#include "viewerFormat.h"

#include <gtest/gtest.h>

#include <vector>

#include "support/guardedBuffer.h"
#include "support/random.h"

namespace tool::live {
namespace {

using tests::GuardedBuffer;
using tests::Random;

struct Named {
  const char* name;
  uint32 code;
  PixelFormat format;
};

constexpr Named kFormats[] = {
    {"32", 32, {32, 24, false, true, 255, 255, 255, 16, 8, 0}},
    {"red-lowest 32", 0, {32, 24, false, true, 255, 255, 255, 0, 8, 16}},
    {"big-endian 32", 0, {32, 24, true, true, 255, 255, 255, 16, 8, 0}},
    {"32 in the high bytes", 0, {32, 24, false, true, 255, 255, 255, 24, 16, 8}},
    {"30 bits", 0, {32, 30, false, true, 1023, 1023, 1023, 20, 10, 0}},
    {"16 bits a channel", 0, {32, 32, false, true, 65535, 255, 255, 0, 16, 24}},
    {"24", 24, {24, 24, false, true, 255, 255, 255, 16, 8, 0}},
    {"big-endian 24", 0, {24, 24, true, true, 255, 255, 255, 16, 8, 0}},
    {"16", 16, {16, 16, false, true, 31, 63, 31, 11, 5, 0}},
    {"big-endian 16", 0, {16, 16, true, true, 31, 63, 31, 11, 5, 0}},
    {"red-lowest 16", 0, {16, 16, false, true, 31, 63, 31, 0, 5, 11}},
    {"15", 15, {16, 15, false, true, 31, 31, 31, 10, 5, 0}},
    {"4-4-4", 0, {16, 12, false, true, 15, 15, 15, 8, 4, 0}},
    {"8", 8, {8, 8, false, true, 7, 7, 3, 0, 3, 6}},
    {"8, red highest", 0, {8, 8, false, true, 7, 7, 3, 5, 2, 0}},
    {"6", 6, {8, 6, false, true, 3, 3, 3, 4, 2, 0}},
    {"6, big-endian", 6, {8, 6, true, true, 3, 3, 3, 4, 2, 0}},
    {"3", 3, {8, 3, false, true, 1, 1, 1, 2, 5, 7}},
    {"1-1-1", 0, {8, 3, false, true, 1, 1, 1, 2, 1, 0}},
};

/// A channel of 8 bits in a field of any width: its top bits, or itself repeated.
uint32 field(uint32 channel, uint32 max, uint32 shift) {
  uint32 bits = 0;
  while ((max >> bits) != 0) ++bits;
  const uint32 repeated = channel * 0x0101;  // 16 bits
  return (repeated >> (16 - bits)) << shift;
}

std::vector<uint8> modelPixel(const PixelFormat& format, uint32 color) {
  const uint32 value = field(color >> 16 & 255, format.redMax, format.redShift) |
                       field(color >> 8 & 255, format.greenMax, format.greenShift) |
                       field(color & 255, format.blueMax, format.blueShift);
  std::vector<uint8> bytes;
  for (uint32 i = 0; i < format.bitsPerPixel / 8; ++i)
    bytes.push_back(static_cast<uint8>(value >> 8 * i));
  if (format.bigEndian) return {bytes.rbegin(), bytes.rend()};
  return bytes;
}

/// Bits of a pixel that say something; the top byte of code 32 is anything.
bool counts(const PixelFormat& format, size_t byte) {
  return ViewerFormat(format).libraryCode() != 32 || byte % 4 != 3;
}

TEST(ViewerFormat, ConvertsEveryFormatAsTheModelDoes) {
  constexpr uint32 kWidth = 37;
  constexpr uint32 kHeight = 11;
  Random random(1);
  const std::vector<uint8> source = random.bytes(size_t{kWidth} * kHeight * 4);
  const PixelView view = {source.data(), kWidth * 4, kWidth, kHeight};
  for (const Named& named : kFormats) {
    const ViewerFormat format(named.format);
    EXPECT_EQ(format.libraryCode(), named.code) << named.name;
    const uint32 bytes = format.bytesPerPixel();
    for (const Rect area : {Rect{0, 0, 37, 11}, Rect{3, 2, 20, 9}, Rect{36, 10, 37, 11}}) {
      const auto width = static_cast<uint32>(area.right - area.left);
      const auto height = static_cast<uint32>(area.bottom - area.top);
      GuardedBuffer rows(size_t{width} * height * bytes);
      format.convert(rows.data(), width * bytes, view, area);
      std::vector<uint8> expected;
      for (int32 y = area.top; y < area.bottom; ++y) {
        for (int32 x = area.left; x < area.right; ++x) {
          const uint8* pixel = view.at(x, y);
          const uint32 color = uint32{pixel[2]} << 16 | uint32{pixel[1]} << 8 | pixel[0];
          for (const uint8 byte : modelPixel(named.format, color)) expected.push_back(byte);
        }
      }
      for (size_t i = 0; i < expected.size(); ++i)
        ASSERT_TRUE(!counts(named.format, i) || rows.data()[i] == expected[i]) << named.name;
    }
  }
}

TEST(ViewerFormat, LeavesOutTheUnusedByte) {
  const auto packing = [](const PixelFormat& format) {
    const ViewerFormat viewer(format);
    return std::pair(viewer.compactBytes(), viewer.compactOffset());
  };
  EXPECT_EQ(packing(kFormats[0].format), std::pair(3u, 0u));
  EXPECT_EQ(packing(kFormats[1].format), std::pair(3u, 0u));
  EXPECT_EQ(packing(kFormats[2].format), std::pair(3u, 1u));
  EXPECT_EQ(packing(kFormats[3].format), std::pair(3u, 1u));
  EXPECT_EQ(packing(kFormats[4].format), std::pair(4u, 0u));
  EXPECT_EQ(packing(kFormats[8].format), std::pair(2u, 0u));
}

std::vector<uint8> asBytes(const PixelFormat& format) {
  Bytes bytes;
  putPixelFormat(bytes, format);
  return {bytes.data(), bytes.data() + bytes.size()};
}

TEST(ViewerFormat, ReadsWhatItWrites) {
  for (const Named& named : kFormats) {
    const std::vector<uint8> bytes = asBytes(named.format);
    ASSERT_EQ(bytes.size(), kPixelFormatBytes);
    EXPECT_EQ(readPixelFormat(bytes.data()), named.format) << named.name;
  }
}

TEST(ViewerFormat, RefusesWhatCannotBe) {
  const auto refuses = [](void change(PixelFormat&)) {
    PixelFormat format = kFormats[0].format;
    change(format);
    return !readPixelFormat(asBytes(format).data());
  };
  EXPECT_FALSE(refuses([](PixelFormat&) {}));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.bitsPerPixel = 12; }));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.redMax = 0; }));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.greenMax = 200; }));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.redShift = 25; }));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.blueShift = 255; }));
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.blueShift = 4; }));  // channels overlap
  // A table of 2^32 colours.
  EXPECT_TRUE(refuses([](PixelFormat& format) { format.trueColor = false; }));
}

TEST(ViewerFormat, SendsATableToViewersThatWantIndices) {
  PixelFormat indexed = kFormats[0].format;
  indexed.bitsPerPixel = 8;
  indexed.trueColor = false;
  const auto read = readPixelFormat(asBytes(indexed).data());
  ASSERT_TRUE(read);
  const ViewerFormat format(*read);
  EXPECT_TRUE(format.needsColorMap());
  EXPECT_EQ(format.libraryCode(), 8u);
  Bytes map;
  ViewerFormat::putColorMap(map);
  ASSERT_EQ(map.size(), 6u + 256 * 6);
  const auto channel = [&](uint32 index, uint32 which) {
    return bigEndian16(map.data() + 6 + size_t{6} * index + size_t{2} * which);
  };
  EXPECT_EQ(channel(7, 0), 0xFFFFu);
  EXPECT_EQ(channel(7, 1), 0u);
  EXPECT_EQ(channel(0xC0, 2), 0xFFFFu);
  EXPECT_EQ(channel(255, 1), 0xFFFFu);
}

}  // namespace
}  // namespace tool::live
