// SPDX-License-Identifier: MIT

#include "tintedPicture.h"

#include <algorithm>
#include <utility>

#include "raster.h"

namespace tool::live {
namespace {

constexpr std::chrono::milliseconds kMoment(400);
constexpr uint32 kTint = 0x60602000;  // premultiplied: orange, three eighths opaque
constexpr uint32 kOutline = 0xFFFFFF;
constexpr uint32 kXor = 6;
constexpr uint32 kBandRows = 64;
constexpr uint32 kPixelBytes = 4;

}  // namespace

TintedPicture::TintedPicture(uint32 pictureWidth, uint32 pictureHeight)
    : width(pictureWidth),
      height(pictureHeight),
      pixels(size_t{kPixelBytes} * width * height),
      tintPixels(size_t{width} * kBandRows, kTint) {}

void TintedPicture::take(const PixelView& from, const Rect& rect) {
  const auto x = static_cast<uint32>(rect.left);
  const auto y = static_cast<uint32>(rect.top);
  Raster_RectCopy(pixels.data(), kPixelBytes * width, from.data, from.pitch, kPixelBytes, x, y, x,
                  y, widthOf(rect), heightOf(rect));
}

void TintedPicture::tint(const Rect& rect) {
  const auto bottom = static_cast<uint32>(rect.bottom);
  for (auto y = static_cast<uint32>(rect.top); y < bottom; y += kBandRows)
    Raster_AlphaBlendOver(pixels.data(), static_cast<uint32>(rect.left), y, kPixelBytes * width,
                          reinterpret_cast<const uint8*>(tintPixels.data()), 0, 0,
                          kPixelBytes * width, widthOf(rect), std::min(kBandRows, bottom - y), 24,
                          32, 0);
  outline(rect);
}

void TintedPicture::outline(const Rect& rect) {
  const auto fill = [&](int32 left, int32 top, int32 right, int32 bottom) {
    const Rect line = {left, top, right, bottom};
    if (isEmpty(line)) return;
    Raster_RectROPfill(pixels.data(), static_cast<int32>(kPixelBytes * width), kPixelBytes,
                       kOutline, kXor, static_cast<uint32>(left), static_cast<uint32>(top),
                       widthOf(line), heightOf(line));
  };
  fill(rect.left, rect.top, rect.right, rect.top + 1);
  if (rect.bottom - rect.top < 2) return;
  fill(rect.left, rect.bottom - 1, rect.right, rect.bottom);
  fill(rect.left, rect.top + 1, rect.left + 1, rect.bottom - 1);
  if (rect.right - rect.left > 1) fill(rect.right - 1, rect.top + 1, rect.right, rect.bottom - 1);
}

void TintedPicture::takeAll(const PixelView& from) {
  take(from, from.bounds());
  batches.clear();
}

void TintedPicture::draw(const PixelView& from, const ChangeList& changed, Clock::time_point now,
                         ChangeList& drawn) {
  Batch batch = {now + kMoment, changed.all()};
  for (const Rect& rect : batch.rects) {
    take(from, rect);
    tint(rect);
    drawn.add(rect);
  }
  if (!batch.rects.empty()) batches.push_back(std::move(batch));
}

std::optional<TintedPicture::Clock::time_point> TintedPicture::nextExpiry() const {
  if (batches.empty()) return std::nullopt;
  return batches.front().end;
}

void TintedPicture::expire(const PixelView& from, Clock::time_point now, ChangeList& drawn) {
  ChangeList over(width, height);
  for (; !batches.empty() && batches.front().end <= now; batches.pop_front())
    for (const Rect& rect : batches.front().rects) over.add(rect);
  if (over.isEmpty()) return;
  for (const Batch& batch : batches)
    for (const Rect& rect : batch.rects) over.subtract(rect);
  for (const Rect& rect : over.all()) {
    take(from, rect);
    drawn.add(rect);
  }
}

}  // namespace tool::live
