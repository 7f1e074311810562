// SPDX-License-Identifier: MIT

#include "pngHeader.h"

#include <cstring>
#include <vector>

#include "commands.h"
#include "outputFile.h"

namespace tool {
namespace {

constexpr uint8 kStart[] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n',
                            0,    0,   0,   13,  'I',  'H',  'D',  'R'};
constexpr size_t kHeaderEnd = sizeof kStart + 13;

uint32 bigEndian(const uint8* bytes) {
  return uint32{bytes[0]} << 24 | uint32{bytes[1]} << 16 | uint32{bytes[2]} << 8 | bytes[3];
}

}  // namespace

PngHeader readPngHeader(const std::string& path) {
  const std::vector<uint8> bytes = readFileStart(path, kHeaderEnd);
  if (bytes.size() < kHeaderEnd || memcmp(bytes.data(), kStart, sizeof kStart) != 0)
    throw Failure("'" + path + "' is not a PNG picture");
  const uint8* fields = bytes.data() + sizeof kStart;
  return {bigEndian(fields), bigEndian(fields + 4), fields[8], fields[9], fields[12] != 0};
}

const char* colourTypeName(uint32 colourType) {
  switch (colourType) {
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
