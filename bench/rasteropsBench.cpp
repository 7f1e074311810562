// SPDX-License-Identifier: MIT
//
// Fill and copy against memset, memcpy and the public libraries that do the same.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr uint32 kPixel = 0x5A3C21F7;

#ifdef HAVE_SDL2
SDL_Surface* surface(uint8* pixels, Extent e, uint32 bytes) {
  const Uint32 format = bytes == 4 ? Uint32{SDL_PIXELFORMAT_ARGB8888} : bench::kSdlFormats[bytes];
  return bench::surface(format, pixels, e, e.width * bytes);
}
#endif

void fillJob(uint32 bytes) {
  bench::job("fill/" + std::to_string(8 * bytes), [=](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    const uint32 pitch = e.width * bytes;
    const size_t total = size_t{pitch} * e.height;
    c.add("raster", [=] { Raster_RectFill(dst, pitch, bytes, kPixel, 0, 0, e.width, e.height); });
    c.add("limit", [=] { memset(dst, 0x5A, total); });
    const int w = static_cast<int>(e.width);
    const int h = static_cast<int>(e.height);
    const int intPitch = static_cast<int>(pitch);
#ifdef HAVE_PIXMAN
    if (bytes != 3) {
      c.add("pixman", [=] {
        pixman_fill(bench::words(dst), intPitch / 4, static_cast<int>(8 * bytes), 0, 0, w, h,
                    kPixel);
      });
    }
#endif
#ifdef HAVE_LIBYUV
    if (bytes == 4) c.add("libyuv", [=] { libyuv::ARGBRect(dst, intPitch, 0, 0, w, h, kPixel); });
    if (bytes == 1) c.add("libyuv", [=] { libyuv::SetPlane(dst, intPitch, w, h, 0x5A); });
#endif
#ifdef HAVE_SDL2
    c.add("SDL2", [s = surface(dst, e, bytes)] { SDL_FillRect(s, nullptr, kPixel); });
#endif
#ifdef HAVE_OPENCV
    c.add("OpenCV", [mat = bench::mat(bench::kMatTypes[bytes], dst, e, pitch)]() mutable {
      mat.setTo(cv::Scalar(0xF7, 0x21, 0x3C, 0x5A));
    });
#endif
    (void)w, (void)h, (void)intPitch;
  });
}

/// A copy between two buffers, or within one where dx or dy is not 0.
void copyJob(const std::string& name, uint32 bytes, uint32 dx, uint32 sy, uint32 dy, uint32 mmx) {
  bench::job("copy/" + name, [=](Contenders& c, Extent e) {
    const bool scrolls = dx != 0 || sy != dy;
    uint8* dst = bench::buffer(0);
    uint8* src = scrolls ? dst : bench::buffer(1);
    const uint32 pitch = (e.width + dx) * bytes;
    const size_t total = size_t{e.width} * bytes * e.height;
    c.add("raster", [=] {
      rasterops_mmx = mmx;
      Raster_RectCopy(dst, pitch, src, pitch, bytes, 0, sy, dx, dy, e.width, e.height);
    });
    c.add("limit", [=] {
      memmove(dst + size_t{dy} * pitch + size_t{dx} * bytes, src + size_t{sy} * pitch, total);
    });
    if (scrolls) return;
    const int w = static_cast<int>(e.width);
    const int h = static_cast<int>(e.height);
    const int intPitch = static_cast<int>(pitch);
#ifdef HAVE_PIXMAN
    if (bytes == 4) {
      c.add("pixman", [=] {
        pixman_blt(bench::words(src), bench::words(dst), intPitch / 4, intPitch / 4, 32, 32, 0, 0,
                   0, 0, w, h);
      });
    }
#endif
#ifdef HAVE_LIBYUV
    c.add("libyuv", [=] { libyuv::CopyPlane(src, intPitch, dst, intPitch, intPitch, h); });
#endif
#ifdef HAVE_SDL2
    c.add("SDL2", [from = surface(src, e, bytes), to = surface(dst, e, bytes)] {
      SDL_BlitSurface(from, nullptr, to, nullptr);
    });
#endif
#ifdef HAVE_OPENCV
    c.add("OpenCV",
          [from = cv::Mat(h, intPitch, CV_8UC1, src, pitch),
           to = cv::Mat(h, intPitch, CV_8UC1, dst, pitch)]() mutable { from.copyTo(to); });
#endif
    (void)w, (void)h, (void)intPitch;
  });
}

void fillAlphaJob() {
  bench::job("fillalpha/32", [](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    const uint32 pitch = e.width * 4;
    c.add("raster", [=] { Raster_RectFillAlpha(dst, pitch, 0x80, 0, 0, e.width, e.height); });
    c.add("limit", [=] { memset(dst, 0x5A, size_t{pitch} * e.height); });
#ifdef HAVE_PIXMAN
    const int w = static_cast<int>(e.width);
    const int h = static_cast<int>(e.height);
    auto* image = bench::pixmanImage(PIXMAN_a8r8g8b8, dst, e, pitch);
    const pixman_color_t opaque = {0, 0, 0, 0xFFFF};
    auto* source = pixman_image_create_solid_fill(&opaque);
    c.add("pixman ADD", [=] {
      pixman_image_composite32(PIXMAN_OP_ADD, source, nullptr, image, 0, 0, 0, 0, 0, 0, w, h);
    });
#endif
  });
}

}  // namespace

int main(int argc, char** argv) {
  for (const uint32 bytes : {1u, 2u, 3u, 4u}) fillJob(bytes);
  for (const uint32 bytes : {1u, 3u, 4u}) copyJob(std::to_string(8 * bytes), bytes, 0, 0, 0, 0);
  copyJob("32-mmxswitch", 4, 0, 0, 0, 1);
  copyJob("32-scroll-down1", 4, 0, 0, 1, 0);
  copyJob("32-scroll-up1", 4, 0, 1, 0, 0);
  copyJob("32-scroll-right1", 4, 1, 0, 0, 0);
  fillAlphaJob();
  return bench::run(argc, argv);
}
