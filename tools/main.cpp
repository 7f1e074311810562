// SPDX-License-Identifier: MIT
//
// rastertool: screenshots, and every family of the library on pictures in files.

#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <exception>
#include <new>

#include "commands.h"
#include "message.h"
#include "rasterVersion.h"

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

int usageError(const CLI::ParseError& error) {
  complain(error.what());
  fputs("Run with --help for more information.\n", stderr);
  return kUsage;
}

int runChosen(Commands& commands) {
  statusOfPanic = commands.statusOfFailure;
  Panic_SetSink(endOnPanic);
  Warning_SetSink([](const char*) {});  // a Panic follows, and one line is enough
  try {
    return commands.chosen();
  } catch (const CLI::ParseError& error) {  // arguments that only the body can judge
    return usageError(error);
  } catch (const std::bad_alloc&) {
    complain("out of memory");
  } catch (const std::exception& failure) {
    complain(failure.what());
  }
  return commands.statusOfFailure;
}

int runCommandLine(int argc, char** argv) {
  CLI::App app("Screenshots of an X display, and raster graphics on PNG pictures.", "rastertool");
  app.require_subcommand(1);
  app.set_version_flag("--version", "rastertool " RASTER_VERSION);
  Commands commands(app);
  for (const auto addFamily :
       {addScreenCommands, addImageCommands, addRopCommand, addBlendCommand, addCursorCommand,
        addScaleCommands, addCompareCommand, addYuvCommand, addPackCommands})
    addFamily(commands);
  try {
    app.parse(argc, argv);
  } catch (const CLI::Success& help) {
    return app.exit(help);
  } catch (const CLI::ParseError& error) {
    return usageError(error);
  }
  return runChosen(commands);
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
}  // namespace tool

int main(int argc, char** argv) { return tool::runProgram(argc, argv); }
