// SPDX-License-Identifier: MIT

#include "names.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <sstream>

#include "failure.h"

namespace tool {
namespace {

std::string plain(const std::string& name) {
  std::string letters;
  for (const char letter : name)
    if (letter != '-' && letter != '_')
      letters += static_cast<char>(tolower(static_cast<unsigned char>(letter)));
  return letters;
}

/// How many letters have to be changed, left out, put in or exchanged with their neighbour.
size_t distance(const std::string& a, const std::string& b) {
  std::vector<std::vector<size_t>> d(a.size() + 1, std::vector<size_t>(b.size() + 1));
  for (size_t i = 0; i <= a.size(); ++i) d[i][0] = i;
  for (size_t j = 0; j <= b.size(); ++j) d[0][j] = j;
  for (size_t i = 1; i <= a.size(); ++i) {
    for (size_t j = 1; j <= b.size(); ++j) {
      const size_t change = a[i - 1] == b[j - 1] ? 0 : 1;
      d[i][j] = std::min({d[i - 1][j] + 1, d[i][j - 1] + 1, d[i - 1][j - 1] + change});
      if (i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1])
        d[i][j] = std::min(d[i][j], d[i - 2][j - 2] + 1);
    }
  }
  return d[a.size()][b.size()];
}

}  // namespace

bool sameName(const std::string& a, const std::string& b) { return plain(a) == plain(b); }

std::vector<std::string> namesIn(const char* list) {
  std::istringstream words(list);
  std::vector<std::string> names;
  for (std::string word; words >> word;) names.push_back(word);
  return names;
}

bool isOneOf(const char* list, const std::string& name) {
  const std::vector<std::string> names = namesIn(list);
  return std::any_of(names.begin(), names.end(),
                     [&](const std::string& known) { return sameName(known, name); });
}

std::string firstOf(const char* list) { return namesIn(list).front(); }

uint32 numberOfName(const std::string& text, std::span<const char* const> lists) {
  const auto found = std::find_if(lists.begin(), lists.end(),
                                  [&](const char* list) { return isOneOf(list, text); });
  if (found != lists.end()) return static_cast<uint32>(found - lists.begin());
  uint32 number = 0;
  const char* end = text.data() + text.size();
  const auto [next, error] = std::from_chars(text.data(), end, number);
  if (error == std::errc() && next == end && number < lists.size()) return number;
  throw UsageError("there is no operation '" + text + "'; the names are " + listOf(lists));
}

std::string listOf(std::span<const char* const> lists) {
  std::string all;
  for (const char* list : lists) all += (all.empty() ? "" : ", ") + firstOf(list);
  return all;
}

std::string suggestion(const std::string& wrong, const std::vector<std::string>& known) {
  const auto near = [&](const std::string& name) { return distance(plain(wrong), plain(name)); };
  const auto best = std::min_element(
      known.begin(), known.end(),
      [&](const std::string& a, const std::string& b) { return near(a) < near(b); });
  if (best == known.end() || near(*best) > std::max<size_t>(1, wrong.size() / 3)) return {};
  return "; did you mean '" + *best + "'?";
}

}  // namespace tool
