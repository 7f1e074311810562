// SPDX-License-Identifier: MIT
//
// The growable buffer: contents, growth, refusal, release.

#include "dynBuf.h"

#include <gtest/gtest.h>
#include <sys/resource.h>

#include <cstdio>
#include <cstring>
#include <vector>

#include "support/random.h"

namespace {

#ifdef __SANITIZE_ADDRESS__
constexpr bool kSanitized = true;
#else
constexpr bool kSanitized = false;
#endif

TEST(DynBuf_Init, MakesAnEmptyBufferOfAnything) {
  DynBuf buffer;
  memset(&buffer, 0xCC, sizeof buffer);
  DynBuf_Init(&buffer);
  EXPECT_EQ(buffer.data, nullptr);
  EXPECT_EQ(buffer.size, 0u);
  EXPECT_EQ(buffer.allocated, 0u);
}

TEST(DynBuf_Append, KeepsAllBytesInOrder) {
  tests::Random random(1);
  DynBuf buffer;
  DynBuf_Init(&buffer);
  std::vector<uint8> expected;
  for (int i = 0; i < 300; ++i) {
    const std::vector<uint8> more = random.bytes(random.below(i % 50 == 0 ? 5000 : 40));
    ASSERT_TRUE(DynBuf_Append(&buffer, more.data(), more.size()));
    expected.insert(expected.end(), more.begin(), more.end());
    ASSERT_EQ(buffer.size, expected.size());
    ASSERT_GE(buffer.allocated, buffer.size);
  }
  EXPECT_EQ(std::vector<uint8>(buffer.data, buffer.data + buffer.size), expected);
  DynBuf_Destroy(&buffer);
}

TEST(DynBuf_Append, AllocatesSeldom) {
  DynBuf buffer;
  DynBuf_Init(&buffer);
  int allocations = 0;
  for (size_t i = 0; i < 1000000; ++i) {
    const size_t before = buffer.allocated;
    ASSERT_TRUE(DynBuf_Append(&buffer, "x", 1));
    if (buffer.allocated == before) continue;
    ++allocations;
    ASSERT_GE(buffer.allocated, 2 * before);
  }
  EXPECT_LE(allocations, 20);
  DynBuf_Destroy(&buffer);
}

TEST(DynBuf_Append, AllocatesNothingForNoBytes) {
  DynBuf buffer;
  DynBuf_Init(&buffer);
  EXPECT_TRUE(DynBuf_Append(&buffer, nullptr, 0));
  EXPECT_EQ(buffer.data, nullptr);
}

TEST(DynBuf_Append, RefusesASizeThatDoesNotFitAndKeepsTheBuffer) {
  DynBuf buffer;
  DynBuf_Init(&buffer);
  ASSERT_TRUE(DynBuf_Append(&buffer, "abc", 3));
  const DynBuf before = buffer;
  volatile size_t length = SIZE_MAX - 2;  // the sum is 0 modulo the address size
  EXPECT_FALSE(DynBuf_Append(&buffer, "abc", length));
  length = SIZE_MAX - 3;  // the sum is the largest size there is
  EXPECT_TRUE(kSanitized || !DynBuf_Append(&buffer, "abc", length));
  EXPECT_EQ(buffer.data, before.data);
  EXPECT_EQ(buffer.size, 3u);
  EXPECT_EQ(buffer.allocated, before.allocated);
  EXPECT_EQ(0, memcmp(buffer.data, "abc", 3));
  DynBuf_Destroy(&buffer);
}

/// The bytes of address space in use.
rlim_t usedAddresses() {
  unsigned long pages = 0;
  FILE* file = fopen("/proc/self/statm", "r");
  if (file == nullptr) return 0;
  const bool known = fscanf(file, "%lu", &pages) == 1;
  fclose(file);
  return known ? rlim_t{pages} * 4096 : 0;
}

TEST(DynBuf_Append, TakesWhatIsNeededWhereTwiceAsMuchIsNotThere) {
  constexpr size_t kMany = size_t{48} << 20;
  const rlim_t used = usedAddresses();
  if (kSanitized || used == 0) GTEST_SKIP() << "the address space cannot be limited here";
  const std::vector<uint8> bytes(kMany, 0x5A);
  DynBuf buffer;
  DynBuf_Init(&buffer);
  ASSERT_TRUE(DynBuf_Append(&buffer, bytes.data(), kMany));
  rlimit before{};
  getrlimit(RLIMIT_AS, &before);
  const rlimit tight = {used + 2 * kMany + (rlim_t{16} << 20), before.rlim_max};
  ASSERT_EQ(setrlimit(RLIMIT_AS, &tight), 0);
  const bool aLittleMore = DynBuf_Append(&buffer, bytes.data(), 4096);
  const bool muchMore = DynBuf_Append(&buffer, bytes.data(), kMany);
  setrlimit(RLIMIT_AS, &before);
  EXPECT_TRUE(aLittleMore);
  EXPECT_FALSE(muchMore);
  EXPECT_EQ(buffer.size, kMany + 4096);
  EXPECT_EQ(buffer.data[kMany + 4095], 0x5A);
  DynBuf_Destroy(&buffer);
}

TEST(DynBuf_Destroy, LeavesAnEmptyBufferThatMayBeDestroyedAgainAndUsedAgain) {
  DynBuf buffer;
  DynBuf_Init(&buffer);
  ASSERT_TRUE(DynBuf_Append(&buffer, "abc", 3));
  DynBuf_Destroy(&buffer);
  EXPECT_EQ(buffer.data, nullptr);
  EXPECT_EQ(buffer.size, 0u);
  EXPECT_EQ(buffer.allocated, 0u);
  DynBuf_Destroy(&buffer);
  ASSERT_TRUE(DynBuf_Append(&buffer, "de", 2));
  EXPECT_EQ(0, memcmp(buffer.data, "de", 2));
  DynBuf_Destroy(&buffer);
}

}  // namespace
