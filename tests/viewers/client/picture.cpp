// SPDX-License-Identifier: MIT

#include "picture.h"

#include <algorithm>
#include <cstdio>

#include "link.h"

namespace viewers {

void Picture::resize(int width, int height) {
  width_ = width;
  height_ = height;
  pixels_.assign(static_cast<size_t>(width) * static_cast<size_t>(height), 0);
}

bool Picture::contains(Box box) const {
  return box.x >= 0 && box.y >= 0 && box.x + box.width <= width_ && box.y + box.height <= height_;
}

void Picture::fill(Box box, uint32_t pixel) {
  for (int y = box.y; y < box.y + box.height; ++y)
    std::fill_n(pixels_.begin() + static_cast<ptrdiff_t>(indexOf(box.x, y)), box.width, pixel);
}

void Picture::copy(Box to, int fromX, int fromY) {
  const Picture before = *this;
  for (int y = 0; y < to.height; ++y)
    for (int x = 0; x < to.width; ++x) at(to.x + x, to.y + y) = before.at(fromX + x, fromY + y);
}

void Picture::convert(const PixelFormat& from, const PixelFormat& to) {
  for (uint32_t& pixel : pixels_) pixel = to.pixel(from.color(pixel));
}

void Picture::save(const std::string& path, const PixelFormat& format) const {
  FILE* file = fopen(path.c_str(), "wb");
  if (file == nullptr) throw Broken("cannot write " + path);
  fprintf(file, "P6\n%d %d\n255\n", width_, height_);
  for (const uint32_t pixel : pixels_) {
    const Color color = format.color(pixel);
    for (const int value : {color.red, color.green, color.blue}) putc(value, file);
  }
  if (fclose(file) != 0) throw Broken("cannot write " + path);
}

}  // namespace viewers
