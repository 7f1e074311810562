// SPDX-License-Identifier: MIT
//
// SIGTERM and SIGINT as something that can be waited for.

#ifndef RASTER_TOOLS_LIVE_STOP_SIGNALS_H
#define RASTER_TOOLS_LIVE_STOP_SIGNALS_H

#include "listener.h"

namespace tool::live {

class StopSignals {
 public:
  StopSignals();
  /// Can be read once one of them has come.
  int descriptor() const { return readable.get(); }

 private:
  Descriptor readable;
};

}  // namespace tool::live

#endif
