// SPDX-License-Identifier: MIT
//
// Video conversion against a copy of the output's size and the public libraries that convert BT.601
// video. Theirs is not the same result: they round otherwise, pack 15 bits one bit lower, and take
// the chroma bytes in the other order, which costs the same.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

enum class Layout { kYuy2, kUyvy, kYv12 };

struct Job {
  Layout layout;
  int depth;  // 15, 16, 24 or 32
  Extent e;
  uint8* src;
  uint8* dst;

  uint32 bytes() const { return static_cast<uint32>(depth + 1) / 8; }
  int width() const { return static_cast<int>(e.width); }
  int height() const { return static_cast<int>(e.height); }
  int dstPitch() const { return static_cast<int>(e.width * bytes()); }
  int srcPitch() const { return layout == Layout::kYv12 ? width() : 2 * width(); }
  size_t pixels() const { return size_t{e.width} * e.height; }
  const uint8* firstChroma() const { return src + pixels(); }
  const uint8* secondChroma() const { return src + pixels() + pixels() / 4; }
};

uint32 codeOf(Layout layout) {
  static constexpr uint32 kCodes[] = {RASTER_VIDEO_YUY2, RASTER_VIDEO_UYVY, RASTER_VIDEO_YV12};
  return kCodes[static_cast<int>(layout)];
}

/// Memory traffic of the conversion as a copy: as many bytes as are read and written, halved.
size_t limitBytes(const Job& job) {
  const size_t read = job.layout == Layout::kYv12 ? job.pixels() * 3 / 2 : job.pixels() * 2;
  return (read + job.pixels() * job.bytes()) / 2;
}

void addLibyuv([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job) {
#ifdef HAVE_LIBYUV
  const int chromaPitch = job.width() / 2;
  if (job.layout == Layout::kYv12 && job.depth != 15) {
    const auto convert = job.depth == 32   ? libyuv::I420ToARGB
                         : job.depth == 24 ? libyuv::I420ToRGB24
                                           : libyuv::I420ToRGB565;
    c.add("libyuv", [=] {
      convert(job.src, job.width(), job.secondChroma(), chromaPitch, job.firstChroma(), chromaPitch,
              job.dst, job.dstPitch(), job.width(), job.height());
    });
  } else if (job.layout != Layout::kYv12 && job.depth == 32) {
    const auto convert = job.layout == Layout::kYuy2 ? libyuv::YUY2ToARGB : libyuv::UYVYToARGB;
    c.add("libyuv", [=] {
      convert(job.src, job.srcPitch(), job.dst, job.dstPitch(), job.width(), job.height());
    });
  }
#endif
}

void addSdl([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job) {
#ifdef HAVE_SDL2
  static constexpr Uint32 kSources[] = {SDL_PIXELFORMAT_YUY2, SDL_PIXELFORMAT_UYVY,
                                        SDL_PIXELFORMAT_YV12};
  const Uint32 source = kSources[static_cast<int>(job.layout)];
  const Uint32 target = job.depth == 15   ? SDL_PIXELFORMAT_RGB555
                        : job.depth == 16 ? SDL_PIXELFORMAT_RGB565
                        : job.depth == 24 ? SDL_PIXELFORMAT_BGR24
                                          : SDL_PIXELFORMAT_RGB888;
  c.add("SDL2", [=] {
    SDL_ConvertPixels(job.width(), job.height(), source, job.src, job.srcPitch(), target, job.dst,
                      job.dstPitch());
  });
#endif
}

void addSwscale([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job) {
#ifdef HAVE_SWSCALE
  static constexpr AVPixelFormat kSources[] = {AV_PIX_FMT_YUYV422, AV_PIX_FMT_UYVY422,
                                               AV_PIX_FMT_YUV420P};
  const AVPixelFormat target = job.depth == 15   ? AV_PIX_FMT_RGB555LE
                               : job.depth == 16 ? AV_PIX_FMT_RGB565LE
                               : job.depth == 24 ? AV_PIX_FMT_BGR24
                                                 : AV_PIX_FMT_BGRA;
  SwsContext* context =
      sws_getContext(job.width(), job.height(), kSources[static_cast<int>(job.layout)], job.width(),
                     job.height(), target, SWS_POINT, nullptr, nullptr, nullptr);
  if (context == nullptr) return;
  c.add("swscale", [=] {
    const uint8* planes[4] = {job.src, job.secondChroma(), job.firstChroma(), nullptr};
    const int pitches[4] = {job.srcPitch(), job.width() / 2, job.width() / 2, 0};
    uint8* out[4] = {job.dst, nullptr, nullptr, nullptr};
    const int outPitches[4] = {job.dstPitch(), 0, 0, 0};
    sws_scale(context, planes, pitches, 0, job.height(), out, outPitches);
  });
#endif
}

void addOpenCv([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job) {
#ifdef HAVE_OPENCV
  if (job.depth < 24) return;
  static constexpr int kCodes[][2] = {{cv::COLOR_YUV2BGR_YUY2, cv::COLOR_YUV2BGRA_YUY2},
                                      {cv::COLOR_YUV2BGR_UYVY, cv::COLOR_YUV2BGRA_UYVY},
                                      {cv::COLOR_YUV2BGR_YV12, cv::COLOR_YUV2BGRA_YV12}};
  const int code = kCodes[static_cast<int>(job.layout)][job.depth == 32];
  const bool planar = job.layout == Layout::kYv12;
  const cv::Mat from(planar ? job.height() * 3 / 2 : job.height(), job.width(),
                     planar ? CV_8UC1 : CV_8UC2, job.src);
  const cv::Mat to(job.height(), job.width(), job.depth == 32 ? CV_8UC4 : CV_8UC3, job.dst);
  c.add("OpenCV", [=]() mutable { cv::cvtColor(from, to, code); });
#endif
}

void yuvJob(const std::string& name, Layout layout, int depth) {
  bench::job("yuv/" + name + "-to-" + std::to_string(depth), [=](Contenders& c, Extent e) {
    const Job job = {layout, depth, e, bench::buffer(1), bench::buffer(0)};
    c.add("raster",
          [=] { Raster_YUVtoRGB(job.src, job.dst, e.width, e.height, codeOf(layout), depth); });
    c.add("limit", [=] { memcpy(job.dst, job.src, limitBytes(job)); });
    addLibyuv(c, job);
    addSdl(c, job);
    addSwscale(c, job);
    addOpenCv(c, job);
  });
}

}  // namespace

int main(int argc, char** argv) {
  for (const int depth : {32, 24, 16, 15}) {
    yuvJob("YUY2", Layout::kYuy2, depth);
    yuvJob("UYVY", Layout::kUyvy, depth);
    yuvJob("YV12", Layout::kYv12, depth);
  }
  return bench::run(argc, argv);
}
