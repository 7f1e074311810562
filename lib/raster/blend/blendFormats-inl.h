// SPDX-License-Identifier: MIT
//
// The six destination formats: how blocks of their pixels become vectors of channels and go back.
// Included once per instruction set.

#if defined(RASTER_BLEND_FORMATS_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_BLEND_FORMATS_INL_H
#undef RASTER_BLEND_FORMATS_INL_H
#else
#define RASTER_BLEND_FORMATS_INL_H
#endif

#include "blendBytes-inl.h"
#include "blendPlanes-inl.h"
#include "frame/frameBuffer.h"
#include "vector/fields-inl.h"
#include "vector/triples-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {

/// Three bits as eight. Deliberate: the last two repeat the field's low two bits, not its high
/// ones.
constexpr uint8 widenThree(uint32 field) {
  return static_cast<uint8>(field << 5 | field << 2 | (field & 3));
}
static_assert(widenThree(4) == 0x90 && widenThree(7) == 0xFF);

/// All of them, and behind them the 1 that a product needs as the lower byte.
alignas(16) inline constexpr uint8 kWidenedThrees[16] = {
    widenThree(0), widenThree(1), widenThree(2),
    widenThree(3), widenThree(4), widenThree(5),
    widenThree(6), widenThree(7), 1};
inline constexpr uint16 kOneAt = 8;

template <class Field> HWY_INLINE WordLanes widenThrees(WordLanes words) {
  const Words d;
  const auto fields = shiftLanes<Field::kTop - Field::kBits - 8>(words);
  const auto index = hn::OrAnd(hn::Set(d, kOneAt), fields, hn::Set(d, 0x0700));
#if HWY_TARGET == HWY_SCALAR
  return hn::Set(d, static_cast<uint16>(kWidenedThrees[hn::GetLane(index) >> 8] << 8 | 1));
#else
  const hn::Repartition<uint8, Words> d8;
  const auto table = hn::LoadDup128(d8, kWidenedThrees);
  return hn::BitCast(d, hn::TableLookupBytes(table, hn::BitCast(d8, index)));
#endif
}

/// Widens a field of two or three bits to the upper byte; the lower one becomes 1.
template <class Field> HWY_INLINE WordLanes widenShort(WordLanes words) {
  if constexpr (Field::kBits == 3) {
    return widenThrees<Field>(words);
  } else {
    return copyField<Field>(Words(), words, 0x5500 >> (Field::kTop - Field::kBits)) |
           hn::Set(Words(), 1);
  }
}
template <class Field> inline constexpr bool kIsShort = Field::kBits <= 3;

/// Pixels of one or two bytes, with a field for each channel: the first one is blue. Bits outside
/// them become 0.
template <class Format> struct Packed {
  using Lanes = Words;
  static constexpr size_t kBytes = Format::kBytes;
  static constexpr bool kKeepsBytes = false;

  static HWY_INLINE PlaneFactor factorOf(uint8 value) { return planeFactor(value); }
  static HWY_INLINE Planes black() {
    const auto zero = hn::Zero(Words());
    return {zero, zero, zero, zero};
  }

  template <class Part> static HWY_INLINE Planes loadSource(const uint8* at, Part part) {
    return loadPlanes(at, part);
  }
  template <class Part> static HWY_INLINE auto load(const uint8* at, Part part) {
    [[maybe_unused]] const Words d;
    const auto words = loadWords(at, part);
    if constexpr (kIsShort<C0> && kIsShort<C1> && kIsShort<C2>) {
      return ExactPlanes{
          {widenShort<C0>(words), widenShort<C1>(words), widenShort<C2>(words), words}};
    } else {
      return Planes{widenToUpper<C0>(d, words), widenToUpper<C1>(d, words),
                    widenToUpper<C2>(d, words), words};
    }
  }
  template <class Part>
  static HWY_INLINE void store(const Planes& p, const Planes& /*before*/, uint8* at, Part part) {
    const Words d;
    const auto fields = addField<C1>(d, firstField<C0>(d, p.c0), p.c1);
    storeWords(addField<C2>(d, fields, p.c2), at, part);
  }

 private:
  using C0 = typename Format::Blue;
  using C1 = typename Format::Green;
  using C2 = typename Format::Red;
  static constexpr hn::Rebind<std::conditional_t<kBytes == 1, uint8, uint16>, Words> kPixels{};

  template <class Part> static HWY_INLINE WordLanes loadWords(const uint8* at, Part part) {
    const auto pixels = loadPart<kBytes>(kPixels, at, 0, part);
    if constexpr (kBytes == 2) {
      return pixels;
    } else {
      return hn::PromoteTo(Words(), pixels);
    }
  }
  template <class Part> static HWY_INLINE void storeWords(WordLanes words, uint8* at, Part part) {
    if constexpr (kBytes == 2) {
      storePart<kBytes>(kPixels, words, at, part);
    } else {
      storePart<kBytes>(kPixels, hn::TruncateTo(kPixels, words), at, part);
    }
  }
};

/// What pixels of three and four bytes have in common.
struct WholeBytes {
  using Lanes = hn::ScalableTag<uint32>;
  static HWY_INLINE Factor<Lanes> factorOf(uint8 value) { return factor(Lanes(), value); }
  static HWY_INLINE Bytes<Lanes> black() { return {hn::Zero(Lanes())}; }
  template <class Part> static HWY_INLINE Bytes<Lanes> loadSource(const uint8* at, Part part) {
    return {loadPart<4>(Lanes(), at, 0, part)};
  }
  static HWY_INLINE Bytes<Lanes> loadSource(const uint8* at, AllButLastByte /*part*/) {
    return loadSource(at, WholeBlock());
  }
};

#if HWY_TARGET == HWY_SCALAR

/// Pixels in words of their own.
struct PixelWord : WholeBytes {
  static constexpr size_t kBytes = 4;
  static constexpr bool kKeepsBytes = false;

  static HWY_INLINE Bytes<Lanes> load(const uint8* at, WholeBlock /*part*/) {
    return {hn::Set(Lanes(), loadPixel<4>(at))};
  }
  template <class P, class Before>
  static HWY_INLINE void store(P p, Before /*before*/, uint8* at, WholeBlock /*part*/) {
    storePixel<4>(at, hn::GetLane(bytesOf(p).v));
  }
};

/// Pixels of kPixel bytes, of which three are read and written, as words (blendThrees).
template <size_t kPixel> struct ThreeOf { static constexpr size_t kBytes = kPixel; };
using Bytes3 = ThreeOf<3>;
using Bytes4 = ThreeOf<4>;

#else

/// Pixels of four bytes, of which the fourth one keeps its value.
struct Bytes4 : WholeBytes {
  static constexpr size_t kBytes = 4;
  static constexpr bool kKeepsBytes = true;

  template <class Part> static HWY_INLINE Bytes<Lanes> load(const uint8* at, Part part) {
    return {loadColors(Lanes(), at, part)};
  }
  template <class P, class Before, class Part>
  static HWY_INLINE void store(P p, Before before, uint8* at, Part part) {
    storeColors(Lanes(), bytesOf(p).v, before.v, at, part);
  }
};

/// Pixels of three bytes.
struct Bytes3 : WholeBytes {
  static constexpr size_t kBytes = 3;
  static constexpr bool kKeepsBytes = false;

  template <class Part> static HWY_INLINE Bytes<Lanes> load(const uint8* at, Part part) {
    return {spreadTriples(Lanes(), loadQuarters(at, part))};
  }
  template <class P, class Before, class Part>
  static HWY_INLINE void store(P p, Before /*before*/, uint8* at, Part part) {
    storeQuarters(gatherTriples(Lanes(), bytesOf(p).v), at, part);
  }

 private:
  using Vector = hn::Vec<Lanes>;

  // Three quarters of a vector hold the pixels: its lower half and half of the upper one.
  static constexpr hn::Half<Lanes> kHalf{};
  static constexpr hn::Half<hn::Half<Lanes>> kQuarter{};
  static constexpr size_t kHalfBytes = sizeof(uint32) * kLanes<hn::Half<Lanes>>;

#if HWY_TARGET == HWY_AVX3
  static HWY_INLINE Vector loadQuarters(const uint8* at, FirstPixels part) {
    return loadPart<kBytes>(Lanes(), at, 0, part);
  }
  static HWY_INLINE Vector loadQuarters(const uint8* at, WholeBlock /*part*/) {
    constexpr size_t kWords = kLanes<Lanes> / 4 * 3;
    return loadPart<sizeof(uint32)>(Lanes(), at, 0, FirstPixels{kWords});
  }
  static HWY_INLINE void storeQuarters(Vector v, uint8* at, FirstPixels part) {
    storePart<kBytes>(Lanes(), v, at, part);
  }
#else
  static HWY_INLINE Vector loadQuarters(const uint8* at, WholeBlock /*part*/) {
    const auto upper = loadLanes(kQuarter, at + kHalfBytes);
    return hn::Combine(Lanes(), hn::ZeroExtendVector(kHalf, upper), loadLanes(kHalf, at));
  }
#endif
  // By two stores, which the next loads do not wait for as they do for a masked one.
  static HWY_INLINE void storeQuarters(Vector v, uint8* at, WholeBlock /*part*/) {
    storeLanes(kHalf, hn::LowerHalf(kHalf, v), at);
    const auto upper = hn::LowerHalf(kQuarter, hn::UpperHalf(kHalf, v));
    storeLanes(kQuarter, upper, at + kHalfBytes);
  }
};

#endif

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
