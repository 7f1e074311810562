// SPDX-License-Identifier: MIT
//
// YUV video frames to packed RGB.
//
// Each source layout says where a group's luma and chroma are, each packing (yuvColor-inl.h) what
// becomes of a colour; one loop runs all of them.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/video/rasterYuvKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "frame/frameBuffer.h"
#include "video/rasterYuvInternal.h"
#include "video/videoColor.h"
#include "video/yuvColor-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

/// Whether packed rows that are far are fetched ahead. With AVX-512 and eight registers most
/// constants are loaded again for every vector, and these loads leave few places to begin those of
/// far memory early.
inline constexpr bool kFetchesPacked = HWY_TARGET == HWY_AVX3 && sizeof(void*) == 4;

/// One set of rows of a packed layout: a luma byte and a chroma byte alternate.
/// Deliberate: a group's first chroma byte is the red-difference, its second the blue-difference.
template <bool kLumaFirst> struct PackedRows {
  static constexpr size_t kRows = 1;
  const uint8* bytes;
  bool far = false;

  PackedRows(const YuvFrame& frame, uint32 set)
      : bytes(frame.luma.first + set * frame.luma.step),
        far(kFetchesPacked && isFar(4 * frame.groups, frame.rowSets)) {}

#if HWY_TARGET == HWY_SCALAR
  uint8 luma(size_t pixel, size_t /*row*/) const { return bytes[2 * pixel + (kLumaFirst ? 0 : 1)]; }
  uint8 cr(size_t group) const { return bytes[4 * group + (kLumaFirst ? 1 : 0)]; }
  uint8 cb(size_t group) const { return bytes[4 * group + (kLumaFirst ? 3 : 2)]; }
#else
  explicit PackedRows(const uint8* first) : bytes(first) {}

  /// Asks for what the groups of a vector come to soon.
  HWY_INLINE void fetch(size_t group) const {
    if (kFetchesPacked && far) fetchAhead(bytes + 4 * group);
  }

  template <class P, class D>
  HWY_INLINE Unsigned16<D> luma(P /*packing*/, D d, size_t group, size_t /*row*/) const {
    const auto v = load<P>(d, group);
    return kLumaFirst ? hn::And(v, hn::Set(hn::RebindToUnsigned<D>(), uint16{0xFF}))
                      : hn::ShiftRight<8>(v);
  }
  template <class P, class D> HWY_INLINE Chroma<D> chroma(P /*packing*/, D d, size_t group) const {
    const hn::RebindToUnsigned<D> du;
    const auto v = load<P>(d, group);
    if (kLumaFirst) return {hn::And(v, hn::Set(du, uint16{0xFF00})), hn::ShiftRight<8>(v)};
    return {hn::ShiftLeft<8>(v), hn::And(v, hn::Set(du, uint16{0xFF}))};
  }

  /// Calls `body` with a copy of the groups from `group` on that has as many as a block.
  template <class Body> void padded(size_t group, size_t groups, const Body& body) const {
    uint8 copy[16] = {};
    memcpy(copy, bytes + 4 * group, 4 * groups);
    body(PackedRows(copy));
  }

 private:
  template <class P, class D> HWY_INLINE Unsigned16<D> load(D /*d*/, size_t group) const {
    const hn::RebindToUnsigned<D> du;
    return P::arrange(du, loadLanes(du, bytes + 4 * group));
  }
#endif
};

/// A pair of rows of the planar layout.
struct PlanarRows {
  static constexpr size_t kRows = 2;
  const uint8* lumas;
  size_t lumaPitch;
  const uint8* cbs;
  const uint8* crs;

  PlanarRows(const YuvFrame& frame, uint32 set)
      : lumas(frame.luma.first + set * frame.luma.step),
        lumaPitch(frame.lumaPitch),
        cbs(frame.cb.first + set * frame.cb.step),
        crs(frame.cr.first + set * frame.cr.step) {}

#if HWY_TARGET == HWY_SCALAR
  uint8 luma(size_t pixel, size_t row) const { return lumas[row * lumaPitch + pixel]; }
  uint8 cr(size_t group) const { return crs[group]; }
  uint8 cb(size_t group) const { return cbs[group]; }
#else
  PlanarRows(const uint8* luma, size_t pitch, const uint8* cb, const uint8* cr)
      : lumas(luma), lumaPitch(pitch), cbs(cb), crs(cr) {}

  HWY_INLINE void fetch(size_t /*group*/) const {}

  template <class P, class D>
  HWY_INLINE Unsigned16<D> luma(P /*packing*/, D /*d*/, size_t group, size_t row) const {
    const hn::RebindToUnsigned<D> du;
    const hn::Rebind<uint8, D> bytes;
    return P::arrange(du, hn::PromoteTo(du, hn::LoadU(bytes, lumas + row * lumaPitch + 2 * group)));
  }
  template <class P, class D>
  HWY_INLINE Chroma<D> chroma(P /*packing*/, D /*d*/, size_t group) const {
    const hn::RebindToUnsigned<D> du;
    const hn::RepartitionToWide<decltype(du)> wide;
    const hn::Rebind<uint8, decltype(wide)> bytes;
    const auto cr = hn::PromoteTo(wide, hn::LoadU(bytes, crs + group));
    const auto cb = hn::PromoteTo(wide, hn::LoadU(bytes, cbs + group));
    const auto lower = P::arrange(du, hn::BitCast(du, hn::Or(cr, hn::ShiftLeft<16>(cb))));
    return {hn::ShiftLeft<8>(lower), lower};
  }

  template <class Body> void padded(size_t group, size_t groups, const Body& body) const {
    uint8 copy[4][8] = {};
    memcpy(copy[0], lumas + 2 * group, 2 * groups);
    memcpy(copy[1], lumas + lumaPitch + 2 * group, 2 * groups);
    memcpy(copy[2], cbs + group, groups);
    memcpy(copy[3], crs + group, groups);
    body(PlanarRows(copy[0], sizeof copy[0], copy[2], copy[3]));
  }
#endif
};

#if HWY_TARGET == HWY_SCALAR

template <class Rows, class P>
void convertRows(const Rows& rows, uint8* dst, size_t dstPitch, size_t groups) {
  for (size_t row = 0; row < Rows::kRows; ++row, dst += dstPitch) {
    for (size_t group = 0; group < groups; ++group) {
      const uint8 cb = rows.cb(group), cr = rows.cr(group);
      const Rgb left = colorOf(rows.luma(2 * group, row), cb, cr, 128);
      const Rgb right = colorOf(rows.luma(2 * group + 1, row), cb, cr, 128);
      // A packed frame may be converted in place: the group has been read.
      uint8* const pixels = dst + 2 * group * P::kBytes;
      storePixel<P::kBytes>(pixels, P::pack(left.r, left.g, left.b));
      storePixel<P::kBytes>(pixels + P::kBytes, P::pack(right.r, right.g, right.b));
    }
  }
}

#else

/// Converts the groups of one vector.
template <class P, class Rows, class D>
HWY_INLINE void convertBlock(D d, const Rows& rows, size_t group, uint8* dst, size_t dstPitch) {
  const auto chroma = chromaTerms(d, rows.chroma(P(), d, group));
  for (size_t row = 0; row < Rows::kRows; ++row)
    P::store(d, colorSums(d, rows.luma(P(), d, group, row), chroma), dst + row * dstPitch);
}

/// Converts less than a block of 16 bytes: as such a block, from and to a copy.
template <class Rows, class P>
HWY_INLINE void convertRest(const Rows& rows, size_t group, size_t groups, uint8* dst,
                            size_t dstPitch) {
  const hn::Full128<int16> d;
  constexpr size_t kBlockBytes = 8 * P::kBytes;
  rows.padded(group, groups, [&](const Rows& copy) HWY_ATTR {
    uint8 pixels[Rows::kRows * kBlockBytes];
    convertBlock<typename P::Near>(d, copy, 0, pixels, kBlockBytes);
    for (size_t row = 0; row < Rows::kRows; ++row)
      memcpy(dst + row * dstPitch, pixels + row * kBlockBytes, groups * 2 * P::kBytes);
  });
}

/// Whole vectors, then smaller ones, down to the rest.
template <class Rows, class P, class D>
HWY_INLINE void convertFrom(D d, const Rows& rows, size_t group, size_t groups, uint8* dst,
                            size_t dstPitch) {
  constexpr size_t kStep = kLanes<D> / 2;
  constexpr size_t kGroupBytes = 2 * P::kBytes;
  for (; groups - group >= kStep; group += kStep) {
    rows.fetch(group);
    convertBlock<P>(d, rows, group, dst + group * kGroupBytes, dstPitch);
  }
  if (group == groups) return;
  if constexpr (kLanes < D >> 8) {
    convertFrom<Rows, P>(hn::Half<D>(), rows, group, groups, dst, dstPitch);
  } else {
    convertRest<Rows, P>(rows, group, groups - group, dst + group * kGroupBytes, dstPitch);
  }
}

template <class Rows, class P>
void convertRows(const Rows& rows, uint8* dst, size_t dstPitch, size_t groups) {
  convertFrom<Rows, P>(Lanes16(), rows, 0, groups, dst, dstPitch);
}

#endif

template <class Rows, class P> void convertSets(const YuvFrame& frame) {
  for (uint32 set = 0; set < frame.rowSets; ++set)
    convertRows<Rows, P>(Rows(frame, set), frame.dst + set * frame.dstStep, frame.dstPitch,
                         frame.groups);
}

#if HWY_TARGET != HWY_SCALAR

/// Whether pixels may go past the caches: where a block of them is a whole cache line. In parts of
/// one, with as much to compute between them, that takes longer.
template <class P> constexpr bool kStreams = kLanes<Lanes16>* P::kBytes % kCacheLine == 0;

/// Whether they do: where their vectors lie at multiples of their size, and the frame is not
/// converted in place.
template <class Rows, class P> bool areStreamed(const YuvFrame& frame) {
  const size_t read = frame.groups * (Rows::kRows == 2 ? 6 : 4);
  const size_t bytes = frame.groups * 2 * P::kBytes;
  if (!isStreamed(bytes, Rows::kRows * bytes + read, frame.rowSets)) return false;
  const auto places = reinterpret_cast<uintptr_t>(frame.dst) | frame.dstPitch | frame.dstStep;
  const RowSpan to(frame.dst, 0, bytes, 1);
  return places % (2 * kLanes<Lanes16>) == 0 &&
         (Rows::kRows == 2 || to.isApartFrom(RowSpan(frame.luma.first, 0, read, 1)));
}

/// Converts a frame past the caches, where that is right; says whether. A function of its own:
/// small frames are done before the registers that it needs would be saved.
template <class Rows, class P> HWY_NOINLINE bool streamFrame(const YuvFrame& frame) {
  if (!areStreamed<Rows, P>(frame)) return false;
  convertSets<Rows, typename P::Far>(frame);
  endStreams();
  return true;
}

#endif

template <class Rows, class P> void convertFrame(const YuvFrame& frame) {
#if HWY_TARGET != HWY_SCALAR
  if constexpr (P::kBytes != 3 && kStreams<P>) {
    constexpr uint64 kMostBytesOfGroup = 32;  // read and written
    const uint64 groups = uint64{frame.groups} * frame.rowSets;
    if (HWY_UNLIKELY(groups > kLeastCacheBytes / kMostBytesOfGroup) && streamFrame<Rows, P>(frame))
      return;
  }
#endif
  convertSets<Rows, P>(frame);
}

using Yuy2 = PackedRows<true>;
using Uyvy = PackedRows<false>;
using Yv12 = PlanarRows;

constexpr YuvKernels kKernels = {{
    {convertFrame<Yuy2, Packing<Video15>>, convertFrame<Yuy2, Packing<Code16>>,
     convertFrame<Yuy2, Packing<Code24>>, convertFrame<Yuy2, Packing<Code32>>},
    {convertFrame<Uyvy, Packing<Video15>>, convertFrame<Uyvy, Packing<Code16>>,
     convertFrame<Uyvy, Packing<Code24>>, convertFrame<Uyvy, Packing<Code32>>},
    {convertFrame<Yv12, Packing<Video15>>, convertFrame<Yv12, Packing<Code16>>,
     convertFrame<Yv12, Packing<Code24>>, convertFrame<Yv12, Packing<Code32>>},
}};

}  // namespace

const YuvKernels* yuvKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(yuvKernels);

}  // namespace

const YuvKernels* lookUpYuv() { return HWY_DYNAMIC_DISPATCH(yuvKernels)(); }

}  // namespace raster

#endif
