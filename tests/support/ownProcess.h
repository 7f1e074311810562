// SPDX-License-Identifier: MIT
//
// A call in a process of its own, for state that lasts as long as a process and for calls that end
// it.

#ifndef TESTS_OWN_PROCESS_H
#define TESTS_OWN_PROCESS_H

#include <functional>
#include <string>

namespace tests {

/// Runs `call` in a child process that starts with the library's state of this one, and returns
/// what it sent to Log there. A child that does not end well gives "the child failed".
std::string logOfOwnProcess(const std::function<void()>& call);

/// Runs `call` in a child process and returns the signal that ended it, 0 when it ended otherwise.
int signalOfOwnProcess(const std::function<void()>& call);

}  // namespace tests

#endif
