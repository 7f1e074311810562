// SPDX-License-Identifier: MIT
//
// File access over the POSIX calls.

#include "fileIO.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// The kernel moves at most this many bytes a call; asking for more is not portable.
constexpr size_t kMaxTransfer = 0x7FFFF000;
constexpr mode_t kNewFileMode = 0666;

FileIOResult resultOfErrno(int error) {
  switch (error) {
    case ENOENT:
    case ENOTDIR:
      return FILEIO_FILE_NOT_FOUND;
    case EACCES:
    case EPERM:
      return FILEIO_NO_PERMISSION;
    case EISDIR:
      return FILEIO_IS_DIRECTORY;
    case EEXIST:
      return FILEIO_FILE_EXISTS;
    case ENOSPC:
    case EDQUOT:
      return FILEIO_NO_SPACE;
    case EFBIG:
    case EOVERFLOW:
      return FILEIO_FILE_TOO_LARGE;
    case EROFS:
      return FILEIO_READ_ONLY;
    default:
      return FILEIO_ERROR;
  }
}

/// The flags of open() for an access and an action code, or -1 when one of them is not known.
int openFlags(int access, int action) {
  static constexpr int kActionFlags[] = {0, O_TRUNC, O_CREAT, O_CREAT | O_EXCL, O_CREAT | O_TRUNC};
  if (action < FILEIO_OPEN || action > FILEIO_OPEN_CREATE_EMPTY) return -1;
  const int flags = kActionFlags[action] | O_CLOEXEC;
  switch (access) {
    case FILEIO_ACCESS_READ:
      return flags | O_RDONLY | O_NONBLOCK;  // or a pipe that nobody writes to would hang it
    case FILEIO_ACCESS_WRITE:
      return flags | O_WRONLY;
    case FILEIO_ACCESS_READ | FILEIO_ACCESS_WRITE:
      return flags | O_RDWR;
    default:
      return -1;
  }
}

/// What speaks against an open file. What is only read must be able to end: a pipe or a device need
/// not.
FileIOResult judge(int descriptor, int access) {
  struct stat status {};
  if (fstat(descriptor, &status) != 0) return resultOfErrno(errno);
  if (S_ISDIR(status.st_mode)) return FILEIO_IS_DIRECTORY;
  if (access == FILEIO_ACCESS_READ && !S_ISREG(status.st_mode)) return FILEIO_NOT_A_FILE;
  return FILEIO_SUCCESS;
}

/// Repeats `transfer(done, count)` until `size` bytes are moved or it gives 0 or an error.
template <class Transfer>
FileIOResult transferAll(size_t size, size_t* actual, FileIOResult whenNothingMoves,
                         Transfer transfer) {
  size_t done = 0;
  FileIOResult result = FILEIO_SUCCESS;
  while (done < size && result == FILEIO_SUCCESS) {
    const size_t rest = size - done;
    const ssize_t moved = transfer(done, rest < kMaxTransfer ? rest : kMaxTransfer);
    if (moved > 0) {
      done += static_cast<size_t>(moved);
    } else if (moved == 0) {
      result = whenNothingMoves;
    } else if (errno != EINTR) {
      result = resultOfErrno(errno);
    }
  }
  if (actual != nullptr) *actual = done;
  return result;
}

}  // namespace

extern "C" {

void FileIO_Invalidate(FileIODescriptor* file) { file->posix = -1; }

FileIOResult FileIO_Open(FileIODescriptor* file, const char* path, int access, int action) {
  FileIO_Invalidate(file);
  const int flags = openFlags(access, action);
  if (path == nullptr || flags == -1) return FILEIO_BAD_ARGUMENT;
  int descriptor = -1;
  do {
    descriptor = open(path, flags, kNewFileMode);
  } while (descriptor == -1 && errno == EINTR);
  if (descriptor == -1) return resultOfErrno(errno);

  const FileIOResult result = judge(descriptor, access);
  if (result == FILEIO_SUCCESS) {
    file->posix = descriptor;
  } else {
    close(descriptor);
  }
  return result;
}

FileIOResult FileIO_Read(const FileIODescriptor* file, void* bytes, size_t size, size_t* actual) {
  auto* to = static_cast<uint8*>(bytes);
  return transferAll(size, actual, FILEIO_END_OF_FILE, [&](size_t done, size_t count) {
    return read(file->posix, to + done, count);
  });
}

FileIOResult FileIO_Write(const FileIODescriptor* file, const void* bytes, size_t size,
                          size_t* actual) {
  const auto* from = static_cast<const uint8*>(bytes);
  return transferAll(size, actual, FILEIO_ERROR, [&](size_t done, size_t count) {
    return write(file->posix, from + done, count);
  });
}

FileIOResult FileIO_Close(FileIODescriptor* file) {
  if (file->posix == -1) return FILEIO_SUCCESS;
  const int status = close(file->posix);
  FileIO_Invalidate(file);
  // After EINTR Linux has released the descriptor all the same.
  return status == 0 || errno == EINTR ? FILEIO_SUCCESS : resultOfErrno(errno);
}

int64 FileIO_GetSize(const FileIODescriptor* file) {
  struct stat status {};
  return fstat(file->posix, &status) == 0 ? int64{status.st_size} : -1;
}

const char* FileIO_ErrorEnglish(FileIOResult result) {
  switch (result) {
    case FILEIO_SUCCESS:
      return "Success";
    case FILEIO_FILE_NOT_FOUND:
      return "File not found";
    case FILEIO_NO_PERMISSION:
      return "Insufficient permission to access file";
    case FILEIO_IS_DIRECTORY:
      return "Path is a directory";
    case FILEIO_FILE_EXISTS:
      return "File already exists";
    case FILEIO_NO_SPACE:
      return "No space left on device";
    case FILEIO_FILE_TOO_LARGE:
      return "File too large";
    case FILEIO_READ_ONLY:
      return "Read-only file system";
    case FILEIO_END_OF_FILE:
      return "End of file reached";
    case FILEIO_BAD_ARGUMENT:
      return "Invalid argument";
    case FILEIO_NOT_A_FILE:
      return "Not a regular file";
    default:
      return "Error";
  }
}

}  // extern "C"
