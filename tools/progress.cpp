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
  fprintf(stderr, "\r%s: %llu of %llu\033[K", work.c_str(), static_cast<unsigned long long>(done),
          static_cast<unsigned long long>(whole));
  shown = true;
  next = Clock::now() + kPace;
}

}  // namespace tool
