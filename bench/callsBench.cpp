// SPDX-License-Identifier: MIT
//
// What a call costs when there is little to do: empty, of one pixel, of a glyph. With --csv the
// last column is the cost in nanoseconds; rates count calls.

#include "support/works.h"

int main(int argc, char** argv) {
  constexpr bench::Extent kSizes[] = {{0, 0}, {1, 1}, {4, 4}, {16, 16}};
  const bench::Library library("libraster.so.1");
  for (const bench::Work& work : bench::works()) {
    for (const bench::Extent e : kSizes) {
      bench::Contenders contenders("call/" + work.name, e, 1);
      contenders.add("raster", work.make(library, e));
    }
  }
  return bench::run(argc, argv);
}
