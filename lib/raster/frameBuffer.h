// SPDX-License-Identifier: MIT
//
// Frame buffers as memory: row addresses, pitches, single pixels, and the choice by pixel size.

#ifndef RASTER_FRAME_BUFFER_H
#define RASTER_FRAME_BUFFER_H

#include <cstdint>
#include <cstring>
#include <type_traits>

#include "baseTypes.h"

namespace raster {

/// The address of pixel (x, y), with the wrap-around of pointer-size integers. `pitch` may be
/// negative; an unsigned pitch arrives zero-extended, a signed one sign-extended.
template <class Byte>
inline Byte* rowAt(Byte* base, intptr_t pitch, uint32 y, uint32 x, size_t bytesPerPixel) {
  const uintptr_t offset = static_cast<uintptr_t>(pitch) * y + uintptr_t{x} * bytesPerPixel;
  // Integers, because the sum may leave the buffer on the way (negative pitches).
  return reinterpret_cast<Byte*>(  // NOLINT(performance-no-int-to-ptr)
      reinterpret_cast<uintptr_t>(base) + offset);
}

/// The row after (or, with a negative step, before) the one at `row`.
template <class Byte> inline Byte* nextRow(Byte* row, intptr_t step) {
  return rowAt(row, step, 1, 0, 0);
}

/// An unsigned pitch as the signed, pointer-size number that rowAt takes.
inline intptr_t pitchOf(uint32 pitch) { return static_cast<intptr_t>(uintptr_t{pitch}); }
inline intptr_t pitchOf(int32 pitch) { return pitch; }

/// Deliberate: rows of 2- and 4-byte pixels step by whole pixels, so a pitch that is not a multiple
/// of the pixel size is rounded down (toward minus infinity) for the steps, while the first row is
/// found with the full pitch.
inline intptr_t rowStep(intptr_t pitch, uint32 bytesPerPixel) {
  const bool wholeWords = bytesPerPixel == 2 || bytesPerPixel == 4;
  return wholeWords ? pitch & -static_cast<intptr_t>(bytesPerPixel) : pitch;
}

/// Rows of equal length: how many bytes each, how many rows.
struct RowRun {
  size_t bytes;
  uint32 rows;
};

/// Rows that lie one after the other without a gap are one long row. For work that does not care
/// where a row ends.
inline RowRun joinRows(intptr_t step, size_t bytes, uint32 rows) {
  const bool gapless = bytes != 0 && step == static_cast<intptr_t>(bytes) && rows != 0;
  return gapless ? RowRun{bytes * rows, 1} : RowRun{bytes, rows};
}

/// The memory from the first to the last byte of some rows, gaps included. Rows that wrap around
/// the end of the address space count as everywhere.
struct RowSpan {
  uintptr_t first;
  uintptr_t last;

  RowSpan(const uint8* row, intptr_t step, size_t bytes, uint32 rows)
      : first(reinterpret_cast<uintptr_t>(row)), last(first) {
    if (bytes == 0 || rows == 0) return;
    const uintptr_t distance =
        step < 0 ? 0 - static_cast<uintptr_t>(step) : static_cast<uintptr_t>(step);
    uintptr_t extent = 0;
    bool wraps = __builtin_mul_overflow(distance, uintptr_t{rows} - 1, &extent);
    wraps |= step < 0 ? __builtin_sub_overflow(first, extent, &first)
                      : __builtin_add_overflow(last, extent, &last);
    wraps |= __builtin_add_overflow(last, uintptr_t{bytes} - 1, &last);
    if (wraps) first = 0, last = UINTPTR_MAX;
  }

  bool isApartFrom(const RowSpan& other) const { return last < other.first || other.last < first; }
};

/// One pixel of kBytes bytes, at any alignment.
template <unsigned kBytes> inline uint32 loadPixel(const uint8* at) {
  if constexpr (kBytes == 3) {
    // Not through memory: reading four bytes where two and one were just stored stalls.
    return loadPixel<2>(at) | static_cast<uint32>(at[2]) << 16;
  } else {
    uint32 pixel = 0;
    memcpy(&pixel, at, kBytes);
    return pixel;
  }
}
template <unsigned kBytes> inline void storePixel(uint8* at, uint32 pixel) {
  memcpy(at, &pixel, kBytes);
}

/// Calls `body` with the pixel size as a compile-time constant (1 to 4) and returns true; for any
/// other size returns false.
template <class Body> inline bool withPixelSize(uint32 bytesPerPixel, Body body) {
  switch (bytesPerPixel) {
    case 1:
      body(std::integral_constant<unsigned, 1>());
      return true;
    case 2:
      body(std::integral_constant<unsigned, 2>());
      return true;
    case 3:
      body(std::integral_constant<unsigned, 3>());
      return true;
    case 4:
      body(std::integral_constant<unsigned, 4>());
      return true;
    default:
      return false;
  }
}

/// A constant pixel repeated through memory, as the first three 32-bit words of the run. Twelve
/// bytes hold whole pixels of every size, so the words repeat from there on.
struct PixelWords {
  uint32 word[3];
};
inline PixelWords repeatPixel(uint32 pixel, uint32 bytesPerPixel) {
  switch (bytesPerPixel) {
    case 1:
      pixel = (pixel & 0xFF) * 0x01010101u;
      return {{pixel, pixel, pixel}};
    case 2:
      pixel = (pixel & 0xFFFF) * 0x00010001u;
      return {{pixel, pixel, pixel}};
    case 3:
      pixel &= 0xFFFFFF;
      return {{pixel | pixel << 24, pixel >> 8 | pixel << 16, pixel >> 16 | pixel << 8}};
    default:
      return {{pixel, pixel, pixel}};
  }
}

}  // namespace raster

#endif
