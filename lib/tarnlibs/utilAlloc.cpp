// SPDX-License-Identifier: MIT
//
// Allocation that never returns null.

#include "utilAlloc.h"

#include <csetjmp>
#include <cstdlib>

#include "panicOrTrap.h"

namespace {

/// Where this thread's innermost attempt began; null outside of one.
constinit thread_local jmp_buf* attempt = nullptr;

/// Ends the attempt that is under way, if any.
void giveUpAttempt() {
  if (attempt != nullptr) longjmp(*attempt, 1);
}

}  // namespace

extern "C" {

void* UtilSafeMalloc0(size_t size) {
  void* block = malloc(size != 0 ? size : 1);
  if (block == nullptr) {
    giveUpAttempt();
    tarnlibs::panicOrTrap("Out of memory: %zu bytes\n", size);
  }
  return block;
}

void* UtilSafeCalloc0(size_t count, size_t size) {
  const bool empty = count == 0 || size == 0;
  void* block = empty ? calloc(1, 1) : calloc(count, size);
  if (block == nullptr) {
    giveUpAttempt();
    tarnlibs::panicOrTrap("Out of memory: %zu x %zu bytes\n", count, size);
  }
  return block;
}

bool UtilSafeAttempt(void (*body)(void* context), void* context) {
  jmp_buf landing;
  jmp_buf* const outer = attempt;  // not changed between setjmp and longjmp
  const bool begun = setjmp(landing) == 0;
  attempt = begun ? &landing : outer;
  if (!begun) return false;
  body(context);
  attempt = outer;
  return true;
}

}  // extern "C"
