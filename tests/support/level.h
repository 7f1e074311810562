// SPDX-License-Identifier: MIT
//
// The instruction-set level that the vector code runs at.

#ifndef TESTS_LEVEL_H
#define TESTS_LEVEL_H

#include <string>

namespace tests {

/// Whether this machine has a level: scalar, ssse3, sse4, avx2 or avx3.
bool machineHas(const std::string& level);

/// The level of this process: the one that RASTER_CPU_LEVEL names, or else the machine's best one.
std::string levelInUse();

}  // namespace tests

#endif
