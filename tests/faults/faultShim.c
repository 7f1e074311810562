// SPDX-License-Identifier: MIT
//
// To be preloaded: makes one call of the system fail, or sends the program a signal in it.
// FAULT=CALL:NUMBER:WHAT in the environment: the call of that name and number, from 1, fails with
// the error WHAT (a number), does half of its work (short), or comes after the signal -WHAT. Then
// the file FAULT_SEEN is made, from which a test learns that there was such a call.

#undef _FILE_OFFSET_BITS  // which would give two of the calls below one name
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <signal.h>
#include <stdarg.h>
#include <stdlib.h>
#include <string.h>
#include <sys/syscall.h>
#include <unistd.h>

enum { kShort = 1000 };

static long callsLeft = -1;

/// 0 for a call that is to work, or what is to happen.
static int faultOf(const char* name) {
  const char* fault = getenv("FAULT");
  const size_t length = strlen(name);
  if (fault == NULL || strncmp(fault, name, length) != 0 || fault[length] != ':') return 0;
  char* rest = NULL;
  const long number = strtol(fault + length + 1, &rest, 10);
  if (callsLeft < 0) callsLeft = number;
  if (callsLeft == 0 || --callsLeft != 0) return 0;
  const char* seen = getenv("FAULT_SEEN");
  if (seen != NULL) syscall(SYS_close, syscall(SYS_openat, AT_FDCWD, seen, O_CREAT, 0600));
  return strcmp(rest, ":short") == 0 ? kShort : atoi(rest + 1);
}

/// Whether the call fails now.
static int fails(const char* name) {
  const int fault = faultOf(name);
  if (fault < 0) raise(-fault);
  if (fault > 0 && fault != kShort) errno = fault;
  return fault > 0 && fault != kShort;
}

static mode_t modeOf(int flags, va_list arguments) {
  return (flags & O_CREAT) != 0 || (flags & O_TMPFILE) == O_TMPFILE ? va_arg(arguments, mode_t) : 0;
}

#define OPEN(name)                                                              \
  int name(const char* path, int flags, ...) {                                  \
    va_list arguments;                                                          \
    va_start(arguments, flags);                                                 \
    const mode_t mode = modeOf(flags, arguments);                               \
    va_end(arguments);                                                          \
    if (fails("open")) return -1;                                               \
    return (int)syscall(SYS_openat, AT_FDCWD, path, flags | O_LARGEFILE, mode); \
  }
#define OPENAT(name)                                                                       \
  int name(int folder, const char* path, int flags, ...) {                                 \
    va_list arguments;                                                                     \
    va_start(arguments, flags);                                                            \
    const mode_t mode = modeOf(flags, arguments);                                          \
    va_end(arguments);                                                                     \
    const int nameless = (flags & O_TMPFILE) == O_TMPFILE && getenv("NO_TMPFILE") != NULL; \
    if (nameless) errno = EOPNOTSUPP;                                                      \
    if (nameless || fails("open")) return -1;                                              \
    return (int)syscall(SYS_openat, folder, path, flags | O_LARGEFILE, mode);              \
  }
OPEN(open)
OPEN(open64)
OPENAT(openat)
OPENAT(openat64)

#define TRANSFER(name, Bytes)                                                   \
  ssize_t name(int file, Bytes bytes, size_t size) {                            \
    const int fault = faultOf(#name);                                           \
    if (fault < 0) raise(-fault);                                               \
    if (fault > 0 && fault != kShort) {                                         \
      errno = fault;                                                            \
      return -1;                                                                \
    }                                                                           \
    return syscall(SYS_##name, file, bytes, fault > 0 ? (size + 1) / 2 : size); \
  }
TRANSFER(read, void*)
TRANSFER(write, const void*)

int close(int file) {
  const int result = (int)syscall(SYS_close, file);
  return fails("close") ? -1 : result;
}
int fsync(int file) { return fails("fsync") ? -1 : (int)syscall(SYS_fsync, file); }
int fchmod(int file, mode_t mode) {
  return fails("fchmod") ? -1 : (int)syscall(SYS_fchmod, file, mode);
}
int linkat(int from, const char* old, int to, const char* new, int flags) {
  return fails("linkat") ? -1 : (int)syscall(SYS_linkat, from, old, to, new, flags);
}
int renameat(int from, const char* old, int to, const char* new) {
  return fails("rename") ? -1 : (int)syscall(SYS_renameat, from, old, to, new);
}
