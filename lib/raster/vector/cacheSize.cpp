// SPDX-License-Identifier: MIT
//
// The size of the largest cache, as the processor tells it. (The C library tells the sum of all
// caches of that kind where a processor has several.)

#include "cacheSize.h"

#include <cpuid.h>

#include <algorithm>
#include <atomic>

namespace raster {
namespace {

// The leaves of cpuid that have a subleaf for each cache: Intel's, and AMD's in the same form.
constexpr unsigned kCacheLeaves[] = {4, 0x8000001D};
constexpr unsigned kMaxCaches = 16;

/// The size of the largest cache that a leaf tells of, 0 when it tells of none.
uint64 largestCacheOf(unsigned leaf) {
  uint64 largest = 0;
  for (unsigned cache = 0; cache < kMaxCaches; ++cache) {
    unsigned a = 0;
    unsigned b = 0;
    unsigned c = 0;
    unsigned d = 0;
    const bool isThere = __get_cpuid_count(leaf, cache, &a, &b, &c, &d) != 0 && (a & 0x1F) != 0;
    if (!isThere) break;
    const uint64 ways = (b >> 22) + 1;
    const uint64 partitions = (b >> 12 & 0x3FF) + 1;
    const uint64 lineBytes = (b & 0xFFF) + 1;
    const uint64 sets = uint64{c} + 1;
    largest = std::max(largest, ways * partitions * lineBytes * sets);
  }
  return largest;
}

uint32 askForLargestCache() {
  uint64 largest = 0;
  for (const unsigned leaf : kCacheLeaves) largest = std::max(largest, largestCacheOf(leaf));
  if (largest == 0) return kMostCacheBytes;
  return static_cast<uint32>(
      std::clamp(largest, uint64{kLeastCacheBytes}, uint64{kMostCacheBytes}));
}

}  // namespace

uint32 largestCacheBytes() {
  static constinit std::atomic<uint32> known{0};
  uint32 bytes = known.load(std::memory_order_relaxed);
  if (bytes == 0) {
    bytes = askForLargestCache();
    known.store(bytes, std::memory_order_relaxed);
  }
  return bytes;
}

}  // namespace raster
