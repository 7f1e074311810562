// SPDX-License-Identifier: MIT
//
// Numbers on the command line. An option with one of these checks takes plain decimal numbers only:
// no other base, no "nan" or "inf", no leading zeros of whole numbers, nothing after the digits.

#ifndef RASTER_TOOLS_NUMBERS_H
#define RASTER_TOOLS_NUMBERS_H

#include "baseTypes.h"
#include "commandLine.h"

namespace tool {

/// Checks an option whose value is a number between two limits, both allowed.
Check finiteNumber(double lowest, double highest);

/// Checks an option whose value is a whole number from `lowest` to `highest`, without a sign.
Check count(uint64 lowest, uint64 highest);

}  // namespace tool

#endif
