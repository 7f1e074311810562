// SPDX-License-Identifier: MIT
//
// The main function of a fuzz target where there is no libFuzzer: gives it the inputs in the
// folders that are named, and some changed copies of each, always the same ones. usage: PROGRAM
// FOLDER...     (RASTER_TEST_SEED and RASTER_TEST_ROUNDS as for the tests)

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "fuzzing.h"
#include "support/random.h"

namespace {

namespace fs = std::filesystem;
using fuzz::Bytes;
using tests::Random;

constexpr size_t kSpareBytes = 64;

uint64 numberIn(const char* variable, uint64 otherwise) {
  const char* text = getenv(variable);
  return text != nullptr ? strtoull(text, nullptr, 0) : otherwise;
}

/// One change: a byte, a bit, bytes taken out, or bytes repeated.
size_t changeOnce(Random& random, uint8* bytes, size_t size, size_t maxSize) {
  if (size == 0) return 0;
  const size_t at = random.below(static_cast<uint32>(size));
  const size_t some = std::min(size - at, size_t{1} + random.below(16));
  switch (random.below(4)) {
    case 0:
      bytes[at] = static_cast<uint8>(random.next());
      return size;
    case 1:
      bytes[at] = static_cast<uint8>(bytes[at] ^ 1u << random.below(8));
      return size;
    case 2:
      std::copy(bytes + at + some, bytes + size, bytes + at);
      return size - some;
    default:
      if (some > maxSize - size) return size;
      std::copy_backward(bytes + at, bytes + size, bytes + size + some);
      return size + some;
  }
}

Bytes contentsOf(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

Bytes given;

/// Keeps the input that ended the process, for a debugger or libFuzzer.
void keepInput(int signal) {
  const int file = open("found-input", O_CREAT | O_WRONLY | O_TRUNC | O_CLOEXEC, 0666);
  if (write(file, given.data(), given.size()) == static_cast<ssize_t>(given.size()))
    dprintf(STDERR_FILENO, "signal %d: the input is in ./found-input\n", signal);
  std::signal(signal, SIG_DFL);
  raise(signal);
}

/// In memory that ends where the input ends.
void give(const uint8* bytes, size_t size) {
  given = Bytes(bytes, bytes + size);
  LLVMFuzzerTestOneInput(given.data(), given.size());
}

}  // namespace

// What libFuzzer offers to targets, and what they may offer to it.
extern "C" {
size_t LLVMFuzzerMutate(uint8* bytes, size_t size, size_t maxSize) {
  static Random random(numberIn("RASTER_TEST_SEED", 1));
  for (uint32 changes = 1 + random.below(4); changes != 0; --changes)
    size = changeOnce(random, bytes, size, maxSize);
  return size;
}
__attribute__((weak)) size_t LLVMFuzzerCustomMutator(uint8* bytes, size_t size, size_t maxSize,
                                                     unsigned /*seed*/) {
  return LLVMFuzzerMutate(bytes, size, maxSize);
}
}

int main(int argc, char** argv) {
  const auto copies = static_cast<unsigned>(numberIn("RASTER_TEST_ROUNDS", 100));
  unsigned inputs = 0;
  for (const int signal : {SIGILL, SIGTRAP, SIGSEGV, SIGABRT, SIGFPE})
    std::signal(signal, keepInput);
  for (int i = 1; i < argc; ++i) {
    std::vector<fs::path> paths(fs::directory_iterator(argv[i]), {});
    std::sort(paths.begin(), paths.end());
    for (const fs::path& path : paths) {
      const Bytes input = contentsOf(path);
      give(input.data(), input.size());
      for (unsigned copy = 1; copy <= copies; ++copy) {
        Bytes changed = input;
        changed.resize(input.size() + kSpareBytes);
        give(changed.data(),
             LLVMFuzzerCustomMutator(changed.data(), input.size(), changed.size(), copy));
      }
      inputs += 1 + copies;
    }
  }
  printf("%u inputs\n", inputs);
  return inputs != 0 ? 0 : 1;
}
