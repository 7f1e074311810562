// SPDX-License-Identifier: MIT
//
// The sampler that mixes two neighbouring source pixels, to enlarge. Included once per instruction
// set.

#if defined(RASTER_SCALE_MIX_INL_H) == defined(HWY_TARGET_TOGGLE)
#ifdef RASTER_SCALE_MIX_INL_H
#undef RASTER_SCALE_MIX_INL_H
#else
#define RASTER_SCALE_MIX_INL_H
#endif

#include <algorithm>

#include "rasterScaleInternal.h"
#include "rasterScaleMemory.h"
#include "rasterScaleSource-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

#if HWY_TARGET == HWY_SCALAR

class Mix {
 public:
  static size_t memoryFor(const ScaleJob&) { return 0; }
  Mix(const ScaleJob& job, ScaleMemory&) : job_(job) {}

  void resample(const uint8* row, uint32* out) const {
    if (job_.srcBytesPerPixel == 4) {
      resampleAs<4>(row, out);
    } else {
      resampleAs<3>(row, out);
    }
  }

 private:
  template <unsigned kBytes> void resampleAs(const uint8* row, uint32* out) const {
    const auto pixelAt = [row](uint32 column) { return loadPixel<kBytes>(row + column * kBytes); };
    uint32* const end = out + job_.width;
    const uint32 step = job_.stepX;
    uint32 x = job_.startX - kHalfPixel;
    for (; out != end && static_cast<int32>(x) < 0; x += step) *out++ = pixelAt(0);
    for (; out != end && x < job_.xLimit(); x += step)
      *out++ = mixPixels(pixelAt(x >> 16), pixelAt((x >> 16) + 1), mixWeights(x));
    std::fill(out, end, pixelAt(job_.srcWidth - 1));
  }

  const ScaleJob& job_;
};

#else

class Mix {
 public:
  static size_t memoryFor(const ScaleJob& job) {
    return SourcePlaces::memoryFor(job) + 2 * ScaleMemory::sizeOf<uint32>(blockPixels(job));
  }

  Mix(const ScaleJob& job, ScaleMemory& memory) : job_(job), places_(job, 2, memory) {
    for (uint32*& weights : weights_) weights = memory.take<uint32>(blockPixels(job));
    prepare();
  }

  /// `out` has room for whole vectors.
  void resample(const uint8* row, uint32* out) const {
    places_.withReader([&](const auto& read) HWY_ATTR {
      const auto pixels = read(row);
      for (size_t i = 0; i < job_.width; i += kBlock) {
        const uint32 base = places_.base(i);
        const PixelVec index = places_.index(i);
        hn::StoreU(mixLanes(pixels.pick(base, index), pixels.pick(base, index, 1), weight(0, i),
                            weight(1, i)),
                   Pixels(), out + i);
      }
    });
  }

 private:
  /// Both edges are part of the tables: the outer pixels get the full weight of their only
  /// neighbour.
  void prepare() {
    const Pixels d;
    const hn::RebindToSigned<Pixels> di;
    const auto limit = hn::Set(di, static_cast<int32>(job_.xLimit()));
    const bool single = job_.srcWidth < 2;
    const uint32 lastPair = single ? 0 : job_.srcWidth - 2;
    const auto whole = hn::Set(di, int32{256});
    const auto place = [&](size_t block, PixelVec position) HWY_ATTR {
      const auto at = hn::BitCast(di, position);
      const auto before = single ? hn::Eq(at, at) : hn::Lt(at, hn::Zero(di));
      const auto beyond = hn::Eq(at, limit);
      const auto inside = hn::Max(at, hn::Zero(di));
      places_.place(block,
                    hn::Min(hn::ShiftRight<16>(hn::BitCast(d, inside)), hn::Set(d, lastPair)));
      auto w1 = hn::And(hn::ShiftRight<8>(at), hn::Set(di, int32{255}));
      auto w0 = hn::Sub(hn::Set(di, int32{255}), w1);
      w1 = hn::IfThenZeroElse(before, hn::IfThenElse(beyond, whole, w1));
      w0 = hn::IfThenElse(before, whole, hn::IfThenZeroElse(beyond, w0));
      hn::StoreU(inBothHalves(hn::BitCast(d, w0)), d, weights_[0] + block);
      hn::StoreU(inBothHalves(hn::BitCast(d, w1)), d, weights_[1] + block);
    };
    places_.forBlocks(static_cast<int32>(job_.startX - kHalfPixel), blockPixels(job_), place);
  }

  HWY_INLINE HalvesVec weight(int neighbour, size_t i) const {
    return hn::BitCast(Halves(), hn::LoadU(Pixels(), weights_[neighbour] + i));
  }

  const ScaleJob& job_;
  SourcePlaces places_;
  uint32* weights_[2];
};

#endif

}  // namespace
}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
