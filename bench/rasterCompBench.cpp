// SPDX-License-Identifier: MIT
//
// Comparison of equal pictures, which reads every byte. The limit is memcmp of the same bytes;
// under a mask, which is a third stream, also a memcmp of the mask with itself.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

size_t bytesOf(Extent e, uint32 bytes) { return size_t{e.width} * e.height * bytes; }

// The pictures, of every size: two equal ones, one that differs from them in every fourth byte, and
// a mask. Nothing writes them while the benchmarks run.
constexpr int kPicture = 0;
constexpr int kSame = 1;
constexpr int kMask = 2;
constexpr int kOtherAlpha = 3;

void preparePictures() {
  const uint8* picture = bench::buffer(kPicture);
  memcpy(bench::buffer(kSame), picture, bench::kBufferBytes);
  memcpy(bench::buffer(kOtherAlpha), picture, bench::kBufferBytes);
  for (size_t i = 3; i < bench::kBufferBytes; i += 4)
    bench::buffer(kOtherAlpha)[i] = static_cast<uint8>(~picture[i]);
}

#ifdef HAVE_OPENCV
cv::Mat matOf(const uint8* pixels, Extent e, int type, size_t bytes) {
  return bench::mat(type, const_cast<uint8*>(pixels), e, static_cast<uint32>(e.width * bytes));
}
#endif

void compareJob(const std::string& name, uint32 bytes, int other) {
  bench::job("compare/" + name, [=](Contenders& c, Extent e) {
    const uint32 pitch = e.width * bytes;
    const auto bpp = static_cast<int32>(8 * bytes);
    const uint8* a = bench::buffer(kPicture);
    const uint8* b = bench::buffer(kSame);
    c.add("raster", [=] {
      benchmark::DoNotOptimize(Raster_ComparePixels(a, pitch, bpp, bench::buffer(other), pitch, bpp,
                                                    0, 0, 0, 0, e.width, e.height));
    });
    c.add("limit", [=] { benchmark::DoNotOptimize(memcmp(a, b, bytesOf(e, bytes))); });
#ifdef HAVE_OPENCV
    if (bytes != 4) return;
    c.add("OpenCV norm~all", [=, one = matOf(a, e, CV_8UC4, 4), two = matOf(b, e, CV_8UC4, 4)] {
      benchmark::DoNotOptimize(cv::norm(one, two, cv::NORM_L1));
    });
#endif
  });
}

void maskedJob(uint32 bytes) {
  bench::job("compare/masked" + std::to_string(8 * bytes), [=](Contenders& c, Extent e) {
    const uint8* a = bench::buffer(kPicture);
    const uint8* b = bench::buffer(kSame);
    const uint8* mask = bench::buffer(kMask);
    const uint32 pitch = e.width * bytes;
    const auto bpp = static_cast<int32>(8 * bytes);
    c.add("raster", [=] {
      benchmark::DoNotOptimize(Raster_CompareMasked(a, pitch, bpp, b, pitch, bpp, mask, pitch, bpp,
                                                    0, 0, e.width, e.height, 0));
    });
    c.add("limit", [=] {
      benchmark::DoNotOptimize(memcmp(a, b, bytesOf(e, bytes)));
      const uint8* sameMask = mask;  // unknown to the compiler, which would leave out the work
      benchmark::DoNotOptimize(sameMask);
      benchmark::DoNotOptimize(memcmp(mask, sameMask, bytesOf(e, bytes)));
    });
#ifdef HAVE_OPENCV
    if (bytes != 1) return;
    c.add("OpenCV norm", [=, one = matOf(a, e, CV_8UC1, 1), two = matOf(b, e, CV_8UC1, 1),
                          under = matOf(mask, e, CV_8UC1, 1)] {
      benchmark::DoNotOptimize(cv::norm(one, two, cv::NORM_L1, under));
    });
#endif
  });
}

/// Fifteen tiles of a frame.
void rectsJob() {
  constexpr Extent kFrame = {1920, 1080};
  constexpr uint32 kPitch = kFrame.width * 4;
  Contenders c("compare/rects32-15of64x64", kFrame, 15 * 64 * 64);
  const uint8* a = bench::buffer(kPicture);
  const uint8* b = bench::buffer(kSame);
  static RectList list;
  for (int32 i = 0; i < 15; ++i) list.rects[i] = {120 * i, 60 * i, 64, 64};
  c.add("raster", [=] {
    benchmark::DoNotOptimize(Raster_CompareRects(a, kPitch, 32, b, kPitch, 32, &list));
  });
  c.add("limit", [=] {
    for (int32 i = 0; i < 15; ++i) {
      const RectListEntry& r = list.rects[i];
      for (int32 y = r.y; y < r.y + r.height; ++y) {
        const size_t row = size_t{kPitch} * static_cast<uint32>(y) + static_cast<uint32>(4 * r.x);
        benchmark::DoNotOptimize(memcmp(a + row, b + row, 64 * 4));
      }
    }
  });
}

}  // namespace

int main(int argc, char** argv) {
  preparePictures();
  compareJob("32-equal", 4, kSame);
  compareJob("32-equal-alphadiffers", 4, kOtherAlpha);
  compareJob("24-equal", 3, kSame);
  compareJob("16-equal", 2, kSame);
  for (const uint32 bytes : {4u, 2u, 1u}) maskedJob(bytes);
  rectsJob();
  return bench::run(argc, argv);
}
