// SPDX-License-Identifier: MIT
//
// Memory that the library has allocated for its caller.

#ifndef TESTS_ALLOCATED_H
#define TESTS_ALLOCATED_H

#include <cstdlib>
#include <memory>

#include "baseTypes.h"

namespace tests {

struct Free {
  void operator()(uint8* bytes) const { free(bytes); }
};
using Allocated = std::unique_ptr<uint8, Free>;

}  // namespace tests

#endif
