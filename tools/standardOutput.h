// SPDX-License-Identifier: MIT
//
// Standard output as the place of a result ("-"), and where words go beside it.

#ifndef RASTER_TOOLS_STANDARD_OUTPUT_H
#define RASTER_TOOLS_STANDARD_OUTPUT_H

#include <cstdio>
#include <string>

#include "fileIO.h"

namespace tool {

/// Whether a path stands for standard output: "-" or "/dev/stdout".
bool isStandardOutput(const std::string& path);

/// Where text goes when the result goes to `path`: standard error where the result takes standard
/// output.
FILE* textBeside(const std::string& path);

/// Writes a whole result: to standard output, or a file that is replaced as a whole.
void writeOutput(const std::string& path, const uint8* bytes, size_t size);

/// A result that grows: standard output, or a file that is begun anew.
class OutputStream {
 public:
  explicit OutputStream(const std::string& path);
  ~OutputStream();
  OutputStream(const OutputStream&) = delete;
  OutputStream& operator=(const OutputStream&) = delete;

  void write(const uint8* bytes, size_t size);

 private:
  std::string shown;
  FileIODescriptor file;
  bool isOurs = false;
};

/// Sends on what a stream of text holds back; fails when it cannot be written.
void flushText(FILE* stream);

/// Closes standard output; false when something that was printed did not get there.
bool closeStandardOutput();

}  // namespace tool

#endif
