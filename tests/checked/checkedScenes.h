// SPDX-License-Identifier: MIT
//
// Random views in memory that ends where they end, and a clip that goes pixel by pixel.

#ifndef TESTS_CHECKED_SCENES_H
#define TESTS_CHECKED_SCENES_H

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "rasterChecked.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/rectValues.h"
#include "support/someValues.h"

namespace tests {

using Bytes = std::vector<uint8>;

struct PixelFormat {
  uint32 depth;
  uint32 bpp;
};
inline constexpr PixelFormat kFormats[] = {{3, 8},   {6, 8},   {8, 8},  {15, 16},
                                           {16, 16}, {24, 24}, {24, 32}};
inline PixelFormat someFormat(Random& random) { return kFormats[random.below(7)]; }

inline size_t rowBytesOf(const RasterView& view) { return (size_t{view.width} * view.bpp + 7) / 8; }

/// A view whose memory ends with its last pixel, or begins with its first one, at a guard page.
class GuardedView {
 public:
  GuardedView(Random& random, PixelFormat format, uint32 width, uint32 height, bool gaps = true) {
    view_.width = width;
    view_.height = height;
    view_.depth = format.depth;
    view_.bpp = format.bpp;
    const uint32 unit = format.bpp == 16 || format.bpp == 32 ? format.bpp / 8 : 1;
    view_.pitch = static_cast<uint32>(rowBytesOf(view_));
    if (gaps) view_.pitch += unit * random.below(9);
    const size_t bytes =
        width == 0 || height == 0 ? 0 : size_t{height - 1} * view_.pitch + rowBytesOf(view_);
    memory_ = std::make_unique<GuardedBuffer>(bytes, tests::someGuard(random));
    memory_->assign(random.bytes(bytes));
    view_.data = memory_->data();
    view_.bytes = bytes;
  }

  const RasterView* operator&() const { return &view_; }
  const RasterView& view() const { return view_; }
  Bytes bytes() const { return memory_->bytes(); }
  void assign(const Bytes& bytes) { memory_->assign(bytes); }
  GuardedBuffer& memory() { return *memory_; }

 private:
  RasterView view_{};
  std::unique_ptr<GuardedBuffer> memory_;
};

/// A rectangle that lies in the view, touches its edges, or is somewhere else altogether.
inline Rect someRectFor(Random& random, const RasterView& view) {
  const auto width = static_cast<int32>(view.width);
  const auto height = static_cast<int32>(view.height);
  switch (random.below(8)) {
    case 0:
      return someRect(random);
    case 1:
      return {0, 0, width, height};
    case 2:
    case 3: {
      const int32 left = random.between(-width, width);
      const int32 top = random.between(-height, height);
      return {left, top, left + random.between(-2, 2 * width),
              top + random.between(-2, 2 * height)};
    }
    default: {
      const int32 left = random.between(0, width);
      const int32 top = random.between(0, height);
      return {left, top, random.between(left, width), random.between(top, height)};
    }
  }
}

/// The first and the number of the columns of a rectangle that lie in destination and source, found
/// by looking at every column of the destination. Rows likewise.
struct NaiveSide {
  uint32 to = 0;
  uint32 from = 0;
  uint32 size = 0;
  bool clipped = false;
};
inline NaiveSide naiveSide(int32 low, int32 high, uint32 limit, int64 from, int64 fromLimit) {
  NaiveSide side;
  for (uint32 i = 0; i < limit; ++i) {
    const int64 at = from + (int64{i} - low);
    if (i < int64{low} || i >= int64{high} || at < 0 || at >= fromLimit) continue;
    if (side.size++ == 0) side = {i, static_cast<uint32>(at), 1, false};
  }
  side.clipped = int64{high} - low != side.size;
  return side;
}
struct NaiveArea {
  NaiveSide x;
  NaiveSide y;
  bool isEmptyRect;

  bool isClipped() const { return !isEmptyRect && (x.clipped || y.clipped); }
  bool drawsNothing() const { return isEmptyRect || x.size == 0 || y.size == 0; }
};
inline constexpr int64 kNoLimit = int64{1} << 40;
inline NaiveArea naiveArea(const Rect& r, const RasterView& dst, int64 srcX, int64 srcY,
                           int64 srcWidth, int64 srcHeight) {
  return {naiveSide(r.left, r.right, dst.width, srcX, srcWidth),
          naiveSide(r.top, r.bottom, dst.height, srcY, srcHeight),
          r.left >= r.right || r.top >= r.bottom};
}
inline NaiveArea naiveArea(const Rect& r, const RasterView& dst) {
  return naiveArea(r, dst, 0, 0, kNoLimit, kNoLimit);
}

/// The status that a call owes for its rectangle alone.
inline RasterStatus statusFor(const NaiveArea& area, uint32 flags) {
  return area.isClipped() && flags == 0 ? RASTER_STATUS_OUTSIDE : RASTER_STATUS_OK;
}

inline uint32 someSize(Random& random) { return random.below(8) == 0 ? 0 : 1 + random.below(40); }

/// Views of a destination and a source, a rectangle, and a place in the source.
struct Scene {
  Scene(Random& random, PixelFormat dstFormat, PixelFormat srcFormat)
      : dst(random, dstFormat, someSize(random), someSize(random)),
        src(random, srcFormat, someSize(random), someSize(random)),
        rect(someRectFor(random, dst.view())),
        srcX(random.below(6) == 0 ? someCoordinate(random) : random.between(-2, 20)),
        srcY(random.below(6) == 0 ? someCoordinate(random) : random.between(-2, 20)),
        flags(random.below(2)) {}

  NaiveArea area() const {
    return naiveArea(rect, dst.view(), srcX, srcY, src.view().width, src.view().height);
  }

  GuardedView dst;
  GuardedView src;
  Rect rect;
  int32 srcX, srcY;
  uint32 flags;
};

inline std::string describe(const RasterView& v) {
  return std::to_string(v.width) + "x" + std::to_string(v.height) + " " + std::to_string(v.depth) +
         "/" + std::to_string(v.bpp) + " pitch " + std::to_string(v.pitch);
}

}  // namespace tests

#endif
