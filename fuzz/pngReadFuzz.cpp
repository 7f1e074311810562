// SPDX-License-Identifier: MIT
//
// PNG streams of any bytes. The mutator repairs checksums, so that what is changed is also looked
// at. What the exact reader takes as well, both read alike.

#include <zlib.h>

#include <cstdlib>
#include <cstring>

#include "fuzzing.h"
#include "imageUtil.h"

using fuzz::require;

extern "C" size_t LLVMFuzzerMutate(uint8* bytes, size_t size, size_t maxSize);

namespace {

constexpr size_t kSignature = 8;
constexpr size_t kFrame = 12;

uint32 bigEndian(const uint8* at) {
  return uint32{at[0]} << 24 | uint32{at[1]} << 16 | uint32{at[2]} << 8 | at[3];
}
void storeBigEndian(uint8* at, uint32 value) {
  for (int i = 0; i < 4; ++i) at[i] = static_cast<uint8>(value >> (24 - 8 * i));
}

void repairChecksums(uint8* bytes, size_t size) {
  for (size_t at = kSignature; size >= kFrame && at <= size - kFrame;) {
    const size_t length = bigEndian(bytes + at);
    if (length > size - at - kFrame) return;
    const uLong checksum = crc32(0, bytes + at + 4, static_cast<uInt>(length + 4));
    storeBigEndian(bytes + at + 8 + length, static_cast<uint32>(checksum));
    at += length + kFrame;
  }
}

/// The exact reader trusts a stream to be whole, which an accepted one is.
void compareWithExact(const fuzz::Bytes& stream, const ImageUtilImage& image, uint32 flags) {
  RasterPngInfo info = {};
  require(RasterChecked_PngInfo(stream.data(), stream.size(), &info) == RASTER_STATUS_OK);
  if (info.bitDepth == 16 || info.colorType == 0 || info.colorType == 4) return;
  ImageUtilImage exact;
  require(ImageUtil_ReadPNGBuffer(&exact, stream.data(), static_cast<uint32>(stream.size()),
                                  static_cast<uint8>(flags & 1)));
  require(exact.width == image.width && exact.height == image.height && exact.bpp == image.bpp &&
          exact.numColors == image.numColors && exact.bytesPerLine == image.bytesPerLine);
  require(memcmp(exact.palette, image.palette, sizeof exact.palette) == 0);
  require(memcmp(exact.data, image.data, size_t{image.bytesPerLine} * image.height) == 0);
  ImageUtil_FreeImageData(&exact);
}

}  // namespace

extern "C" size_t LLVMFuzzerCustomMutator(uint8* bytes, size_t size, size_t maxSize,
                                          unsigned seed) {
  const size_t mutated = LLVMFuzzerMutate(bytes, size, maxSize);
  if (seed % 8 != 0) repairChecksums(bytes, mutated);
  return mutated;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  if (size == 0) return 0;
  const RasterLimits limits = {2000, 2000, 1 << 18, 1 << 20, 1 << 16, 50};
  const uint32 flags = bytes[size - 1] % 8;  // bytes after the picture do not count
  const fuzz::Bytes stream(bytes, bytes + size);
  char message[80];
  ImageUtilImage image = {};
  const RasterStatus status = RasterChecked_ReadPngBuffer(stream.data(), size, flags, &limits,
                                                          &image, message, sizeof message);
  if (status != RASTER_STATUS_OK) {
    require(image.data == nullptr && image.width == 0);
    return 0;
  }
  require(message[0] == 0);
  RasterView view = {};
  require(RasterChecked_ImageView(&image, size_t{image.bytesPerLine} * image.height, &view) ==
          RASTER_STATUS_OK);
  compareWithExact(stream, image, flags);
  free(image.data);
  return 0;
}
