// SPDX-License-Identifier: MIT
//
// Long runs of memory by the processor's own string instructions. Beyond the inner caches they are
// ahead of stores of vectors: lines that are overwritten as a whole are not read first, and they
// stay in the caches that have room for them.

#ifndef RASTER_LONG_RUNS_H
#define RASTER_LONG_RUNS_H

#include <cstddef>
#include <cstring>

#include "baseTypes.h"

namespace raster {

/// Whether the processor says that its string instructions are fast for runs of any alignment
/// ("enhanced REP MOVSB/STOSB"); asked for once.
bool hasFastStringInstructions();

/// Whether `rows` runs of `bytes`, each of at least `leastBytes`, are better left to these
/// instructions: together they are more than the inner caches hold, or it is better there too.
inline bool areLongRuns(size_t bytes, uint32 rows, size_t leastBytes, bool anywhere = false) {
  constexpr uint64 kInnerCaches = uint64{1} << 20;
  return bytes >= leastBytes && (anywhere || uint64{bytes} * rows >= kInnerCaches) &&
         hasFastStringInstructions();
}

/// Stores a word over and over, the last time as much of it as fits. At least a word.
inline void storeLongRun(uint8* dst, uint32 word, size_t bytes) {
  // Words at multiples of their size: the first one goes where `dst` is, the others turned.
  const size_t skipped = (0 - reinterpret_cast<uintptr_t>(dst)) % sizeof word;
  const uint32 turned = skipped == 0 ? word : word >> 8 * skipped | word << (32 - 8 * skipped);
  memcpy(dst, &word, sizeof word);
  uint8* at = dst + skipped;
  size_t words = (bytes - skipped) / sizeof word;
  const size_t rest = (bytes - skipped) % sizeof word;
  asm volatile("rep stosl" : "+D"(at), "+c"(words) : "a"(turned) : "memory");
  memcpy(at, &turned, rest);
}

/// Copies bytes that are apart.
inline void copyLongRun(uint8* dst, const uint8* src, size_t bytes) {
  asm volatile("rep movsb" : "+D"(dst), "+S"(src), "+c"(bytes) : : "memory");
}

}  // namespace raster

#endif
