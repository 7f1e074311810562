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

void addWhere(OptionList& command, ServeOptions& options) {
  command.add("--display", options.display, "the X display; without it, the one in DISPLAY");
  Option listen =
      command
          .add("--listen", options.address,
               "where viewers connect; port 0 takes a free one. Every user of this machine "
               "reaches a port; viewers elsewhere come through ssh -L")
          .form("HOST:PORT")
          .withDefault();
  command.add("--socket", options.socketPath, "a UNIX socket for this user only, instead of a port")
      .form("PATH")
      .excludes(listen);
  command.addFlag("--anyone", options.anyone,
                  "allow an address that other machines reach: there is no password and no "
                  "encryption");
}

void addWhat(OptionList& command, ServeOptions& options) {
  command.addParsed("--region", options.region, parseRegion, "WxH+X+Y", "a part of the screen");
  command.addParsed("--hide", options.hidden, parseRegion, "WxH+X+Y",
                    "parts of the screen that are shown black");
  command.add("--scale", options.scale, "show it larger or smaller")
      .check(finiteNumber(0.05, 8))
      .form("FACTOR");
  command.addFlag("--show-changes", options.showChanges, "tint what has just changed for a moment");
  command.add("--max-rate", options.maxRate, "captures a second at most")
      .check(finiteNumber(0.1, 1000))
      .form("FPS")
      .withDefault();
  command
      .add("--busy-rate", options.busyRate,
           "captures a second at least, however much CPU time they cost")
      .check(finiteNumber(0.1, 1000))
      .form("FPS")
      .withDefault();
  Option input = command.addFlag("--input", options.input,
                                 "let viewers move the pointer and type; on a shared machine with "
                                 "--socket only");
  command.addFlag("--view-only", "viewers only look; this is the default").excludes(input);
  command
      .add("--record", options.recording,
           "write what is shown to a file, for `play`; also without viewers")
      .form("FILE");
  command.addFlag("--once", options.once, "serve one viewer and end when it leaves");
  command.addFlag("--stats", options.stats, "print what was done at the end");
}

}  // namespace

void addServeCommand(Commands& commands) {
  auto options = std::make_shared<ServeOptions>();
  Command command =
      commands.add("serve", "Shows a live X screen to VNC viewers, without a password.",
                   [options] { return serve(*options); });
  addWhere(command, *options);
  addWhat(command, *options);
}

}  // namespace tool
