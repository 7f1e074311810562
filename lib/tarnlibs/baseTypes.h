// SPDX-License-Identifier: MIT
/// \file
/// The fixed-width integer names of every public interface, and the mark of an exported name.

#ifndef TARNLIBS_BASE_TYPES_H
#define TARNLIBS_BASE_TYPES_H

#include <stdbool.h>
#include <stddef.h>
#include <stdint.h>

typedef int8_t int8;      ///< signed, 8 bits
typedef uint8_t uint8;    ///< unsigned, 8 bits
typedef int16_t int16;    ///< signed, 16 bits
typedef uint16_t uint16;  ///< unsigned, 16 bits
typedef int32_t int32;    ///< signed, 32 bits
typedef uint32_t uint32;  ///< unsigned, 32 bits
typedef int64_t int64;    ///< signed, 64 bits
typedef uint64_t uint64;  ///< unsigned, 64 bits

/// The mark of an exported name.
#define TARNLIBS_EXPORT __attribute__((visibility("default")))

#endif
