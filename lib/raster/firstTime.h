// SPDX-License-Identifier: MIT
//
// Messages that are logged once per process, each with a flag of its own.

#ifndef RASTER_FIRST_TIME_H
#define RASTER_FIRST_TIME_H

#include <atomic>

namespace raster {

/// Sets the flag of a message; true if it was clear.
inline bool firstTime(std::atomic<bool>& said) {
  return !said.exchange(true, std::memory_order_relaxed);
}

}  // namespace raster

#endif
