// SPDX-License-Identifier: MIT
//
// The working memory of one scaling call, released when the call ends.

#ifndef RASTER_RASTER_SCALE_MEMORY_H
#define RASTER_RASTER_SCALE_MEMORY_H

#include <cstddef>
#include <cstdlib>

#include "baseTypes.h"
#include "utilAlloc.h"

namespace raster {

/// One block, handed out in pieces; not initialised. Small calls do without the heap.
class ScaleMemory {
 public:
  explicit ScaleMemory(size_t bytes)
      : heap_(bytes > sizeof local_ ? UtilSafeMalloc0(bytes) : nullptr),
        next_(heap_ != nullptr ? static_cast<uint8*>(heap_) : local_) {}
  ~ScaleMemory() {
    if (heap_ != nullptr) free(heap_);  // a call of free, even of nothing, is a part of a small job
  }
  ScaleMemory(const ScaleMemory&) = delete;
  ScaleMemory& operator=(const ScaleMemory&) = delete;

  /// The bytes that take<T>(count) needs.
  template <class T> static constexpr size_t sizeOf(size_t count) {
    return (count * sizeof(T) + kAlignment - 1) / kAlignment * kAlignment;
  }

  template <class T> T* take(size_t count) {
    void* piece = next_;
    next_ += sizeOf<T>(count);
    return static_cast<T*>(piece);
  }

 private:
  static constexpr size_t kAlignment = 64;
  void* heap_;
  uint8* next_;
  alignas(kAlignment) uint8 local_[8192];
};

}  // namespace raster

#endif
