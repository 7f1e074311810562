// SPDX-License-Identifier: MIT
//
// The copy that bypasses the cache, for large copies on old machines (see rasterops_mmx).

#ifndef RASTER_MMX_COPY_H
#define RASTER_MMX_COPY_H

#include "frame/frameBuffer.h"

namespace raster {

/// Copies rows of at least 7 bytes with 64-bit MMX loads and non-temporal stores. The head that
/// aligns the first destination row to 8 bytes is copied plainly, and the same head length serves
/// every row. Leaves the floating-point state usable.
void mmxCopyRows(const RowPair& rows);

}  // namespace raster

#endif
