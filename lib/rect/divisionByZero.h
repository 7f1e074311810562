// SPDX-License-Identifier: MIT
//
// Division by zero where it is the stated end of a call. A division in C++ would be undefined
// behaviour, which a compiler may move, drop or end in another way; the processor's own is none.

#ifndef RASTER_DIVISION_BY_ZERO_H
#define RASTER_DIVISION_BY_ZERO_H

#include "baseTypes.h"

namespace raster {

[[noreturn]] inline void divisionByZero() {
  asm volatile("divl %0" : : "r"(uint32{0}), "a"(uint32{0}), "d"(uint32{0}) : "cc");
  __builtin_unreachable();
}

}  // namespace raster

#endif
