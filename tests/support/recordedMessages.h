// SPDX-License-Identifier: MIT
//
// What the library says during a call, word for word.

#ifndef TESTS_RECORDED_MESSAGES_H
#define TESTS_RECORDED_MESSAGES_H

#include <functional>
#include <string>

namespace tests {

/// The messages of one call, joined in order per kind.
struct Messages {
  std::string log;
  std::string warning;
  std::string panic;  ///< empty when the call returned
};

/// Runs `call` with sinks in place of standard error. A panic ends the call (by longjmp: objects of
/// `call` that need their destructor must live outside it).
Messages messagesOf(const std::function<void()>& call);

/// Whether `panic` is "<kind> <source>:<line><rest>\n" with any line number, for example
/// isPanic(text, "NOT_IMPLEMENTED", "lib/raster/rasterops") or
/// isPanic(text, "ASSERT", "lib/raster/rasterRect", " bugNr=15740").
bool isPanic(const std::string& panic, const std::string& kind, const std::string& source,
             const std::string& rest = "");

}  // namespace tests

#endif
