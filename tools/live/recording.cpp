// SPDX-License-Identifier: MIT

#include "recording.h"

#include <cstdlib>
#include <cstring>
#include <memory>

#include "packedBlock.h"
#include "raster.h"

namespace tool::live {
namespace {

constexpr char kMagic[] = "RASTLIVE";
constexpr size_t kMagicBytes = sizeof kMagic - 1;
constexpr uint32 kVersion = 1;
constexpr size_t kHeaderBytes = kMagicBytes + 3 * 4;
constexpr size_t kUpdateBytes = 8 + 4;
constexpr size_t kPartBytes = 5 * 4;
constexpr uint32 kPixelBytes = 4;
constexpr uint32 kLargestSide = 65535;

// Files have the lowest byte first, whatever the machine.

void putLittle32(Bytes& out, uint32 value) {
  for (uint32 shift = 0; shift < 32; shift += 8) out.put8(value >> shift);
}
void putLittle64(Bytes& out, uint64 value) {
  putLittle32(out, static_cast<uint32>(value));
  putLittle32(out, static_cast<uint32>(value >> 32));
}
uint32 little32(const uint8* bytes) {
  return bytes[0] | uint32{bytes[1]} << 8 | uint32{bytes[2]} << 16 | uint32{bytes[3]} << 24;
}
uint64 little64(const uint8* bytes) { return little32(bytes) | uint64{little32(bytes + 4)} << 32; }

bool isSize(uint32 width, uint32 height) {
  constexpr uint64 kMostPixels = uint64{1} << 28;
  return width != 0 && height != 0 && width <= kLargestSide && height <= kLargestSide &&
         uint64{width} * height <= kMostPixels;
}

void putUpdateHeader(uint64 time, uint32 count, Bytes& out) {
  putLittle64(out, time);
  putLittle32(out, count);
}

void putPartHeader(const Rect& rect, uint32 blockBytes, Bytes& out) {
  putLittle32(out, static_cast<uint32>(rect.left));
  putLittle32(out, static_cast<uint32>(rect.top));
  putLittle32(out, widthOf(rect));
  putLittle32(out, heightOf(rect));
  putLittle32(out, blockBytes);
}

}  // namespace

void RecordingWriter::putHeader(uint32 width, uint32 height, Bytes& out) {
  out.append(kMagic, kMagicBytes);
  putLittle32(out, kVersion);
  putLittle32(out, width);
  putLittle32(out, height);
}

void RecordingWriter::putSize(uint64 time, uint32 width, uint32 height, Bytes& out) {
  putUpdateHeader(time, 1, out);
  putPartHeader({0, 0, static_cast<int32>(width), static_cast<int32>(height)}, 0, out);
}

void RecordingWriter::putUpdate(uint64 time, const PixelView& pixels,
                                const std::vector<Rect>& rects, Bytes& out) {
  putUpdateHeader(time, static_cast<uint32>(rects.size()), out);
  for (const Rect& rect : rects) putRect(pixels, rect, out);
}

/// Rows without gaps and top bytes of 0, so that equal colours are equal words.
void RecordingWriter::putRect(const PixelView& pixels, const Rect& rect, Bytes& out) {
  const uint32 width = widthOf(rect);
  const uint32 height = heightOf(rect);
  const uint32 pitch = kPixelBytes * width;
  rows.resize(size_t{pitch} * height);
  Raster_RectCopy(rows.data(), pitch, pixels.data, pixels.pitch, kPixelBytes,
                  static_cast<uint32>(rect.left), static_cast<uint32>(rect.top), 0, 0, width,
                  height);
  Raster_RectFillAlpha(rows.data(), pitch, 0, 0, 0, width, height);
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(rows.data(), pitch, 8 * kPixelBytes, width, height, &block, &size);
  const std::unique_ptr<uint8, decltype(&free)> owner(block, free);
  putPartHeader(rect, size, out);
  out.append(block, size);
}

RecordingReader::RecordingReader(const uint8* bytes, size_t size)
    : start(bytes), at(bytes), end(bytes + size) {
  if (!readHeader()) at = end;
}

bool RecordingReader::readHeader() {
  if (static_cast<size_t>(end - at) < kHeaderBytes || memcmp(at, kMagic, kMagicBytes) != 0) {
    what = "it is not a recording";
    return false;
  }
  const uint32 version = little32(at + kMagicBytes);
  const uint32 newWidth = little32(at + kMagicBytes + 4);
  const uint32 newHeight = little32(at + kMagicBytes + 8);
  if (version != kVersion) {
    what = "it is of version " + std::to_string(version);
    return false;
  }
  if (!isSize(newWidth, newHeight)) {
    what = "it has no pixels, or too many";
    return false;
  }
  at += kHeaderBytes;
  resize(newWidth, newHeight);
  return true;
}

void RecordingReader::resize(uint32 newWidth, uint32 newHeight) {
  width = newWidth;
  height = newHeight;
  pixels.assign(size_t{kPixelBytes} * width * height, 0);
}

std::optional<uint64> RecordingReader::nextTime() {
  if (next == nullptr && at != end && what.empty()) readUpdate();
  if (next == nullptr) return std::nullopt;
  return time;
}

void RecordingReader::readUpdate() {
  brokenOff = !readParts() && what.empty();
  if (brokenOff) what = "it breaks off within an update";
}

/// Reads and checks the update at `at`; `next` is then behind it. False when it is not all there,
/// or, with a fault, when it is damaged.
bool RecordingReader::readParts() {
  const uint8* from = at;
  const auto has = [&](size_t bytes) { return static_cast<size_t>(end - from) >= bytes; };
  if (!has(kUpdateBytes)) return false;
  const uint64 newTime = little64(from);
  const uint32 count = little32(from + 8);
  from += kUpdateBytes;
  parts.clear();
  for (uint32 i = 0; i < count; ++i) {
    if (!has(kPartBytes)) return false;
    Part part = {{}, from + kPartBytes, little32(from + 16)};
    const auto sound = Rect_SetFromXYWH(
        &part.rect, static_cast<int32>(little32(from)), static_cast<int32>(little32(from + 4)),
        static_cast<int32>(little32(from + 8)), static_cast<int32>(little32(from + 12)));
    from += kPartBytes;
    if (!has(part.blockBytes)) return false;
    from += part.blockBytes;
    if (!sound || !checkPart(part)) {
      what = "it is damaged at byte " + std::to_string(part.block - start);
      return false;
    }
    parts.push_back(part);
  }
  time = newTime;
  next = from;
  return true;
}

bool RecordingReader::checkPart(const Part& part) {
  const Rect& rect = part.rect;
  if (part.blockBytes == 0)  // a new size stands alone
    return rect.left == 0 && rect.top == 0 && isSize(widthOf(rect), heightOf(rect)) &&
           parts.empty();
  const Rect whole = picture().bounds();
  BlockHeader header;
  return !isEmpty(rect) && Rect_ContainsRect(&whole, &rect) &&
         blockFault(part.block, part.blockBytes, header).empty() && header.bpp == 8 * kPixelBytes &&
         header.width == widthOf(rect) && header.height == heightOf(rect) &&
         header.pitch == kPixelBytes * header.width &&
         (parts.empty() || parts.front().blockBytes != 0);
}

void RecordingReader::draw(const Part& part) {
  const Rect& rect = part.rect;
  if (part.blockBytes == 0) {
    resize(widthOf(rect), heightOf(rect));
    return;
  }
  const size_t offset = kPixelBytes * (size_t{width} * static_cast<uint32>(rect.top) +
                                       static_cast<uint32>(rect.left));
  const RasterView to = {pixels.data() + offset, pixels.size() - offset, kPixelBytes * width,
                         widthOf(rect),          heightOf(rect),         24,
                         8 * kPixelBytes};
  const std::string fault = drawBlock(part.block, part.blockBytes, to);
  if (!fault.empty()) what = fault;
}

void RecordingReader::drawNext() {
  for (const Part& part : parts) draw(part);
  at = next;
  next = nullptr;
}

}  // namespace tool::live
