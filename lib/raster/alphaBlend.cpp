// SPDX-License-Identifier: MIT
//
// Alpha blending: fourteen operators onto six destination formats, in place and staged.

#include <algorithm>
#include <array>
#include <cstring>
#include <tuple>
#include <utility>

#include "alphaBlendInternal.h"
#include "panicPlace.h"
#include "raster.h"

namespace raster {
namespace {

constexpr char kSource[] = "lib/raster/alphaBlend";
constexpr int kBadFormatLine = 205;  // part of the message, whatever line the call stands on
constexpr int kBadFormatBug = 19864;

constexpr uint32 kFlagSrcAlpha = 1;
constexpr uint32 kFlagDstAlpha = 2;

constexpr uint32 mul(uint32 a, uint32 b) { return a * b / 255; }
constexpr uint32 inv(uint32 a) { return 255 - a; }
constexpr uint32 add(uint32 a, uint32 b) { return a + b < 255 ? a + b : 255; }

/// One channel with both alphas, and the factor of Saturate.
struct Channel {
  uint32 s, d, sa, da, f;
};

// The operators (Porter and Duff, 1984), by number.
constexpr auto kOperators =
    std::make_tuple([](const Channel&) { return 0u; }, [](const Channel& c) { return c.s; },
                    [](const Channel& c) { return c.d; },
                    [](const Channel& c) { return add(c.s, mul(c.d, inv(c.sa))); },
                    [](const Channel& c) { return add(c.d, mul(c.s, inv(c.da))); },
                    [](const Channel& c) { return mul(c.s, c.da); },
                    [](const Channel& c) { return mul(c.d, c.sa); },
                    [](const Channel& c) { return mul(c.s, inv(c.da)); },
                    [](const Channel& c) { return mul(c.d, inv(c.sa)); },
                    [](const Channel& c) { return add(mul(c.s, c.da), mul(c.d, inv(c.sa))); },
                    [](const Channel& c) { return add(mul(c.d, c.sa), mul(c.s, inv(c.da))); },
                    [](const Channel& c) { return add(mul(c.d, c.sa), mul(c.s, inv(c.da))); },
                    [](const Channel& c) { return add(c.s, c.d); },
                    [](const Channel& c) { return add(c.d, mul(c.s, c.f)); });

/// Where a channel lies in a pixel; 3-bit fields repeat their low bits, all others their high ones.
template <unsigned kShift, unsigned kBits> struct Field {
  static constexpr uint32 widen(uint32 pixel) {
    const uint32 c = pixel >> kShift & ((1u << kBits) - 1);
    if constexpr (kBits == 2) return c * 0x55;
    if constexpr (kBits == 3) return c << 5 | c << 2 | (c & 3);
    return c << (8 - kBits) | c >> (kBits >= 4 ? 2 * kBits - 8 : 0);
  }
  static constexpr uint32 narrow(uint32 c) { return c >> (8 - kBits) << kShift; }
};

template <unsigned kSize, class C0, class C1, class C2> struct Format {
  static constexpr unsigned kBytes = kSize;
  static constexpr unsigned kColorBytes = kSize < 4 ? kSize : 3;  // byte 3 is never touched
  static void load(const uint8* at, uint32* c) {
    const uint32 pixel = loadPixel<kColorBytes>(at);
    c[0] = C0::widen(pixel), c[1] = C1::widen(pixel), c[2] = C2::widen(pixel);
  }
  static void store(uint8* at, const uint32* c) {
    storePixel<kColorBytes>(at, C0::narrow(c[0]) | C1::narrow(c[1]) | C2::narrow(c[2]));
  }
};
using Formats = std::tuple<Format<1, Field<0, 2>, Field<2, 2>, Field<4, 2>>,
                           Format<1, Field<6, 2>, Field<3, 3>, Field<0, 3>>,
                           Format<2, Field<0, 5>, Field<5, 5>, Field<10, 5>>,
                           Format<2, Field<0, 5>, Field<5, 6>, Field<11, 5>>,
                           Format<3, Field<0, 8>, Field<8, 8>, Field<16, 8>>,
                           Format<4, Field<0, 8>, Field<8, 8>, Field<16, 8>>>;

template <class Format, size_t kOp>
void blendPixels(uint8* dst, const uint8* src, size_t count, const BlendConstants& constants) {
  for (; count != 0; --count, dst += Format::kBytes, src += 4) {
    Channel channel{};
    uint32 c[3] = {};
    Format::load(dst, c);
    channel.sa = mul(src[3], constants.srcAlpha);
    channel.da = constants.dstAlpha;
    if constexpr (kOp == 13) channel.f = std::min(255u, inv(channel.da) / channel.da);
    for (unsigned i = 0; i < 3; ++i) {
      channel.s = mul(src[i], constants.srcAlpha);
      channel.d = mul(c[i], constants.dstAlpha);
      c[i] = std::get<kOp>(kOperators)(channel);
    }
    Format::store(dst, c);
  }
}

template <size_t kFormat, size_t kOp, bool kStaged>
void blendRect(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src, uint32 srcX,
               uint32 srcY, uint32 srcPitch, uint32 width, uint32 height, uint32 flags,
               uint32 srcAlpha, uint32 dstAlpha) {
  using F = std::tuple_element_t<kFormat, Formats>;
  const BlendConstants constants{(flags & kFlagSrcAlpha) != 0 ? srcAlpha & 255 : 255,
                                 (flags & kFlagDstAlpha) != 0 ? dstAlpha & 255 : 255};
  uint8* dstRow = rowAt(dst, pitchOf(dstPitch), dstY, dstX, F::kBytes);
  const uint8* srcRow = rowAt(src, pitchOf(srcPitch), srcY, srcX, 4);
  for (; height != 0; --height) {
    if constexpr (kStaged) {
      uint8 stage[kStageBytes];
      constexpr size_t kPixels = kStageBytes / F::kBytes;
      for (size_t x = 0; x < width; x += kPixels) {
        const size_t count = std::min<size_t>(kPixels, width - x);
        memcpy(stage, dstRow + x * F::kBytes, count * F::kBytes);
        blendPixels<F, kOp>(stage, srcRow + x * 4, count, constants);
        memcpy(dstRow + x * F::kBytes, stage, count * F::kBytes);
      }
    } else {
      blendPixels<F, kOp>(dstRow, srcRow, width, constants);
    }
    dstRow = nextRow(dstRow, pitchOf(dstPitch));
    srcRow = nextRow(srcRow, pitchOf(srcPitch));
  }
}

template <size_t kFormat, size_t... kOps>
constexpr BlendRow blendRow(std::index_sequence<kOps...>) {
  return {BlendPair{blendRect<kFormat, kOps, false>, blendRect<kFormat, kOps, true>}...,
          BlendPair{nullptr, nullptr}, BlendPair{nullptr, nullptr}};
}
template <size_t... kFormats> constexpr auto blendTable(std::index_sequence<kFormats...>) {
  return std::array<BlendRow, sizeof...(kFormats)>{
      blendRow<kFormats>(std::make_index_sequence<14>())...};
}
constexpr auto kTable = blendTable(std::make_index_sequence<6>());

size_t tableRow(uint32 depth, uint32 bpp) {
  switch (depth) {
    case 6:
      return 0;
    case 8:
      return 1;
    case 15:
      return 2;
    case 16:
      return 3;
    case 24:
      if (bpp == 24) return 4;
      if (bpp == 32) return 5;
      break;
    default:
      break;
  }
  assertFailed({kSource, kBadFormatLine}, kBadFormatBug);
}

}  // namespace

void alphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                uint32 depth, uint32 bpp, uint32 op, uint32 flags, uint32 srcAlpha, uint32 dstAlpha,
                uint8 staged) {
  const BlendPair& pair = kTable[tableRow(depth, bpp)][op];
  (staged != 0 ? pair.staged : pair.inPlace)(dst, dstX, dstY, dstPitch, src, srcX, srcY, srcPitch,
                                             width, height, flags, srcAlpha, dstAlpha);
}

}  // namespace raster

extern "C" {

void Raster_AlphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                       uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                       uint32 depth, uint32 bpp, uint32 op, uint32 flags, uint32 srcAlpha,
                       uint32 dstAlpha, uint8 staged) {
  raster::alphaBlend(dst, dstX, dstY, dstPitch, src, srcX, srcY, srcPitch, width, height, depth,
                     bpp, op, flags, srcAlpha, dstAlpha, staged);
}

void Raster_AlphaBlendOver(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch, const uint8* src,
                           uint32 srcX, uint32 srcY, uint32 srcPitch, uint32 width, uint32 height,
                           uint32 depth, uint32 bpp, uint8 staged) {
  raster::alphaBlend(dst, dstX, dstY, dstPitch, src, srcX, srcY, srcPitch, width, height, depth,
                     bpp, raster::kBlendOver, 0, 0, 0, staged);
}

}  // extern "C"
