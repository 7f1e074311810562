// SPDX-License-Identifier: MIT
//
// Format conversion against memcpy and the public libraries that convert pixels.

#include <cstring>
#include <string>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

/// A format: its name in a job, its code, and what the peers call it (0 or less: they do not).
struct Format {
  const char* name;
  int32 code;
  uint32 bytes;
  bool isPalette;
  unsigned sdl;
  unsigned pixman;
  int swscale;
};

#ifdef HAVE_SDL2
#define SDL_CODE(code) SDL_PIXELFORMAT_##code
#else
#define SDL_CODE(code) 0
#endif
#ifdef HAVE_PIXMAN
#define PIXMAN_CODE(code) PIXMAN_##code
#else
#define PIXMAN_CODE(code) 0
#endif
#ifdef HAVE_SWSCALE
#define SWS_CODE(code) AV_PIX_FMT_##code
#else
#define SWS_CODE(code) -1
#endif

constexpr unsigned kNone = 0;

constexpr Format k3 = {"3", 3, 1, false, kNone, kNone, -1};
constexpr Format k6 = {"6", 6, 1, false, kNone, PIXMAN_CODE(a2r2g2b2), -1};
// SDL2 has three bits for red at the top where ours are at the bottom: the same work.
constexpr Format k8 = {"8", 8, 1, false, SDL_CODE(RGB332), PIXMAN_CODE(b2g3r3), SWS_CODE(BGR8)};
constexpr Format k15 = {
    "15", 15, 2, false, SDL_CODE(RGB555), PIXMAN_CODE(x1r5g5b5), SWS_CODE(RGB555LE)};
constexpr Format k16 = {
    "16", 16, 2, false, SDL_CODE(RGB565), PIXMAN_CODE(r5g6b5), SWS_CODE(RGB565LE)};
constexpr Format k24 = {"24", 24, 3, false, SDL_CODE(BGR24), PIXMAN_CODE(r8g8b8), SWS_CODE(BGR24)};
constexpr Format k32 = {"32",          32, 4, false, SDL_CODE(ARGB8888), PIXMAN_CODE(a8r8g8b8),
                        SWS_CODE(BGRA)};
constexpr Format kPal8 = {"pal8", 8, 1, true, SDL_CODE(INDEX8), kNone, SWS_CODE(PAL8)};

/// What some peers have functions for: a conversion by libyuv and OpenCV's code, or none.
using LibyuvConversion = int (*)(const uint8*, int, uint8*, int, int, int);
struct Job {
  Format from;
  Format to;
  LibyuvConversion libyuv = nullptr;
  int openCv = -1;
};

#ifdef HAVE_LIBYUV
#define LIBYUV(function) libyuv::function
#else
#define LIBYUV(function) nullptr
#endif
#ifdef HAVE_OPENCV
#define OPENCV(code) cv::COLOR_##code
#else
#define OPENCV(code) -1
#endif

constexpr Job kJobs[] = {
    {k16, k32, LIBYUV(RGB565ToARGB), OPENCV(BGR5652BGRA)},
    {k15, k32, LIBYUV(ARGB1555ToARGB), OPENCV(BGR5552BGRA)},
    {k24, k32, LIBYUV(RGB24ToARGB), OPENCV(BGR2BGRA)},
    {kPal8, k32},
    {k32, k16, LIBYUV(ARGBToRGB565), OPENCV(BGRA2BGR565)},
    {k32, k15, LIBYUV(ARGBToARGB1555), OPENCV(BGRA2BGR555)},
    {k32, k24, LIBYUV(ARGBToRGB24), OPENCV(BGRA2BGR)},
    {k32, k8},
    {k32, k6},
    {k32, k3},
    {k24, k16, nullptr, OPENCV(BGR2BGR565)},
    {k24, k15, nullptr, OPENCV(BGR2BGR555)},
    {k24, k8},
    {k16, k24, nullptr, OPENCV(BGR5652BGR)},
    {k15, k24, nullptr, OPENCV(BGR5552BGR)},
    {k16, k15},
    {k15, k16},
    {k16, k8},
    {kPal8, k16},
    {kPal8, k24},
    {k32, k32, LIBYUV(ARGBCopy)},
};

/// The memory of one measurement.
struct Pictures {
  Extent extent;
  uint8* dst;
  uint8* src;
  uint32 dstPitch;
  uint32 srcPitch;

  int width() const { return static_cast<int>(extent.width); }
  int height() const { return static_cast<int>(extent.height); }
};

const uint32* palette() { return bench::words(bench::buffer(2)); }

void addPixman([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job,
               [[maybe_unused]] const Pictures& p) {
#ifdef HAVE_PIXMAN
  if (job.from.pixman == kNone || job.to.pixman == kNone) return;
  if (p.srcPitch % 4 != 0 || p.dstPitch % 4 != 0) return;
  const auto image = [&](const Format& format, uint8* pixels, uint32 pitch) {
    return bench::pixmanImage(static_cast<pixman_format_code_t>(format.pixman), pixels, p.extent,
                              pitch);
  };
  c.add("pixman",
        [p, src = image(job.from, p.src, p.srcPitch), dst = image(job.to, p.dst, p.dstPitch)] {
          pixman_image_composite32(PIXMAN_OP_SRC, src, nullptr, dst, 0, 0, 0, 0, 0, 0, p.width(),
                                   p.height());
        });
#endif
}

void addLibyuv([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job,
               [[maybe_unused]] const Pictures& p) {
#ifdef HAVE_LIBYUV
  if (job.libyuv == nullptr) return;
  c.add("libyuv", [p, convert = job.libyuv] {
    convert(p.src, static_cast<int>(p.srcPitch), p.dst, static_cast<int>(p.dstPitch), p.width(),
            p.height());
  });
#endif
}

void addSdl([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job,
            [[maybe_unused]] const Pictures& p) {
#ifdef HAVE_SDL2
  if (job.from.sdl == kNone || job.to.sdl == kNone) return;
  const auto surface = [&](const Format& format, uint8* pixels, uint32 pitch) {
    SDL_Surface* made = bench::surface(format.sdl, pixels, p.extent, pitch);
    SDL_SetSurfaceBlendMode(made, SDL_BLENDMODE_NONE);
    return made;
  };
  SDL_Surface* src = surface(job.from, p.src, p.srcPitch);
  SDL_Surface* dst = surface(job.to, p.dst, p.dstPitch);
  if (job.from.isPalette) {
    SDL_Color colors[256];
    memcpy(colors, palette(), sizeof colors);
    SDL_SetPaletteColors(src->format->palette, colors, 0, 256);
  }
  c.add("SDL2", [=] { SDL_BlitSurface(src, nullptr, dst, nullptr); });
#endif
}

void addSwscale([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job,
                [[maybe_unused]] const Pictures& p) {
#ifdef HAVE_SWSCALE
  if (job.from.swscale < 0 || job.to.swscale < 0) return;
  av_log_set_level(AV_LOG_QUIET);
  SwsContext* context = sws_getContext(
      p.width(), p.height(), static_cast<AVPixelFormat>(job.from.swscale), p.width(), p.height(),
      static_cast<AVPixelFormat>(job.to.swscale), SWS_POINT, nullptr, nullptr, nullptr);
  if (context == nullptr) return;
  c.add("swscale", [=] {
    const uint8_t* planes[] = {p.src, bench::buffer(2)};
    const int srcPitches[] = {static_cast<int>(p.srcPitch), 0};
    uint8_t* dstPlanes[] = {p.dst};
    const int dstPitches[] = {static_cast<int>(p.dstPitch)};
    sws_scale(context, planes, srcPitches, 0, p.height(), dstPlanes, dstPitches);
  });
#endif
}

void addOpenCv([[maybe_unused]] Contenders& c, [[maybe_unused]] const Job& job,
               [[maybe_unused]] const Pictures& p) {
#ifdef HAVE_OPENCV
  if (job.openCv < 0) return;
  static constexpr int kTypes[] = {0, CV_8UC1, CV_8UC2, CV_8UC3, CV_8UC4};
  c.add("OpenCV",
        [code = job.openCv, src = bench::mat(kTypes[job.from.bytes], p.src, p.extent, p.srcPitch),
         dst = bench::mat(kTypes[job.to.bytes], p.dst, p.extent, p.dstPitch)]() mutable {
          cv::cvtColor(src, dst, code);
        });
#endif
}

/// The limit moves as many bytes as the larger side has.
void convertJob(const Job& job) {
  bench::job(std::string("convert/") + job.from.name + "-to-" + job.to.name, [=](Contenders& c,
                                                                                 Extent e) {
    const Pictures p = {e, bench::buffer(0), bench::buffer(1), e.width * job.to.bytes,
                        e.width * job.from.bytes};
    c.add("raster", [=] {
      Raster_ConvertPixels(p.dst, p.dstPitch, job.to.code, p.src, p.srcPitch, job.from.code,
                           job.from.isPalette, palette(), 0, 0, 0, 0, e.width, e.height);
    });
    c.add("limit", [=] { memcpy(p.dst, p.src, size_t{e.height} * (p.dstPitch + p.srcPitch) / 2); });
    addPixman(c, job, p);
    addLibyuv(c, job, p);
    addSdl(c, job, p);
    addSwscale(c, job, p);
    addOpenCv(c, job, p);
  });
}

/// Single pixels, one call each.
void onePixelJob() {
  constexpr uint32 kPixels = 1024;
  Contenders c("convert/onepixel-32-to-16", {kPixels, 1}, kPixels);
  const uint32* pixels = bench::words(bench::buffer(1));
  c.add("raster", [=] {
    for (uint32 i = 0; i < kPixels; ++i) {
      benchmark::DoNotOptimize(Raster_ConvertOnePixel(pixels[i], 32, 16, false, nullptr));
    }
  });
#ifdef HAVE_SDL2
  c.add("SDL2", [pixels, format = SDL_AllocFormat(SDL_PIXELFORMAT_RGB565)] {
    for (uint32 i = 0; i < kPixels; ++i) {
      const uint32 p = pixels[i];
      benchmark::DoNotOptimize(SDL_MapRGB(format, static_cast<uint8>(p >> 16),
                                          static_cast<uint8>(p >> 8), static_cast<uint8>(p)));
    }
  });
#endif
}

}  // namespace

int main(int argc, char** argv) {
  for (const Job& job : kJobs) convertJob(job);
  onePixelJob();
  return bench::run(argc, argv);
}
