// SPDX-License-Identifier: MIT
//
// The kernels of format conversion.

#ifndef RASTER_RASTER_CONV_INTERNAL_H
#define RASTER_RASTER_CONV_INTERNAL_H

#include <array>

#include "frame/frameBuffer.h"
#include "frame/pixelFormat.h"

namespace raster {

/// Where a palette has the entry of a pixel.
inline const uint8* entryAt(const uint8* palette, uint32 pixel) {
  return rowAt(palette, 0, 0, pixel, sizeof(uint32));
}

/// Converts rows; `palette` is the bytes of 32-bit entries, null without a palette.
using ConvertKernel = void (*)(const RowPair& rows, const uint8* palette);

/// The kernels from one source, in the order of DestinationFormats; null where the formats agree.
using ConvertKernelsFrom = std::array<ConvertKernel, std::tuple_size_v<DestinationFormats>>;

/// The kernels of one instruction-set level, by source in the order of SourceFormats. Last come
/// those that look one-byte pixels up in a palette.
constexpr size_t kPaletteSource = std::tuple_size_v<SourceFormats>;
using ConvertKernels = std::array<ConvertKernelsFrom, kPaletteSource + 1>;

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const ConvertKernels* lookUpConvert();

}  // namespace raster

#endif
