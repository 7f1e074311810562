// SPDX-License-Identifier: MIT
//
// Blending against the naive model, and the cases that the interface names.

#include <gtest/gtest.h>

#include <string>

#include "raster.h"
#include "reference/alphaBlendReference.h"
#include "support/guardedBuffer.h"
#include "support/random.h"
#include "support/recordedMessages.h"

namespace {

using reference::Blend;
using reference::BlendFormat;
using reference::Bytes;
using reference::kBlendFormats;
using reference::kBlendOperators;
using tests::Guard;
using tests::GuardedBuffer;
using tests::Messages;
using tests::Random;

/// A rectangle in a destination and a source buffer that end with it.
struct Place {
  size_t dstBase, srcBase;  // beyond the first byte, so that bases are unaligned
  uint32 dstPitch, srcPitch;
  uint32 dstX, dstY, srcX, srcY, width, height;

  size_t dstFirst(const BlendFormat& f) const {
    return dstBase + size_t{dstY} * dstPitch + size_t{dstX} * f.bytes;
  }
  size_t srcFirst() const { return srcBase + size_t{srcY} * srcPitch + size_t{srcX} * 4; }
  size_t dstEnd(const BlendFormat& f) const {
    return dstFirst(f) + (height == 0 ? 0 : height - 1) * size_t{dstPitch} +
           size_t{width} * f.bytes;
  }
  size_t srcEnd() const {
    return srcFirst() + (height == 0 ? 0 : height - 1) * size_t{srcPitch} + size_t{width} * 4;
  }
};

/// A width that is likely to meet a boundary of some vector size or of the staging buffer.
uint32 someWidth(Random& random, const BlendFormat& f) {
  switch (random.below(16)) {
    case 0:
      return 3072 / f.bytes * (1 + random.below(2)) + random.below(70) - 35;
    case 1:
      return 500 + random.below(2000);
    default:
      return random.below(71);
  }
}

Place somePlace(Random& random, const BlendFormat& f) {
  Place p{};
  p.dstBase = random.below(70);
  p.srcBase = random.below(70);
  p.dstX = random.below(9);
  p.srcX = random.below(9);
  p.dstY = random.below(3);
  p.srcY = random.below(3);
  p.width = someWidth(random, f);
  p.height = random.below(p.width > 100 ? 3 : 8);
  p.dstPitch = (p.dstX + p.width) * f.bytes + random.below(40);
  p.srcPitch = (p.srcX + p.width) * 4 + random.below(40);
  return p;
}

/// A constant alpha, the extremes among them more often.
uint32 someAlpha(Random& random) {
  return random.below(4) == 0 ? random.oneOf({0u, 1u, 127u, 128u, 254u, 255u}) : random.below(256);
}

Blend someBlend(Random& random) {
  Blend blend{random.below(kBlendOperators), random.word(), someAlpha(random), someAlpha(random)};
  if (random.below(2) == 0) blend.flags &= 3;
  if (blend.op == 13 && blend.dstAlpha == 0) blend.dstAlpha = 1;
  return blend;
}

std::string describe(const Place& p, const BlendFormat& f, const Blend& b) {
  const auto text = [](auto... numbers) { return ((std::to_string(numbers) + " ") + ...); };
  return "depth " + text(f.depth, f.bpp) + "op " + text(b.op) + "flags " + text(b.flags) +
         "alphas " + text(b.srcAlpha, b.dstAlpha) + "dst base, x, y, pitch " +
         text(p.dstBase, p.dstX, p.dstY, p.dstPitch) + "src base, x, y, pitch " +
         text(p.srcBase, p.srcX, p.srcY, p.srcPitch) + "size " + text(p.width, p.height);
}

void blendAt(uint8* dst, const uint8* src, const Place& p, const BlendFormat& f, const Blend& b,
             uint8 staged) {
  Raster_AlphaBlend(dst + p.dstBase, p.dstX, p.dstY, p.dstPitch, src + p.srcBase, p.srcX, p.srcY,
                    p.srcPitch, p.width, p.height, f.depth, f.bpp, b.op, b.flags, b.srcAlpha,
                    b.dstAlpha, staged);
}

TEST(Raster_AlphaBlend, EqualsTheModelAndTouchesNothingElse) {
  Random random(1);
  for (int round = 0; round < 6000; ++round) {
    const BlendFormat& f = kBlendFormats[random.below(6)];
    const Place p = somePlace(random, f);
    const Blend b = someBlend(random);
    const uint8 staged = random.oneOf<uint8>({0, 1, 2, 255});
    const Bytes source = random.bytes(p.srcEnd());
    const Bytes before = random.bytes(p.dstEnd(f));
    Bytes joined = before;
    joined.insert(joined.end(), source.begin(), source.end());
    reference::alphaBlend(joined, p.dstFirst(f), p.dstPitch, before.size() + p.srcFirst(),
                          p.srcPitch, p.width, p.height, f, b);
    joined.resize(before.size());

    GuardedBuffer src(source.size(), random.oneOf({Guard::kBefore, Guard::kAfter}));
    GuardedBuffer dst(before.size(), random.oneOf({Guard::kBefore, Guard::kAfter}));
    src.assign(source);
    dst.assign(before);
    blendAt(dst.data(), src.data(), p, f, b, staged);
    ASSERT_EQ(dst.bytes(), joined)
        << "round " << round << " staged " << int{staged} << ": " << describe(p, f, b);
    ASSERT_EQ(src.bytes(), source);
  }
}

TEST(Raster_AlphaBlend, PanicsForADepthWithoutKernelsEvenWhenThereIsNothingToBlend) {
  for (const auto& [depth, bpp] :
       {std::array{24u, 16u}, std::array{32u, 32u}, std::array{0u, 8u}, std::array{24u, 0u}}) {
    const Messages said = tests::messagesOf([&, depth = depth, bpp = bpp] {
      Raster_AlphaBlend(nullptr, 0, 0, 0, nullptr, 0, 0, 0, 0, 0, depth, bpp, 3, 0, 0, 0, 0);
    });
    EXPECT_EQ(said.panic, "ASSERT lib/raster/alphaBlend:205 bugNr=19864\n");
    EXPECT_EQ(said.warning, "");
  }
}

}  // namespace
