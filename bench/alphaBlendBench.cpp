// SPDX-License-Identifier: MIT
//
// Blending against a copy of as many bytes and the public libraries that blend.
//
// The limit copies the mean of the bytes of a source and a destination pixel, so that it reads and
// writes as much memory as a blend. Peers marked ~x round or use the fourth byte, those marked ~dst
// take the destination's alpha from its pixels in place of a constant, ~straight multiplies colors
// by alpha.

#include <cstring>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

/// A row of the table: what is blended onto what, and how.
struct Job {
  const char* name;
  uint32 depth, bpp;
  uint32 op;
  uint32 flags;
  bool sprite;
  uint8 staged;
};

constexpr Job kJobs[] = {
    {"over-32", 24, 32, RASTER_BLEND_OVER, 0, false, 0},
    {"over-32-sprite", 24, 32, RASTER_BLEND_OVER, 0, true, 0},
    {"over-32-staged", 24, 32, RASTER_BLEND_OVER, 0, false, 1},
    {"over-32-srcalpha", 24, 32, RASTER_BLEND_OVER, RASTER_BLEND_USE_SRC_ALPHA, false, 0},
    {"over-32-srcalpha-dstalpha", 24, 32, RASTER_BLEND_OVER,
     RASTER_BLEND_USE_SRC_ALPHA | RASTER_BLEND_USE_DST_ALPHA, false, 0},
    {"over-24", 24, 24, RASTER_BLEND_OVER, 0, false, 0},
    {"over-16", 16, 16, RASTER_BLEND_OVER, 0, false, 0},
    {"over-16-sprite", 16, 16, RASTER_BLEND_OVER, 0, true, 0},
    {"over-16-staged", 16, 16, RASTER_BLEND_OVER, 0, false, 1},
    {"over-15", 15, 16, RASTER_BLEND_OVER, 0, false, 0},
    {"over-8", 8, 8, RASTER_BLEND_OVER, 0, false, 0},
    {"over-6", 6, 8, RASTER_BLEND_OVER, 0, false, 0},
    {"src-32", 24, 32, RASTER_BLEND_SOURCE, 0, false, 0},
    {"overrev-32-dstalpha", 24, 32, RASTER_BLEND_OVER_REVERSE, RASTER_BLEND_USE_DST_ALPHA, false,
     0},
    {"in-32", 24, 32, RASTER_BLEND_IN, 0, false, 0},
    {"inrev-32", 24, 32, RASTER_BLEND_IN_REVERSE, 0, false, 0},
    {"outrev-32", 24, 32, RASTER_BLEND_OUT_REVERSE, 0, false, 0},
    {"atop-32-dstalpha", 24, 32, RASTER_BLEND_ATOP, RASTER_BLEND_USE_DST_ALPHA, false, 0},
    {"atoprev-32-dstalpha", 24, 32, RASTER_BLEND_ATOP_REVERSE, RASTER_BLEND_USE_DST_ALPHA, false,
     0},
    {"add-32", 24, 32, RASTER_BLEND_ADD, 0, false, 0},
    {"saturate-32-dstalpha", 24, 32, RASTER_BLEND_SATURATE, RASTER_BLEND_USE_DST_ALPHA, false, 0},
    {"inrev-16", 16, 16, RASTER_BLEND_IN_REVERSE, 0, false, 0},
    {"add-16", 16, 16, RASTER_BLEND_ADD, 0, false, 0},
    {"add-24", 24, 24, RASTER_BLEND_ADD, 0, false, 0},
    {"add-15", 15, 16, RASTER_BLEND_ADD, 0, false, 0},
    {"atop-16-dstalpha", 16, 16, RASTER_BLEND_ATOP, RASTER_BLEND_USE_DST_ALPHA, false, 0},
    {"outrev-24", 24, 24, RASTER_BLEND_OUT_REVERSE, 0, false, 0},
    {"src-16", 16, 16, RASTER_BLEND_SOURCE, 0, false, 0},
};

constexpr uint32 kAlpha = 0xB0;  // both constants

/// Premultiplied noise, and in the last buffer runs of sixteen pixels: half of them clear, a third
/// opaque, the rest mixed.
void prepareSources() {
  uint8* noise = bench::buffer(1);
  uint8* sprite = bench::buffer(2);
  for (size_t i = 0; i < bench::kBufferBytes; i += 4) {
    const uint32 run = static_cast<uint32>(i / 64) * 2654435761u >> 16;
    const uint8 alpha = run % 6 < 3 ? 0 : run % 6 < 5 ? 255 : noise[i + 3];
    for (size_t k = 0; k < 3; ++k) {
      sprite[i + k] = static_cast<uint8>(noise[i + k] * alpha / 255);
      noise[i + k] = static_cast<uint8>(noise[i + k] * noise[i + 3] / 255);
    }
    sprite[i + 3] = alpha;
  }
}

#ifdef HAVE_PIXMAN
void addPixman(Contenders& c, const Job& job, Extent e, uint8* dst, uint8* src, uint32 pitch) {
  const bool dstAlpha = (job.flags & RASTER_BLEND_USE_DST_ALPHA) != 0;
  const auto format = job.depth == 6    ? PIXMAN_a2r2g2b2
                      : job.depth == 8  ? PIXMAN_b2g3r3
                      : job.depth == 15 ? (dstAlpha ? PIXMAN_a1r5g5b5 : PIXMAN_x1r5g5b5)
                      : job.depth == 16 ? PIXMAN_r5g6b5
                      : job.bpp == 24   ? PIXMAN_r8g8b8
                      : dstAlpha        ? PIXMAN_a8r8g8b8
                                        : PIXMAN_x8r8g8b8;
  if (pitch % 4 != 0) return;
  auto* to = bench::pixmanImage(format, dst, e, pitch);
  auto* from = bench::pixmanImage(PIXMAN_a8r8g8b8, src, e, e.width * 4);
  const pixman_color_t faded = {0, 0, 0, kAlpha * 0x101};
  auto* mask = (job.flags & RASTER_BLEND_USE_SRC_ALPHA) != 0
                   ? pixman_image_create_solid_fill(&faded)
                   : nullptr;
  const char* name = dstAlpha ? "pixman~dst" : job.bpp == 32 ? "pixman~x" : "pixman";
  c.add(name, [=, op = static_cast<pixman_op_t>(job.op)] {
    pixman_image_composite32(op, from, mask, to, 0, 0, 0, 0, 0, 0, static_cast<int>(e.width),
                             static_cast<int>(e.height));
  });
}
#endif

#ifdef HAVE_QT6
void addQt(Contenders& c, const Job& job, Extent e, uint8* dst, uint8* src, uint32 pitch) {
  const bool dstAlpha = (job.flags & RASTER_BLEND_USE_DST_ALPHA) != 0;
  if (job.bpp == 8 || job.op == RASTER_BLEND_SATURATE) return;
  static constexpr QPainter::CompositionMode kModes[] = {QPainter::CompositionMode_Clear,
                                                         QPainter::CompositionMode_Source,
                                                         QPainter::CompositionMode_Destination,
                                                         QPainter::CompositionMode_SourceOver,
                                                         QPainter::CompositionMode_DestinationOver,
                                                         QPainter::CompositionMode_SourceIn,
                                                         QPainter::CompositionMode_DestinationIn,
                                                         QPainter::CompositionMode_SourceOut,
                                                         QPainter::CompositionMode_DestinationOut,
                                                         QPainter::CompositionMode_SourceAtop,
                                                         QPainter::CompositionMode_DestinationAtop,
                                                         QPainter::CompositionMode_Xor,
                                                         QPainter::CompositionMode_Plus};
  const auto format = job.depth == 15   ? QImage::Format_RGB555
                      : job.depth == 16 ? QImage::Format_RGB16
                      : job.bpp == 24   ? QImage::Format_BGR888
                      : dstAlpha        ? QImage::Format_ARGB32_Premultiplied
                                        : QImage::Format_RGB32;
  const int w = static_cast<int>(e.width);
  const int h = static_cast<int>(e.height);
  const QImage from(src, w, h, static_cast<int>(e.width * 4), QImage::Format_ARGB32_Premultiplied);
  QImage to(dst, w, h, static_cast<int>(pitch), format);
  const auto mode = kModes[job.op];
  const double opacity = (job.flags & RASTER_BLEND_USE_SRC_ALPHA) != 0 ? kAlpha / 255.0 : 1.0;
  c.add(dstAlpha ? "Qt6~dst" : "Qt6~x", [=]() mutable {
    QPainter painter(&to);
    painter.setCompositionMode(mode);
    painter.setOpacity(opacity);
    painter.drawImage(0, 0, from);
  });
}
#endif

void addOthers(Contenders& c, const Job& job, Extent e, uint8* dst, uint8* src, uint32 pitch) {
  const int w = static_cast<int>(e.width);
  const int h = static_cast<int>(e.height);
  const int srcPitch = w * 4;
  const int dstPitch = static_cast<int>(pitch);
#ifdef HAVE_LIBYUV
  if (job.op == RASTER_BLEND_OVER && job.bpp == 32 && job.flags == 0) {
    c.add("libyuv~x",
          [=] { libyuv::ARGBBlend(src, srcPitch, dst, dstPitch, dst, dstPitch, w, h); });
  }
#endif
#ifdef HAVE_SDL2
  if (job.op == RASTER_BLEND_OVER && job.flags == 0 && job.bpp != 8) {
    const auto format = job.depth == 15   ? SDL_PIXELFORMAT_RGB555
                        : job.depth == 16 ? SDL_PIXELFORMAT_RGB565
                        : job.bpp == 24   ? SDL_PIXELFORMAT_BGR24
                                          : SDL_PIXELFORMAT_RGB888;
    auto* from = bench::surface(SDL_PIXELFORMAT_ARGB8888, src, e, e.width * 4);
    auto* to = bench::surface(format, dst, e, pitch);
    SDL_SetSurfaceBlendMode(from, SDL_BLENDMODE_BLEND);
    c.add("SDL2~straight", [=] { SDL_BlitSurface(from, nullptr, to, nullptr); });
  }
#endif
#ifdef HAVE_OPENCV
  if (job.op == RASTER_BLEND_ADD && job.bpp == 32) {
    c.add("OpenCV~x",
          [from = bench::mat(CV_8UC4, src, e, e.width * 4),
           to = bench::mat(CV_8UC4, dst, e, pitch)]() mutable { cv::add(from, to, to); });
  }
#endif
  (void)c, (void)job, (void)dst, (void)src, (void)w, (void)h, (void)srcPitch, (void)dstPitch;
}

void blendJob(const Job& job) {
  bench::job(std::string("blend/") + job.name, [&](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    uint8* src = bench::buffer(job.sprite ? 2 : 1);
    const uint32 pitch = e.width * (job.bpp / 8);
    const uint32 srcPitch = e.width * 4;
    c.add("raster", [=] {
      Raster_AlphaBlend(dst, 0, 0, pitch, src, 0, 0, srcPitch, e.width, e.height, job.depth,
                        job.bpp, job.op, job.flags, kAlpha, kAlpha, job.staged);
    });
    c.add("limit", [=] { memcpy(dst, src, size_t{pitch + srcPitch} / 2 * e.height); });
#ifdef HAVE_PIXMAN
    addPixman(c, job, e, dst, src, pitch);
#endif
#ifdef HAVE_QT6
    addQt(c, job, e, dst, src, pitch);
#endif
    addOthers(c, job, e, dst, src, pitch);
  });
}

}  // namespace

int main(int argc, char** argv) {
  prepareSources();
  for (const Job& job : kJobs) blendJob(job);
  return bench::run(argc, argv);
}
