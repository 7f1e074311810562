// SPDX-License-Identifier: MIT

#include "checkedPng.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace raster::checked {
namespace {

PngUse* useOf(png_structp png) { return static_cast<PngUse*>(png_get_error_ptr(png)); }

[[noreturn]] void takeError(png_structp png, png_const_charp message) {
  setMessage(*useOf(png), message);
  png_longjmp(png, 1);
}

void ignoreWarning(png_structp /*png*/, png_const_charp /*message*/) {}

/// libpng's own words for exhausted memory differ by place.
png_voidp allocate(png_structp png, png_alloc_size_t size) {
  void* block = malloc(size);
  if (block == nullptr)
    static_cast<PngUse*>(png_get_mem_ptr(png))->failure = RASTER_STATUS_NO_MEMORY;
  return block;
}

void release(png_structp /*png*/, png_voidp block) { free(block); }

}  // namespace

void setMessage(const PngUse& use, const char* text) {
  if (use.message == nullptr || use.messageBytes == 0) return;
  const size_t length = std::min(strlen(text), use.messageBytes - 1);
  memcpy(use.message, text, length);
  use.message[length] = 0;
}

png_structp createPngReader(PngUse* use) {
  return png_create_read_struct_2(PNG_LIBPNG_VER_STRING, use, takeError, ignoreWarning, use,
                                  allocate, release);
}

png_structp createPngWriter(PngUse* use) {
  return png_create_write_struct_2(PNG_LIBPNG_VER_STRING, use, takeError, ignoreWarning, use,
                                   allocate, release);
}

}  // namespace raster::checked
