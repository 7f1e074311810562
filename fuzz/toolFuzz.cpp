// SPDX-License-Identifier: MIT
//
// Command lines of rastertool in this process. An input is a line of arguments and, behind it, the
// bytes of the file "in".

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <csetjmp>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "fuzzing.h"

int rastertoolMain(int argc, char** argv);

namespace {

namespace fs = std::filesystem;

jmp_buf whereItEnds;

/// Files lie in a folder of their own, and there is no display to ask.
class PrivateFolder {
 public:
  PrivateFolder() {
    fuzz::require(mkdtemp(path) != nullptr && chdir(path) == 0);
    unsetenv("DISPLAY");
    const int nothing = open("/dev/null", O_RDWR | O_CLOEXEC);
    dup2(nothing, STDIN_FILENO);
    dup2(nothing, STDOUT_FILENO);
    close(nothing);
  }
  ~PrivateFolder() {
    std::error_code ignored;
    fs::remove_all(path, ignored);
  }
  PrivateFolder(const PrivateFolder&) = delete;
  PrivateFolder& operator=(const PrivateFolder&) = delete;

 private:
  char path[32] = "/tmp/toolFuzz.XXXXXX";
};

void emptyFolder() {
  for (const fs::directory_entry& entry : fs::directory_iterator(".")) fs::remove_all(entry);
}

bool hasLongNumber(const std::string& text) {
  constexpr int kLongest = 3;
  int digits = 0;
  for (const char letter : text) {
    digits = isdigit(static_cast<unsigned char>(letter)) != 0 ? digits + 1 : 0;
    if (digits > kLongest) return true;
  }
  return false;
}

/// Not what would leave the folder, wait for the network or take minutes.
bool isHarmless(const std::string& argument) {
  const auto has = [&](const char* text) { return argument.find(text) != std::string::npos; };
  return !has("/") && !has("..") && !has("serve") && !has("display") && !hasLongNumber(argument);
}

/// Recordings of many pixels take their memory at once, as they may.
bool isLargeRecording(const std::string& file) {
  constexpr size_t kSizesEnd = 20;
  if (file.compare(0, 8, "RASTLIVE") != 0 || file.size() < kSizesEnd) return false;
  return file[13] > 1 || file[14] != 0 || file[15] != 0 || file[17] > 1 || file[18] != 0 ||
         file[19] != 0;
}

void run(std::vector<std::string> arguments) {
  std::vector<char*> argv = {const_cast<char*>("rastertool")};
  for (std::string& argument : arguments) argv.push_back(argument.data());
  argv.push_back(nullptr);
  FILE* const before = stderr;
  stdout = fopen("/dev/null", "w");  // which the program closes at its end
  if (setjmp(whereItEnds) == 0) {
    const int status = rastertoolMain(static_cast<int>(argv.size()) - 1, argv.data());
    fuzz::require(status >= 0 && status <= 2);
  }
  stderr = before;
}

}  // namespace

// Where the program would end its process.
extern "C" [[noreturn]] void rastertoolExit(int /*status*/) { longjmp(whereItEnds, 1); }

// What a Panic leaves behind is no leak. Pictures beyond 512 MiB find no memory.
extern "C" const char* __asan_default_options() {
  return "allocator_may_return_null=1:max_allocation_size_mb=512:detect_leaks=0";
}

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  static const PrivateFolder folder;
  const uint8* const end = std::find(bytes, bytes + size, '\n');
  std::istringstream line(std::string(bytes, end));
  std::vector<std::string> arguments;
  for (std::string word; line >> word;) arguments.push_back(word);
  const std::string file(end + (end != bytes + size), bytes + size);
  if (!std::all_of(arguments.begin(), arguments.end(), isHarmless) || isLargeRecording(file))
    return -1;
  std::ofstream("in", std::ios::binary) << file;
  run(arguments);
  emptyFolder();
  return 0;
}
