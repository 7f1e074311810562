// SPDX-License-Identifier: MIT
//
// What viewers say: whole conversations, cut at every byte, and nonsense.

#include "protocol.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/random.h"

namespace tool::live {
namespace {

using tests::Random;

/// Writes down what it is told.
class Diary : public ProtocolEvents {
 public:
  void onStart(Bytes& out) override {
    out.append("start", 5);
    lines.emplace_back("start");
  }
  void onFormat(const PixelFormat& format) override {
    note("format",
         {format.bitsPerPixel, format.depth, format.bigEndian, format.redMax, format.greenMax,
          format.blueMax, format.redShift, format.greenShift, format.blueShift});
  }
  void onEncodingsBegin() override { lines.emplace_back("begin"); }
  void onEncoding(int32 encoding) override { note("encoding", {encoding}); }
  void onEncodingsEnd() override { lines.emplace_back("end"); }
  bool onRequest(const UpdateRequest& request) override {
    const Rect& area = request.area;
    note("request", {request.incremental, area.left, area.top, area.right, area.bottom});
    return acceptsRequests;
  }
  void onKey(bool down, uint32 keySymbol) override { note("key", {down, keySymbol}); }
  void onPointer(uint32 buttons, const Point& at) override {
    note("pointer", {buttons, at.x, at.y});
  }

  std::vector<std::string> lines;
  bool acceptsRequests = true;

 private:
  void note(std::string line, std::initializer_list<int64> numbers) {
    for (const int64 number : numbers) line += " " + std::to_string(number);
    lines.push_back(line);
  }
};

std::string be16(uint32 value) { return {static_cast<char>(value >> 8), static_cast<char>(value)}; }
std::string be32(uint32 value) { return be16(value >> 16) + be16(value & 0xFFFF); }
std::string zeros(size_t count) { return std::string(count, '\0'); }

std::string request(bool incremental, uint32 x, uint32 y, uint32 width, uint32 height) {
  return std::string(1, 3) + static_cast<char>(incremental) + be16(x) + be16(y) + be16(width) +
         be16(height);
}

std::string formatMessage() {
  return zeros(4) + std::string({16, 16, 0, 1}) + be16(31) + be16(63) + be16(31) +
         std::string({11, 5, 0}) + zeros(3);
}

std::string messages() {
  return formatMessage() + std::string(1, 2) + zeros(1) + be16(3) + be32(16) + be32(0) +
         be32(static_cast<uint32>(-239)) + request(true, 1, 2, 3, 4) + std::string({4, 1, 0, 0}) +
         be32(0xFF0D) + std::string({5, 3}) + be16(700) + be16(500) + std::string(1, 6) + zeros(3) +
         be32(5) + "hello" + std::string(1, 6) + zeros(3) + be32(static_cast<uint32>(-6)) +
         "extend" + std::string({2, 0}) + be16(0) + request(false, 0, 0, 65535, 65535);
}

const std::vector<std::string> kTold = {"start",
                                        "format 16 16 0 31 63 31 11 5 0",
                                        "begin",
                                        "encoding 16",
                                        "encoding 0",
                                        "encoding -239",
                                        "end",
                                        "request 1 1 2 4 6",
                                        "key 1 65293",
                                        "pointer 3 700 500",
                                        "begin",
                                        "end",
                                        "request 0 0 0 65535 65535"};

std::string greetingOf(const std::string& version) {
  if (version == "003") return "RFB 003.003\n" + zeros(1);
  return "RFB 003." + version + "\n" + std::string(1, 1) + zeros(1);
}

/// The server's part, after its own greeting.
std::string answerTo(const std::string& version) {
  if (version == "003") return be32(1) + "start";
  const std::string offer = {1, 1};
  return offer + (version == "008" ? be32(0) : "") + "start";
}

struct Outcome {
  bool isSound = true;
  std::string answers;
  std::vector<std::string> lines;
  std::string fault;
};

Outcome tell(const std::vector<std::string>& pieces) {
  Diary diary;
  Protocol protocol(diary);
  Bytes out;
  Outcome outcome;
  for (const std::string& piece : pieces)
    outcome.isSound =
        outcome.isSound &&
        protocol.receive(reinterpret_cast<const uint8*>(piece.data()), piece.size(), out);
  outcome.answers.assign(reinterpret_cast<const char*>(out.data()), out.size());
  outcome.lines = diary.lines;
  outcome.fault = protocol.fault();
  return outcome;
}

TEST(Protocol, GreetsFirst) {
  Bytes out;
  Protocol::greet(out);
  EXPECT_EQ(std::string(reinterpret_cast<const char*>(out.data()), out.size()), "RFB 003.008\n");
}

TEST(Protocol, UnderstandsAllMessagesCutAtEveryByte) {
  for (const std::string version : {"003", "007", "008"}) {
    const std::string whole = greetingOf(version) + messages();
    for (size_t cut = 0; cut <= whole.size(); ++cut) {
      const Outcome outcome = tell({whole.substr(0, cut), whole.substr(cut)});
      EXPECT_TRUE(outcome.isSound);
      EXPECT_EQ(outcome.answers, answerTo(version)) << version << " cut at " << cut;
      EXPECT_EQ(outcome.lines, kTold) << version << " cut at " << cut;
    }
  }
}

TEST(Protocol, UnderstandsSingleBytes) {
  const std::string whole = greetingOf("008") + messages();
  std::vector<std::string> bytes;
  for (const char byte : whole) bytes.emplace_back(1, byte);
  const Outcome outcome = tell(bytes);
  EXPECT_TRUE(outcome.isSound);
  EXPECT_EQ(outcome.lines, kTold);
}

TEST(Protocol, TreatsUnpublishedVersionsAsTheNextLowerOne) {
  EXPECT_EQ(tell({"RFB 003.005\n", zeros(1)}).answers, answerTo("003"));
  EXPECT_EQ(tell({"RFB 003.889\n", std::string(1, 1), zeros(1)}).answers, answerTo("008"));
  EXPECT_EQ(tell({"RFB 004.001\n", std::string(1, 1), zeros(1)}).answers, answerTo("008"));
}

TEST(Protocol, RefusesNonsense) {
  EXPECT_EQ(tell({"GET / HTTP/1.1\r\n"}).fault, "a greeting that is none");
  EXPECT_EQ(tell({"RFB 002.000\n"}).fault, "a greeting that is none");
  EXPECT_EQ(tell({"RFB 003.0x8\n"}).fault, "a greeting that is none");
  EXPECT_EQ(tell({"RFB 003.008\n", std::string(1, 2)}).fault,
            "a security type that was not offered");
  EXPECT_EQ(tell({greetingOf("008"), std::string(1, 77)}).fault, "a message of unknown type 77");
  EXPECT_EQ(tell({greetingOf("008"), zeros(20)}).fault, "a pixel format that cannot be");
}

TEST(Protocol, PassesOnThatARequestIsRefused) {
  Diary diary;
  diary.acceptsRequests = false;
  Protocol protocol(diary);
  Bytes out;
  const std::string text = greetingOf("008") + request(true, 0, 0, 0, 0);
  EXPECT_FALSE(protocol.receive(reinterpret_cast<const uint8*>(text.data()), text.size(), out));
  EXPECT_EQ(protocol.fault(), "a request for pixels that do not exist");
}

TEST(Protocol, SkipsALargeTextAsItComes) {
  constexpr uint32 kLength = 80'000'000;
  Diary diary;
  Protocol protocol(diary);
  Bytes out;
  const auto say = [&](const std::string& text) {
    return protocol.receive(reinterpret_cast<const uint8*>(text.data()), text.size(), out);
  };
  ASSERT_TRUE(say(greetingOf("008") + std::string(1, 6) + zeros(3) + be32(kLength)));
  const std::string piece(1'000'000, 'x');
  for (uint32 sent = 0; sent < kLength; sent += 1'000'000) {
    EXPECT_TRUE(protocol.isWithinMessage());
    ASSERT_TRUE(say(piece));
  }
  EXPECT_FALSE(protocol.isWithinMessage());
  ASSERT_TRUE(say(request(true, 0, 0, 1, 1)));
  EXPECT_EQ(diary.lines.back(), "request 1 0 0 1 1");
}

TEST(Protocol, KnowsWhenItIsWithinAMessage) {
  Diary diary;
  Protocol protocol(diary);
  Bytes out;
  EXPECT_TRUE(protocol.isWithinMessage());
  const std::string text = greetingOf("008") + messages() + request(true, 0, 0, 1, 1);
  protocol.receive(reinterpret_cast<const uint8*>(text.data()), text.size() - 1, out);
  EXPECT_TRUE(protocol.isWithinMessage());
  protocol.receive(reinterpret_cast<const uint8*>(text.data()) + text.size() - 1, 1, out);
  EXPECT_FALSE(protocol.isWithinMessage());
}

TEST(Protocol, SurvivesRandomBytes) {
  Random random(20);
  for (int round = 0; round < tests::rounds(20000); ++round) {
    Diary diary;
    Protocol protocol(diary);
    Bytes out;
    const std::string start = greetingOf(random.oneOf({"003", "007", "008"}));
    protocol.receive(reinterpret_cast<const uint8*>(start.data()), start.size(), out);
    bool isSound = true;
    for (int message = 0; isSound && message < 50; ++message) {
      std::vector<uint8> bytes = random.bytes(1 + random.below(40));
      // Mostly types that exist, with random contents.
      if (random.below(8) != 0) bytes[0] = random.oneOf<uint8>({0, 2, 3, 4, 5, 6});
      isSound = protocol.receive(bytes.data(), bytes.size(), out);
    }
    EXPECT_EQ(isSound, protocol.fault().empty());
    EXPECT_LE(out.size(), 64u);
  }
}

}  // namespace
}  // namespace tool::live
