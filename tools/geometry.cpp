// SPDX-License-Identifier: MIT

#include "geometry.h"

#include <algorithm>
#include <charconv>

#include "failure.h"

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
  void expect(char sign) {
    if (at == end || *at != sign) fail();
    ++at;
  }
  /// Whether the text goes on with a sign, which is then passed over.
  bool takes(char sign) {
    const bool is = at != end && *at == sign;
    if (is) ++at;
    return is;
  }
  bool isAtEnd() const { return at == end; }
  void expectEnd() const {
    if (at != end) fail();
  }

 private:
  [[noreturn]] void fail() const { throw UsageError("'" + text + "' is not of the form " + form); }

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
  if (reader.isAtEnd()) return {0, 0, width, height};
  reader.expect('+');
  const int32 x = reader.number(0);
  reader.expect('+');
  const int32 y = reader.number(0);
  reader.expectEnd();
  return {x, y, x + width, y + height};
}

uint32 parseColor(const std::string& text) {
  const bool isShort = text.size() == 4 && text[0] == '#';
  const size_t prefix = text.rfind("0x", 0) == 0 ? 2 : text.rfind('#', 0) == 0 ? 1 : 0;
  uint32 value = 0;
  const char* end = text.data() + text.size();
  const auto [next, error] = std::from_chars(text.data() + prefix, end, value, 16);
  if (error != std::errc() || next != end || text.size() - prefix != (isShort ? 3 : 6))
    throw UsageError("'" + text +
                     "' is not of the form RRGGBB, #RRGGBB, #RGB or "
                     "0xRRGGBB");
  if (!isShort) return value;
  return (value >> 8) * 0x110000 + (value >> 4 & 0xF) * 0x1100 + (value & 0xF) * 0x11;
}

SizeRequest parseSizeRequest(const std::string& text) {
  constexpr const char* kForm = "WxH, Wx, xH, FACTOR or PERCENT%";
  if (text.find('x') != std::string::npos) {
    Reader reader(text, kForm);
    const uint32 width = reader.takes('x') ? 0 : reader.size();
    if (width != 0) reader.expect('x');
    const uint32 height = width != 0 && reader.isAtEnd() ? 0 : reader.size();
    reader.expectEnd();
    return {width, height, 0};
  }
  constexpr double kLargestFactor = 32767;
  const bool isPercent = !text.empty() && text.back() == '%';
  const char* end = text.data() + text.size() - (isPercent ? 1 : 0);
  double factor = 0;
  const auto [next, error] = std::from_chars(text.data(), end, factor);
  if (isPercent) factor /= 100;
  if (error != std::errc() || next != end || !(factor > 0) || factor > kLargestFactor)
    throw UsageError("'" + text +
                     "' is neither of the form WxH, Wx or xH nor a factor or "
                     "percentage above 0");
  return {0, 0, factor};
}

Size SizeRequest::of(const Size& original) const {
  const auto scaled = [](uint32 side, double by) {
    constexpr double kRoundingError = 1e-9;  // 29 % of 100 are 29, not 28
    const double result = side * by * (1 + kRoundingError);
    return static_cast<uint32>(std::clamp(result, 1.0, double{kLargestCoordinate}));
  };
  if (factor != 0) return {scaled(original.width, factor), scaled(original.height, factor)};
  return {width != 0 ? width : scaled(original.width, double{1} * height / original.height),
          height != 0 ? height : scaled(original.height, double{1} * width / original.width)};
}

std::string regionText(const Rect& rect) {
  return std::to_string(widthOf(rect)) + "x" + std::to_string(heightOf(rect)) + "+" +
         std::to_string(rect.left) + "+" + std::to_string(rect.top);
}

}  // namespace tool
