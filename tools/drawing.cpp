// SPDX-License-Identifier: MIT

#include "drawing.h"

#include <algorithm>
#include <charconv>

#include "commands.h"
#include "geometry.h"

namespace tool {

Placement place(const Picture& source, const Point& at, const Picture& target) {
  Rect placed;
  const Rect size = source.bounds();
  const Rect area = target.bounds();
  Placement result = {};
  if (!Rect_Translate(&placed, &size, &at) || !Rect_Intersect(&result.onTarget, &placed, &area) ||
      widthOf(result.onTarget) == 0 || heightOf(result.onTarget) == 0)
    throw Failure("at " + std::to_string(at.x) + "," + std::to_string(at.y) +
                  " nothing of the source lies on the destination");
  result.srcX = static_cast<uint32>(result.onTarget.left - at.x);
  result.srcY = static_cast<uint32>(result.onTarget.top - at.y);
  return result;
}

void premultiply(Picture& picture) {
  for (uint32 y = 0; y < picture.height(); ++y) {
    uint8* pixel = picture.data() + size_t{picture.pitch()} * y;
    for (uint32 x = 0; x < picture.width(); ++x, pixel += 4) {
      for (int channel = 0; channel < 3; ++channel)
        pixel[channel] = static_cast<uint8>(pixel[channel] * pixel[3] / 255);
    }
  }
}

uint32 numberOfName(const std::string& text, std::span<const char* const> names) {
  const auto found = std::find(names.begin(), names.end(), text);
  if (found != names.end()) return static_cast<uint32>(found - names.begin());
  uint32 number = 0;
  const char* end = text.data() + text.size();
  const auto [next, error] = std::from_chars(text.data(), end, number);
  if (error == std::errc() && next == end && number < names.size()) return number;
  throw CLI::ValidationError("there is no operation '" + text + "'; the names are " +
                             listOf(names));
}

std::string listOf(std::span<const char* const> names) {
  std::string list;
  for (const char* name : names) list += list.empty() ? name : std::string(", ") + name;
  return list;
}

}  // namespace tool
