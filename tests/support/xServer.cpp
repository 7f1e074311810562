// SPDX-License-Identifier: MIT

#include "support/xServer.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>

namespace tests {
namespace {

constexpr int kSkipped = 77;
constexpr int kStartMilliseconds = 30000;

/// Runs Xvfb in the child of a fork. It picks a free display and writes its number to `numberTo`.
[[noreturn]] void becomeServer(int numberTo) {
  prctl(PR_SET_PDEATHSIG, SIGTERM);
  const int nowhere = open("/dev/null", O_RDWR);
  dup2(nowhere, STDIN_FILENO);
  dup2(nowhere, STDOUT_FILENO);
  dup2(nowhere, STDERR_FILENO);
  const std::string number = std::to_string(numberTo);
  execlp("Xvfb", "Xvfb", "-displayfd", number.c_str(), "-screen", "0", "640x480x24", "-nolisten",
         "tcp", "-noreset", static_cast<char*>(nullptr));
  _exit(127);
}

/// The line that the server writes when it is ready: its display number. Empty when none came.
std::string readLine(int from) {
  std::string line;
  char c = 0;
  pollfd ready = {from, POLLIN, 0};
  while (poll(&ready, 1, kStartMilliseconds) == 1 && read(from, &c, 1) == 1) {
    if (c == '\n') return line;
    line += c;
  }
  return {};
}

}  // namespace

std::unique_ptr<XServer> XServer::start(std::string& why) {
  int ends[2];
  if (pipe(ends) != 0) {
    why = "no pipe";
    return nullptr;
  }
  const pid_t process = fork();
  if (process == 0) {
    close(ends[0]);
    becomeServer(ends[1]);
  }
  close(ends[1]);
  if (process < 0) {
    close(ends[0]);
    why = "no process";
    return nullptr;
  }
  std::unique_ptr<XServer> server(new XServer(process));
  const std::string display = readLine(ends[0]);
  close(ends[0]);
  if (display.empty()) {
    why = "Xvfb does not start (is it installed?)";
    return nullptr;
  }
  server->connection_ = xcb_connect((":" + display).c_str(), nullptr);
  if (xcb_connection_has_error(server->connection_) != 0) {
    why = "no connection to Xvfb on display :" + display;
    return nullptr;
  }
  return server;
}

XServer::~XServer() {
  if (connection_ != nullptr) xcb_disconnect(connection_);
  kill(process_, SIGTERM);
  waitpid(process_, nullptr, 0);
}

const xcb_screen_t& XServer::screen() const {
  return *xcb_setup_roots_iterator(xcb_get_setup(connection_)).data;
}

namespace {

std::unique_ptr<XServer> server;

class Environment : public testing::Environment {
  void SetUp() override {
    std::string why;
    server = XServer::start(why);
    if (server != nullptr) return;
    printf("skipped: no X server: %s\n", why.c_str());
    exit(kSkipped);
  }
  void TearDown() override { server.reset(); }
};
[[maybe_unused]] testing::Environment* const kEnvironment =
    testing::AddGlobalTestEnvironment(new Environment);

}  // namespace

XServer& theXServer() { return *server; }

}  // namespace tests
