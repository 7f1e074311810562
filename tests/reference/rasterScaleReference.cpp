// SPDX-License-Identifier: MIT

#include "reference/rasterScaleReference.h"

#include <cstdio>

namespace reference {
namespace {

using Row = std::vector<uint32>;
using Picture = std::vector<uint8>;

uint32 mixPixels(uint32 p0, uint32 p1, uint32 w0, uint32 w1) {
  const uint32 high =
      (((p0 >> 8) & 0x00ff00ffu) * w0 + ((p1 >> 8) & 0x00ff00ffu) * w1) & 0xff00ff00u;
  const uint32 low = (((p0 & 0x00ff00ffu) * w0 + (p1 & 0x00ff00ffu) * w1) & 0xff00ff00u) >> 8;
  return high | low;
}

uint32 quotients(uint32 sumBR, uint32 sumGA, uint32 step) {
  const uint32 red = (sumBR / step) & 255;
  const uint32 blue = ((sumBR << 16) / step) & 255;
  const uint32 green = ((sumGA << 16) / step) & 255;
  const uint32 fourth = sumGA / step;
  return (fourth << 24) | (red << 16) | (green << 8) | blue;
}

class Model {
 public:
  Model(Picture& dst, const Picture& src, const ScaleCall& call)
      : dst_(dst),
        src_(src),
        call_(call),
        stepX_(static_cast<uint32>(65536.0 / call.scaleX)),
        stepY_(static_cast<uint32>(65536.0 / call.scaleY)),
        smooth_(call.dstDepth > 23 && call.smooth != 0),
        slots_(smooth_ ? std::min(((stepY_ + 65535) >> 16) + 1, 32u) : 1) {}

  void draw() {
    for (uint32 i = 0; i < height(); ++i) drawRow(i);
  }

 private:
  uint32 width() const { return static_cast<uint32>(call_.x2 - call_.x1); }
  uint32 height() const { return static_cast<uint32>(call_.y2 - call_.y1); }
  uint32 srcBytes() const { return call_.srcBpp / 8; }
  uint32 dstBytes() const { return call_.dstBpp / 8; }

  uint32 pixel(uint32 row, uint32 column) const {
    const int64 at = static_cast<int64>(call_.srcBase) + int64{row} * call_.srcPitch +
                     int64{column} * srcBytes();
    uint32 value = 0;
    for (uint32 byte = 0; byte < srcBytes(); ++byte)
      value |= uint32{src_.at(static_cast<size_t>(at + byte))} << (8 * byte);
    return value;
  }

  void put(uint32 i, uint32 column, uint32 value, uint32 bytes) {
    const size_t at = call_.dstBase + (static_cast<size_t>(call_.y1) + i) * call_.dstPitch +
                      (static_cast<size_t>(call_.x1) + column) * dstBytes();
    for (uint32 byte = 0; byte < bytes; ++byte)
      dst_.at(at + byte) = static_cast<uint8>(value >> (8 * byte));
  }

  /// The source row at a signed 16.16 position, as it was when it came into its slot.
  const Row& fetch(int32 y) {
    const uint32 row = std::min(call_.srcHeight - 1, static_cast<uint32>(std::max(y, 0)) >> 16);
    Slot& slot = slots_[row % slots_.size()];
    if (slot.row != row) slot = {row, resample(row)};
    return slot.pixels;
  }

  Row resample(uint32 row) const {
    Row out;
    const uint32 xStart = stepX_ * static_cast<uint32>(call_.x1);
    const uint32 xLimit = (call_.srcWidth - 1) << 16;
    if (smooth_ && stepX_ < 0x10000) {
      enlarge(out, row, static_cast<int32>(xStart - 32768), static_cast<int32>(xLimit));
    } else if (smooth_ && stepX_ > 0x10000) {
      reduce(out, row, xStart, xLimit);
    } else {
      for (uint32 x = xStart; x < xLimit && out.size() < width(); x += stepX_)
        out.push_back(pixel(row, x >> 16));
    }
    while (out.size() < width()) out.push_back(pixel(row, call_.srcWidth - 1));
    return out;
  }

  void enlarge(Row& out, uint32 row, int32 x, int32 xLimit) const {
    const auto step = static_cast<int32>(stepX_);
    for (; x < 0 && out.size() < width(); x += step) out.push_back(pixel(row, 0));
    for (; x < xLimit && out.size() < width(); x += step) {
      const auto column = static_cast<uint32>(x >> 16);
      const auto f = static_cast<uint32>(x & 0xffff);
      out.push_back(
          mixPixels(pixel(row, column), pixel(row, column + 1), (65535 - f) >> 8, f >> 8));
    }
  }

  void reduce(Row& out, uint32 row, uint32 x, uint32 xLimit) const {
    while (x < xLimit && out.size() < width()) {
      uint32 sumBR = 0;
      uint32 sumGA = 0;
      uint32 remaining = stepX_;
      const uint32 f = x & 0xffff;
      if (f != 0) {
        const uint32 part = mixPixels(pixel(row, x >> 16), 0, (0x10000 - f) >> 8, 0);
        sumBR += part & 0x00ff00ff;
        sumGA += (part >> 8) & 0x00ff00ff;
        remaining -= 0x10000 - f;
        x += 0x10000 - f;
      }
      while (x < xLimit && remaining >= 0x10000) {
        const uint32 whole = pixel(row, x >> 16);
        sumBR += whole & 0x00ff00ff;
        sumGA += (whole >> 8) & 0x00ff00ff;
        x += 0x10000;
        remaining -= 0x10000;
      }
      if (remaining != 0 && x < xLimit) {
        const uint32 part = mixPixels(pixel(row, x >> 16), 0, (remaining & 0xffff) >> 8, 0);
        sumBR += part & 0x00ff00ff;
        sumGA += (part >> 8) & 0x00ff00ff;
        x += remaining;
      }
      out.push_back(quotients(sumBR, sumGA, stepX_));
    }
  }

  /// The vertical position of destination row `i`.
  uint32 position(uint32 i) const { return stepY_ * static_cast<uint32>(call_.y1) + stepY_ * i; }

  void drawRow(uint32 i) {
    if (!smooth_ || stepY_ == 0x10000) {
      drawPlain(i);
    } else if (stepY_ < 0x10000) {
      drawMix(i, position(i) - 32768);
    } else {
      drawAverage(i, position(i));
    }
  }

  void drawPlain(uint32 i) {
    const Row& row = fetch(static_cast<int32>(position(i)));
    const bool sameDepth = static_cast<uint32>(call_.srcDepth) == call_.dstDepth;
    if (sameDepth && call_.srcBpp == call_.dstBpp) {
      for (uint32 j = 0; j < width(); ++j) put(i, j, row[j], dstBytes());
    } else if (call_.dstDepth == 16) {
      for (uint32 j = 0; j < width(); ++j) {
        const uint32 v = row[j];
        put(i, j, ((v & 0xf8) >> 3) | ((v & 0xfc00) >> 5) | ((v & 0xf80000) >> 8), 2);
      }
    } else {
      // The row as memory: 4-byte pixels, then zeros up to 16 bytes a pixel.
      Row memory = row;
      memory.resize(size_t{4} * width(), 0);
      for (uint32 j = 0; j + 1 < width(); ++j) put(i, j, memory[size_t{4} * j], 3);
    }
  }

  void drawMix(uint32 i, uint32 y) {
    const Row& upper = fetch(static_cast<int32>(y));
    const Row& lower = fetch(static_cast<int32>(y + 0x10000));
    const uint32 f = y & 0xffff;
    for (uint32 j = 0; j < width(); ++j)
      put(i, j, mixPixels(upper[j], lower[j], (65535 - f) >> 8, f >> 8), dstBytes());
  }

  void drawAverage(uint32 i, uint32 y) {
    Row sumBR(width(), 0);
    Row sumGA(width(), 0);
    uint32 rows = 0;
    const auto add = [&](uint32 position, uint32 weight) {
      const Row& row = fetch(static_cast<int32>(position));
      for (uint32 j = 0; j < width(); ++j) {
        const uint32 part = mixPixels(row[j], 0, weight, 0);
        sumBR[j] += part & 0x00ff00ff;
        sumGA[j] += (part >> 8) & 0x00ff00ff;
      }
      ++rows;
    };
    uint32 remaining = stepY_;
    const uint32 f = y & 0xffff;
    if (f != 0) {
      add(y, (0x10000 - f) >> 8);
      y += 0x10000 - f;
      remaining -= 0x10000 - f;
    }
    while (remaining >= 0x10000 && rows < 32) {
      add(y, 255);
      y += 0x10000;
      remaining -= 0x10000;
    }
    if (remaining != 0 && rows < 32) add(y, remaining >> 8);
    for (uint32 j = 0; j < width(); ++j)
      put(i, j, quotients(sumBR[j], sumGA[j], stepY_), dstBytes());
  }

  Picture& dst_;
  const Picture& src_;
  const ScaleCall& call_;
  uint32 stepX_;
  uint32 stepY_;
  bool smooth_;
  struct Slot {
    int64 row = -1;
    Row pixels;
  };
  std::vector<Slot> slots_;
};

std::string text(const char* format, auto... values) {
  char buffer[200];
  snprintf(buffer, sizeof buffer, format, values...);
  return buffer;
}

}  // namespace

ScaleAnswer scale(std::vector<uint8>& dst, const std::vector<uint8>& src, const ScaleCall& c) {
  const auto outside = [](int32 from, int32 to, uint32 size) {
    return from < 0 || int64{size} < int64{to};
  };
  if (outside(c.x1, c.x2, c.dstWidth) || outside(c.y1, c.y2, c.dstHeight)) return {false, ""};
  if (c.dstBpp < c.dstDepth) {
    return {false, text("%s: Dest color format (depth %d, BPP %d) is not supported.\n",
                        "Raster_Scale", static_cast<int>(c.dstDepth), static_cast<int>(c.dstBpp))};
  }
  const bool source32 = c.srcDepth == 24 && c.srcBpp == 32;
  const bool supported =
      source32 ? c.dstDepth == 24 || c.dstDepth == 16
               : static_cast<uint32>(c.srcDepth) == c.dstDepth && c.srcBpp == c.dstBpp;
  if (!supported) {
    return {false, text("%s: Color depth conversion from D%dB%d to D%dB%d is not supported.\n",
                        "Raster_Scale", c.srcDepth, static_cast<int>(c.srcBpp),
                        static_cast<int>(c.dstDepth), static_cast<int>(c.dstBpp))};
  }
  if (c.dstBpp % 8 != 0) return {false, ""};
  if (c.dstDepth % 8 != 0) {
    return {false,
            text("Raster_Scale: Dest depth %d is not supported.\n", static_cast<int>(c.dstDepth))};
  }
  for (const uint32 size : {c.srcHeight, c.srcWidth, c.dstHeight, c.dstWidth}) {
    if (!(size < 32768)) return {false, ""};
  }
  constexpr double kLimit = 3.051850947599719e-5;
  if (!(c.scaleX > kLimit) || !(c.scaleY > kLimit)) return {false, ""};
  if (c.x1 >= c.x2 || c.y1 >= c.y2) return {true, ""};
  if (c.srcWidth == 0 || c.srcHeight == 0 || c.dstWidth == 0 || c.dstHeight == 0) return {true, ""};
  Model(dst, src, c).draw();
  return {true, ""};
}

}  // namespace reference
