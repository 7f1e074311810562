// SPDX-License-Identifier: MIT
//
// serve: a live X screen for viewers.

#include <memory>

#include "commands.h"
#include "geometry.h"
#include "numbers.h"
#include "serveOptions.h"
#include "server.h"

namespace tool {
namespace {

using live::ServeOptions;

int serve(const ServeOptions& options) {
  live::Server server(options);
  server.run();
  return kSuccess;
}

void addWhere(CLI::App* command, ServeOptions& options) {
  command->add_option("--display", options.display,
                      "the X display; without it, the one in DISPLAY");
  CLI::Option* listen =
      command
          ->add_option("--listen", options.address,
                       "where viewers connect; port 0 takes a free one. Every user of this machine "
                       "reaches a port; viewers elsewhere come through ssh -L")
          ->type_name("HOST:PORT")
          ->capture_default_str();
  command
      ->add_option("--socket", options.socketPath,
                   "a UNIX socket for this user only, instead of a port")
      ->type_name("PATH")
      ->excludes(listen);
  command->add_flag("--anyone", options.anyone,
                    "allow an address that other machines reach: there is no password and no "
                    "encryption");
}

void addWhat(CLI::App* command, ServeOptions& options) {
  addParsed(command, "--region", options.region, parseRegion, "WxH+X+Y", "a part of the screen");
  command
      ->add_option_function<std::vector<std::string>>(
          "--hide",
          [&options](const std::vector<std::string>& texts) {
            for (const std::string& text : texts) options.hidden.push_back(parseRegion(text));
          },
          "parts of the screen that are shown black")
      ->type_name("WxH+X+Y");
  command->add_option("--scale", options.scale, "show it larger or smaller")
      ->check(finiteNumber(0.05, 8))
      ->type_name("FACTOR");
  command->add_flag("--show-changes", options.showChanges,
                    "tint what has just changed for a moment");
  command->add_option("--max-rate", options.maxRate, "captures a second at most")
      ->check(finiteNumber(0.1, 1000))
      ->type_name("FPS")
      ->capture_default_str();
  command
      ->add_option("--busy-rate", options.busyRate,
                   "captures a second at least, however much CPU time they cost")
      ->check(finiteNumber(0.1, 1000))
      ->type_name("FPS")
      ->capture_default_str();
  CLI::Option* input =
      command->add_flag("--input", options.input,
                        "let viewers move the pointer and type; on a shared machine with "
                        "--socket only");
  command->add_flag("--view-only")
      ->description("viewers only look; this is the default")
      ->excludes(input);
  command
      ->add_option("--record", options.recording,
                   "write what is shown to a file, for `play`; also without viewers")
      ->type_name("FILE");
  command->add_flag("--once", options.once, "serve one viewer and end when it leaves");
  command->add_flag("--stats", options.stats, "print what was done at the end");
}

}  // namespace

void addServeCommand(Commands& commands) {
  auto options = std::make_shared<ServeOptions>();
  CLI::App* command =
      commands.add("serve", "Shows a live X screen to VNC viewers, without a password.",
                   [options] { return serve(*options); });
  addWhere(command, *options);
  addWhat(command, *options);
}

}  // namespace tool
