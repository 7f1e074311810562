// SPDX-License-Identifier: MIT

#include "support/accessLog.h"

#include <sys/mman.h>
#include <ucontext.h>
#include <unistd.h>

#include <array>
#include <csignal>
#include <cstdint>
#include <cstdlib>

namespace tests {
namespace {

constexpr unsigned kTrapFlag = 0x100;      // of the processor: stop after one instruction
constexpr unsigned kWriteFault = 2;        // of a page fault's error code
constexpr size_t kMostAccesses = 1 << 20;  // no allocation in a signal handler

struct Watch {
  uint8* first = nullptr;
  size_t size = 0;
  std::array<Access, kMostAccesses> accesses;
  size_t count = 0;
  const std::function<void()>* between = nullptr;
};
Watch watch;

void permit(int protection) {
  if (mprotect(watch.first, watch.size, protection) != 0) abort();
}

auto& registersOf(void* context) { return static_cast<ucontext_t*>(context)->uc_mcontext.gregs; }

/// Notes a fault in the watched memory and lets its instruction through.
void onFault(int /*signal*/, siginfo_t* info, void* context) {
  const auto offset =
      reinterpret_cast<uintptr_t>(info->si_addr) - reinterpret_cast<uintptr_t>(watch.first);
  if (offset >= watch.size || watch.count == kMostAccesses) abort();
  auto& registers = registersOf(context);
  watch.accesses[watch.count++] = {offset, (registers[REG_ERR] & kWriteFault) != 0};
  permit(PROT_READ | PROT_WRITE);
  registers[REG_EFL] |= kTrapFlag;
}

/// Closes the memory again after that instruction.
void onStep(int /*signal*/, siginfo_t* /*info*/, void* context) {
  if (*watch.between) (*watch.between)();
  permit(PROT_NONE);
  registersOf(context)[REG_EFL] &= ~static_cast<greg_t>(kTrapFlag);
}

struct sigaction handled(int signal, void (*handler)(int, siginfo_t*, void*)) {
  struct sigaction action {};
  struct sigaction before {};
  action.sa_sigaction = handler;
  action.sa_flags = SA_SIGINFO;
  if (sigaction(signal, &action, &before) != 0) abort();
  return before;
}

}  // namespace

WatchedMemory::WatchedMemory(size_t size) {
  const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
  mappedSize_ = (size + page - 1) / page * page;
  void* mapping =
      mmap(nullptr, mappedSize_, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (mapping == MAP_FAILED) abort();
  data_ = static_cast<uint8*>(mapping);
}

WatchedMemory::~WatchedMemory() { munmap(data_, mappedSize_); }

std::vector<Access> WatchedMemory::accessesOf(const std::function<void()>& call,
                                              const std::function<void()>& between) {
  watch.first = data_;
  watch.between = &between;
  watch.size = mappedSize_;
  watch.count = 0;
  const struct sigaction faults = handled(SIGSEGV, onFault);
  const struct sigaction steps = handled(SIGTRAP, onStep);
  permit(PROT_NONE);
  call();
  permit(PROT_READ | PROT_WRITE);
  sigaction(SIGSEGV, &faults, nullptr);
  sigaction(SIGTRAP, &steps, nullptr);
  return {watch.accesses.begin(), watch.accesses.begin() + watch.count};
}

}  // namespace tests
