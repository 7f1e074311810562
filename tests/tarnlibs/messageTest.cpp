// SPDX-License-Identifier: MIT
//
// Messages: their formatting, their sinks, and the end of a panic.

#include "message.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <string>

#include "support/recordedMessages.h"

namespace {

using tests::Messages;

std::string heard;
void hear(const char* message) { heard += message; }

TEST(Log, FormatsAndReachesItsOwnSinkOnly) {
  const Messages said = tests::messagesOf([] { Log("%s: %d of %zu\n", "Name", -3, size_t{7}); });
  EXPECT_EQ(said.log, "Name: -3 of 7\n");
  EXPECT_EQ(said.warning, "");
  EXPECT_EQ(said.panic, "");
}

TEST(Warning, FormatsAndReachesItsOwnSinkOnly) {
  const Messages said = tests::messagesOf([] { Warning("%d %%\n", 5); });
  EXPECT_EQ(said.log, "");
  EXPECT_EQ(said.warning, "5 %\n");
  EXPECT_EQ(said.panic, "");
}

TEST(Log, CutsAMessageAt1023Bytes) {
  const std::string exact(1023, 'x');
  EXPECT_EQ(tests::messagesOf([&] { Log("%s", exact.c_str()); }).log, exact);
  EXPECT_EQ(tests::messagesOf([&] { Log("%sy", exact.c_str()); }).log, exact);
}

TEST(Log, SendsNothingOfAFormatThatFails) {
  // A wide character that the C locale cannot express.
  const wchar_t foreign[] = {0x20AC, 0};
  const Messages said = tests::messagesOf([&] { Log("%ls\n", foreign); });
  EXPECT_EQ(said.log.find("x"), std::string::npos);
  EXPECT_LT(said.log.size(), 8u);
}

TEST(Log_SetSink, ReturnsTheSinkBeforeAndNullForTheDefault) {
  EXPECT_EQ(Log_SetSink(hear), nullptr);
  EXPECT_EQ(Log_SetSink(nullptr), hear);
  EXPECT_EQ(Log_SetSink(nullptr), nullptr);
}

TEST(Log_SetSink, KeepsTheSinksOfTheKindsApart) {
  heard.clear();
  const Messages said = tests::messagesOf([] {
    Log_SetSink(hear);
    Warning("w\n");
    Log("l\n");
  });
  EXPECT_EQ(heard, "l\n");
  EXPECT_EQ(said.log, "");
  EXPECT_EQ(said.warning, "w\n");
}

TEST(LogDeathTest, GoesToStandardErrorByDefault) {
  EXPECT_EXIT(
      {
        Log("to standard error\n");
        _Exit(3);
      },
      testing::ExitedWithCode(3), "^to standard error\n$");
}

TEST(PanicDeathTest, WritesItsMessageAndAborts) {
  EXPECT_EXIT(Panic("fatal %d\n", 4), testing::KilledBySignal(SIGABRT), "fatal 4\n");
}

TEST(PanicDeathTest, AbortsEvenWhenItsSinkReturns) {
  EXPECT_EXIT(
      {
        Panic_SetSink([](const char*) {});
        Panic("unheard\n");
      },
      testing::KilledBySignal(SIGABRT), "^$");
}

TEST(Panic, MayBeLeftByItsSink) {
  for (int again = 0; again < 3; ++again)
    EXPECT_EQ(tests::messagesOf([] { Panic("fatal %d\n", 4); }).panic, "fatal 4\n");
}

}  // namespace
