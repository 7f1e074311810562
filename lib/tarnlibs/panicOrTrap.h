// SPDX-License-Identifier: MIT
//
// For the libraries themselves: a Panic after which nothing runs, whatever the host's own does.

#ifndef TARNLIBS_PANIC_OR_TRAP_H
#define TARNLIBS_PANIC_OR_TRAP_H

namespace tarnlibs {

/// The function that is found under the name Panic. A host's may return, against its declaration,
/// which would have the compiler leave out what follows a call.
extern "C" void anyPanic(const char* format, ...) __asm__("Panic");

/// As Panic. When that returns, the process ends in an illegal instruction.
template <class... Arguments>
[[noreturn]] inline void panicOrTrap(const char* format, Arguments... arguments) {
  anyPanic(format, arguments...);
  __builtin_trap();
}

}  // namespace tarnlibs

#endif
