// SPDX-License-Identifier: MIT

#include "rasterBlock.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <utility>

#include "failure.h"
#include "raster.h"

namespace tool {
namespace {

template <class T> using Allocated = std::unique_ptr<T, decltype(&free)>;

[[noreturn]] void damaged(const std::string& why) { throw Failure("not a sound block: " + why); }

}  // namespace

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
  BlockHeader header;
  if (block.size() < sizeof header) damaged("it is shorter than its header");
  memcpy(&header, block.data(), sizeof header);
  const std::string fault = headerFault(header);
  if (!fault.empty()) damaged(fault);
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
  BlockHeader header;
  std::string fault = blockFault(block.data(), block.size(), header);
  if (!fault.empty()) damaged(fault);
  Picture picture(header.width, header.height, header.bpp);
  fault = drawBlock(block.data(), block.size(), picture.view());
  if (!fault.empty()) damaged(fault);
  return picture;
}

}  // namespace tool
