// SPDX-License-Identifier: MIT
//
// The public libraries that draw, scale and convert, each where it is installed (HAVE_<NAME>, from
// cmake/Peers.cmake), and pixels as their interfaces want them. What is made here lives as long as
// the program.

#ifndef BENCH_PEERS_H
#define BENCH_PEERS_H

#ifdef HAVE_LIBYUV
#include <libyuv.h>
#include <libyuv/scale_rgb.h>
#endif
#ifdef HAVE_OPENCV
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>
#endif
#ifdef HAVE_PIXMAN
#include <pixman.h>
#endif
#ifdef HAVE_QT6
#define QT_NO_KEYWORDS
#include <QBrush>
#include <QImage>
#include <QPainter>
#endif
#ifdef HAVE_SDL2
#include <SDL.h>
#endif
#ifdef HAVE_SWSCALE
extern "C" {
#include <libavutil/cpu.h>
#include <libavutil/log.h>
#include <libswscale/swscale.h>
}
#endif

#include <cstdlib>
#include <cstring>

#include "baseTypes.h"
#include "support/jobs.h"

namespace bench {

#ifdef HAVE_OPENCV
/// By bytes per pixel.
inline constexpr int kMatTypes[] = {0, CV_8UC1, CV_16UC1, CV_8UC3, CV_8UC4};

inline cv::Mat mat(int type, uint8* pixels, Extent e, uint32 pitch) {
  return {static_cast<int>(e.height), static_cast<int>(e.width), type, pixels, pitch};
}
#endif

#ifdef HAVE_PIXMAN
/// By bytes per pixel.
inline constexpr pixman_format_code_t kPixmanFormats[] = {PIXMAN_a8, PIXMAN_a8, PIXMAN_r5g6b5,
                                                          PIXMAN_r8g8b8, PIXMAN_a8r8g8b8};

inline pixman_image_t* pixmanImage(pixman_format_code_t format, uint8* pixels, Extent e,
                                   uint32 pitch) {
  return pixman_image_create_bits(format, static_cast<int>(e.width), static_cast<int>(e.height),
                                  words(pixels), static_cast<int>(pitch));
}
#endif

#ifdef HAVE_QT6
inline QImage qImage(QImage::Format format, uint8* pixels, Extent e, uint32 pitch) {
  return {pixels, static_cast<int>(e.width), static_cast<int>(e.height),
          static_cast<qsizetype>(pitch), format};
}
#endif

#ifdef HAVE_SDL2
/// By bytes per pixel; those of four bytes without alpha.
inline constexpr Uint32 kSdlFormats[] = {0, SDL_PIXELFORMAT_INDEX8, SDL_PIXELFORMAT_RGB565,
                                         SDL_PIXELFORMAT_BGR24, SDL_PIXELFORMAT_RGB888};

inline SDL_Surface* surface(Uint32 format, uint8* pixels, Extent e, uint32 pitch) {
  return SDL_CreateRGBSurfaceWithFormatFrom(
      pixels, static_cast<int>(e.width), static_cast<int>(e.height),
      static_cast<int>(SDL_BITSPERPIXEL(format)), static_cast<int>(pitch), format);
}
#endif

/// Everybody works with one thread, as this library does, and those that choose an instruction set
/// when they run choose none above RASTER_CPU_LEVEL (OpenCV: in scripts/measure.sh, before it
/// starts; Qt cannot be held below AVX2; the others have nothing above SSSE3).
inline void preparePeers() {
#ifdef HAVE_OPENCV
  cv::setNumThreads(1);
#endif
  const char* level = getenv("RASTER_CPU_LEVEL");
  if (level == nullptr) return;
  [[maybe_unused]] const bool upToSse4 = strcmp(level, "sse4") == 0;
  [[maybe_unused]] const bool upToAvx2 = upToSse4 || strcmp(level, "avx2") == 0;
#ifdef HAVE_LIBYUV
  if (upToSse4)
    libyuv::MaskCpuFlags(libyuv::kCpuHasX86 | libyuv::kCpuHasSSE2 | libyuv::kCpuHasSSSE3 |
                         libyuv::kCpuHasSSE41 | libyuv::kCpuHasSSE42);
#endif
#ifdef HAVE_SWSCALE
  constexpr int kAbove512 = AV_CPU_FLAG_AVX512 | AV_CPU_FLAG_AVX512ICL;
  constexpr int kAboveSse4 = AV_CPU_FLAG_AVX | AV_CPU_FLAG_AVX2 | AV_CPU_FLAG_FMA3 |
                             AV_CPU_FLAG_FMA4 | AV_CPU_FLAG_XOP | AV_CPU_FLAG_BMI1 |
                             AV_CPU_FLAG_BMI2;
  if (upToAvx2) av_force_cpu_flags(av_get_cpu_flags() & ~(kAbove512 | (upToSse4 ? kAboveSse4 : 0)));
#endif
}

}  // namespace bench

#endif
