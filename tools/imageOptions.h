// SPDX-License-Identifier: MIT
//
// Options that several subcommands share: where the result goes, and pixel formats.

#ifndef RASTER_TOOLS_IMAGE_OPTIONS_H
#define RASTER_TOOLS_IMAGE_OPTIONS_H

#include <string>
#include <vector>

#include "commandLine.h"
#include "picture.h"

namespace tool {

struct OutputOptions {
  std::string path;
  std::string format;
  int compression = -1;
  bool keepAlpha = false;
  bool noAlpha = false;

  /// OUT.
  void addPathTo(OptionList& command);
  /// OUT and --format.
  void addTo(OptionList& command);
  void addCompressionTo(OptionList& command);
  /// --no-alpha and --keep-alpha, for commands that keep alpha anyhow.
  void addAlphaTo(OptionList& command);
  SaveOptions forSave() const;
  /// A usage error for --keep-alpha, since pixels of this depth have none.
  void refuseToKeepAlphaOf(uint32 code) const;
  /// Writes a picture with its alpha, of which `picture` has some if it has 32 bits; says so when
  /// that cannot be kept.
  void saveWithAlpha(const Picture& picture) const;
};

/// --depth, one of the given pixel formats.
Option addDepth(OptionList& command, uint32& code, const std::vector<uint32>& allowed,
                const std::string& description);

}  // namespace tool

#endif
