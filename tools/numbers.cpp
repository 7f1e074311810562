// SPDX-License-Identifier: MIT

#include "numbers.h"

#include <charconv>
#include <cmath>
#include <string>

namespace tool {
namespace {

template <class Number> bool parse(const std::string& text, Number& number) {
  const char* end = text.data() + text.size();
  const auto [next, error] = std::from_chars(text.data(), end, number);
  return error == std::errc() && next == end;
}

/// A limit as a user would write it.
std::string shown(double limit) {
  char text[32];
  return {text, std::to_chars(text, text + sizeof text, limit).ptr};
}

std::string wrong(const std::string& text, const std::string& expected) {
  return "'" + text + "' is not " + expected;
}

}  // namespace

Check finiteNumber(double lowest, double highest) {
  const std::string expected = "a number from " + shown(lowest) + " to " + shown(highest);
  const auto check = [=](const std::string& text) {
    double number = 0;
    // Written so that a NaN, for which every comparison is false, is refused.
    const bool good = parse(text, number) && number >= lowest && number <= highest;
    return good && std::isfinite(number) ? std::string() : wrong(text, expected);
  };
  return {"NUMBER in [" + shown(lowest) + " - " + shown(highest) + "]", check};
}

Check count(uint64 lowest, uint64 highest) {
  const std::string most = highest == UINT64_MAX ? "" : std::to_string(highest);
  const std::string least = std::to_string(lowest);
  const std::string expected =
      "a whole number of " + least + (most.empty() ? " or more" : " to " + most);
  const auto check = [=](const std::string& text) {
    uint64 number = 0;
    const bool good = parse(text, number) && number >= lowest && number <= highest;
    // The argument library takes a number with a leading zero for an octal one.
    return good && text == std::to_string(number) ? std::string() : wrong(text, expected);
  };
  return {"COUNT in [" + least + " - " + most + "]", check};
}

}  // namespace tool
