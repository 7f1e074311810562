// SPDX-License-Identifier: MIT
//
// File access: what opens and what does not, whole reads and writes whatever the system gives,
// large files, texts.

#include "fileIO.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>
#include <vector>

#include "support/random.h"

namespace {

namespace fs = std::filesystem;
using Bytes = std::vector<uint8>;

constexpr int kReadWrite = FILEIO_ACCESS_READ | FILEIO_ACCESS_WRITE;

/// A folder of its own for every test, removed at its end.
class FileIO : public testing::Test {
 protected:
  FileIO() {
    std::string pattern = (fs::temp_directory_path() / "fileIOTest.XXXXXX").string();
    folder_ = mkdtemp(pattern.data());
  }
  ~FileIO() override { fs::remove_all(folder_); }

  std::string path(const std::string& name) const { return (folder_ / name).string(); }

  std::string make(const std::string& name, const std::string& contents) const {
    std::ofstream(path(name), std::ios::binary) << contents;
    return path(name);
  }
  static std::string contents(const std::string& of) {
    std::ifstream in(of, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
  }

 private:
  fs::path folder_;
};

/// An open file, closed at the end of the scope.
struct Open {
  Open(const std::string& path, int access, int action)
      : result(FileIO_Open(&file, path.c_str(), access, action)) {}
  explicit Open(int descriptor) : file{descriptor} {}
  ~Open() { FileIO_Close(&file); }
  Open(const Open&) = delete;
  Open& operator=(const Open&) = delete;

  FileIODescriptor file{};
  FileIOResult result = FILEIO_SUCCESS;
};

TEST_F(FileIO, InvalidateMarksAFileAsNotOpen) {
  FileIODescriptor file = {7};
  FileIO_Invalidate(&file);
  EXPECT_EQ(file.posix, -1);
  EXPECT_EQ(FileIO_Close(&file), FILEIO_SUCCESS);
  EXPECT_EQ(FileIO_GetSize(&file), -1);
  size_t actual = 9;
  uint8 byte = 0;
  EXPECT_EQ(FileIO_Read(&file, &byte, 1, &actual), FILEIO_ERROR);
  EXPECT_EQ(actual, 0u);
}

TEST_F(FileIO, ReadsAnExistingFile) {
  const Open in(make("a", "0123456789"), FILEIO_ACCESS_READ, FILEIO_OPEN);
  ASSERT_EQ(in.result, FILEIO_SUCCESS);
  EXPECT_EQ(FileIO_GetSize(&in.file), 10);
  char bytes[10];
  size_t actual = 0;
  EXPECT_EQ(FileIO_Read(&in.file, bytes, 4, &actual), FILEIO_SUCCESS);
  EXPECT_EQ(actual, 4u);
  EXPECT_EQ(FileIO_Read(&in.file, bytes + 4, 6, nullptr), FILEIO_SUCCESS);
  EXPECT_EQ(std::string(bytes, 10), "0123456789");
}

TEST_F(FileIO, ReportsTheEndOfTheFileWithWhatWasRead) {
  const Open in(make("a", "abc"), FILEIO_ACCESS_READ, FILEIO_OPEN);
  char bytes[10];
  size_t actual = 0;
  EXPECT_EQ(FileIO_Read(&in.file, bytes, 10, &actual), FILEIO_END_OF_FILE);
  EXPECT_EQ(actual, 3u);
  EXPECT_EQ(FileIO_Read(&in.file, bytes, 0, &actual), FILEIO_SUCCESS);
  EXPECT_EQ(actual, 0u);
}

TEST_F(FileIO, OpensByItsActionCodes) {
  const struct {
    int action;
    FileIOResult whenThere;
    FileIOResult whenMissing;
    const char* left;  // of "old", when nothing is written
  } cases[] = {
      {0, FILEIO_SUCCESS, FILEIO_FILE_NOT_FOUND, "old"},
      {1, FILEIO_SUCCESS, FILEIO_FILE_NOT_FOUND, ""},
      {2, FILEIO_SUCCESS, FILEIO_SUCCESS, "old"},
      {3, FILEIO_FILE_EXISTS, FILEIO_SUCCESS, "old"},
      {4, FILEIO_SUCCESS, FILEIO_SUCCESS, ""},
  };
  for (const auto& c : cases) {
    const std::string there = make("there", "old");
    const std::string missing = path("missing");
    EXPECT_EQ(Open(there, FILEIO_ACCESS_WRITE, c.action).result, c.whenThere) << c.action;
    EXPECT_EQ(contents(there), c.left) << c.action;
    EXPECT_EQ(Open(missing, FILEIO_ACCESS_WRITE, c.action).result, c.whenMissing) << c.action;
    EXPECT_EQ(fs::exists(missing), c.whenMissing == FILEIO_SUCCESS) << c.action;
    fs::remove(missing);
  }
}

TEST_F(FileIO, OpensByItsAccessCodes) {
  const std::string there = make("there", "old");
  const Open read(there, 1, FILEIO_OPEN);
  const Open write(there, 2, FILEIO_OPEN);
  const Open both(there, 3, FILEIO_OPEN);
  char byte = 'x';
  EXPECT_NE(FileIO_Write(&read.file, &byte, 1, nullptr), FILEIO_SUCCESS);
  EXPECT_NE(FileIO_Read(&write.file, &byte, 1, nullptr), FILEIO_SUCCESS);
  EXPECT_EQ(FileIO_Read(&both.file, &byte, 1, nullptr), FILEIO_SUCCESS);
  EXPECT_EQ(FileIO_Write(&both.file, "X", 1, nullptr), FILEIO_SUCCESS);
  EXPECT_EQ(contents(there), "oXd");
}

TEST_F(FileIO, RefusesUnknownCodesAndNoPath) {
  const std::string there = make("there", "old");
  for (const int access : {0, 4, -1})
    EXPECT_EQ(Open(there, access, FILEIO_OPEN).result, FILEIO_BAD_ARGUMENT);
  for (const int action : {-1, 5})
    EXPECT_EQ(Open(there, FILEIO_ACCESS_READ, action).result, FILEIO_BAD_ARGUMENT);
  FileIODescriptor file = {7};
  EXPECT_EQ(FileIO_Open(&file, nullptr, FILEIO_ACCESS_READ, FILEIO_OPEN), FILEIO_BAD_ARGUMENT);
  EXPECT_EQ(file.posix, -1);
}

TEST_F(FileIO, NamesTheReasonOfAFailure) {
  const std::string there = make("there", "old");
  const auto open = [](const std::string& at, int access, int action) {
    const Open opened(at, access, action);
    EXPECT_EQ(opened.file.posix == -1, opened.result != FILEIO_SUCCESS);
    return opened.result;
  };
  EXPECT_EQ(open(path("no/such"), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE), FILEIO_FILE_NOT_FOUND);
  EXPECT_EQ(open(there + "/below", FILEIO_ACCESS_READ, FILEIO_OPEN), FILEIO_FILE_NOT_FOUND);
  EXPECT_EQ(open(path(""), FILEIO_ACCESS_READ, FILEIO_OPEN), FILEIO_IS_DIRECTORY);
  EXPECT_EQ(open(path(""), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY), FILEIO_IS_DIRECTORY);
  if (geteuid() == 0) return;  // who may do everything
  fs::permissions(there, fs::perms::none);
  EXPECT_EQ(open(there, FILEIO_ACCESS_READ, FILEIO_OPEN), FILEIO_NO_PERMISSION);
}

TEST_F(FileIO, OpensNothingButRegularFilesForReading) {
  ASSERT_EQ(mkfifo(path("pipe").c_str(), 0600), 0);
  alarm(20);  // ends a test that waits for a writer
  EXPECT_EQ(Open(path("pipe"), FILEIO_ACCESS_READ, FILEIO_OPEN).result, FILEIO_NOT_A_FILE);
  alarm(0);
  EXPECT_EQ(Open("/dev/zero", FILEIO_ACCESS_READ, FILEIO_OPEN).result, FILEIO_NOT_A_FILE);
  EXPECT_EQ(Open("/dev/null", FILEIO_ACCESS_WRITE, FILEIO_OPEN).result, FILEIO_SUCCESS);
  fs::create_symlink(make("a", ""), path("link"));
  EXPECT_EQ(Open(path("link"), FILEIO_ACCESS_READ, FILEIO_OPEN).result, FILEIO_SUCCESS);
}

TEST_F(FileIO, DoesNotLeakADescriptorForADirectory) {
  const Open before(make("a", ""), FILEIO_ACCESS_READ, FILEIO_OPEN);
  for (int i = 0; i < 10; ++i) Open(path(""), FILEIO_ACCESS_READ, FILEIO_OPEN);
  const Open after(path("a"), FILEIO_ACCESS_READ, FILEIO_OPEN);
  EXPECT_EQ(after.file.posix, before.file.posix + 1);
}

TEST_F(FileIO, CreatesFilesWithTheUsualModeAndClosesThemOnExec) {
  const mode_t before = umask(027);
  const Open out(path("new"), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
  umask(before);
  struct stat status {};
  ASSERT_EQ(fstat(out.file.posix, &status), 0);
  EXPECT_EQ(status.st_mode & 0777u, 0640u);
  EXPECT_NE(fcntl(out.file.posix, F_GETFD) & FD_CLOEXEC, 0);
}

TEST_F(FileIO, WritesAndClosesOnce) {
  Open out(path("new"), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
  size_t actual = 0;
  EXPECT_EQ(FileIO_Write(&out.file, "hello", 5, &actual), FILEIO_SUCCESS);
  EXPECT_EQ(actual, 5u);
  EXPECT_EQ(FileIO_Write(&out.file, nullptr, 0, &actual), FILEIO_SUCCESS);
  EXPECT_EQ(actual, 0u);
  EXPECT_EQ(FileIO_Close(&out.file), FILEIO_SUCCESS);
  EXPECT_EQ(out.file.posix, -1);
  EXPECT_EQ(FileIO_Close(&out.file), FILEIO_SUCCESS);
  EXPECT_EQ(contents(path("new")), "hello");
}

TEST_F(FileIO, ReportsACloseThatFails) {
  FileIODescriptor file = {0x7FFFFFF};
  EXPECT_NE(FileIO_Close(&file), FILEIO_SUCCESS);
  EXPECT_EQ(file.posix, -1);
}

// The kernel first takes the bytes that fit and refuses the rest on the next call.
TEST_F(FileIO, GoesOnAfterAShortWriteUntilTheReasonIsKnown) {
  const auto oldHandler = signal(SIGXFSZ, SIG_IGN);
  rlimit before{};
  getrlimit(RLIMIT_FSIZE, &before);
  const rlimit small = {10000, before.rlim_max};
  const Bytes bytes(25000, 1);
  const Open out(path("new"), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
  setrlimit(RLIMIT_FSIZE, &small);
  size_t actual = 0;
  const FileIOResult result = FileIO_Write(&out.file, bytes.data(), bytes.size(), &actual);
  setrlimit(RLIMIT_FSIZE, &before);
  signal(SIGXFSZ, oldHandler);
  EXPECT_EQ(result, FILEIO_FILE_TOO_LARGE);
  EXPECT_EQ(actual, 10000u);
}

TEST_F(FileIO, ReportsAFullDevice) {
  const Open out("/dev/full", FILEIO_ACCESS_WRITE, FILEIO_OPEN);
  if (out.result != FILEIO_SUCCESS) GTEST_SKIP() << "no /dev/full";
  size_t actual = 9;
  EXPECT_EQ(FileIO_Write(&out.file, "abc", 3, &actual), FILEIO_NO_SPACE);
  EXPECT_EQ(actual, 0u);
}

/// A timer that interrupts the main thread all the time.
class Interruptions {
 public:
  Interruptions() {
    struct sigaction handler {};
    handler.sa_handler = [](int) { count = count + 1; };  // no SA_RESTART: calls end in EINTR
    sigaction(SIGALRM, &handler, &before_);
    const itimerval often = {{0, 500}, {0, 500}};
    setitimer(ITIMER_REAL, &often, nullptr);
  }
  ~Interruptions() {
    const itimerval never{};
    setitimer(ITIMER_REAL, &never, nullptr);
    sigaction(SIGALRM, &before_, nullptr);
  }
  Interruptions(const Interruptions&) = delete;
  Interruptions& operator=(const Interruptions&) = delete;

  static inline volatile sig_atomic_t count = 0;

 private:
  struct sigaction before_ {};
};

/// Runs `work` in a thread that no signal interrupts.
template <class Work> std::thread undisturbed(Work work) {
  sigset_t all;
  sigset_t before;
  sigfillset(&all);
  pthread_sigmask(SIG_BLOCK, &all, &before);
  std::thread thread(work);
  pthread_sigmask(SIG_SETMASK, &before, nullptr);
  return thread;
}

void waitAWhile() { std::this_thread::sleep_for(std::chrono::milliseconds(2)); }

TEST_F(FileIO, WritesEverythingDespiteInterruptionsAndShortCounts) {
  int ends[2];
  ASSERT_EQ(pipe(ends), 0);
  const Bytes sent = tests::Random(1).bytes(500000);
  Bytes received(sent.size());
  std::thread reader = undisturbed([&] {
    for (size_t at = 0; at < received.size();) {
      waitAWhile();
      const ssize_t got =
          read(ends[0], &received[at], std::min<size_t>(9001, received.size() - at));
      if (got <= 0) return;
      at += static_cast<size_t>(got);
    }
  });
  size_t actual = 0;
  FileIOResult result = FILEIO_ERROR;
  {
    const Interruptions on;
    const Open out(ends[1]);
    result = FileIO_Write(&out.file, sent.data(), sent.size(), &actual);
  }
  reader.join();
  close(ends[0]);
  EXPECT_EQ(result, FILEIO_SUCCESS);
  EXPECT_EQ(actual, sent.size());
  EXPECT_TRUE(received == sent);
  EXPECT_GT(Interruptions::count, 0);
}

TEST_F(FileIO, ReadsEverythingDespiteInterruptionsAndShortCounts) {
  int ends[2];
  ASSERT_EQ(pipe(ends), 0);
  const Bytes sent = tests::Random(2).bytes(50000);
  std::thread writer = undisturbed([&] {
    for (size_t at = 0; at < sent.size();) {
      waitAWhile();
      const ssize_t put = write(ends[1], &sent[at], std::min<size_t>(777, sent.size() - at));
      if (put <= 0) return;
      at += static_cast<size_t>(put);
    }
    close(ends[1]);
  });
  Bytes received(sent.size() + 1);
  size_t actual = 0;
  FileIOResult whole = FILEIO_ERROR;
  FileIOResult end = FILEIO_ERROR;
  {
    const Interruptions on;
    const Open in(ends[0]);
    whole = FileIO_Read(&in.file, received.data(), sent.size(), &actual);
    end = FileIO_Read(&in.file, &received.back(), 1, nullptr);
  }
  writer.join();
  received.pop_back();
  EXPECT_EQ(whole, FILEIO_SUCCESS);
  EXPECT_EQ(end, FILEIO_END_OF_FILE);
  EXPECT_EQ(actual, sent.size());
  EXPECT_TRUE(received == sent);
}

TEST_F(FileIO, HandlesFilesOverTwoGibibytes) {
  constexpr int64 kHole = int64{5} << 30;
  {
    const Open out(path("sparse"), FILEIO_ACCESS_WRITE, FILEIO_OPEN_CREATE_EMPTY);
    ASSERT_EQ(out.result, FILEIO_SUCCESS);
    ASSERT_EQ(lseek(out.file.posix, kHole, SEEK_SET), kHole);
    ASSERT_EQ(FileIO_Write(&out.file, "end", 3, nullptr), FILEIO_SUCCESS);
    EXPECT_EQ(FileIO_GetSize(&out.file), kHole + 3);
  }
  const Open in(path("sparse"), kReadWrite, FILEIO_OPEN);
  ASSERT_EQ(in.result, FILEIO_SUCCESS);
  EXPECT_EQ(FileIO_GetSize(&in.file), kHole + 3);
  lseek(in.file.posix, kHole - 1, SEEK_SET);
  char bytes[4];
  EXPECT_EQ(FileIO_Read(&in.file, bytes, 4, nullptr), FILEIO_SUCCESS);
  EXPECT_EQ(0, memcmp(bytes, "\0end", 4));
}

TEST_F(FileIO, HasAnEnglishTextForEveryResult) {
  EXPECT_STREQ(FileIO_ErrorEnglish(FILEIO_SUCCESS), "Success");
  std::vector<std::string> texts;
  for (int result = FILEIO_SUCCESS; result <= FILEIO_NOT_A_FILE; ++result) {
    const std::string text = FileIO_ErrorEnglish(static_cast<FileIOResult>(result));
    EXPECT_NE(text, "");
    EXPECT_EQ(std::count(texts.begin(), texts.end(), text), 0) << text;
    texts.push_back(text);
  }
}

}  // namespace
