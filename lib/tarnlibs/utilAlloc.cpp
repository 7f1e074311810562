// SPDX-License-Identifier: MIT
//
// Allocation that never returns null.

#include "utilAlloc.h"

#include <cstdlib>

#include "message.h"

extern "C" {

void* UtilSafeMalloc0(size_t size) {
  void* block = malloc(size != 0 ? size : 1);
  if (block == nullptr) Panic("Out of memory: %zu bytes\n", size);
  return block;
}

void* UtilSafeCalloc0(size_t count, size_t size) {
  const bool empty = count == 0 || size == 0;
  void* block = empty ? calloc(1, 1) : calloc(count, size);
  if (block == nullptr) Panic("Out of memory: %zu x %zu bytes\n", count, size);
  return block;
}

}  // extern "C"
