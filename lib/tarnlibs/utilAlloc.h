// SPDX-License-Identifier: MIT
/// \file
/// Allocation that never returns null. Memory comes from malloc and calloc; release it with free.

#ifndef TARNLIBS_UTIL_ALLOC_H
#define TARNLIBS_UTIL_ALLOC_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

/// \defgroup tarnlibs_allocation Allocation
/// @{

/// Returns `size` bytes, not initialised. A size of 0 gives a pointer that can be freed. When
/// memory is exhausted the call ends in Panic("Out of memory: %zu bytes\n").
TARNLIBS_EXPORT void* UtilSafeMalloc0(size_t size);

/// Returns `count` x `size` bytes, all zero. A product of 0 gives a pointer that can be freed. When
/// memory is exhausted or the product overflows, the call ends in
/// Panic("Out of memory: %zu x %zu bytes\n").
TARNLIBS_EXPORT void* UtilSafeCalloc0(size_t count, size_t size);

/// Runs body(context) and returns true. Should one of the functions above find no memory for the
/// calling thread meanwhile, `body` ends there without a Panic and the result is false.
///
/// `body` is left by longjmp: what it owned is not released and no destructor of it runs, so it may
/// own nothing by then that the caller cannot find through `context`. It must not be left in any
/// other way than by returning. Attempts may be nested; other threads are not concerned. A host's
/// own UtilSafeMalloc0 or UtilSafeCalloc0 knows of no attempt.
TARNLIBS_EXPORT bool UtilSafeAttempt(void (*body)(void* context), void* context);

/// @}

#ifdef __cplusplus
}
#endif

#endif
