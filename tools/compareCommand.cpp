// SPDX-License-Identifier: MIT
//
// compare: do two pictures agree, and where do they not.

#include <algorithm>
#include <cstdio>
#include <memory>

#include "changedRects.h"
#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "numbers.h"
#include "picture.h"
#include "raster.h"

namespace tool {
namespace {

constexpr int kEqual = 0;
constexpr int kDifferent = 1;
constexpr int kTrouble = 2;
constexpr int32 kMostDiffs = 0x1FFFFFFF;  // times four bytes is still a number of 32 bits

struct CompareOptions {
  std::string first;
  std::string second;
  std::string mask;
  int32 maxDiffs = 0;
  uint32 tileSize = 16;
  std::string out;
};

Picture loadMask(const std::string& path, const Picture& like) {
  if (!path.empty()) return Picture::loadAs(32, path);
  Picture all(like.width(), like.height(), 32);
  Raster_RectFill(all.data(), all.pitch(), 4, 0xFFFFFFFF, 0, 0, all.width(), all.height());
  return all;
}

/// Clears what the mask does not compare.
void applyMask(Picture& picture, const Picture& mask) {
  constexpr uint32 kRopAnd = 1;
  Raster_RectROPcopy(picture.data(), static_cast<int32>(picture.pitch()), mask.data(),
                     static_cast<int32>(mask.pitch()), 4, 0, 0, kRopAnd, 0, 0, picture.width(),
                     picture.height());
}

void outline(Picture& picture, const Rect& rect) {
  constexpr uint32 kRed = 0xFFFF0000;
  const auto x = static_cast<uint32>(rect.left);
  const auto y = static_cast<uint32>(rect.top);
  const auto fill = [&](uint32 left, uint32 top, uint32 width, uint32 height) {
    Raster_RectFill(picture.data(), picture.pitch(), 4, kRed, left, top, width, height);
  };
  fill(x, y, widthOf(rect), 1);
  fill(x, static_cast<uint32>(rect.bottom) - 1, widthOf(rect), 1);
  fill(x, y, 1, heightOf(rect));
  fill(static_cast<uint32>(rect.right) - 1, y, 1, heightOf(rect));
}

/// The second picture, dark where both agree, each rectangle of differences bright and outlined.
void drawDifferences(const Picture& second, const std::vector<Rect>& rects,
                     const std::string& path) {
  constexpr uint32 kDestination = 2;
  constexpr uint32 kScaleDestination = 2;
  constexpr uint32 kDark = 85;
  Picture picture = second.convertedTo(32);
  Raster_AlphaBlend(picture.data(), 0, 0, picture.pitch(), second.data(), 0, 0, second.pitch(),
                    picture.width(), picture.height(), 24, 32, kDestination, kScaleDestination, 0,
                    kDark, 0);
  for (const Rect& rect : rects) {
    const auto x = static_cast<uint32>(rect.left);
    const auto y = static_cast<uint32>(rect.top);
    Raster_RectCopy(picture.data(), picture.pitch(), second.data(), second.pitch(), 4, x, y, x, y,
                    widthOf(rect), heightOf(rect));
    outline(picture, rect);
  }
  save(picture, path);
}

int compare(const CompareOptions& options) {
  if (!options.out.empty()) typeFromName(options.out);
  Picture first = Picture::loadAs(32, options.first);
  Picture second = Picture::loadAs(32, options.second);
  const Rect firstBounds = first.bounds();
  const Rect secondBounds = second.bounds();
  if (!Rect_IsSizeEqual(&firstBounds, &secondBounds)) {
    printf("different sizes: %ux%u and %ux%u\n", first.width(), first.height(), second.width(),
           second.height());
    return kDifferent;
  }
  const Picture mask = loadMask(options.mask, first);
  const Rect maskBounds = mask.bounds();
  if (!Rect_IsSizeEqual(&firstBounds, &maskBounds))
    throw Failure("the mask '" + options.mask + "' is not of the pictures' size");
  const bool agree = Raster_CompareMasked(first.data(), first.pitch(), 32, second.data(),
                                          second.pitch(), 32, mask.data(), mask.pitch(), 32, 0, 0,
                                          first.width(), first.height(), options.maxDiffs);

  const Picture shown = second.convertedTo(32);
  applyMask(first, mask);
  applyMask(second, mask);
  const std::vector<Rect> rects = changedRects(first, second, options.tileSize);
  if (rects.empty()) {
    printf("equal\n");
  } else {
    printf("%s: differences within %s\n", agree ? "equal within the tolerance" : "different",
           regionText(boundingRect(first, second, rects)).c_str());
    for (const Rect& rect : rects) printf("  %s\n", regionText(rect).c_str());
  }
  if (!options.out.empty()) drawDifferences(shown, rects, options.out);
  return agree ? kEqual : kDifferent;
}

}  // namespace

void addCompareCommand(Commands& commands) {
  auto options = std::make_shared<CompareOptions>();
  CLI::App* command = commands.add(
      "compare",
      "Compares two pictures. The exit status is 0 when they are equal, 1 when they differ and 2 "
      "when that cannot be told.",
      [options] { return compare(*options); }, kTrouble);
  command->add_option("A", options->first, "a PNG picture")->required();
  command->add_option("B", options->second, "a PNG picture")->required();
  command->add_option("--mask", options->mask,
                      "a PNG picture; the bits set in its colours are compared (white: all)");
  command->add_option("--max-diffs", options->maxDiffs, "so many pixels' worth of bytes may differ")
      ->check(count(0, kMostDiffs));
  command->add_option("--tile", options->tileSize, "side of the tiles that are compared")
      ->check(count(1, 4096))
      ->capture_default_str();
  command->add_option("--out", options->out, "a picture of the differences to write");
}

}  // namespace tool
