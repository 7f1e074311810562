// SPDX-License-Identifier: MIT
//
// What the program says about itself: help that fits a terminal, the version, and better words for
// the commonest mistakes.

#ifndef RASTER_TOOLS_HELP_H
#define RASTER_TOOLS_HELP_H

#include <string>

#include "commandLine.h"

namespace tool {

void addHelpCommand(Commands& commands);

/// Gives the program and all the commands that it has this form of help, -h and -V.
void addHelp(Commands& commands);

/// The version, and the instruction-set level that the library runs at.
std::string versionText();

/// What is wrong with a command line, and what may have been meant.
std::string explanation(const Commands& commands, const UsageError& error, int argc,
                        const char* const* argv);

}  // namespace tool

#endif
