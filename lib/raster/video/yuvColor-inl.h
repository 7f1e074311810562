// SPDX-License-Identifier: MIT
//
// The colour equation of video and the packings of its result. Included once per instruction set,
// after Highway.
//
// The equation is that of BT.601 with limited range, in 8 bits of fraction:
//   R = (298 Y' + 409 Cr' + 128) >> 8                Y' = Y - 16
//   G = (298 Y' - 100 Cb' - 208 Cr' + 128) >> 8      Cb' = Cb - 128
//   B = (298 Y' + 516 Cb' + 128) >> 8                Cr' = Cr - 128
// each limited to a byte. In vectors it runs in 16-bit lanes without loss: all terms but 409 Cr'
// are even, so R and G are sums with 7 bits of fraction (of 409 Cr' the half, rounded down), and B,
// whose chroma factor is a multiple of 4, is one with 6. Sums that leave the lane saturate beyond
// the limits of a byte.

#if defined(RASTER_YUV_COLOR_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_YUV_COLOR_INL_H
#undef RASTER_YUV_COLOR_INL_H
#else
#define RASTER_YUV_COLOR_INL_H
#endif

#include "vector/fields-inl.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

#if HWY_TARGET != HWY_SCALAR

using Lanes16 = hn::ScalableTag<int16>;
template <class D> using Unsigned16 = hn::Vec<hn::RebindToUnsigned<D>>;

/// The two differences of the groups of a vector in alternate lanes, red then blue: as the upper
/// byte of a lane and as the lower one.
template <class D> struct Chroma { Unsigned16<D> upper, lower; };

/// What chroma adds to each channel, pixel by pixel.
template <class D> struct ChromaTerms { hn::Vec<D> r, g, b; };

/// The channels as sums: red and green with 7 bits of fraction, blue with 6.
template <class D> struct Sums { hn::Vec<D> r, g, b; };
constexpr int kFraction = 7;
constexpr int kFractionOfBlue = 6;

/// A bias: taken from the luma and added to the chroma, so that both fit a lane.
constexpr int kBias = 4096;
static_assert(149 * (255 - 16) + 64 - kBias <= 32767);
static_assert(409 * 127 / 2 + kBias <= 32767);

template <class D> HWY_INLINE hn::Vec<D> alternately(D d, int even, int odd) {
  const hn::RepartitionToWide<D> d32;
  return hn::BitCast(
      d, hn::Set(d32, static_cast<int32>((even & 0xFFFF) | static_cast<uint32>(odd) << 16)));
}

/// The even (kFirst 0) or odd (kFirst 2) lanes, each twice.
template <size_t kFirst, class D> HWY_INLINE hn::Vec<D> twice(D d, hn::Vec<D> v) {
  constexpr uint8 k = kFirst;
  alignas(16) static constexpr uint8 kBytes[16] = {k,      k + 1,  k,      k + 1, k + 4, k + 5,
                                                   k + 4,  k + 5,  k + 8,  k + 9, k + 8, k + 9,
                                                   k + 12, k + 13, k + 12, k + 13};
  const hn::Repartition<uint8, D> d8;
  return hn::BitCast(d, hn::TableLookupBytes(hn::BitCast(d8, v), hn::LoadDup128(d8, kBytes)));
}

template <class D> HWY_INLINE ChromaTerms<D> chromaTerms(D d, Chroma<D> chroma) {
  const hn::RebindToUnsigned<D> du;
  const hn::RepartitionToWide<D> d32;
  // 65536 times the factors 409 / 2 and 129, over the 256 of the upper byte.
  const auto factors = hn::BitCast(du, alternately(d, 409 * 128, 129 * 256));
  const auto rb = hn::Add(hn::BitCast(d, hn::MulHigh(chroma.upper, factors)),
                          alternately(d, kBias - 409 * 64, kBias / 2 - 129 * 128));
  auto none = hn::Zero(d32);
  const auto g =
      hn::ReorderWidenMulAccumulate(d32, hn::BitCast(d, chroma.lower), alternately(d, -104, -50),
                                    hn::Set(d32, kBias + 154 * 128), none);
  return {twice<0>(d, rb), twice<0>(d, hn::BitCast(d, g)), twice<2>(d, rb)};
}

template <class D>
HWY_INLINE Sums<D> colorSums(D d, Unsigned16<D> luma, const ChromaTerms<D>& chroma) {
  const auto y = hn::Add(hn::Mul(hn::BitCast(d, luma), hn::Set(d, int16{149})),
                         hn::Set(d, static_cast<int16>(64 - 149 * 16 - kBias)));
  return {hn::SaturatedAdd(y, chroma.r), hn::SaturatedAdd(y, chroma.g),
          hn::SaturatedAdd(hn::ShiftRight<1>(y), chroma.b)};
}

/// Limits the lanes to bytes: in every 16-byte block, eight of `a` and then eight of `b`. Highway
/// names this only from a later version on.
HWY_INLINE hn::Vec128<uint8> packBytes(hn::Vec128<int16> a, hn::Vec128<int16> b) {
  return hn::Vec128<uint8>{_mm_packus_epi16(a.raw, b.raw)};
}
#if HWY_TARGET <= HWY_AVX2
HWY_INLINE hn::Vec256<uint8> packBytes(hn::Vec256<int16> a, hn::Vec256<int16> b) {
  return hn::Vec256<uint8>{_mm256_packus_epi16(a.raw, b.raw)};
}
#endif
#if HWY_TARGET <= HWY_AVX3
HWY_INLINE hn::Vec512<uint8> packBytes(hn::Vec512<int16> a, hn::Vec512<int16> b) {
  return hn::Vec512<uint8>{_mm512_packus_epi16(a.raw, b.raw)};
}
#endif

/// Bytes of eight pixels per 16-byte block: blue then red in one vector, green then 0 in the other.
template <class D> struct ChannelBytes { hn::Vec<hn::Repartition<uint8, D>> blueRed, green; };

/// Drops the fraction of a sum. Where shuffles are many and registers too, it pays to multiply: on
/// AMD's processors shifts run in the units of the shuffles.
template <int kBits, bool kMultiplies, class D> HWY_INLINE hn::Vec<D> whole(D d, hn::Vec<D> sum) {
  if constexpr (kMultiplies) return hn::MulHigh(sum, hn::Set(d, int16{1 << (16 - kBits)}));
  return hn::ShiftRight<kBits>(sum);
}

template <bool kMultiplies, class D> HWY_INLINE ChannelBytes<D> toBytes(D d, const Sums<D>& sums) {
  return {packBytes(whole<kFractionOfBlue, kMultiplies>(d, sums.b),
                    whole<kFraction, kMultiplies>(d, sums.r)),
          packBytes(whole<kFraction, kMultiplies>(d, sums.g), hn::Zero(d))};
}

/// Lane i of the result is lane order[i] of `v`, in 8-byte lanes.
template <class D, class Order>
HWY_INLINE hn::Vec<D> permuteQuads(D d, hn::Vec<D> v, const Order& order) {
  const hn::Repartition<uint64, D> d64;
  return hn::BitCast(
      d, hn::TableLookupLanes(hn::BitCast(d64, v), hn::SetTableIndices(d64, order.lane)));
}

/// An order of 8-byte lanes.
template <size_t kCount> struct QuadOrder { int64_t lane[kCount]; };
template <class D> constexpr size_t kQuads = kLanes<D> * sizeof(hn::TFromD<D>) / 8;

#endif

/// What three colour channels become in memory: pixels of a format, lowest byte first. With
/// kPastCaches vectors of them go past the caches, to addresses that are multiples of their size.
template <class Format, bool kPastCaches = false> struct Packing {
  static constexpr unsigned kBytes = Format::kBytes;
  using Near = Packing<Format>;
  using Far = Packing<Format, true>;
  using Red = typename Format::Red;
  using Green = typename Format::Green;
  using Blue = typename Format::Blue;

  static constexpr uint32 pack(uint32 r, uint32 g, uint32 b) {
    return Red::ofByte(r) | Green::ofByte(g) | Blue::ofByte(b);
  }

#if HWY_TARGET != HWY_SCALAR

  /// Brings the pixels of a vector of 16-bit lanes into the order that `store` wants: for four-byte
  /// pixels, the first half of the pixels in the lower halves of the 16-byte blocks.
  template <class D> static HWY_INLINE hn::Vec<D> arrange(D d, hn::Vec<D> lanes) {
    if constexpr (kBytes != 4 || kQuads<D> == 2) {
      return lanes;
    } else {
      static constexpr QuadOrder<kQuads<D>> kOrder = [] {
        QuadOrder<kQuads<D>> order{};
        for (size_t i = 0; i < kQuads<D>; ++i)
          order.lane[i] = static_cast<int64_t>(i / 2 + i % 2 * (kQuads<D> / 2));
        return order;
      }();
      return permuteQuads(d, lanes, kOrder);
    }
  }

  /// Stores the pixels of a vector.
  template <class D> static HWY_INLINE void store(D d, const Sums<D>& sums, uint8* dst) {
    if constexpr (kBytes == 2) {
      putLanes<kPastCaches>(hn::RebindToUnsigned<D>(), packWords(d, sums), dst);
    } else if constexpr (kBytes == 3) {
      storeTriples(d, toBytes<false>(d, sums), dst);
    } else {
      storeQuads(d, toBytes<HWY_TARGET <= HWY_AVX3>(d, sums), dst);
    }
  }

 private:
  /// One channel of a word: the top bits of a sum that is limited to a byte.
  template <class Field, int kSumFraction, class D>
  static HWY_INLINE Unsigned16<D> field(D d, hn::Vec<D> sum) {
    const hn::RebindToUnsigned<D> du;
    const auto moved = shiftLanes<kSumFraction + 8 - Field::kTop>(hn::BitCast(du, sum));
    return hn::And(moved, setMask(du, Field::kMask));
  }

  template <class D> static HWY_INLINE Unsigned16<D> packWords(D d, const Sums<D>& sums) {
    const auto zero = hn::Zero(d);
    // The other two saturate where their bytes end.
    const auto b = hn::Min(sums.b, hn::Set(d, int16{(256 << kFractionOfBlue) - 1}));
    return hn::Or(hn::Or(field<Red, kFraction>(d, hn::Max(sums.r, zero)),
                         field<Green, kFraction>(d, hn::Max(sums.g, zero))),
                  field<Blue, kFractionOfBlue>(d, hn::Max(b, zero)));
  }

  /// Each block becomes the first 16 and the last 8 of its 24 bytes; then these are joined.
  template <class D>
  static HWY_INLINE void storeTriples(D d, const ChannelBytes<D>& bytes, uint8* dst) {
    constexpr uint8 kNone = 0x80;
    alignas(16) static constexpr uint8 kHeadOfBlueRed[16] = {
        0, kNone, 8, 1, kNone, 9, 2, kNone, 10, 3, kNone, 11, 4, kNone, 12, 5};
    alignas(16) static constexpr uint8 kHeadOfGreen[16] = {
        kNone, 0, kNone, kNone, 1, kNone, kNone, 2, kNone, kNone, 3, kNone, kNone, 4, kNone, kNone};
    alignas(16) static constexpr uint8 kRestOfBlueRed[16] = {
        kNone, 13,    6,     kNone, 14,    7,     kNone, 15,
        kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone};
    alignas(16) static constexpr uint8 kRestOfGreen[16] = {5,     kNone, kNone, 6,     kNone, kNone,
                                                           7,     kNone, kNone, kNone, kNone, kNone,
                                                           kNone, kNone, kNone, kNone};
    const hn::Repartition<uint8, D> d8;
    const auto pick = [&](const uint8* ofBlueRed, const uint8* ofGreen) HWY_ATTR {
      return hn::Or(hn::TableLookupBytesOr0(bytes.blueRed, hn::LoadDup128(d8, ofBlueRed)),
                    hn::TableLookupBytesOr0(bytes.green, hn::LoadDup128(d8, ofGreen)));
    };
    storeJoined(d8, pick(kHeadOfBlueRed, kHeadOfGreen), pick(kRestOfBlueRed, kRestOfGreen), dst);
  }

  /// For the joined blocks, from 8-byte lane kFrom on: where each lane comes from.
  template <size_t kCount, size_t kFrom> struct JoinOrder {
    QuadOrder<kCount> head{}, rest{};
    uint64 isRest[kCount]{};
    constexpr JoinOrder() {
      for (size_t i = 0; i < kCount; ++i) {
        const size_t block = (kFrom + i) / 3 % (kCount / 2);
        const size_t part = (kFrom + i) % 3;
        head.lane[i] = static_cast<int64_t>(2 * block + part % 2);
        rest.lane[i] = static_cast<int64_t>(2 * block);
        isRest[i] = part == 2 ? ~uint64{0} : 0;
      }
    }
  };

  template <size_t kFrom, class D8>
  static HWY_INLINE hn::Vec<D8> joined(D8 d8, hn::Vec<D8> head, hn::Vec<D8> rest) {
    const hn::Repartition<uint64, D8> d64;
    static constexpr JoinOrder<kQuads<D8>, kFrom> kOrder;
    const auto isRest = hn::MaskFromVec(hn::LoadU(d64, kOrder.isRest));
    return hn::BitCast(d8,
                       hn::IfThenElse(isRest, hn::BitCast(d64, permuteQuads(d8, rest, kOrder.rest)),
                                      hn::BitCast(d64, permuteQuads(d8, head, kOrder.head))));
  }

  template <class D8>
  static HWY_INLINE void storeJoined(D8 d8, hn::Vec<D8> head, hn::Vec<D8> rest, uint8* dst) {
    const hn::Half<D8> half;
    if constexpr (kQuads<D8> == 2) {
      hn::StoreU(head, d8, dst);
      hn::StoreU(hn::LowerHalf(half, rest), half, dst + hn::Lanes(d8));
    } else {
      hn::StoreU(joined<0>(d8, head, rest), d8, dst);
      hn::StoreU(hn::LowerHalf(half, joined<kQuads<D8>>(d8, head, rest)), half,
                 dst + hn::Lanes(d8));
    }
  }

  template <class D>
  static HWY_INLINE void storeQuads(D /*d*/, const ChannelBytes<D>& bytes, uint8* dst) {
    const hn::Repartition<uint8, D> d8;
    const hn::RebindToUnsigned<D> du;
    const auto bg = hn::BitCast(du, hn::InterleaveLower(bytes.blueRed, bytes.green));
    const auto r = hn::BitCast(du, hn::InterleaveUpper(d8, bytes.blueRed, bytes.green));
    putLanes<kPastCaches>(du, hn::InterleaveLower(bg, r), dst);
    putLanes<kPastCaches>(du, hn::InterleaveUpper(du, bg, r), dst + hn::Lanes(d8));
  }

#endif
};

/// Deliberate: 15 bits lie one higher than in code 15.
using Video15 = PixelFormat<15, 2, Field<11, 5>, Field<6, 5>, Field<1, 5>>;

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
