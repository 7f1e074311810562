// SPDX-License-Identifier: MIT

#include "session.h"

namespace viewers {
namespace {

constexpr unsigned kSetPixelFormat = 0, kSetEncodings = 2, kUpdateRequest = 3, kKey = 4,
                   kPointer = 5;
constexpr int kUpdate = 0, kColors = 1, kBell = 2, kCutText = 3;
constexpr unsigned kNoSecurity = 1;

std::string textOf(const std::vector<uint8_t>& bytes) { return {bytes.begin(), bytes.end()}; }

}  // namespace

Session::Session(Link& link, const std::string& version) : link_(link) {
  greet(version);
  link_.write({1});  // others may stay
  const int width = link_.read16();
  const int height = link_.read16();
  readServerFormat();
  name_ = textOf(link_.read(link_.read32()));
  picture_.resize(width, height);
}

void Session::greet(const std::string& version) {
  const std::string greeting = textOf(link_.read(12));
  if (greeting.substr(0, 4) != "RFB " || greeting.back() != '\n')
    throw Broken("the server does not greet: " + greeting);
  link_.write(Message().add("RFB 003.00" + version.substr(2) + "\n").bytes());
  if (version == "3.3") {
    if (link_.read32() != kNoSecurity) throw Broken("the server wants a password");
    return;
  }
  const size_t count = link_.read8();
  if (count == 0) throw Broken("refused: " + textOf(link_.read(link_.read32())));
  bool open = false;
  for (const uint8_t kind : link_.read(count)) open = open || kind == kNoSecurity;
  if (!open) throw Broken("the server wants a password");
  link_.write({kNoSecurity});
  if (version == "3.8" && link_.read32() != 0)
    throw Broken("refused: " + textOf(link_.read(link_.read32())));
}

void Session::readServerFormat() {
  format_.name = "the server's own";
  format_.bitsPerPixel = link_.read8();
  format_.depth = link_.read8();
  format_.bigEndian = link_.read8() != 0;
  if (link_.read8() == 0) throw Broken("the server's own format has a palette");
  for (int& max : format_.max) max = link_.read16();
  for (int& shift : format_.shift) shift = link_.read8();
  link_.read(3);
}

void Session::useFormat(const PixelFormat& format) {
  Message message;
  message.add8(kSetPixelFormat).add8(0).add16(0);
  message.add8(static_cast<unsigned>(format.bitsPerPixel));
  message.add8(static_cast<unsigned>(format.depth)).add8(format.bigEndian ? 1 : 0).add8(1);
  for (const int max : format.max) message.add16(static_cast<unsigned>(max));
  for (const int shift : format.shift) message.add8(static_cast<unsigned>(shift));
  message.add16(0).add8(0);
  link_.write(message.bytes());
  picture_.convert(format_, format);
  format_ = format;
}

void Session::useEncodings(const std::vector<int32_t>& encodings) {
  Message message;
  message.add8(kSetEncodings).add8(0).add16(static_cast<unsigned>(encodings.size()));
  for (const int32_t encoding : encodings) message.add32(static_cast<uint32_t>(encoding));
  link_.write(message.bytes());
}

void Session::request(bool incremental) { request(incremental, {0, 0, width(), height()}); }

void Session::request(bool incremental, Box box) {
  Message message;
  message.add8(kUpdateRequest).add8(incremental ? 1 : 0);
  for (const int number : {box.x, box.y, box.width, box.height})
    message.add16(static_cast<unsigned>(number));
  link_.write(message.bytes());
}

void Session::movePointer(int x, int y, int buttons) {
  link_.write(Message()
                  .add8(kPointer)
                  .add8(static_cast<unsigned>(buttons))
                  .add16(static_cast<unsigned>(x))
                  .add16(static_cast<unsigned>(y))
                  .bytes());
}

void Session::pressKey(uint32_t key, bool down) {
  link_.write(Message().add8(kKey).add8(down ? 1 : 0).add16(0).add32(key).bytes());
}

bool Session::readMessage() {
  const int kind = link_.read8();
  switch (kind) {
    case kUpdate:
      return readUpdate();
    case kColors:
      throw Broken("colours of a palette that nobody asked for");
    case kBell:
      return false;
    case kCutText:
      link_.read(3);
      link_.read(link_.read32());
      return false;
    default:
      throw Broken("a message of kind " + std::to_string(kind));
  }
}

bool Session::readUpdate() {
  link_.read8();
  const int count = link_.read16();
  // A count of 65535 means: up to the last rectangle that says so.
  for (int i = 0; i < count; ++i)
    if (!readRectangle()) break;
  ++counters_.updates;
  return true;
}

/// False after the mark of an update's end.
bool Session::readRectangle() {
  const int x = link_.read16();
  const int y = link_.read16();
  const int width = link_.read16();
  const int height = link_.read16();
  const Box box = {x, y, width, height};
  const auto encoding = static_cast<int32_t>(link_.read32());
  ++counters_.rectangles[encoding];
  switch (encoding) {
    case kLastRect:
      return false;
    case kDesktopSize:
      picture_.resize(width, height);
      return true;
    case kPointerPosition:
      return true;
    case kCursor:
      readCursor(box);
      return true;
    case kCursorWithAlpha:
      readCursorWithAlpha(box);
      return true;
    default:
      break;
  }
  if (!picture_.contains(box)) throw Broken("a rectangle outside the screen");
  if (encoding != kCopyRect)
    counters_.pixels += static_cast<uint64_t>(width) * static_cast<uint64_t>(height);
  switch (encoding) {
    case kRaw:
      readRaw(link_, format_, picture_, box);
      return true;
    case kCopyRect:
      readCopy(link_, picture_, box);
      return true;
    case kZrle:
      readZrle(link_, inflater_, format_, picture_, box);
      return true;
    case kTightPng:
      readTightPng(link_, format_, picture_, box);
      return true;
    default:
      throw Broken("an encoding that nobody asked for: " + std::to_string(encoding));
  }
}

void Session::readCursor(Box box) {
  Picture image(box.width, box.height);
  readRaw(link_, format_, image, {0, 0, box.width, box.height});
  const size_t rowBytes = (static_cast<size_t>(box.width) + 7) / 8;
  const std::vector<uint8_t> mask = link_.read(rowBytes * static_cast<size_t>(box.height));
  CursorImage cursor = {box.width, box.height, box.x, box.y, {}, true};
  for (int y = 0; y < box.height; ++y)
    for (int x = 0; x < box.width; ++x) {
      const int byte = mask[static_cast<size_t>(y) * rowBytes + static_cast<size_t>(x) / 8];
      const bool shown = (byte & 0x80 >> x % 8) != 0;
      const Color color = format_.color(image.at(x, y));
      const uint32_t word = 0xFF000000 | static_cast<uint32_t>(color.red) << 16 |
                            static_cast<uint32_t>(color.green) << 8 |
                            static_cast<uint32_t>(color.blue);
      cursor.pixels.push_back(shown ? word : 0);
    }
  cursor_ = cursor;
}

void Session::readCursorWithAlpha(Box box) {
  if (link_.read32() != kRaw) throw Broken("a cursor with alpha that is not raw");
  CursorImage cursor = {box.width, box.height, box.x, box.y, {}, false};
  for (int i = 0; i < box.width * box.height; ++i) {
    const uint32_t rgba = link_.read32();
    cursor.pixels.push_back(rgba << 24 | rgba >> 8);
  }
  cursor_ = cursor;
}

}  // namespace viewers
