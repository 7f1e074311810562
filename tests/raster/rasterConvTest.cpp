// SPDX-License-Identifier: MIT
//
// Format codes and conversion against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <functional>
#include <string>

#include "raster.h"
#include "reference/rasterConvReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"
#include "support/someValues.h"

namespace {

using reference::Bytes;
using reference::Spot;
using tests::Guard;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;
using Palette = std::vector<uint32>;

constexpr int32 kSources[] = {15, 16, 24, 32};
constexpr int32 kDestinations[] = {3, 6, 8, 15, 16, 24, 32};
constexpr char kPath[] = "lib/raster/rasterConv";

uint32 bytesPerPixel(int32 depth) {
  return depth == 15 ? 2 : std::max(1u, static_cast<uint32>(depth) / 8);
}

/// A pair of formats; a pseudo-colour source has one byte a pixel whatever its depth.
struct Pair {
  int32 srcDepth;
  int32 dstDepth;
  bool pseudoColor;

  uint32 srcBytes() const { return pseudoColor ? 1 : bytesPerPixel(srcDepth); }
  uint32 dstBytes() const { return bytesPerPixel(dstDepth); }
  bool isCopy() const { return !pseudoColor && srcDepth == dstDepth; }
  std::string name() const {
    return std::to_string(srcDepth) + (pseudoColor ? " pseudo to " : " to ") +
           std::to_string(dstDepth);
  }
};

std::vector<Pair> allPairs() {
  std::vector<Pair> pairs;
  for (const int32 dst : kDestinations) {
    for (const int32 src : kSources) pairs.push_back({src, dst, false});
    for (const int32 depth : {-1, 1, 4, 8}) pairs.push_back({depth, dst, true});
    if (bytesPerPixel(dst) == 1) pairs.push_back({dst, dst, false});
  }
  return pairs;
}

Palette somePalette(Random& random, size_t count) {
  Palette palette(count);
  for (uint32& color : palette) color = random.word();
  return palette;
}

/// Memory that ends or begins at a guard page, with these bytes.
class Memory : public GuardedBuffer {
 public:
  Memory(Random& random, const Bytes& bytes)
      : GuardedBuffer(bytes.size(), tests::someGuard(random)) {
    assign(bytes);
  }
};

/// The entries as memory of just their size.
class PaletteMemory : public Memory {
 public:
  PaletteMemory(Random& random, const Palette& palette) : Memory(random, bytesOf(palette)) {}
  const uint32* entries() const {
    return static_cast<const uint32*>(static_cast<const void*>(data()));
  }

 private:
  static Bytes bytesOf(const Palette& palette) {
    Bytes bytes(palette.size() * sizeof(uint32));
    if (!bytes.empty()) memcpy(bytes.data(), palette.data(), bytes.size());
    return bytes;
  }
};

uint32* words(uint8* bytes) { return static_cast<uint32*>(static_cast<void*>(bytes)); }
const uint32* words(const uint8* bytes) {
  return static_cast<const uint32*>(static_cast<const void*>(bytes));
}

// ---- Modes and single pixels -------------------------------------------------------------------

TEST(Raster_IsModeReasonable, AcceptsTheUsableModesOnly) {
  EXPECT_TRUE(Raster_IsModeReasonable(24, 32, false));
  EXPECT_TRUE(Raster_IsModeReasonable(24, 24, false));
  EXPECT_TRUE(Raster_IsModeReasonable(15, 16, false));
  EXPECT_TRUE(Raster_IsModeReasonable(16, 16, false));
  EXPECT_FALSE(Raster_IsModeReasonable(8, 8, false));
  EXPECT_FALSE(Raster_IsModeReasonable(16, 24, false));
  EXPECT_FALSE(Raster_IsModeReasonable(15, 32, false));
  EXPECT_TRUE(Raster_IsModeReasonable(1, 8, true));
  EXPECT_FALSE(Raster_IsModeReasonable(8, 16, true));

  int reasonable = 0;
  for (uint32 depth = 0; depth < 70; ++depth) {
    for (uint32 bpp = 0; bpp < 70; ++bpp) {
      reasonable += Raster_IsModeReasonable(depth, bpp, false) ? 1 : 0;
      EXPECT_EQ(Raster_IsModeReasonable(depth, bpp, true), bpp == 8);
    }
  }
  EXPECT_EQ(reasonable, 4);
}

// Deliberate: a mode with an unused byte has depth 24.
TEST(Raster_IsModeReasonable, RefusesDepth32) {
  EXPECT_FALSE(Raster_IsModeReasonable(32, 32, false));
}

TEST(Raster_GetBPPDepth, TellsDepth24In32BitsApartAndNothingElse) {
  EXPECT_EQ(Raster_GetBPPDepth(24, 32), 32u);
  EXPECT_EQ(Raster_GetBPPDepth(24, 24), 24u);
  EXPECT_EQ(Raster_GetBPPDepth(16, 32), 16u);
  EXPECT_EQ(Raster_GetBPPDepth(32, 32), 32u);
  for (uint32 depth = 0; depth < 40; ++depth) {
    for (uint32 bpp = 0; bpp < 40; ++bpp) {
      const bool isSpecial = depth == 24 && bpp == 32;
      EXPECT_EQ(Raster_GetBPPDepth(depth, bpp), isSpecial ? 32 : depth);
    }
  }
}

uint32 one(uint32 pixel, int32 srcDepth, int32 dstDepth) {
  return Raster_ConvertOnePixel(pixel, srcDepth, dstDepth, false, nullptr);
}

TEST(Raster_ConvertOnePixel, EqualsTheModelForEvery16BitValueAndManyLongerOnes) {
  Random random(1);
  for (const int32 src : kSources) {
    for (const int32 dst : kDestinations) {
      for (uint32 i = 0; i < 0x20000; ++i) {
        const uint32 pixel = i < 0x10000 ? i : random.word();
        ASSERT_EQ(one(pixel, src, dst), reference::convertOnePixel(pixel, src, dst, false, {}))
            << std::hex << pixel << std::dec << " of " << src << " to " << dst;
      }
    }
  }
}

TEST(Raster_ConvertOnePixel, GivesTheNamedValues) {
  EXPECT_EQ(one(0xFFFF, 16, 32), 0x00FFFFFFu);
  EXPECT_EQ(one(0x8410, 16, 32), 0x00848284u);
  EXPECT_EQ(one(0x7FFF, 15, 16), 0xFFFFu);
  EXPECT_EQ(one(0x0200, 15, 16), 0x0420u);
  EXPECT_EQ(one(0x12345678, 32, 32), 0x12345678u);
  EXPECT_EQ(one(0x00FFFFFF, 24, 16), 0xFFFFu);
  EXPECT_EQ(one(0x00FFFFFF, 24, 15), 0x7FFFu);
  EXPECT_EQ(one(0x00FFFFFF, 24, 8), 0xFFu);
  EXPECT_EQ(one(0x00FF0000, 24, 8), 0x07u);
  EXPECT_EQ(one(0x000000FF, 24, 8), 0xC0u);
  EXPECT_EQ(one(0x00FFFFFF, 24, 3), 0xA4u);
}

// Deliberate: the shifts of a single pixel are not those of code 6.
TEST(Raster_ConvertOnePixel, TakesOtherBitsThanTheTopOnesForCode6) {
  EXPECT_EQ(one(0x00FFFFFF, 32, 6), 0x0Fu);
  EXPECT_EQ(one(0xFFFFFFFF, 32, 6), 0x3Fu);
  EXPECT_EQ(one(0xFFFF, 16, 6), 0x0Cu);
}

// Deliberate: a value that has the format already keeps its unused bits.
TEST(Raster_ConvertOnePixel, DoesNotCutSourcesToTheirSize) {
  EXPECT_EQ(one(0xABCD1234, 16, 16), 0xABCD1234u);
  EXPECT_EQ(one(0xABCDFFFF, 15, 15), 0xABCDFFFFu);
  EXPECT_EQ(one(0x00020000, 16, 6), 0x10u);
}

TEST(Raster_ConvertOnePixel, LooksAWholeWordUpInThePalette) {
  Random random(2);
  Palette palette = somePalette(random, 1001);
  palette[5] = 0x00FF0000;
  const PaletteMemory memory(random, palette);
  EXPECT_EQ(Raster_ConvertOnePixel(5, 8, 16, true, memory.entries()), 0xF800u);
  EXPECT_EQ(Raster_ConvertOnePixel(5, 8, 32, true, memory.entries()), 0x00FF0000u);
  for (const int32 dst : kDestinations) {
    for (uint32 i = 0; i < palette.size(); ++i) {
      ASSERT_EQ(Raster_ConvertOnePixel(i, 8, dst, true, memory.entries()),
                reference::convertOnePixel(i, 8, dst, true, palette));
    }
  }
}

/// Expects `call` to warn with these words and then to panic.
void expectFatal(const std::string& warning, const std::function<void()>& call) {
  const Messages said = tests::messagesOf(call);
  EXPECT_EQ(said.warning, warning);
  EXPECT_TRUE(tests::isPanic(said.panic, "NOT_IMPLEMENTED", kPath)) << said.panic;
  EXPECT_EQ(said.log, "");
}

TEST(Raster_ConvertOnePixel, PanicsForABadCodeBeforeThePaletteIsRead) {
  const auto fatal = [](const std::string& warning, int32 src, int32 dst, bool pseudoColor) {
    expectFatal(warning, [=] { Raster_ConvertOnePixel(5, src, dst, pseudoColor, nullptr); });
  };
  for (const int32 depth : {4, 0, -8, 9, 16, 32}) {
    fatal("Raster convert pixels invalid depth for pseudo color " + std::to_string(depth) + "\n",
          depth, 7, true);
  }
  for (const int32 depth : {0, 3, 6, 8, 17, -16}) {
    fatal("Raster convert one pixel invalid source depth " + std::to_string(depth) + "\n", depth, 7,
          false);
  }
  for (const int32 depth : {0, 4, 7, 33, -32}) {
    const std::string warning =
        "Raster convert one pixel invalid depth " + std::to_string(depth) + "\n";
    for (const int32 src : kSources) fatal(warning, src, depth, false);
    fatal(warning, 8, depth, true);
  }
}

// ---- Rectangles --------------------------------------------------------------------------------

/// Which of the exported functions converts.
enum class Entry { kGeneral, kTo32, kFrom32, kCopy };

void convert(Entry entry, uint8* dst, const Spot& to, const uint8* src, const Spot& from,
             const Pair& pair, const uint32* palette, uint32 width, uint32 height) {
  dst += to.base;
  src += from.base;
  switch (entry) {
    case Entry::kGeneral:
      Raster_ConvertPixels(dst, to.pitch, pair.dstDepth, src, from.pitch, pair.srcDepth,
                           pair.pseudoColor, palette, from.x, from.y, to.x, to.y, width, height);
      break;
    case Entry::kTo32:
      Raster_ConvertPixelsTo32(words(dst), to.pitch, src, from.pitch, pair.srcDepth,
                               pair.pseudoColor, palette, from.x, from.y, to.x, to.y, width,
                               height);
      break;
    case Entry::kFrom32:
      Raster_ConvertPixelsFrom32(dst, to.pitch, pair.dstDepth, words(src), from.pitch, from.x,
                                 from.y, to.x, to.y, width, height);
      break;
    case Entry::kCopy:
      Raster_CopyPixels(dst, to.pitch, src, from.pitch, pair.dstDepth, from.x, from.y, to.x, to.y,
                        width, height);
      break;
  }
}

Entry someEntry(Random& random, const Pair& pair) {
  if (random.below(2) == 0) return Entry::kGeneral;
  if (pair.isCopy() && random.below(2) == 0) return Entry::kCopy;
  if (pair.dstDepth == 32) return Entry::kTo32;
  return pair.srcDepth == 32 ? Entry::kFrom32 : Entry::kGeneral;
}

Spot someSpot(Random& random, uint32 width, uint32 bytes) {
  Spot spot{};
  spot.base = random.below(70);
  spot.x = random.below(9);
  spot.y = random.below(4);
  spot.pitch = (spot.x + width) * bytes + (random.below(3) == 0 ? 0 : random.below(40));
  return spot;
}

/// The bytes of a picture that ends with the last pixel of the rectangle at `spot`.
size_t sizeWith(const Spot& spot, uint32 width, uint32 height, uint32 bytes, bool isCopy) {
  const bool wholePixels = !isCopy && (bytes == 2 || bytes == 4);
  const size_t step = wholePixels ? spot.pitch / bytes * bytes : spot.pitch;
  const size_t lastRow = spot.y + (height == 0 ? 0 : height - 1);
  return spot.base + lastRow * step + size_t{spot.x + width} * bytes;
}

std::string describe(const Spot& s) {
  return "base " + std::to_string(s.base) + " pitch " + std::to_string(s.pitch) + " at " +
         std::to_string(s.x) + "," + std::to_string(s.y);
}

/// Indices below the palette's size, everywhere in the picture.
Bytes someSource(Random& random, size_t size, const Pair& pair, size_t paletteSize) {
  Bytes bytes = random.bytes(size);
  if (!pair.pseudoColor) return bytes;
  for (uint8& byte : bytes) byte = static_cast<uint8>(byte % paletteSize);
  return bytes;
}

void checkRandomRectangle(Random& random, const Pair& pair) {
  const uint32 width = tests::someWidth(random, 140);
  const uint32 height = random.below(width > 150 ? 4 : 12);
  const Spot to = someSpot(random, width, pair.dstBytes());
  const Spot from = someSpot(random, width, pair.srcBytes());
  const Palette palette = somePalette(random, 1 + random.below(256));
  const size_t dstSize = sizeWith(to, width, height, pair.dstBytes(), pair.isCopy());
  const size_t srcSize = sizeWith(from, width, height, pair.srcBytes(), pair.isCopy());
  const Bytes source = someSource(random, srcSize, pair, palette.size());
  Bytes expected = random.bytes(dstSize);
  const Memory src(random, source);
  Memory dst(random, expected);
  const PaletteMemory colors(random, palette);
  const Entry entry = someEntry(random, pair);

  reference::convertPixels(expected, to, pair.dstDepth, source, from, pair.srcDepth,
                           pair.pseudoColor, palette, width, height);
  convert(entry, dst.data(), to, src.data(), from, pair, colors.entries(), width, height);
  ASSERT_EQ(dst.bytes(), expected)
      << pair.name() << " by entry " << static_cast<int>(entry) << ": from " << describe(from)
      << ", to " << describe(to) << ", size " << width << "x" << height << ", palette of "
      << palette.size();
  ASSERT_EQ(src.bytes(), source);
}

TEST(Raster_ConvertPixels, EqualsTheModelAndTouchesNothingElse) {
  Random random(3);
  for (const Pair& pair : allPairs()) {
    for (int round = 0; round < tests::rounds(150); ++round) {
      checkRandomRectangle(random, pair);
      if (HasFatalFailure()) FAIL() << "round " << round;
    }
  }
}

/// Converts every value that a pixel can have, or very many, as one picture.
TEST(Raster_ConvertPixels, EqualsTheModelForEveryShortPixelAndManyLongOnes) {
  constexpr uint32 kWidth = 256;
  constexpr uint32 kHeight = 256;
  Random random(4);
  const Palette palette = somePalette(random, 256);
  for (const Pair& pair : allPairs()) {
    const uint32 srcBytes = pair.srcBytes();
    Bytes source = random.bytes(size_t{kWidth} * kHeight * srcBytes);
    if (srcBytes <= 2) {
      for (size_t i = 0; i < source.size(); ++i)
        source[i] = static_cast<uint8>(i / srcBytes >> (8 * (i % srcBytes)));
    }
    const Spot from{0, kWidth * srcBytes, 0, 0};
    const Spot to{0, kWidth * pair.dstBytes(), 0, 0};
    Bytes expected(size_t{kWidth} * kHeight * pair.dstBytes());
    Bytes actual = expected;
    reference::convertPixels(expected, to, pair.dstDepth, source, from, pair.srcDepth,
                             pair.pseudoColor, palette, kWidth, kHeight);
    convert(Entry::kGeneral, actual.data(), to, source.data(), from, pair, palette.data(), kWidth,
            kHeight);
    for (size_t i = 0; i < actual.size(); ++i)
      ASSERT_EQ(actual[i], expected[i]) << pair.name() << ", byte " << i;
  }
}

/// Rows that end at an inaccessible page: no fourth byte of a 24-bit pixel, no whole word of
/// palette indices past the last group of four.
TEST(Raster_ConvertPixels, ReadsAndWritesNothingBesideARowOfAnyWidth) {
  Random random(5);
  const Palette palette = somePalette(random, 256);
  for (const Pair& pair : allPairs()) {
    for (uint32 width = 0; width < 200; ++width) {
      for (const Guard guard : {Guard::kBefore, Guard::kAfter}) {
        const Bytes source = random.bytes(size_t{width} * pair.srcBytes());
        Bytes expected = random.bytes(size_t{width} * pair.dstBytes());
        GuardedBuffer src(source.size(), guard);
        GuardedBuffer dst(expected.size(), guard);
        src.assign(source);
        dst.assign(expected);
        reference::convertPixels(expected, {}, pair.dstDepth, source, {}, pair.srcDepth,
                                 pair.pseudoColor, palette, width, 1);
        convert(Entry::kGeneral, dst.data(), {}, src.data(), {}, pair, palette.data(), width, 1);
        ASSERT_EQ(dst.bytes(), expected) << pair.name() << ", width " << width;
      }
    }
  }
}

TEST(Raster_ConvertPixels, WritesAndReadsNothingForAWidthOrHeightOfZero) {
  const GuardedBuffer nothing(0);
  GuardedBuffer nowhere(0);
  for (const Pair& pair : allPairs()) {
    const Spot spot{0, 64, 1, 1};
    convert(Entry::kGeneral, nowhere.data(), spot, nothing.data(), spot, pair, nullptr, 0, 5);
    convert(Entry::kGeneral, nowhere.data(), spot, nothing.data(), spot, pair, nullptr, 5, 0);
  }
}

/// One row of pixels, converted.
Bytes converted(const Bytes& source, int32 srcDepth, int32 dstDepth, uint32 pixels) {
  Bytes result(size_t{pixels} * bytesPerPixel(dstDepth));
  Raster_ConvertPixels(result.data(), 0, dstDepth, source.data(), 0, srcDepth, false, nullptr, 0, 0,
                       0, 0, pixels, 1);
  return result;
}

TEST(Raster_ConvertPixels, GivesTheNamedValues) {
  EXPECT_EQ(converted({1, 2, 3, 4, 5, 6}, 24, 32, 2), (Bytes{1, 2, 3, 0xFF, 4, 5, 6, 0xFF}));
  EXPECT_EQ(converted({1, 2, 3, 4}, 32, 32, 1), (Bytes{1, 2, 3, 4}));
  EXPECT_EQ(converted({0xFF, 0xFF}, 16, 32, 1), (Bytes{0xFF, 0xFF, 0xFF, 0xFF}));
  EXPECT_EQ(converted({0xFF, 0xFF, 0xFF}, 24, 6, 1), Bytes{0x3F});
  EXPECT_EQ(converted({0xFF, 0xFF}, 16, 6, 1), Bytes{0x3F});
  EXPECT_EQ(converted({0xFF, 0xFF, 0xFF, 0x00}, 32, 3, 1), Bytes{0xA4});
  EXPECT_EQ(converted({0xFF, 0x7F}, 15, 8, 1), Bytes{0xFF});
}

// Deliberate: what a single pixel of code 6 does not do.
TEST(Raster_ConvertPixels, TakesTheTopBitsForCode6) {
  EXPECT_EQ(converted({0xFF, 0xFF, 0xFF, 0x00}, 32, 6, 1), Bytes{0x3F});
  EXPECT_EQ(one(0x00FFFFFF, 32, 6), 0x0Fu);
}

TEST(Raster_ConvertPixels, CopiesEqualCodesUnchanged) {
  EXPECT_EQ(converted({0x34, 0x92}, 16, 16, 1), (Bytes{0x34, 0x92}));
  EXPECT_EQ(converted({0xFF, 0xFF}, 15, 15, 1), (Bytes{0xFF, 0xFF}));
  EXPECT_EQ(converted({0xE7, 0x01}, 8, 8, 2), (Bytes{0xE7, 0x01}));
  EXPECT_EQ(converted({0xE7, 0x01}, 3, 3, 2), (Bytes{0xE7, 0x01}));
}

// Deliberate: no code is checked when source and destination agree.
TEST(Raster_ConvertPixels, CopiesNothingForCode7) {
  uint8 dst[4] = {1, 2, 3, 4};
  const uint8 src[4] = {5, 6, 7, 8};
  Raster_ConvertPixels(dst, 4, 7, src, 4, 7, false, nullptr, 0, 0, 0, 0, 4, 1);
  EXPECT_EQ(0, memcmp(dst, "\1\2\3\4", 4));
}

TEST(Raster_ConvertPixels, ConvertsPseudoColorsOfDepth4And8) {
  Palette palette(256);
  palette[0] = 0x12FFFFFF;
  palette[1] = 0x3400FF00;
  const uint8 src[2] = {0, 1};
  uint8 dst15[4] = {};
  Raster_ConvertPixels(dst15, 4, 15, src, 2, 4, true, palette.data(), 0, 0, 0, 0, 2, 1);
  EXPECT_EQ(Bytes(dst15, dst15 + 4), (Bytes{0xFF, 0x7F, 0xE0, 0x03}));
  // 8 to 8 is a conversion when the source is pseudo-colour.
  uint8 dst8[2] = {};
  Raster_ConvertPixels(dst8, 2, 8, src, 2, 8, true, palette.data(), 0, 0, 0, 0, 2, 1);
  EXPECT_EQ(Bytes(dst8, dst8 + 2), (Bytes{0xFF, 0x38}));
}

// Deliberate: palette colours keep their top byte, true colours become opaque.
TEST(Raster_ConvertPixels, KeepsTheTopByteOfPaletteEntries) {
  const Palette palette = {0x12345678};
  const uint8 src[1] = {0};
  uint8 dst[4] = {};
  Raster_ConvertPixels(dst, 4, 32, src, 1, 8, true, palette.data(), 0, 0, 0, 0, 1, 1);
  EXPECT_EQ(Bytes(dst, dst + 4), (Bytes{0x78, 0x56, 0x34, 0x12}));
}

// Deliberate: rounded for the first row too, other than in a fill.
TEST(Raster_ConvertPixels, RoundsThePitchOf32BitPixelsForRowsAndSteps) {
  const Bytes source = {1, 2, 3, 4, 5, 6};  // two rows of one 24-bit pixel
  Bytes dst(20);
  Raster_ConvertPixels(dst.data(), 7, 32, source.data(), 3, 24, false, nullptr, 0, 0, 1, 1, 1, 2);
  EXPECT_EQ(dst, (Bytes{0, 0, 0, 0, 0, 0, 0, 0, 1, 2, 3, 0xFF, 4, 5, 6, 0xFF, 0, 0, 0, 0}));
}

TEST(Raster_ConvertPixels, RoundsThePitchOf16BitSourcesOnly) {
  // Source rows step by 2 bytes, destination rows by 5.
  const Bytes source = {0xFF, 0xFF, 0x00, 0xF8};
  Bytes dst(8);
  Raster_ConvertPixels(dst.data(), 5, 24, source.data(), 3, 16, false, nullptr, 0, 0, 0, 0, 1, 2);
  EXPECT_EQ(dst, (Bytes{0xFF, 0xFF, 0xFF, 0, 0, 0, 0, 0xFF}));
}

TEST(Raster_CopyPixels, StepsByTheFullPitch) {
  const Bytes source = {0, 0, 0, 0, 0, 0, 0, 1, 2, 3, 4};  // the second row of pitch 7
  Bytes dst(9);
  Raster_CopyPixels(dst.data(), 5, source.data(), 7, 32, 0, 1, 0, 1, 1, 1);
  EXPECT_EQ(dst, (Bytes{0, 0, 0, 0, 0, 1, 2, 3, 4}));
  Raster_ConvertPixels(dst.data(), 5, 32, source.data(), 7, 32, false, nullptr, 0, 1, 0, 0, 1, 1);
  EXPECT_EQ(dst, (Bytes{1, 2, 3, 4, 0, 1, 2, 3, 4}));
}

TEST(Raster_CopyPixels, EqualsTheModelForCodesThatNoConversionAccepts) {
  Random random(6);
  for (const int32 depth : {0, 1, 3, 6, 7, 8, 9, 12, 15, 16, 17, 24, 31, 32, 48, 64}) {
    const uint32 bytes = depth == 15 ? 2 : depth == 3 || depth == 6 ? 1 : uint32(depth) / 8;
    for (const uint32 gap : {0u, 1u, 5u}) {
      const Spot from{3, 5 * bytes + gap, 0, 1};
      const Spot to{1, 5 * bytes + gap, 0, 2};
      const Bytes source = random.bytes(from.base + size_t{from.pitch} * 5);
      Bytes expected = random.bytes(to.base + size_t{to.pitch} * 6);
      Bytes actual = expected;
      reference::copyPixels(expected, to, source, from, depth, 5, 4);
      convert(Entry::kCopy, actual.data(), to, source.data(), from, {depth, depth, false}, nullptr,
              5, 4);
      EXPECT_EQ(actual, expected) << depth;
    }
  }
}

/// Expects every entry in question to be fatal, even without a pixel and before anything is read.
void expectFatal(Entry entry, const std::string& text, int32 named, const Pair& pair) {
  for (const uint32 height : {0u, 1u}) {
    expectFatal("Raster convert pixels invalid " + text + " " + std::to_string(named) + "\n",
                [&] { convert(entry, nullptr, {}, nullptr, {}, pair, nullptr, 0, height); });
  }
}

TEST(Raster_ConvertPixels, PanicsForABadPseudoColorDepthFirst) {
  for (const int32 depth : {9, 16, 32, 0x7FFFFFFF}) {
    for (const int32 dst : {8, 32, 7, depth})
      expectFatal(Entry::kGeneral, "depth for pseudo color", depth, {depth, dst, true});
    expectFatal(Entry::kTo32, "depth for pseudo color", depth, {depth, 32, true});
  }
}

TEST(Raster_ConvertPixels, PanicsForABadDestination) {
  for (const int32 depth : {0, 4, 7, 25, -3}) {
    for (const int32 src : kSources)
      expectFatal(Entry::kGeneral, "depth", depth, {src, depth, false});
    expectFatal(Entry::kGeneral, "depth", depth, {8, depth, true});
    expectFatal(Entry::kFrom32, "depth", depth, {32, depth, false});
  }
}

TEST(Raster_ConvertPixels, PanicsForABadSourceBeforeABadDestination) {
  for (const int32 depth : {0, 3, 6, 8, 17, -16}) {
    expectFatal(Entry::kGeneral, "source depth", depth, {depth, 7, false});
    expectFatal(Entry::kGeneral, "source depth", depth, {depth, 16, false});
    expectFatal(Entry::kGeneral, "source depth", depth, {depth, 32, false});
    expectFatal(Entry::kTo32, "source depth", depth, {depth, 32, false});
  }
}

}  // namespace
