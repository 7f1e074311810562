// SPDX-License-Identifier: MIT

#include "digest/apiCases.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace tests {
namespace {

using Bytes = std::vector<uint8>;

struct PixelFormat {
  uint32 depth;
  uint32 bpp;
};

/// A buffer that a rectangle lies in, and where.
struct Place {
  Bytes bytes;
  uint32 pitch, x, y;
  uint8* data() { return bytes.data(); }
};

/// What every case works with.
struct Case {
  const Api& api;
  Choices& c;
  Sink& sink;

  uint32 side() { return c.chance(8) ? c.below(200) : c.below(24); }
  uint32 pixelBytes() { return 1 + c.below(4); }

  /// A buffer for a rectangle of pixels of some bytes. The pitch may be any, so rows drift.
  Place place(uint32 width, uint32 height, uint32 bytesPerPixel, bool drifts = true) {
    Place p;
    p.x = c.below(4);
    p.y = c.below(3);
    p.pitch = (p.x + width) * bytesPerPixel + (drifts ? c.below(7) : 4 * c.below(2));
    if (!drifts) p.pitch = (p.pitch + 3) / 4 * 4;
    const size_t rows = height == 0 ? 0 : height - 1;
    p.bytes = c.fill((p.y + rows) * p.pitch + size_t{p.x + width} * bytesPerPixel);
    return p;
  }
  void give(const Bytes& bytes) { sink.add(bytes.data(), bytes.size()); }
  void give(const Place& p) { give(p.bytes); }
  template <class T> void give(T value) { sink.addNumber(value); }
  void giveRect(const Rect& r) { sink.add(&r, sizeof r); }
};

// ---- Rectangles of pixels ----------------------------------------------------------------------

void fillCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const uint32 pixel = k.c.word();
  switch (k.c.below(3)) {
    case 0: {
      Place p = k.place(w, h, n);
      k.api.Raster_RectFill(p.data(), p.pitch, n, pixel, p.x, p.y, w, h);
      return k.give(p);
    }
    case 1: {
      Place p = k.place(w, h, 4);
      k.api.Raster_RectFillAlpha(p.data(), p.pitch, static_cast<uint8>(pixel), p.x, p.y, w, h);
      return k.give(p);
    }
    default: {
      Place p = k.place(w, h, n);
      k.api.Raster_RectROPfill(p.data(), static_cast<int32>(p.pitch), n, pixel, k.c.below(17), p.x,
                               p.y, w, h);
      k.give(p);
    }
  }
}

/// Copies between buffers.
void copyCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  // Rows that run up step by a pitch that is rounded away from the buffer.
  Place d = k.place(w, h, n, false);
  Place s = k.place(w, h, n, false);
  *k.api.mmxSwitch = k.c.below(2);
  if (k.c.chance(2)) {
    k.api.Raster_RectCopy(d.data(), d.pitch, s.data(), s.pitch, n, s.x, s.y, d.x, d.y, w, h);
  } else {
    k.api.Raster_RectROPcopy(d.data(), static_cast<int32>(d.pitch), s.data(),
                             static_cast<int32>(s.pitch), n, s.x, s.y, k.c.below(17), d.x, d.y, w,
                             h);
  }
  *k.api.mmxSwitch = 0;
  k.give(d);
  k.give(s);
}

/// Copies within one frame buffer.
void moveCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const uint32 sx = k.c.below(5);
  const uint32 sy = k.c.below(5);
  Place p = k.place(w + 4, h + 4, n, false);
  const uint32 dx = k.c.below(5);
  const uint32 dy = k.c.below(5);
  if (k.c.chance(2)) {
    k.api.Raster_RectCopy(p.data(), p.pitch, p.data(), p.pitch, n, sx, sy, dx, dy, w, h);
  } else {
    k.api.Raster_RectROPcopy(p.data(), static_cast<int32>(p.pitch), p.data(),
                             static_cast<int32>(p.pitch), n, sx, sy, k.c.below(16), dx, dy, w, h);
  }
  k.give(p);
}

void tileCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const uint32 tw = 1 + k.c.below(40);
  const uint32 th = 1 + k.c.below(10);
  const auto signedSize = static_cast<int32>(n);
  const uint32 rop = k.c.below(17);
  Place d = k.place(w, h, n);
  if (k.c.chance(3)) {
    Place s = k.place(w, h, n);
    const auto worker =
        std::array{k.api.RasterRectPixmapROPcopy8, k.api.RasterRectPixmapROPcopy16,
                   k.api.RasterRectPixmapROPcopy24, k.api.RasterRectPixmapROPcopy32}[n - 1];
    worker(d.data(), d.pitch, s.data(), s.pitch, s.x, s.y, rop, d.x, d.y, w, h);
    return k.give(d);
  }
  const uint32 pitch = tw * n + k.c.below(5);
  const Bytes tile = k.c.fill(size_t{th - 1} * pitch + tw * n);
  const uint32 tx = k.c.word();
  const uint32 ty = k.c.word();
  if (k.c.chance(2)) {
    k.api.Raster_RectPixmapCopy(d.data(), d.pitch, tile.data(), pitch, signedSize, tx, ty, tw, th,
                                d.x, d.y, w, h);
  } else {
    k.api.Raster_RectPixmapROPcopy(d.data(), d.pitch, tile.data(), pitch, signedSize, tx, ty, tw,
                                   th, rop, d.x, d.y, w, h);
  }
  k.give(d);
}

void bitsCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const uint32 pitch = (w + 7) / 8 + k.c.below(3);
  const Bytes bits = k.c.fill(h == 0 || w == 0 ? 0 : size_t{h - 1} * pitch + (w + 7) / 8);
  Place d = k.place(w, h, n);
  uint8* at = d.bytes.empty() ? nullptr : d.data() + size_t{d.y} * d.pitch + size_t{d.x} * n;
  const uint32 set = k.c.word();
  const uint32 clear = k.c.word();
  const auto iw = static_cast<int32>(w);
  const auto ih = static_cast<int32>(h);
  const Api& a = k.api;
  switch (k.c.below(4)) {
    case 0:
      a.Raster_BitsToPixels(bits.data(), pitch, at, d.pitch, static_cast<int32>(n), iw, ih, set,
                            clear);
      break;
    case 1:
      a.Raster_BitsToPixelsStencil(bits.data(), pitch, at, d.pitch, static_cast<int32>(n), iw, ih,
                                   set);
      break;
    case 2:
      std::array{a.RasterBitsToPixels8, a.RasterBitsToPixels16, a.RasterBitsToPixels24,
                 a.RasterBitsToPixels32}[n - 1](bits.data(), pitch, at, d.pitch, iw, ih, set,
                                                clear);
      break;
    default:
      std::array{a.RasterBitsToPixelsStencil8, a.RasterBitsToPixelsStencil16,
                 a.RasterBitsToPixelsStencil24, a.RasterBitsToPixelsStencil32}[n - 1](
          bits.data(), pitch, at, d.pitch, iw, ih, set);
  }
  k.give(d);
}

// ---- Formats -----------------------------------------------------------------------------------

uint32 bytesOfCode(int32 code) {
  return code <= 8 ? 1 : code <= 16 ? 2 : static_cast<uint32>(code / 8);
}

void convertCase(Case& k) {
  const int32 to = k.c.oneOf({3, 6, 8, 15, 16, 24, 32});
  const bool pseudo = k.c.chance(4);
  const int32 from = pseudo ? k.c.between(1, 8) : k.c.oneOf({15, 16, 24, 32});
  const uint32 fromBytes = pseudo ? 1 : bytesOfCode(from);
  const uint32 w = k.side();
  const uint32 h = k.side();
  Place d = k.place(w, h, bytesOfCode(to), false);
  Place s = k.place(w, h, fromBytes, false);
  uint32 palette[256];
  for (uint32& entry : palette) entry = k.c.byte() * 0x01030507u;
  const Api& a = k.api;
  switch (k.c.below(4)) {
    case 0: {
      Place wide = k.place(w, h, 4, false);
      a.Raster_ConvertPixelsTo32(static_cast<uint32*>(static_cast<void*>(wide.data())), wide.pitch,
                                 s.data(), s.pitch, from, pseudo, palette, s.x, s.y, wide.x, wide.y,
                                 w, h);
      return k.give(wide);
    }
    case 1: {
      Place wide = k.place(w, h, 4, false);
      a.Raster_ConvertPixelsFrom32(d.data(), d.pitch, to,
                                   static_cast<uint32*>(static_cast<void*>(wide.data())),
                                   wide.pitch, wide.x, wide.y, d.x, d.y, w, h);
      return k.give(d);
    }
    case 2: {
      Place same = k.place(w, h, bytesOfCode(to));
      Place other = k.place(w, h, bytesOfCode(to));
      a.Raster_CopyPixels(same.data(), same.pitch, other.data(), other.pitch, to, other.x, other.y,
                          same.x, same.y, w, h);
      return k.give(same);
    }
    default:
      a.Raster_ConvertPixels(d.data(), d.pitch, to, s.data(), s.pitch, from, pseudo, palette, s.x,
                             s.y, d.x, d.y, w, h);
      k.give(d);
  }
}

void onePixelCase(Case& k) {
  const uint32 pixel = k.c.word();
  const bool pseudo = k.c.chance(4);
  const uint32 palette[] = {pixel, ~pixel, pixel * 3, pixel * 7};
  const int32 to = k.c.oneOf({3, 6, 8, 15, 16, 24, 32});
  k.give(k.api.Raster_ConvertOnePixel(
      pseudo ? pixel % 4 : pixel, pseudo ? 8 : k.c.oneOf({15, 16, 24, 32}), to, pseudo, palette));
  const uint32 depth = k.c.below(40);
  const uint32 bpp = k.c.below(40);
  k.give(k.api.Raster_IsModeReasonable(depth, bpp, pseudo));
  k.give(k.api.Raster_GetBPPDepth(depth, bpp));
}

// ---- Comparison, blending ----------------------------------------------------------------------

/// memcmp's sign is what the functions promise.
int32 signOf(int32 value) { return (value > 0) - (value < 0); }

void compareCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const auto bpp = static_cast<int32>(8 * n);
  Place a = k.place(w, h, n);
  Place b = a;
  if (!b.bytes.empty() && k.c.chance(2)) b.bytes[k.c.word() % b.bytes.size()] ^= k.c.byte();
  k.give(signOf(k.api.Raster_ComparePixels(a.data(), a.pitch, bpp, b.data(), b.pitch, bpp, a.x, a.y,
                                           b.x, b.y, w, h)));
  RectList list = {};
  list.rects[0] = {static_cast<int32>(a.x), static_cast<int32>(a.y), static_cast<int32>(w),
                   static_cast<int32>(h)};
  k.give(signOf(k.api.Raster_CompareRects(a.data(), a.pitch, bpp, b.data(), b.pitch, bpp, &list)));
  const Bytes first = k.c.fill(size_t{w} * n * h);
  Bytes second = first;
  for (uint32 i = k.c.below(5); i != 0 && !second.empty(); --i)
    second[k.c.word() % second.size()] ^= k.c.byte();
  const Bytes mask = k.c.fill(first.size());
  k.give(k.api.Raster_CompareMasked(first.data(), w * n, bpp, second.data(), w * n, bpp,
                                    mask.data(), w * n, bpp, 0, 0, w, h, k.c.between(-1, 3)));
}

void blendCase(Case& k) {
  const auto format =
      k.c.oneOf<PixelFormat>({{6, 8}, {8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}});
  const uint32 w = k.side();
  const uint32 h = k.side();
  Place d = k.place(w, h, format.bpp / 8);
  Place s = k.place(w, h, 4);
  const auto staged = static_cast<uint8>(k.c.below(2));
  if (k.c.chance(4)) {
    k.api.Raster_AlphaBlendOver(d.data(), d.x, d.y, d.pitch, s.data(), s.x, s.y, s.pitch, w, h,
                                format.depth, format.bpp, staged);
  } else {
    const uint32 how[] = {k.c.below(14), k.c.below(4), k.c.byte(), 1 + k.c.below(255)};
    k.api.Raster_AlphaBlend(d.data(), d.x, d.y, d.pitch, s.data(), s.x, s.y, s.pitch, w, h,
                            format.depth, format.bpp, how[0], how[1], how[2], how[3], staged);
  }
  k.give(d);
}

// ---- Scaling, cursors --------------------------------------------------------------------------

void scaleCase(Case& k) {
  const auto format = k.c.oneOf<PixelFormat>({{8, 8}, {16, 16}, {24, 24}, {24, 32}, {24, 32}});
  const auto target =
      format.bpp == 32 ? k.c.oneOf<PixelFormat>({{24, 32}, {24, 32}, {16, 16}, {24, 24}}) : format;
  const uint32 w = 1 + k.side();
  const uint32 h = 1 + k.side();
  const uint32 sw = 1 + k.side();
  const uint32 sh = 1 + k.side();
  const uint32 pitch = w * target.bpp / 8 + k.c.below(5);
  const uint32 srcPitch = sw * format.bpp / 8 + k.c.below(5);
  Bytes d = k.c.fill(size_t{h - 1} * pitch + w * target.bpp / 8);
  const Bytes s = k.c.fill(size_t{sh - 1} * srcPitch + sw * format.bpp / 8);
  const auto x = static_cast<int32>(k.c.below(w));
  const auto y = static_cast<int32>(k.c.below(h));
  const double factors[] = {k.c.factor(), k.c.factor()};
  const int32 smooth = k.c.between(0, 2);
  k.api.Raster_ScaleInit();
  k.give(k.api.Raster_Scale(
      d.data(), pitch, target.bpp, target.depth, w, h, 0, x, y, static_cast<int32>(w),
      static_cast<int32>(h), s.data(), static_cast<int32>(srcPitch), format.bpp,
      static_cast<int32>(format.depth), 0, sw, sh, 0, factors[0], factors[1], smooth));
  k.api.Raster_ScaleExit();
  k.give(d);
  Rect r = {x, y, x + 5, y + 7};
  k.give(k.api.Raster_ScaleSrcCoordinates(&r, w, h, factors[1], factors[0]));
  k.giveRect(r);
}

void setPlanes(RasterCursor& cursor, uint32 depth, uint32 bpp, uint8* andMask, uint8* xorMask) {
  cursor.depth = depth;
  cursor.bpp = bpp;
  cursor.andMask = andMask;
  cursor.xorMask = xorMask;
}

void cursorCase(Case& k) {
  const auto format =
      k.c.oneOf<PixelFormat>({{6, 8}, {8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}});
  const uint32 n = format.bpp / 8;
  const uint32 w = k.c.below(20);
  const uint32 h = k.c.below(20);
  const uint32 fw = 1 + k.c.below(30);
  const uint32 fh = 1 + k.c.below(30);
  RasterCursor cursor = {};
  cursor.type = k.c.below(2);
  cursor.hotX = k.c.between(-3, 9);
  cursor.hotY = k.c.between(-3, 9);
  cursor.width = w;
  cursor.height = h;
  Bytes first = k.c.fill(size_t{w} * h * 4);
  Bytes second = k.c.fill(size_t{w} * h * 4);
  cursor.pixels = first.data();
  if (cursor.type == RASTER_CURSOR_MASK)
    setPlanes(cursor, format.depth, format.bpp, first.data(), second.data());
  const RasterFrameBufferDesc fb = {fw, fh, format.depth, format.bpp, (fw * n + 3) / 4 * 4};
  Bytes screen = k.c.fill(size_t{fb.pitch} * fh);
  Bytes save = k.c.fill(size_t{fb.pitch} * fh);
  RasterCursorBox box = {};
  const Point at = {k.c.between(-20, 40), k.c.between(-20, 40)};
  const bool visible = k.api.Raster_ComputeCursorBox(&fb, &cursor, at.x, at.y, &box);
  k.give(visible);
  k.sink.add(&box, sizeof box);
  if (visible) {
    k.api.Raster_DrawCursor(screen.data(), &fb, k.c.chance(2) ? save.data() : nullptr, fb.pitch,
                            &cursor, &box);
  }
  k.give(screen);
  k.give(save);
}

void planesCase(Case& k) {
  const uint32 w = k.c.below(40);
  const uint32 h = k.c.below(20);
  const uint32 bpp = 8 * k.pixelBytes();
  const uint32 size = k.api.Raster_CalculateCursorSize(w, h, bpp);
  k.give(size);
  const uint32 any[] = {k.c.word(), k.c.word(), k.c.word()};
  k.give(k.api.Raster_CalculateCursorSize(any[0], any[1], any[2]));
  const uint32 andDepth = k.c.oneOf({1u, bpp});
  const uint32 xorDepth = k.c.oneOf({1u, bpp});
  const Bytes andBits = k.c.fill(k.api.Raster_CalculateCursorSize(w, h, andDepth));
  const Bytes xorBits = k.c.fill(k.api.Raster_CalculateCursorSize(w, h, xorDepth));
  Bytes both = k.c.fill(size_t{2} * size);
  k.api.Raster_ExpandPlanarCursorData(w, h, andDepth, andBits.data(), xorDepth, xorBits.data(), bpp,
                                      both.data(), 2 * size);
  k.give(both);
  const Bytes bits = k.c.fill(k.api.Raster_CalculateCursorSize(w, h, 1));
  Bytes one = k.c.fill(size);
  k.api.Raster_ExpandCursorBitPlane(w, h, bpp, bits.data(), one.data(), size);
  k.give(one);
}

void scaledCursorCase(Case& k) {
  RasterCursor cursor = {};
  cursor.type = k.c.below(2);
  cursor.width = 1 + k.c.below(16);
  cursor.height = 1 + k.c.below(16);
  Bytes first = k.c.fill(size_t{cursor.width} * cursor.height * 4);
  Bytes second = k.c.fill(first.size());
  cursor.pixels = first.data();
  if (cursor.type == RASTER_CURSOR_MASK) setPlanes(cursor, 24, 32, first.data(), second.data());
  const double x = k.c.between(3000, 40000) / 10000.0;
  const double y = k.c.between(3000, 40000) / 10000.0;
  const Point spot = {k.c.between(-5, 20), k.c.between(-5, 20)};
  uint32 size[4];
  int32 hot[2];
  const uint32 bytes =
      k.api.Raster_GetScaledCursorSize(&size[0], &size[1], &size[2], &size[3], hot, cursor.width,
                                       cursor.height, x, y, spot.x, spot.y);
  k.sink.add(size, sizeof size);
  k.sink.add(hot, sizeof hot);
  Bytes a(bytes);
  Bytes b(bytes);
  if (cursor.type == RASTER_CURSOR_MASK) {
    k.api.Raster_ScaleColorCursor(a.data(), b.data(), &cursor, x, y, size[0], size[1], size[2],
                                  size[3]);
  } else {
    k.api.Raster_ScaleAlphaCursor(a.data(), &cursor, x, y, size[0], size[1], size[2], size[3]);
  }
  k.give(a);
  k.give(b);
}

// ---- Video, blocks, lists, rectangles ----------------------------------------------------------

void videoCase(Case& k) {
  const uint32 w = k.c.below(60);
  const uint32 h = k.c.below(30);
  const auto format = k.c.oneOf<uint32>({RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY, RASTER_VIDEO_YV12});
  const int32 code = k.c.oneOf({15, 16, 24, 32});
  const size_t chroma = size_t{(w + 1) / 2} * ((h + 1) / 2);
  const size_t frame = format == RASTER_VIDEO_YV12 ? 6 * chroma : size_t{w} * h / 2 * 4;
  const Bytes s = k.c.fill(frame);
  Bytes d = k.c.fill(size_t{w} * h * bytesOfCode(code));
  k.api.Raster_YUVtoRGB(s.data(), d.data(), w, h, format, code);
  k.give(d);
  const uint8 yuv[] = {k.c.byte(), k.c.byte(), k.c.byte()};
  k.give(k.api.RasterRGB_YUVtoBGRX(yuv[0], yuv[1], yuv[2]));
  RasterRGBParam param = {};
  const uint32 mask = k.c.oneOf({0xF800u, 0x7E0u, 0x1Fu, 0xFF0000u, 0xFFFFFFFFu, 0x10u});
  k.give(k.api.RasterRGB_MakeRGBParam(&param, 1 + k.c.below(16), mask));
  k.sink.add(&param, sizeof param);
}

void blockCase(Case& k) {
  const uint32 n = k.pixelBytes();
  const uint32 w = k.side();
  const uint32 h = k.side();
  const uint32 pitch = w * n + (n == 4 ? 0 : k.c.below(4));
  const Bytes s = k.c.fill(size_t{pitch} * h);
  uint8* block = nullptr;
  uint32 size = 0;
  k.api.Raster_Compress(s.data(), pitch, 8 * n, w, h, &block, &size);
  k.sink.add(block, size);
  uint32 words[5];
  memcpy(words, block, sizeof words);
  if (words[4] != 0) {
    uint8* pixels = nullptr;
    uint32 fields[4];
    k.api.Raster_Decompress(block, &pixels, &fields[0], &fields[1], &fields[2], &fields[3]);
    k.sink.add(fields, sizeof fields);
    k.sink.add(pixels, size_t{pitch} * h);
    free(pixels);
  }
  free(block);
}

void listCase(Case& k) {
  RectList list;
  k.api.Raster_ClearRectList(&list);
  const auto some = [&] { return k.c.between(0, 30); };
  for (uint32 step = k.c.below(30); step != 0; --step) {
    // More than fifteen rectangles cannot come of a hole in two.
    const bool cuts = list.rects[2].width <= 0 && k.c.chance(3);
    const auto change = cuts ? k.api.Raster_SubRect : k.api.Raster_AddRect;
    const int32 x = some();
    const int32 y = some();
    const int32 w = some();
    k.give(change(&list, x, y, w, some()));
    k.sink.add(&list, sizeof list);
  }
}

int32 coordinate(Case& k) {
  switch (k.c.below(4)) {
    case 0:
      return static_cast<int32>(k.c.word());
    case 1:
      return k.c.oneOf({INT32_MAX, INT32_MIN, INT32_MAX - 1, INT32_MIN + 1, 0, -1});
    default:
      return k.c.between(-50, 50);
  }
}

Rect rect(Case& k) {
  Rect r = {};
  r.left = coordinate(k);
  r.top = coordinate(k);
  r.right = coordinate(k);
  r.bottom = coordinate(k);
  return r;
}

void rectCase(Case& k) {
  const Api& a = k.api;
  const Rect p = rect(k);
  const Rect q = rect(k);
  const Rect t = rect(k);
  Point point = {};
  point.x = coordinate(k);
  point.y = coordinate(k);
  const Point other = {p.left, q.top};
  Rect out = {};
  Rect out2 = {};
  Point moved = {};
  const int32 width = coordinate(k);
  k.give(a.Rect_SetFromXYWH(&out, point.x, point.y, width, coordinate(k)));
  k.giveRect(out);
  k.give(a.Rect_IsEqual(&p, &q));
  k.give(a.Rect_IsSizeEqual(&p, &q));
  k.give(a.Rect_Translate(&out, &p, &point));
  k.giveRect(out);
  k.give(a.Rect_TranslateInv(&out, &p, &point));
  k.giveRect(out);
  k.give(a.Rect_Intersect(&out, &p, &q));
  k.giveRect(out);
  out = p;
  a.Rect_Union(&out, &q);
  k.giveRect(out);
  k.give(a.Rect_ContainsRect(&p, &q));
  k.give(a.Rect_ContainsPoint(&p, &point));
  k.give(a.Rect_ApplyDiff(&out, &p, &q, &t));
  k.giveRect(out);
  k.give(a.Rect_ApplyDiffToPoint(&moved, &point, &other, &point));
  k.sink.add(&moved, sizeof moved);
  if (q.left < q.right && q.top < q.bottom) {
    k.give(a.Rect_ApplyDiffEx(&out, &p, &q, &t));
    k.giveRect(out);
  }
  k.give(a.Rect_IntersectPair(&out, &p, &q, &out2, &t));
  k.giveRect(out);
  k.giveRect(out2);
  a.Rect_ScalePoint(&p, &q, &point, &moved);
  k.sink.add(&moved, sizeof moved);
  k.give(a.Rect_PointDistance(&p, &point));
  a.Rect_Test();
}

// ---- Images ------------------------------------------------------------------------------------

/// An image and the bytes that it lies in.
struct OwnImage {
  ImageUtilImage image;
  Bytes bytes;
};

OwnImage image(Case& k, PixelFormat format) {
  OwnImage own = {};
  own.image.width = 1 + k.c.below(40);
  own.image.height = 1 + k.c.below(20);
  own.image.depth = format.depth;
  own.image.bpp = format.bpp;
  own.image.bytesPerLine = (own.image.width * format.bpp / 8 + 3) / 4 * 4;
  own.image.flags = k.c.below(2);
  own.image.numColors = format.bpp == 8 ? 256 : 0;
  for (uint32 i = 0; i < own.image.numColors; ++i)
    own.image.palette[i] = {static_cast<uint8>(i), static_cast<uint8>(3 * i),
                            static_cast<uint8>(7 * i), 0};
  own.bytes = k.c.fill(size_t{own.image.bytesPerLine} * own.image.height);
  own.image.data = own.bytes.data();
  return own;
}

void giveImage(Case& k, const ImageUtilImage& made) {
  for (const uint32 field :
       {made.width, made.height, made.depth, made.bpp, made.bytesPerLine, made.numColors})
    k.give(field);
  k.sink.add(made.palette, sizeof made.palette);
  k.sink.add(made.data, size_t{made.bytesPerLine} * made.height);
}

PixelFormat imageFormat(Case& k) {
  return k.c.oneOf<PixelFormat>({{8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}});
}

void* hostAlloc(void* /*context*/, size_t size) { return malloc(size); }
void hostFree(void* /*context*/, void* block) { free(block); }
void* hostRealloc(void* /*context*/, void* block, size_t size) { return realloc(block, size); }

/// PNG there and back: what a stream holds, not how a version of zlib has packed it.
void pngCase(Case& k) {
  const OwnImage own = image(k, imageFormat(k));
  const ImageUtilPNGWriteParams params = {k.c.between(0, 9), k.c.chance(2)};
  DynBuf buffer = {};
  if (k.c.chance(2)) {
    k.give(k.api.ImageUtil_ConstructPNGBuffer(&own.image, &params, &buffer));
  } else {
    const ImageUtilMemOps memory = {nullptr, hostAlloc, hostFree, hostRealloc};
    uint32 size = 0;
    k.give(k.api.ImageUtil_ConstructPNGBufferWithMemOps(&own.image, &params, &buffer.data, &size,
                                                        &memory));
    buffer.size = size;
  }
  ImageUtilImage back;
  k.give(k.api.ImageUtil_ReadPNGBuffer(&back, buffer.data, static_cast<uint32>(buffer.size),
                                       static_cast<uint8>(k.c.below(2))));
  giveImage(k, back);
  k.api.ImageUtil_FreeImageData(&back);
  free(buffer.data);
}

void bitmapCase(Case& k) {
  const OwnImage own = image(k, imageFormat(k));
  DynBuf buffer = {};
  k.give(k.api.ImageUtil_ConstructBMPBuffer(&own.image, &buffer));
  k.sink.add(buffer.data, buffer.size);
  free(buffer.data);
}

void combineCase(Case& k) {
  const auto format = k.c.oneOf<PixelFormat>({{15, 16}, {16, 16}, {24, 24}, {24, 32}});
  const uint32 count = k.c.below(4);
  std::vector<OwnImage> own;
  for (uint32 i = 0; i < count; ++i) own.push_back(image(k, format));
  std::vector<ImageUtilImage> images;
  std::vector<int32> positions;
  for (OwnImage& one : own) {
    one.image.data = one.bytes.data();
    images.push_back(one.image);
    positions.push_back(k.c.between(-30, 30));
    positions.push_back(k.c.between(-30, 30));
  }
  ImageUtilImage made;
  k.give(k.api.ImageUtil_Combine(images.data(), positions.data(), count, &made));
  giveImage(k, made);
  free(made.data);
}

void cropCase(Case& k) {
  const auto format = k.c.oneOf<PixelFormat>({{8, 8}, {16, 16}, {24, 24}, {24, 32}});
  const OwnImage own = image(k, format);
  ImageUtilImage made = {};
  const int32 left = k.c.between(-1, 10);
  const int32 top = k.c.between(-1, 10);
  const int32 right = k.c.between(-1, 41);
  const int32 bottom = k.c.between(-1, 21);
  const int32 width = k.c.chance(2) ? -1 : k.c.between(0, 60);
  const int32 height = k.c.chance(2) ? -1 : k.c.between(0, 60);
  const bool cut = k.api.ImageUtil_CropAndScaleImage(&own.image, left, top, right, bottom, 0, 0,
                                                     width, height, &made);
  k.give(cut);
  if (cut) giveImage(k, made);
  free(made.data);
}

constexpr void (*kCases[])(Case&) = {
    fillCase,    copyCase,  moveCase,  tileCase,   bitsCase,   convertCase,      onePixelCase,
    compareCase, blendCase, scaleCase, cursorCase, planesCase, scaledCursorCase, videoCase,
    blockCase,   listCase,  rectCase,  pngCase,    bitmapCase, combineCase,      cropCase};

}  // namespace

void runApiCase(const Api& api, Choices& choices, Sink& sink) {
  Case k = {api, choices, sink};
  kCases[choices.below(sizeof kCases / sizeof *kCases)](k);
}

}  // namespace tests
