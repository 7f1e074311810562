// SPDX-License-Identifier: MIT
//
// The families of subcommands: each adds itself to the program.

#ifndef RASTER_TOOLS_COMMANDS_H
#define RASTER_TOOLS_COMMANDS_H

#include "commandLine.h"
#include "failure.h"

namespace tool {

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
