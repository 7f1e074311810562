// SPDX-License-Identifier: MIT
//
// Averages from channel sums, a vector of pixels at a time. Included once per instruction set.
//
// The sums are divided by multiplication. Both ways are exact, not approximate: the error of the
// rounded-up reciprocal stays below the distance of any quotient from the next integer.

#if defined(RASTER_SCALE_DIVIDE_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_DIVIDE_INL_H
#undef RASTER_SCALE_DIVIDE_INL_H
#else
#define RASTER_SCALE_DIVIDE_INL_H
#endif

#include <algorithm>
#include <bit>

#include "rasterScaleInternal.h"
#include "rasterScaleLanes-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET != HWY_SCALAR

/// More weighted pixels than this are not summed in 16-bit lanes.
inline constexpr uint32 kMaxTerms = 64;

/// Any step: quotients of 32-bit numbers n by reciprocals of 32 bits, in 64-bit products.
///
/// With 2^b the power of two at or above the step and m = 2^(31 + b) / step rounded up, m fits 32
/// bits and m * step exceeds 2^(31 + b) by less than 2^b, so n * m >> (31 + b) is n / step for all
/// n below 2^31. Sums of kMaxTerms bytes in the upper half of a word are below that.
class AnyStep {
 public:
  explicit AnyStep(uint32 step) {
    shift_ = 31 + static_cast<int>(std::bit_width(step - 1));
    reciprocal_ = static_cast<uint32>(((uint64{1} << shift_) + step - 1) / step);
  }
  static_assert(kMaxTerms * 255 < 1u << 15);

  HWY_INLINE PixelVec average(HalvesVec br, HalvesVec ga) const {
    const Pixels d;
    const Pairs d64;
    const auto low = [&](HalvesVec sums) { return hn::ShiftLeft<16>(hn::BitCast(d, sums)); };
    const auto odd = [&](PixelVec v) {
      return hn::BitCast(d, hn::ShiftRight<32>(hn::BitCast(d64, v)));
    };
    const PixelVec b = low(br), r = hn::BitCast(d, br), g = low(ga), a = hn::BitCast(d, ga);
    return hn::Or(averageEven(b, g, r, a),
                  hn::BitCast(d, hn::ShiftLeft<32>(hn::BitCast(
                                     d64, averageEven(odd(b), odd(g), odd(r), odd(a))))));
  }

 private:
  /// The averages of every other pixel; the lanes between are 0.
  HWY_INLINE PixelVec averageEven(PixelVec b, PixelVec g, PixelVec r, PixelVec a) const {
    const Pixels d;
    const Pairs d64;
    const PixelVec m = hn::Set(d, reciprocal_);
    const auto quotient = [&](PixelVec n, int bit) {  // of at most 255
      const auto q = hn::ShiftRightSame(hn::MulEven(n, m), shift_ - bit);
      return bit == 0 ? q : hn::And(q, hn::Set(d64, uint64{255} << bit));
    };
    return hn::BitCast(d, hn::Or(hn::Or(quotient(b, 0), quotient(g, 8)),
                                 hn::Or(quotient(r, 16), quotient(a, 24))));
  }

  uint32 reciprocal_;
  int shift_;
};

/// Steps of few significant bits, step = divisor << zeros with zeros <= 16: a channel's quotient is
/// (sum << (16 - zeros)) / divisor and does not depend on the channel below it.
///
/// That holds while sums are below 2^zeros: shifted, they fit 16 bits, and what the lower channel
/// adds to the dividend does not reach the divisor's last bit. With 2^e the largest power of two
/// below the divisor and m = 2^(16 + e) / divisor rounded up, m fits 16 bits and the quotient is
/// n * m >> (16 + e): n < 256 * divisor, and m * divisor exceeds 2^(16 + e) by less than the
/// divisor, so the product is off by less than 2^(16 + e) / divisor while
/// divisor^2 * 256 <= 2^(16 + e).
class ShortStep {
 public:
  /// Whether the step qualifies when that many bytes are summed.
  static bool fits(uint32 step, uint32 terms) {
    return step >> zerosOf(step) <= kMaxDivisor && terms * 255 < 1u << zerosOf(step);
  }

  explicit ShortStep(uint32 step) {
    const int zeros = zerosOf(step);
    const uint32 divisor = step >> zeros;
    left_ = 16 - zeros;
    right_ = static_cast<int>(std::bit_width(divisor - 1)) - 1;
    reciprocal_ = static_cast<uint16>(((kOnePixel << right_) + divisor - 1) / divisor);
  }

  HWY_INLINE PixelVec average(HalvesVec br, HalvesVec ga) const {
    return hn::BitCast(Pixels(), hn::Or(quotient(br), hn::ShiftLeft<8>(quotient(ga))));
  }

 private:
  static constexpr uint32 kMaxDivisor = 64;
  static int zerosOf(uint32 step) { return std::min(std::countr_zero(step), 16); }

  HWY_INLINE HalvesVec quotient(HalvesVec sums) const {
    const HalvesVec scaled = hn::ShiftLeftSame(sums, left_);
    return hn::ShiftRightSame(hn::MulHigh(scaled, hn::Set(Halves(), reciprocal_)), right_);
  }

  uint16 reciprocal_;
  int left_;
  int right_;
};

/// Calls body(divider) with the cheaper divider for sums of `terms` weighted bytes.
template <class Body> HWY_INLINE void withDivider(uint32 step, uint32 terms, const Body& body) {
  if (ShortStep::fits(step, terms)) {
    body(ShortStep(step));
  } else {
    body(AnyStep(step));
  }
}

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
