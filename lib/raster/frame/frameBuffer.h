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

/// A pixel of a frame buffer, where a rectangle begins.
template <class Byte> struct Corner {
  Byte* base;
  intptr_t pitch;
  uint32 x, y;

  Byte* pixel(size_t bytesPerPixel) const { return rowAt(base, pitch, y, x, bytesPerPixel); }
};

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

/// Rows of a destination: the first one, the signed step to the next one, their length and number.
struct Rows {
  uint8* first;
  intptr_t step;
  size_t bytes;
  uint32 rows;

  /// As one long row, where there is nothing between the rows.
  Rows joined() const {
    const RowRun run = joinRows(step, bytes, rows);
    return {first, step, run.bytes, run.rows};
  }
};

/// Rows of a destination and as many of a source: on each side the first one and the signed step to
/// the next one, then the bytes of a row and the number of rows.
struct RowPair {
  uint8* dst;
  intptr_t dstStep;
  const uint8* src;
  intptr_t srcStep;
  size_t bytes;  ///< of a destination row; of a source row too where nothing else is said
  uint32 rows;

  // The fields of the results are made one by one: a copy of the record would load what was just
  // stored in pieces as a whole, and so wait for the stores (store-to-load forwarding).

  /// As one long row on each side, where there is nothing between the rows of either.
  RowPair joined(size_t srcBytes) const {
    const RowRun run = joinRows(dstStep, bytes, rows);
    const bool both = joinRows(srcStep, srcBytes, rows).rows == run.rows;
    return {dst, dstStep, src, srcStep, both ? run.bytes : bytes, both ? run.rows : rows};
  }
  RowPair joined() const { return joined(bytes); }

  /// From the first row down, or from the last one up.
  RowPair inOrder(bool fromLast) const {
    const uint32 first = fromLast ? rows - 1 : 0;
    return {rowAt(dst, dstStep, first, 0, 0),
            fromLast ? -dstStep : dstStep,
            rowAt(src, srcStep, first, 0, 0),
            fromLast ? -srcStep : srcStep,
            bytes,
            rows};
  }

  /// How many bytes beyond the source the destination lies in the first row, modulo the size of the
  /// address space.
  uintptr_t ahead() const {
    return reinterpret_cast<uintptr_t>(dst) - reinterpret_cast<uintptr_t>(src);
  }

  /// Whether the first row shares bytes with its source.
  bool overlap() const { return ahead() < bytes || 0 - ahead() < bytes; }

  /// Whether rows that are walked from their ends may be walked from the last one up and gain from
  /// it: every row lies in its source, further right, and meets no other one. Memory is read
  /// fastest in one direction throughout.
  bool gainFromLast() const {
    return rows != 0 && dstStep == srcStep && dstStep > 0 && ahead() != 0 && ahead() < bytes &&
           ahead() + bytes <= static_cast<uintptr_t>(dstStep);
  }
};

/// The order of the pixels in a row.
enum class Walk { kToRight, kToLeft };

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
