// SPDX-License-Identifier: MIT

#include "screen.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <memory>

#include "link.h"

namespace viewers {
namespace {

constexpr int kTrueColor = 4;

/// The words of a dump's header that are of interest, by their place.
enum Word {
  kHeaderSize = 0,
  kWidth = 4,
  kHeight = 5,
  kByteOrder = 7,
  kBitsPerPixel = 11,
  kBytesPerLine = 12,
  kVisualClass = 13,
  kRedMask = 14,
  kColors = 19,
  kWords = 25
};

class Dump {
 public:
  explicit Dump(std::vector<uint8_t> bytes) : bytes_(std::move(bytes)) {
    if (bytes_.size() < 4 * kWords) throw Broken("xwd says nothing");
    for (size_t i = 0; i < kWords; ++i) words_[i] = number(4 * i, 4, true);
    palette_ = words_[kHeaderSize];
    pixels_ = palette_ + kEntry * words_[kColors];
    const size_t size = static_cast<size_t>(words_[kBytesPerLine]) * words_[kHeight];
    if (bytes_.size() != pixels_ + size) throw Broken("xwd's dump is not whole");
  }

  Screen screen() const {
    Screen result = {static_cast<int>(words_[kWidth]), static_cast<int>(words_[kHeight]), {}};
    for (size_t y = 0; y < words_[kHeight]; ++y)
      for (size_t x = 0; x < words_[kWidth]; ++x) result.colors.push_back(color(pixel(x, y)));
    return result;
  }

 private:
  static constexpr size_t kEntry = 12;

  uint32_t number(size_t at, size_t size, bool bigEndian) const {
    uint32_t value = 0;
    for (size_t i = 0; i < size; ++i)
      value = value << 8 | bytes_[at + (bigEndian ? i : size - 1 - i)];
    return value;
  }

  uint32_t pixel(size_t x, size_t y) const {
    const size_t size = words_[kBitsPerPixel] / 8;
    return number(pixels_ + y * words_[kBytesPerLine] + x * size, size, words_[kByteOrder] != 0);
  }

  Color color(uint32_t pixel) const {
    if (words_[kVisualClass] < kTrueColor) return entry(pixel);
    return {channel(pixel, words_[kRedMask]), channel(pixel, words_[kRedMask + 1]),
            channel(pixel, words_[kRedMask + 2])};
  }

  /// The upper byte of each of a palette entry's three 16-bit values.
  Color entry(uint32_t index) const {
    const size_t at = palette_ + index * kEntry;
    return {bytes_[at + 4], bytes_[at + 6], bytes_[at + 8]};
  }

  /// A field of some bits as eight, its upper bits repeated below.
  static int channel(uint32_t pixel, uint32_t mask) {
    uint32_t value = pixel & mask;
    for (; (mask & 1) == 0; mask >>= 1) value >>= 1;
    int bits = 0;
    for (; mask != 0; mask >>= 1) ++bits;
    uint32_t wide = 0;
    for (int have = 0; have < 16; have += bits) wide = wide << bits | value;
    const int made = (15 / bits + 1) * bits;
    return static_cast<int>(wide >> (made - 8) & 0xFF);
  }

  std::vector<uint8_t> bytes_;
  std::array<uint32_t, kWords> words_;
  size_t palette_, pixels_;
};

std::vector<uint8_t> outputOf(const std::string& command) {
  FILE* pipe = popen(command.c_str(), "r");
  if (pipe == nullptr) throw Broken("cannot run " + command);
  std::vector<uint8_t> all;
  std::array<uint8_t, 1 << 16> block;
  for (size_t got = 0; (got = fread(block.data(), 1, block.size(), pipe)) > 0;)
    all.insert(all.end(), block.data(), block.data() + got);
  if (pclose(pipe) != 0) throw Broken("failed: " + command);
  return all;
}

int blended(int source, int destination, int alpha) {
  return std::min(255, source + destination * (255 - alpha) / 255);
}

bool isInside(Box box, int x, int y) {
  return x >= box.x && x < box.x + box.width && y >= box.y && y < box.y + box.height;
}

Color colorOf(uint32_t argb) {
  return {static_cast<int>(argb >> 16 & 0xFF), static_cast<int>(argb >> 8 & 0xFF),
          static_cast<int>(argb & 0xFF)};
}

}  // namespace

Screen dumpOf(const std::string& display) {
  return Dump(outputOf("xwd -root -silent -display '" + display + "'")).screen();
}

void drawPointer(const Pointer& pointer, Screen& screen) {
  const CursorImage& image = pointer.image;
  for (int i = 0; i < image.width * image.height; ++i) {
    const int x = pointer.left + i % image.width;
    const int y = pointer.top + i / image.width;
    if (x < 0 || y < 0 || x >= screen.width || y >= screen.height) continue;
    const uint32_t word = image.pixels[static_cast<size_t>(i)];
    const int alpha = static_cast<int>(word >> 24);
    const Color over = colorOf(word);
    Color& under = screen.at(x, y);
    under = {blended(over.red, under.red, alpha), blended(over.green, under.green, alpha),
             blended(over.blue, under.blue, alpha)};
  }
}

size_t differences(const Screen& screen, const Picture& picture, const PixelFormat& format,
                   Box without) {
  if (screen.width != picture.width() || screen.height != picture.height())
    return screen.colors.size();
  size_t count = 0;
  for (int y = 0; y < screen.height; ++y)
    for (int x = 0; x < screen.width; ++x) {
      const Color color = screen.colors[static_cast<size_t>(y * screen.width + x)];
      if (picture.at(x, y) != format.pixel(color) && !isInside(without, x, y)) ++count;
    }
  return count;
}

size_t differences(const CursorImage& wanted, const CursorImage& got, const PixelFormat& format) {
  if (wanted.width != got.width || wanted.height != got.height || wanted.hotX != got.hotX ||
      wanted.hotY != got.hotY)
    return wanted.pixels.size();
  size_t count = 0;
  for (size_t i = 0; i < wanted.pixels.size(); ++i) {
    const uint32_t a = wanted.pixels[i];
    const uint32_t b = got.pixels[i];
    const bool halfShown = a >> 24 != 0 && a >> 24 != 255;
    if (halfShown && got.isMasked) continue;
    if (a >> 24 != b >> 24 || format.pixel(colorOf(a)) != format.pixel(colorOf(b))) ++count;
  }
  return count;
}

}  // namespace viewers
