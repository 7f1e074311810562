// SPDX-License-Identifier: MIT
//
// The naive model of the comparisons: one byte at a time. It shares nothing with the library.

#ifndef TESTS_RASTER_COMP_REFERENCE_H
#define TESTS_RASTER_COMP_REFERENCE_H

#include <vector>

#include "baseTypes.h"

namespace reference {

using Bytes = std::vector<uint8>;

/// A rectangle's place: the index of its first byte, and the bytes from row to row.
struct Rows {
  size_t first;
  size_t pitch;
};

/// -1, 0 or 1. With 4 bytes per pixel the fourth one is left out.
int compare(const Bytes& a, Rows aRows, const Bytes& b, Rows bRows, uint32 bytesPerPixel,
            uint32 width, uint32 height);

/// Whether at most maxDiffs * n bytes differ, for `bitsPerPixel` / 8 rounded up to n.
bool compareMasked(const Bytes& a, const Bytes& b, const Bytes& mask, int32 bitsPerPixel,
                   int32 maxDiffs);

}  // namespace reference

#endif
