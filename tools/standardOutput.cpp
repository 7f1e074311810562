// SPDX-License-Identifier: MIT

#include "standardOutput.h"

#include <unistd.h>

#include <cerrno>
#include <filesystem>

#include "failure.h"
#include "outputFile.h"

namespace tool {
namespace {

namespace fs = std::filesystem;

[[noreturn]] void fail(const std::string& shown, const std::string& why) {
  throw Failure("cannot write " + shown + ": " + why);
}

std::string quoted(const std::string& path) { return "'" + path + "'"; }

/// The most common reason why a file cannot be made deserves more than "not found".
void requireFolderOf(const std::string& path) {
  const fs::path folder = fs::path(path).parent_path();
  std::error_code ignored;
  if (!folder.empty() && !fs::is_directory(folder, ignored))
    fail(quoted(path), "there is no folder " + quoted(folder.string()));
}

}  // namespace

bool isStandardOutput(const std::string& path) { return path == "-" || path == "/dev/stdout"; }

FILE* textBeside(const std::string& path) { return isStandardOutput(path) ? stderr : stdout; }

void writeOutput(const std::string& path, const uint8* bytes, size_t size) {
  if (isStandardOutput(path)) {
    OutputStream(path).write(bytes, size);
  } else {
    requireFolderOf(path);
    writeFile(path, bytes, size);
  }
}

OutputStream::OutputStream(const std::string& path) : shown(quoted(path)) {
  if (isStandardOutput(path)) {
    shown = "standard output";
    if (isatty(STDOUT_FILENO) == 1) fail(shown, "it is a terminal");
    file.posix = STDOUT_FILENO;
    return;
  }
  requireFolderOf(path);
  const FileIOResult result =
      FileIO_Open(&file, path.c_str(), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
  if (result != FILEIO_SUCCESS) fail(shown, FileIO_ErrorEnglish(result));
  isOurs = true;
}

OutputStream::~OutputStream() {
  if (isOurs) FileIO_Close(&file);
}

void OutputStream::write(const uint8* bytes, size_t size) {
  const FileIOResult result = FileIO_Write(&file, bytes, size, nullptr);
  if (result != FILEIO_SUCCESS) fail(shown, FileIO_ErrorEnglish(result));
}

void flushText(FILE* stream) {
  if (fflush(stream) != 0) fail("standard output", "its text does not get through");
}

/// A program that was started without standard output has nothing to close.
bool closeStandardOutput() {
  const bool written = ferror(stdout) == 0 && fflush(stdout) == 0;
  const bool closed = fclose(stdout) == 0 || errno == EBADF;
  return written && closed;
}

}  // namespace tool
