// SPDX-License-Identifier: MIT

#include "reference/alphaBlendReference.h"

#include <algorithm>

#include "reference/unknown.h"

namespace reference {

namespace {

uint32 scaled(uint32 value, uint32 by) { return value * by / 255; }
uint32 clamped(uint32 sum) { return sum > 255 ? 255 : sum; }

uint32 combine(uint32 op, uint32 s, uint32 d, uint32 sa, uint32 da) {
  switch (op) {
    case 0:
      return 0;
    case 1:
      return scaled(s, 255);
    case 2:
      return scaled(d, 255);
    case 3:
      return clamped(scaled(s, 255) + scaled(d, 255 - sa));
    case 4:
      return clamped(scaled(d, 255) + scaled(s, 255 - da));
    case 5:
      return scaled(s, da);
    case 6:
      return scaled(d, sa);
    case 7:
      return scaled(s, 255 - da);
    case 8:
      return scaled(d, 255 - sa);
    case 9:
      return clamped(scaled(s, da) + scaled(d, 255 - sa));
    case 10:
    case 11:
      return clamped(scaled(d, sa) + scaled(s, 255 - da));
    case 12:
      return clamped(scaled(s, 255) + scaled(d, 255));
    case 13:
      return clamped(scaled(d, 255) + scaled(s, clamped((255 - da) / da)));
    default:
      unknown("operator", op);
  }
}

uint32 widen2(uint32 c) { return c << 6 | c << 4 | c << 2 | c; }
uint32 widen3(uint32 c) { return c << 5 | c << 2 | (c & 3); }
uint32 widen5(uint32 c) { return c << 3 | c >> 2; }
uint32 widen6(uint32 c) { return c << 2 | c >> 4; }

struct Channels {
  uint32 c[3];
};

Channels expand(const BlendFormat& format, uint32 p) {
  switch (format.depth) {
    case 6:
      return {{widen2(p & 3), widen2(p >> 2 & 3), widen2(p >> 4 & 3)}};
    case 8:
      return {{widen2(p >> 6 & 3), widen3(p >> 3 & 7), widen3(p & 7)}};
    case 15:
      return {{widen5(p & 31), widen5(p >> 5 & 31), widen5(p >> 10 & 31)}};
    case 16:
      return {{widen5(p & 31), widen6(p >> 5 & 63), widen5(p >> 11 & 31)}};
    case 24:
      return {{p & 255, p >> 8 & 255, p >> 16 & 255}};
    default:
      unknown("format of depth", format.depth);
  }
}

uint32 narrowed(const BlendFormat& format, const Channels& r, uint32 before) {
  const auto& [r0, r1, r2] = r.c;
  switch (format.depth) {
    case 6:
      return r0 >> 6 | r1 >> 6 << 2 | r2 >> 6 << 4;
    case 8:
      return (r0 & 0xC0) | (r1 >> 2 & 0x38) | r2 >> 5;
    case 15:
      return r0 >> 3 | r1 >> 3 << 5 | r2 >> 3 << 10;
    case 16:
      return r0 >> 3 | r1 >> 2 << 5 | r2 >> 3 << 11;
    case 24:
      return r0 | r1 << 8 | r2 << 16 | (format.bpp == 32 ? before & 0xFF000000 : 0);
    default:
      unknown("format of depth", format.depth);
  }
}

}  // namespace

uint32 blendChannel(const Blend& blend, uint32 source, uint32 sourceAlpha, uint32 destination) {
  if ((blend.flags & 1) != 0) {
    source = scaled(source, blend.srcAlpha);
    sourceAlpha = scaled(sourceAlpha, blend.srcAlpha);
  }
  uint32 da = 255;
  if ((blend.flags & 2) != 0) {
    destination = scaled(destination, blend.dstAlpha);
    da = blend.dstAlpha;
  }
  return combine(blend.op, source, destination, sourceAlpha, da);
}

uint32 blendPixel(const BlendFormat& format, const Blend& blend, const uint8* source,
                  uint32 pixel) {
  Channels channels = expand(format, pixel);
  for (unsigned i = 0; i < 3; ++i)
    channels.c[i] = blendChannel(blend, source[i], source[3], channels.c[i]);
  return narrowed(format, channels, pixel);
}

namespace {

/// Blends `count` pixels at `dst` of one memory with those at `src` of another, or of the same.
void blendPixels(Bytes& to, size_t dst, const Bytes& from, size_t src, size_t count,
                 const BlendFormat& format, const Blend& blend) {
  for (; count != 0; --count, dst += format.bytes, src += 4) {
    const uint8 source[4] = {from.at(src), from.at(src + 1), from.at(src + 2), from.at(src + 3)};
    uint32 pixel = 0;
    for (uint32 k = 0; k < format.bytes; ++k) pixel |= uint32{to.at(dst + k)} << (8 * k);
    pixel = blendPixel(format, blend, source, pixel);
    for (uint32 k = 0; k < format.bytes; ++k) to.at(dst + k) = static_cast<uint8>(pixel >> (8 * k));
  }
}

}  // namespace

void blendInPlace(Bytes& memory, const BlendPlace& place, const BlendFormat& format,
                  const Blend& blend) {
  for (uint32 y = 0; y < place.height; ++y) {
    blendPixels(memory, place.dst + y * place.dstPitch, memory, place.src + y * place.srcPitch,
                place.width, format, blend);
  }
}

void blendStaged(Bytes& memory, const BlendPlace& place, const BlendFormat& format,
                 const Blend& blend) {
  for (uint32 y = 0; y < place.height; ++y) {
    size_t dst = place.dst + y * place.dstPitch;
    size_t src = place.src + y * place.srcPitch;
    size_t left = size_t{place.width} * format.bytes;
    while (left != 0) {
      const size_t chunk = std::min<size_t>(3072, left);
      Bytes buffer;
      for (size_t i = 0; i < chunk; ++i) buffer.push_back(memory.at(dst + i));
      blendPixels(buffer, 0, memory, src, chunk / format.bytes, format, blend);
      for (size_t i = 0; i < chunk; ++i) memory.at(dst + i) = buffer[i];
      dst += chunk;
      src += chunk / format.bytes * 4;
      left -= chunk;
    }
  }
}

}  // namespace reference
