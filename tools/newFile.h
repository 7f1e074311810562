// SPDX-License-Identifier: MIT
//
// A file that appears under its name all at once.

#ifndef RASTER_TOOLS_NEW_FILE_H
#define RASTER_TOOLS_NEW_FILE_H

#include <sys/stat.h>

#include <optional>
#include <string>

#include "baseTypes.h"

namespace tool {

/// A regular file in the making. Until it is published it has no name, or, where the file system
/// knows only files with names, a short random one that goes with the object and with a signal that
/// ends the program. Symbolic links are followed, also to where there is nothing yet.
class NewFile {
 public:
  explicit NewFile(const std::string& path);
  ~NewFile();
  NewFile(const NewFile&) = delete;
  NewFile& operator=(const NewFile&) = delete;

  void write(const uint8* bytes, size_t size);

  /// Gives the file its name, in place of the file that has it. That file's mode and, where that is
  /// allowed, its owner are kept; a new file follows the umask. The bytes are on the disk first:
  /// after a power failure the name leads to the old file or to the new one, both whole.
  void publish();

 private:
  [[noreturn]] void fail(int error) const;
  bool openWithoutName();
  void openWithName();
  void takeOverMode();
  bool linkAs(const std::string& as) const;
  void linkUnderRandomName();

  const std::string& shown;
  int folder = -1;
  std::string name;
  std::optional<struct stat> old;
  int file = -1;
  std::string temporary;  // its name for now, in the folder; empty when it has none
};

}  // namespace tool

#endif
