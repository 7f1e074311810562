// SPDX-License-Identifier: MIT
//
// The fixed-width integer names of every public interface, and the mark of an exported name.

#ifndef TARNLIBS_BASE_TYPES_H
#define TARNLIBS_BASE_TYPES_H

#include <stdbool.h>
#include <stddef.h>
#include <stdint.h>

typedef int8_t int8;
typedef uint8_t uint8;
typedef int16_t int16;
typedef uint16_t uint16;
typedef int32_t int32;
typedef uint32_t uint32;
typedef int64_t int64;
typedef uint64_t uint64;
#define TARNLIBS_EXPORT __attribute__((visibility("default")))

#endif
