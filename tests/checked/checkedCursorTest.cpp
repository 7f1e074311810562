// SPDX-License-Identifier: MIT
//
// Cursors: expansion, drawing and scaling against the exact functions, with planes that end where
// they end.

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "checked/checkedScenes.h"
#include "rasterChecked.h"
#include "support/cursorPlanes.h"
#include "support/recordedMessages.h"

namespace {

using tests::Bytes;
using tests::GuardedBuffer;
using tests::GuardedView;
using tests::PixelFormat;
using tests::Random;

/// A cursor with planes of exactly the bytes that it needs.
struct OwnCursor {
  OwnCursor(Random& random, bool mask, PixelFormat format, uint32 width, uint32 height)
      : bytes(size_t{width} * height * (mask ? format.bpp / 8 : 4)), first(bytes), second(bytes) {
    first.assign(random.bytes(bytes));
    second.assign(random.bytes(bytes));
    cursor.type = mask ? RASTER_CURSOR_MASK : RASTER_CURSOR_ALPHA;
    cursor.hotX = random.between(-3, 20);
    cursor.hotY = random.between(-3, 20);
    cursor.width = width;
    cursor.height = height;
    tests::setPlanes(cursor, format.depth, format.bpp, first.data(), second.data());
  }

  size_t bytes;
  GuardedBuffer first;
  GuardedBuffer second;
  RasterCursor cursor{};
};

int32 somePlace(Random& random) {
  return random.below(6) == 0 ? tests::someCoordinate(random) : random.between(-30, 60);
}

TEST(RasterChecked_DrawCursor, EqualsTheExactDrawing) {
  Random random(51);
  int drawn = 0;
  for (int round = 0; round < 8000; ++round) {
    GuardedView fb(random, tests::someFormat(random), random.below(40), random.below(40));
    const RasterView& v = fb.view();
    const bool mask = random.below(2) == 0;
    const PixelFormat format =
        random.below(6) == 0 ? tests::someFormat(random) : PixelFormat{v.depth, v.bpp};
    const OwnCursor own(random, mask, format, random.below(30), random.below(30));
    GuardedView save(random, {v.depth, v.bpp}, random.below(60), random.below(60));
    const bool saves = random.below(2) == 0;
    const int32 x = somePlace(random);
    const int32 y = somePlace(random);
    const Bytes before = fb.bytes();
    const Bytes saveBefore = save.bytes();
    RasterCursorBox box = {7, 7, 7, 7, 7, 7};
    const RasterStatus status =
        RasterChecked_DrawCursor(&fb, saves ? &save : nullptr, &own.cursor, own.bytes, x, y, &box);

    const RasterFrameBufferDesc desc = {v.width, v.height, v.depth, v.bpp, v.pitch};
    RasterCursorBox expectedBox = {};
    const bool visible = Raster_ComputeCursorBox(&desc, &own.cursor, x, y, &expectedBox);
    RasterStatus expected = RASTER_STATUS_OK;
    if (mask ? format.depth != v.depth || format.bpp != v.bpp : v.depth == 3) {
      expected = RASTER_STATUS_BAD_FORMAT;
    } else if (saves && visible &&
               (expectedBox.width > static_cast<int32>(save.view().width) ||
                expectedBox.height > static_cast<int32>(save.view().height))) {
      expected = RASTER_STATUS_OUTSIDE;
    }
    ASSERT_EQ(status, expected) << "round " << round;
    const Bytes after = fb.bytes();
    const Bytes saveAfter = save.bytes();
    fb.assign(before);
    save.assign(saveBefore);
    if (status != RASTER_STATUS_OK) expectedBox = {7, 7, 7, 7, 7, 7};
    if (status == RASTER_STATUS_OK && visible) {
      ++drawn;
      Raster_DrawCursor(v.data, &desc, saves ? save.view().data : nullptr, save.view().pitch,
                        &own.cursor, &expectedBox);
    }
    ASSERT_EQ(after, fb.bytes()) << "round " << round;
    ASSERT_EQ(saveAfter, save.bytes()) << "round " << round;
    ASSERT_EQ(0, memcmp(&box, &expectedBox, sizeof box)) << "round " << round;
  }
  EXPECT_GT(drawn, 500);
}

TEST(RasterChecked_DrawCursor, RefusesPlanesThatAreTooShort) {
  Random random(52);
  const GuardedView fb(random, {24, 32}, 40, 40);
  const Bytes before = fb.bytes();
  OwnCursor alpha(random, false, {24, 32}, 10, 10);
  OwnCursor mask(random, true, {24, 32}, 10, 10);
  for (OwnCursor* own : {&alpha, &mask}) {
    EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, &own->cursor, own->bytes - 1, 5, 5, nullptr),
              RASTER_STATUS_BAD_VIEW);
    own->cursor.width = 0x40000001;  // four bytes a row, modulo 2^32
    EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, &own->cursor, own->bytes, 5, 5, nullptr),
              RASTER_STATUS_BAD_VIEW);
    own->cursor.width = 10;
    own->cursor.height = 0xFFFFFFFF;
    EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, &own->cursor, own->bytes, 5, 5, nullptr),
              RASTER_STATUS_BAD_VIEW);
    own->cursor.height = 10;
  }
  mask.cursor.xorMask = nullptr;
  EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, &mask.cursor, mask.bytes, 5, 5, nullptr),
            RASTER_STATUS_NULL);
  alpha.cursor.type = 2;
  EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, &alpha.cursor, alpha.bytes, 5, 5, nullptr),
            RASTER_STATUS_BAD_ARGUMENT);
  EXPECT_EQ(RasterChecked_DrawCursor(&fb, nullptr, nullptr, 0, 5, 5, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(fb.bytes(), before);
}

TEST(RasterChecked_DrawCursor, WantsASaveOfItsOwn) {
  Random random(53);
  const GuardedView fb(random, {24, 32}, 40, 40);
  const GuardedView otherFormat(random, {16, 16}, 40, 40);
  OwnCursor own(random, false, {24, 32}, 10, 10);
  own.cursor.hotX = own.cursor.hotY = 0;
  EXPECT_EQ(RasterChecked_DrawCursor(&fb, &fb, &own.cursor, own.bytes, 5, 5, nullptr),
            RASTER_STATUS_OVERLAP);
  EXPECT_EQ(RasterChecked_DrawCursor(&fb, &otherFormat, &own.cursor, own.bytes, 5, 5, nullptr),
            RASTER_STATUS_BAD_FORMAT);
}

// ---- Expansion ---------------------------------------------------------------------------------

TEST(RasterChecked_ExpandCursor, EqualsTheExactExpansion) {
  Random random(54);
  for (int round = 0; round < 5000; ++round) {
    const uint32 width = random.below(40);
    const uint32 height = random.below(20);
    const uint32 bpp = random.oneOf({8u, 16u, 24u, 32u, 32u, 12u, 0u, 40u});
    const uint32 andDepth = random.oneOf({1u, bpp, 7u});
    const uint32 xorDepth = random.oneOf({1u, bpp, 1u});
    const uint32 andNeeds = Raster_CalculateCursorSize(width, height, andDepth);
    const uint32 xorNeeds = Raster_CalculateCursorSize(width, height, xorDepth);
    const uint32 size = 2 * Raster_CalculateCursorSize(width, height, bpp);
    const bool shortPlane = random.below(6) == 0 && andNeeds != 0;
    const bool shortDst = random.below(6) == 0 && size != 0;
    GuardedBuffer andBits(andNeeds - (shortPlane ? 1 : 0));
    GuardedBuffer xorBits(xorNeeds);
    GuardedBuffer dst(size - (shortDst ? 1 : 0));
    andBits.assign(random.bytes(andBits.size()));
    xorBits.assign(random.bytes(xorBits.size()));
    const Bytes before = random.bytes(dst.size());
    dst.assign(before);
    const RasterStatus status = RasterChecked_ExpandCursor(
        width, height, andDepth, andBits.data(), andBits.size(), xorDepth, xorBits.data(),
        xorBits.size(), bpp, dst.data(), dst.size());
    RasterStatus expected = RASTER_STATUS_OK;
    if (bpp != 8 && bpp != 16 && bpp != 24 && bpp != 32) {
      expected = RASTER_STATUS_BAD_FORMAT;
    } else if (shortDst) {
      expected = RASTER_STATUS_OUTSIDE;
    } else if (andDepth != 1 && andDepth != bpp) {
      expected = RASTER_STATUS_BAD_FORMAT;
    } else if (shortPlane) {
      expected = RASTER_STATUS_TRUNCATED;
    }
    ASSERT_EQ(status, expected) << "round " << round;
    const Bytes after = dst.bytes();
    dst.assign(before);
    if (status == RASTER_STATUS_OK && size != 0) {
      Raster_ExpandPlanarCursorData(width, height, andDepth, andBits.data(), xorDepth,
                                    xorBits.data(), bpp, dst.data(), size);
    }
    ASSERT_EQ(after, dst.bytes()) << "round " << round;
  }
}

TEST(RasterChecked_ExpandCursor, RefusesSizesThatWrap) {
  uint8 bytes[16] = {};
  uint8 dst[16] = {};
  const auto statusOf = [](uint32 width, uint32 height, uint32 bpp, const uint8* andBits,
                           const uint8* xorBits, uint8* to) {
    return RasterChecked_ExpandCursor(width, height, 1, andBits, 16, 1, xorBits, 16, bpp, to, 16);
  };
  EXPECT_EQ(statusOf(0x10000000, 1, 32, bytes, bytes, dst), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(statusOf(0x10000, 0x10000, 32, bytes, bytes, dst), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(statusOf(0x80000000, 0, 8, bytes, bytes, dst), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(statusOf(0, 0x80000000, 8, bytes, bytes, dst), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(statusOf(1, 1, 32, bytes, dst, dst), RASTER_STATUS_OVERLAP);
  EXPECT_EQ(statusOf(1, 1, 32, nullptr, bytes, dst), RASTER_STATUS_NULL);
  EXPECT_EQ(statusOf(1, 1, 32, bytes, bytes, nullptr), RASTER_STATUS_NULL);
}

// ---- Scaling -----------------------------------------------------------------------------------

double someFactor(Random& random) {
  return random.below(8) == 0 ? random.oneOf({0.0, -2.0, 1.0 / 32767, 1.0 / 20000, 20000.0, 1e300,
                                              std::numeric_limits<double>::infinity(),
                                              -std::numeric_limits<double>::infinity(),
                                              std::numeric_limits<double>::quiet_NaN()})
                              : random.between(50, 4000) / 1000.0;
}

TEST(RasterChecked_ScaleCursor, EqualsTheExactScaling) {
  Random random(55);
  int scaledCount = 0;
  for (int round = 0; round < 2000; ++round) {
    const bool mask = random.below(2) == 0;
    const OwnCursor own(random, mask, {24, 32}, random.below(40), random.below(40));
    const double x = someFactor(random);
    const double y = someFactor(random);
    RasterScaledCursor size = {};
    const RasterStatus sized =
        RasterChecked_ScaledCursorSize(own.cursor.width, own.cursor.height, own.cursor.hotX,
                                       own.cursor.hotY, x, y, nullptr, &size);
    const bool numbers = std::isfinite(x) && std::isfinite(y) && x > 1.0 / 32767 && y > 1.0 / 32767;
    ASSERT_EQ(sized == RASTER_STATUS_BAD_ARGUMENT, !numbers);
    if (sized != RASTER_STATUS_OK) {
      uint8 none = 0;
      ASSERT_EQ(RasterChecked_ScaleCursor(&own.cursor, own.bytes, x, y, nullptr, &none, 1, nullptr),
                sized);
      continue;
    }
    uint32 padded[2];
    uint32 scaled[2];
    int32 hot[2];
    ASSERT_EQ(size.planeBytes,
              Raster_GetScaledCursorSize(&padded[0], &padded[1], &scaled[0], &scaled[1], hot,
                                         own.cursor.width, own.cursor.height, x, y, own.cursor.hotX,
                                         own.cursor.hotY));
    ASSERT_EQ(size.paddedWidth, padded[0]);
    ASSERT_EQ(size.paddedHeight, padded[1]);
    ASSERT_EQ(size.width, scaled[0]);
    ASSERT_EQ(size.height, scaled[1]);
    ASSERT_EQ(size.hotX, hot[0]);
    ASSERT_EQ(size.hotY, hot[1]);
    if (size.planeBytes > 4000000) continue;
    ++scaledCount;
    const size_t bytes = size_t{size.planeBytes} * (mask ? 2 : 1);
    GuardedBuffer dst(bytes);
    ASSERT_EQ(RasterChecked_ScaleCursor(&own.cursor, own.bytes, x, y, nullptr, dst.data(),
                                        bytes - 1, nullptr),
              RASTER_STATUS_OUTSIDE);
    ASSERT_EQ(RasterChecked_ScaleCursor(&own.cursor, own.bytes, x, y, nullptr, dst.data(), bytes,
                                        nullptr),
              RASTER_STATUS_OK);
    Bytes expected(bytes);
    if (mask) {
      Raster_ScaleColorCursor(expected.data(), expected.data() + size.planeBytes, &own.cursor, x, y,
                              padded[0], padded[1], scaled[0], scaled[1]);
    } else {
      Raster_ScaleAlphaCursor(expected.data(), &own.cursor, x, y, padded[0], padded[1], scaled[0],
                              scaled[1]);
    }
    ASSERT_EQ(dst.bytes(), expected) << "round " << round;
  }
  EXPECT_GT(scaledCount, 1000);
}

TEST(RasterChecked_ScaledCursorSize, RefusesWhatCannotBeScaled) {
  RasterScaledCursor size = {};
  size.width = 77;
  const double smallest = 1.0 / 16382.5;  // of 2 x 2 pixels: a margin that wraps a 32-bit size
  EXPECT_EQ(RasterChecked_ScaledCursorSize(2, 2, 0, 0, smallest, smallest, nullptr, &size),
            RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_ScaledCursorSize(32768, 2, 0, 0, 1, 1, nullptr, &size),
            RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_ScaledCursorSize(2, 0xFFFFFFFF, 0, 0, 1, 1, nullptr, &size),
            RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_ScaledCursorSize(2, 2, 0, 0, 1e12, 1, nullptr, &size),
            RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_ScaledCursorSize(20000, 20000, 0, 0, 1, 1, nullptr, &size),
            RASTER_STATUS_LIMIT);
  const RasterLimits fewPixels = {100, 100, 64, 0, 0, 0};
  EXPECT_EQ(RasterChecked_ScaledCursorSize(20, 20, 0, 0, 1, 1, &fewPixels, &size),
            RASTER_STATUS_LIMIT);
  EXPECT_EQ(RasterChecked_ScaledCursorSize(2, 2, 0, 0, 1, 1, nullptr, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(size.width, 77u);
}

TEST(RasterChecked_ScaleCursor, RefusesOtherFormatsAndOverlap) {
  Random random(56);
  const OwnCursor small(random, true, {16, 16}, 8, 8);
  OwnCursor own(random, false, {24, 32}, 8, 8);
  Bytes dst(100000);
  EXPECT_EQ(RasterChecked_ScaleCursor(&small.cursor, small.bytes, 1, 1, nullptr, dst.data(),
                                      dst.size(), nullptr),
            RASTER_STATUS_BAD_FORMAT);
  const auto statusAt = [&](const OwnCursor& from, uint8* to) {
    return RasterChecked_ScaleCursor(&from.cursor, from.bytes, 1, 1, nullptr, to, dst.size(),
                                     nullptr);
  };
  EXPECT_EQ(statusAt(own, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(statusAt(own, dst.data()), RASTER_STATUS_OK);
  own.cursor.pixels = dst.data();
  EXPECT_EQ(statusAt(own, dst.data()), RASTER_STATUS_OVERLAP);
  OwnCursor mask(random, true, {24, 32}, 8, 8);
  EXPECT_EQ(statusAt(mask, dst.data()), RASTER_STATUS_OK);
  mask.cursor.xorMask = dst.data();
  EXPECT_EQ(statusAt(mask, dst.data()), RASTER_STATUS_OVERLAP);
}

}  // namespace
