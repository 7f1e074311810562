// SPDX-License-Identifier: MIT

#include "protocol.h"

#include <algorithm>
#include <utility>

namespace tool::live {
namespace {

constexpr char kGreeting[] = "RFB 003.008\n";
constexpr size_t kGreetingBytes = sizeof kGreeting - 1;
constexpr uint32 kSecurityNone = 1;

enum MessageType : uint8 {
  kSetPixelFormat = 0,
  kSetEncodings = 2,
  kUpdateRequest = 3,
  kKeyEvent = 4,
  kPointerEvent = 5,
  kCutText = 6
};

/// Bytes of a message's fixed part, or 0 when there is no such message.
size_t messageBytes(uint8 type) {
  switch (type) {
    case kSetPixelFormat:
      return 4 + kPixelFormatBytes;
    case kSetEncodings:
      return 4;
    case kUpdateRequest:
      return 10;
    case kKeyEvent:
      return 8;
    case kPointerEvent:
      return 6;
    case kCutText:
      return 8;
    default:
      return 0;
  }
}

/// The number that three digits are, or -1.
int numberOf(const uint8* digits) {
  int number = 0;
  for (int i = 0; i < 3; ++i) {
    if (digits[i] < '0' || digits[i] > '9') return -1;
    number = 10 * number + (digits[i] - '0');
  }
  return number;
}

}  // namespace

void Protocol::greet(Bytes& out) { out.append(kGreeting, kGreetingBytes); }

bool Protocol::nonsense(std::string why) {
  what = std::move(why);
  return false;
}

size_t Protocol::needed() const {
  switch (step) {
    case Step::greeting:
      return kGreetingBytes;
    case Step::encodings:
      return 4;
    case Step::message:
      return heldBytes == 0 ? 1 : messageBytes(held[0]);
    default:
      return 1;
  }
}

bool Protocol::receive(const uint8* bytes, size_t count, Bytes& out) {
  while (count != 0) {
    if (step == Step::skip) {
      const size_t skipped = std::min<size_t>(count, remaining);
      remaining -= static_cast<uint32>(skipped);
      bytes += skipped;
      count -= skipped;
      if (remaining == 0) step = Step::message;
      continue;
    }
    const size_t taken = std::min(count, needed() - heldBytes);
    memcpy(held + heldBytes, bytes, taken);
    heldBytes += taken;
    bytes += taken;
    count -= taken;
    if (step == Step::message && messageBytes(held[0]) == 0)
      return nonsense("a message of unknown type " + std::to_string(held[0]));
    if (heldBytes < needed()) continue;
    heldBytes = 0;
    if (!take(held, out)) return false;
  }
  return true;
}

bool Protocol::take(const uint8* piece, Bytes& out) {
  switch (step) {
    case Step::greeting:
      return takeGreeting(piece, out);
    case Step::security:
      return takeSecurity(piece[0], out);
    case Step::clientInit:
      takeInit(out);
      return true;
    case Step::encodings:
      takeOneEncoding(piece);
      return true;
    default:
      return takeMessage(piece);
  }
}

bool Protocol::takeGreeting(const uint8* text, Bytes& out) {
  const bool isGreeting = memcmp(text, kGreeting, 4) == 0 && numberOf(text + 4) >= 3 &&
                          text[7] == '.' && numberOf(text + 8) >= 0 && text[11] == '\n';
  if (!isGreeting) return nonsense("a greeting that is none");
  // Versions between the published ones are to be treated as 3.3, later ones as the last.
  const int minor = numberOf(text + 4) > 3 ? 8 : numberOf(text + 8);
  minorVersion = minor >= 8 ? 8 : minor == 7 ? 7 : 3;
  if (minorVersion == 3) {
    out.put32(kSecurityNone);
    step = Step::clientInit;
  } else {
    out.put8(1);
    out.put8(kSecurityNone);
    step = Step::security;
  }
  return true;
}

bool Protocol::takeSecurity(uint32 type, Bytes& out) {
  if (type != kSecurityNone) return nonsense("a security type that was not offered");
  if (minorVersion == 8) out.put32(0);
  step = Step::clientInit;
  return true;
}

void Protocol::takeInit(Bytes& out) {
  step = Step::message;
  events.onStart(out);
}

bool Protocol::takeMessage(const uint8* message) {
  switch (message[0]) {
    case kSetPixelFormat:
      return takeFormat(message);
    case kUpdateRequest:
      return takeRequest(message);
    case kSetEncodings:
      takeEncodings(message);
      return true;
    case kKeyEvent:
      events.onKey(message[1] != 0, bigEndian32(message + 4));
      return true;
    case kPointerEvent:
      events.onPointer(message[1], {static_cast<int32>(bigEndian16(message + 2)),
                                    static_cast<int32>(bigEndian16(message + 4))});
      return true;
    default:
      skipText(message);
      return true;
  }
}

bool Protocol::takeFormat(const uint8* message) {
  const std::optional<PixelFormat> format = readPixelFormat(message + 4);
  if (!format) return nonsense("a pixel format that cannot be");
  events.onFormat(*format);
  return true;
}

bool Protocol::takeRequest(const uint8* message) {
  UpdateRequest request = {message[1] != 0, {}};
  Rect_SetFromXYWH(&request.area, static_cast<int32>(bigEndian16(message + 2)),
                   static_cast<int32>(bigEndian16(message + 4)),
                   static_cast<int32>(bigEndian16(message + 6)),
                   static_cast<int32>(bigEndian16(message + 8)));
  return events.onRequest(request) || nonsense("a request for pixels that do not exist");
}

void Protocol::takeEncodings(const uint8* message) {
  events.onEncodingsBegin();
  remaining = bigEndian16(message + 2);
  if (remaining == 0) {
    events.onEncodingsEnd();
  } else {
    step = Step::encodings;
  }
}

void Protocol::takeOneEncoding(const uint8* word) {
  events.onEncoding(static_cast<int32>(bigEndian32(word)));
  if (--remaining != 0) return;
  step = Step::message;
  events.onEncodingsEnd();
}

/// Nobody here wants the viewer's clipboard; an extended one says its length as a negative number.
void Protocol::skipText(const uint8* message) {
  const auto length = static_cast<int32>(bigEndian32(message + 4));
  remaining = length < 0 ? 0 - static_cast<uint32>(length) : static_cast<uint32>(length);
  if (remaining != 0) step = Step::skip;
}

}  // namespace tool::live
