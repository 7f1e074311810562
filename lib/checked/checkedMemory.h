// SPDX-License-Identifier: MIT
//
// Memory that may be refused.

#ifndef RASTER_CHECKED_MEMORY_H
#define RASTER_CHECKED_MEMORY_H

#include <cstdlib>

#include "rasterChecked.h"
#include "utilAlloc.h"

namespace raster::checked {

/// Runs `body`, which may call functions that allocate with UtilSafeMalloc0, once, before they own
/// anything else; false when there was no memory.
template <class Body> bool attempt(Body body) {
  return UtilSafeAttempt([](void* context) { (*static_cast<Body*>(context))(); }, &body);
}

/// Memory that is released unless it is handed over.
class OwnedBytes {
 public:
  /// `size` bytes, not initialised; none when there is no memory for them. No bytes need no memory.
  static OwnedBytes ofSize(uint64 size) { return OwnedBytes(allocate(size, false)); }
  static OwnedBytes ofZeros(uint64 size) { return OwnedBytes(allocate(size, true)); }

  explicit OwnedBytes(uint8* bytes) : bytes_(bytes) {}
  ~OwnedBytes() { free(bytes_); }
  OwnedBytes(const OwnedBytes&) = delete;
  OwnedBytes& operator=(const OwnedBytes&) = delete;

  explicit operator bool() const { return bytes_ != nullptr; }
  uint8* get() const { return bytes_; }
  uint8* release() {
    uint8* bytes = bytes_;
    bytes_ = nullptr;
    return bytes;
  }

 private:
  static uint8* allocate(uint64 size, bool zeros) {
    if (size > PTRDIFF_MAX) return nullptr;
    const size_t bytes = size != 0 ? static_cast<size_t>(size) : 1;
    return static_cast<uint8*>(zeros ? calloc(bytes, 1) : malloc(bytes));
  }

  uint8* bytes_;
};

}  // namespace raster::checked

#endif
