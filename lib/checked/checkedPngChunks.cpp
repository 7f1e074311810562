// SPDX-License-Identifier: MIT
//
// The header and the chunks of PNG streams.

#include "checkedPngChunks.h"

#include <cstring>

#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr uint8 kSignature[] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n'};
constexpr uint8 kHeaderStart[] = {0, 0, 0, 13, 'I', 'H', 'D', 'R'};
constexpr size_t kFirstChunk = sizeof kSignature;
constexpr size_t kHeaderFields = kFirstChunk + sizeof kHeaderStart;
constexpr size_t kHeaderCrc = kHeaderFields + 13;
constexpr size_t kChunkFrame = 12;  // length, name and checksum
static_assert(kHeaderCrc + 4 == RASTER_CHECKED_PNG_INFO_BYTES);

/// Deflate codes 258 bytes in two bits at best.
constexpr uint64 kBestCompression = 1032;

uint32 bigEndian(const uint8* bytes) {
  return uint32{bytes[0]} << 24 | uint32{bytes[1]} << 16 | uint32{bytes[2]} << 8 | bytes[3];
}

/// The checksum of PNG and zlib (CRC-32, ISO 3309), for a few bytes.
uint32 crc32(const uint8* bytes, size_t size) {
  uint32 crc = ~0u;
  for (size_t i = 0; i < size; ++i) {
    crc ^= bytes[i];
    for (int bit = 0; bit < 8; ++bit) crc = crc >> 1 ^ ((crc & 1) != 0 ? 0xEDB88320u : 0u);
  }
  return ~crc;
}

uint32 samplesOf(uint8 colorType) {
  switch (colorType) {
    case kRgb:
      return 3;
    case kGreyAlpha:
      return 2;
    case kRgba:
      return 4;
    default:
      return 1;
  }
}

bool isPixelFormat(uint8 colorType, uint8 bitDepth) {
  const bool small = bitDepth == 1 || bitDepth == 2 || bitDepth == 4;
  switch (colorType) {
    case kGrey:
      return small || bitDepth == 8 || bitDepth == 16;
    case kPalette:
      return small || bitDepth == 8;
    case kRgb:
    case kGreyAlpha:
    case kRgba:
      return bitDepth == 8 || bitDepth == 16;
    default:
      return false;
  }
}

/// The bytes that the decompressed stream has at least.
bool rawBytes(const RasterPngInfo& info, uint64* bytes) {
  const uint64 row = rowBytes(info.width, samplesOf(info.colorType) * info.bitDepth);
  return !__builtin_mul_overflow(row, uint64{info.height}, bytes);
}

bool hasName(const uint8* chunk, const char* name) { return memcmp(chunk + 4, name, 4) == 0; }

}  // namespace

RasterStatus checkChunks(const uint8* png, size_t size, const RasterPngInfo& info,
                         const RasterLimits& limits) {
  uint64 compressed = 0;
  uint32 others = 0;
  for (size_t at = kFirstChunk;;) {
    if (size - at < kChunkFrame) return RASTER_STATUS_TRUNCATED;
    const uint8* const chunk = png + at;
    const uint32 length = bigEndian(chunk);
    if (length > INT32_MAX) return RASTER_STATUS_DAMAGED;
    if (length > size - at - kChunkFrame) return RASTER_STATUS_TRUNCATED;
    if (hasName(chunk, "IEND")) break;
    if (hasName(chunk, "IDAT")) {
      compressed += length;
    } else if (++others > limits.chunks || length > limits.chunkBytes) {
      return RASTER_STATUS_LIMIT;
    }
    at += kChunkFrame + length;
  }
  uint64 raw = 0;
  const bool enough = rawBytes(info, &raw) && raw <= compressed * kBestCompression;
  return enough ? RASTER_STATUS_OK : RASTER_STATUS_TRUNCATED;
}

}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_PngInfo(const uint8* png, size_t size, RasterPngInfo* info) {
  using namespace raster::checked;
  if (png == nullptr || info == nullptr) return RASTER_STATUS_NULL;
  if (memcmp(png, kSignature, std::min(size, sizeof kSignature)) != 0) return RASTER_STATUS_NOT_PNG;
  if (size < RASTER_CHECKED_PNG_INFO_BYTES) return RASTER_STATUS_TRUNCATED;
  const uint8* const fields = png + kHeaderFields;
  const uint8 compression = fields[10];
  const uint8 filter = fields[11];
  const RasterPngInfo read = {bigEndian(fields), bigEndian(fields + 4), fields[8], fields[9],
                              fields[12]};
  const bool valid = memcmp(png + kFirstChunk, kHeaderStart, sizeof kHeaderStart) == 0 &&
                     crc32(png + kFirstChunk + 4, 4 + 13) == bigEndian(png + kHeaderCrc) &&
                     read.width != 0 && read.width <= INT32_MAX && read.height != 0 &&
                     read.height <= INT32_MAX && isPixelFormat(read.colorType, read.bitDepth) &&
                     compression == 0 && filter == 0 && read.interlaced <= 1;
  if (!valid) return RASTER_STATUS_DAMAGED;
  *info = read;
  return RASTER_STATUS_OK;
}

}  // extern "C"
