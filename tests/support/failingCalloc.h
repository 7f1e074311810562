// SPDX-License-Identifier: MIT
//
// A calloc that fails when it is told to, for one source of a program. Under the address sanitizer,
// which has a calloc of its own, it never does.

#ifndef TESTS_FAILING_CALLOC_H
#define TESTS_FAILING_CALLOC_H

#include <cstddef>

namespace tests {

inline bool callocFails = false;

}  // namespace tests

#ifndef __SANITIZE_ADDRESS__
extern "C" {
void* __libc_calloc(size_t count, size_t size);
void* calloc(size_t count, size_t size) noexcept {
  return tests::callocFails ? nullptr : __libc_calloc(count, size);
}
}
#endif

#endif
