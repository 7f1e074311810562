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

/// What is left of one side, in numbers that do not wrap.
struct Part {
  int64 to;
  int64 from;
  int64 size;

  Part(int32 first, int32 end, uint32 viewSize, int32 begin, uint32 sourceSize)
      : to(first), from(begin) {
    const int64 low = std::max<int64>(0, std::max(-to, -from));
    const int64 high = std::min(end - to, std::min<int64>(viewSize - to, sourceSize - from));
    to += low;
    from += low;
    size = high - low;
  }
};

}  // namespace

RasterLimits limitsOf(const RasterLimits* given) {
  return given != nullptr ? *given : kDefaultLimits;
}

Area clipped(const RasterView& dst, Rect rect, Source src) {
  const Part across(rect.left, rect.right, dst.width, src.x, src.width);
  const Part down(rect.top, rect.bottom, dst.height, src.y, src.height);
  if (across.size <= 0 || down.size <= 0) return {};
  return {static_cast<uint32>(across.to),   static_cast<uint32>(down.to),
          static_cast<uint32>(across.from), static_cast<uint32>(down.from),
          static_cast<uint32>(across.size), static_cast<uint32>(down.size)};
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
