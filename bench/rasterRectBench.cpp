// SPDX-License-Identifier: MIT
//
// Rect lists against pixman's regions, and intersection against SDL's. Rates are in calls.

#include <array>

#include "raster.h"
#include "rect.h"
#include "support/jobs.h"
#include "support/peers.h"

#ifdef HAVE_PIXMAN
#include "peers/pixmanRegion.h"
#endif

namespace {

using bench::Contenders;

/// Squares down a slope, each over the two before it: every step makes a band.
constexpr auto kOverlapping = [] {
  std::array<RectListEntry, 12> rects{};
  int32 i = 0;
  for (RectListEntry& r : rects) r = {10 * i, 10 * i, 30, 30}, ++i;
  return rects;
}();

/// Two rows of four, as windows lie on a screen.
constexpr auto kDisjoint = [] {
  std::array<RectListEntry, 8> rects{};
  int32 i = 0;
  for (RectListEntry& r : rects) r = {100 * (i % 4), 100 * (i / 4), 60, 40 + 5 * (i % 4)}, ++i;
  return rects;
}();

/// Four holes in one rectangle.
constexpr RectListEntry kWhole = {0, 0, 400, 400};
constexpr std::array<RectListEntry, 4> kHoles = {
    {{20, 20, 50, 50}, {120, 20, 50, 50}, {20, 120, 50, 50}, {300, 300, 200, 50}}};

template <class Rects> void addJob(const std::string& name, const Rects& rects) {
  Contenders c(name, {1, 1}, static_cast<double>(rects.size()));
  c.add("raster", [=] {
    RectList list;
    Raster_ClearRectList(&list);
    for (const RectListEntry& r : rects) Raster_AddRect(&list, r.x, r.y, r.width, r.height);
    benchmark::DoNotOptimize(list);
  });
#ifdef HAVE_PIXMAN
  c.add("pixman", [=] {
    tests::PixmanRegion region;
    for (const RectListEntry& r : rects) region.add(r);
    benchmark::DoNotOptimize(region);
  });
#endif
}

void subtractJob() {
  Contenders c("rects/sub-4", {1, 1}, static_cast<double>(kHoles.size()));
  c.add("raster", [] {
    RectList list = {{kWhole}};
    for (const RectListEntry& r : kHoles) Raster_SubRect(&list, r.x, r.y, r.width, r.height);
    benchmark::DoNotOptimize(list);
  });
#ifdef HAVE_PIXMAN
  c.add("pixman", [] {
    tests::PixmanRegion region;
    region.add(kWhole);
    for (const RectListEntry& r : kHoles) region.subtract(r);
    benchmark::DoNotOptimize(region);
  });
#endif
}

void intersectJob() {
  constexpr int32 kPairs = 64;
  Contenders c("rects/intersect", {1, 1}, kPairs);
  c.add("raster", [] {
    Rect a = {0, 0, 100, 100};
    for (int32 i = 0; i < kPairs; ++i) {
      const Rect b = {i, 2 * i, i + 50, 2 * i + 20};
      Rect out;
      benchmark::DoNotOptimize(Rect_Intersect(&out, &a, &b));
      benchmark::DoNotOptimize(out);
    }
  });
#ifdef HAVE_SDL2
  c.add("SDL2", [] {
    const SDL_Rect a = {0, 0, 100, 100};
    for (int32 i = 0; i < kPairs; ++i) {
      const SDL_Rect b = {i, 2 * i, 50, 20};
      SDL_Rect out;
      benchmark::DoNotOptimize(SDL_IntersectRect(&a, &b, &out));
      benchmark::DoNotOptimize(out);
    }
  });
#endif
}

}  // namespace

int main(int argc, char** argv) {
  addJob("rects/add-12-overlapping", kOverlapping);
  addJob("rects/add-8-disjoint", kDisjoint);
  subtractJob();
  intersectJob();
  return bench::run(argc, argv);
}
