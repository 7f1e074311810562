// SPDX-License-Identifier: MIT
//
// A viewer without a window, for tests and measurements. It shares no code with the server.

#include <poll.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <cstdio>

#include "link.h"
#include "options.h"
#include "screen.h"
#include "session.h"

namespace viewers {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kStillMilliseconds = 300;
/// How often a list of formats is gone through.
constexpr size_t kRounds = 5;

class Viewer {
 public:
  explicit Viewer(const Options& options)
      : options_(options),
        link_(options.address, options.patienceSeconds * 1000),
        session_(link_, options.version) {
    if (!options.formats.empty()) session_.useFormat(options.formats[0]);
    session_.useEncodings(options.encodings);
    session_.request(false);
    receiveUpdate();
  }

  int run() {
    giveInput();
    if (!options_.whereOn.empty()) tellPointer();
    if (options_.untilEndOfInput) followUntilEndOfInput();
    const int status = options_.display.empty() ? 0 : compare();
    if (!options_.saveTo.empty()) session_.picture().save(options_.saveTo, session_.format());
    return status;
  }

 private:
  /// Reads up to an update's end and asks for the next one.
  void receiveUpdate() {
    while (!session_.readMessage()) {
    }
    const size_t count = options_.formats.size();
    if (count > 1 && changes_ + 1 < kRounds * count) {
      session_.useFormat(options_.formats[++changes_ % count]);
      session_.request(false);
    } else {
      session_.request(true);
    }
  }

  void followUntilStill() {
    while (link_.readable(kStillMilliseconds)) {
      if (Clock::now() > deadline_) return;
      receiveUpdate();
    }
  }

  void followUntilEndOfInput() {
    pollfd input = {STDIN_FILENO, POLLIN, 0};
    char ignored = 0;
    printf("following\n");
    fflush(stdout);
    for (;;) {
      if (link_.readable(20)) receiveUpdate();
      if (poll(&input, 1, 0) == 1 && read(STDIN_FILENO, &ignored, 1) <= 0) return;
    }
  }

  void giveInput() {
    constexpr uint32_t kReturn = 0xFF0D;
    if (options_.pointerX >= 0) session_.movePointer(options_.pointerX, options_.pointerY, 0);
    for (const char c : options_.typed) {
      const uint32_t key = c == '\n' ? kReturn : static_cast<unsigned char>(c);
      session_.pressKey(key, true);
      session_.pressKey(key, false);
    }
  }

  void tellPointer() {
    session_.request(false);
    receiveUpdate();
    followUntilStill();
    const Pointer pointer = pointerOf(options_.whereOn);
    printf("%d,%d\n", pointer.left + pointer.image.hotX, pointer.top + pointer.image.hotY);
  }

  /// Until picture and screen are equal, or patience ends.
  int compare() {
    deadline_ = Clock::now() + std::chrono::seconds(options_.patienceSeconds);
    size_t different = 0;
    do {
      followUntilStill();
      different = differencesNow();
    } while (different != 0 && Clock::now() < deadline_);
    report(different);
    return different == 0 ? 0 : 1;
  }

  size_t differencesNow() {
    Screen screen = dumpOf(options_.display);
    total_ = screen.colors.size();
    const Pointer pointer = pointerOf(options_.display);
    if (options_.besidePointer)
      return differences(screen, session_.picture(), session_.format(), pointer.box());
    if (options_.cursor == 0) {
      drawPointer(pointer, screen);
      return differences(screen, session_.picture(), session_.format());
    }
    if (!session_.cursor()) return pointer.image.pixels.size();
    return differences(screen, session_.picture(), session_.format()) +
           differences(pointer.image, *session_.cursor(), session_.format());
  }

  void report(size_t different) const {
    const Counters& counters = session_.counters();
    printf("%s %s: %zu of %zu pixels differ (%llu updates, %llu pixels, %llu bytes;",
           session_.format().name.c_str(), options_.encodingNames.c_str(), different, total_,
           static_cast<unsigned long long>(counters.updates),
           static_cast<unsigned long long>(counters.pixels),
           static_cast<unsigned long long>(link_.received()));
    for (const auto& [encoding, count] : counters.rectangles)
      printf(" %d:%llu", encoding, static_cast<unsigned long long>(count));
    printf(")\n");
  }

  const Options& options_;
  Link link_;
  Session session_;
  size_t changes_ = 0;
  size_t total_ = 0;
  Clock::time_point deadline_ = Clock::time_point::max();
};

}  // namespace
}  // namespace viewers

int main(int count, char** arguments) {
  signal(SIGPIPE, SIG_IGN);
  try {
    return viewers::Viewer(viewers::parseOptions(count, arguments)).run();
  } catch (const std::exception& trouble) {
    fprintf(stderr, "rfbViewer: %s\n", trouble.what());
    return 2;
  }
}
