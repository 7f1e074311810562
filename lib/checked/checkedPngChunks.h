// SPDX-License-Identifier: MIT
//
// What can be said about a PNG stream without decoding it.

#ifndef RASTER_CHECKED_PNG_CHUNKS_H
#define RASTER_CHECKED_PNG_CHUNKS_H

#include "rasterChecked.h"

namespace raster::checked {

// Colour types of the format.
enum PngColor : uint8 { kGrey = 0, kRgb = 2, kPalette = 3, kGreyAlpha = 4, kRgba = 6 };

/// Walks the chunks from the first one to IEND, whose header has been checked: TRUNCATED, LIMIT,
/// DAMAGED or OK. TRUNCATED as well where even the best compression could not make the pixels that
/// `info` promises from the bytes that are there.
RasterStatus checkChunks(const uint8* png, size_t size, const RasterPngInfo& info,
                         const RasterLimits& limits);

}  // namespace raster::checked

#endif
