// SPDX-License-Identifier: MIT
/// \file
/// A growable byte buffer.
///
/// The record is the caller's; its fields may be read at any time and are written by the functions
/// below only. No function is safe to call on one buffer from two threads at once.

#ifndef TARNLIBS_DYN_BUF_H
#define TARNLIBS_DYN_BUF_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

/// \defgroup tarnlibs_dynbuf Growable buffers
/// @{

/// The buffer's record, which is the caller's.
typedef struct DynBuf {
  uint8* data;       ///< the bytes, or null while none were appended; from malloc
  size_t size;       ///< bytes in use
  size_t allocated;  ///< bytes allocated
} DynBuf;

/// Makes `buffer` empty without looking at what it held. Nothing is allocated.
TARNLIBS_EXPORT void DynBuf_Init(DynBuf* buffer);

/// Appends `length` bytes, which must not lie in the buffer itself. The allocation at least doubles
/// when it must grow, unless there is no memory for that much. Returns false, with the buffer as it
/// was, when memory is exhausted or the size would not fit size_t.
TARNLIBS_EXPORT bool DynBuf_Append(DynBuf* buffer, const void* bytes, size_t length);

/// Releases the bytes and leaves an empty buffer, so that a second call does nothing.
TARNLIBS_EXPORT void DynBuf_Destroy(DynBuf* buffer);

/// @}

#ifdef __cplusplus
}
#endif

#endif
