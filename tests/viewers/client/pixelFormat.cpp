// SPDX-License-Identifier: MIT

#include "pixelFormat.h"

#include "link.h"

namespace viewers {
namespace {

constexpr std::array<int, 3> kBytes = {255, 255, 255};

int bitsOf(int max) {
  int bits = 0;
  for (; max > 0; max >>= 1) ++bits;
  return bits;
}

}  // namespace

uint32_t PixelFormat::mask() const {
  uint32_t bits = 0;
  for (int channel = 0; channel < 3; ++channel)
    bits |= static_cast<uint32_t>(max[channel]) << shift[channel];
  return bits;
}

uint32_t PixelFormat::pixel(Color color) const {
  const int values[3] = {color.red, color.green, color.blue};
  uint32_t result = 0;
  for (int channel = 0; channel < 3; ++channel) {
    const int narrowed = values[channel] >> (8 - bitsOf(max[channel]));
    result |= static_cast<uint32_t>(narrowed) << shift[channel];
  }
  return result;
}

Color PixelFormat::color(uint32_t pixel) const {
  std::array<int, 3> values;
  for (int channel = 0; channel < 3; ++channel) {
    const int value = static_cast<int>(pixel >> shift[channel]) & max[channel];
    values[channel] = value * 255 / max[channel];
  }
  return {values[0], values[1], values[2]};
}

uint32_t PixelFormat::load(const uint8_t* from, int count) const {
  uint32_t value = 0;
  for (int i = 0; i < count; ++i) value = value << 8 | from[bigEndian ? i : count - 1 - i];
  return value;
}

const std::vector<PixelFormat>& knownFormats() {
  static const std::vector<PixelFormat> formats = {
      {"32", 32, 24, false, kBytes, {16, 8, 0}},
      {"red-lowest-32", 32, 24, false, kBytes, {0, 8, 16}},
      {"big-endian-32", 32, 24, true, kBytes, {16, 8, 0}},
      {"24", 24, 24, false, kBytes, {16, 8, 0}},
      {"16", 16, 16, false, {31, 63, 31}, {11, 5, 0}},
      {"big-endian-16", 16, 16, true, {31, 63, 31}, {11, 5, 0}},
      {"15", 16, 15, false, {31, 31, 31}, {10, 5, 0}},
      {"8", 8, 8, false, {7, 7, 3}, {0, 3, 6}},
      {"6", 8, 6, false, {3, 3, 3}, {4, 2, 0}},
      {"1-1-1", 8, 3, false, {1, 1, 1}, {2, 1, 0}},
      // Beyond what viewers ask for: colours in the upper three bytes, apart from one another, and
      // with red highest in one byte.
      {"high-32", 32, 24, false, kBytes, {24, 16, 8}},
      {"3", 8, 3, false, {1, 1, 1}, {2, 5, 7}},
      {"3-3-2", 8, 8, false, {7, 7, 3}, {5, 2, 0}}};
  return formats;
}

const PixelFormat& formatNamed(const std::string& name) {
  for (const PixelFormat& format : knownFormats())
    if (format.name == name) return format;
  throw Broken("there is no pixel format '" + name + "'");
}

}  // namespace viewers
