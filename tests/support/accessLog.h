// SPDX-License-Identifier: MIT
//
// A record of every load and store that meets a piece of memory.

#ifndef TESTS_ACCESS_LOG_H
#define TESTS_ACCESS_LOG_H

#include <functional>
#include <vector>

#include "baseTypes.h"

namespace tests {

/// One load or store: where it starts in the watched memory, and which of the two it is.
struct Access {
  size_t offset;
  bool writes;
};

/// `size` bytes that start at a page and are only reachable one instruction at a time while a call
/// is watched. One object at a time may watch.
class WatchedMemory {
 public:
  explicit WatchedMemory(size_t size);
  ~WatchedMemory();
  WatchedMemory(const WatchedMemory&) = delete;
  WatchedMemory& operator=(const WatchedMemory&) = delete;

  uint8* data() { return data_; }

  /// Runs `call` and returns what it did to the memory, in order. `between` runs after every load
  /// and store, in a signal handler, and may use the memory: as another thread would.
  std::vector<Access> accessesOf(const std::function<void()>& call,
                                 const std::function<void()>& between = nullptr);

 private:
  uint8* data_ = nullptr;
  size_t mappedSize_ = 0;
};

}  // namespace tests

#endif
