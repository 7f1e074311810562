// SPDX-License-Identifier: MIT
//
// Every drawing function of the companion with any arguments: refused with the destination as it
// was, or the pixels of the exact function.

#include <cstring>

#include "fuzzing.h"

using fuzz::Bytes;
using fuzz::Choices;
using fuzz::require;

namespace {

/// One call: its views and numbers, and the rectangle as the exact function takes it.
struct Call {
  fuzz::FuzzedView dst;
  fuzz::FuzzedView src;
  Rect rect;
  int32 srcX, srcY;
  uint32 number, other;
  uint32 flags;
  RasterBlend blend;

  explicit Call(Choices& c, bool plane)
      : dst(c),
        src(c, plane),
        rect(fuzz::rect(c)),
        srcX(fuzz::coordinate(c)),
        srcY(fuzz::coordinate(c)),
        number(c.word()),
        other(c.below(18)),
        flags(c.below(2)),
        blend{c.below(15), c.below(5), c.byte(), c.byte(), c.below(2)} {}

  uint32 x() const { return static_cast<uint32>(rect.left); }
  uint32 y() const { return static_cast<uint32>(rect.top); }
  uint32 width() const { return static_cast<uint32>(rect.right - rect.left); }
  uint32 height() const { return static_cast<uint32>(rect.bottom - rect.top); }
  uint32 fromX() const { return static_cast<uint32>(srcX); }
  uint32 fromY() const { return static_cast<uint32>(srcY); }
};

enum Kind : uint32 {
  kFill,
  kFillAlpha,
  kRopFill,
  kCopy,
  kRopCopy,
  kTile,
  kConvert,
  kBlend,
  kBits,
  kKinds
};

RasterStatus runChecked(Kind kind, const Call& k) {
  const RasterView* d = &k.dst.view;
  const RasterView* s = &k.src.view;
  switch (kind) {
    case kFill:
      return RasterChecked_Fill(d, &k.rect, k.number, k.flags);
    case kFillAlpha:
      return RasterChecked_FillAlpha(d, &k.rect, static_cast<uint8>(k.number), k.flags);
    case kRopFill:
      return RasterChecked_RopFill(d, &k.rect, k.number, k.other, k.flags);
    case kCopy:
      return RasterChecked_Copy(d, &k.rect, s, k.srcX, k.srcY, k.flags);
    case kRopCopy:
      return RasterChecked_RopCopy(d, &k.rect, s, k.srcX, k.srcY, k.other, k.flags);
    case kTile:
      return RasterChecked_Tile(d, &k.rect, s, k.srcX, k.srcY, k.other, k.flags);
    case kConvert:
      return RasterChecked_Convert(d, &k.rect, s, k.srcX, k.srcY, nullptr, 0, k.flags);
    case kBlend:
      return RasterChecked_Blend(d, &k.rect, s, k.srcX, k.srcY, &k.blend, k.flags);
    default:
      return RasterChecked_Bits(d, &k.rect, s, k.srcX, k.srcY, k.number, ~k.number, k.flags);
  }
}

/// The exact function on the whole rectangle, which was found to lie in the views.
void runExact(Kind kind, const Call& k) {
  const RasterView& d = k.dst.view;
  const RasterView& s = k.src.view;
  const uint32 n = d.bpp / 8;
  const uint32 w = k.width();
  const uint32 h = k.height();
  const auto dPitch = static_cast<int32>(d.pitch);
  const auto sPitch = static_cast<int32>(s.pitch);
  const auto code = [](const RasterView& v) {
    return static_cast<int32>(Raster_GetBPPDepth(v.depth, v.bpp));
  };
  switch (kind) {
    case kFill:
      return Raster_RectFill(d.data, d.pitch, n, k.number, k.x(), k.y(), w, h);
    case kFillAlpha:
      return Raster_RectFillAlpha(d.data, d.pitch, static_cast<uint8>(k.number), k.x(), k.y(), w,
                                  h);
    case kRopFill:
      return Raster_RectROPfill(d.data, dPitch, n, k.number, k.other, k.x(), k.y(), w, h);
    case kCopy:
      return Raster_RectCopy(d.data, d.pitch, s.data, s.pitch, n, k.fromX(), k.fromY(), k.x(),
                             k.y(), w, h);
    case kRopCopy:
      return Raster_RectROPcopy(d.data, dPitch, s.data, sPitch, n, k.fromX(), k.fromY(), k.other,
                                k.x(), k.y(), w, h);
    case kTile: {
      const auto inTile = [](int32 at, uint32 size) {
        return static_cast<uint32>((int64{at} % size + size) % size);
      };
      return Raster_RectPixmapROPcopy(d.data, d.pitch, s.data, s.pitch, static_cast<int32>(n),
                                      inTile(k.srcX, s.width), inTile(k.srcY, s.height), s.width,
                                      s.height, k.other, k.x(), k.y(), w, h);
    }
    case kConvert:
      return Raster_ConvertPixels(d.data, d.pitch, code(d), s.data, s.pitch, code(s), false,
                                  nullptr, k.fromX(), k.fromY(), k.x(), k.y(), w, h);
    case kBlend:
      return Raster_AlphaBlend(d.data, k.x(), k.y(), d.pitch, s.data, k.fromX(), k.fromY(), s.pitch,
                               w, h, d.depth, d.bpp, k.blend.op, k.blend.flags, k.blend.srcAlpha,
                               k.blend.dstAlpha, static_cast<uint8>(k.blend.staged));
    default:
      for (uint32 j = 0; j < h; ++j) {
        for (uint32 i = 0; i < w; ++i) {
          const uint32 column = k.fromX() + i;
          const uint8 byte = s.data[size_t{k.fromY() + j} * s.pitch + column / 8];
          const bool set = (byte >> (7 - column % 8) & 1) != 0;
          Raster_RectFill(d.data, d.pitch, n, set ? k.number : ~k.number, k.x() + i, k.y() + j, 1,
                          1);
        }
      }
  }
}

/// Comparison writes nothing but its result.
void compareCase(Choices& c) {
  const Call k(c, false);
  int32 difference = 77;
  const RasterStatus status = RasterChecked_Compare(&k.dst.view, &k.rect, &k.src.view, k.srcX,
                                                    k.srcY, k.flags, &difference);
  require(status == RASTER_STATUS_OK || difference == 77);
  bool agree = false;
  RasterChecked_CompareMasked(&k.dst.view, &k.src.view, &k.dst.view, k.srcX, &agree);
}

/// Frames of any size for any view.
void videoCase(Choices& c) {
  const fuzz::FuzzedView dst(c);
  const auto format =
      c.oneOf<uint32>({RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY, RASTER_VIDEO_YV12, 0u});
  uint64 needed = 0;
  const bool known =
      RasterChecked_YuvBytes(format, dst.view.width, dst.view.height, &needed) == RASTER_STATUS_OK;
  if (needed > 100000) needed = 100;
  const Bytes frame = c.fill(static_cast<size_t>(needed) - (c.chance(4) && needed != 0 ? 1 : 0));
  const Bytes before = dst.bytes;
  const RasterStatus status = RasterChecked_YuvToRgb(&dst.view, frame.data(), frame.size(), format);
  require(status == RASTER_STATUS_OK || dst.bytes == before);
  require(known || status != RASTER_STATUS_OK);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  Choices c(bytes, size);
  const auto kind = static_cast<Kind>(c.below(kKinds + 2));
  if (kind == kKinds) return compareCase(c), 0;
  if (kind > kKinds) return videoCase(c), 0;
  Call call(c, kind == kBits);
  const Bytes before = call.dst.bytes;
  const RasterStatus status = runChecked(kind, call);
  if (status != RASTER_STATUS_OK) {
    require(call.dst.bytes == before);
    return 0;
  }
  const bool empty = call.rect.left >= call.rect.right || call.rect.top >= call.rect.bottom;
  if (empty || call.flags != 0) return 0;
  const Bytes after = call.dst.bytes;
  if (!before.empty()) memcpy(call.dst.bytes.data(), before.data(), before.size());
  runExact(kind, call);
  require(call.dst.bytes == after);
  return 0;
}
