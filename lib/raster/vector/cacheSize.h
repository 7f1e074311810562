// SPDX-License-Identifier: MIT
//
// Whether work is beyond the caches: then it pays to store past them, since memory that is not read
// need not be fetched before it is overwritten.

#ifndef RASTER_CACHE_SIZE_H
#define RASTER_CACHE_SIZE_H

#include "baseTypes.h"

namespace raster {

/// What isBeyondCaches takes for the largest cache at least and at most. A cache that is larger is
/// shared by many processors.
inline constexpr uint32 kLeastCacheBytes = 8u << 20;
inline constexpr uint32 kMostCacheBytes = 32u << 20;

/// The size of this processor's largest cache, within these bounds; asked for once.
uint32 largestCacheBytes();

/// Whether `bytes`, all that a call reads and writes, fill the largest cache.
inline bool isBeyondCaches(uint64 bytes) {
  return bytes >= kLeastCacheBytes && bytes >= largestCacheBytes();
}

}  // namespace raster

#endif
