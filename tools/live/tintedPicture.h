// SPDX-License-Identifier: MIT
//
// A picture in which what has just changed is tinted and outlined for a moment.

#ifndef RASTER_TOOLS_LIVE_TINTED_PICTURE_H
#define RASTER_TOOLS_LIVE_TINTED_PICTURE_H

#include <chrono>
#include <deque>
#include <optional>
#include <vector>

#include "changeList.h"
#include "pixelView.h"

namespace tool::live {

class TintedPicture {
 public:
  using Clock = std::chrono::steady_clock;

  TintedPicture(uint32 width, uint32 height);

  PixelView view() const { return {pixels.data(), 4 * width, width, height}; }
  uint8* data() { return pixels.data(); }

  /// Takes over a whole picture without a tint.
  void takeAll(const PixelView& from);
  /// Takes over what of a picture has changed, with a tint, and adds to `drawn` where.
  void draw(const PixelView& from, const ChangeList& changed, Clock::time_point now,
            ChangeList& drawn);
  /// When the oldest tint is to go; nothing without one.
  std::optional<Clock::time_point> nextExpiry() const;
  /// Takes the tints away that are due, and adds to `drawn` where.
  void expire(const PixelView& from, Clock::time_point now, ChangeList& drawn);

 private:
  struct Batch {
    Clock::time_point end;
    std::vector<Rect> rects;
  };
  void take(const PixelView& from, const Rect& rect);
  void tint(const Rect& rect);
  void outline(const Rect& rect);

  uint32 width;
  uint32 height;
  std::vector<uint8> pixels;
  std::vector<uint32> tintPixels;  // a band of the picture's width
  std::deque<Batch> batches;
};

}  // namespace tool::live

#endif
