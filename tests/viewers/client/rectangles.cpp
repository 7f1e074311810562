// SPDX-License-Identifier: MIT

#include "rectangles.h"

#include <png.h>

namespace viewers {

void readRaw(Link& link, const PixelFormat& format, Picture& picture, Box box) {
  const auto bytes = static_cast<size_t>(format.bytes());
  for (int y = box.y; y < box.y + box.height; ++y) {
    const std::vector<uint8_t> row = link.read(static_cast<size_t>(box.width) * bytes);
    for (int x = 0; x < box.width; ++x)
      picture.at(box.x + x, y) = format.load(&row[static_cast<size_t>(x) * bytes]);
  }
}

void readCopy(Link& link, Picture& picture, Box box) {
  const int x = link.read16();
  const int y = link.read16();
  if (!picture.contains({x, y, box.width, box.height})) throw Broken("a copy from outside");
  picture.copy(box, x, y);
}

namespace {

/// One to three bytes of seven, seven and eight bits.
size_t readCompactLength(Link& link) {
  size_t length = 0;
  for (int shift = 0; shift <= 14; shift += 7) {
    const size_t byte = link.read8();
    if (shift == 14) return length | byte << shift;
    length |= (byte & 0x7F) << shift;
    if (byte < 0x80) break;
  }
  return length;
}

void readPng(const std::vector<uint8_t>& file, const PixelFormat& format, Picture& picture,
             Box box) {
  png_image image = {};
  image.version = PNG_IMAGE_VERSION;
  if (png_image_begin_read_from_memory(&image, file.data(), file.size()) == 0)
    throw Broken(std::string("no PNG: ") + image.message);
  if (image.width != static_cast<unsigned>(box.width) ||
      image.height != static_cast<unsigned>(box.height))
    throw Broken("the PNG is not of its rectangle's size");
  image.format = PNG_FORMAT_RGB;
  std::vector<uint8_t> pixels(PNG_IMAGE_SIZE(image));
  if (png_image_finish_read(&image, nullptr, pixels.data(), 0, nullptr) == 0)
    throw Broken(std::string("a damaged PNG: ") + image.message);
  const uint8_t* rgb = pixels.data();
  for (int y = box.y; y < box.y + box.height; ++y)
    for (int x = box.x; x < box.x + box.width; ++x, rgb += 3)
      picture.at(x, y) = format.pixel({rgb[0], rgb[1], rgb[2]});
}

}  // namespace

void readTightPng(Link& link, const PixelFormat& format, Picture& picture, Box box) {
  constexpr int kFill = 0x80, kPng = 0xA0;
  const int control = link.read8();
  if (control == kFill) {
    const std::vector<uint8_t> rgb = link.read(3);
    picture.fill(box, format.pixel({rgb[0], rgb[1], rgb[2]}));
  } else if (control == kPng) {
    readPng(link.read(readCompactLength(link)), format, picture, box);
  } else {
    throw Broken("a Tight rectangle of kind " + std::to_string(control));
  }
}

}  // namespace viewers
