// SPDX-License-Identifier: MIT

#include "reference/rasterCompressReference.h"

namespace reference {

Bytes toBytes(const Words& words) {
  Bytes bytes;
  for (const uint32 word : words) {
    for (int k = 0; k < 4; ++k) bytes.push_back(static_cast<uint8>(word >> (8 * k)));
  }
  return bytes;
}

Words encode(const Words& pixels) {
  Words code;
  int state = 0;
  uint32 previous = 0;
  uint32 count = 0;
  for (const uint32 word : pixels) {
    if (state == 0) {
      previous = word;
      code.push_back(word);
      state = 1;
    } else if (state == 1) {
      code.push_back(word);
      if (word == previous) {
        state = 2;
        count = 0;
      } else {
        previous = word;
      }
    } else if (word == previous) {
      ++count;
    } else {
      code.push_back(count);
      code.push_back(word);
      previous = word;
      state = 1;
    }
    if (code.size() >= pixels.size()) break;
  }
  if (state == 2) code.push_back(count);
  return code.size() < pixels.size() ? code : Words();
}

Words decode(const Words& code) {
  Words pixels;
  int state = 0;
  uint32 previous = 0;
  for (const uint32 word : code) {
    if (state == 2) {
      for (uint32 i = 0; i < word; ++i) pixels.push_back(previous);
      state = 0;
      continue;
    }
    pixels.push_back(word);
    state = state == 1 && word == previous ? 2 : 1;
    previous = word;
  }
  return pixels;
}

Bytes compress(const Bytes& src, uint32 pitch, uint32 bpp, uint32 width, uint32 height) {
  const uint32 bytesPerPixel = bpp / 8;
  if (pitch == 0) pitch = width * bytesPerPixel;
  const size_t total = size_t{height} * pitch / bytesPerPixel;
  Words pixels;
  if (bpp == 32) {
    for (size_t i = 0; i < total; ++i) {
      uint32 word = 0;
      for (size_t k = 4; k-- > 0;) word = word << 8 | src.at(4 * i + k);
      pixels.push_back(word);
    }
  }
  const Words code = encode(pixels);
  Bytes block = toBytes({width, height, pitch, bpp, static_cast<uint32>(code.size())});
  const Bytes payload = code.empty() ? src : toBytes(code);
  for (size_t i = 0; i < (code.empty() ? total * bytesPerPixel : 4 * code.size()); ++i)
    block.push_back(payload.at(i));
  return block;
}

}  // namespace reference
