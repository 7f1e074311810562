// SPDX-License-Identifier: MIT

#include "geometry.h"

#include <charconv>

namespace tool {
namespace {

constexpr int kLargestCoordinate = 0x3FFFFFFF;

/// Reads a text from left to right: numbers and the signs between them.
class Reader {
 public:
  Reader(const std::string& whole, const char* expectedForm)
      : text(whole), form(expectedForm), at(text.data()), end(text.data() + text.size()) {}

  int number(int lowest) {
    int value = 0;
    const auto [next, error] = std::from_chars(at, end, value);
    if (error != std::errc() || value < lowest || value > kLargestCoordinate) fail();
    at = next;
    return value;
  }
  uint32 size() { return static_cast<uint32>(number(1)); }
  uint32 hexadecimal() {
    uint32 value = 0;
    const auto [next, error] = std::from_chars(at, end, value, 16);
    if (error != std::errc() || next - at != 6) fail();
    at = next;
    return value;
  }
  void expect(char sign) {
    if (at == end || *at != sign) fail();
    ++at;
  }
  void expectEnd() const {
    if (at != end) fail();
  }

 private:
  [[noreturn]] void fail() const {
    throw CLI::ValidationError("'" + text + "' is not of the form " + form);
  }

  const std::string& text;
  const char* form;
  const char* at;
  const char* end;
};

}  // namespace

Size parseSize(const std::string& text) {
  Reader reader(text, "WxH");
  const uint32 width = reader.size();
  reader.expect('x');
  const uint32 height = reader.size();
  reader.expectEnd();
  return {width, height};
}

Point parsePoint(const std::string& text) {
  Reader reader(text, "X,Y");
  const int32 x = reader.number(-kLargestCoordinate);
  reader.expect(',');
  const int32 y = reader.number(-kLargestCoordinate);
  reader.expectEnd();
  return {x, y};
}

Rect parseRegion(const std::string& text) {
  Reader reader(text, "WxH+X+Y");
  const int32 width = reader.number(1);
  reader.expect('x');
  const int32 height = reader.number(1);
  reader.expect('+');
  const int32 x = reader.number(0);
  reader.expect('+');
  const int32 y = reader.number(0);
  reader.expectEnd();
  return {x, y, x + width, y + height};
}

uint32 parseColour(const std::string& text) {
  Reader reader(text, "RRGGBB");
  const uint32 colour = reader.hexadecimal();
  reader.expectEnd();
  return colour;
}

std::string regionText(const Rect& rect) {
  return std::to_string(widthOf(rect)) + "x" + std::to_string(heightOf(rect)) + "+" +
         std::to_string(rect.left) + "+" + std::to_string(rect.top);
}

}  // namespace tool
