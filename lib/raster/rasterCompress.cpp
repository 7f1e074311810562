// SPDX-License-Identifier: MIT
//
// Blocks of pixels behind a header, as a run-length code over 32-bit words or as they are.

#include "frameBuffer.h"
#include "panicPlace.h"
#include "raster.h"
#include "utilAlloc.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterCompress";
// Part of the messages, whatever line the calls stand on.
constexpr int kBadEncodeDepthLine = 114;
constexpr int kBadDecodeDepthLine = 187;

/// The start of a block, in memory order. With 0 code words the pixels follow as they are.
struct Header {
  uint32 width, height, pitch, bpp, codeWords;
};
static_assert(sizeof(Header) == 20);

// What a block may need beyond header and pixels, and what the decoder reads beyond a stored block
// whose size is no multiple of the pixel size.
constexpr size_t kSpareBytes = 32;

/// Encodes `total` words to `code` and returns the number of code words; a result that is not less
/// than `total` may be the start of the code only.
size_t encode(const uint8* src, size_t total, uint8* code) {
  const auto word = [&](size_t i) { return loadPixel<4>(src + 4 * i); };
  size_t in = 0;
  size_t out = 0;
  const auto emit = [&](uint32 value) { storePixel<4>(code + 4 * out++, value); };
  while (in < total && out < total) {
    const uint32 pixel = word(in++);
    emit(pixel);
    if (out >= total || in == total || word(in) != pixel) continue;
    emit(word(in++));
    if (out >= total) break;
    uint32 count = 0;
    for (; in < total && word(in) == pixel; ++in) ++count;
    emit(count);
  }
  return out;
}

void decode(const uint8* code, size_t codeWords, uint8* dst) {
  const uint8* const end = code + 4 * codeWords;
  const auto next = [&] {
    const uint32 word = loadPixel<4>(code);
    code += 4;
    return word;
  };
  bool hasPrevious = false;
  uint32 previous = 0;
  while (code != end) {
    const uint32 pixel = next();
    storePixel<4>(dst, pixel);
    dst += 4;
    const bool repeats = hasPrevious && pixel == previous;
    previous = pixel;
    hasPrevious = true;
    if (!repeats || code == end) continue;
    for (uint32 count = next(); count != 0; --count, dst += 4) storePixel<4>(dst, pixel);
    hasPrevious = false;
  }
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_Compress(const void* src, uint32 pitch, uint32 bpp, uint32 width, uint32 height,
                     uint8** outBlock, uint32* outSize) {
  using namespace raster;
  const uint32 bytesPerPixel = bpp >> 3;
  if (bytesPerPixel == 0) notImplemented({kSource, kBadEncodeDepthLine});
  if (pitch == 0) pitch = width * bytesPerPixel;
  const size_t total = size_t{height} * pitch / bytesPerPixel;
  uint8* block = static_cast<uint8*>(UtilSafeMalloc0(total * bytesPerPixel + kSpareBytes));
  *outBlock = block;
  Header header = {width, height, pitch, bpp, 0};
  memcpy(block, &header, sizeof header);
  if (bpp != 8 && bpp != 16 && bpp != 24 && bpp != 32)
    notImplemented({kSource, kBadEncodeDepthLine});
  const uint8* pixels = static_cast<const uint8*>(src);
  size_t payload = total * bytesPerPixel;
  if (bpp == 32 && total != 0) {
    const size_t words = encode(pixels, total, block + sizeof header);
    if (words < total) {
      header.codeWords = static_cast<uint32>(words);
      payload = words * 4;
    }
  }
  if (header.codeWords == 0 && payload != 0) memcpy(block + sizeof header, src, payload);
  memcpy(block, &header, sizeof header);
  *outSize = static_cast<uint32>(payload + sizeof header);
}

void Raster_Decompress(const uint8* block, uint8** outData, uint32* outPitch, uint32* outBpp,
                       uint32* outWidth, uint32* outHeight) {
  using namespace raster;
  Header header;
  memcpy(&header, block, sizeof header);
  *outWidth = header.width;
  *outHeight = header.height;
  *outPitch = header.pitch;
  *outBpp = header.bpp;
  const size_t bytes = size_t{header.height} * header.pitch;
  uint8* pixels = static_cast<uint8*>(UtilSafeMalloc0(bytes));
  *outData = pixels;
  if (header.codeWords == 0) {
    // Deliberate: a stored block goes over the caller's pointer and what follows it.
    memcpy(static_cast<void*>(outData), block + sizeof header, bytes);
    return;
  }
  if (header.bpp == 8 || header.bpp == 16 || header.bpp == 24)
    notImplemented({kSource, kBadDecodeDepthLine});
  if (header.bpp != 32) return;
  memset(pixels, 0, bytes);
  decode(block + sizeof header, header.codeWords, pixels);
}

}  // extern "C"
