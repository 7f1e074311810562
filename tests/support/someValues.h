// SPDX-License-Identifier: MIT
//
// Random choices that many tests make.

#ifndef TESTS_SOME_VALUES_H
#define TESTS_SOME_VALUES_H

#include "support/guardedBuffer.h"
#include "support/random.h"

namespace tests {

inline Guard someGuard(Random& random) { return random.oneOf({Guard::kBefore, Guard::kAfter}); }

/// A width that is likely to meet a boundary of some vector size: below `small`, or now and then
/// one of many vectors.
inline uint32 someWidth(Random& random, uint32 small = 71) {
  return random.below(16) == 0 ? 1000 + random.below(2000) : random.below(small);
}

}  // namespace tests

#endif
