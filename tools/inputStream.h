// SPDX-License-Identifier: MIT
//
// Bytes in: a file, a pipe or standard input, read from front to back. No size is asked first, so
// that everything that can be read will do.

#ifndef RASTER_TOOLS_INPUT_STREAM_H
#define RASTER_TOOLS_INPUT_STREAM_H

#include <optional>
#include <string>
#include <vector>

#include "fileIO.h"

namespace tool {

class InputStream {
 public:
  /// "-" and "/dev/stdin" are standard input. A named pipe that nobody writes to is given up after
  /// a few seconds.
  explicit InputStream(const std::string& path);
  ~InputStream();
  InputStream(const InputStream&) = delete;
  InputStream& operator=(const InputStream&) = delete;

  /// Reads `size` bytes, or what is left when that is less; returns how many.
  size_t read(uint8* bytes, size_t size);
  /// Appends up to `most` bytes to `bytes`.
  void append(std::vector<uint8>& bytes, uint64 most);
  /// Goes on by `size` bytes without keeping them; false when the input ends before that.
  bool skip(uint64 size);
  /// How many bytes are left, when that can be told: of a regular file.
  std::optional<uint64> left() const;

  /// How messages name it: the path in quotes, or "standard input".
  const std::string& name() const { return shown; }

 private:
  void open(const std::string& path);
  void awaitWriter() const;
  [[noreturn]] void fail(const std::string& why) const;

  std::string shown;
  FileIODescriptor file;
  bool isOurs = false;
};

/// All bytes of an input, of which `start` has been read already. Fails when they are more than
/// `most`.
std::vector<uint8> readWhole(InputStream& input, uint64 most = uint64{1} << 30,
                             std::vector<uint8> start = {});

}  // namespace tool

#endif
