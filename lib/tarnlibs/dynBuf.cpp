// SPDX-License-Identifier: MIT
//
// A growable byte buffer.

#include "dynBuf.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <initializer_list>

namespace {

constexpr size_t kFirstAllocation = 256;

/// Doubles `allocated` until `needed` bytes fit; exactly `needed` where doubling would overflow.
size_t grownAllocation(size_t allocated, size_t needed) {
  const size_t doubled = allocated <= SIZE_MAX / 2 ? allocated * 2 : needed;
  const size_t grown = doubled < needed ? needed : doubled;
  return grown < kFirstAllocation ? kFirstAllocation : grown;
}

/// Makes room for `needed` bytes, more than there are: with room to grow, or just for them.
bool grow(DynBuf* buffer, size_t needed) {
  for (const size_t allocated : {grownAllocation(buffer->allocated, needed), needed}) {
    void* grown = realloc(buffer->data, allocated);
    if (grown == nullptr) continue;
    buffer->data = static_cast<uint8*>(grown);
    buffer->allocated = allocated;
    return true;
  }
  return false;
}

}  // namespace

extern "C" {

void DynBuf_Init(DynBuf* buffer) { *buffer = DynBuf{nullptr, 0, 0}; }

bool DynBuf_Append(DynBuf* buffer, const void* bytes, size_t length) {
  if (length == 0) return true;
  if (length > SIZE_MAX - buffer->size) return false;
  const size_t needed = buffer->size + length;
  if (needed > buffer->allocated && !grow(buffer, needed)) return false;
  memcpy(buffer->data + buffer->size, bytes, length);
  buffer->size = needed;
  return true;
}

void DynBuf_Destroy(DynBuf* buffer) {
  free(buffer->data);
  DynBuf_Init(buffer);
}

}  // extern "C"
