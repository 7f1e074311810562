// SPDX-License-Identifier: MIT

#include "outputFile.h"

#include <algorithm>
#include <filesystem>

#include "failure.h"
#include "fileIO.h"
#include "newFile.h"

namespace tool {
namespace {

namespace fs = std::filesystem;

/// A file open for writing that is closed when it goes out of scope.
class File {
 public:
  File(const std::string& path, int action, const std::string& shownAs) : shown(shownAs) {
    FileIO_Invalidate(&descriptor);
    check(FileIO_Open(&descriptor, path.c_str(), FILEIO_ACCESS_WRITE, action));
  }
  ~File() { FileIO_Close(&descriptor); }
  File(const File&) = delete;
  File& operator=(const File&) = delete;

  void write(const uint8* bytes, size_t size) {
    check(FileIO_Write(&descriptor, bytes, size, nullptr));
    check(FileIO_Close(&descriptor));
  }

 private:
  void check(FileIOResult result) const {
    if (result != FILEIO_SUCCESS)
      throw Failure("cannot write '" + shown + "': " + FileIO_ErrorEnglish(result));
  }

  FileIODescriptor descriptor;
  const std::string& shown;
};

}  // namespace

void writeFile(const std::string& path, const uint8* bytes, size_t size) {
  std::error_code ignored;
  const fs::file_status status = fs::status(path, ignored);
  if (fs::exists(status) && !fs::is_regular_file(status)) {
    File(path, FILEIO_OPEN, path).write(bytes, size);
    return;
  }
  NewFile file(path);
  file.write(bytes, size);
  file.publish();
}

}  // namespace tool
