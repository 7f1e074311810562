// SPDX-License-Identifier: MIT

#include "support/ownProcess.h"

#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <cstring>

#include "message.h"

namespace tests {
namespace {

int logPipe = -1;

void logToPipe(const char* text) {
  if (write(logPipe, text, strlen(text)) < 0) _exit(1);
}

std::string readAll(int from) {
  std::string all;
  char part[4096];
  for (ssize_t got = 0; (got = read(from, part, sizeof part)) > 0;)
    all.append(part, static_cast<size_t>(got));
  return all;
}

int statusOf(pid_t child) {
  int status = 0;
  if (waitpid(child, &status, 0) != child) abort();
  return status;
}

}  // namespace

std::string logOfOwnProcess(const std::function<void()>& call) {
  int ends[2];
  if (pipe(ends) != 0) abort();
  const pid_t child = fork();
  if (child < 0) abort();
  if (child == 0) {
    close(ends[0]);
    logPipe = ends[1];
    Log_SetSink(logToPipe);
    call();
    _exit(0);
  }
  close(ends[1]);
  std::string log = readAll(ends[0]);
  close(ends[0]);
  const int status = statusOf(child);
  return WIFEXITED(status) && WEXITSTATUS(status) == 0 ? log : "the child failed";
}

int signalOfOwnProcess(const std::function<void()>& call) {
  const pid_t child = fork();
  if (child < 0) abort();
  if (child == 0) {
    // Not a sanitizer's handlers, which report and exit.
    for (const int number : {SIGFPE, SIGILL, SIGSEGV}) signal(number, SIG_DFL);
    call();
    _exit(0);
  }
  const int status = statusOf(child);
  return WIFSIGNALED(status) ? WTERMSIG(status) : 0;
}

}  // namespace tests
