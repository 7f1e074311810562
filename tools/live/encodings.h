// SPDX-License-Identifier: MIT
//
// The numbers of the encodings and of what viewers say they understand.

#ifndef RASTER_TOOLS_LIVE_ENCODINGS_H
#define RASTER_TOOLS_LIVE_ENCODINGS_H

#include "bytes.h"
#include "pixelView.h"

namespace tool::live {

enum Encoding : int32 {
  kRaw = 0,
  kCopyRect = 1,
  kZrle = 16,
  kDesktopSize = -223,
  kPointerPosition = -232,
  kCursor = -239,
  kCompressLevel9 = -247,
  kCompressLevel0 = -256,
  kTightPng = -260,
  kCursorWithAlpha = -314
};

/// What stands before every rectangle of an update.
inline void putRectHeader(Bytes& out, uint32 x, uint32 y, uint32 width, uint32 height,
                          int32 encoding) {
  out.put16(x);
  out.put16(y);
  out.put16(width);
  out.put16(height);
  out.put32(static_cast<uint32>(encoding));
}
inline void putRectHeader(Bytes& out, const Rect& rect, int32 encoding) {
  putRectHeader(out, static_cast<uint32>(rect.left), static_cast<uint32>(rect.top), widthOf(rect),
                heightOf(rect), encoding);
}

}  // namespace tool::live

#endif
