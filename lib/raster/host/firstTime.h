// SPDX-License-Identifier: MIT
//
// Messages that are logged once per process, each with a flag of its own.

#ifndef RASTER_FIRST_TIME_H
#define RASTER_FIRST_TIME_H

#include <atomic>

#include "baseTypes.h"

namespace raster {

/// Sets the flag of a message; true if it was clear.
inline bool firstTime(std::atomic<bool>& said) {
  return !said.exchange(true, std::memory_order_relaxed);
}

/// Logs once that a function does not support a number; `format` has a %s and a %d or %u.
void logOnce(std::atomic<bool>& said, const char* format, const char* function, uint32 number);

}  // namespace raster

#endif
