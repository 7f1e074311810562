// SPDX-License-Identifier: MIT

#include "progress.h"

#include <unistd.h>

#include <cstdio>
#include <utility>

namespace tool {
namespace {

constexpr std::chrono::milliseconds kPatience(500);
constexpr std::chrono::milliseconds kPace(100);

}  // namespace

Progress::Progress(std::string name, uint64 total)
    : work(std::move(name)),
      whole(total),
      onTerminal(isatty(STDERR_FILENO) == 1),
      next(Clock::now() + kPatience) {}

Progress::~Progress() {
  if (shown) fputs("\r\033[K", stderr);
}

void Progress::show(uint64 done) {
  if (!onTerminal || Clock::now() < next) return;
  fprintf(stderr, "\r%s: %llu", work.c_str(), static_cast<unsigned long long>(done));
  if (whole != 0) fprintf(stderr, " of %llu", static_cast<unsigned long long>(whole));
  fputs("\033[K", stderr);
  shown = true;
  next = Clock::now() + kPace;
}

}  // namespace tool
