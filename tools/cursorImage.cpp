// SPDX-License-Identifier: MIT

#include "cursorImage.h"

#include <utility>

namespace tool {
namespace {

uint8* bytesOf(std::vector<uint32>& words) { return reinterpret_cast<uint8*>(words.data()); }

/// The library's records point to pixels that it only reads.
uint8* bytesOf(const std::vector<uint32>& words) {
  return bytesOf(const_cast<std::vector<uint32>&>(words));
}

}  // namespace

CursorImage::CursorImage(uint32 type, uint32 width, uint32 height, const Point& hotSpot) {
  geometry.type = type;
  geometry.hotX = hotSpot.x;
  geometry.hotY = hotSpot.y;
  geometry.width = width;
  geometry.height = height;
}

CursorImage CursorImage::ofPixels(uint32 width, uint32 height, const Point& hotSpot,
                                  std::vector<uint32> pixels) {
  CursorImage cursor(RASTER_CURSOR_ALPHA, width, height, hotSpot);
  cursor.first = std::move(pixels);
  return cursor;
}

CursorImage CursorImage::ofBitPlanes(uint32 width, uint32 height, const Point& hotSpot,
                                     const std::vector<uint8>& andBits,
                                     const std::vector<uint8>& xorBits) {
  CursorImage cursor(RASTER_CURSOR_MASK, width, height, hotSpot);
  const uint32 size = Raster_CalculateCursorSize(width, height, 32);
  std::vector<uint32> planes(2 * size / sizeof(uint32));
  Raster_ExpandPlanarCursorData(width, height, 1, andBits.data(), 1, xorBits.data(), 32,
                                bytesOf(planes), 2 * size);
  const auto middle = planes.begin() + static_cast<ptrdiff_t>(planes.size() / 2);
  cursor.first.assign(planes.begin(), middle);
  cursor.second.assign(middle, planes.end());
  return cursor;
}

RasterCursor CursorImage::record() const {
  RasterCursor cursor = geometry;
  if (cursor.type == RASTER_CURSOR_ALPHA) {
    cursor.pixels = bytesOf(first);
  } else {
    cursor.depth = 24;
    cursor.bpp = 32;
    cursor.andMask = bytesOf(first);
    cursor.xorMask = bytesOf(second);
  }
  return cursor;
}

void CursorImage::scaleBy(double scale) {
  if (scale == 1) return;
  const RasterCursor before = record();
  uint32 paddedWidth = 0;
  uint32 paddedHeight = 0;
  int32 hotSpot[2];
  const uint32 size = Raster_GetScaledCursorSize(
      &paddedWidth, &paddedHeight, &geometry.width, &geometry.height, hotSpot, before.width,
      before.height, scale, scale, before.hotX, before.hotY);
  geometry.hotX = hotSpot[0];
  geometry.hotY = hotSpot[1];
  std::vector<uint32> scaledFirst(size / sizeof(uint32));
  std::vector<uint32> scaledSecond(second.empty() ? 0 : size / sizeof(uint32));
  if (before.type == RASTER_CURSOR_ALPHA) {
    Raster_ScaleAlphaCursor(bytesOf(scaledFirst), &before, scale, scale, paddedWidth, paddedHeight,
                            geometry.width, geometry.height);
  } else {
    Raster_ScaleColorCursor(bytesOf(scaledFirst), bytesOf(scaledSecond), &before, scale, scale,
                            paddedWidth, paddedHeight, geometry.width, geometry.height);
  }
  first = std::move(scaledFirst);
  second = std::move(scaledSecond);
}

bool CursorImage::drawOn(Picture& picture, const Point& at) const {
  const RasterCursor cursor = record();
  const RasterFrameBufferDesc frame = {picture.width(), picture.height(), picture.record.depth,
                                       picture.record.bpp, picture.pitch()};
  RasterCursorBox box;
  if (!Raster_ComputeCursorBox(&frame, &cursor, at.x, at.y, &box)) return false;
  Raster_DrawCursor(picture.data(), &frame, nullptr, 0, &cursor, &box);
  return true;
}

}  // namespace tool
