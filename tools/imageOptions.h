// SPDX-License-Identifier: MIT
//
// Options that several subcommands share: where the result goes, and pixel formats.

#ifndef RASTER_TOOLS_IMAGE_OPTIONS_H
#define RASTER_TOOLS_IMAGE_OPTIONS_H

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "picture.h"

namespace tool {

struct OutputOptions {
  std::string path;
  std::string format;
  int compression = -1;
  bool keepAlpha = false;

  /// OUT.
  void addPathTo(CLI::App* command);
  /// OUT and --format.
  void addTo(CLI::App* command);
  /// --compression and --keep-alpha.
  void addEncodingTo(CLI::App* command);
  SaveOptions forSave() const;
};

/// --depth, one of the given pixel formats.
CLI::Option* addDepth(CLI::App* command, uint32& code, const std::vector<uint32>& allowed,
                      const std::string& description);

}  // namespace tool

#endif
