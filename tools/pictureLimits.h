// SPDX-License-Identifier: MIT
//
// How large a picture from a file may be.

#ifndef RASTER_TOOLS_PICTURE_LIMITS_H
#define RASTER_TOOLS_PICTURE_LIMITS_H

#include "baseTypes.h"

namespace tool {

inline constexpr uint64 kLargestPicture = uint64{1} << 30;  ///< bytes
inline constexpr uint32 kLargestSide = 1000000;

}  // namespace tool

#endif
