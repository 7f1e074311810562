// SPDX-License-Identifier: MIT
//
// Files: read with a limit, written all or nothing, with nothing left behind.

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <set>
#include <string>

#include "checked/checkedScenes.h"
#include "image/pngFiles.h"
#include "rasterChecked.h"

namespace {

namespace fs = std::filesystem;
using tests::Bytes;
using tests::Random;

/// A folder of its own, where the test works.
class RasterCheckedFiles : public testing::Test {
 protected:
  RasterCheckedFiles() {
    std::string pattern = (fs::temp_directory_path() / "checkedFilesXXXXXX").string();
    folder_ = mkdtemp(pattern.data());
    old_ = umask(022);
  }
  ~RasterCheckedFiles() override {
    umask(old_);
    fs::permissions(folder_, fs::perms::owner_all);
    fs::remove_all(folder_);
  }

  std::string path(const std::string& name) const { return folder_ + "/" + name; }
  std::set<std::string> names() const {
    std::set<std::string> found;
    for (const auto& entry : fs::directory_iterator(folder_))
      found.insert(entry.path().filename().string());
    return found;
  }
  static std::string contentOf(const std::string& file) {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
  }
  static void put(const std::string& file, const std::string& content) {
    std::ofstream(file, std::ios::binary) << content;
  }
  static unsigned modeOf(const std::string& file) {
    struct stat status = {};
    return stat(file.c_str(), &status) == 0 ? status.st_mode & 07777u : 0;
  }
  static RasterStatus write(const std::string& file, const std::string& content, uint32 flags = 0) {
    const Bytes bytes(content.begin(), content.end());
    return RasterChecked_WriteFile(file.c_str(), bytes.data(), bytes.size(), flags);
  }

  std::string folder_;
  mode_t old_;
};

TEST_F(RasterCheckedFiles, NewOnesFollowTheUmask) {
  for (const uint32 flags : {0u, 1u, 2u, 3u}) {
    const std::string file = path("new" + std::to_string(flags));
    umask(flags == 0 ? 022 : 0137);
    ASSERT_EQ(write(file, "words", flags), RASTER_STATUS_OK);
    EXPECT_EQ(contentOf(file), "words");
    EXPECT_EQ(modeOf(file), flags == 0 ? 0644u : 0640u);
  }
  EXPECT_EQ(names().size(), 4u);
}

TEST_F(RasterCheckedFiles, OldOnesKeepTheirMode) {
  const std::string file = path("old");
  for (const mode_t mode : {0600u, 0640u, 0666u, 0755u, 04700u}) {
    put(file, "before");
    chmod(file.c_str(), mode);
    ASSERT_EQ(write(file, "after"), RASTER_STATUS_OK);
    EXPECT_EQ(contentOf(file), "after");
    EXPECT_EQ(modeOf(file), mode);
    fs::remove(file);
  }
  EXPECT_EQ(names().size(), 0u);
}

TEST_F(RasterCheckedFiles, ThatAreOpenKeepTheirBytesForTheReader) {
  const std::string file = path("old");
  put(file, "before");
  std::ifstream reader(file);
  ASSERT_EQ(write(file, ""), RASTER_STATUS_OK);
  std::string word;
  reader >> word;
  EXPECT_EQ(word, "before");
  EXPECT_EQ(contentOf(file), "");
}

TEST_F(RasterCheckedFiles, AreNotReplacedAgainstTheFlag) {
  const std::string file = path("old");
  put(file, "before");
  EXPECT_EQ(write(file, "after", RASTER_CHECKED_NO_REPLACE), RASTER_STATUS_EXISTS);
  EXPECT_EQ(contentOf(file), "before");
  fs::create_symlink("nowhere", path("link"));
  EXPECT_EQ(write(path("link"), "after", RASTER_CHECKED_NO_REPLACE), RASTER_STATUS_EXISTS);
  EXPECT_EQ(names(), (std::set<std::string>{"link", "old"}));
}

TEST_F(RasterCheckedFiles, AreFoundBehindLinks) {
  fs::create_directory(path("deep"));
  put(path("deep/file"), "before");
  fs::create_symlink("deep/file", path("link"));
  fs::create_symlink("link", path("second"));
  fs::create_symlink("deep/none", path("dangling"));
  fs::create_symlink(path("deep/other"), path("absolute"));
  for (const char* link : {"second", "dangling", "absolute"})
    ASSERT_EQ(write(path(link), link), RASTER_STATUS_OK) << link;
  EXPECT_TRUE(fs::is_symlink(path("second")));
  EXPECT_TRUE(fs::is_symlink(path("link")));
  EXPECT_EQ(contentOf(path("deep/file")), "second");
  EXPECT_EQ(contentOf(path("deep/none")), "dangling");
  EXPECT_EQ(contentOf(path("deep/other")), "absolute");
  fs::create_symlink("circle", path("circle"));
  EXPECT_EQ(write(path("circle"), "x"), RASTER_STATUS_FILE);
}

TEST_F(RasterCheckedFiles, MayHaveTheLongestNameAndAnyFolder) {
  const std::string longest(255, 'n');
  EXPECT_EQ(write(path(longest), "x"), RASTER_STATUS_OK);
  EXPECT_EQ(write(path(longest), "y"), RASTER_STATUS_OK);
  EXPECT_EQ(contentOf(path(longest)), "y");
  EXPECT_EQ(write(path(longest + "n"), "x"), RASTER_STATUS_FILE);
  const fs::path before = fs::current_path();
  fs::current_path(folder_);
  EXPECT_EQ(write("here", "x"), RASTER_STATUS_OK);
  EXPECT_EQ(write("here", "z"), RASTER_STATUS_OK);
  fs::current_path(before);
  EXPECT_EQ(contentOf(path("here")), "z");
  EXPECT_EQ(names(), (std::set<std::string>{"here", longest}));
}

TEST_F(RasterCheckedFiles, ThatAreNoneAreNamed) {
  EXPECT_EQ(write(path("none/file"), "x"), RASTER_STATUS_NOT_FOUND);
  EXPECT_EQ(write(folder_, "x"), RASTER_STATUS_NOT_REGULAR);
  mkfifo(path("pipe").c_str(), 0600);
  EXPECT_EQ(write(path("pipe"), "x"), RASTER_STATUS_NOT_REGULAR);
  EXPECT_EQ(write("/dev/null", "x"), RASTER_STATUS_NOT_REGULAR);
  uint8* bytes = nullptr;
  size_t size = 77;
  for (const std::string& file : {path("pipe"), folder_, std::string("/dev/zero")})
    EXPECT_EQ(RasterChecked_ReadFile(file.c_str(), nullptr, &bytes, &size),
              RASTER_STATUS_NOT_REGULAR);
  EXPECT_EQ(RasterChecked_ReadFile(path("none").c_str(), nullptr, &bytes, &size),
            RASTER_STATUS_NOT_FOUND);
  EXPECT_EQ(RasterChecked_ReadFile((path("pipe") + "/x").c_str(), nullptr, &bytes, &size),
            RASTER_STATUS_NOT_FOUND);
  EXPECT_EQ(bytes, nullptr);
  EXPECT_EQ(size, 77u);
}

TEST_F(RasterCheckedFiles, AreReadUpToTheLimit) {
  put(path("file"), "twelve bytes");
  RasterLimits limits = {};
  limits.inputBytes = 12;
  uint8* bytes = nullptr;
  size_t size = 0;
  ASSERT_EQ(RasterChecked_ReadFile(path("file").c_str(), &limits, &bytes, &size), RASTER_STATUS_OK);
  EXPECT_EQ(std::string(bytes, bytes + size), "twelve bytes");
  free(bytes);
  bytes = nullptr;
  limits.inputBytes = 11;
  EXPECT_EQ(RasterChecked_ReadFile(path("file").c_str(), &limits, &bytes, &size),
            RASTER_STATUS_LIMIT);
  EXPECT_EQ(bytes, nullptr);
  put(path("empty"), "");
  ASSERT_EQ(RasterChecked_ReadFile(path("empty").c_str(), &limits, &bytes, &size),
            RASTER_STATUS_OK);
  EXPECT_NE(bytes, nullptr);
  EXPECT_EQ(size, 0u);
  free(bytes);
}

TEST_F(RasterCheckedFiles, RefuseWrongArguments) {
  uint8 byte = 0;
  uint8* bytes = nullptr;
  size_t size = 0;
  EXPECT_EQ(RasterChecked_WriteFile(nullptr, &byte, 1, 0), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_WriteFile(path("x").c_str(), nullptr, 1, 0), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_WriteFile(path("x").c_str(), &byte, 1, 4), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_ReadFile(nullptr, nullptr, &bytes, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_ReadFile("x", nullptr, nullptr, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_ReadFile("x", nullptr, &bytes, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(names().size(), 0u);
}

/// Runs `body` in a child and returns what it returned.
template <class Body> int inChild(Body body) {
  const pid_t child = fork();
  if (child == 0) _exit(body());
  int status = 0;
  waitpid(child, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : 1000;
}

TEST_F(RasterCheckedFiles, AreAsTheyWereWhenThereIsNoSpace) {
  put(path("old"), "before");
  const int status = inChild([&] {
    const rlimit limit = {1000, 1000};
    signal(SIGXFSZ, SIG_IGN);
    setrlimit(RLIMIT_FSIZE, &limit);
    const RasterStatus replaced = write(path("old"), std::string(5000, 'x'));
    return write(path("new"), std::string(5000, 'x')) == replaced ? replaced : 99;
  });
  EXPECT_EQ(status, RASTER_STATUS_NO_SPACE);
  EXPECT_EQ(contentOf(path("old")), "before");
  EXPECT_EQ(names(), (std::set<std::string>{"old"}));
}

TEST_F(RasterCheckedFiles, LeaveNothingWhenTheProcessIsKilled) {
  put(path("old"), "before");
  const int status = inChild([&] {
    const rlimit limit = {1000, 1000};
    setrlimit(RLIMIT_FSIZE, &limit);  // the signal ends the child in the middle
    return static_cast<int>(write(path("old"), std::string(5000, 'x')));
  });
  EXPECT_EQ(status, 1000);
  EXPECT_EQ(contentOf(path("old")), "before");
  EXPECT_EQ(names(), (std::set<std::string>{"old"}));
}

TEST_F(RasterCheckedFiles, NeedPermission) {
  if (getuid() != 0) GTEST_SKIP() << "needs root, to become somebody else";
  put(path("old"), "before");
  chmod(path("old").c_str(), 0600);
  fs::permissions(folder_, fs::perms::all);
  const auto asNobody = [&](const std::string& file) {
    return inChild([&] {
      if (setuid(65534) != 0) return 99;
      return static_cast<int>(write(file, "x"));
    });
  };
  EXPECT_EQ(asNobody(path("old")), RASTER_STATUS_NO_PERMISSION);
  EXPECT_EQ(asNobody(path("new")), RASTER_STATUS_OK);
  fs::permissions(folder_, fs::perms::owner_all);
  EXPECT_EQ(asNobody(path("other")), RASTER_STATUS_NO_PERMISSION);
  EXPECT_EQ(contentOf(path("old")), "before");
  EXPECT_EQ(names(), (std::set<std::string>{"new", "old"}));
}

TEST_F(RasterCheckedFiles, HoldPictures) {
  Random random(91);
  tests::GuardedView view(random, {24, 32}, 20, 10);
  ImageUtilImage image = {};
  image.width = 20;
  image.height = 10;
  image.depth = 24;
  image.bpp = 32;
  image.bytesPerLine = view.view().pitch;
  image.data = view.view().data;
  const ImageUtilPNGWriteParams params = {9, false};
  for (const ImageUtilPNGWriteParams* given : {&params, static_cast<decltype(&params)>(nullptr)}) {
    ASSERT_EQ(RasterChecked_WriteImage(&image, view.view().bytes, path("a.png").c_str(), 0, given,
                                       RASTER_CHECKED_SYNC),
              RASTER_STATUS_OK);
    ASSERT_TRUE(ImageUtil_WritePNG(&image, path("b.png").c_str(), given));
    EXPECT_EQ(contentOf(path("a.png")), contentOf(path("b.png")));
  }
  ASSERT_EQ(
      RasterChecked_WriteImage(&image, view.view().bytes, path("a.bmp").c_str(), 1, nullptr, 0),
      RASTER_STATUS_OK);
  ASSERT_TRUE(ImageUtil_WriteImage(&image, path("b.bmp").c_str(), 1));
  EXPECT_EQ(contentOf(path("a.bmp")), contentOf(path("b.bmp")));
  EXPECT_EQ(RasterChecked_WriteImage(&image, view.view().bytes, path("c").c_str(), 2, nullptr, 0),
            RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_WriteImage(&image, 5, path("c").c_str(), 0, nullptr, 0),
            RASTER_STATUS_BAD_VIEW);
  EXPECT_EQ(RasterChecked_WriteImage(&image, view.view().bytes, nullptr, 0, nullptr, 0),
            RASTER_STATUS_NULL);

  ImageUtilImage back = {};
  char message[50] = "x";
  ASSERT_EQ(RasterChecked_ReadPng(path("a.png").c_str(), 0, nullptr, &back, message, 50),
            RASTER_STATUS_OK);
  EXPECT_STREQ(message, "");
  EXPECT_EQ(back.width, 20u);
  free(back.data);
  message[0] = 'x';
  EXPECT_EQ(RasterChecked_ReadPng(path("none.png").c_str(), 0, nullptr, &back, message, 50),
            RASTER_STATUS_NOT_FOUND);
  EXPECT_STREQ(message, "");
  EXPECT_EQ(RasterChecked_ReadPng(path("a.bmp").c_str(), 0, nullptr, &back, nullptr, 0),
            RASTER_STATUS_NOT_PNG);
}

}  // namespace
