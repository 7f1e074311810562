// SPDX-License-Identifier: MIT
//
// A line on a terminal that says how far a long piece of work is.

#ifndef RASTER_TOOLS_PROGRESS_H
#define RASTER_TOOLS_PROGRESS_H

#include <chrono>
#include <string>

#include "baseTypes.h"

namespace tool {

/// A total of 0 is one that is not known. Shows nothing when standard error is no terminal or the
/// work is done within half a second.
class Progress {
 public:
  Progress(std::string name, uint64 total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  void show(uint64 done);

 private:
  using Clock = std::chrono::steady_clock;

  std::string work;
  uint64 whole;
  bool onTerminal;
  bool shown = false;
  Clock::time_point next;
};

}  // namespace tool

#endif
