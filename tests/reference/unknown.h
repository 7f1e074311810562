// SPDX-License-Identifier: MIT
//
// What the naive models do with a number that they do not know: a new one is to be written into
// them, not taken for another.

#ifndef REFERENCE_UNKNOWN_H
#define REFERENCE_UNKNOWN_H

#include <cstdio>
#include <cstdlib>

#include "baseTypes.h"

namespace reference {

[[noreturn]] inline void unknown(const char* what, uint32 number) {
  fprintf(stderr, "The model has no %s %u.\n", what, number);
  abort();
}

}  // namespace reference

#endif
