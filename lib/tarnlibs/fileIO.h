// SPDX-License-Identifier: MIT
/// \file
/// Whole-call file access: every read and write goes on until all bytes are moved, the file ends or
/// an error comes, whatever interruptions and short counts the system gives. Files may be over
/// 2 GiB, in 32-bit programs too.
///
/// Results are FileIOResult codes: FILEIO_SUCCESS (0) or a positive number that
/// FileIO_ErrorEnglish turns into a plain English text.

#ifndef TARNLIBS_FILE_IO_H
#define TARNLIBS_FILE_IO_H

#include "baseTypes.h"

#ifdef __cplusplus
extern "C" {
#endif

/// \defgroup tarnlibs_files File access
/// @{

/// An open file, or none. The record is the caller's.
typedef struct FileIODescriptor {
  int posix;  ///< the file descriptor, -1 when none is open
} FileIODescriptor;

/// What a call came to.
typedef enum FileIOResult {
  FILEIO_SUCCESS = 0,
  FILEIO_ERROR = 1,           ///< an error that none of the others names
  FILEIO_FILE_NOT_FOUND = 2,  ///< the path, or a folder of it, does not exist
  FILEIO_NO_PERMISSION = 3,
  FILEIO_IS_DIRECTORY = 4,
  FILEIO_FILE_EXISTS = 5,
  FILEIO_NO_SPACE = 6,
  FILEIO_FILE_TOO_LARGE = 7,
  FILEIO_READ_ONLY = 8,
  FILEIO_END_OF_FILE = 9,  ///< a read met the end of the file before all bytes were there
  FILEIO_BAD_ARGUMENT = 10,
  FILEIO_NOT_A_FILE = 11  ///< a pipe, a socket or a device where a regular file is wanted
} FileIOResult;

/// Access codes of FileIO_Open; they may be combined.
enum { FILEIO_ACCESS_READ = 1, FILEIO_ACCESS_WRITE = 2 };

/// Action codes of FileIO_Open.
enum {
  FILEIO_OPEN = 0,               ///< the file must exist
  FILEIO_OPEN_EMPTY = 1,         ///< it must exist and is truncated
  FILEIO_OPEN_CREATE = 2,        ///< it is created when it does not exist
  FILEIO_OPEN_CREATE_SAFE = 3,   ///< it is created and must not exist
  FILEIO_OPEN_CREATE_EMPTY = 4,  ///< it is created, or truncated when it exists
};

/// Marks `file` as not open, without looking at what it held.
TARNLIBS_EXPORT void FileIO_Invalidate(FileIODescriptor* file);

/// Opens `path` (a system path, relative to the working folder unless it begins with '/') into
/// `file`. New files get mode 0666 less the umask. A directory gives FILEIO_IS_DIRECTORY, in
/// reading too. For reading alone only regular files are opened, so that neither this call nor a
/// read waits for anybody: a pipe, a socket or a device gives FILEIO_NOT_A_FILE. On failure `file`
/// is left not open.
TARNLIBS_EXPORT FileIOResult FileIO_Open(FileIODescriptor* file, const char* path, int access,
                                         int action);

/// Reads `size` bytes. `actual` (may be null) receives the number read, also on failure. Returns
/// FILEIO_END_OF_FILE when the file ends first.
TARNLIBS_EXPORT FileIOResult FileIO_Read(const FileIODescriptor* file, void* bytes, size_t size,
                                         size_t* actual);

/// Writes `size` bytes. `actual` (may be null) receives the number written, also on failure.
TARNLIBS_EXPORT FileIOResult FileIO_Write(const FileIODescriptor* file, const void* bytes,
                                          size_t size, size_t* actual);

/// Closes the file and leaves `file` not open. Closing a file that is not open is a success.
TARNLIBS_EXPORT FileIOResult FileIO_Close(FileIODescriptor* file);

/// Returns the size of the file in bytes, or -1 when it cannot be told.
TARNLIBS_EXPORT int64 FileIO_GetSize(const FileIODescriptor* file);

/// Returns a short English text for a result ("Success" for 0). The text is constant.
TARNLIBS_EXPORT const char* FileIO_ErrorEnglish(FileIOResult result);

/// @}

#ifdef __cplusplus
}
#endif

#endif
