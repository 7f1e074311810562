// SPDX-License-Identifier: MIT
//
// Two versions of the library in one program, on forty pieces of work. The new one is the contender
// "raster", the old one its peer. usage: against NEW-LIBRARY OLD-LIBRARY [OPTION...]

#include <cstdio>

#include "support/works.h"

int main(int argc, char** argv) {
  if (argc < 3) {
    fprintf(stderr, "usage: %s NEW-LIBRARY OLD-LIBRARY [OPTION...]\n", argv[0]);
    return 2;
  }
  const bench::Library now(argv[1]);
  const bench::Library before(argv[2]);
  constexpr bench::Extent kSizes[] = {{1920, 1080}, {256, 64}, {16, 16}};
  for (const bench::Work& work : bench::works()) {
    for (const bench::Extent e : kSizes) {
      bench::Contenders contenders("against/" + work.name, e, e.pixels());
      contenders.add("raster", work.make(now, e));
      contenders.add("old", work.make(before, e));
    }
  }
  bench::Contenders contenders("against/rects-add-12", {1, 1}, 12);
  contenders.add("raster", bench::addRects(now));
  contenders.add("old", bench::addRects(before));
  argv[2] = argv[0];
  return bench::run(argc - 2, argv + 2);
}
