// SPDX-License-Identifier: MIT

#include "firstTime.h"

#include "message.h"

namespace raster {

void logOnce(std::atomic<bool>& said, const char* format, const char* function, uint32 number) {
  if (firstTime(said)) Log(format, function, number);
}

}  // namespace raster
