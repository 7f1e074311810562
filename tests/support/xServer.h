// SPDX-License-Identifier: MIT
//
// A private X server for the tests that draw with one. Only their programs link this source and
// XCB.

#ifndef TESTS_X_SERVER_H
#define TESTS_X_SERVER_H

#include <sys/types.h>
#include <xcb/xcb.h>

#include <memory>
#include <string>

namespace tests {

/// A running Xvfb on a display of its own, with a connection to it. Both end with the object.
class XServer {
 public:
  /// Null where Xvfb is not installed or does not start; `why` then says what is missing.
  static std::unique_ptr<XServer> start(std::string& why);
  ~XServer();
  XServer(const XServer&) = delete;
  XServer& operator=(const XServer&) = delete;

  xcb_connection_t* connection() const { return connection_; }
  /// The only screen, of depth 24; pixmaps may have the depths 1, 8, 16, 24 and 32 as well.
  const xcb_screen_t& screen() const;

 private:
  explicit XServer(pid_t process) : process_(process) {}

  pid_t process_;
  xcb_connection_t* connection_ = nullptr;
};

/// One server for all tests of a program. Where there is none, the program says so at its start and
/// ends with the status that CTest counts as skipped.
XServer& theXServer();

}  // namespace tests

#endif
