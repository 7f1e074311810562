// SPDX-License-Identifier: MIT

#include "pngFile.h"

#include <cstring>
#include <utility>

#include "failure.h"

namespace tool {
namespace {

constexpr uint8 kStart[] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n',
                            0,    0,   0,   13,  'I',  'H',  'D',  'R'};
constexpr size_t kHeaderEnd = sizeof kStart + 13;
constexpr size_t kChunkFrame = 12;  // length, name, checksum
constexpr uint64 kLargestFile = uint64{1} << 30;

uint32 bigEndian(const uint8* bytes) {
  return uint32{bytes[0]} << 24 | uint32{bytes[1]} << 16 | uint32{bytes[2]} << 8 | bytes[3];
}

struct Chunk {
  const uint8* at;
  size_t size;  // with its frame

  bool is(const char* name) const { return memcmp(at + 4, name, 4) == 0; }
};

/// Calls `visit` for every chunk; false when the file ends before its last one does.
template <class Visit> bool forEachChunk(const std::vector<uint8>& bytes, Visit visit) {
  for (size_t at = kPngStart; bytes.size() - at >= kChunkFrame;) {
    const uint32 length = bigEndian(bytes.data() + at);
    if (length > bytes.size() - at - kChunkFrame) return false;
    const Chunk chunk = {bytes.data() + at, length + kChunkFrame};
    visit(chunk);
    if (chunk.is("IEND")) return true;
    at += chunk.size;
  }
  return false;
}

}  // namespace

bool beginsPng(const std::vector<uint8>& bytes) {
  return bytes.size() >= kPngStart && memcmp(bytes.data(), kStart, kPngStart) == 0;
}

PngFile readPng(InputStream& input, std::vector<uint8> start) {
  PngFile png = {};
  png.bytes = std::move(start);
  if (png.bytes.size() < kHeaderEnd) input.append(png.bytes, kHeaderEnd - png.bytes.size());
  if (png.bytes.size() < kHeaderEnd || memcmp(png.bytes.data(), kStart, sizeof kStart) != 0)
    throw Failure(input.name() + " is not a PNG picture");
  const uint8* fields = png.bytes.data() + sizeof kStart;
  png.width = bigEndian(fields);
  png.height = bigEndian(fields + 4);
  png.bitDepth = fields[8];
  png.colorType = fields[9];
  png.isInterlaced = fields[12] != 0;
  input.append(png.bytes, kLargestFile);
  const bool whole =
      forEachChunk(png.bytes, [&](const Chunk& chunk) { png.hasTransparency |= chunk.is("tRNS"); });
  if (!whole) throw Failure("cannot read the picture " + input.name() + " (it is cut off)");
  return png;
}

const char* colorTypeName(uint32 colorType) {
  switch (colorType) {
    case kGrey:
      return "grey";
    case kRgb:
      return "RGB";
    case kPalette:
      return "palette";
    case kGreyAlpha:
      return "grey with alpha";
    case kRgba:
      return "RGB with alpha";
    default:
      return "unknown";
  }
}

}  // namespace tool
