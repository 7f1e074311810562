// SPDX-License-Identifier: MIT
//
// The ways a command ends other than well.

#ifndef RASTER_TOOLS_FAILURE_H
#define RASTER_TOOLS_FAILURE_H

#include <stdexcept>
#include <string>

namespace tool {

/// Ends the command; the text is the one line that the user sees.
struct Failure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// The command line makes no sense; the text is the line that the user sees.
struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// A line on standard error about something that is worth knowing and no failure.
void note(const std::string& text);

enum ExitStatus : int { kSuccess = 0, kFailure = 1, kUsage = 2 };

}  // namespace tool

#endif
