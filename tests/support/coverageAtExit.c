// SPDX-License-Identifier: MIT
//
// For scripts/coverage, to be preloaded: processes that end by _exit or a signal write GCC's
// counters too, which otherwise only those do that return from main. A limit of the size of files,
// which would leave counters cut off, ends before.

#define _GNU_SOURCE
#include <dlfcn.h>
#include <link.h>
#include <signal.h>
#include <stdlib.h>
#include <string.h>
#include <sys/resource.h>
#include <unistd.h>

typedef void (*Function)(void);

static const int kSignals[] = {SIGABRT, SIGFPE, SIGILL, SIGSEGV, SIGTRAP};

/// Runs the first destructor of an object of the build, which writes the counters.
static int writeCounters(struct dl_phdr_info* object, size_t size, void* build) {
  (void)size;
  char path[4096] = "";
  if (object->dlpi_name[0] != 0) {
    if (realpath(object->dlpi_name, path) == NULL) return 0;
  } else if (readlink("/proc/self/exe", path, sizeof path - 1) < 0) {
    return 0;
  }
  if (strncmp(path, build, strlen(build)) != 0) return 0;
  for (int i = 0; i < object->dlpi_phnum; ++i) {
    if (object->dlpi_phdr[i].p_type != PT_DYNAMIC) continue;
    const ElfW(Dyn)* entry = (const void*)(object->dlpi_addr + object->dlpi_phdr[i].p_vaddr);
    size_t bytes = 0;
    const Function* functions = NULL;
    for (; entry->d_tag != DT_NULL; ++entry) {
      if (entry->d_tag == DT_FINI_ARRAY)
        functions = (const void*)(object->dlpi_addr + entry->d_un.d_ptr);
      if (entry->d_tag == DT_FINI_ARRAYSZ) bytes = entry->d_un.d_val;
    }
    if (bytes >= 2 * sizeof *functions) functions[0]();  // one alone is the start files'
  }
  return 0;
}

static void liftLimit(void) {
  const struct rlimit none = {RLIM_INFINITY, RLIM_INFINITY};
  if (setrlimit(RLIMIT_FSIZE, &none) != 0) setenv("GCOV_PREFIX", "/dev/null", 1);  // writes nothing
}

static void writeAllCounters(void) {
  const char* build = getenv("COVERAGE_OF");
  if (build == NULL) return;
  liftLimit();
  dl_iterate_phdr(writeCounters, (void*)build);
}

void _exit(int status) {
  writeAllCounters();
  const Function next = (Function)dlsym(RTLD_NEXT, "_exit");
  ((void (*)(int))(void*)next)(status);
  __builtin_unreachable();
}

static void onSignal(int number) {
  writeAllCounters();
  signal(number, SIG_DFL);
  raise(number);
}

__attribute__((constructor)) static void start(void) {
  if (getenv("COVERAGE_OF") == NULL) return;
  atexit(liftLimit);
  for (size_t i = 0; i < sizeof kSignals / sizeof *kSignals; ++i) signal(kSignals[i], onSignal);
}
