// SPDX-License-Identifier: MIT
//
// Allocation that never returns null.

#include "utilAlloc.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>

#include "support/recordedMessages.h"

namespace {

/// More than any process has, under sanitizers too; and a number whose double is 2.
volatile size_t tooMuch = SIZE_MAX / 16 * 15;
volatile size_t overHalf = SIZE_MAX / 2 + 2;

TEST(UtilSafeMalloc0, ReturnsWritableMemory) {
  void* block = UtilSafeMalloc0(1000);
  ASSERT_NE(block, nullptr);
  memset(block, 0xAB, 1000);
  free(block);
}

TEST(UtilSafeMalloc0, ReturnsAPointerToFreeForNoBytes) {
  void* one = UtilSafeMalloc0(0);
  void* other = UtilSafeMalloc0(0);
  EXPECT_NE(one, nullptr);
  EXPECT_NE(one, other);
  free(one);
  free(other);
}

TEST(UtilSafeMalloc0, PanicsWhenMemoryIsExhausted) {
  const tests::Messages said = tests::messagesOf([] { UtilSafeMalloc0(tooMuch); });
  EXPECT_EQ(said.panic, "Out of memory: " + std::to_string(tooMuch) + " bytes\n");
  EXPECT_EQ(said.warning, "");
}

TEST(UtilSafeCalloc0, ReturnsZeroedMemory) {
  // Memory that was just released with other contents.
  void* dirty = UtilSafeMalloc0(3000);
  memset(dirty, 0xFF, 3000);
  free(dirty);
  auto* block = static_cast<uint8*>(UtilSafeCalloc0(30, 100));
  EXPECT_TRUE(std::all_of(block, block + 3000, [](uint8 byte) { return byte == 0; }));
  free(block);
}

TEST(UtilSafeCalloc0, ReturnsAPointerToFreeForAProductOfZero) {
  for (const auto& [count, size] : {std::pair<size_t, size_t>{0, 8}, {8, 0}, {0, 0}}) {
    void* block = UtilSafeCalloc0(count, size);
    EXPECT_NE(block, nullptr);
    free(block);
  }
}

TEST(UtilSafeCalloc0, PanicsWhenMemoryIsExhaustedOrTheProductOverflows) {
  EXPECT_EQ(tests::messagesOf([] { UtilSafeCalloc0(1, tooMuch); }).panic,
            "Out of memory: 1 x " + std::to_string(tooMuch) + " bytes\n");
  // The product is 2 modulo the address size.
  EXPECT_EQ(tests::messagesOf([] { UtilSafeCalloc0(2, overHalf); }).panic,
            "Out of memory: 2 x " + std::to_string(overHalf) + " bytes\n");
}

}  // namespace
