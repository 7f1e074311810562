// SPDX-License-Identifier: MIT

#include "packedBlock.h"

#include <cstdlib>
#include <cstring>
#include <memory>

#include "pictureLimits.h"

namespace tool {
namespace {

constexpr RasterLimits kLimits = {kLargestSide, kLargestSide, kLargestPicture, UINT64_MAX, 0, 0};

/// Pixel units of the image, row padding included.
uint64 unitsOf(const BlockHeader& header) {
  return uint64{header.pitch} * header.height / (header.bpp / 8);
}

/// Walks the code and tells how many pixels it makes: two equal pixels in a row are followed by a
/// count of further ones. False when it ends where a count should be.
bool countPixels(const uint8* code, uint32 codeWords, uint64& pixels) {
  enum { kFirst, kNext, kCount } state = kFirst;
  uint32 previous = 0;
  for (uint32 i = 0; i < codeWords; ++i) {
    uint32 word;
    memcpy(&word, code + sizeof word * i, sizeof word);
    pixels += state == kCount ? word : 1;
    if (state == kCount) {
      state = kFirst;
    } else {
      state = state == kNext && word == previous ? kCount : kNext;
      previous = word;
    }
  }
  return state != kCount;
}

std::string codeFault(const uint8* code, size_t size, const BlockHeader& header) {
  if (header.payload() != size) return "its code is not as long as its header says";
  uint64 pixels = 0;
  if (!countPixels(code, header.codeWords, pixels)) return "its code ends where a count should be";
  if (pixels != unitsOf(header))
    return "its code does not make the pixels that its header promises";
  return {};
}

std::string storedFault(size_t size, const BlockHeader& header) {
  const uint64 stored = header.payload();
  if (size != stored) return "its pixels are not as many as its header says";
  const uint64 needed = uint64{header.pitch} * (header.height - 1) + header.width * header.bpp / 8;
  if (stored < needed) return "its last pixel is cut off";
  return {};
}

std::string wrongSize(const BlockHeader& header) {
  return "it is of " + std::to_string(header.width) + "x" + std::to_string(header.height) +
         " pixels";
}

/// In our words, why the library does not take a header.
std::string reasonAgainst(const BlockHeader& header, RasterStatus status) {
  const uint32 bpp = header.bpp;
  if (bpp != 8 && bpp != 16 && bpp != 24 && bpp != 32)
    return "it has " + std::to_string(bpp) + " bits per pixel";
  if (header.width > kLargestSide || header.height > kLargestSide) return wrongSize(header);
  if (header.pitch < header.width * (bpp / 8)) return "its rows are longer than its pitch";
  if (uint64{header.pitch} * header.height > kLargestPicture) return "it is too large";
  if (header.pitch % (bpp / 8) != 0 && bpp != 24) return "its rows do not begin at whole pixels";
  if (header.isCoded() && bpp != 32) return "only pixels of 32 bits can be coded";
  return RasterChecked_Text(status);
}

}  // namespace

uint64 BlockHeader::payload() const {
  return isCoded() ? uint64{codeWords} * 4 : unitsOf(*this) * (bpp / 8);
}

std::string headerFault(const BlockHeader& header) {
  uint8 bytes[sizeof header];
  memcpy(bytes, &header, sizeof header);
  RasterBlockInfo info;
  const RasterStatus status = RasterChecked_BlockInfo(bytes, sizeof bytes, &kLimits, &info);
  const bool isSound = status == RASTER_STATUS_OK || status == RASTER_STATUS_TRUNCATED;
  if (!isSound) return reasonAgainst(header, status);
  return header.width == 0 || header.height == 0 ? wrongSize(header) : "";
}

std::string blockFault(const uint8* block, size_t size, BlockHeader& header) {
  if (size < sizeof header) return "it is shorter than its header";
  memcpy(&header, block, sizeof header);
  std::string fault = headerFault(header);
  if (!fault.empty()) return fault;
  const uint8* payload = block + sizeof header;
  const size_t payloadSize = size - sizeof header;
  return header.isCoded() ? codeFault(payload, payloadSize, header)
                          : storedFault(payloadSize, header);
}

std::string drawBlock(const uint8* block, size_t size, const RasterView& to) {
  RasterView pixels;
  RasterStatus status = RasterChecked_Decompress(block, size, &kLimits, &pixels);
  if (status != RASTER_STATUS_OK) return RasterChecked_Text(status);
  const std::unique_ptr<uint8, decltype(&free)> owner(pixels.data, free);
  status = RasterChecked_Copy(&to, nullptr, &pixels, 0, 0, 0);
  return status != RASTER_STATUS_OK ? RasterChecked_Text(status) : "";
}

}  // namespace tool
