// SPDX-License-Identifier: MIT
//
// The pixels of an update's rectangles, as each encoding writes them.

#ifndef VIEWERS_RECTANGLES_H
#define VIEWERS_RECTANGLES_H

#include <zlib.h>

#include <cstdint>
#include <vector>

#include "link.h"
#include "picture.h"
#include "pixelFormat.h"

namespace viewers {

enum Encoding : int32_t {
  kRaw = 0,
  kCopyRect = 1,
  kZrle = 16,
  kTightPng = -260,
  kDesktopSize = -223,
  kLastRect = -224,
  kPointerPosition = -232,
  kCursor = -239,
  kCursorWithAlpha = -314,
};

/// The one zlib stream of a connection.
class Inflater {
 public:
  Inflater();
  ~Inflater();
  Inflater(const Inflater&) = delete;
  Inflater& operator=(const Inflater&) = delete;
  /// All that the compressed bytes stand for. Throws Broken.
  std::vector<uint8_t> inflated(const std::vector<uint8_t>& compressed);

 private:
  z_stream stream_ = {};
};

void readRaw(Link& link, const PixelFormat& format, Picture& picture, Box box);
void readCopy(Link& link, Picture& picture, Box box);
void readZrle(Link& link, Inflater& inflater, const PixelFormat& format, Picture& picture, Box box);
/// A Tight rectangle that is one colour or a PNG.
void readTightPng(Link& link, const PixelFormat& format, Picture& picture, Box box);

}  // namespace viewers

#endif
