// SPDX-License-Identifier: MIT
//
// One use of libpng, reading or writing: what ends it, and in which words.

#ifndef RASTER_CHECKED_PNG_H
#define RASTER_CHECKED_PNG_H

#include <png.h>

#include "image/pngErrors.h"
#include "rasterChecked.h"

namespace raster::checked {

/// Told to libpng as the context of its errors and of its memory.
struct PngUse {
  RasterStatus failure = RASTER_STATUS_DAMAGED;  ///< of the error that comes, unless one knows more
  char* message = nullptr;                       ///< for libpng's words; may be null
  size_t messageBytes = 0;
};

/// libpng's structure for reading or writing, silent and with errors that leave by a long jump.
/// Null when there is no memory.
png_structp createPngReader(PngUse* use);
png_structp createPngWriter(PngUse* use);

/// Runs `body` on a structure that was made, with room for what is told of the picture; both are
/// released then. `Job` has them as `png` and `info` beside its `use`.
template <class Job>
RasterStatus runPng(Job& job, bool (*body)(Job&), void (*release)(png_structpp, png_infopp)) {
  if (job.png == nullptr) return RASTER_STATUS_NO_MEMORY;
  job.info = png_create_info_struct(job.png);
  const bool hasInfo = job.info != nullptr;
  const bool done = hasInfo && withoutPngError(job.png, body, job);
  release(&job.png, &job.info);
  if (done) return RASTER_STATUS_OK;
  return hasInfo ? job.use.failure : RASTER_STATUS_NO_MEMORY;
}

/// Stores a text, cut to what fits.
void setMessage(const PngUse& use, const char* text);

}  // namespace raster::checked

#endif
