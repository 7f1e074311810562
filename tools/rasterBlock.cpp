// SPDX-License-Identifier: MIT

#include "rasterBlock.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <utility>

#include "commands.h"
#include "raster.h"

namespace tool {
namespace {

template <class T> using Allocated = std::unique_ptr<T, decltype(&free)>;

[[noreturn]] void damaged(const std::string& why) { throw Failure("not a sound block: " + why); }

/// Pixel units of the image, row padding included.
uint64 unitsOf(const BlockHeader& header) {
  return uint64{header.pitch} * header.height / (header.bpp / 8);
}

/// Walks the code and returns how many pixels it makes: two equal pixels in a row are followed by a
/// count of further ones.
uint64 codedPixels(const std::vector<uint8>& block, uint32 codeWords) {
  enum { kFirst, kNext, kCount } state = kFirst;
  uint64 pixels = 0;
  uint32 previous = 0;
  for (uint32 i = 0; i < codeWords; ++i) {
    uint32 word;
    memcpy(&word, block.data() + sizeof(BlockHeader) + sizeof word * i, sizeof word);
    pixels += state == kCount ? word : 1;
    if (state == kCount) {
      state = kFirst;
    } else {
      state = state == kNext && word == previous ? kCount : kNext;
      previous = word;
    }
  }
  if (state == kCount) damaged("its code ends where a count should be");
  return pixels;
}

void checkCode(const std::vector<uint8>& block, const BlockHeader& header) {
  if (header.bpp != 32) damaged("only pixels of 32 bits can be coded");
  if (header.payload() != block.size() - sizeof header)
    damaged("its code is not as long as its header says");
  if (codedPixels(block, header.codeWords) != unitsOf(header))
    damaged("its code does not make the pixels that its header promises");
}

/// A picture of rows that lie `pitch` bytes apart.
Picture pictureOfRows(const BlockHeader& header, const uint8* rows) {
  Picture picture(header.width, header.height, header.bpp);
  Raster_RectCopy(picture.data(), picture.pitch(), rows, header.pitch, picture.bytesPerPixel(), 0,
                  0, 0, 0, header.width, header.height);
  return picture;
}

Picture decodeCoded(const std::vector<uint8>& block, const BlockHeader& header) {
  uint8* pixels = nullptr;
  uint32 pitch, bpp, width, height;
  Raster_Decompress(block.data(), &pixels, &pitch, &bpp, &width, &height);
  const Allocated<uint8> owner(pixels, free);
  return pictureOfRows(header, pixels);
}

/// The library copies the pixels of a stored block over its caller's pointer, so they are taken
/// from the block here.
Picture decodeStored(const std::vector<uint8>& block, const BlockHeader& header) {
  const uint64 stored = header.payload();
  if (block.size() - sizeof header != stored)
    damaged("its pixels are not as many as its header says");
  const uint64 needed = uint64{header.pitch} * (header.height - 1) + header.width * header.bpp / 8;
  if (stored < needed) damaged("its last pixel is cut off");
  std::vector<uint8> rows(block.begin() + sizeof header, block.end());
  rows.resize(size_t{header.pitch} * header.height);
  return pictureOfRows(header, rows.data());
}

}  // namespace

uint64 BlockHeader::payload() const {
  return isCoded() ? uint64{codeWords} * 4 : unitsOf(*this) * (bpp / 8);
}

std::vector<uint8> packBlock(const Picture& picture) {
  // Rows without padding: of a block with padding, the library stores whole pixel units only.
  const uint32 pitch = picture.width() * picture.bytesPerPixel();
  std::vector<uint8> rows(size_t{pitch} * picture.height());
  Raster_RectCopy(rows.data(), pitch, picture.data(), picture.pitch(), picture.bytesPerPixel(), 0,
                  0, 0, 0, picture.width(), picture.height());
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(rows.data(), pitch, picture.record.bpp, picture.width(), picture.height(), &block,
                  &size);
  const Allocated<uint8> owner(block, free);
  return {block, block + size};
}

BlockHeader blockHeader(const std::vector<uint8>& block) {
  constexpr uint64 kLargestPicture = uint64{1} << 30;
  constexpr uint32 kLargestSide = 1000000;
  BlockHeader header;
  if (block.size() < sizeof header) damaged("it is shorter than its header");
  memcpy(&header, block.data(), sizeof header);
  const uint32 bpp = header.bpp;
  if (bpp != 8 && bpp != 16 && bpp != 24 && bpp != 32)
    damaged("it has " + std::to_string(bpp) + " bits per pixel");
  if (header.width == 0 || header.height == 0 || header.width > kLargestSide ||
      header.height > kLargestSide)
    damaged("it is of " + std::to_string(header.width) + "x" + std::to_string(header.height) +
            " pixels");
  if (header.pitch < header.width * (bpp / 8)) damaged("its rows are longer than its pitch");
  if (uint64{header.pitch} * header.height > kLargestPicture) damaged("it is too large");
  return header;
}

std::vector<uint8> readBlock(InputStream& input, std::vector<uint8> start) {
  constexpr uint64 kLargestPayload = uint64{1} << 30;
  std::vector<uint8> block = std::move(start);
  const auto appendUpTo = [&](uint64 size) {
    if (block.size() < size) input.append(block, size - block.size());
  };
  appendUpTo(sizeof(BlockHeader));
  appendUpTo(sizeof(BlockHeader) + std::min(blockHeader(block).payload(), kLargestPayload) + 1);
  return block;
}

Picture unpackBlock(const std::vector<uint8>& block) {
  const BlockHeader header = blockHeader(block);
  if (header.isCoded()) checkCode(block, header);
  return header.isCoded() ? decodeCoded(block, header) : decodeStored(block, header);
}

}  // namespace tool
