// SPDX-License-Identifier: MIT
//
// The words for a status, the default limits, and views by themselves.

#include <iterator>

#include "checkedView.h"

namespace raster::checked {
namespace {

constexpr const char* kTexts[] = {
    "success",
    "a pointer is null",
    "an argument is out of range",
    "a view does not lie in its memory",
    "a pixel format is not supported here",
    "a rectangle reaches out of its view",
    "memory overlaps",
    "the result is too big",
    "the limits are exceeded",
    "the data ends too early",
    "the data is damaged",
    "the data is no PNG picture",
    "the picture is of a kind that was not asked for",
    "there is not enough memory",
    "the file or its folder does not exist",
    "permission denied",
    "the file is not a plain file",
    "the file exists",
    "no space is left for the file",
    "the file cannot be accessed",
};
static_assert(std::size(kTexts) == RASTER_STATUS_FILE + 1);

constexpr uint64 kMebibyte = uint64{1} << 20;
constexpr RasterLimits kDefaultLimits = {16384,           16384,         256 * kMebibyte,
                                         256 * kMebibyte, 8 * kMebibyte, 1000};

}  // namespace

RasterLimits limitsOf(const RasterLimits* given) {
  return given != nullptr ? *given : kDefaultLimits;
}

}  // namespace raster::checked

extern "C" {

const char* RasterChecked_Text(RasterStatus status) {
  const auto index = static_cast<size_t>(status);
  return index < std::size(raster::checked::kTexts) ? raster::checked::kTexts[index]
                                                    : "unknown status";
}

void RasterChecked_DefaultLimits(RasterLimits* limits) {
  if (limits != nullptr) *limits = raster::checked::kDefaultLimits;
}

RasterStatus RasterChecked_View(const RasterView* view) { return raster::checked::checkView(view); }

RasterStatus RasterChecked_ImageView(const ImageUtilImage* image, size_t bytes, RasterView* view) {
  if (image == nullptr || view == nullptr) return RASTER_STATUS_NULL;
  const RasterView made = {image->data,   bytes,        image->bytesPerLine, image->width,
                           image->height, image->depth, image->bpp};
  const RasterStatus status = raster::checked::checkPixels(&made);
  if (status == RASTER_STATUS_OK) *view = made;
  return status;
}

}  // extern "C"
