// SPDX-License-Identifier: MIT
//
// Blocks from elsewhere: what is found sound is what the checked library unpacks.

#include "packedBlock.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <vector>

#include "support/random.h"

namespace tool {
namespace {

using tests::Random;

RasterStatus statusOf(const BlockHeader& header) {
  uint8 bytes[sizeof header];
  memcpy(bytes, &header, sizeof header);
  RasterBlockInfo info;
  return RasterChecked_BlockInfo(bytes, sizeof bytes, nullptr, &info);
}

TEST(PackedBlock, TakesTheHeadersThatTheLibraryTakes) {
  for (uint32 bpp = 0; bpp <= 40; ++bpp) {
    for (uint32 width = 1; width < 5; ++width) {
      for (uint32 pitch = 0; pitch < 24; ++pitch) {
        for (const uint32 codeWords : {0u, 3u}) {
          const BlockHeader header = {width, 2, pitch, bpp, codeWords};
          // Without a byte behind it, a header that makes sense is that of a block cut off.
          ASSERT_EQ(headerFault(header).empty(), statusOf(header) == RASTER_STATUS_TRUNCATED)
              << width << " pixels of " << bpp << " bits, pitch " << pitch << ", " << codeWords
              << " words: " << headerFault(header);
        }
      }
    }
  }
}

TEST(PackedBlock, NamesWhatIsWrongWithAHeader) {
  EXPECT_EQ(headerFault({2, 2, 8, 12, 0}), "it has 12 bits per pixel");
  EXPECT_EQ(headerFault({0, 2, 8, 32, 0}), "it is of 0x2 pixels");
  EXPECT_EQ(headerFault({1, 1000001, 4, 32, 0}), "it is of 1x1000001 pixels");
  EXPECT_EQ(headerFault({3, 2, 8, 32, 0}), "its rows are longer than its pitch");
  EXPECT_EQ(headerFault({2, 2, 10, 32, 0}), "its rows do not begin at whole pixels");
  EXPECT_EQ(headerFault({2, 2, 5, 16, 0}), "its rows do not begin at whole pixels");
  EXPECT_EQ(headerFault({2, 1000000, 4000, 32, 0}), "it is too large");
  EXPECT_EQ(headerFault({2, 2, 8, 16, 1}), "only pixels of 32 bits can be coded");
}

TEST(PackedBlock, FindsNothingWrongWithWhatTheLibraryUnpacks) {
  Random random(1);
  int sound = 0;
  const int rounds = tests::rounds(20000);
  for (int round = 0; round < rounds; ++round) {
    BlockHeader header = {1 + random.below(4), 1 + random.below(3), 1 + random.below(20),
                          random.oneOf({8u, 16u, 24u, 32u}), random.below(4)};
    std::vector<uint8> block(sizeof header);
    memcpy(block.data(), &header, sizeof header);
    const uint64 payload = headerFault(header).empty() ? header.payload() : random.below(40);
    for (size_t i = 0; i < payload; ++i)
      block.push_back(i % 4 == 0 ? random.oneOf<uint8>({0, 1, 2}) : uint8{0});
    if (!blockFault(block.data(), block.size(), header).empty()) continue;
    ++sound;
    RasterView pixels = {};
    ASSERT_EQ(RasterChecked_Decompress(block.data(), block.size(), nullptr, &pixels),
              RASTER_STATUS_OK)
        << "round " << round;
    free(pixels.data);
  }
  EXPECT_GT(sound, rounds / 100);
}

}  // namespace
}  // namespace tool
