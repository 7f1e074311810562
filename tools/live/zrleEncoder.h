// SPDX-License-Identifier: MIT
//
// The encoding ZRLE: tiles of 64 x 64 pixels in one stream of zlib for the whole connection.

#ifndef RASTER_TOOLS_LIVE_ZRLE_ENCODER_H
#define RASTER_TOOLS_LIVE_ZRLE_ENCODER_H

#include <zlib.h>

#include "pixelView.h"
#include "viewerFormat.h"

namespace tool::live {

class ZrleEncoder {
 public:
  ZrleEncoder() = default;
  ~ZrleEncoder();
  ZrleEncoder(const ZrleEncoder&) = delete;
  ZrleEncoder& operator=(const ZrleEncoder&) = delete;

  /// zlib's level, 0 to 9.
  void setLevel(int wanted) { level = wanted; }
  /// Appends what stands behind a rectangle's header.
  void put(const PixelView& pixels, const Rect& rect, const ViewerFormat& format, Bytes& out);

 private:
  // 5 takes a tenth less time and a tenth more bytes.
  static constexpr int kUsualLevel = 6;

  void putTiles(const PixelView& pixels, const Rect& rect, const ViewerFormat& format);
  void deflateTo(Bytes& out);

  z_stream stream = {};
  bool isStarted = false;
  int level = kUsualLevel;
  int usedLevel = kUsualLevel;
  Bytes tiles;
};

}  // namespace tool::live

#endif
