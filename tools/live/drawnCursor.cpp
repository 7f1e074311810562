// SPDX-License-Identifier: MIT

#include "drawnCursor.h"

namespace tool::live {
namespace {

constexpr uint32 kPixelBytes = 4;

RasterCursor recordOf(const LiveCursor& cursor) {
  RasterCursor record = {};
  record.type = RASTER_CURSOR_ALPHA;
  record.hotX = cursor.hotSpot.x;
  record.hotY = cursor.hotSpot.y;
  record.width = cursor.width;
  record.height = cursor.height;
  // The library only reads them.
  record.pixels = reinterpret_cast<uint8*>(const_cast<uint32*>(cursor.pixels.data()));
  return record;
}

RasterFrameBufferDesc frameOf(uint32 width, uint32 height, uint32 pitch) {
  return {width, height, 24, 32, pitch};
}

}  // namespace

Rect cursorBox(const LiveCursor& cursor, const Point& at, uint32 width, uint32 height) {
  const RasterCursor record = recordOf(cursor);
  const RasterFrameBufferDesc frame = frameOf(width, height, kPixelBytes * width);
  RasterCursorBox box;
  Rect rect = {};
  if (Raster_ComputeCursorBox(&frame, &record, at.x, at.y, &box))
    Rect_SetFromXYWH(&rect, box.x, box.y, box.width, box.height);
  return rect;
}

DrawnCursor::DrawnCursor(uint8* pixels, uint32 pitch, uint32 width, uint32 height,
                         const LiveCursor& cursor, const Point& at)
    : picture(pixels), picturePitch(pitch) {
  const RasterCursor record = recordOf(cursor);
  const RasterFrameBufferDesc frame = frameOf(width, height, pitch);
  if (!Raster_ComputeCursorBox(&frame, &record, at.x, at.y, &box)) return;
  const uint32 boxPitch = kPixelBytes * static_cast<uint32>(box.width);
  other.resize(size_t{boxPitch} * static_cast<uint32>(box.height));
  Raster_DrawCursor(picture, &frame, other.data(), boxPitch, &record, &box);
  swap();
}

DrawnCursor::~DrawnCursor() { swap(); }

void DrawnCursor::swap() {
  if (other.empty()) return;
  const auto width = static_cast<uint32>(box.width);
  const auto height = static_cast<uint32>(box.height);
  const auto x = static_cast<uint32>(box.x);
  const auto y = static_cast<uint32>(box.y);
  std::vector<uint8> before(other.size());
  Raster_RectCopy(before.data(), kPixelBytes * width, picture, picturePitch, kPixelBytes, x, y, 0,
                  0, width, height);
  Raster_RectCopy(picture, picturePitch, other.data(), kPixelBytes * width, kPixelBytes, 0, 0, x, y,
                  width, height);
  other.swap(before);
}

}  // namespace tool::live
