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

/// A block that is released unless it is handed over.
class Block {
 public:
  /// `size` bytes, not initialised; none when there is no memory for them. No bytes need no memory.
  static Block ofSize(uint64 size) { return Block(allocate(size, false)); }
  static Block ofZeros(uint64 size) { return Block(allocate(size, true)); }

  explicit Block(uint8* bytes) : bytes_(bytes) {}
  ~Block() { free(bytes_); }
  Block(const Block&) = delete;
  Block& operator=(const Block&) = delete;

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
