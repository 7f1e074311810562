// SPDX-License-Identifier: MIT
//
// Names on the command line: of operations, formats and commands, and what somebody may have meant.

#ifndef RASTER_TOOLS_NAMES_H
#define RASTER_TOOLS_NAMES_H

#include <span>
#include <string>
#include <vector>

#include "baseTypes.h"

namespace tool {

/// Whether two names are the same when case, dashes and underscores do not count.
bool sameName(const std::string& a, const std::string& b);

/// The names in a list with blanks between them; the first one is the usual one.
std::vector<std::string> namesIn(const char* list);
bool isOneOf(const char* list, const std::string& name);
std::string firstOf(const char* list);

/// The place in a table of lists of a name, or the number that the text is. A usage error shows
/// every list's first name.
uint32 numberOfName(const std::string& text, std::span<const char* const> lists);

/// The first names, separated by commas.
std::string listOf(std::span<const char* const> lists);

/// "; did you mean 'x'?" for the known name that is nearest to a wrong one, or nothing when none is
/// near.
std::string suggestion(const std::string& wrong, const std::vector<std::string>& known);

}  // namespace tool

#endif
