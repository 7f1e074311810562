// SPDX-License-Identifier: MIT
//
// Bytes that go to a viewer: a growable buffer whose new bytes are not set, and numbers in the
// order of the network, highest byte first.

#ifndef RASTER_TOOLS_LIVE_BYTES_H
#define RASTER_TOOLS_LIVE_BYTES_H

#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>

#include "baseTypes.h"

namespace tool::live {

class Bytes {
 public:
  const uint8* data() const { return memory.get(); }
  uint8* data() { return memory.get(); }
  size_t size() const { return used; }
  bool empty() const { return used == 0; }

  /// Forgets the bytes and keeps the memory.
  void clear() { used = 0; }
  /// Releases the memory as well.
  void release() {
    memory.reset();
    used = allocated = 0;
  }
  /// Takes bytes off the end.
  void truncate(size_t size) { used = size; }

  /// Adds `count` bytes whose values are not set. Earlier addresses are no longer valid.
  uint8* extend(size_t count) {
    if (count > allocated - used) grow(count);
    uint8* added = memory.get() + used;
    used += count;
    return added;
  }
  void append(const void* bytes, size_t count) {
    if (count != 0) memcpy(extend(count), bytes, count);
  }
  void put8(uint32 value) { *extend(1) = static_cast<uint8>(value); }
  void put16(uint32 value) {
    put8(value >> 8);
    put8(value);
  }
  void put32(uint32 value) {
    put16(value >> 16);
    put16(value);
  }

 private:
  void grow(size_t count) {
    const size_t size = 2 * (used + count);
    void* moved = realloc(memory.get(), size);
    if (moved == nullptr) throw std::bad_alloc();
    (void)memory.release();
    memory.reset(static_cast<uint8*>(moved));
    allocated = size;
  }

  struct Free {
    void operator()(uint8* bytes) const { free(bytes); }
  };
  std::unique_ptr<uint8[], Free> memory;
  size_t used = 0;
  size_t allocated = 0;
};

inline uint32 bigEndian16(const uint8* bytes) { return uint32{bytes[0]} << 8 | bytes[1]; }
inline uint32 bigEndian32(const uint8* bytes) {
  return bigEndian16(bytes) << 16 | bigEndian16(bytes + 2);
}

/// Stores a number over bytes that are there already.
inline void storeBigEndian16(uint8* bytes, uint32 value) {
  bytes[0] = static_cast<uint8>(value >> 8);
  bytes[1] = static_cast<uint8>(value);
}
inline void storeBigEndian32(uint8* bytes, uint32 value) {
  storeBigEndian16(bytes, value >> 16);
  storeBigEndian16(bytes + 2, value);
}

}  // namespace tool::live

#endif
