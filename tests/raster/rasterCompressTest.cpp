// SPDX-License-Identifier: MIT
//
// Compression against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>

#include "imageUtil.h"
#include "raster.h"
#include "reference/rasterCompressReference.h"
#include "support/allocated.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"
#include "utilAlloc.h"

namespace {

using tests::Allocated;
/// What the library asked for last.
size_t lastAllocation = 0;
/// A block that is handed out instead of fresh memory.
uint8* nextBlock = nullptr;

constexpr uint8 kUntouched = 0xD7;

}  // namespace

// Takes the place of the utility library's: every byte that the library hands back comes from here.
extern "C" void* UtilSafeMalloc0(size_t size) {
  lastAllocation = size;
  uint8* block = nextBlock != nullptr ? nextBlock : static_cast<uint8*>(malloc(size + 1));
  nextBlock = nullptr;
  memset(block, kUntouched, size);
  return block;
}

namespace {

using reference::Bytes;
using reference::Words;
using tests::Guard;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;

/// Compresses `src`, which is placed between guards, into memory that ends at a guard, and returns
/// the block.
Bytes compress(const Bytes& src, uint32 pitch, uint32 bpp, uint32 width, uint32 height,
               Guard guard = Guard::kAfter) {
  GuardedBuffer pixels(src.size(), guard);
  pixels.assign(src);
  GuardedBuffer room(src.size() + 32);
  nextBlock = room.data();
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(pixels.data(), pitch, bpp, width, height, &block, &size);
  EXPECT_EQ(block, room.data());
  EXPECT_LE(size, lastAllocation);
  return {block, block + size};
}

Bytes compressWords(const Words& pixels, Guard guard = Guard::kAfter) {
  const uint32 count = static_cast<uint32>(pixels.size());
  return compress(reference::toBytes(pixels), 0, 32, count, 1, guard);
}

uint32 wordOf(const Bytes& block, size_t index) {
  uint32 word = 0;
  memcpy(&word, block.data() + 4 * index, 4);
  return word;
}

/// A block with a code.
Bytes codedBlock(uint32 width, uint32 height, uint32 pitch, uint32 bpp, const Words& code) {
  Bytes block = reference::toBytes({width, height, pitch, bpp, static_cast<uint32>(code.size())});
  const Bytes payload = reference::toBytes(code);
  block.insert(block.end(), payload.begin(), payload.end());
  return block;
}

/// Decompresses a coded block from between guards into memory that ends at a guard.
Bytes decompress(const Bytes& block) {
  GuardedBuffer in(block.size());
  in.assign(block);
  const size_t bytes = size_t{wordOf(block, 1)} * wordOf(block, 2);
  GuardedBuffer room(bytes);
  nextBlock = room.data();
  uint8* data = nullptr;
  uint32 pitch = 0, bpp = 0, width = 0, height = 0;
  Raster_Decompress(in.data(), &data, &pitch, &bpp, &width, &height);
  EXPECT_EQ(data, room.data());
  EXPECT_EQ(lastAllocation, bytes);
  EXPECT_EQ(width, wordOf(block, 0));
  EXPECT_EQ(height, wordOf(block, 1));
  EXPECT_EQ(pitch, wordOf(block, 2));
  EXPECT_EQ(bpp, wordOf(block, 3));
  return room.bytes();
}

std::string describe(const Words& pixels) {
  std::string text = std::to_string(pixels.size()) + " pixels:";
  for (size_t i = 0; i < pixels.size() && i < 200; ++i) text += " " + std::to_string(pixels[i]);
  return text;
}

/// Compresses as the model does, and back to the same pixels where the block is coded.
void check(const Words& pixels, Guard guard = Guard::kAfter) {
  const uint32 count = static_cast<uint32>(pixels.size());
  const Bytes bytes = reference::toBytes(pixels);
  const Bytes block = compressWords(pixels, guard);
  ASSERT_EQ(block, reference::compress(bytes, 0, 32, count, 1)) << describe(pixels);
  if (wordOf(block, 4) != 0) {
    ASSERT_EQ(decompress(block), bytes) << describe(pixels);
  }
}

/// Runs of random lengths up to `longest`, of few colours, so that neighbours may be equal.
Words someRuns(Random& random, size_t count, uint32 longest, uint32 colors) {
  Words pixels;
  while (pixels.size() < count) {
    const uint32 color = random.below(colors);
    for (uint32 run = 1 + random.below(longest); run != 0 && pixels.size() < count; --run)
      pixels.push_back(color);
  }
  return pixels;
}

TEST(Raster_Compress, EqualsTheModelForRunsOfAllKinds) {
  Random random(1);
  for (int round = 0; round < tests::rounds(12000); ++round) {
    const size_t count = random.below(round % 50 == 0 ? 5000 : 150);
    const uint32 longest = random.oneOf({1u, 2u, 3u, 4u, 6u, 20u, 90u, 400u});
    const uint32 colors = random.oneOf({1u, 2u, 3u, 1000000000u});
    check(someRuns(random, count, longest, colors), tests::someGuard(random));
    if (HasFatalFailure()) return;
  }
}

TEST(Raster_Compress, EqualsTheModelForEveryImageOfTenPixelsAndThreeColors) {
  for (uint32 image = 0; image < 59049; ++image) {
    Words pixels;
    for (uint32 rest = image, i = 0; i < 10; ++i, rest /= 3) pixels.push_back(rest % 3);
    uint8* block = nullptr;
    uint32 size = 0;
    Raster_Compress(pixels.data(), 0, 32, 10, 1, &block, &size);
    const Allocated owned(block);
    ASSERT_EQ(Bytes(block, block + size),
              reference::compress(reference::toBytes(pixels), 0, 32, 10, 1))
        << describe(pixels);
  }
}

TEST(Raster_Compress, CodesRunsOfEveryLengthAtEveryPlace) {
  for (uint32 run = 1; run <= 140; ++run) {
    for (uint32 before = 0; before <= 40; ++before) {
      Words pixels;
      for (uint32 i = 0; i < before; ++i) pixels.push_back(i);
      pixels.insert(pixels.end(), run, 77777);
      for (uint32 i = 0; i < 20; ++i) pixels.push_back(i);
      check(pixels);
      if (HasFatalFailure()) return;
    }
  }
}

TEST(Raster_Compress, StoresACodeThatIsNoShorter) {
  const Words pixels = {5, 5, 5, 9};  // code 5 5 1 9
  const Bytes block = compress(reference::toBytes(pixels), 16, 32, 4, 1);
  EXPECT_EQ(wordOf(block, 4), 0u);
  EXPECT_EQ(block.size(), 36u);
  EXPECT_EQ(Bytes(block.begin() + 20, block.end()), reference::toBytes(pixels));
}

TEST(Raster_Compress, CodesEightEqualPixelsInThreeWords) {
  const Bytes block = compress(reference::toBytes(Words(8, 0xAABBCCDD)), 32, 32, 8, 1);
  EXPECT_EQ(block, reference::toBytes({8, 1, 32, 32, 3, 0xAABBCCDD, 0xAABBCCDD, 6}));
}

TEST(Raster_Compress, StopsWhereTheCodeReachesThePixels) {
  const Bytes block = compressWords({1, 1, 2, 2});
  EXPECT_EQ(block, reference::toBytes({4, 1, 16, 32, 0, 1, 1, 2, 2}));
}

// The code of pairs is longer than they are, so a long run at the end would still save the image.
TEST(Raster_Compress, StopsEvenWhenTheRestWouldSaveIt) {
  Words pixels;
  for (uint32 i = 0; i < 100; ++i) pixels.insert(pixels.end(), 2, i);
  pixels.insert(pixels.end(), 99, 1000);
  check(pixels);  // 300 words of code for 200 pixels, then 3 for 99
  EXPECT_EQ(wordOf(compressWords(pixels), 4), 0u);
  pixels.insert(pixels.end(), 10, 1000);
  check(pixels);
  EXPECT_NE(wordOf(compressWords(pixels), 4), 0u);
}

TEST(Raster_Compress, StoresPixelsThatNeverRepeat) {
  Words pixels;
  for (uint32 i = 0; i < 1000; ++i) pixels.push_back(i % 2);
  EXPECT_EQ(wordOf(compressWords(pixels), 4), 0u);
  check(pixels);
}

TEST(Raster_Compress, AppendsTheCountOfARunThatEndsTheImage) {
  const Bytes block = compressWords({1, 2, 3, 3, 3, 3, 3});
  EXPECT_EQ(block, reference::toBytes({7, 1, 28, 32, 5, 1, 2, 3, 3, 3}));
}

TEST(Raster_Compress, StoresAnEmptyImage) {
  for (const uint32 bpp : {8u, 16u, 24u, 32u}) {
    uint8* block = nullptr;
    uint32 size = 0;
    Raster_Compress(nullptr, 0, bpp, 0, 7, &block, &size);
    const Allocated owned(block);
    EXPECT_EQ(Bytes(block, block + size), reference::toBytes({0, 7, 0, bpp, 0}));
    EXPECT_EQ(lastAllocation, 32u);
  }
}

TEST(Raster_Compress, StoresOtherDepthsWhateverTheContent) {
  Random random(2);
  for (const uint32 bpp : {8u, 16u, 24u}) {
    for (const uint32 pitch : {0u, 10 * bpp / 8, 10 * bpp / 8 + 1, 64u, 7u}) {
      const uint32 bytes = pitch == 0 ? 10 * bpp / 8 : pitch;
      for (const Bytes& src : {Bytes(5 * bytes), random.bytes(5 * bytes)}) {
        const Bytes block = compress(src, pitch, bpp, 10, 5);
        EXPECT_EQ(block, reference::compress(src, pitch, bpp, 10, 5))
            << bpp << " bits, pitch " << pitch;
        EXPECT_EQ(wordOf(block, 2), bytes);
      }
    }
  }
}

TEST(Raster_Compress, TakesAPitchOfZeroAsThatOfTheWidth) {
  const Bytes block = compress(Bytes(30, 5), 0, 24, 10, 1);
  EXPECT_EQ(wordOf(block, 2), 30u);
  EXPECT_EQ(lastAllocation, 62u);
}

// The quotient of height x pitch and the pixel size is truncated.
TEST(Raster_Compress, TakesWholePixelsOfAnOddPitch) {
  Random random(3);
  for (uint32 pitch = 1; pitch < 40; ++pitch) {
    for (uint32 height = 0; height < 6; ++height) {
      const Bytes src = random.bytes(size_t{pitch} * height);
      const Bytes flat(src.size(), 3);
      EXPECT_EQ(compress(src, pitch, 32, 2, height),
                reference::compress(src, pitch, 32, 2, height));
      EXPECT_EQ(compress(flat, pitch, 32, 2, height),
                reference::compress(flat, pitch, 32, 2, height));
      EXPECT_EQ(lastAllocation, size_t{pitch} * height / 4 * 4 + 32);
    }
  }
}

TEST(Raster_Compress, PanicsForOtherDepthsAtLine114) {
  for (const uint32 bpp : {0u, 1u, 7u, 9u, 12u, 15u, 40u, 64u, 0xFFFFFFFFu}) {
    uint8* block = nullptr;
    uint32 size = 0;
    const Messages said =
        tests::messagesOf([&] { Raster_Compress(nullptr, 4, bpp, 1, 1, &block, &size); });
    const Allocated owned(block);
    EXPECT_EQ(said.panic, "NOT_IMPLEMENTED lib/raster/rasterCompress:114\n") << bpp;
    EXPECT_EQ(said.warning, "");
  }
}

TEST(Raster_Decompress, ExpandsEveryCodeAsTheModelDoes) {
  Random random(4);
  for (int round = 0; round < tests::rounds(8000); ++round) {
    Words code;
    const uint32 longest = random.oneOf({1u, 3u, 40u, 300u});
    for (uint32 words = 1 + random.below(60); words != 0; --words)
      code.push_back(random.below(random.oneOf({2u, 4u, longest})));
    const Words pixels = reference::decode(code);
    Bytes expected = reference::toBytes(pixels);
    // Bytes that the code leaves are zero.
    expected.resize(expected.size() + random.below(3) * random.below(90));
    const uint32 bytes = static_cast<uint32>(expected.size());
    ASSERT_EQ(decompress(codedBlock(9, 1, bytes, 32, code)), expected) << describe(code);
  }
}

TEST(Raster_Decompress, WritesNothingForACountOfZero) {
  const Words code = {7, 7, 0, 7, 7, 0, 8, 9, 9, 2};
  const Words pixels = {7, 7, 7, 7, 8, 9, 9, 9, 9};
  EXPECT_EQ(decompress(codedBlock(9, 1, 36, 32, code)), reference::toBytes(pixels));
}

// A pair right after a count is not one with the pixel before the count.
TEST(Raster_Decompress, TakesTheWordAfterACountAsAFreshLiteral) {
  EXPECT_EQ(decompress(codedBlock(5, 1, 20, 32, {7, 7, 1, 7, 5})),
            reference::toBytes({7, 7, 7, 7, 5}));
}

TEST(Raster_Decompress, EndsAfterAPairWithoutACount) {
  EXPECT_EQ(decompress(codedBlock(3, 1, 12, 32, {1, 7, 7})), reference::toBytes({1, 7, 7}));
}

TEST(Raster_Decompress, ZeroesWhatACodeLeavesUnwritten) {
  const Bytes data = decompress(codedBlock(100, 2, 403, 32, {1, 6, 6, 20}));
  Bytes expected = reference::toBytes({1});
  const Bytes run = reference::toBytes(Words(22, 6));
  expected.insert(expected.end(), run.begin(), run.end());
  expected.resize(806);
  EXPECT_EQ(data, expected);
}

TEST(Raster_Decompress, ReturnsTheBufferAsAllocatedForAnUnknownDepth) {
  for (const uint32 bpp : {0u, 12u, 15u, 64u})
    EXPECT_EQ(decompress(codedBlock(4, 1, 16, bpp, {1, 2, 3})), Bytes(16, kUntouched));
}

TEST(Raster_Compress, PanicsWhereTheSizeOfTheBlockDoesNotFit) {
  struct Case {
    uint32 pitch, bpp, width, height;
  };
  // A block of 2^32 bytes, one of many more, and more pixels than 32 bits can count.
  const Case cases[] = {
      {0xFFFFFFEC, 8, 1, 1},  {0x7FFFFFFF, 16, 1, 0xFFFFFFFF}, {3 << 28, 24, 1, 6},
      {0, 24, 0x15555555, 4}, {0x10000, 8, 0x10000, 0x10000},  {0x80000000, 32, 1, 9}};
  for (const Case& c : cases) {
    lastAllocation = 0;
    uint8* block = nullptr;
    uint32 size = 7;
    const Messages said = tests::messagesOf(
        [&] { Raster_Compress(nullptr, c.pitch, c.bpp, c.width, c.height, &block, &size); });
    EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", "lib/raster/rasterCompress"))
        << said.panic;
    EXPECT_EQ(lastAllocation, 0u);
    EXPECT_EQ(size, 7u);
  }
}

TEST(Raster_Decompress, PanicsForACodeOfAStoredDepthAtLine187) {
  for (const uint32 bpp : {8u, 16u, 24u}) {
    const Bytes block = codedBlock(4, 1, 4, bpp, {1});
    uint8* data = nullptr;
    uint32 pitch, bits, width, height;
    const Messages said = tests::messagesOf(
        [&] { Raster_Decompress(block.data(), &data, &pitch, &bits, &width, &height); });
    const Allocated owned(data);
    EXPECT_EQ(said.panic, "NOT_IMPLEMENTED lib/raster/rasterCompress:187\n");
    EXPECT_EQ(bits, bpp);
  }
}

// Deliberate: the pixels of a stored block go where the caller's pointer is.
TEST(Raster_Decompress, CopiesAStoredBlockOverTheCallersPointer) {
  Random random(5);
  for (const uint32 bpp : {8u, 16u, 24u, 32u, 12u}) {
    union {
      uint8* data;
      uint8 bytes[256];
    } place;
    memset(&place, 0x11, sizeof place);
    const Bytes pixels = random.bytes(60);
    Bytes block = reference::toBytes({5, 3, 20, bpp, 0});
    block.insert(block.end(), pixels.begin(), pixels.end());
    GuardedBuffer in(block.size());
    in.assign(block);
    GuardedBuffer room(60);
    nextBlock = room.data();
    uint32 pitch, bits, width, height;
    Raster_Decompress(in.data(), &place.data, &pitch, &bits, &width, &height);
    EXPECT_EQ(pitch, 20u);
    EXPECT_EQ(bits, bpp);
    EXPECT_EQ(width, 5u);
    EXPECT_EQ(height, 3u);
    EXPECT_EQ(Bytes(place.bytes, place.bytes + 60), pixels);
    EXPECT_EQ(place.bytes[60], 0x11);
    EXPECT_EQ(lastAllocation, 60u);
    EXPECT_EQ(room.bytes(), Bytes(60, kUntouched));
  }
}

// A stored block of an odd pitch has fewer bytes than the decoder copies; the allocation has them.
TEST(Raster_Decompress, ReadsAStoredBlockOfAnOddPitchWithinItsAllocation) {
  const Bytes src(39, 9);
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(src.data(), 13, 24, 4, 3, &block, &size);
  const Allocated owned(block);
  EXPECT_EQ(size, 59u);
  uint8* place[16] = {};
  uint32 pitch, bpp, width, height;
  GuardedBuffer room(39);
  nextBlock = room.data();
  Raster_Decompress(block, place, &pitch, &bpp, &width, &height);
  EXPECT_EQ(0, memcmp(place, src.data(), 39));
}

/// A screen of windows: flat areas, lines of specks and a patch of noise.
Words syntheticScreen(uint32 width, uint32 height) {
  Random random(6);
  Words pixels(size_t{width} * height, 0x00336699);
  for (int window = 0; window < 6; ++window) {
    const uint32 left = random.below(width / 2);
    const uint32 top = random.below(height / 2);
    for (uint32 y = top; y < top + height / 2; ++y) {
      for (uint32 x = left; x < left + width / 2; ++x) {
        const bool speck = y % 16 < 10 && window != 3 && random.below(9) == 0;
        const uint32 paper = 0x00FFFFFF - static_cast<uint32>(window);
        pixels[size_t{y} * width + x] = window == 5 ? random.word() : speck ? 0 : paper;
      }
    }
  }
  return pixels;
}

TEST(Raster_Decompress, GivesBackAScreen) {
  for (const uint32 width : {64u, 333u}) check(syntheticScreen(width, 240));
}

/// A picture of tests/data as pixels of four bytes.
Words screenshot(const char* name) {
  ImageUtilImage image{};
  if (!ImageUtil_ReadPNG(&image, (std::string(TESTS_DATA) + "/" + name).c_str(), 0)) return {};
  const size_t bytes = image.bpp / 8;
  Words pixels;
  for (uint32 y = 0; y < image.height; ++y) {
    for (uint32 x = 0; x < image.width; ++x) {
      uint32 pixel = 0;
      memcpy(&pixel, image.data + size_t{y} * image.bytesPerLine + x * bytes, bytes);
      pixels.push_back(pixel);
    }
  }
  ImageUtil_FreeImageData(&image);
  return pixels;
}

TEST(Raster_Decompress, GivesBackScreenshots) {
  for (const char* name : {"terminals.png", "clients.png"}) {
    const Words pixels = screenshot(name);
    ASSERT_EQ(pixels.size(), 1280u * 800u) << name;
    check(pixels);
    EXPECT_LT(compressWords(pixels).size(), pixels.size() * 4 / 6) << name;
  }
}

}  // namespace
