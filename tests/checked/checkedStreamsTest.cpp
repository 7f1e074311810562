// SPDX-License-Identifier: MIT
//
// Run-length blocks and video frames from outside: cut off anywhere, changed anywhere.

#include <gtest/gtest.h>

#include <cstring>

#include "checked/checkedScenes.h"
#include "rasterChecked.h"
#include "support/allocated.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using tests::Allocated;
using tests::Bytes;
using tests::GuardedBuffer;
using tests::GuardedView;
using tests::PixelFormat;
using tests::Random;

/// Pixels with runs in them.
void makeRuns(Random& random, GuardedView& view) {
  Bytes bytes = view.bytes();
  size_t at = 0;
  while (at + 4 <= bytes.size()) {
    const size_t run = 4 * (1 + random.below(30));
    const uint32 pixel = random.below(3);
    for (size_t end = std::min(bytes.size() - 3, at + run); at < end; at += 4)
      memcpy(&bytes[at], &pixel, 4);
  }
  view.assign(bytes);
}

PixelFormat someBlockFormat(Random& random) {
  return random.oneOf<PixelFormat>({{8, 8}, {16, 16}, {24, 24}, {24, 32}, {24, 32}});
}

/// The whole rows of a view as a block of the exact function.
Bytes exactBlock(const RasterView& v) {
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(v.data, v.pitch, v.bpp, v.width, v.height, &block, &size);
  const Allocated owned(block);
  return {block, block + size};
}

TEST(RasterChecked_Compress, EqualsTheExactCompression) {
  Random random(61);
  for (int round = 0; round < tests::rounds(2000); ++round) {
    GuardedView view(random, someBlockFormat(random), random.below(40), random.below(40), false);
    makeRuns(random, view);
    uint8* block = nullptr;
    size_t size = 0;
    ASSERT_EQ(RasterChecked_Compress(&view, &block, &size), RASTER_STATUS_OK);
    const Allocated owned(block);
    ASSERT_EQ(Bytes(block, block + size), exactBlock(view.view()));
  }
}

TEST(RasterChecked_Compress, WantsTheLastGap) {
  uint8 bytes[80] = {};
  uint8* block = nullptr;
  size_t size = 77;
  RasterView view = {bytes, 79, 40, 9, 2, 24, 32};
  EXPECT_EQ(RasterChecked_Compress(&view, &block, &size), RASTER_STATUS_BAD_VIEW);
  EXPECT_EQ(block, nullptr);
  EXPECT_EQ(size, 77u);
  view.bytes = 80;
  EXPECT_EQ(RasterChecked_Compress(&view, nullptr, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Compress(&view, &block, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Compress(nullptr, &block, &size), RASTER_STATUS_NULL);
  ASSERT_EQ(RasterChecked_Compress(&view, &block, &size), RASTER_STATUS_OK);
  free(block);
}

TEST(RasterChecked_Decompress, GivesThePixelsBack) {
  Random random(62);
  for (int round = 0; round < tests::rounds(2000); ++round) {
    GuardedView view(random, someBlockFormat(random), random.below(40), random.below(40), false);
    makeRuns(random, view);
    const Bytes bytes = exactBlock(view.view());
    GuardedBuffer block(bytes.size(), tests::someGuard(random));
    block.assign(bytes);
    RasterBlockInfo info = {};
    ASSERT_EQ(RasterChecked_BlockInfo(block.data(), block.size(), nullptr, &info),
              RASTER_STATUS_OK);
    ASSERT_EQ(info.width, view.view().width);
    ASSERT_EQ(info.height, view.view().height);
    ASSERT_EQ(info.pitch, view.view().pitch);
    ASSERT_EQ(info.bpp, view.view().bpp);
    RasterView pixels = {};
    ASSERT_EQ(RasterChecked_Decompress(block.data(), block.size(), nullptr, &pixels),
              RASTER_STATUS_OK);
    const Allocated owned(pixels.data);
    ASSERT_EQ(RasterChecked_View(&pixels), RASTER_STATUS_OK);
    ASSERT_EQ(pixels.depth, std::min(24u, info.bpp));
    ASSERT_EQ(Bytes(pixels.data, pixels.data + pixels.bytes), view.bytes());
    if (info.codeWords == 0) continue;
    uint8* exact = nullptr;
    uint32 ignored = 0;
    Raster_Decompress(block.data(), &exact, &ignored, &ignored, &ignored, &ignored);
    const Allocated exactOwned(exact);
    ASSERT_EQ(0, memcmp(exact, pixels.data, pixels.bytes));
  }
}

TEST(RasterChecked_Decompress, FillsWhatIsNoWholePixelWithZeros) {
  // 3 rows of 5 bytes at 24 bits: five pixels and no byte more, then none missing of 4 rows of 3.
  Bytes bytes(15, 9);
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(bytes.data(), 5, 24, 1, 2, &block, &size);  // 10 bytes: three pixels
  const Allocated owned(block);
  ASSERT_EQ(size, 20u + 9);
  RasterView pixels = {};
  ASSERT_EQ(RasterChecked_Decompress(block, size, nullptr, &pixels), RASTER_STATUS_OK);
  const Allocated made(pixels.data);
  EXPECT_EQ(pixels.bytes, 10u);
  EXPECT_EQ(pixels.data[8], 9);
  EXPECT_EQ(pixels.data[9], 0);
}

Bytes goodBlock(uint64 seed, uint32 width, uint32 height) {
  Random random(seed);
  GuardedView view(random, {24, 32}, width, height, false);
  makeRuns(random, view);
  return exactBlock(view.view());
}

/// Decompresses from memory that ends with the bytes. Whatever comes, outputs are left alone unless
/// it is OK.
RasterStatus decompress(const Bytes& bytes) {
  GuardedBuffer block(bytes.size());
  block.assign(bytes);
  RasterView pixels = {};
  pixels.width = 77;
  RasterStatus status = RASTER_STATUS_OK;
  const tests::Messages said = tests::messagesOf(
      [&] { status = RasterChecked_Decompress(block.data(), block.size(), nullptr, &pixels); });
  EXPECT_EQ(said.log + said.warning + said.panic, "");
  if (status == RASTER_STATUS_OK) {
    EXPECT_EQ(RasterChecked_View(&pixels), RASTER_STATUS_OK);
    free(pixels.data);
  } else {
    EXPECT_EQ(pixels.data, nullptr);
    EXPECT_EQ(pixels.width, 77u);
  }
  return status;
}

TEST(RasterChecked_Decompress, IsTruncatedAtEveryByte) {
  const Bytes good = goodBlock(63, 30, 20);
  ASSERT_EQ(decompress(good), RASTER_STATUS_OK);
  for (size_t size = 0; size < good.size(); ++size)
    ASSERT_EQ(decompress({good.begin(), good.begin() + static_cast<ptrdiff_t>(size)}),
              RASTER_STATUS_TRUNCATED);
  Bytes longer = good;
  longer.resize(good.size() + 100);
  EXPECT_EQ(decompress(longer), RASTER_STATUS_OK);
}

TEST(RasterChecked_Decompress, TakesEveryByteChanged) {
  const Bytes good = goodBlock(64, 30, 20);
  int refused = 0;
  for (size_t at = 0; at < good.size(); ++at) {
    for (const int change : {1, 0x80, 0xFF, 0x10}) {
      Bytes bad = good;
      bad[at] = static_cast<uint8>(bad[at] ^ change);
      refused += decompress(bad) != RASTER_STATUS_OK;
    }
  }
  EXPECT_GT(refused, 100);
}

Bytes blockOf(std::initializer_list<uint32> words) {
  Bytes bytes(4 * words.size());
  memcpy(bytes.data(), words.begin(), bytes.size());
  return bytes;
}

TEST(RasterChecked_Decompress, RefusesCodesThatMakeMoreOrLess) {
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 32, 3, 5, 5, 6})), RASTER_STATUS_OK);
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 32, 3, 5, 5, 7})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 32, 3, 5, 5, 5})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 32, 3, 5, 5, 0xFFFFFFFF})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 32, 4, 5, 5, 6, 1})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({2, 1, 8, 32, 2, 5, 5})), RASTER_STATUS_OK);  // no count
  EXPECT_EQ(decompress(blockOf({2, 1, 8, 32, 1, 5})), RASTER_STATUS_DAMAGED);
}

TEST(RasterChecked_BlockInfo, RefusesHeadersOfNoPicture) {
  EXPECT_EQ(decompress(blockOf({8, 1, 31, 32, 3, 5, 5, 6})), RASTER_STATUS_DAMAGED);  // pitch
  EXPECT_EQ(decompress(blockOf({8, 1, 32, 24, 3, 5, 5, 6})), RASTER_STATUS_DAMAGED);  // a code
  EXPECT_EQ(decompress(blockOf({1, 1, 4, 12, 0, 5})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({1, 1, 4, 0, 0, 5})), RASTER_STATUS_DAMAGED);
  // Of more pixels than 32-bit addresses reach.
  EXPECT_EQ(decompress(blockOf({8, 0x3C000000, 0x20000000, 0, 0, 5})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 0x80000000, 0x20000000, 32, 0, 5})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 0x3C000000, 0x20000000, 32, 0, 5})), RASTER_STATUS_LIMIT);
  EXPECT_EQ(decompress(blockOf({8, 0x80000000, 32, 32, 0, 5})), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(decompress(blockOf({8, 0x7FFFFFFF, 32, 32, 0, 5})), RASTER_STATUS_LIMIT);
  EXPECT_EQ(decompress(blockOf({20000, 1, 80000, 32, 1, 5})), RASTER_STATUS_LIMIT);
  EXPECT_EQ(decompress(blockOf({1, 20000, 4, 32, 1, 5})), RASTER_STATUS_LIMIT);
  EXPECT_EQ(decompress(blockOf({16384, 16384, 65536, 32, 3, 5, 5, 6})), RASTER_STATUS_LIMIT);
  EXPECT_EQ(decompress(blockOf({1, 1, 0x20000000, 32, 3, 5, 5, 6})), RASTER_STATUS_LIMIT);
  RasterBlockInfo info = {};
  const Bytes good = goodBlock(65, 5, 5);
  EXPECT_EQ(RasterChecked_BlockInfo(nullptr, 20, nullptr, &info), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), nullptr, nullptr),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_Decompress(good.data(), good.size(), nullptr, nullptr),
            RASTER_STATUS_NULL);
  RasterLimits limits = {5, 5, 100, good.size(), 0, 0};
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), &limits, &info), RASTER_STATUS_OK);
  limits.width = 4;
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), &limits, &info), RASTER_STATUS_LIMIT);
  limits = {5, 4, 100, good.size(), 0, 0};
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), &limits, &info), RASTER_STATUS_LIMIT);
  limits = {5, 5, 99, good.size(), 0, 0};
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), &limits, &info), RASTER_STATUS_LIMIT);
  limits = {5, 5, 100, good.size() - 1, 0, 0};
  EXPECT_EQ(RasterChecked_BlockInfo(good.data(), good.size(), &limits, &info), RASTER_STATUS_LIMIT);
}

// ---- Video -------------------------------------------------------------------------------------

constexpr uint32 kYuy2 = RASTER_VIDEO_YUY2;
constexpr uint32 kUyvy = RASTER_VIDEO_UYVY;
constexpr uint32 kYv12 = RASTER_VIDEO_YV12;

/// The bytes of a frame by its description.
size_t naiveFrame(uint32 format, size_t width, size_t height) {
  if (format != kYv12) return width * height / 2 * 4;
  const size_t evenWidth = width + width % 2;
  const size_t evenHeight = height + height % 2;
  return evenWidth * evenHeight + 2 * (evenWidth / 2) * (evenHeight / 2);
}

TEST(RasterChecked_YuvToRgb, EqualsTheExactConversion) {
  Random random(66);
  for (int round = 0; round < tests::rounds(3000); ++round) {
    GuardedView dst(random, tests::someFormat(random), random.below(30), random.below(30),
                    random.below(4) == 0);
    const RasterView& v = dst.view();
    const uint32 format = random.oneOf({kYuy2, kUyvy, kYv12, 0x30323449u});
    const size_t needed = naiveFrame(format, v.width, v.height);
    const bool isShort = random.below(5) == 0 && needed != 0;
    GuardedBuffer frame(needed - (isShort ? 1 : 0));
    frame.assign(random.bytes(frame.size()));
    const Bytes before = dst.bytes();
    const RasterStatus status = RasterChecked_YuvToRgb(&dst, frame.data(), frame.size(), format);
    RasterStatus expected = RASTER_STATUS_OK;
    if (format == 0x30323449u || v.bpp == 8) {
      expected = RASTER_STATUS_BAD_FORMAT;
    } else if (v.pitch != v.width * v.bpp / 8) {
      expected = RASTER_STATUS_BAD_VIEW;
    } else if (isShort) {
      expected = RASTER_STATUS_TRUNCATED;
    }
    ASSERT_EQ(status, expected) << "round " << round;
    const Bytes after = dst.bytes();
    dst.assign(before);
    if (status == RASTER_STATUS_OK) {
      Raster_YUVtoRGB(frame.data(), v.data, v.width, v.height, format,
                      static_cast<int32>(Raster_GetBPPDepth(v.depth, v.bpp)));
    }
    ASSERT_EQ(after, dst.bytes()) << "round " << round;
  }
}

TEST(RasterChecked_YuvBytes, CountsBeyond32Bits) {
  uint64 bytes = 77;
  EXPECT_EQ(RasterChecked_YuvBytes(kYuy2, 0x10000, 0x10000, &bytes), RASTER_STATUS_OK);
  EXPECT_EQ(bytes, uint64{1} << 33);
  EXPECT_EQ(RasterChecked_YuvBytes(kYv12, 0x10001, 3, &bytes), RASTER_STATUS_OK);
  EXPECT_EQ(bytes, uint64{6} * 0x8001 * 2);
  EXPECT_EQ(RasterChecked_YuvBytes(0x30323449, 2, 2, &bytes), RASTER_STATUS_BAD_FORMAT);
  EXPECT_EQ(RasterChecked_YuvBytes(kYv12, 0x80000000, 2, &bytes), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_YuvBytes(kYv12, 2, 0x80000000, &bytes), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_YuvBytes(kYv12, 2, 2, nullptr), RASTER_STATUS_NULL);
}

// The views say that they have so many bytes, and nothing looks at them.
TEST(RasterChecked_Compress, RefusesWhatNoBlockHolds) {
  uint8 byte = 0;
  uint8* block = nullptr;
  size_t size = 77;
  const RasterView none = {nullptr, 80, 40, 0, 2, 24, 32};
  EXPECT_EQ(RasterChecked_Compress(&none, &block, &size), RASTER_STATUS_NULL);
  if constexpr (sizeof(size_t) > 4) {
    const RasterView large = {&byte, size_t{~0u} << 2, 0x10000, 0x4000, 0x10001, 24, 32};
    EXPECT_EQ(RasterChecked_Compress(&large, &block, &size), RASTER_STATUS_TOO_BIG);
    EXPECT_EQ(RasterChecked_YuvToRgb(&large, &byte, 1, kYuy2), RASTER_STATUS_TRUNCATED);
    const RasterView larger = {&byte, size_t{~0u} << 4, 0x40000, 0x10000, 0x8000, 24, 32};
    EXPECT_EQ(RasterChecked_YuvToRgb(&larger, &byte, 1, kYuy2), RASTER_STATUS_TOO_BIG);
  }
  EXPECT_EQ(block, nullptr);
  EXPECT_EQ(size, 77u);
}

TEST(RasterChecked_YuvToRgb, RefusesOverlapAndNull) {
  Random random(67);
  const GuardedView dst(random, {24, 32}, 10, 10, false);
  EXPECT_EQ(RasterChecked_YuvToRgb(&dst, dst.view().data, 400, kYuy2), RASTER_STATUS_OVERLAP);
  EXPECT_EQ(RasterChecked_YuvToRgb(&dst, nullptr, 400, kYuy2), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_YuvToRgb(nullptr, dst.view().data, 400, kYuy2), RASTER_STATUS_NULL);
}

}  // namespace
