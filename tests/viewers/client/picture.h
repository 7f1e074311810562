// SPDX-License-Identifier: MIT
//
// What a viewer shows: one number a pixel, in the format that it asked for.

#ifndef VIEWERS_PICTURE_H
#define VIEWERS_PICTURE_H

#include <cstdint>
#include <string>
#include <vector>

#include "pixelFormat.h"

namespace viewers {

struct Box {
  int x, y, width, height;
};

class Picture {
 public:
  Picture() = default;
  Picture(int width, int height) { resize(width, height); }
  /// Everything becomes zero.
  void resize(int width, int height);

  int width() const { return width_; }
  int height() const { return height_; }
  bool contains(Box box) const;
  uint32_t& at(int x, int y) { return pixels_[indexOf(x, y)]; }
  uint32_t at(int x, int y) const { return pixels_[indexOf(x, y)]; }
  void fill(Box box, uint32_t pixel);
  /// The two places may overlap.
  void copy(Box to, int fromX, int fromY);
  /// The same picture in another format, channels widened or cut.
  void convert(const PixelFormat& from, const PixelFormat& to);
  /// Writes a portable pixmap. Throws Broken.
  void save(const std::string& path, const PixelFormat& format) const;

 private:
  size_t indexOf(int x, int y) const {
    return static_cast<size_t>(y) * static_cast<size_t>(width_) + static_cast<size_t>(x);
  }

  int width_ = 0;
  int height_ = 0;
  std::vector<uint32_t> pixels_;
};

}  // namespace viewers

#endif
