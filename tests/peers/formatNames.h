// SPDX-License-Identifier: MIT
//
// For the tests of docs/formats.md: pixels that this library writes, read by somebody else under
// the name that the page gives.

#ifndef TESTS_PEERS_FORMAT_NAMES_H
#define TESTS_PEERS_FORMAT_NAMES_H

#include <gtest/gtest.h>

#include <array>

#include "raster.h"

/// Has `read` look at eight pixels of format `code`: with every field full or empty, the colours
/// are exact however a reader widens. `read` gets the pixel's bytes, at an address that is a
/// multiple of 16 and with rows of 16 bytes, and returns 0xRRGGBB.
template <class Read> void expectReads(int32 code, const Read& read) {
  for (uint32 i = 0; i < 8; ++i) {
    const uint32 color =
        0xFF000000U | (i & 1) * 0xFF0000U | (i >> 1 & 1) * 0xFF00U | (i >> 2) * 0xFFU;
    alignas(16) std::array<uint8, 16> bytes = {};
    Raster_ConvertPixels(bytes.data(), 16, code, &color, 4, RASTER_FORMAT_8888, false, nullptr, 0,
                         0, 0, 0, 1, 1);
    EXPECT_EQ(read(bytes.data()) & 0xFFFFFFU, color & 0xFFFFFFU) << "format " << code;
  }
}

#endif
