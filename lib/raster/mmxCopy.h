// SPDX-License-Identifier: MIT
//
// The copy that bypasses the cache, for large copies on old machines (see rasterops_mmx).

#ifndef RASTER_MMX_COPY_H
#define RASTER_MMX_COPY_H

#include "baseTypes.h"

namespace raster {

/// Copies `height` rows of `bytes` bytes with 64-bit MMX loads and non-temporal stores. The head
/// that aligns the first destination row to 8 bytes is copied plainly, and the same head length
/// serves every row. `bytes` is at least 7. Leaves the floating-point state usable.
void mmxCopyRows(uint8* dst, intptr_t dstStep, const uint8* src, intptr_t srcStep, size_t bytes,
                 uint32 height);

}  // namespace raster

#endif
