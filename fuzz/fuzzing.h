// SPDX-License-Identifier: MIT
//
// What the fuzz targets share: how they fail, and views in memory that ends where they end.

#ifndef FUZZ_FUZZING_H
#define FUZZ_FUZZING_H

#include <vector>

#include "digest/choices.h"
#include "rasterChecked.h"

namespace fuzz {

using Bytes = std::vector<uint8>;
using tests::Choices;

/// Ends the process, with the stack in the report, where a promise is broken.
inline void require(bool kept) {
  if (!kept) __builtin_trap();
}

struct PixelFormat {
  uint32 depth;
  uint32 bpp;
};

/// A view of random size in a block of its own, so that the address sanitizer sees every byte too
/// many. Now and then a field says something that is not so.
class FuzzedView {
 public:
  explicit FuzzedView(Choices& c, bool plane = false) {
    const auto format =
        c.oneOf<PixelFormat>({{3, 8}, {6, 8}, {8, 8}, {15, 16}, {16, 16}, {24, 24}, {24, 32}});
    view = {nullptr, 0, 0, c.below(48), c.below(24), format.depth, format.bpp};
    if (plane) view.depth = view.bpp = 1;
    const uint32 row = (view.width * view.bpp + 7) / 8;
    const uint32 unit = view.bpp == 16 ? 2 : view.bpp == 32 ? 4 : 1;
    view.pitch = row + unit * c.below(4);
    if (row != 0 && view.height != 0) view.bytes = size_t{view.height - 1} * view.pitch + row;
    bytes = c.fill(view.bytes);
    view.data = bytes.data();
    if (c.chance(8)) spoil(c);
  }

  RasterView view{};
  Bytes bytes;

 private:
  /// Claims something else, but never more bytes than there are.
  void spoil(Choices& c) {
    uint32* const fields[] = {&view.pitch, &view.width, &view.height, &view.depth, &view.bpp};
    *fields[c.below(5)] = c.chance(2) ? c.word() : c.below(70);
    if (c.chance(4)) view.bytes = c.word() % (view.bytes + 1);
    if (c.chance(8)) view.data = nullptr, view.bytes = 0;
  }
};

inline int32 coordinate(Choices& c) {
  return c.chance(8) ? static_cast<int32>(c.word()) : c.between(-20, 60);
}

inline Rect rect(Choices& c) {
  const int32 left = coordinate(c);
  const int32 top = coordinate(c);
  const int32 right =
      c.chance(8) ? static_cast<int32>(c.word()) : left % 100000 + c.between(-1, 40);
  return {left, top, right,
          c.chance(8) ? static_cast<int32>(c.word()) : top % 100000 + c.between(-1, 20)};
}

}  // namespace fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size);

#endif
