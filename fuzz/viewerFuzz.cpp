// SPDX-License-Identifier: MIT
//
// What a viewer of the live screen says: any bytes, in pieces of any size, with updates between
// them. How the bytes are cut makes no difference to the answers.

#include <cstring>

#include "fuzzing.h"
#include "session.h"

using fuzz::require;
using tool::LiveCursor;
using tool::live::Bytes;
using tool::live::InputSink;
using tool::live::Scene;
using tool::live::Session;

namespace {

constexpr uint32 kWidth = 70;
constexpr uint32 kHeight = 40;
constexpr size_t kMostBytes = 1 << 20;  // of an update of such a screen, whatever its form

class IgnoredInput : public InputSink {
 public:
  void key(bool /*down*/, uint32 /*keySymbol*/) override {}
  void pointer(uint32 /*buttons*/, const Point& /*at*/) override {}
};

bool saysTheSame(const Bytes& a, const Bytes& b) {
  return a.size() == b.size() && (a.empty() || memcmp(a.data(), b.data(), a.size()) == 0);
}

/// Takes the bytes as a whole and one by one.
void compareCuts(const uint8* bytes, size_t size) {
  IgnoredInput input;
  Session whole(kWidth, kHeight, "screen", &input);
  Session cut(kWidth, kHeight, "screen", &input);
  Bytes wholeAnswers;
  Bytes cutAnswers;
  const bool taken = whole.receive(bytes, size, wholeAnswers);
  bool cutTaken = true;
  for (size_t i = 0; i < size && cutTaken; ++i) cutTaken = cut.receive(bytes + i, 1, cutAnswers);
  require(taken == cutTaken && saysTheSame(wholeAnswers, cutAnswers));
  require(whole.fault() == cut.fault() && whole.fault().empty() == taken);
}

void watch(const uint8* bytes, size_t size) {
  static const std::vector<uint8> pixels = fuzz::Choices(1).fill(size_t{4} * kWidth * kHeight);
  static const LiveCursor cursor = {{5, 5}, {1, 1}, 6, 4, std::vector<uint32>(24, 0x80402010)};
  Scene scene = {{pixels.data(), 4 * kWidth, kWidth, kHeight}, &cursor, 1, {4, 4, 10, 8}, {5, 5}};
  IgnoredInput input;
  Session session(kWidth, kHeight, "screen", &input);
  Bytes out;
  for (size_t at = 0; at < size;) {
    const size_t piece = std::min<size_t>(size - at, 1 + bytes[at] % 64);
    if (!session.receive(bytes + at, piece, out)) return;
    at += piece;
    if (bytes[at - 1] == 0xA5) {
      scene.pixels.width = kWidth / 2;
      if (!session.resize(kWidth / 2, kHeight)) return;
    }
    scene.cursorSerial += bytes[at - 1] & 1;
    out.clear();
    session.putUpdate(scene, out);
    require(out.size() <= kMostBytes);
    out.clear();
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  compareCuts(bytes, size);
  watch(bytes, size);
  return 0;
}
