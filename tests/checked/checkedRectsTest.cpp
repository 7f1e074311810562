// SPDX-License-Identifier: MIT
//
// Drawing and comparing: the same pixels as the exact functions on the rectangle that is left after
// a clip pixel by pixel, and nothing at all for a call that is refused.

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>

#include "checked/checkedScenes.h"
#include "rasterChecked.h"
#include "support/recordedMessages.h"

namespace {

using tests::Bytes;
using tests::GuardedView;
using tests::naiveArea;
using tests::NaiveArea;
using tests::PixelFormat;
using tests::Random;
using tests::Scene;
using tests::someSize;

/// Runs the checked call and the exact one on the same memory. `exact` draws what the naive clip
/// has left. The source must stay as it is.
void compareCalls(Scene& scene, const NaiveArea& area, RasterStatus expected,
                  const std::function<RasterStatus()>& checked,
                  const std::function<void(const NaiveArea&)>& exact) {
  const Bytes before = scene.dst.bytes();
  const Bytes source = scene.src.bytes();
  const RasterStatus status = checked();
  ASSERT_EQ(status, expected) << tests::describe(scene.dst.view()) << " " << scene.rect << " from "
                              << tests::describe(scene.src.view()) << " at " << scene.srcX << ","
                              << scene.srcY;
  const Bytes after = scene.dst.bytes();
  scene.dst.assign(before);
  if (status == RASTER_STATUS_OK && !area.drawsNothing()) exact(area);
  ASSERT_EQ(after, scene.dst.bytes());
  ASSERT_EQ(source, scene.src.bytes());
}

constexpr int kRounds = 3000;

/// The format of a scene's source: any, or mostly the one that a call takes.
enum class Source { kAny, kLikeDestination, kBits, kWithAlpha };

PixelFormat sourceFormat(Random& random, Source source, PixelFormat destination) {
  if (source == Source::kAny || random.below(6) == 0) return tests::someFormat(random);
  if (source == Source::kLikeDestination) return destination;
  return source == Source::kBits ? PixelFormat{1, 1} : PixelFormat{24, 32};
}

/// Runs a test on random scenes, up to the first one in which it fails.
void forScenes(uint32 seed, int rounds, Source source,
               const std::function<void(Scene&, Random&)>& test) {
  Random random(seed);
  for (int round = 0; round < tests::rounds(rounds); ++round) {
    SCOPED_TRACE("round " + std::to_string(round));
    const PixelFormat format = tests::someFormat(random);
    Scene scene(random, format, sourceFormat(random, source, format));
    test(scene, random);
    if (testing::Test::HasFatalFailure()) return;
  }
}

TEST(RasterChecked_Fill, EqualsTheExactFill) {
  forScenes(11, kRounds, Source::kAny, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const NaiveArea area = naiveArea(s.rect, d);
    const uint32 pixel = random.word();
    compareCalls(
        s, area, statusFor(area, s.flags),
        [&] { return RasterChecked_Fill(&s.dst, &s.rect, pixel, s.flags); },
        [&](const NaiveArea& a) {
          Raster_RectFill(d.data, d.pitch, d.bpp / 8, pixel, a.x.to, a.y.to, a.x.size, a.y.size);
        });
  });
}

TEST(RasterChecked_FillAlpha, EqualsTheExactFill) {
  forScenes(12, kRounds, Source::kAny, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const NaiveArea area = naiveArea(s.rect, d);
    const auto alpha = static_cast<uint8>(random.below(256));
    const RasterStatus byRect = statusFor(area, s.flags);
    const bool refused = byRect == RASTER_STATUS_OK && d.bpp != 32;
    compareCalls(
        s, area, refused ? RASTER_STATUS_BAD_FORMAT : byRect,
        [&] { return RasterChecked_FillAlpha(&s.dst, &s.rect, alpha, s.flags); },
        [&](const NaiveArea& a) {
          Raster_RectFillAlpha(d.data, d.pitch, alpha, a.x.to, a.y.to, a.x.size, a.y.size);
        });
  });
}

TEST(RasterChecked_RopFill, EqualsTheExactFill) {
  forScenes(13, kRounds, Source::kAny, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const NaiveArea area = naiveArea(s.rect, d);
    const uint32 pixel = random.word();
    const uint32 rop = random.below(17);
    compareCalls(
        s, area, rop > 15 ? RASTER_STATUS_BAD_ARGUMENT : statusFor(area, s.flags),
        [&] { return RasterChecked_RopFill(&s.dst, &s.rect, pixel, rop, s.flags); },
        [&](const NaiveArea& a) {
          Raster_RectROPfill(d.data, static_cast<int32>(d.pitch), d.bpp / 8, pixel, rop, a.x.to,
                             a.y.to, a.x.size, a.y.size);
        });
  });
}

/// BAD_FORMAT for a pair of sizes that do not go together, unless the rectangle is refused.
RasterStatus statusForPair(const NaiveArea& area, uint32 flags, bool fits) {
  const RasterStatus byRect = statusFor(area, flags);
  return byRect == RASTER_STATUS_OK && !fits ? RASTER_STATUS_BAD_FORMAT : byRect;
}

TEST(RasterChecked_Copy, EqualsTheExactCopy) {
  forScenes(14, kRounds, Source::kLikeDestination, [](Scene& s, Random& /*random*/) {
    const RasterView& d = s.dst.view();
    const RasterView& from = s.src.view();
    const NaiveArea area = s.area();
    compareCalls(
        s, area, statusForPair(area, s.flags, d.bpp == from.bpp),
        [&] { return RasterChecked_Copy(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, s.flags); },
        [&](const NaiveArea& a) {
          Raster_RectCopy(d.data, d.pitch, from.data, from.pitch, d.bpp / 8, a.x.from, a.y.from,
                          a.x.to, a.y.to, a.x.size, a.y.size);
        });
  });
}

TEST(RasterChecked_RopCopy, EqualsTheExactCopy) {
  forScenes(15, kRounds, Source::kLikeDestination, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const RasterView& from = s.src.view();
    const NaiveArea area = s.area();
    const uint32 rop = random.below(17);
    compareCalls(
        s, area,
        rop > 15 ? RASTER_STATUS_BAD_ARGUMENT : statusForPair(area, s.flags, d.bpp == from.bpp),
        [&] {
          return RasterChecked_RopCopy(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, rop, s.flags);
        },
        [&](const NaiveArea& a) {
          Raster_RectROPcopy(d.data, static_cast<int32>(d.pitch), from.data,
                             static_cast<int32>(from.pitch), d.bpp / 8, a.x.from, a.y.from, rop,
                             a.x.to, a.y.to, a.x.size, a.y.size);
        });
  });
}

TEST(RasterChecked_RopCopy, MovesWithinOneView) {
  Random random(16);
  for (int round = 0; round < kRounds; ++round) {
    GuardedView fb(random, tests::someFormat(random), someSize(random), someSize(random));
    const RasterView& v = fb.view();
    const Rect rect = tests::someRectFor(random, v);
    const int32 srcX = random.between(-2, 20);
    const int32 srcY = random.between(-2, 20);
    const uint32 rop = random.below(16);
    const NaiveArea a = naiveArea(rect, v, srcX, srcY, v.width, v.height);
    const Bytes before = fb.bytes();
    ASSERT_EQ(RasterChecked_RopCopy(&fb, &rect, &fb, srcX, srcY, rop, RASTER_CHECKED_CLIP),
              RASTER_STATUS_OK);
    const Bytes after = fb.bytes();
    fb.assign(before);
    if (!a.drawsNothing()) {
      Raster_RectROPcopy(v.data, static_cast<int32>(v.pitch), v.data, static_cast<int32>(v.pitch),
                         v.bpp / 8, a.x.from, a.y.from, rop, a.x.to, a.y.to, a.x.size, a.y.size);
    }
    ASSERT_EQ(after, fb.bytes()) << "round " << round;
  }
}

TEST(RasterChecked_Copy, RefusesOtherViewsOfTheSameMemory) {
  Random random(17);
  const GuardedView fb(random, {8, 8}, 20, 20, false);
  RasterView shifted = fb.view();
  shifted.data += 20;
  shifted.bytes -= 20;
  shifted.height = 19;
  const Bytes before = fb.bytes();
  const Rect top = {0, 0, 20, 5};
  EXPECT_EQ(RasterChecked_Copy(&fb, &top, &shifted, 0, 0, 0), RASTER_STATUS_OVERLAP);
  EXPECT_EQ(RasterChecked_RopCopy(&fb, &top, &shifted, 0, 0, 6, 0), RASTER_STATUS_OVERLAP);
  EXPECT_EQ(fb.bytes(), before);
  // Rows 0 to 4 and rows 5 to 9 of the frame buffer do not meet.
  EXPECT_EQ(RasterChecked_Copy(&fb, &top, &shifted, 0, 4, 0), RASTER_STATUS_OK);
}

TEST(RasterChecked_Tile, EqualsTheExactTiling) {
  forScenes(18, kRounds, Source::kLikeDestination, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const RasterView& tile = s.src.view();
    const NaiveArea area = naiveArea(s.rect, d);
    const uint32 rop = random.below(16);
    RasterStatus expected = statusForPair(area, s.flags, d.bpp == tile.bpp);
    if (expected == RASTER_STATUS_OK && (tile.width == 0 || tile.height == 0))
      expected = RASTER_STATUS_BAD_ARGUMENT;
    compareCalls(
        s, area, expected,
        [&] { return RasterChecked_Tile(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, rop, s.flags); },
        [&](const NaiveArea& a) {
          // The phase at the clipped corner, by steps of whole pixmaps.
          int64 x = int64{s.srcX} + a.x.from;
          int64 y = int64{s.srcY} + a.y.from;
          x -= static_cast<int64>(std::floor(static_cast<double>(x) / tile.width)) * tile.width;
          y -= static_cast<int64>(std::floor(static_cast<double>(y) / tile.height)) * tile.height;
          Raster_RectPixmapROPcopy(d.data, d.pitch, tile.data, tile.pitch,
                                   static_cast<int32>(d.bpp / 8), static_cast<uint32>(x),
                                   static_cast<uint32>(y), tile.width, tile.height, rop, a.x.to,
                                   a.y.to, a.x.size, a.y.size);
        });
  });
}

/// Bit (x, y) of a plane, looked up by itself.
bool bitOf(const RasterView& plane, uint32 x, uint32 y) {
  return (plane.data[size_t{y} * plane.pitch + x / 8] >> (7 - x % 8) & 1) != 0;
}

void drawBits(const RasterView& d, const RasterView& plane, const NaiveArea& a, bool stencil,
              uint32 foreground, uint32 background) {
  for (uint32 j = 0; j < a.y.size; ++j) {
    for (uint32 i = 0; i < a.x.size; ++i) {
      const bool set = bitOf(plane, a.x.from + i, a.y.from + j);
      if (stencil && !set) continue;
      Raster_RectFill(d.data, d.pitch, d.bpp / 8, set ? foreground : background, a.x.to + i,
                      a.y.to + j, 1, 1);
    }
  }
}

TEST(RasterChecked_Bits, EqualsABitByBitExpansion) {
  forScenes(19, 2 * kRounds, Source::kBits, [](Scene& s, Random& random) {
    const RasterView& plane = s.src.view();
    const NaiveArea area = s.area();
    const bool stencil = random.below(2) == 0;
    const uint32 foreground = random.word();
    const uint32 background = random.word();
    compareCalls(
        s, area, statusForPair(area, s.flags, plane.bpp == 1),
        [&] {
          return stencil ? RasterChecked_BitsStencil(&s.dst, &s.rect, &s.src, s.srcX, s.srcY,
                                                     foreground, s.flags)
                         : RasterChecked_Bits(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, foreground,
                                              background, s.flags);
        },
        [&](const NaiveArea& a) {
          drawBits(s.dst.view(), plane, a, stencil, foreground, background);
        });
  });
}

TEST(RasterChecked_Bits, TakesLongRowsFromAnyBit) {
  Random random(20);
  for (const int32 first : {0, 1, 7, 8, 13}) {
    GuardedView dst(random, {8, 8}, 9000, 2);
    const GuardedView plane(random, {1, 1}, 9013, 2);
    ASSERT_EQ(RasterChecked_Bits(&dst, nullptr, &plane, first, 0, 1, 2, 0), RASTER_STATUS_OK);
    for (uint32 x = 0; x < 9000; ++x) {
      ASSERT_EQ(dst.view().data[x], bitOf(plane.view(), x + static_cast<uint32>(first), 0) ? 1 : 2)
          << x << " from " << first;
    }
  }
}

/// A format code as the exact converter takes it.
int32 codeOf(const RasterView& v) { return static_cast<int32>(Raster_GetBPPDepth(v.depth, v.bpp)); }

TEST(RasterChecked_Convert, EqualsTheExactConversion) {
  forScenes(21, 2 * kRounds, Source::kAny, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const RasterView& from = s.src.view();
    const NaiveArea area = s.area();
    const bool pseudo = random.below(2) == 0;
    const uint32 colors = random.oneOf({0u, 1u, 100u, 255u, 256u, 1000u});
    std::vector<uint32> palette(colors);
    for (uint32& entry : palette) entry = random.word();
    std::vector<uint32> whole(256);
    std::copy_n(palette.begin(), std::min<size_t>(colors, 256), whole.begin());
    palette.reserve(1);  // so that there is a pointer
    const bool same = d.depth == from.depth && d.bpp == from.bpp;
    const bool fits = pseudo ? from.bpp == 8 : from.bpp > 8 || same;
    compareCalls(
        s, area, statusForPair(area, s.flags, fits),
        [&] {
          return RasterChecked_Convert(&s.dst, &s.rect, &s.src, s.srcX, s.srcY,
                                       pseudo ? palette.data() : nullptr, colors, s.flags);
        },
        [&](const NaiveArea& a) {
          Raster_ConvertPixels(d.data, d.pitch, codeOf(d), from.data, from.pitch, codeOf(from),
                               pseudo, whole.data(), a.x.from, a.y.from, a.x.to, a.y.to, a.x.size,
                               a.y.size);
        });
  });
}

TEST(RasterChecked_Blend, EqualsTheExactBlend) {
  forScenes(22, 2 * kRounds, Source::kWithAlpha, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const RasterView& from = s.src.view();
    const NaiveArea area = s.area();
    const RasterBlend blend = {random.below(15), random.below(5), random.below(257),
                               random.below(3) == 0 ? 0 : random.below(257), random.below(3)};
    const bool valid = blend.op < 14 && blend.flags < 4 && blend.srcAlpha < 256 &&
                       blend.dstAlpha < 256 && blend.staged < 2 &&
                       !(blend.op == 13 && (blend.flags & 2) != 0 && blend.dstAlpha == 0);
    compareCalls(
        s, area,
        !valid ? RASTER_STATUS_BAD_ARGUMENT
               : statusForPair(area, s.flags, from.bpp == 32 && d.depth != 3),
        [&] {
          return RasterChecked_Blend(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, &blend, s.flags);
        },
        [&](const NaiveArea& a) {
          Raster_AlphaBlend(d.data, a.x.to, a.y.to, d.pitch, from.data, a.x.from, a.y.from,
                            from.pitch, a.x.size, a.y.size, d.depth, d.bpp, blend.op, blend.flags,
                            blend.srcAlpha, blend.dstAlpha, static_cast<uint8>(blend.staged));
        });
  });
}

TEST(RasterChecked_Blend, IsOverWithoutABlend) {
  Random random(23);
  GuardedView dst(random, {16, 16}, 20, 10);
  const GuardedView src(random, {24, 32}, 20, 10);
  const Bytes before = dst.bytes();
  const RasterView& d = dst.view();
  ASSERT_EQ(RasterChecked_Blend(&dst, nullptr, &src, 0, 0, nullptr, 0), RASTER_STATUS_OK);
  const Bytes after = dst.bytes();
  dst.assign(before);
  Raster_AlphaBlendOver(d.data, 0, 0, d.pitch, src.view().data, 0, 0, src.view().pitch, 20, 10, 16,
                        16, 0);
  EXPECT_EQ(after, dst.bytes());
}

// ---- Scaling -----------------------------------------------------------------------------------

double someFactor(Random& random) {
  switch (random.below(12)) {
    case 0:
      return random.oneOf({0.0, -1.0, 1.0 / 32767, std::numeric_limits<double>::infinity(),
                           -std::numeric_limits<double>::infinity(),
                           std::numeric_limits<double>::quiet_NaN()});
    case 1:
      return random.oneOf({1.0 / 32766, 1e9, 1e300, 70000.0, 32768.0});
    case 2:
      return random.oneOf({1.0, 2.0, 0.5, 0.25});
    default:
      return random.between(1, 4000) / 1000.0;
  }
}

bool isFactor(double f) { return std::isfinite(f) && f > 1.0 / 32767; }

TEST(RasterChecked_Scale, EqualsTheExactScaling) {
  forScenes(24, 2 * kRounds, Source::kLikeDestination, [](Scene& s, Random& random) {
    const RasterView& d = s.dst.view();
    const RasterView& from = s.src.view();
    const NaiveArea area = naiveArea(s.rect, d);
    const double x = someFactor(random);
    const double y = someFactor(random);
    const uint32 smooth = random.below(3);
    const bool same = d.depth == from.depth && d.bpp == from.bpp;
    const bool pair = same || (from.bpp == 32 && (d.bpp == 24 || (d.bpp == 16 && d.depth == 16)));
    const bool fits = pair && d.depth % 8 == 0;
    const bool numbers = isFactor(x) && isFactor(y) && smooth < 2;
    NaiveArea drawn = area;
    drawn.isEmptyRect |= from.width == 0 || from.height == 0;
    compareCalls(
        s, drawn, numbers ? statusForPair(area, s.flags, fits) : RASTER_STATUS_BAD_ARGUMENT,
        [&] { return RasterChecked_Scale(&s.dst, &s.rect, &s.src, x, y, smooth, s.flags); },
        [&](const NaiveArea& a) {
          EXPECT_TRUE(Raster_Scale(
              d.data, d.pitch, d.bpp, d.depth, d.width, d.height, 0, static_cast<int32>(a.x.to),
              static_cast<int32>(a.y.to), static_cast<int32>(a.x.to + a.x.size),
              static_cast<int32>(a.y.to + a.y.size), from.data, static_cast<int32>(from.pitch),
              from.bpp, static_cast<int32>(from.depth), 0, from.width, from.height, 0, x, y,
              static_cast<int32>(smooth)));
        });
  });
}

TEST(RasterChecked_Scale, RefusesSidesOf32768) {
  Random random(25);
  const GuardedView small(random, {8, 8}, 4, 4);
  const GuardedView large(random, {8, 8}, 32768, 1);
  const GuardedView fits(random, {8, 8}, 32767, 1);
  EXPECT_EQ(RasterChecked_Scale(&small, nullptr, &large, 1, 1, 0, 0), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_Scale(&large, nullptr, &small, 1, 1, 0, 0), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_Scale(&small, nullptr, &fits, 1, 1, 0, 0), RASTER_STATUS_OK);
  EXPECT_EQ(RasterChecked_Scale(&fits, nullptr, &small, 1, 1, 0, 0), RASTER_STATUS_OK);
}

// ---- Comparison --------------------------------------------------------------------------------

TEST(RasterChecked_Compare, EqualsTheExactComparison) {
  forScenes(26, kRounds, Source::kLikeDestination, [](Scene& s, Random& random) {
    const RasterView& a = s.dst.view();
    const RasterView& b = s.src.view();
    if (random.below(2) == 0) {  // equal but for a byte
      s.dst.assign(Bytes(s.dst.bytes().size(), 7));
      s.src.assign(Bytes(s.src.bytes().size(), 7));
      if (a.bytes != 0) a.data[random.below(static_cast<uint32>(a.bytes))] = 8;
    }
    const NaiveArea area = s.area();
    const RasterStatus byRect = statusFor(area, s.flags);
    int32 difference = 77;
    const RasterStatus status =
        RasterChecked_Compare(&s.dst, &s.rect, &s.src, s.srcX, s.srcY, s.flags, &difference);
    ASSERT_EQ(status, a.bpp != b.bpp ? RASTER_STATUS_BAD_FORMAT : byRect);
    int32 expected = status == RASTER_STATUS_OK ? 0 : 77;
    if (status == RASTER_STATUS_OK && !area.drawsNothing()) {
      expected = Raster_ComparePixels(a.data, a.pitch, static_cast<int32>(a.bpp), b.data, b.pitch,
                                      static_cast<int32>(b.bpp), area.x.to, area.y.to, area.x.from,
                                      area.y.from, area.x.size, area.y.size);
    }
    ASSERT_EQ(difference, expected);
  });
}

TEST(RasterChecked_CompareRects, LooksAtSixteenEntriesAtMost) {
  Random random(27);
  GuardedView a(random, {24, 24}, 40, 8);
  GuardedView b(random, {24, 24}, 40, 8);
  a.assign(Bytes(a.view().bytes, 5));
  b.assign(Bytes(b.view().bytes, 5));
  tests::GuardedBuffer memory(sizeof(RectList));
  auto* list = static_cast<RectList*>(static_cast<void*>(memory.data()));
  for (int32 i = 0; i < 16; ++i) list->rects[i] = {2 * i, 0, 1, 8};
  int32 difference = 77;
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_OK);
  EXPECT_EQ(difference, 0);
  a.view().data[3] = 9;  // column 1 is in no rectangle
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_OK);
  EXPECT_EQ(difference, 0);
  a.view().data[30 * 3] = 4;  // the last one
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_OK);
  EXPECT_LT(difference, 0);
  difference = 77;
  list->rects[15] = {39, 0, 2, 8};
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_OUTSIDE);
  EXPECT_EQ(difference, 77);
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, RASTER_CHECKED_CLIP, &difference),
            RASTER_STATUS_OK);
  EXPECT_EQ(difference, 0);
  list->rects[3] = {tests::kMax, 0, 1, 8};
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_BAD_ARGUMENT);
  list->rects[2].height = 0;
  EXPECT_EQ(RasterChecked_CompareRects(&a, &b, list, 0, &difference), RASTER_STATUS_OK);
}

TEST(RasterChecked_CompareRects, RefusesNullAndUnknownFlags) {
  Random random(30);
  const GuardedView a(random, {24, 24}, 8, 8);
  const GuardedView other(random, {16, 16}, 8, 8);
  const RectList list = {{{0, 0, 8, 8}}};
  int32 difference = 77;
  EXPECT_EQ(RasterChecked_CompareRects(&a, &a, &list, 0, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_CompareRects(&a, &a, nullptr, 0, &difference), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_CompareRects(nullptr, &a, &list, 0, &difference), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_CompareRects(&a, &a, &list, ~RASTER_CHECKED_CLIP, &difference),
            RASTER_STATUS_BAD_ARGUMENT);
  const RectList none = {};
  EXPECT_EQ(RasterChecked_CompareRects(&a, &a, &none, ~RASTER_CHECKED_CLIP, &difference),
            RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_CompareRects(&a, &other, &list, 0, &difference),
            RASTER_STATUS_BAD_FORMAT);
  EXPECT_EQ(difference, 77);
}

TEST(RasterChecked_CompareMasked, EqualsTheExactComparison) {
  Random random(28);
  for (int round = 0; round < kRounds; ++round) {
    const PixelFormat format = tests::someFormat(random);
    const uint32 width = random.below(20);
    const uint32 height = random.below(20);
    GuardedView a(random, format, width, height, false);
    GuardedView b(random, format, width, height, false);
    GuardedView mask(random, format, width, height, false);
    Bytes near = a.bytes();
    for (int i = 0; i < 5 && !near.empty(); ++i)
      near[random.below(static_cast<uint32>(near.size()))] ^= static_cast<uint8>(random.word());
    b.assign(near);
    const int32 maxDiffs = random.between(-1, 3);
    bool agree = false;
    const RasterStatus status = RasterChecked_CompareMasked(&a, &b, &mask, maxDiffs, &agree);
    if (maxDiffs < 0) {
      ASSERT_EQ(status, RASTER_STATUS_BAD_ARGUMENT);
      continue;
    }
    ASSERT_EQ(status, RASTER_STATUS_OK);
    const RasterView& v = a.view();
    const auto bpp = static_cast<int32>(v.bpp);
    ASSERT_EQ(agree,
              Raster_CompareMasked(v.data, v.pitch, bpp, b.view().data, v.pitch, bpp,
                                   mask.view().data, v.pitch, bpp, 0, 0, width, height, maxDiffs));
  }
}

TEST(RasterChecked_CompareMasked, RefusesWhatDoesNotMatch) {
  Random random(29);
  const GuardedView a(random, {24, 24}, 9, 7, false);
  const GuardedView other(random, {16, 16}, 9, 7, false);
  const GuardedView narrow(random, {24, 24}, 8, 7, false);
  const GuardedView low(random, {24, 24}, 9, 6, false);
  RasterView gaps = GuardedView(random, {24, 24}, 9, 7, false).view();
  gaps.pitch += 3;
  gaps.data = a.view().data;
  gaps.height = 6;
  bool agree = true;
  EXPECT_EQ(RasterChecked_CompareMasked(&a, &other, &a, 0, &agree), RASTER_STATUS_BAD_FORMAT);
  EXPECT_EQ(RasterChecked_CompareMasked(&a, &narrow, &a, 0, &agree), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_CompareMasked(&a, &a, &low, 0, &agree), RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_CompareMasked(&gaps, &gaps, &gaps, 0, &agree), RASTER_STATUS_BAD_VIEW);
  EXPECT_EQ(RasterChecked_CompareMasked(&a, &a, &a, 0, nullptr), RASTER_STATUS_NULL);
  EXPECT_TRUE(agree);
}

// ---- What holds for all ------------------------------------------------------------------------

TEST(Drawing, SaysNothingAndRefusesOverlap) {
  Random random(30);
  const GuardedView fb(random, {24, 32}, 30, 30, false);
  RasterView other = fb.view();
  other.pitch = 60 * 4;  // every second row
  other.height = 15;
  RasterView plane = fb.view();
  plane.depth = plane.bpp = 1;
  const Bytes before = fb.bytes();
  const tests::Messages said = tests::messagesOf([&] {
    EXPECT_EQ(RasterChecked_Copy(&fb, nullptr, &other, 0, 0, 1), RASTER_STATUS_OVERLAP);
    EXPECT_EQ(RasterChecked_Tile(&fb, nullptr, &other, 0, 0, 3, 0), RASTER_STATUS_OVERLAP);
    EXPECT_EQ(RasterChecked_Convert(&fb, nullptr, &fb, 0, 0, nullptr, 0, 0), RASTER_STATUS_OVERLAP);
    EXPECT_EQ(RasterChecked_Scale(&fb, nullptr, &other, 1, 1, 1, 0), RASTER_STATUS_OVERLAP);
    EXPECT_EQ(RasterChecked_Bits(&fb, nullptr, &plane, 0, 0, 1, 0, 0), RASTER_STATUS_OVERLAP);
  });
  EXPECT_EQ(said.log + said.warning + said.panic, "");
  EXPECT_EQ(fb.bytes(), before);
}

TEST(Drawing, RefusesNullAndBrokenViews) {
  Random random(31);
  const GuardedView good(random, {24, 32}, 10, 10);
  RasterView broken = good.view();
  --broken.bytes;
  int32 difference = 0;
  const Bytes before = good.bytes();
  const auto statusOf = [&](const RasterView* d, const RasterView* s, int which) {
    switch (which) {
      case 0:
        return RasterChecked_Copy(d, nullptr, s, 0, 0, 0);
      case 1:
        return RasterChecked_RopCopy(d, nullptr, s, 0, 0, 6, 0);
      case 2:
        return RasterChecked_Tile(d, nullptr, s, 0, 0, 6, 0);
      case 3:
        return RasterChecked_Convert(d, nullptr, s, 0, 0, nullptr, 0, 0);
      case 4:
        return RasterChecked_Blend(d, nullptr, s, 0, 0, nullptr, 0);
      case 5:
        return RasterChecked_Scale(d, nullptr, s, 1, 1, 0, 0);
      case 6:
        return RasterChecked_Bits(d, nullptr, s, 0, 0, 1, 0, 0);
      case 7:
        return RasterChecked_Compare(d, nullptr, s, 0, 0, 0, &difference);
      default:
        return RasterChecked_BitsStencil(d, nullptr, s, 0, 0, 1, 0);
    }
  };
  for (int which = 0; which < 9; ++which) {
    EXPECT_EQ(statusOf(nullptr, &good, which), RASTER_STATUS_NULL) << which;
    EXPECT_EQ(statusOf(&good, nullptr, which), RASTER_STATUS_NULL) << which;
    EXPECT_EQ(statusOf(&broken, &good, which), RASTER_STATUS_BAD_VIEW) << which;
    EXPECT_EQ(statusOf(&good, &broken, which), RASTER_STATUS_BAD_VIEW) << which;
  }
  EXPECT_EQ(RasterChecked_Compare(&good, nullptr, &good, 0, 0, 0, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(good.bytes(), before);
}

// ---- Parts of one frame buffer -----------------------------------------------------------------

/// A frame buffer whose lower half is another view.
struct Halves {
  static constexpr uint32 kSide = 16;

  explicit Halves(Random& random, PixelFormat format)
      : frame(random, format, kSide, 2 * kSide, false), whole(frame.view()), lower(whole) {
    lower.data += size_t{kSide} * whole.pitch;
    lower.bytes -= size_t{kSide} * whole.pitch;
    lower.height = kSide;
  }

  /// What a call says that draws from the lower half into the rows of the upper one, and one
  /// further down.
  template <class Call> void expectMayNotMeet(const Call& call) const {
    constexpr auto kEdge = static_cast<int32>(kSide);
    const Rect upper = {0, 0, kEdge, kEdge};
    const Rect further = {0, 1, kEdge, kEdge + 1};
    EXPECT_EQ(call(&whole, &upper, &lower), RASTER_STATUS_OK);
    EXPECT_EQ(call(&whole, &further, &lower), RASTER_STATUS_OVERLAP);
  }

  GuardedView frame;
  RasterView whole;
  RasterView lower;
};

TEST(PartsOfOneFrameBuffer, AreNoOverlapUnlessTheyMeet) {
  Random random(31);
  const Halves colors(random, {24, 32});
  const auto convert = [](const RasterView* dst, const Rect* rect, const RasterView* src) {
    return RasterChecked_Convert(dst, rect, src, 0, 0, nullptr, 0, 0);
  };
  const auto copy = [](const RasterView* dst, const Rect* rect, const RasterView* src) {
    return RasterChecked_Copy(dst, rect, src, 0, 0, 0);
  };
  const auto tile = [](const RasterView* dst, const Rect* rect, const RasterView* src) {
    return RasterChecked_Tile(dst, rect, src, 0, 0, RASTER_ROP_XOR, 0);
  };
  const auto scale = [](const RasterView* dst, const Rect* rect, const RasterView* src) {
    return RasterChecked_Scale(dst, rect, src, 1, 1, 1, 0);
  };
  colors.expectMayNotMeet(convert);
  colors.expectMayNotMeet(copy);
  colors.expectMayNotMeet(tile);
  colors.expectMayNotMeet(scale);

  Halves bytes(random, {8, 8});
  bytes.lower.depth = bytes.lower.bpp = 1;
  bytes.expectMayNotMeet([](const RasterView* dst, const Rect* rect, const RasterView* plane) {
    return RasterChecked_Bits(dst, rect, plane, 0, 0, 1, 2, 0);
  });
}

}  // namespace
