// SPDX-License-Identifier: MIT

#include "newFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <random>
#include <system_error>

#include "failure.h"
#include "fileIO.h"

namespace tool {
namespace {

namespace fs = std::filesystem;

constexpr mode_t kUsual = 0666;  // less the umask
constexpr mode_t kPrivate = 0600;
constexpr int kTries = 100;

/// Repeats a call of the system that a signal interrupted.
template <class Call> int uninterrupted(Call call) {
  int result = -1;
  do {
    result = call();
  } while (result == -1 && errno == EINTR);
  return result;
}

/// Where a chain of symbolic links leads, whether there is something or not. A circle gives a link.
fs::path followLinks(fs::path path) {
  constexpr int kMostLinks = 40;
  std::error_code error;
  for (int i = 0; i < kMostLinks && fs::is_symlink(fs::symlink_status(path, error)); ++i)
    path = path.parent_path() / fs::read_symlink(path);
  return path;
}

/// Short, so that it fits wherever the final name does.
std::string randomName() {
  char text[16];
  snprintf(text, sizeof text, ".rt%08x", std::random_device()());
  return text;
}

/// Signals wait as long as it lives.
class HeldSignals {
 public:
  HeldSignals() {
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, &before);
  }
  ~HeldSignals() { sigprocmask(SIG_SETMASK, &before, nullptr); }
  HeldSignals(const HeldSignals&) = delete;
  HeldSignals& operator=(const HeldSignals&) = delete;

 private:
  sigset_t before;
};

// What a signal that ends the program removes first. There is one at a time.
char doomedName[16];
int doomedFolder = -1;

void removeAndEnd(int signal) {
  unlinkat(doomedFolder, doomedName, 0);
  raise(signal);  // the handler is for one time: now it ends the program
}

void doom(int folder, const std::string& name) {
  doomedFolder = folder;
  memcpy(doomedName, name.c_str(), name.size() + 1);
  for (const int signal : {SIGHUP, SIGINT, SIGTERM, SIGQUIT, SIGPIPE, SIGALRM}) {
    struct sigaction before = {};
    struct sigaction once = {};
    once.sa_handler = removeAndEnd;
    once.sa_flags = static_cast<int>(SA_RESETHAND);
    if (sigaction(signal, nullptr, &before) == 0 && before.sa_handler == SIG_DFL)
      sigaction(signal, &once, nullptr);
  }
}

}  // namespace

NewFile::NewFile(const std::string& path) : shown(path) {
  signal(SIGXFSZ, SIG_IGN);  // a limit on sizes is an error like any other
  const fs::path target = followLinks(path);
  std::error_code ignored;
  if (fs::is_symlink(fs::symlink_status(target, ignored))) fail(ELOOP);
  name = target.filename().string();
  const std::string parent = target.has_parent_path() ? target.parent_path().string() : ".";
  folder = uninterrupted([&] { return open(parent.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC); });
  if (folder == -1) fail(errno);
  struct stat status = {};
  if (fstatat(folder, name.c_str(), &status, 0) == 0) old = status;
  if (!openWithoutName()) openWithName();
}

NewFile::~NewFile() {
  const HeldSignals held;
  if (!temporary.empty()) unlinkat(folder, temporary.c_str(), 0);
  if (file != -1) close(file);
  if (folder != -1) close(folder);
}

void NewFile::fail(int error) const {
  throw Failure("cannot write '" + shown + "': " + std::generic_category().message(error));
}

/// Nobody else reads what takes the place of a private file.
bool NewFile::openWithoutName() {
  // The one way to a name later that needs no privilege.
  if (access("/proc/self/fd", X_OK) != 0) return false;
  file = uninterrupted([&] {
    return openat(folder, ".", O_TMPFILE | O_WRONLY | O_CLOEXEC, old ? kPrivate : kUsual);
  });
  return file != -1;
}

void NewFile::openWithName() {
  const HeldSignals held;
  for (int i = 0; i < kTries; ++i) {
    const std::string tried = randomName();
    file = uninterrupted([&] {
      return openat(folder, tried.c_str(), O_CREAT | O_EXCL | O_WRONLY | O_CLOEXEC,
                    old ? kPrivate : kUsual);
    });
    if (file != -1) {
      temporary = tried;
      doom(folder, tried);
      return;
    }
    if (errno != EEXIST) break;
  }
  fail(errno);
}

void NewFile::write(const uint8* bytes, size_t size) {
  const FileIODescriptor descriptor = {file};
  const FileIOResult result = FileIO_Write(&descriptor, bytes, size, nullptr);
  if (result != FILEIO_SUCCESS)
    throw Failure("cannot write '" + shown + "': " + FileIO_ErrorEnglish(result));
}

void NewFile::takeOverMode() {
  if (!old) return;
  const bool sameOwner = fchown(file, old->st_uid, old->st_gid) == 0;
  // A program that runs as its owner must not run as another one.
  constexpr mode_t kAll = 07777;
  constexpr mode_t kPermissions = 0777;
  if (fchmod(file, old->st_mode & (sameOwner ? kAll : kPermissions)) != 0) fail(errno);
}

bool NewFile::linkAs(const std::string& as) const {
  const std::string self = "/proc/self/fd/" + std::to_string(file);
  return linkat(AT_FDCWD, self.c_str(), folder, as.c_str(), AT_SYMLINK_FOLLOW) == 0;
}

void NewFile::linkUnderRandomName() {
  for (int i = 0; i < kTries && temporary.empty(); ++i) {
    const std::string tried = randomName();
    if (linkAs(tried)) {
      temporary = tried;
    } else if (errno != EEXIST) {
      fail(errno);
    }
  }
  if (temporary.empty()) fail(EEXIST);
}

void NewFile::publish() {
  takeOverMode();
  const bool canSync = uninterrupted([&] { return fsync(file); }) == 0;
  if (!canSync && errno != EINVAL) fail(errno);  // not every file system can
  const HeldSignals held;
  if (temporary.empty() && !old && linkAs(name)) return;
  if (temporary.empty()) linkUnderRandomName();
  if (renameat(folder, temporary.c_str(), folder, name.c_str()) != 0) fail(errno);
  temporary.clear();
}

}  // namespace tool
