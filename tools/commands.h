// SPDX-License-Identifier: MIT
//
// What a family of subcommands needs to add itself to the program, and the way all of them fail.

#ifndef RASTER_TOOLS_COMMANDS_H
#define RASTER_TOOLS_COMMANDS_H

#include <CLI/CLI.hpp>
#include <functional>
#include <stdexcept>
#include <string>

namespace tool {

/// Ends the command; the text is the one line that the user sees.
struct Failure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// A line on standard error about something that is worth knowing and no failure.
void note(const std::string& text);

enum ExitStatus : int { kSuccess = 0, kFailure = 1, kUsage = 2 };

/// The subcommands of the program, and which of them the command line chose.
class Commands {
 public:
  explicit Commands(CLI::App& program) : app(program) {}

  /// Adds a subcommand. `body` runs after the whole command line was understood and returns the
  /// exit status; when it throws Failure the program ends with `failureStatus`.
  CLI::App* add(const std::string& name, const std::string& description, std::function<int()> body,
                int failureStatus = kFailure) {
    CLI::App* command = app.add_subcommand(name, description);
    command->callback([this, body = std::move(body), failureStatus] {
      chosen = body;
      statusOfFailure = failureStatus;
    });
    return command;
  }

  CLI::App& program() { return app; }

  std::function<int()> chosen;
  int statusOfFailure = kFailure;

 private:
  CLI::App& app;
};

void addInfoCommand(Commands& commands);
void addImageCommands(Commands& commands);
void addRopCommand(Commands& commands);
void addBlendCommand(Commands& commands);
void addCursorCommand(Commands& commands);
void addScaleCommands(Commands& commands);
void addCompareCommand(Commands& commands);
void addScreenCommands(Commands& commands);
void addYuvCommand(Commands& commands);
void addPackCommands(Commands& commands);
void addServeCommand(Commands& commands);
void addPlayCommand(Commands& commands);

}  // namespace tool

#endif
