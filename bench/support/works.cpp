// SPDX-License-Identifier: MIT

#include "support/works.h"

#include <dlfcn.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "raster.h"

namespace bench {
namespace {

using Call = std::function<void()>;

constexpr uint32 kPixel = 0x5A3C21F7;

Call fill(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_RectFill)>("Raster_RectFill");
  return [=] { f(buffer(0), 4 * e.width, 4, kPixel, 0, 0, e.width, e.height); };
}

Call copy(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_RectCopy)>("Raster_RectCopy");
  return
      [=] { f(buffer(0), 4 * e.width, buffer(1), 4 * e.width, 4, 0, 0, 0, 0, e.width, e.height); };
}

Call ropCopy(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_RectROPcopy)>("Raster_RectROPcopy");
  const auto pitch = static_cast<int32>(4 * e.width);
  return [=] {
    f(buffer(0), pitch, buffer(1), pitch, 4, 0, 0, RASTER_ROP_XOR, 0, 0, e.width, e.height);
  };
}

Call tile(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_RectPixmapCopy)>("Raster_RectPixmapCopy");
  return [=] {
    f(buffer(0), 4 * e.width, buffer(1), 64 * 4, 4, 3, 5, 64, 64, 0, 0, e.width, e.height);
  };
}

Call bits(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_BitsToPixels)>("Raster_BitsToPixels");
  return [=] {
    f(buffer(1), (e.width + 7) / 8, buffer(0), 4 * e.width, 4, static_cast<int32>(e.width),
      static_cast<int32>(e.height), kPixel, ~kPixel);
  };
}

Call convert(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_ConvertPixels)>("Raster_ConvertPixels");
  return [=] {
    f(buffer(0), 2 * e.width, 16, buffer(1), 4 * e.width, 32, false, nullptr, 0, 0, 0, 0, e.width,
      e.height);
  };
}

/// A picture with itself: all of it is read.
Call compare(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_ComparePixels)>("Raster_ComparePixels");
  return [=] {
    benchmark::DoNotOptimize(
        f(buffer(1), 4 * e.width, 32, buffer(1), 4 * e.width, 32, 0, 0, 0, 0, e.width, e.height));
  };
}

Call blend(const Library& library, Extent e, uint32 depth, uint32 bpp, uint8 staged) {
  const auto f = library.find<decltype(Raster_AlphaBlendOver)>("Raster_AlphaBlendOver");
  return [=] {
    f(buffer(0), 0, 0, e.width * bpp / 8, buffer(2), 0, 0, 4 * e.width, e.width, e.height, depth,
      bpp, staged);
  };
}

/// The larger side is of the given size.
Call scale(const Library& library, Extent larger, double factor, bool smooth) {
  const auto f = library.find<decltype(Raster_Scale)>("Raster_Scale");
  const double smaller = factor > 1 ? 1 / factor : factor;
  const auto side = [=](uint32 n) {
    return n == 0 ? 0 : std::max(1u, static_cast<uint32>(n * smaller));
  };
  const Extent other = {side(larger.width), side(larger.height)};
  const Extent from = factor > 1 ? other : larger;
  const Extent to = factor > 1 ? larger : other;
  return [=] {
    f(buffer(0), 4 * to.width, 32, 24, to.width, to.height, 0, 0, 0, static_cast<int32>(to.width),
      static_cast<int32>(to.height), buffer(1), static_cast<int32>(4 * from.width), 32, 24, 0,
      from.width, from.height, 0, factor, factor, smooth ? 1 : 0);
  };
}

Call video(const Library& library, Extent e) {
  const auto f = library.find<decltype(Raster_YUVtoRGB)>("Raster_YUVtoRGB");
  return [=] { f(buffer(1), buffer(0), e.width, e.height, RASTER_VIDEO_YUY2, 32); };
}

}  // namespace

Library::Library(const char* path) : handle_(dlopen(path, RTLD_NOW | RTLD_LOCAL)) {
  if (handle_ != nullptr) return;
  fprintf(stderr, "%s\n", dlerror());
  exit(2);
}

void* Library::address(const char* name) const {
  void* found = dlsym(handle_, name);
  if (found != nullptr) return found;
  fprintf(stderr, "%s\n", dlerror());
  exit(2);
}

const std::vector<Work>& works() {
  using Of = const Library&;
  static const std::vector<Work> all = {
      {"fill-32", fill},
      {"copy-32", copy},
      {"ropcopy-32-xor", ropCopy},
      {"tile-32-copy-64x64", tile},
      {"bits-32", bits},
      {"convert-32-to-16", convert},
      {"compare-32-equal", compare},
      {"blend-over-32", [](Of l, Extent e) { return blend(l, e, 24, 32, 0); }},
      {"blend-over-32-staged", [](Of l, Extent e) { return blend(l, e, 24, 32, 1); }},
      {"blend-over-16", [](Of l, Extent e) { return blend(l, e, 16, 16, 0); }},
      {"scale-bilinear-32-x1.5", [](Of l, Extent e) { return scale(l, e, 1.5, true); }},
      {"scale-box-32-x0.5", [](Of l, Extent e) { return scale(l, e, 0.5, true); }},
      {"yuv-YUY2-to-32", video}};
  return all;
}

Call addRects(const Library& library) {
  const auto clear = library.find<decltype(Raster_ClearRectList)>("Raster_ClearRectList");
  const auto add = library.find<decltype(Raster_AddRect)>("Raster_AddRect");
  return [=] {
    RectList list;
    clear(&list);
    for (int32 i = 0; i < 12; ++i) add(&list, 10 * i, 10 * i, 30, 30);
    benchmark::DoNotOptimize(list);
  };
}

}  // namespace bench
