// SPDX-License-Identifier: MIT
//
// Blocks of the raster compression in memory, read with mistrust: the library takes them at their
// word.

#ifndef RASTER_TOOLS_RASTER_BLOCK_H
#define RASTER_TOOLS_RASTER_BLOCK_H

#include <vector>

#include "inputStream.h"
#include "packedBlock.h"
#include "picture.h"

namespace tool {

/// A picture's block, in 8, 16, 24 or 32 bits per pixel as the picture is.
std::vector<uint8> packBlock(const Picture& picture);

/// Reads a block, of which `start` has been read already, and a byte of what follows it, if
/// anything does.
std::vector<uint8> readBlock(InputStream& input, std::vector<uint8> start = {});

/// The header of a block of which these are the first bytes; fails when it cannot be sound.
BlockHeader blockHeader(const std::vector<uint8>& block);

/// The picture in a whole block; fails when the block is not sound.
Picture unpackBlock(const std::vector<uint8>& block);

}  // namespace tool

#endif
