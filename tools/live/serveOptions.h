// SPDX-License-Identifier: MIT
//
// What the command line of `serve` says.

#ifndef RASTER_TOOLS_LIVE_SERVE_OPTIONS_H
#define RASTER_TOOLS_LIVE_SERVE_OPTIONS_H

#include <optional>
#include <string>
#include <vector>

#include "rect.h"

namespace tool::live {

struct ServeOptions {
  std::string display;
  std::string address = "127.0.0.1:5900";
  std::string socketPath;
  bool anyone = false;
  std::optional<Rect> region;
  std::vector<Rect> hidden;
  double scale = 1;
  bool showChanges = false;
  bool input = false;
  std::string recording;
  bool once = false;
  bool stats = false;
  double maxRate = 60;
  double busyRate = 20;
};

}  // namespace tool::live

#endif
