// SPDX-License-Identifier: MIT
//
// Whole files: read with a limit, written all or nothing.
//
// A file is written without a name where the file system has such files, so that nothing is left of
// it however the process ends; it gets its name when it is complete.

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>
#include <ctime>

#include "checkedMemory.h"
#include "checkedView.h"
#include "fileIO.h"

namespace raster::checked {
namespace {

constexpr uint32 kAllFlags = RASTER_CHECKED_SYNC | RASTER_CHECKED_NO_REPLACE;
constexpr mode_t kNewMode = 0666;
constexpr mode_t kPrivateMode = 0600;
constexpr mode_t kModeBits = 07777;
constexpr int kMaxLinks = 40;  // as the kernel follows

RasterStatus statusOfErrno(int error) {
  switch (error) {
    case ENOENT:
    case ENOTDIR:
      return RASTER_STATUS_NOT_FOUND;
    case EACCES:
    case EPERM:
    case EROFS:
      return RASTER_STATUS_NO_PERMISSION;
    case EISDIR:
    case ENXIO:
      return RASTER_STATUS_NOT_REGULAR;
    case EEXIST:
      return RASTER_STATUS_EXISTS;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
      return RASTER_STATUS_NO_SPACE;
    case ENOMEM:
      return RASTER_STATUS_NO_MEMORY;
    default:
      return RASTER_STATUS_FILE;
  }
}

RasterStatus statusOfResult(FileIOResult result) {
  switch (result) {
    case FILEIO_SUCCESS:
      return RASTER_STATUS_OK;
    case FILEIO_NO_SPACE:
    case FILEIO_FILE_TOO_LARGE:
      return RASTER_STATUS_NO_SPACE;
    default:
      return RASTER_STATUS_FILE;
  }
}

/// A system call that is repeated as long as signals interrupt it.
template <class Call> int retried(Call call) {
  int result = 0;
  do result = call();
  while (result < 0 && errno == EINTR);
  return result;
}

/// An open file that is closed at the end.
class OpenFile {
 public:
  explicit OpenFile(int descriptor) : file_{descriptor} {}
  ~OpenFile() { close(); }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;

  bool isOpen() const { return file_.posix >= 0; }
  int descriptor() const { return file_.posix; }
  const FileIODescriptor* io() const { return &file_; }
  FileIOResult close() { return FileIO_Close(&file_); }

 private:
  FileIODescriptor file_;
};

// ---- Reading -----------------------------------------------------------------------------------

RasterStatus readFile(const char* path, uint64 limit, uint8** bytes, size_t* size) {
  const OpenFile file(
      retried([&] { return open(path, O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC); }));
  struct stat status = {};
  if (!file.isOpen() || fstat(file.descriptor(), &status) != 0) return statusOfErrno(errno);
  if (!S_ISREG(status.st_mode)) return RASTER_STATUS_NOT_REGULAR;
  const auto fileSize = static_cast<uint64>(status.st_size);
  if (fileSize > limit) return RASTER_STATUS_LIMIT;
  OwnedBytes content = OwnedBytes::ofSize(fileSize);
  if (!content) return RASTER_STATUS_NO_MEMORY;
  size_t actual = 0;
  const FileIOResult result =
      FileIO_Read(file.io(), content.get(), static_cast<size_t>(fileSize), &actual);
  if (result != FILEIO_SUCCESS && result != FILEIO_END_OF_FILE) return RASTER_STATUS_FILE;
  *bytes = content.release();
  *size = actual;
  return RASTER_STATUS_OK;
}

// ---- Writing -----------------------------------------------------------------------------------

/// Where a file goes: its path with links followed, its folder, and what is there.
struct Target {
  char path[PATH_MAX];
  char folder[PATH_MAX];
  bool exists;
  mode_t mode;
};

/// Stores `text`, or false when it does not fit.
bool copyPath(char (&to)[PATH_MAX], const char* text, size_t length) {
  if (length >= PATH_MAX) {
    errno = ENAMETOOLONG;
    return false;
  }
  memcpy(to, text, length);
  to[length] = 0;
  return true;
}

void setFolder(Target* target) {
  const char* slash = strrchr(target->path, '/');
  if (slash == nullptr) {
    strcpy(target->folder, ".");
  } else {
    const size_t length = slash == target->path ? 1 : static_cast<size_t>(slash - target->path);
    copyPath(target->folder, target->path, length);
  }
}

/// Replaces a path that ends in a link by what the link says; false when it does not fit.
bool followLink(Target* target) {
  char link[PATH_MAX];
  const ssize_t length = readlink(target->path, link, sizeof link - 1);
  if (length < 0) return false;
  link[length] = 0;
  if (link[0] == '/') return copyPath(target->path, link, static_cast<size_t>(length));
  setFolder(target);
  char joined[2 * PATH_MAX];
  const int size = snprintf(joined, sizeof joined, "%s/%s", target->folder, link);
  return copyPath(target->path, joined, static_cast<size_t>(size));
}

/// Finds out where a file goes. Links are followed by hand, since they may lead to no file yet.
RasterStatus findTarget(const char* path, uint32 flags, Target* target) {
  struct stat status = {};
  if (!copyPath(target->path, path, strlen(path))) return statusOfErrno(errno);
  for (int links = 0;; ++links) {
    target->exists = lstat(target->path, &status) == 0;
    if (!target->exists && errno != ENOENT) return statusOfErrno(errno);
    if (!target->exists || !S_ISLNK(status.st_mode)) break;
    if ((flags & RASTER_CHECKED_NO_REPLACE) != 0) return RASTER_STATUS_EXISTS;
    if (links == kMaxLinks || !followLink(target)) return RASTER_STATUS_FILE;
  }
  setFolder(target);
  target->mode = status.st_mode & kModeBits;
  if (!target->exists) return RASTER_STATUS_OK;
  if ((flags & RASTER_CHECKED_NO_REPLACE) != 0) return RASTER_STATUS_EXISTS;
  if (!S_ISREG(status.st_mode)) return RASTER_STATUS_NOT_REGULAR;
  if (faccessat(AT_FDCWD, target->path, W_OK, AT_EACCESS) != 0) return statusOfErrno(errno);
  return RASTER_STATUS_OK;
}

/// A name in the target's folder that nobody has.
struct TemporaryName {
  char path[PATH_MAX + 32];

  /// The `attempt`th one.
  void make(const Target& target, uint32 attempt) {
    struct timespec now = {};
    clock_gettime(CLOCK_MONOTONIC, &now);
    const auto number = static_cast<uint32>(now.tv_nsec) ^ static_cast<uint32>(getpid()) << 12;
    snprintf(path, sizeof path, "%s/.%08x%02x", target.folder, number + attempt * 0x9E3779B9u,
             attempt);
  }
};

constexpr uint32 kNameAttempts = 100;

/// Calls `create` with one name after the other until one is free. Returns its result.
template <class Create> int withFreeName(const Target& target, TemporaryName* name, Create create) {
  int result = -1;
  for (uint32 attempt = 0; attempt < kNameAttempts; ++attempt) {
    name->make(target, attempt);
    result = retried([&] { return create(name->path); });
    if (result >= 0 || errno != EEXIST) break;
  }
  return result;
}

/// What is to be written, and how.
struct Content {
  const uint8* bytes;
  size_t size;
  uint32 flags;

  bool syncs() const { return (flags & RASTER_CHECKED_SYNC) != 0; }
  bool replaces() const { return (flags & RASTER_CHECKED_NO_REPLACE) == 0; }
};

/// Until it is complete, nobody else reads what takes the place of a private file.
mode_t firstMode(const Target& target) { return target.exists ? kPrivateMode : kNewMode; }

RasterStatus writeContent(const OpenFile& file, const Target& target, const Content& content) {
  const FileIOResult result = FileIO_Write(file.io(), content.bytes, content.size, nullptr);
  if (result != FILEIO_SUCCESS) return statusOfResult(result);
  if (target.exists && fchmod(file.descriptor(), target.mode) != 0) return statusOfErrno(errno);
  if (content.syncs() && retried([&] { return fsync(file.descriptor()); }) != 0)
    return statusOfErrno(errno);
  return RASTER_STATUS_OK;
}

/// Gives a file with a temporary name its own; the temporary one is gone afterwards.
RasterStatus settle(const char* temporary, const Target& target, bool replaces) {
  const int result = replaces ? rename(temporary, target.path) : link(temporary, target.path);
  const int error = errno;
  if (result != 0 || !replaces) unlink(temporary);
  return result == 0 ? RASTER_STATUS_OK : statusOfErrno(error);
}

RasterStatus writeNamed(const Target& target, const Content& content) {
  TemporaryName name;
  OpenFile file(withFreeName(target, &name, [&](const char* path) {
    return open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, firstMode(target));
  }));
  if (!file.isOpen()) return statusOfErrno(errno);
  RasterStatus status = writeContent(file, target, content);
  const FileIOResult closed = file.close();
  if (status == RASTER_STATUS_OK) status = statusOfResult(closed);
  if (status == RASTER_STATUS_OK) return settle(name.path, target, content.replaces());
  unlink(name.path);
  return status;
}

/// Gives a file without a name the target's. `*named` is false when the system has no way to.
RasterStatus giveName(const OpenFile& file, const Target& target, const Content& content,
                      bool* named) {
  char self[32];
  snprintf(self, sizeof self, "/proc/self/fd/%d", file.descriptor());
  const auto linkTo = [&](const char* path) {
    return linkat(AT_FDCWD, self, AT_FDCWD, path, AT_SYMLINK_FOLLOW);
  };
  *named = true;
  if (!target.exists) {
    if (linkTo(target.path) == 0) return RASTER_STATUS_OK;
    if (errno == EEXIST && !content.replaces()) return RASTER_STATUS_EXISTS;
    *named = errno == EEXIST;
    if (!*named) return RASTER_STATUS_FILE;
  }
  TemporaryName name;
  if (withFreeName(target, &name, linkTo) == 0)
    return settle(name.path, target, content.replaces());
  *named = false;
  return RASTER_STATUS_FILE;
}

/// Writes a file that has no name until it is complete. `*done` is false when that cannot be done
/// here, and nothing happened then.
RasterStatus writeUnnamed(const Target& target, const Content& content, bool* done) {
  const OpenFile file(retried(
      [&] { return open(target.folder, O_TMPFILE | O_WRONLY | O_CLOEXEC, firstMode(target)); }));
  *done = file.isOpen();
  if (!*done) return RASTER_STATUS_FILE;
  const RasterStatus status = writeContent(file, target, content);
  return status == RASTER_STATUS_OK ? giveName(file, target, content, done) : status;
}

RasterStatus syncFolder(const char* folder) {
  const OpenFile file(retried([&] { return open(folder, O_RDONLY | O_DIRECTORY | O_CLOEXEC); }));
  const bool synced = file.isOpen() && retried([&] { return fsync(file.descriptor()); }) == 0;
  return synced ? RASTER_STATUS_OK : statusOfErrno(errno);
}

}  // namespace
}  // namespace raster::checked

extern "C" {

RasterStatus RasterChecked_ReadFile(const char* path, const RasterLimits* limits, uint8** bytes,
                                    size_t* size) {
  using namespace raster::checked;
  if (path == nullptr || bytes == nullptr || size == nullptr) return RASTER_STATUS_NULL;
  return readFile(path, limitsOf(limits).inputBytes, bytes, size);
}

RasterStatus RasterChecked_WriteFile(const char* path, const uint8* bytes, size_t size,
                                     uint32 flags) {
  using namespace raster::checked;
  if (path == nullptr || (bytes == nullptr && size != 0)) return RASTER_STATUS_NULL;
  if ((flags & ~kAllFlags) != 0) return RASTER_STATUS_BAD_ARGUMENT;
  Target target;
  RasterStatus status = findTarget(path, flags, &target);
  if (status != RASTER_STATUS_OK) return status;
  const Content content = {bytes, size, flags};
  bool done = false;
  status = writeUnnamed(target, content, &done);
  if (!done) status = writeNamed(target, content);
  if (status == RASTER_STATUS_OK && content.syncs()) status = syncFolder(target.folder);
  return status;
}

}  // extern "C"
