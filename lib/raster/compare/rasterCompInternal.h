// SPDX-License-Identifier: MIT
//
// What the comparison kernels of one instruction-set level offer.

#ifndef RASTER_RASTER_COMP_INTERNAL_H
#define RASTER_RASTER_COMP_INTERNAL_H

#include "frame/frameBuffer.h"

namespace raster {

/// The three bytes of a 4-byte pixel that count.
inline constexpr uint32 kColorBits = 0x00FFFFFF;

/// Whether at most `limit` bytes of a and b differ under the mask. `bytes` is their number.
using CompareUnderMask = bool (*)(const uint8* a, const uint8* b, const uint8* mask, size_t bytes,
                                  size_t limit);

/// Compares rows: 0, or the difference of the first two bytes that differ. `count` is the number of
/// bytes, or pixels, of a row, which is not 0.
using CompareRows = int32 (*)(const uint8* a, intptr_t aStep, const uint8* b, intptr_t bStep,
                              size_t count, uint32 height);

struct RasterCompKernels {
  CompareRows compareBytes;
  CompareRows compareColors;    ///< of 4-byte pixels, without the fourth byte
  CompareUnderMask wholeBytes;  ///< a mask byte that is not 0 counts its whole byte
  CompareUnderMask bits;        ///< the bits of the mask count
  CompareUnderMask colorBits;   ///< the bits of the mask count, but none of a fourth byte
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const RasterCompKernels* lookUpComp();

}  // namespace raster

#endif
