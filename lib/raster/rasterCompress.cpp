// SPDX-License-Identifier: MIT
//
// Blocks of pixels behind a header, as a run-length code over 32-bit words or as they are.

#include <algorithm>
#include <cstring>

#include "vector/kernelChoice.h"
#include "host/panicPlace.h"
#include "raster.h"
#include "utilAlloc.h"
#include "compress/rasterCompressInternal.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/rasterCompress";
// Part of the messages, whatever line the calls stand on.
constexpr int kBadEncodeDepthLine = 114;
constexpr int kBadDecodeDepthLine = 187;

const CompressKernels& kernels() { return chosenKernels<lookUpCompress>(); }

/// The start of a block, in memory order. With 0 code words the pixels follow as they are.
struct Header {
  uint32 width, height, pitch, bpp, codeWords;
};
static_assert(sizeof(Header) == 20);

// A block's room beyond its pixels: for the header, for the last words of a code that proves too
// long, and for the bytes that the decoder reads beyond pixels whose total is no whole number.
constexpr size_t kSpareBytes = 32;

/// Depths whose pixels are stored as they are, without a look at them.
constexpr bool isStoredDepth(uint32 bpp) { return bpp == 8 || bpp == 16 || bpp == 24; }

// What the size of a block can tell.
constexpr uint64 kMostPayloadBytes = UINT32_MAX - sizeof(Header);

/// Whether an image is more than memory, than the counts of its code, or, where it is stored, than
/// the size of its block can hold. Other depths are refused elsewhere.
bool isTooLarge(uint64 units, uint32 bpp) {
  const uint64 bytes = units * (bpp >> 3);
  if (isStoredDepth(bpp))
    return bytes > std::min<uint64>(kMostPayloadBytes, SIZE_MAX - kSpareBytes);
  return bpp == 32 && (units > UINT32_MAX || bytes > SIZE_MAX - kSpareBytes);
}

/// Writes the payload of a block of 32-bit pixels and returns the number of its code words.
size_t writePayload(const uint8* src, size_t total, uint8* payload) {
  const EncodedWords code = kernels().encode(src, total, payload);
  if (code.count < total) return code.count;
  // The start of the code is the pixels already.
  memcpy(payload + 4 * code.unchanged, src + 4 * code.unchanged, 4 * (total - code.unchanged));
  return 0;
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_Compress(const void* src, uint32 pitch, uint32 bpp, uint32 width, uint32 height,
                     uint8** outBlock, uint32* outSize) {
  using namespace raster;
  const uint8* const pixels = static_cast<const uint8*>(src);
  const uint32 bytesPerPixel = bpp >> 3;
  if (bytesPerPixel == 0) notImplemented({kSource, kBadEncodeDepthLine});
  if (pitch == 0) pitch = width * bytesPerPixel;
  const uint64 units = uint64{height} * pitch / bytesPerPixel;
  if (isTooLarge(units, bpp)) notImplemented(kSource);
  const size_t total = static_cast<size_t>(units);
  size_t payloadBytes = total * bytesPerPixel;
  uint8* const block = static_cast<uint8*>(UtilSafeMalloc0(payloadBytes + kSpareBytes));
  *outBlock = block;
  Header header = {width, height, pitch, bpp, 0};
  memcpy(block, &header, sizeof header);
  uint8* const payload = block + sizeof header;
  if (isStoredDepth(bpp)) {
    if (payloadBytes != 0) memcpy(payload, pixels, payloadBytes);
  } else if (bpp != 32) {
    notImplemented({kSource, kBadEncodeDepthLine});
  } else if (total != 0) {
    const size_t codeWords = writePayload(pixels, total, payload);
    if (codeWords != 0) payloadBytes = codeWords * 4;
    header.codeWords = static_cast<uint32>(codeWords);
    memcpy(block, &header, sizeof header);
  }
  if (payloadBytes > kMostPayloadBytes) notImplemented(kSource);
  *outSize = static_cast<uint32>(payloadBytes + sizeof header);
}

void Raster_Decompress(const uint8* block, uint8** outData, uint32* outPitch, uint32* outBpp,
                       uint32* outWidth, uint32* outHeight) {
  using namespace raster;
  Header header;
  memcpy(&header, block, sizeof header);
  const uint8* const payload = block + sizeof header;
  const size_t bytes = size_t{header.height} * header.pitch;
  *outWidth = header.width;
  *outHeight = header.height;
  *outPitch = header.pitch;
  *outBpp = header.bpp;
  uint8* const pixels = static_cast<uint8*>(UtilSafeMalloc0(bytes));
  *outData = pixels;
  if (header.codeWords == 0) {
    // Deliberate: stored pixels go over the caller's pointer and what follows it, not to the
    // buffer.
    memcpy(static_cast<void*>(outData), payload, bytes);
    return;
  }
  if (isStoredDepth(header.bpp)) notImplemented({kSource, kBadDecodeDepthLine});
  if (header.bpp != 32) return;
  const size_t written = 4 * kernels().decode(payload, header.codeWords, pixels, bytes / 4);
  if (written < bytes) memset(pixels + written, 0, bytes - written);
}

}  // extern "C"
