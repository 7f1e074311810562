// SPDX-License-Identifier: MIT

#include "zrleEncoder.h"

#include <algorithm>
#include <new>

#include "zrleTile.h"

namespace tool::live {
namespace {

constexpr uint32 kTilePixels = kZrleTileSide * kZrleTileSide;

/// The viewer's pixels of a tile, each in a word of its own.
void loadTile(uint32* words, const PixelView& pixels, const Rect& tile,
              const ViewerFormat& format) {
  const uint32 bytes = format.bytesPerPixel();
  if (bytes == 4) {
    format.convert(reinterpret_cast<uint8*>(words), widthOf(tile) * 4, pixels, tile);
    if (format.compactBytes() == 4) return;
    const uint32 mask = 0xFFFFFFu << 8 * format.compactOffset();
    std::for_each_n(words, areaOf(tile), [mask](uint32& word) { word &= mask; });
    return;
  }
  uint8 narrow[kTilePixels * 3];
  format.convert(narrow, widthOf(tile) * bytes, pixels, tile);
  const uint8* from = narrow;
  for (uint64 i = 0; i < areaOf(tile); ++i, from += bytes) {
    words[i] = 0;
    memcpy(&words[i], from, bytes);
  }
}

}  // namespace

ZrleEncoder::~ZrleEncoder() {
  if (isStarted) deflateEnd(&stream);
}

void ZrleEncoder::putTiles(const PixelView& pixels, const Rect& rect, const ViewerFormat& format) {
  constexpr auto kSide = static_cast<int32>(kZrleTileSide);
  uint32 words[kTilePixels];
  const PixelPacking packing = {format.compactBytes(), format.compactOffset()};
  for (int32 y = rect.top; y < rect.bottom; y += kSide) {
    for (int32 x = rect.left; x < rect.right; x += kSide) {
      const Rect tile = {x, y, std::min(x + kSide, rect.right), std::min(y + kSide, rect.bottom)};
      loadTile(words, pixels, tile, format);
      putZrleTile(words, widthOf(tile), heightOf(tile), packing, tiles);
    }
  }
}

void ZrleEncoder::deflateTo(Bytes& out) {
  constexpr size_t kStep = 65536;
  stream.next_in = tiles.data();
  stream.avail_in = static_cast<uInt>(tiles.size());
  do {
    stream.next_out = out.extend(kStep);
    stream.avail_out = kStep;
    if (level != usedLevel) {
      deflateParams(&stream, level, Z_DEFAULT_STRATEGY);
      usedLevel = level;
    }
    deflate(&stream, Z_PARTIAL_FLUSH);  // four bytes less than Z_SYNC_FLUSH
    out.truncate(out.size() - stream.avail_out);
  } while (stream.avail_out == 0);
}

void ZrleEncoder::put(const PixelView& pixels, const Rect& rect, const ViewerFormat& format,
                      Bytes& out) {
  if (!isStarted) {
    if (deflateInit(&stream, level) != Z_OK) throw std::bad_alloc();
    usedLevel = level;
    isStarted = true;
  }
  tiles.clear();
  putTiles(pixels, rect, format);
  const size_t before = out.size();
  out.put32(0);
  deflateTo(out);
  storeBigEndian32(out.data() + before, static_cast<uint32>(out.size() - before - 4));
}

}  // namespace tool::live
