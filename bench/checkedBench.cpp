// SPDX-License-Identifier: MIT
//
// What the checks cost: every job through the companion (the contender "raster") beside the exact
// function (the contender "exact"), from rectangles of a few pixels up.

#include <cstdlib>

#include "rasterChecked.h"
#include "support/jobs.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr Extent kSizes[] = {{4, 4}, {16, 16}, {64, 64}, {256, 256}};

/// A view of a benchmark's shared memory.
RasterView viewOf(int buffer, Extent e, uint32 depth, uint32 bpp) {
  return {
      bench::buffer(buffer), bench::kBufferBytes, e.width * bpp / 8, e.width, e.height, depth, bpp};
}

template <class Checked, class Exact>
void pair(const char* name, Extent e, Checked checked, Exact exact) {
  Contenders c(std::string("checked/") + name, e, e.pixels());
  c.add("raster", checked);
  c.add("exact", exact);
}

void fillJob(Extent e, uint32 bpp) {
  const RasterView d = viewOf(0, e, bpp == 32 ? 24 : bpp, bpp);
  const Rect r = {0, 0, static_cast<int32>(e.width), static_cast<int32>(e.height)};
  pair(
      bpp == 8 ? "fill-8" : "fill-32", e,
      [=] { benchmark::DoNotOptimize(RasterChecked_Fill(&d, &r, 0x5A3C21F7, 0)); },
      [=] { Raster_RectFill(d.data, d.pitch, bpp / 8, 0x5A3C21F7, 0, 0, e.width, e.height); });
}

void copyJobs(Extent e) {
  const RasterView d = viewOf(0, e, 24, 32);
  const RasterView s = viewOf(1, e, 24, 32);
  const Rect r = {0, 0, static_cast<int32>(e.width), static_cast<int32>(e.height)};
  pair(
      "copy-32", e, [=] { benchmark::DoNotOptimize(RasterChecked_Copy(&d, &r, &s, 0, 0, 0)); },
      [=] { Raster_RectCopy(d.data, d.pitch, s.data, s.pitch, 4, 0, 0, 0, 0, e.width, e.height); });
  pair(
      "rop-xor-32", e,
      [=] { benchmark::DoNotOptimize(RasterChecked_RopCopy(&d, &r, &s, 0, 0, 6, 0)); },
      [=] {
        Raster_RectROPcopy(d.data, static_cast<int32>(d.pitch), s.data, static_cast<int32>(s.pitch),
                           4, 0, 0, 6, 0, 0, e.width, e.height);
      });
}

void convertJobs(Extent e) {
  const RasterView d = viewOf(0, e, 16, 16);
  const RasterView wide = viewOf(0, e, 24, 32);
  const RasterView s = viewOf(1, e, 24, 32);
  const RasterView index = viewOf(2, e, 8, 8);
  static uint32 palette[256];
  pair(
      "convert-32-16", e,
      [=] {
        benchmark::DoNotOptimize(RasterChecked_Convert(&d, nullptr, &s, 0, 0, nullptr, 0, 0));
      },
      [=] {
        Raster_ConvertPixels(d.data, d.pitch, 16, s.data, s.pitch, 32, false, nullptr, 0, 0, 0, 0,
                             e.width, e.height);
      });
  pair(
      "convert-palette-200", e,
      [=] {
        benchmark::DoNotOptimize(
            RasterChecked_Convert(&wide, nullptr, &index, 0, 0, palette, 200, 0));
      },
      [=] {
        Raster_ConvertPixels(wide.data, wide.pitch, 32, index.data, index.pitch, 8, true, palette,
                             0, 0, 0, 0, e.width, e.height);
      });
}

void blendAndCompareJobs(Extent e) {
  const RasterView d = viewOf(0, e, 24, 32);
  const RasterView s = viewOf(1, e, 24, 32);
  pair(
      "blend-over-32", e,
      [=] { benchmark::DoNotOptimize(RasterChecked_Blend(&d, nullptr, &s, 0, 0, nullptr, 0)); },
      [=] {
        Raster_AlphaBlendOver(d.data, 0, 0, d.pitch, s.data, 0, 0, s.pitch, e.width, e.height, 24,
                              32, 0);
      });
  pair(
      "compare-32", e,
      [=] {
        int32 difference = 0;
        RasterChecked_Compare(&s, nullptr, &s, 0, 0, 0, &difference);
        benchmark::DoNotOptimize(difference);
      },
      [=] {
        benchmark::DoNotOptimize(Raster_ComparePixels(s.data, s.pitch, 32, s.data, s.pitch, 32, 0,
                                                      0, 0, 0, e.width, e.height));
      });
}

void scaleJob(Extent e) {
  const RasterView d = viewOf(0, e, 24, 32);
  const RasterView s = viewOf(1, {e.width / 2, e.height / 2}, 24, 32);
  pair(
      "scale-2-32", e,
      [=] { benchmark::DoNotOptimize(RasterChecked_Scale(&d, nullptr, &s, 2.0, 2.0, 1, 0)); },
      [=] {
        Raster_Scale(d.data, d.pitch, 32, 24, d.width, d.height, 0, 0, 0,
                     static_cast<int32>(d.width), static_cast<int32>(d.height), s.data,
                     static_cast<int32>(s.pitch), 32, 24, 0, s.width, s.height, 0, 2.0, 2.0, 1);
      });
}

/// A block with runs of eight pixels: the companion walks the code before it is unpacked.
void blockJob(Extent e) {
  const RasterView view = viewOf(3, e, 24, 32);
  uint32* const pixels = bench::words(view.data);
  for (uint32 i = 0; i < e.width * e.height; ++i) pixels[i] = i / 8;
  uint8* block = nullptr;
  uint32 size = 0;
  Raster_Compress(view.data, view.pitch, 32, e.width, e.height, &block, &size);
  pair(
      "decompress-32", e,
      [=] {
        RasterView made = {};
        RasterChecked_Decompress(block, size, nullptr, &made);
        free(made.data);
      },
      [=] {
        uint8* made = nullptr;
        uint32 fields[4];
        Raster_Decompress(block, &made, &fields[0], &fields[1], &fields[2], &fields[3]);
        free(made);
      });
}

}  // namespace

int main(int argc, char** argv) {
  for (const Extent e : kSizes) {
    fillJob(e, 8);
    fillJob(e, 32);
    copyJobs(e);
    convertJobs(e);
    blendAndCompareJobs(e);
    scaleJob(e);
    blockJob(e);
  }
  return bench::run(argc, argv);
}
