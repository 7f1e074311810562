// SPDX-License-Identifier: MIT

#include "reference/rasterCompReference.h"

namespace reference {

int compare(const Bytes& a, Rows aRows, const Bytes& b, Rows bRows, uint32 bytesPerPixel,
            uint32 width, uint32 height) {
  for (uint32 y = 0; y < height; ++y) {
    for (size_t i = 0; i < size_t{width} * bytesPerPixel; ++i) {
      if (bytesPerPixel == 4 && i % 4 == 3) continue;
      const uint8 inA = a.at(aRows.first + y * aRows.pitch + i);
      const uint8 inB = b.at(bRows.first + y * bRows.pitch + i);
      if (inA != inB) return inA < inB ? -1 : 1;
    }
  }
  return 0;
}

bool compareMasked(const Bytes& a, const Bytes& b, const Bytes& mask, int32 bitsPerPixel,
                   int32 maxDiffs) {
  const int32 n = bitsPerPixel / 8 + (bitsPerPixel % 8 != 0 ? 1 : 0);
  const int64 limit = int64{maxDiffs} * n;
  int64 count = 0;
  for (size_t i = 0; i < a.size(); ++i) {
    if (n == 4 && i % 4 == 3) continue;
    uint8 m = mask.at(i);
    if (n == 1 && m != 0) m = 0xFF;
    if ((m & (a.at(i) ^ b.at(i))) == 0) continue;
    if (++count > limit) return false;
  }
  return true;
}

}  // namespace reference
