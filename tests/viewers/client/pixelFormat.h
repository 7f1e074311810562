// SPDX-License-Identifier: MIT
//
// Pixel formats as the protocol describes them, and the ones that viewers ask for by name.

#ifndef VIEWERS_PIXEL_FORMAT_H
#define VIEWERS_PIXEL_FORMAT_H

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace viewers {

struct Color {
  int red, green, blue;  // 0 to 255
};

/// A true-colour format. A channel's value is (pixel >> shift) & max; max is a power of two less
/// one.
struct PixelFormat {
  std::string name;
  int bitsPerPixel, depth;
  bool bigEndian;
  std::array<int, 3> max, shift;  // red, green, blue

  int bytes() const { return bitsPerPixel / 8; }
  /// The bits that carry colour.
  uint32_t mask() const;
  /// The pixel of a colour whose channels lose their low bits.
  uint32_t pixel(Color color) const;
  /// The colour nearest to a pixel's.
  Color color(uint32_t pixel) const;
  /// A pixel from `bytes()` bytes; bits without colour are cleared.
  uint32_t load(const uint8_t* from) const { return load(from, bytes()) & mask(); }
  /// As above from a given number of bytes, nothing cleared.
  uint32_t load(const uint8_t* from, int count) const;
};

/// The formats by name; the first is what most servers offer by themselves.
const std::vector<PixelFormat>& knownFormats();
/// Throws Broken where there is none of that name.
const PixelFormat& formatNamed(const std::string& name);

}  // namespace viewers

#endif
