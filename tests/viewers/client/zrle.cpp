// SPDX-License-Identifier: MIT
//
// ZRLE as RFC 6143, section 7.7.6, describes it.

#include <algorithm>

#include "rectangles.h"

namespace viewers {
namespace {

constexpr int kTileSize = 64;

/// The bytes of one rectangle after inflation, read from the front.
class Unpacked {
 public:
  Unpacked(std::vector<uint8_t> bytes, const PixelFormat& format)
      : bytes_(std::move(bytes)), format_(format), size_(format.bytes()) {
    // Colours that fit in three of four bytes come as these three.
    if (format.bitsPerPixel != 32 || format.depth > 24) return;
    const bool low = (format.mask() & 0xFF000000) == 0;
    const bool high = (format.mask() & 0xFF) == 0;
    if (low || high) size_ = 3;
    if (!low && high) shift_ = 8;
  }

  int byte() { return *take(1); }
  uint32_t pixel() { return format_.load(take(size_), size_) << shift_ & format_.mask(); }
  /// Lengths are one more than the sum of the bytes up to the first that is not 255.
  int length() {
    int sum = 1;
    int last = 255;
    while (last == 255) sum += last = byte();
    return sum;
  }
  bool empty() const { return next_ == bytes_.size(); }

 private:
  const uint8_t* take(int count) {
    const size_t start = next_;
    next_ += static_cast<size_t>(count);
    if (next_ > bytes_.size()) throw Broken("ZRLE: a rectangle ends too early");
    return &bytes_[start];
  }

  std::vector<uint8_t> bytes_;
  size_t next_ = 0;
  const PixelFormat& format_;
  int size_;
  int shift_ = 0;
};

/// Puts pixels into a tile in reading order.
class Tile {
 public:
  Tile(Picture& picture, Box box) : picture_(picture), box_(box) {}
  bool full() const { return done_ == box_.width * box_.height; }
  bool atRowStart() const { return done_ % box_.width == 0; }
  void put(uint32_t pixel, int count = 1) {
    for (; count > 0; --count, ++done_) {
      if (full()) throw Broken("ZRLE: a run leaves its tile");
      picture_.at(box_.x + done_ % box_.width, box_.y + done_ / box_.width) = pixel;
    }
  }

 private:
  Picture& picture_;
  Box box_;
  int done_ = 0;
};

std::vector<uint32_t> readPalette(Unpacked& from, int count) {
  std::vector<uint32_t> palette(static_cast<size_t>(count));
  for (uint32_t& color : palette) color = from.pixel();
  return palette;
}

uint32_t colorOf(const std::vector<uint32_t>& palette, int index) {
  if (index >= static_cast<int>(palette.size())) throw Broken("ZRLE: an index beyond the palette");
  return palette[static_cast<size_t>(index)];
}

/// Indices of one, two or four bits; every row starts with a new byte.
void readPackedPalette(Unpacked& from, Tile& tile, int count) {
  const std::vector<uint32_t> palette = readPalette(from, count);
  const int bits = count == 2 ? 1 : count <= 4 ? 2 : 4;
  int byte = 0;
  for (int left = 0; !tile.full();) {
    if (left == 0 || tile.atRowStart()) {
      byte = from.byte();
      left = 8;
    }
    left -= bits;
    tile.put(colorOf(palette, byte >> left & ((1 << bits) - 1)));
  }
}

void readPaletteRuns(Unpacked& from, Tile& tile, int count) {
  const std::vector<uint32_t> palette = readPalette(from, count);
  while (!tile.full()) {
    const int index = from.byte();
    tile.put(colorOf(palette, index & 0x7F), index >= 128 ? from.length() : 1);
  }
}

void readTile(Unpacked& from, Tile tile) {
  const int kind = from.byte();
  if (kind == 0) {
    while (!tile.full()) tile.put(from.pixel());
  } else if (kind == 1) {
    for (const uint32_t pixel = from.pixel(); !tile.full();) tile.put(pixel);
  } else if (kind <= 16) {
    readPackedPalette(from, tile, kind);
  } else if (kind == 128) {
    while (!tile.full()) {
      const uint32_t pixel = from.pixel();
      tile.put(pixel, from.length());
    }
  } else if (kind >= 130) {
    readPaletteRuns(from, tile, kind - 128);
  } else {
    throw Broken("ZRLE: a tile of kind " + std::to_string(kind));
  }
}

}  // namespace

Inflater::Inflater() {
  if (inflateInit(&stream_) != Z_OK) throw Broken("zlib does not start");
}

Inflater::~Inflater() { inflateEnd(&stream_); }

std::vector<uint8_t> Inflater::inflated(const std::vector<uint8_t>& compressed) {
  std::vector<uint8_t> all;
  uint8_t block[1 << 16];
  stream_.next_in = const_cast<uint8_t*>(compressed.data());
  stream_.avail_in = static_cast<uInt>(compressed.size());
  do {
    stream_.next_out = block;
    stream_.avail_out = sizeof block;
    const int result = inflate(&stream_, Z_SYNC_FLUSH);
    if (result != Z_OK && result != Z_BUF_ERROR) throw Broken("ZRLE: zlib finds damage");
    all.insert(all.end(), block, stream_.next_out);
  } while (stream_.avail_out == 0);
  return all;
}

void readZrle(Link& link, Inflater& inflater, const PixelFormat& format, Picture& picture,
              Box box) {
  const uint32_t length = link.read32();
  Unpacked from(inflater.inflated(link.read(length)), format);
  const int right = box.x + box.width;
  const int bottom = box.y + box.height;
  for (int y = box.y; y < bottom; y += kTileSize)
    for (int x = box.x; x < right; x += kTileSize)
      readTile(from,
               {picture, {x, y, std::min(kTileSize, right - x), std::min(kTileSize, bottom - y)}});
  if (!from.empty()) throw Broken("ZRLE: bytes after the last tile");
}

}  // namespace viewers
