// SPDX-License-Identifier: MIT
//
// Cursors against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <functional>
#include <limits>
#include <string>

#include "raster.h"
#include "reference/rasterCursorReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;

constexpr char kSource[] = "lib/raster/rasterCursor";
constexpr uint32 kTooLarge = 0xFFFFFFFF;

/// Whether a call ends in the module's panic, without a warning before it.
void expectPanic(const std::function<void()>& call) {
  const Messages said = tests::messagesOf(call);
  EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", kSource)) << said.panic;
  EXPECT_EQ(said.warning, "");
}

void setPlanes(RasterCursor& cursor, uint32 depth, uint32 bpp, uint8* andMask, uint8* xorMask) {
  cursor.depth = depth;
  cursor.bpp = bpp;
  cursor.andMask = andMask;
  cursor.xorMask = xorMask;
}

/// The formats of frame buffers that take both kinds of cursor.
struct Format {
  uint32 depth, bpp;
  uint32 bytes() const { return bpp / 8; }
};
constexpr Format kFormats[] = {{8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}};

TEST(Raster_CalculateCursorSize, RoundsRowsUpTo32Bits) {
  EXPECT_EQ(Raster_CalculateCursorSize(33, 2, 1), 16u);
  EXPECT_EQ(Raster_CalculateCursorSize(32, 2, 1), 8u);
  EXPECT_EQ(Raster_CalculateCursorSize(3, 5, 24), 60u);
  for (const uint32 none : {0u, 7u}) {
    EXPECT_EQ(Raster_CalculateCursorSize(0, none, 32), 0u);
    EXPECT_EQ(Raster_CalculateCursorSize(none, 0, 32), 0u);
    EXPECT_EQ(Raster_CalculateCursorSize(none, 9, 0), 0u);
  }
}

TEST(Raster_CalculateCursorSize, IsAllOnesWhereAStepOverflows) {
  EXPECT_EQ(Raster_CalculateCursorSize(0x10000000, 1, 32), kTooLarge);
  EXPECT_EQ(Raster_CalculateCursorSize(0xFFFFFFFF, 1, 1), kTooLarge);
  EXPECT_EQ(Raster_CalculateCursorSize(0xFFFFFFE1, 0, 1), kTooLarge);  // even without rows
  EXPECT_EQ(Raster_CalculateCursorSize(0xFFFFFFE0, 1, 1), 0x1FFFFFFCu);
}

TEST(Raster_CalculateCursorSize, EqualsTheModelAroundItsLimits) {
  Random random(1);
  for (int round = 0; round < tests::rounds(100000); ++round) {
    const auto some = [&](uint32 around) { return around + random.below(5) - 2; };
    const uint32 bits = random.oneOf({0u, 1u, 8u, 16u, 24u, 32u, random.word()});
    const uint32 width =
        random.oneOf({random.below(70), some(bits == 0 ? 0 : 0xFFFFFFFFu / bits), some(0xFFFFFFE0u),
                      some(1u << random.below(32)), random.word()});
    const uint64 row = (uint64{width} * bits + 31) / 32 * 4;
    const uint32 height =
        random.oneOf({random.below(70), some(row == 0 ? 0 : static_cast<uint32>(0xFFFFFFFF / row)),
                      random.word()});
    ASSERT_EQ(Raster_CalculateCursorSize(width, height, bits),
              reference::cursorSize(width, height, bits))
        << width << " x " << height << ", " << bits << " bits";
  }
}

TEST(Raster_ExpandCursorBitPlane, EqualsTheModelAndLeavesThePaddingAlone) {
  Random random(2);
  for (int round = 0; round < tests::rounds(500); ++round) {
    const uint32 width = random.below(70);
    const uint32 height = random.below(9);
    const uint32 bpp = random.oneOf({8u, 16u, 24u, 32u});
    const Bytes bits = random.bytes(reference::cursorSize(width, height, 1));
    Bytes expected = random.bytes(reference::cursorSize(width, height, bpp));
    GuardedBuffer plane(bits.size());
    GuardedBuffer dst(expected.size());
    plane.assign(bits);
    dst.assign(expected);
    reference::expandBitPlane(expected, 0, bits, width, height, bpp);
    Raster_ExpandCursorBitPlane(width, height, bpp, plane.data(), dst.data(),
                                static_cast<uint32>(dst.size()));
    ASSERT_EQ(dst.bytes(), expected) << width << " x " << height << ", " << bpp << " bits";
  }
}

TEST(Raster_ExpandCursorBitPlane, PanicsWhereThePlaneIsLargerThanItsBuffer) {
  uint8 bits[4] = {};
  uint8 dst[128] = {};
  Raster_ExpandCursorBitPlane(32, 1, 32, bits, dst, 128);
  expectPanic([&] { Raster_ExpandCursorBitPlane(32, 1, 32, bits, dst, 127); });
  expectPanic([&] { Raster_ExpandCursorBitPlane(0x10000000, 1, 32, bits, dst, 128); });
}

TEST(Raster_ExpandPlanarCursorData, ExpandsOrCopiesEachPlaneOnItsOwn) {
  Random random(3);
  for (int round = 0; round < tests::rounds(500); ++round) {
    const uint32 width = random.below(40);
    const uint32 height = random.below(9);
    const uint32 bpp = random.oneOf({1u, 8u, 16u, 24u, 32u});
    const uint32 size = reference::cursorSize(width, height, bpp);
    const std::array<uint32, 2> depths = {random.oneOf({1u, bpp}), random.oneOf({1u, bpp})};
    std::array<Bytes, 2> planes;
    Bytes expected = random.bytes(size_t{size} * 2);
    GuardedBuffer dst(expected.size());
    dst.assign(expected);
    for (size_t i = 0; i < 2; ++i) {
      planes[i] = random.bytes(reference::cursorSize(width, height, depths[i]));
      if (depths[i] == 1) {  // also where a pixel has one bit: bytes a pixel are none then
        reference::expandBitPlane(expected, i * size, planes[i], width, height, bpp);
      } else {
        std::copy(planes[i].begin(), planes[i].end(),
                  expected.begin() + static_cast<std::ptrdiff_t>(i * size));
      }
    }
    Raster_ExpandPlanarCursorData(width, height, depths[0], planes[0].data(), depths[1],
                                  planes[1].data(), bpp, dst.data(),
                                  static_cast<uint32>(dst.size()));
    ASSERT_EQ(dst.bytes(), expected) << width << " x " << height << ", " << bpp << " bits";
  }
}

TEST(Raster_ExpandPlanarCursorData, PanicsWhereBothPlanesDoNotFit) {
  uint8 plane[128] = {};
  uint8 dst[256] = {};
  expectPanic([&] { Raster_ExpandPlanarCursorData(32, 1, 32, plane, 32, plane, 32, dst, 255); });
  // Twice 0x80000000 bytes overflow.
  expectPanic([&] {
    Raster_ExpandPlanarCursorData(0x01000000, 32, 32, plane, 32, plane, 32, dst, 0xFFFFFFFE);
  });
}

TEST(Raster_ExpandPlanarCursorData, PanicsForOtherDepthsAfterTheAndPlane) {
  const Bytes plane(128, 0x5A);
  Bytes dst(256);
  expectPanic([&] {
    Raster_ExpandPlanarCursorData(32, 1, 16, plane.data(), 32, plane.data(), 32, dst.data(), 256);
  });
  EXPECT_EQ(dst, Bytes(256));
  expectPanic([&] {
    Raster_ExpandPlanarCursorData(32, 1, 32, plane.data(), 16, plane.data(), 32, dst.data(), 256);
  });
  EXPECT_EQ(Bytes(dst.begin(), dst.begin() + 128), plane);
}

void expectBoxOfModel(const RasterFrameBufferDesc& fb, const RasterCursor& cursor, int32 x,
                      int32 y) {
  RasterCursorBox expected = {-1, -2, -3, -4, -5, -6};
  RasterCursorBox actual = expected;  // written only when visible
  const bool isVisible = reference::cursorBox(fb, cursor, x, y, &expected);
  ASSERT_EQ(Raster_ComputeCursorBox(&fb, &cursor, x, y, &actual), isVisible) << x << "," << y;
  ASSERT_EQ(0, memcmp(&actual, &expected, sizeof actual)) << x << "," << y;
}

TEST(Raster_ComputeCursorBox, EqualsTheModelForEveryPosition) {
  const RasterFrameBufferDesc fb = {10, 8, 24, 32, 40};
  for (const auto& [width, height] : {std::array{4u, 3u}, std::array{1u, 1u}, std::array{12u, 9u},
                                      std::array{0u, 3u}, std::array{3u, 0u}}) {
    for (const int32 hot : {0, 2, -3, 14}) {
      RasterCursor cursor{};
      cursor.hotX = hot;
      cursor.hotY = hot / 2;
      cursor.width = width;
      cursor.height = height;
      for (int32 y = -20; y < 25; ++y)
        for (int32 x = -20; x < 28; ++x) expectBoxOfModel(fb, cursor, x, y);
    }
  }
}

TEST(Raster_ComputeCursorBox, ClipsAtTheTopLeftCorner) {
  const RasterFrameBufferDesc fb = {100, 100, 24, 32, 400};
  RasterCursor cursor{};
  cursor.hotX = 4;
  cursor.hotY = 4;
  cursor.width = 32;
  cursor.height = 32;
  RasterCursorBox box{};
  ASSERT_TRUE(Raster_ComputeCursorBox(&fb, &cursor, 2, 3, &box));
  const RasterCursorBox expected = {0, 0, 30, 31, 2, 1};
  EXPECT_EQ(0, memcmp(&box, &expected, sizeof box));
  EXPECT_FALSE(Raster_ComputeCursorBox(&fb, &cursor, 104, 50, &box));  // left edge at the width
  EXPECT_TRUE(Raster_ComputeCursorBox(&fb, &cursor, 103, 50, &box));
}

TEST(Raster_ComputeCursorBox, TakesTheFrameBufferSizeAsUnsigned) {
  RasterCursor cursor{};
  cursor.width = 16;
  cursor.height = 8;
  for (const uint32 size : {0x7FFFFFFFu, 0x80000000u, 0x80000001u, 0xFFFFFFFFu}) {
    const RasterFrameBufferDesc fb = {size, size, 24, 32, 0};
    SCOPED_TRACE(size);
    for (const int32 at : {-3, 100, 0x7FFFFFF0, 0x7FFFFFFC, INT32_MAX})
      expectBoxOfModel(fb, cursor, at, at);
  }
}

TEST(Raster_ComputeCursorBox, SeesNothingFurtherRightThanABoxCanSay) {
  const RasterFrameBufferDesc fb = {0xFFFFFFFF, 0xFFFFFFFF, 24, 32, 0};
  RasterCursor cursor = {};
  cursor.width = cursor.height = 16;
  cursor.hotX = -1;
  RasterCursorBox box = {};
  EXPECT_FALSE(Raster_ComputeCursorBox(&fb, &cursor, 0x7FFFFFFF, 0, &box));
  EXPECT_TRUE(Raster_ComputeCursorBox(&fb, &cursor, 0x7FFFFFFE, 0, &box));
}

TEST(Raster_ComputeCursorBox, DoesNotOverflowAtTheEndsOfTheRange) {
  const RasterFrameBufferDesc fb = {100, 100, 24, 32, 400};
  RasterCursor cursor{};
  cursor.width = 32;
  cursor.height = 32;
  for (const int32 hot : {INT32_MIN, INT32_MAX, 0}) {
    for (const int32 at : {INT32_MIN, INT32_MAX}) {
      cursor.hotX = hot;
      RasterCursorBox box{};
      EXPECT_EQ(Raster_ComputeCursorBox(&fb, &cursor, at, 0, &box), hot == at);
    }
  }
}

/// A frame buffer, a cursor and where its box lies.
struct Scene {
  RasterFrameBufferDesc fb;
  Bytes screen, pixels, andMask, xorMask;
  RasterCursor cursor;
  RasterCursorBox box;
};

/// Any visible cursor on any of the formats; pitches may be odd.
Scene someScene(Random& random) {
  const Format& format = kFormats[random.below(5)];
  const uint32 type = random.below(2);
  Scene s{};
  do {
    s.fb = {1 + random.below(60), 1 + random.below(20), format.depth, format.bpp, 0};
    s.fb.pitch = s.fb.width * format.bytes() + random.below(3) * format.bytes();
    s.cursor.type = type;
    s.cursor.hotX = random.between(-5, 40);
    s.cursor.hotY = random.between(-5, 40);
    s.cursor.width = 1 + random.below(40);
    s.cursor.height = 1 + random.below(20);
  } while (!Raster_ComputeCursorBox(&s.fb, &s.cursor, random.between(-50, 90),
                                    random.between(-50, 50), &s.box));
  s.screen = random.bytes((size_t{s.fb.height} - 1) * s.fb.pitch + s.fb.width * format.bytes());
  const size_t area = size_t{s.cursor.width} * s.cursor.height;
  s.pixels = random.bytes(area * 4);
  s.andMask = random.bytes(area * format.bytes());
  s.xorMask = random.bytes(area * format.bytes());
  return s;
}

/// The box's area of the screen, with a pitch of its own.
Bytes savedArea(const Scene& s, uint32 bytes, uint32 savePitch, Bytes into) {
  for (int32 y = 0; y < s.box.height; ++y) {
    memcpy(&into[static_cast<size_t>(y) * savePitch],
           &s.screen[static_cast<size_t>(s.box.y + y) * s.fb.pitch +
                     static_cast<size_t>(s.box.x) * bytes],
           static_cast<size_t>(s.box.width) * bytes);
  }
  return into;
}

/// Points the cursor at guarded copies of its planes for a call.
struct Planes {
  explicit Planes(Scene& s)
      : pixels(s.pixels.size()), andMask(s.andMask.size()), xorMask(s.xorMask.size()) {
    pixels.assign(s.pixels);
    andMask.assign(s.andMask);
    xorMask.assign(s.xorMask);
    if (s.cursor.type == RASTER_CURSOR_ALPHA) {
      s.cursor.pixels = pixels.data();
    } else {
      setPlanes(s.cursor, s.fb.depth, s.fb.bpp, andMask.data(), xorMask.data());
    }
  }
  GuardedBuffer pixels, andMask, xorMask;
};

/// What drawing at (x, y) of a buffer gives.
Bytes drawn(const Scene& s, Bytes into, uint32 pitch, uint32 x, uint32 y) {
  if (s.cursor.type == RASTER_CURSOR_ALPHA) {
    Raster_AlphaBlendOver(into.data(), x, y, pitch, s.pixels.data(),
                          static_cast<uint32>(s.box.srcX), static_cast<uint32>(s.box.srcY),
                          4 * s.cursor.width, static_cast<uint32>(s.box.width),
                          static_cast<uint32>(s.box.height), s.fb.depth, s.fb.bpp, 0);
  } else {
    reference::drawMaskCursor(into, pitch, s.fb.bpp / 8, x, y, s.andMask, s.xorMask, s.cursor.width,
                              s.box);
  }
  return into;
}

TEST(Raster_DrawCursor, DrawsBothKindsIntoTheFrameBuffer) {
  Random random(4);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    Scene s = someScene(random);
    const Planes planes(s);
    GuardedBuffer fb(s.screen.size(), tests::someGuard(random));
    fb.assign(s.screen);
    Raster_DrawCursor(fb.data(), &s.fb, nullptr, 0, &s.cursor, &s.box);
    ASSERT_EQ(fb.bytes(), drawn(s, s.screen, s.fb.pitch, static_cast<uint32>(s.box.x),
                                static_cast<uint32>(s.box.y)))
        << "round " << round << " type " << s.cursor.type << " depth " << s.fb.depth;
  }
}

TEST(Raster_DrawCursor, DrawsIntoACopyAndLeavesTheFrameBufferUnchanged) {
  Random random(5);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    Scene s = someScene(random);
    const Planes planes(s);
    const uint32 bytes = s.fb.bpp / 8;
    const uint32 savePitch = (static_cast<uint32>(s.box.width) + random.below(3)) * bytes;
    Bytes save = random.bytes((static_cast<size_t>(s.box.height) - 1) * savePitch +
                              static_cast<size_t>(s.box.width) * bytes);
    GuardedBuffer fb(s.screen.size());
    GuardedBuffer copy(save.size());
    fb.assign(s.screen);
    copy.assign(save);
    Raster_DrawCursor(fb.data(), &s.fb, copy.data(), savePitch, &s.cursor, &s.box);
    save = savedArea(s, bytes, savePitch, save);
    ASSERT_EQ(copy.bytes(), drawn(s, save, savePitch, 0, 0)) << "round " << round;
    ASSERT_EQ(fb.bytes(), s.screen);
  }
}

// Deliberate: the raster operations round an odd pitch for rows after the first, the copy does not.
TEST(Raster_DrawCursor, CopiesWithTheFullPitchAndDrawsMasksWithTheRoundedOne) {
  const RasterFrameBufferDesc fb = {2, 2, 24, 32, 8};
  const Bytes screen = Random(6).bytes(16);
  Bytes keep(16, 0xFF);
  Bytes flip(16, 0x0F);
  RasterCursor cursor{RASTER_CURSOR_MASK, 0, 0, 2, 2, {}};
  setPlanes(cursor, 24, 32, keep.data(), flip.data());
  const RasterCursorBox box = {0, 0, 2, 2, 0, 0};
  Bytes expected(17);
  std::copy(screen.begin(), screen.begin() + 8, expected.begin());
  std::copy(screen.begin() + 8, screen.end(), expected.begin() + 9);
  for (size_t i = 0; i < 16; ++i) expected[i] ^= 0x0F;  // the second row is taken at 8, not at 9
  Bytes fbBits = screen;
  Bytes save(17);
  Raster_DrawCursor(fbBits.data(), &fb, save.data(), 9, &cursor, &box);
  EXPECT_EQ(save, expected);
}

TEST(Raster_DrawCursor, PanicsForMasksOfAnotherFormatAndUnknownTypesAfterTheCopy) {
  const RasterFrameBufferDesc fb = {4, 4, 24, 32, 16};
  Bytes screen(64, 7);
  Bytes plane(64);
  const RasterCursorBox box = {0, 0, 4, 4, 0, 0};
  for (const auto& [type, depth, bpp] :
       {std::array{0u, 24u, 24u}, std::array{0u, 16u, 32u}, std::array{2u, 24u, 32u}}) {
    RasterCursor cursor{type, 0, 0, 4, 4, {}};
    setPlanes(cursor, depth, bpp, plane.data(), plane.data());
    Bytes save(64);
    expectPanic([&] { Raster_DrawCursor(screen.data(), &fb, save.data(), 16, &cursor, &box); });
    EXPECT_EQ(save, screen);
    expectPanic([&] { Raster_DrawCursor(screen.data(), &fb, nullptr, 0, &cursor, &box); });
    EXPECT_EQ(screen, Bytes(64, 7));
  }
}

/// The results of Raster_GetScaledCursorSize.
struct ScaledSize {
  uint32 paddedWidth, paddedHeight, scaledWidth, scaledHeight;
  int32 hot[2];
  uint32 bytes;
};

ScaledSize scaledSize(uint32 width, uint32 height, double scaleX, double scaleY, int32 hotX,
                      int32 hotY) {
  ScaledSize s{};
  s.bytes =
      Raster_GetScaledCursorSize(&s.paddedWidth, &s.paddedHeight, &s.scaledWidth, &s.scaledHeight,
                                 s.hot, width, height, scaleX, scaleY, hotX, hotY);
  return s;
}

TEST(Raster_GetScaledCursorSize, AddsTwoPixelsOnEverySideAtScaleOne) {
  const ScaledSize s = scaledSize(32, 32, 1.0, 1.0, 5, 7);
  EXPECT_EQ(s.paddedWidth, 36u);
  EXPECT_EQ(s.paddedHeight, 36u);
  EXPECT_EQ(s.scaledWidth, 36u);
  EXPECT_EQ(s.scaledHeight, 36u);
  EXPECT_EQ(s.hot[0], 7);
  EXPECT_EQ(s.hot[1], 9);
  EXPECT_EQ(s.bytes, 5184u);
}

TEST(Raster_GetScaledCursorSize, AddsThreePixelsAtTwiceAndHalfTheSize) {
  const ScaledSize s = scaledSize(32, 32, 2.0, 0.5, 0, -4);
  EXPECT_EQ(s.paddedWidth, 38u);
  EXPECT_EQ(s.scaledWidth, 76u);
  EXPECT_EQ(s.paddedHeight, 38u);
  EXPECT_EQ(s.scaledHeight, 19u);
  EXPECT_EQ(s.hot[0], 6);
  EXPECT_EQ(s.hot[1], 0);  // -0.5 toward zero
}

TEST(Raster_GetScaledCursorSize, FollowsItsRuleForFactorsFromATenthToEight) {
  for (int tenthX = 1; tenthX <= 80; ++tenthX) {
    for (const int tenthY : {1, 3, 9, 10, 11, 25, 80}) {
      const double scaleX = tenthX / 10.0;
      const double scaleY = tenthY / 10.0;
      const auto margin = [](double scale) {
        return std::max(static_cast<int32>(1 / scale), static_cast<int32>(scale)) + 1;
      };
      const ScaledSize s = scaledSize(33, 21, scaleX, scaleY, 3, 20);
      EXPECT_EQ(s.paddedWidth, 33u + 2 * static_cast<uint32>(margin(scaleX)));
      EXPECT_EQ(s.paddedHeight, 21u + 2 * static_cast<uint32>(margin(scaleY)));
      EXPECT_EQ(s.scaledWidth, static_cast<uint32>(std::ceil(s.paddedWidth * scaleX)));
      EXPECT_EQ(s.scaledHeight, static_cast<uint32>(std::ceil(s.paddedHeight * scaleY)));
      EXPECT_EQ(s.hot[0], static_cast<int32>((3 + margin(scaleX)) * scaleX));
      EXPECT_EQ(s.hot[1], static_cast<int32>((20 + margin(scaleY)) * scaleY));
      EXPECT_EQ(s.bytes, s.scaledWidth * 4 * s.scaledHeight);
    }
  }
}

TEST(Raster_GetScaledCursorSize, GivesTheSmallestIntegerForWhatDoesNotFit) {
  constexpr int32 kLargest = 0x7FFFFFFF;
  const ScaledSize s = scaledSize(1, 1, 1, 1, kLargest - 2, kLargest - 1);
  EXPECT_EQ(s.hot[0], kLargest);
  EXPECT_EQ(s.hot[1], INT32_MIN);
  const ScaledSize low = scaledSize(1, 1, 2, 2, -1073741826, -1073741828);
  EXPECT_EQ(low.hot[0], -2147483646);
  EXPECT_EQ(low.hot[1], INT32_MIN);
  constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
  const ScaledSize none = scaledSize(1, 2, kNan, kNan, 5, 5);
  EXPECT_EQ(none.paddedWidth, 3u);  // twice a margin of 2^31 + 1, modulo 2^32
  EXPECT_EQ(none.paddedHeight, 4u);
  EXPECT_EQ(none.scaledWidth, 0u);
  EXPECT_EQ(none.hot[0], INT32_MIN);
}

/// A plane in the middle of a larger one.
Bytes padded(const Bytes& plane, uint32 width, uint32 height, const ScaledSize& s, uint8 fill) {
  Bytes all(size_t{s.paddedWidth} * s.paddedHeight * 4, fill);
  const size_t left = (s.paddedWidth - width) / 2;
  const size_t top = (s.paddedHeight - height) / 2;
  for (size_t y = 0; y < height; ++y)
    memcpy(&all[((top + y) * s.paddedWidth + left) * 4], &plane[y * width * 4], size_t{width} * 4);
  return all;
}

Bytes scaledPlane(const Bytes& plane, const ScaledSize& s, double scaleX, double scaleY,
                  int32 smooth) {
  Bytes result(s.bytes, 0x77);
  EXPECT_TRUE(Raster_Scale(result.data(), 4 * s.scaledWidth, 32, 24, s.scaledWidth, s.scaledHeight,
                           0, 0, 0, static_cast<int32>(s.scaledWidth),
                           static_cast<int32>(s.scaledHeight), plane.data(),
                           static_cast<int32>(4 * s.paddedWidth), 32, 24, 0, s.paddedWidth,
                           s.paddedHeight, 0, scaleX, scaleY, smooth));
  return result;
}

TEST(Raster_ScaleAlphaCursor, ScalesSmoothlyWithATransparentMargin) {
  Random random(7);
  for (const double scale : {0.1, 0.5, 0.75, 1.0, 1.5, 2.0, 3.3, 8.0}) {
    Bytes pixels = random.bytes(size_t{17} * 13 * 4);
    RasterCursor cursor{RASTER_CURSOR_ALPHA, 0, 0, 17, 13, {}};
    cursor.pixels = pixels.data();
    const double scaleY = scale > 1 ? scale / 2 : scale * 2;
    const ScaledSize s = scaledSize(17, 13, scale, scaleY, 0, 0);
    GuardedBuffer dst(s.bytes);
    Raster_ScaleAlphaCursor(dst.data(), &cursor, scale, scaleY, s.paddedWidth, s.paddedHeight,
                            s.scaledWidth, s.scaledHeight);
    EXPECT_EQ(dst.bytes(), scaledPlane(padded(pixels, 17, 13, s, 0), s, scale, scaleY, 2));
    for (size_t x = 0; x < size_t{s.scaledWidth} * 4; ++x) {
      EXPECT_EQ(dst.data()[x], 0);
      EXPECT_EQ(dst.end()[-1 - static_cast<std::ptrdiff_t>(x)], 0);
    }
  }
}

TEST(Raster_ScaleColorCursor, ScalesBothMasksToTheirNearestPixels) {
  Random random(8);
  for (const double scale : {0.1, 0.5, 0.75, 1.0, 1.5, 2.0, 3.3, 8.0}) {
    Bytes keep = random.bytes(size_t{17} * 13 * 4);
    Bytes flip = random.bytes(size_t{17} * 13 * 4);
    RasterCursor cursor{RASTER_CURSOR_MASK, 0, 0, 17, 13, {}};
    setPlanes(cursor, 24, 32, keep.data(), flip.data());
    const ScaledSize s = scaledSize(17, 13, scale, scale, 0, 0);
    GuardedBuffer andDst(s.bytes);
    GuardedBuffer xorDst(s.bytes);
    Raster_ScaleColorCursor(andDst.data(), xorDst.data(), &cursor, scale, scale, s.paddedWidth,
                            s.paddedHeight, s.scaledWidth, s.scaledHeight);
    EXPECT_EQ(andDst.bytes(), scaledPlane(padded(keep, 17, 13, s, 0xFF), s, scale, scale, 0));
    EXPECT_EQ(xorDst.bytes(), scaledPlane(padded(flip, 17, 13, s, 0), s, scale, scale, 0));
    EXPECT_EQ(andDst.data()[0], 0xFF);  // the screen is kept outside the cursor
    EXPECT_EQ(xorDst.data()[0], 0);
  }
}

/// Scales both kinds of cursor into `dst` with the sizes as given, and returns what was said.
Messages scaleBoth(GuardedBuffer& dst, Bytes& pixels, uint32 side, const ScaledSize& s,
                   double scaleX, double scaleY) {
  GuardedBuffer second(dst.size());
  RasterCursor alpha{RASTER_CURSOR_ALPHA, 0, 0, side, side, {}};
  alpha.pixels = pixels.data();
  RasterCursor mask{RASTER_CURSOR_MASK, 0, 0, side, side, {}};
  setPlanes(mask, 24, 32, pixels.data(), pixels.data());
  return tests::messagesOf([&] {
    Raster_ScaleAlphaCursor(dst.data(), &alpha, scaleX, scaleY, s.paddedWidth, s.paddedHeight,
                            s.scaledWidth, s.scaledHeight);
    Raster_ScaleColorCursor(dst.data(), second.data(), &mask, scaleX, scaleY, s.paddedWidth,
                            s.paddedHeight, s.scaledWidth, s.scaledHeight);
  });
}

TEST(Raster_ScaleAlphaCursor, StaysWithinItsBuffersForEveryFactor) {
  constexpr double kInfinity = std::numeric_limits<double>::infinity();
  const double factors[] = {std::numeric_limits<double>::quiet_NaN(),
                            kInfinity,
                            -kInfinity,
                            0,
                            -0.0,
                            -1,
                            -0.3,
                            -5,
                            1e-300,
                            1e300,
                            1,
                            4e9};
  Random random(9);
  Bytes pixels = random.bytes(size_t{8} * 8 * 4);
  for (const double scaleX : factors) {
    for (const double scaleY : factors) {
      const ScaledSize s = scaledSize(8, 8, scaleX, scaleY, 0, 0);
      if (uint64{s.scaledWidth} * s.scaledHeight > 1000000) continue;
      GuardedBuffer dst(size_t{s.scaledWidth} * s.scaledHeight * 4);
      EXPECT_EQ(scaleBoth(dst, pixels, 8, s, scaleX, scaleY).panic, "") << scaleX << " " << scaleY;
    }
  }
}

TEST(Raster_ScaleAlphaCursor, CopiesNothingThatDoesNotFitThePaddedSize) {
  Bytes pixels(size_t{8} * 8 * 4, 0xFF);
  for (const auto& [width, height] : {std::array{9u, 12u}, {12u, 9u}, {1u, 1u}, {0u, 12u}}) {
    GuardedBuffer dst(size_t{12} * 12 * 4);
    memset(dst.data(), 0, dst.size());
    RasterCursor cursor{RASTER_CURSOR_ALPHA, 0, 0, 8, 8, {}};
    cursor.pixels = pixels.data();
    Raster_ScaleAlphaCursor(dst.data(), &cursor, 1, 1, width, height, 12, 12);
    EXPECT_EQ(dst.bytes(), Bytes(dst.size(), 0)) << width << "x" << height;
  }
}

TEST(Raster_ScaleAlphaCursor, CopiesWhatJustFitsThePaddedSize) {
  Bytes pixels(size_t{8} * 8 * 4, 0xFF);
  for (const auto& [width, height] : {std::array{10u, 12u}, {12u, 10u}, {10u, 10u}}) {
    GuardedBuffer dst(size_t{12} * 12 * 4);
    memset(dst.data(), 0, dst.size());
    RasterCursor cursor{RASTER_CURSOR_ALPHA, 0, 0, 8, 8, {}};
    cursor.pixels = pixels.data();
    Raster_ScaleAlphaCursor(dst.data(), &cursor, 1, 1, width, height, 12, 12);
    const uint8* const middle = dst.data() + (size_t{5} * 12 + 5) * 4;
    EXPECT_EQ(Bytes(middle, middle + 4), Bytes(4, 0xFF)) << width << "x" << height;
  }
}

TEST(Raster_ScaleAlphaCursor, EndsInAPanicWhenThePaddedPlaneIsMoreThanMemory) {
  Bytes pixels(size_t{2} * 2 * 4, 1);
  GuardedBuffer dst(3 * 3 * 4);
  // 2^64 bytes.
  const ScaledSize endless = {0x80000000, 0x80000000, 3, 3, {0, 0}, 36};
  EXPECT_TRUE(scaleBoth(dst, pixels, 2, endless, 1, 1).panic.starts_with("Out of memory: "));
  // The sizes of a cursor of 2 x 2: 2^32 bytes.
  const double scale = 1 / 16382.5;
  const ScaledSize s = scaledSize(2, 2, scale, scale, 0, 0);
  ASSERT_EQ(s.paddedWidth, 32768u);
  ASSERT_EQ(s.scaledWidth, 3u);
  if (sizeof(size_t) > 4) return;
  EXPECT_TRUE(scaleBoth(dst, pixels, 2, s, scale, scale).panic.starts_with("Out of memory: "));
}

}  // namespace
