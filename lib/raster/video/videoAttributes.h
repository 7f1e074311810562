// SPDX-License-Identifier: MIT
//
// The video frame layouts: their sizes and planes.

#ifndef RASTER_VIDEO_ATTRIBUTES_H
#define RASTER_VIDEO_ATTRIBUTES_H

#include "baseTypes.h"

extern "C" {

/// Gives the size of a frame in bytes and, for a planar format, the pitch in bytes and the offset
/// of each of its three planes. `pitches` and `offsets` (three entries each) may be null.
///
/// A packed format reports no planes: `pitches` stays as it is, and of `offsets` only the first
/// entry is set, to 0, as for every format. For an unknown format `size` is 0, the result false,
/// and the first such call of the process logs
/// "RasterComputeVideoAttributes: format :<format> not supported.\n".
bool RasterComputeVideoAttributes(uint32 format, uint32 width, uint32 height, uint32* size,
                                  uint32* pitches, uint32* offsets);

}  // extern "C"

#endif
