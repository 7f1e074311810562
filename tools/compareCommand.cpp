// SPDX-License-Identifier: MIT
//
// compare: do two pictures agree, and where do they not.

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

#include "changedRects.h"
#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "numbers.h"
#include "picture.h"
#include "raster.h"
#include "standardOutput.h"

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
  std::string image;
  bool quiet = false;
};

Picture loadMask(const std::string& path, const Picture& like) {
  if (!path.empty()) return Picture::loadAs(32, path);
  Picture all(like.width(), like.height(), 32);
  Raster_RectFill(all.data(), all.pitch(), 4, 0xFFFFFFFF, 0, 0, all.width(), all.height());
  return all;
}

/// Clears what the mask does not compare.
void applyMask(Picture& picture, const Picture& mask) {
  Raster_RectROPcopy(picture.data(), static_cast<int32>(picture.pitch()), mask.data(),
                     static_cast<int32>(mask.pitch()), 4, 0, 0, RASTER_ROP_AND, 0, 0,
                     picture.width(), picture.height());
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
  constexpr uint32 kDark = 85;
  Picture picture = second.convertedTo(32);
  Raster_AlphaBlend(picture.data(), 0, 0, picture.pitch(), second.data(), 0, 0, second.pitch(),
                    picture.width(), picture.height(), 24, 32, RASTER_BLEND_DESTINATION,
                    RASTER_BLEND_USE_DST_ALPHA, 0, kDark, 0);
  for (const Rect& rect : rects) {
    const auto x = static_cast<uint32>(rect.left);
    const auto y = static_cast<uint32>(rect.top);
    Raster_RectCopy(picture.data(), picture.pitch(), second.data(), second.pitch(), 4, x, y, x, y,
                    widthOf(rect), heightOf(rect));
    outline(picture, rect);
  }
  save(picture, path);
}

/// Where two pictures of 32 bits a pixel differ in colour, and by how much.
struct Difference {
  uint64 pixels = 0;
  uint32 largest = 0;
  Rect within = {};
};

uint32 largestDifference(const uint8* a, const uint8* b) {
  uint32 largest = 0;
  for (int channel = 0; channel < 3; ++channel)
    largest = std::max(largest, static_cast<uint32>(std::abs(a[channel] - b[channel])));
  return largest;
}

const uint8* pixelAt(const Picture& picture, int32 x, int32 y) {
  return picture.data() + size_t{picture.pitch()} * static_cast<uint32>(y) +
         4 * static_cast<size_t>(x);
}

Difference differenceWithin(const Picture& a, const Picture& b, const std::vector<Rect>& rects) {
  Difference all;
  for (const Rect& rect : rects) {
    for (int32 y = rect.top; y < rect.bottom; ++y) {
      for (int32 x = rect.left; x < rect.right; ++x) {
        const uint32 by = largestDifference(pixelAt(a, x, y), pixelAt(b, x, y));
        if (by == 0) continue;
        ++all.pixels;
        all.largest = std::max(all.largest, by);
        const Rect pixel = {x, y, x + 1, y + 1};
        Rect_Union(&all.within, &pixel);
      }
    }
  }
  return all;
}

/// Pixels of which a mask compares anything.
uint64 comparedPixels(const Picture& mask) {
  uint64 compared = 0;
  for (int32 y = 0; y < mask.bounds().bottom; ++y) {
    for (int32 x = 0; x < mask.bounds().right; ++x) {
      const uint8* pixel = pixelAt(mask, x, y);
      if ((pixel[0] | pixel[1] | pixel[2]) != 0) ++compared;
    }
  }
  return compared;
}

void printDifference(FILE* stream, const Difference& difference, uint64 compared, bool agree,
                     const std::vector<Rect>& rects) {
  fprintf(stream, "%llu of %llu pixels differ", static_cast<unsigned long long>(difference.pixels),
          static_cast<unsigned long long>(compared));
  if (difference.pixels != 0) {
    fprintf(stream, ", by up to %u, within %s%s", difference.largest,
            regionText(difference.within).c_str(), agree ? ": equal within the tolerance" : "");
    for (const Rect& rect : rects) fprintf(stream, "\n  %s", regionText(rect).c_str());
  }
  fputs("\n", stream);
}

bool haveOneSize(const Picture& a, const Picture& b) {
  const Rect first = a.bounds();
  const Rect second = b.bounds();
  return Rect_IsSizeEqual(&first, &second);
}

int compare(const CompareOptions& options) {
  if (!options.image.empty()) typeFromName(options.image);
  FILE* text = textBeside(options.image);
  Picture first = Picture::loadAs(32, options.first);
  Picture second = Picture::loadAs(32, options.second);
  if (!haveOneSize(first, second)) {
    if (!options.quiet)
      fprintf(text, "different sizes: %ux%u and %ux%u\n", first.width(), first.height(),
              second.width(), second.height());
    return kDifferent;
  }
  const Picture mask = loadMask(options.mask, first);
  if (!haveOneSize(first, mask))
    throw Failure("the mask '" + options.mask + "' is not of the pictures' size");
  const bool agree = Raster_CompareMasked(first.data(), first.pitch(), 32, second.data(),
                                          second.pitch(), 32, mask.data(), mask.pitch(), 32, 0, 0,
                                          first.width(), first.height(), options.maxDiffs);

  const Picture shown = second.convertedTo(32);
  applyMask(first, mask);
  applyMask(second, mask);
  const std::vector<Rect> rects = changedRects(first, second, options.tileSize);
  if (!options.quiet)
    printDifference(text, differenceWithin(first, second, rects), comparedPixels(mask), agree,
                    rects);
  if (!options.image.empty()) drawDifferences(shown, rects, options.image);
  return agree ? kEqual : kDifferent;
}

}  // namespace

void addCompareCommand(Commands& commands) {
  auto options = std::make_shared<CompareOptions>();
  Command command = commands.add(
      "compare",
      "Compares the colours of two pictures. The exit status is 0 when they are equal, 1 when they "
      "differ and 2 when that cannot be told.",
      [options] { return compare(*options); }, kTrouble);
  command.add("A", options->first, "a PNG picture").required();
  command.add("B", options->second, "a PNG picture").required();
  command
      .add("--mask", options->mask,
           "a PNG picture; the bits set in its colours are compared (white: all)")
      .form("FILE");
  command.add("--max-diffs", options->maxDiffs, "so many pixels' worth of bytes may differ")
      .check(count(0, kMostDiffs));
  command.add("--tile", options->tileSize, "side of the tiles that are compared")
      .check(count(1, 4096))
      .withDefault();
  command
      .add("--image,--out", options->image,
           "a picture to write: dark, with the differences bright and outlined")
      .form("FILE");
  command.addFlag("-q,--quiet", options->quiet, "say nothing: the exit status tells");
}

}  // namespace tool
