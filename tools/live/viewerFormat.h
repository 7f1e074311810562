// SPDX-License-Identifier: MIT
//
// The pixel format that a viewer asks for, and pixels brought into it. Formats that the library has
// are converted by it; for any other masks, and for viewers that want the highest byte first, each
// channel goes through a table.

#ifndef RASTER_TOOLS_LIVE_VIEWER_FORMAT_H
#define RASTER_TOOLS_LIVE_VIEWER_FORMAT_H

#include <optional>
#include <vector>

#include "bytes.h"
#include "pixelView.h"

namespace tool::live {

/// A pixel format as the protocol has it. A channel is (value >> shift) & max, max being 2^n - 1.
struct PixelFormat {
  uint32 bitsPerPixel;  // 8, 16, 24 or 32
  uint32 depth;
  bool bigEndian;
  bool trueColor;  // otherwise pixels are indices into a table that the server sends
  uint32 redMax, greenMax, blueMax;
  uint32 redShift, greenShift, blueShift;

  bool operator==(const PixelFormat&) const = default;
};

inline constexpr size_t kPixelFormatBytes = 16;

/// 32 bits, the lowest byte first, 0x00RRGGBB.
PixelFormat standardFormat();
/// What the protocol's bytes say, or nothing when no pixel could be made so.
std::optional<PixelFormat> readPixelFormat(const uint8* bytes);
void putPixelFormat(Bytes& out, const PixelFormat& format);

class ViewerFormat {
 public:
  explicit ViewerFormat(const PixelFormat& wanted = standardFormat());

  uint32 bytesPerPixel() const { return pixelBytes; }
  /// The library's code of the format, or 0 when it has none.
  uint32 libraryCode() const { return code; }
  bool needsColorMap() const { return !format.trueColor; }

  /// Bytes that are left of a pixel, and where they begin, when its unused byte is left out.
  uint32 compactBytes() const { return packedBytes; }
  uint32 compactOffset() const { return packedOffset; }

  /// Converts a rectangle of 0x00RRGGBB pixels; `to` is the address of its first pixel.
  void convert(uint8* to, uint32 toPitch, const PixelView& from, const Rect& area) const;
  /// One colour, 0x00RRGGBB, as its bytes in memory.
  void convert(uint8* to, uint32 color) const;

  /// The table of a viewer whose pixels are indices: the colours of all 256 of them.
  static void putColorMap(Bytes& out);

 private:
  void fillTables();
  void findPacking();
  uint32 valueOf(const uint8* pixel) const {
    return channels[0][pixel[2]] | channels[1][pixel[1]] | channels[2][pixel[0]];
  }
  template <uint32 kBytes>
  void convertRows(uint8* to, uint32 toPitch, const PixelView& from, const Rect& area) const;

  PixelFormat format;
  uint32 pixelBytes;
  uint32 code;
  uint32 packedBytes;
  uint32 packedOffset = 0;
  std::vector<uint32> channels[3];  // for formats that the library lacks, in the order of memory
};

}  // namespace tool::live

#endif
