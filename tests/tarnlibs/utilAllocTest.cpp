// SPDX-License-Identifier: MIT
//
// Allocation that never returns null.

#include "utilAlloc.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>
#include <thread>

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

/// What an attempt went through, in memory that the longjmp leaves alone.
struct Steps {
  int begun = 0;
  int ended = 0;
  bool inner = true;
};

void takeTooMuch(void* context) {
  auto* steps = static_cast<Steps*>(context);
  ++steps->begun;
  UtilSafeMalloc0(tooMuch);
  ++steps->ended;
}

TEST(UtilSafeAttempt, IsTrueForABodyThatReturns) {
  Steps steps;
  EXPECT_TRUE(
      UtilSafeAttempt([](void* context) { ++static_cast<Steps*>(context)->ended; }, &steps));
  EXPECT_EQ(steps.ended, 1);
}

TEST(UtilSafeAttempt, EndsInsteadOfAPanicWhereMemoryIsExhausted) {
  Steps steps;
  bool done = true;
  const tests::Messages said =
      tests::messagesOf([&] { done = UtilSafeAttempt(takeTooMuch, &steps); });
  EXPECT_FALSE(done);
  EXPECT_EQ(said.panic, "");
  EXPECT_EQ(said.warning, "");
  EXPECT_EQ(steps.begun, 1);
  EXPECT_EQ(steps.ended, 0);
  EXPECT_FALSE(UtilSafeAttempt([](void*) { UtilSafeCalloc0(2, overHalf); }, nullptr));
}

TEST(UtilSafeAttempt, IsOverWhenItEnds) {
  Steps steps;
  EXPECT_TRUE(UtilSafeAttempt([](void*) {}, nullptr));
  EXPECT_NE(tests::messagesOf([] { UtilSafeMalloc0(tooMuch); }).panic, "");
  EXPECT_FALSE(UtilSafeAttempt(takeTooMuch, &steps));
  EXPECT_NE(tests::messagesOf([] { UtilSafeMalloc0(tooMuch); }).panic, "");
}

TEST(UtilSafeAttempt, EndsTheInnermostOneOnly) {
  Steps steps;
  EXPECT_TRUE(UtilSafeAttempt(
      [](void* context) {
        auto* outer = static_cast<Steps*>(context);
        outer->inner = UtilSafeAttempt(takeTooMuch, context);
        ++outer->ended;
      },
      &steps));
  EXPECT_FALSE(steps.inner);
  EXPECT_EQ(steps.ended, 1);
}

TEST(UtilSafeAttempt, IsOfItsThreadAlone) {
  bool inThread = true;
  EXPECT_TRUE(UtilSafeAttempt(
      [](void* context) {
        std::thread([context] {
          Steps steps;
          *static_cast<bool*>(context) = UtilSafeAttempt(takeTooMuch, &steps);
        }).join();
      },
      &inThread));
  EXPECT_FALSE(inThread);
}

}  // namespace
