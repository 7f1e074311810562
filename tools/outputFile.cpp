// SPDX-License-Identifier: MIT

#include "outputFile.h"

#include <algorithm>
#include <filesystem>

#include "commands.h"
#include "fileIO.h"
#include "newFile.h"

namespace tool {
namespace {

namespace fs = std::filesystem;

[[noreturn]] void fail(const char* what, const std::string& path, FileIOResult result) {
  throw Failure(std::string(what) + " '" + path + "': " + FileIO_ErrorEnglish(result));
}

/// An open file that is closed when it goes out of scope.
class File {
 public:
  File(const std::string& path, int access, int action, const std::string& shownAs)
      : shown(shownAs), reading(access == FILEIO_ACCESS_READ) {
    FileIO_Invalidate(&descriptor);
    check(FileIO_Open(&descriptor, path.c_str(), access, action));
  }
  ~File() { FileIO_Close(&descriptor); }
  File(const File&) = delete;
  File& operator=(const File&) = delete;

  void write(const uint8* bytes, size_t size) {
    check(FileIO_Write(&descriptor, bytes, size, nullptr));
    check(FileIO_Close(&descriptor));
  }

  /// Reads up to `limit` bytes.
  std::vector<uint8> read(uint64 limit) {
    const int64 size = FileIO_GetSize(&descriptor);
    if (size < 0) throw Failure("cannot tell the size of '" + shown + "'");
    std::vector<uint8> bytes(checkedSize(std::min(limit, static_cast<uint64>(size))));
    check(FileIO_Read(&descriptor, bytes.data(), bytes.size(), nullptr));
    return bytes;
  }

 private:
  size_t checkedSize(uint64 size) const {
    if (size > std::vector<uint8>().max_size()) throw Failure("'" + shown + "' is too large");
    return static_cast<size_t>(size);
  }
  void check(FileIOResult result) const {
    if (result != FILEIO_SUCCESS) fail(reading ? "cannot read" : "cannot write", shown, result);
  }

  FileIODescriptor descriptor;
  const std::string& shown;
  const bool reading;
};

}  // namespace

void writeFile(const std::string& path, const uint8* bytes, size_t size) {
  std::error_code ignored;
  const fs::file_status status = fs::status(path, ignored);
  if (fs::exists(status) && !fs::is_regular_file(status)) {
    File(path, FILEIO_ACCESS_WRITE, FILEIO_OPEN, path).write(bytes, size);
    return;
  }
  NewFile file(path);
  file.write(bytes, size);
  file.publish();
}

std::vector<uint8> readFileStart(const std::string& path, size_t size) {
  return File(path, FILEIO_ACCESS_READ, FILEIO_OPEN, path).read(size);
}

std::vector<uint8> readFile(const std::string& path) {
  return File(path, FILEIO_ACCESS_READ, FILEIO_OPEN, path).read(UINT64_MAX);
}

}  // namespace tool
