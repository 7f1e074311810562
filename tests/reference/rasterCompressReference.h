// SPDX-License-Identifier: MIT
//
// The naive model of raster compression: the code as its three states, one word at a time. It
// shares nothing with the library.

#ifndef TESTS_RASTER_COMPRESS_REFERENCE_H
#define TESTS_RASTER_COMPRESS_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

using Bytes = std::vector<uint8>;
using Words = std::vector<uint32>;

Bytes toBytes(const Words& words);

/// The code of 32-bit pixels; empty when it is not shorter than they are.
Words encode(const Words& pixels);

/// The pixels of a code.
Words decode(const Words& code);

/// A whole block. `src` holds the pixels from its start on.
Bytes compress(const Bytes& src, uint32 pitch, uint32 bpp, uint32 width, uint32 height);

}  // namespace reference

#endif
