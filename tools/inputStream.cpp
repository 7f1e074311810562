// SPDX-License-Identifier: MIT

#include "inputStream.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <system_error>
#include <utility>

#include "failure.h"

namespace tool {
namespace {

std::string textOfErrno() { return std::generic_category().message(errno); }

struct stat statusOf(const FileIODescriptor& file) {
  struct stat status {};
  if (fstat(file.posix, &status) != 0) status.st_mode = 0;
  return status;
}

/// Whether a pipe that has nothing to read is open for writing: of such a one there is nothing to
/// be copied yet, of another one there is its end.
bool hasWriter(int descriptor) {
  int copy[2];
  if (pipe2(copy, O_CLOEXEC) != 0) return true;
  const ssize_t seen = tee(descriptor, copy[1], 1, SPLICE_F_NONBLOCK);
  close(copy[0]);
  close(copy[1]);
  return seen != 0;
}

}  // namespace

InputStream::InputStream(const std::string& path) : shown("'" + path + "'") {
  if (path == "-" || path == "/dev/stdin") {
    shown = "standard input";
    file.posix = STDIN_FILENO;
  } else {
    open(path);
  }
  if (S_ISDIR(statusOf(file).st_mode)) fail("it is a folder");
}

InputStream::~InputStream() {
  if (isOurs) FileIO_Close(&file);
}

void InputStream::fail(const std::string& why) const {
  throw Failure("cannot read " + shown + ": " + why);
}

/// Opening a named pipe for reading would wait for its writer for ever, so that is done without
/// waiting; reading waits again.
void InputStream::open(const std::string& path) {
  file.posix = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  if (file.posix == -1) fail(textOfErrno());
  isOurs = true;
  if (S_ISFIFO(statusOf(file).st_mode)) awaitWriter();
  if (fcntl(file.posix, F_SETFL, O_RDONLY) == -1) fail(textOfErrno());
}

/// A pipe that had a writer, even one that is gone, has something to say to poll.
void InputStream::awaitWriter() const {
  constexpr int kPatienceMs = 3000;
  pollfd pipe = {file.posix, POLLIN, 0};
  int ready;
  do {
    ready = poll(&pipe, 1, kPatienceMs);
  } while (ready == -1 && errno == EINTR);
  if (ready == 0 && !hasWriter(file.posix)) fail("nobody writes to this pipe");
}

size_t InputStream::read(uint8* bytes, size_t size) {
  size_t actual = 0;
  const FileIOResult result = FileIO_Read(&file, bytes, size, &actual);
  if (result != FILEIO_SUCCESS && result != FILEIO_END_OF_FILE) fail(FileIO_ErrorEnglish(result));
  return actual;
}

void InputStream::append(std::vector<uint8>& bytes, uint64 most) {
  constexpr uint64 kFirstPiece = 1 << 16;
  for (uint64 done = 0; done < most;) {
    const size_t before = bytes.size();
    const auto piece = static_cast<size_t>(std::min(most - done, std::max(kFirstPiece, done)));
    bytes.resize(before + piece);
    const size_t actual = read(bytes.data() + before, piece);
    bytes.resize(before + actual);
    if (actual < piece) return;
    done += piece;
  }
}

bool InputStream::skip(uint64 size) {
  if (const auto rest = left()) {
    if (*rest < size) return false;
    return lseek(file.posix, static_cast<off_t>(size), SEEK_CUR) != -1;
  }
  std::vector<uint8> ignored(static_cast<size_t>(std::min<uint64>(size, 1 << 16)));
  while (size != 0) {
    const auto piece = static_cast<size_t>(std::min<uint64>(size, ignored.size()));
    if (read(ignored.data(), piece) < piece) return false;
    size -= piece;
  }
  return true;
}

std::optional<uint64> InputStream::left() const {
  const struct stat status = statusOf(file);
  const off_t at = lseek(file.posix, 0, SEEK_CUR);
  if (!S_ISREG(status.st_mode) || at == -1) return {};
  return status.st_size > at ? static_cast<uint64>(status.st_size - at) : 0;
}

std::vector<uint8> readWhole(InputStream& input, uint64 most, std::vector<uint8> start) {
  std::vector<uint8> bytes = std::move(start);
  input.append(bytes, most + 1 - std::min<uint64>(most, bytes.size()));
  if (bytes.size() > most) throw Failure(input.name() + " is too large");
  return bytes;
}

}  // namespace tool
