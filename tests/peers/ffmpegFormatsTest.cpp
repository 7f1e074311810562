// SPDX-License-Identifier: MIT
//
// FFmpeg's names of our pixel formats.

extern "C" {
#include <libavutil/pixdesc.h>
}

#include "formatNames.h"

namespace {

void expectName(int32 code, AVPixelFormat name) {
  const AVPixFmtDescriptor* format = av_pix_fmt_desc_get(name);
  expectReads(code, [format](const uint8* bytes) {
    const uint8_t* planes[4] = {bytes, bytes, bytes, bytes};
    const int lines[4] = {16, 16, 16, 16};
    uint32 result = 0;
    for (int channel = 0; channel < 3; ++channel) {
      uint16_t value = 0;
      av_read_image_line(&value, planes, lines, format, 0, 0, channel, 1, 0);
      // A full field as 255, anything between as what it is not.
      const bool full = value == (1 << format->comp[channel].depth) - 1;
      result = result << 8 | (full ? 0xFFU : value != 0 ? 0x80U : 0U);
    }
    return result;
  });
}

TEST(FfmpegFormats, Names) {
  expectName(8, AV_PIX_FMT_BGR8);
  expectName(15, AV_PIX_FMT_RGB555LE);
  expectName(16, AV_PIX_FMT_RGB565LE);
  expectName(24, AV_PIX_FMT_BGR24);
  expectName(32, AV_PIX_FMT_BGRA);
  expectName(32, AV_PIX_FMT_BGR0);
}

}  // namespace
