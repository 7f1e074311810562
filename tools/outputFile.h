// SPDX-License-Identifier: MIT
//
// Whole files out.

#ifndef RASTER_TOOLS_OUTPUT_FILE_H
#define RASTER_TOOLS_OUTPUT_FILE_H

#include <string>

#include "baseTypes.h"

namespace tool {

/// Writes a file that appears under `path` all at once (newFile.h), so that there is the whole new
/// file or what was there before. Where `path` is a device or a pipe, writes to it.
void writeFile(const std::string& path, const uint8* bytes, size_t size);

}  // namespace tool

#endif
