// SPDX-License-Identifier: MIT
//
// Scaling against memory speed and the public libraries that scale. Rates count the pixels of the
// larger side: of the destination when enlarging, of the source when reducing. Peers that do not
// centre or weigh pixels as this library does still do the same amount of work.

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <string>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

enum class Way { kNearest, kBilinear, kBox };

struct Job {
  const char* name;
  Way way;
  uint32 srcBytes;
  uint32 dstBytes;
  double scale;
};
constexpr Job kJobs[] = {
    {"nearest-32-x2", Way::kNearest, 4, 4, 2},
    {"nearest-32-x1.5", Way::kNearest, 4, 4, 1.5},
    {"nearest-32-x0.5", Way::kNearest, 4, 4, 0.5},
    {"nearest-16-x1.5", Way::kNearest, 2, 2, 1.5},
    {"bilinear-32-x2", Way::kBilinear, 4, 4, 2},
    {"bilinear-32-x1.5", Way::kBilinear, 4, 4, 1.5},
    {"bilinear-32-x1.25", Way::kBilinear, 4, 4, 1.25},
    {"bilinear-32-x4", Way::kBilinear, 4, 4, 4},
    {"bilinear-24-x1.5", Way::kBilinear, 3, 3, 1.5},
    {"box-32-x0.5", Way::kBox, 4, 4, 0.5},
    {"box-32-x0.667", Way::kBox, 4, 4, 2.0 / 3},
    {"box-32-x0.8", Way::kBox, 4, 4, 0.8},
    {"box-32-x0.25", Way::kBox, 4, 4, 0.25},
    {"box-24-x0.5", Way::kBox, 3, 3, 0.5},
    {"nearest-32-to-16-x1.5", Way::kNearest, 4, 2, 1.5},
};

/// One job at one size: both frame buffers, packed.
struct Work {
  Job job;
  uint8* src;
  uint8* dst;
  Extent from;
  Extent to;

  uint32 srcPitch() const { return from.width * job.srcBytes; }
  uint32 dstPitch() const { return to.width * job.dstBytes; }
  int intPitch(bool ofSrc) const { return static_cast<int>(ofSrc ? srcPitch() : dstPitch()); }
};

Work workOf(const Job& job, Extent larger) {
  const double smaller = job.scale > 1 ? 1 / job.scale : job.scale;
  const auto side = [&](uint32 n) {
    return std::max(1u, static_cast<uint32>(job.scale > 1 ? std::ceil(n * smaller)
                                                          : std::floor(n * smaller + 1e-9)));
  };
  const Extent other = {side(larger.width), side(larger.height)};
  return {job, bench::buffer(0), bench::buffer(1), job.scale > 1 ? other : larger,
          job.scale > 1 ? larger : other};
}

/// 32 bytes anywhere in memory.
using Lump = uint64 __attribute__((vector_size(32), aligned(1), may_alias));

__attribute__((target("avx2"))) uint64 readAll(const uint8* bytes, size_t count) {
  const auto* at = reinterpret_cast<const Lump*>(bytes);
  Lump a = {}, b = {}, c = {}, d = {};
  for (size_t i = 0; i + 4 <= count / sizeof(Lump); i += 4) {
    a ^= at[i];
    b ^= at[i + 1];
    c ^= at[i + 2];
    d ^= at[i + 3];
  }
  a ^= b ^ c ^ d;
  return a[0] ^ a[1] ^ a[2] ^ a[3];
}

/// What memory allows: as many bytes as the job writes, and as many as it has to read.
void limit(const Work& w) {
  const size_t skips = w.job.way == Way::kNearest && w.job.scale < 1 ? 2 : 1;
  const size_t srcBytes = size_t{w.srcPitch()} * w.from.height / skips;
  const size_t dstBytes = size_t{w.dstPitch()} * w.to.height;
  const size_t both = std::min(srcBytes, dstBytes);
  memcpy(w.dst, w.src, both);
  memset(w.dst + both, 0x5A, dstBytes - both);
  benchmark::DoNotOptimize(readAll(w.src + both, srcBytes - both));
}

void scale(const Work& w) {
  const uint32 srcDepth = w.job.srcBytes == 4 ? 24 : 8 * w.job.srcBytes;
  const uint32 dstDepth = w.job.dstBytes == 4 ? 24 : 8 * w.job.dstBytes;
  Raster_Scale(w.dst, w.dstPitch(), 8 * w.job.dstBytes, dstDepth, w.to.width, w.to.height, 0, 0, 0,
               static_cast<int32>(w.to.width), static_cast<int32>(w.to.height), w.src,
               static_cast<int32>(w.srcPitch()), 8 * w.job.srcBytes, static_cast<int32>(srcDepth),
               0, w.from.width, w.from.height, 0, w.job.scale, w.job.scale,
               w.job.way != Way::kNearest ? 1 : 0);
}

#ifdef HAVE_LIBYUV
void addLibyuv(Contenders& c, const Work& w) {
  if (w.job.srcBytes != w.job.dstBytes || w.job.srcBytes < 3) return;
  // Its box filter is a bilinear one at other ratios.
  if (w.job.way == Way::kBox && w.job.scale != 0.5 && w.job.scale != 0.25) return;
  const auto filter = w.job.way == Way::kNearest    ? libyuv::kFilterNone
                      : w.job.way == Way::kBilinear ? libyuv::kFilterBilinear
                                                    : libyuv::kFilterBox;
  c.add("libyuv", [=] {
    const auto call = w.job.srcBytes == 4 ? libyuv::ARGBScale : libyuv::RGBScale;
    call(w.src, w.intPitch(true), static_cast<int>(w.from.width), static_cast<int>(w.from.height),
         w.dst, w.intPitch(false), static_cast<int>(w.to.width), static_cast<int>(w.to.height),
         filter);
  });
}
#endif

#ifdef HAVE_OPENCV
void addOpencv(Contenders& c, const Work& w) {
  if (w.job.srcBytes != w.job.dstBytes) return;
  const int filter = w.job.way == Way::kNearest    ? cv::INTER_NEAREST
                     : w.job.way == Way::kBilinear ? cv::INTER_LINEAR
                                                   : cv::INTER_AREA;
  const int type = bench::kMatTypes[w.job.srcBytes];
  const cv::Mat from = bench::mat(type, w.src, w.from, w.srcPitch());
  const cv::Mat to = bench::mat(type, w.dst, w.to, w.dstPitch());
  c.add("OpenCV", [from, to, filter]() mutable { cv::resize(from, to, to.size(), 0, 0, filter); });
}
#endif

#ifdef HAVE_PIXMAN
void addPixman(Contenders& c, const Work& w) {
  if (w.job.srcBytes == 3 || w.job.dstBytes == 3) return;
  if (w.job.way == Way::kBox && w.job.scale == 0.25) return;
  const auto image = [](uint32 bytes, Extent e, uint8* pixels, uint32 pitch) {
    // Pitches are multiples of 4 there.
    return bench::pixmanImage(bytes == 4 ? PIXMAN_x8r8g8b8 : PIXMAN_r5g6b5, pixels, e,
                              (pitch + 3) / 4 * 4);
  };
  auto* from = image(w.job.srcBytes, w.from, w.src, w.srcPitch());
  auto* to = image(w.job.dstBytes, w.to, w.dst, w.dstPitch());
  pixman_transform_t transform;
  const pixman_fixed_t step = pixman_double_to_fixed(1 / w.job.scale);
  pixman_transform_init_scale(&transform, step, step);
  pixman_image_set_transform(from, &transform);
  if (w.job.way == Way::kBox) {
    int count = 0;
    pixman_fixed_t* filter = pixman_filter_create_separable_convolution(
        &count, step, step, PIXMAN_KERNEL_IMPULSE, PIXMAN_KERNEL_IMPULSE, PIXMAN_KERNEL_BOX,
        PIXMAN_KERNEL_BOX, 4, 4);
    pixman_image_set_filter(from, PIXMAN_FILTER_SEPARABLE_CONVOLUTION, filter, count);
    free(filter);
  } else {
    pixman_image_set_filter(
        from, w.job.way == Way::kNearest ? PIXMAN_FILTER_NEAREST : PIXMAN_FILTER_BILINEAR, nullptr,
        0);
  }
  c.add("pixman", [=] {
    pixman_image_composite32(PIXMAN_OP_SRC, from, nullptr, to, 0, 0, 0, 0, 0, 0,
                             static_cast<int>(w.to.width), static_cast<int>(w.to.height));
  });
}
#endif

#ifdef HAVE_SDL2
void addSdl(Contenders& c, const Work& w) {
  if (w.job.way != Way::kNearest || w.job.srcBytes != w.job.dstBytes) return;
  auto* from = bench::surface(bench::kSdlFormats[w.job.srcBytes], w.src, w.from, w.srcPitch());
  auto* to = bench::surface(bench::kSdlFormats[w.job.dstBytes], w.dst, w.to, w.dstPitch());
  c.add("SDL2", [=] { SDL_SoftStretch(from, nullptr, to, nullptr); });
}
#endif

#ifdef HAVE_SWSCALE
void addSwscale(Contenders& c, const Work& w) {
  if (w.job.way != Way::kBox || w.job.srcBytes != 4) return;
  auto* context =
      sws_getContext(static_cast<int>(w.from.width), static_cast<int>(w.from.height),
                     AV_PIX_FMT_BGRA, static_cast<int>(w.to.width), static_cast<int>(w.to.height),
                     AV_PIX_FMT_BGRA, SWS_AREA, nullptr, nullptr, nullptr);
  if (context == nullptr) return;
  c.add("swscale", [=] {
    const uint8* from[] = {w.src, nullptr, nullptr, nullptr};
    uint8* to[] = {w.dst, nullptr, nullptr, nullptr};
    const int fromPitch[] = {w.intPitch(true), 0, 0, 0};
    const int toPitch[] = {w.intPitch(false), 0, 0, 0};
    sws_scale(context, from, fromPitch, 0, static_cast<int>(w.from.height), to, toPitch);
  });
}
#endif

void addContenders(Contenders& c, const Work& w) {
  c.add("raster", [=] { scale(w); });
  c.add("limit", [=] { limit(w); });
#ifdef HAVE_LIBYUV
  addLibyuv(c, w);
#endif
#ifdef HAVE_OPENCV
  addOpencv(c, w);
#endif
#ifdef HAVE_PIXMAN
  addPixman(c, w);
#endif
#ifdef HAVE_SDL2
  addSdl(c, w);
#endif
#ifdef HAVE_SWSCALE
  addSwscale(c, w);
#endif
}

}  // namespace

int main(int argc, char** argv) {
  for (const Job& job : kJobs) {
    const std::string name = std::string("scale/") + job.name;
    bench::job(name, [&](Contenders& c, Extent e) { addContenders(c, workOf(job, e)); });
  }
  return bench::run(argc, argv);
}
