// SPDX-License-Identifier: MIT
//
// What other libraries print on standard error, caught so that it can become part of one message.

#ifndef RASTER_TOOLS_STANDARD_ERROR_H
#define RASTER_TOOLS_STANDARD_ERROR_H

#include <cstdio>
#include <string>

namespace tool {

/// While it lives, output to the stream `stderr` is collected.
class CaughtStandardError {
 public:
  CaughtStandardError();
  ~CaughtStandardError();
  CaughtStandardError(const CaughtStandardError&) = delete;
  CaughtStandardError& operator=(const CaughtStandardError&) = delete;

  /// The first line so far, in parentheses after a space, or nothing.
  std::string remark();

 private:
  FILE* before;
  FILE* caught;
  char* text = nullptr;
  size_t size = 0;
};

}  // namespace tool

#endif
