// SPDX-License-Identifier: MIT
//
// Cursors, combined images and crops with any numbers, every double among them.

#include <cstdlib>
#include <cstring>

#include "fuzzing.h"
#include "imageUtil.h"
#include "support/cursorPlanes.h"
#include "support/viewImages.h"

using fuzz::Bytes;
using fuzz::Choices;
using fuzz::require;

namespace {

constexpr RasterLimits kLimits = {600, 600, 1 << 19, 1 << 20, 1 << 20, 100};

struct OwnCursor {
  explicit OwnCursor(Choices& c) {
    cursor.type = c.below(3);
    cursor.hotX = fuzz::coordinate(c);
    cursor.hotY = fuzz::coordinate(c);
    cursor.width = c.below(24);
    cursor.height = c.below(24);
    const auto format =
        c.oneOf<fuzz::PixelFormat>({{24, 32}, {24, 32}, {24, 24}, {16, 16}, {8, 8}, {24, 16}});
    const bool mask = cursor.type == RASTER_CURSOR_MASK;
    planeBytes = size_t{cursor.width} * cursor.height * (mask ? format.bpp / 8 : 4);
    first = c.fill(planeBytes);
    second = c.fill(planeBytes);
    tests::setPlanes(cursor, format.depth, format.bpp, first.data(), second.data());
    if (c.chance(8)) (c.chance(2) ? cursor.width : cursor.height) = c.word();
  }
  RasterCursor cursor{};
  Bytes first, second;
  size_t planeBytes = 0;
};

void drawCase(Choices& c) {
  const fuzz::FuzzedView fb(c);
  const fuzz::FuzzedView save(c);
  const OwnCursor own(c);
  const Bytes before = fb.bytes;
  const bool saves = c.chance(2);
  const int32 x = fuzz::coordinate(c);
  const RasterStatus status =
      RasterChecked_DrawCursor(&fb.view, saves ? &save.view : nullptr, &own.cursor, own.planeBytes,
                               x, fuzz::coordinate(c), nullptr);
  require((status == RASTER_STATUS_OK && !saves) || fb.bytes == before);
}

void scaleCase(Choices& c) {
  const OwnCursor own(c);
  const double x = c.number();
  const double y = c.number();
  uint32 sizes[4];
  int32 hot[2];
  Raster_GetScaledCursorSize(&sizes[0], &sizes[1], &sizes[2], &sizes[3], hot, own.cursor.width,
                             own.cursor.height, x, y, own.cursor.hotX, own.cursor.hotY);
  RasterScaledCursor size = {};
  if (RasterChecked_ScaledCursorSize(own.cursor.width, own.cursor.height, own.cursor.hotX,
                                     own.cursor.hotY, x, y, &kLimits, &size) != RASTER_STATUS_OK)
    return;
  require(size.paddedWidth == sizes[0] && size.height == sizes[3]);
  Bytes dst(size_t{2} * size.planeBytes, 7);
  const Bytes before = dst;
  const RasterStatus status = RasterChecked_ScaleCursor(&own.cursor, own.planeBytes, x, y, &kLimits,
                                                        dst.data(), dst.size(), nullptr);
  require(status == RASTER_STATUS_OK || dst == before);
}

ImageUtilImage imageOf(Choices& c, const RasterView& view) {
  ImageUtilImage image = tests::imageOn(view);
  image.flags = c.below(2);
  return image;
}

void combineCase(Choices& c) {
  std::vector<fuzz::FuzzedView> views;
  std::vector<ImageUtilImage> images;
  std::vector<size_t> bytes;
  std::vector<int32> positions;
  for (uint32 count = c.below(4); count != 0; --count) views.emplace_back(c);
  for (fuzz::FuzzedView& own : views) {
    images.push_back(imageOf(c, own.view));
    if (c.chance(2)) {
      images.back().depth = images[0].depth;
      images.back().bpp = images[0].bpp;
    }
    bytes.push_back(own.view.bytes);
    positions.push_back(fuzz::coordinate(c));
    positions.push_back(fuzz::coordinate(c));
  }
  ImageUtilImage result = {};
  const RasterStatus status =
      RasterChecked_Combine(images.data(), bytes.data(), positions.data(),
                            static_cast<uint32>(images.size()), &kLimits, &result);
  require(status == RASTER_STATUS_OK || result.data == nullptr);
  free(result.data);
}

void cropCase(Choices& c) {
  const fuzz::FuzzedView own(c);
  const ImageUtilImage image = imageOf(c, own.view);
  const int32 n[] = {fuzz::coordinate(c), fuzz::coordinate(c), fuzz::coordinate(c),
                     fuzz::coordinate(c), fuzz::coordinate(c), fuzz::coordinate(c)};
  ImageUtilImage result = {};
  const RasterStatus status = RasterChecked_CropAndScale(&image, own.view.bytes, n[0], n[1], n[2],
                                                         n[3], n[4], n[5], &kLimits, &result);
  require((status == RASTER_STATUS_OK) == (result.data != nullptr));
  free(result.data);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  Choices c(bytes, size);
  constexpr void (*kCases[])(Choices&) = {drawCase, scaleCase, combineCase, cropCase};
  kCases[c.below(4)](c);
  return 0;
}
