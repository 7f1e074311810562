// SPDX-License-Identifier: MIT
//
// One piece of work of every family, on the exported functions of a library that is loaded when the
// program runs: two versions can be measured in one program.

#ifndef BENCH_WORKS_H
#define BENCH_WORKS_H

#include <functional>
#include <string>
#include <vector>

#include "support/jobs.h"

namespace bench {

/// The functions that the works call.
class Library {
 public:
  /// Loads a file, or what the program would be linked with when there is no slash in the name.
  /// Ends the program when something is missing.
  explicit Library(const char* path);

  template <class Function> Function* find(const char* name) const {
    return reinterpret_cast<Function*>(address(name));
  }

 private:
  void* address(const char* name) const;
  void* handle_;
};

struct Work {
  std::string name;
  /// What one call does to a rectangle of the shared memory.
  std::function<void()> (*make)(const Library&, Extent);
};

/// The works whose size is a rectangle.
const std::vector<Work>& works();

/// Twelve rectangles added to a list, which has no size.
std::function<void()> addRects(const Library& library);

}  // namespace bench

#endif
