// SPDX-License-Identifier: MIT
//
// For functions of a test program that stand in front of those of a library.

#ifndef TESTS_NEXT_FUNCTION_H
#define TESTS_NEXT_FUNCTION_H

#include <dlfcn.h>

#include <cstring>

namespace tests {

/// The function of that name that the program would call without its own one.
template <class Function> Function next(const char* name) {
  void* address = dlsym(RTLD_NEXT, name);
  Function function = nullptr;
  memcpy(&function, &address, sizeof function);
  return function;
}

}  // namespace tests

#endif
