// SPDX-License-Identifier: MIT
//
// Allocation that never returns null. Memory comes from malloc and calloc; release it with free.

#ifndef TARNLIBS_UTIL_ALLOC_H
#define TARNLIBS_UTIL_ALLOC_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

/// Returns `size` bytes, not initialised. A size of 0 gives a pointer that can be freed. When
/// memory is exhausted the call ends in Panic("Out of memory: %zu bytes\n").
TARNLIBS_EXPORT void* UtilSafeMalloc0(size_t size);

/// Returns `count` x `size` bytes, all zero. A product of 0 gives a pointer that can be freed. When
/// memory is exhausted or the product overflows, the call ends in
/// Panic("Out of memory: %zu x %zu bytes\n").
TARNLIBS_EXPORT void* UtilSafeCalloc0(size_t count, size_t size);

#ifdef __cplusplus
}
#endif

#endif
