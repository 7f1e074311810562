// SPDX-License-Identifier: MIT
//
// Blocks of the raster compression that come from elsewhere: checked before they are unpacked.

#ifndef RASTER_TOOLS_PACKED_BLOCK_H
#define RASTER_TOOLS_PACKED_BLOCK_H

#include <string>

#include "rasterChecked.h"

namespace tool {

/// The five words that a block begins with.
struct BlockHeader {
  uint32 width;
  uint32 height;
  uint32 pitch;
  uint32 bpp;
  uint32 codeWords;  ///< 0: the pixels follow as they are

  bool isCoded() const { return codeWords != 0; }
  /// Bytes that follow the header.
  uint64 payload() const;
};

/// What is wrong with a header, or nothing: what libraster-checked refuses, and pictures without
/// pixels.
std::string headerFault(const BlockHeader& header);

/// Reads the header of a block and checks all of it: what is wrong, or nothing.
std::string blockFault(const uint8* block, size_t size, BlockHeader& header);

/// Unpacks a block into a frame buffer of its format and size: what was wrong, or nothing.
std::string drawBlock(const uint8* block, size_t size, const RasterView& to);

}  // namespace tool

#endif
