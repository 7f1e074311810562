// SPDX-License-Identifier: MIT
//
// Run-length blocks.

#include <cstring>

#include "checkedMemory.h"
#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr size_t kHeaderBytes = 20;
constexpr uint64 kMaxBlock = UINT32_MAX - 64;  // Raster_Compress counts in 32 bits, with some room

uint32 wordAt(const uint8* bytes, size_t index) {
  uint32 word = 0;
  memcpy(&word, bytes + 4 * index, sizeof word);
  return word;
}

RasterBlockInfo headerOf(const uint8* block) {
  return {wordAt(block, 0), wordAt(block, 1), wordAt(block, 2), wordAt(block, 3), wordAt(block, 4)};
}

uint32 depthOf(uint32 bpp) { return std::min(bpp, 24u); }

uint64 pixelBytesOf(const RasterBlockInfo& info) { return uint64{info.pitch} * info.height; }

/// The pixels that a header describes, in memory that is large enough.
RasterView viewOf(const RasterBlockInfo& info, uint8* data) {
  const auto bytes = static_cast<size_t>(std::min<uint64>(pixelBytesOf(info), SIZE_MAX));
  return {data, bytes, info.pitch, info.width, info.height, depthOf(info.bpp), info.bpp};
}

/// Whether a header makes sense: it describes pixels, and only those of 32 bits have a code. More
/// of them than any memory holds are not its fault: then a row is looked at.
bool isHeader(const RasterBlockInfo& info) {
  RasterBlockInfo fitting = info;
  if (pixelBytesOf(info) > SIZE_MAX) fitting.height = 1;
  uint8 anything = 0;
  const RasterView view = viewOf(fitting, &anything);
  return info.height <= INT32_MAX && checkPixels(&view) == RASTER_STATUS_OK &&
         (info.codeWords == 0 || info.bpp == 32);
}

/// The bytes behind the header. Pixels that are stored as they are come without what the last
/// row's gap has beyond whole pixels.
uint64 payloadOf(const RasterBlockInfo& info) {
  if (info.codeWords != 0) return uint64{info.codeWords} * 4;
  return pixelBytesOf(info) - pixelBytesOf(info) % (info.bpp / 8);
}

RasterStatus checkLimits(const RasterBlockInfo& info, uint64 size, const RasterLimits& limits) {
  const bool keeps = info.width <= limits.width && info.height <= limits.height &&
                     pixelBytesOf(info) <= std::min<uint64>(limits.pixelBytes, PTRDIFF_MAX) &&
                     size <= limits.inputBytes;
  return keeps ? RASTER_STATUS_OK : RASTER_STATUS_LIMIT;
}

/// The place of the second word of the next pair of equal words, or `words` when there is none.
size_t findPair(const uint8* code, size_t at, size_t words) {
  uint32 previous = wordAt(code, at);
  for (++at; at < words; ++at) {
    const uint32 word = wordAt(code, at);
    if (word == previous) return at;
    previous = word;
  }
  return words;
}

/// Whether a code makes exactly `total` pixels: literals up to a pair, then a count.
bool makesPixels(const uint8* code, size_t words, uint64 total) {
  uint64 made = 0;
  for (size_t at = 0; at < words;) {
    const size_t pair = findPair(code, at, words);
    if (pair + 1 >= words) {  // no pair, or one without a count
      made += words - at;
      break;
    }
    made += pair + 1 - at + uint64{wordAt(code, pair + 1)};
    if (made > total) return false;
    at = pair + 2;
  }
  return made == total;
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_BlockInfo(const uint8* block, size_t size, const RasterLimits* limits,
                                     RasterBlockInfo* info) {
  using namespace raster::checked;
  if (block == nullptr || info == nullptr) return RASTER_STATUS_NULL;
  if (size < kHeaderBytes) return RASTER_STATUS_TRUNCATED;
  const RasterBlockInfo read = headerOf(block);
  if (!isHeader(read)) return RASTER_STATUS_DAMAGED;
  const uint64 payload = payloadOf(read);
  const RasterStatus status = checkLimits(read, payload + kHeaderBytes, limitsOf(limits));
  if (status != RASTER_STATUS_OK) return status;
  if (payload > size - kHeaderBytes) return RASTER_STATUS_TRUNCATED;
  *info = read;
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Decompress(const uint8* block, size_t size, const RasterLimits* limits,
                                      RasterView* pixels) {
  using namespace raster::checked;
  if (pixels == nullptr) return RASTER_STATUS_NULL;
  RasterBlockInfo info;
  const RasterStatus status = RasterChecked_BlockInfo(block, size, limits, &info);
  if (status != RASTER_STATUS_OK) return status;
  RasterView made = viewOf(info, nullptr);
  if (info.codeWords == 0) {
    // Raster_Decompress has another place for these.
    made.data = OwnedBytes::ofZeros(made.bytes).release();
    if (made.data == nullptr) return RASTER_STATUS_NO_MEMORY;
    memcpy(made.data, block + kHeaderBytes, static_cast<size_t>(payloadOf(info)));
  } else {
    if (!makesPixels(block + kHeaderBytes, info.codeWords, made.bytes / 4))
      return RASTER_STATUS_DAMAGED;
    uint32 ignored = 0;
    const auto unpack = [&] {
      Raster_Decompress(block, &made.data, &ignored, &ignored, &ignored, &ignored);
    };
    if (!attempt(unpack)) return RASTER_STATUS_NO_MEMORY;
  }
  *pixels = made;
  return RASTER_STATUS_OK;
}

RasterStatus RasterChecked_Compress(const RasterView* view, uint8** block, size_t* size) {
  using namespace raster::checked;
  if (block == nullptr || size == nullptr) return RASTER_STATUS_NULL;
  const RasterStatus status = checkPixels(view);
  if (status != RASTER_STATUS_OK) return status;
  const uint64 bytes = uint64{view->pitch} * view->height;
  if (bytes > view->bytes) return RASTER_STATUS_BAD_VIEW;
  if (bytes > kMaxBlock) return RASTER_STATUS_TOO_BIG;
  if (bytes != 0 && view->data == nullptr) return RASTER_STATUS_NULL;
  uint8* made = nullptr;
  uint32 madeBytes = 0;
  const auto pack = [&] {
    Raster_Compress(view->data, view->pitch, view->bpp, view->width, view->height, &made,
                    &madeBytes);
  };
  if (!attempt(pack)) return RASTER_STATUS_NO_MEMORY;
  *block = made;
  *size = madeBytes;
  return RASTER_STATUS_OK;
}

}  // extern "C"
