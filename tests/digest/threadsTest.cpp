// SPDX-License-Identifier: MIT
//
// Eight threads that make their first calls at the same moment, and then go through the same cases,
// each in memory of its own: all get what one thread gets. The thread sanitizer looks for more.

#include <gtest/gtest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "digest/apiDigest.h"

namespace {

constexpr int kThreads = 8;
constexpr int kCases = 3000;

/// The library's switch is one for all threads, so each has a word that stands for it.
std::string digestOfThread() {
  uint32 ownSwitch = 0;
  return tests::digestOfCases(kCases, &ownSwitch);
}

TEST(Threads, GetWhatOneThreadGets) {
  std::atomic<int> waiting = kThreads;
  std::vector<std::string> digests(kThreads);
  std::vector<std::thread> threads;
  for (std::string& digest : digests)
    threads.emplace_back([&] {
      --waiting;
      while (waiting != 0) std::this_thread::yield();
      digest = digestOfThread();
    });
  for (std::thread& thread : threads) thread.join();
  const std::string alone = digestOfThread();
  for (const std::string& digest : digests) EXPECT_EQ(digest, alone);
}

}  // namespace
