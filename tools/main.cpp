// SPDX-License-Identifier: MIT
//
// rastertool: screenshots, and every family of the library on pictures in files.

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <exception>
#include <new>
#include <optional>
#include <string>
#include <vector>

#include "commands.h"
#include "help.h"
#include "message.h"
#include "standardOutput.h"

namespace tool {
namespace {

int statusOfPanic = kFailure;

/// One line on standard error, whether or not the text brings its line end.
void complain(const char* text) {
  const size_t length = strcspn(text, "\n");
  // Not to the stream, which may be caught (standardError.h).
  dprintf(STDERR_FILENO, "rastertool: %.*s\n", static_cast<int>(length), text);
}

/// Fatal faults of the library, most of all exhausted memory, end the program like any failure.
void endOnPanic(const char* text) {
  complain(text);
  _exit(statusOfPanic);
}

int usageError(const std::string& text) {
  complain(text.c_str());
  fputs("Run with --help for more information.\n", stderr);
  return kUsage;
}

int runChosen(Commands& commands) {
  statusOfPanic = commands.statusOfFailure;
  Panic_SetSink(endOnPanic);
  Warning_SetSink([](const char*) {});  // a Panic follows, and one line is enough
  try {
    return commands.chosen();
  } catch (const UsageError& error) {  // arguments that only the body can judge
    return usageError(error.what());
  } catch (const std::bad_alloc&) {
    complain("out of memory");
  } catch (const std::exception& failure) {
    complain(failure.what());
  }
  return commands.statusOfFailure;
}

/// What was printed counts as done when it got where it should.
int closed(int status, int statusOfFailure) {
  if (closeStandardOutput() || status == statusOfFailure) return status;
  complain("cannot write standard output");
  return statusOfFailure;
}

/// The arguments. Standard input at a place ("-@X,Y") would look like an option.
std::vector<std::string> argumentsOf(int argc, char** argv) {
  std::vector<std::string> arguments(argv + std::min(argc, 1), argv + argc);
  for (std::string& argument : arguments)
    if (argument.rfind("-@", 0) == 0) argument.replace(0, 1, "/dev/stdin");
  return arguments;
}

int runCommandLine(int argc, char** argv) {
  Commands commands(
      "rastertool",
      "Screenshots of X displays, and raster graphics on pictures in files or pipes.");
  for (const auto addFamily :
       {addScreenCommands, addServeCommand, addPlayCommand, addInfoCommand, addImageCommands,
        addRopCommand, addBlendCommand, addCursorCommand, addScaleCommands, addCompareCommand,
        addYuvCommand, addPackCommands, addHelpCommand})
    addFamily(commands);
  addHelp(commands);
  try {
    const std::optional<std::string> answer = commands.parse(argumentsOf(argc, argv));
    if (answer) {
      fputs(answer->c_str(), stdout);
      return closed(kSuccess, kFailure);
    }
  } catch (const UsageError& error) {
    return usageError(explanation(commands, error, argc, argv));
  }
  return closed(runChosen(commands), commands.statusOfFailure);
}

/// What no command caught, such as no memory for the list of commands.
int runProgram(int argc, char** argv) noexcept {
  try {
    return runCommandLine(argc, argv);
  } catch (...) {
    complain("cannot start");
    return kFailure;
  }
}

}  // namespace

void note(const std::string& text) { complain(text.c_str()); }

}  // namespace tool

int main(int argc, char** argv) { return tool::runProgram(argc, argv); }
