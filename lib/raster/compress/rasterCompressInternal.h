// SPDX-License-Identifier: MIT
//
// The run-length code over 32-bit words, as the kernels of one instruction-set level.

#ifndef RASTER_RASTER_COMPRESS_INTERNAL_H
#define RASTER_RASTER_COMPRESS_INTERNAL_H

#include <cstddef>

#include "baseTypes.h"

namespace raster {

/// What the encoder made of an image.
struct EncodedWords {
  size_t count;      // of the code; when it is not less than the pixels', the code is not complete
  size_t unchanged;  // how many words at the start of the code are the pixels themselves
};

struct CompressKernels {
  /// Encodes `total` words to `code`, which has room for `total` words and two more.
  EncodedWords (*encode)(const uint8* src, size_t total, uint8* code);
  /// Decodes to `dst`, which has room for `room` words, and returns the number of words written. A
  /// code that claims more runs over the end.
  size_t (*decode)(const uint8* code, size_t codeWords, uint8* dst, size_t room);
};

/// The kernels of the level that the process runs at, found anew by every call (kernelChoice.h).
const CompressKernels* lookUpCompress();

}  // namespace raster

#endif
