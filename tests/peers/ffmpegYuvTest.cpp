// SPDX-License-Identifier: MIT
//
// Video conversion beside FFmpeg's: test patterns that the ffmpeg program makes in the three
// layouts, converted by us and by libswscale (BT.601, limited range), differ by at most 2 a
// channel.
//
// Standard frames have their chroma the other way round than we take it, so they are exchanged
// first; a frame that is not has red and blue differences exchanged in its picture.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "raster.h"

extern "C" {
#include <libswscale/swscale.h>
}

namespace {

using Bytes = std::vector<uint8>;

constexpr int kSkipped = 77;
constexpr uint32 kWidth = 320;
constexpr uint32 kHeight = 240;
constexpr size_t kPixels = size_t{kWidth} * kHeight;

/// A layout: our code, ffmpeg's name, swscale's number, and how to bring a standard frame into the
/// order that we take.
struct Layout {
  const char* name;
  uint32 code;
  const char* pixelFormat;
  AVPixelFormat number;
  size_t frameBytes;
};
const Layout kLayouts[] = {
    {"YUY2", RASTER_VIDEO_YUY2, "yuyv422", AV_PIX_FMT_YUYV422, kPixels * 2},
    {"UYVY", RASTER_VIDEO_UYVY, "uyvy422", AV_PIX_FMT_UYVY422, kPixels * 2},
    // ffmpeg's planes are Y, Cb, Cr, as are ours; those of a standard YV12 frame are Y, Cr, Cb.
    {"YV12", RASTER_VIDEO_YV12, "yuv420p", AV_PIX_FMT_YUV420P, kPixels * 3 / 2},
};

const char* const kPatterns[] = {"testsrc", "testsrc2", "smptebars", "rgbtestsrc", "yuvtestsrc"};

/// The frame as ffmpeg makes it.
Bytes patternOf(const char* pattern, const Layout& layout) {
  const std::string command = std::string("ffmpeg -v error -nostdin -f lavfi -i ") + pattern +
                              "=size=320x240 -frames:v 1 -pix_fmt " + layout.pixelFormat +
                              " -f rawvideo - 2>/dev/null";
  Bytes frame(layout.frameBytes + 1);
  FILE* pipe = popen(command.c_str(), "r");
  if (pipe == nullptr) return {};
  frame.resize(fread(frame.data(), 1, frame.size(), pipe));
  return pclose(pipe) == 0 ? frame : Bytes();
}

/// The frame with its two differences exchanged.
Bytes exchanged(Bytes frame, const Layout& layout) {
  if (layout.number == AV_PIX_FMT_YUV420P) {
    const auto first = frame.begin() + kPixels;
    std::swap_ranges(first, first + kPixels / 4, first + kPixels / 4);
    return frame;
  }
  const size_t chroma = layout.number == AV_PIX_FMT_YUYV422 ? 1 : 0;
  for (size_t i = chroma; i < frame.size(); i += 4) std::swap(frame[i], frame[i + 2]);
  return frame;
}

/// A standard frame in our order.
Bytes inOurOrder(const Bytes& frame, const Layout& layout) {
  return layout.number == AV_PIX_FMT_YUV420P ? frame : exchanged(frame, layout);
}

/// What swscale makes of a frame: bytes B, G, R.
Bytes bySwscale(const Bytes& frame, const Layout& layout) {
  const int w = kWidth;
  const int h = kHeight;
  SwsContext* context = sws_getContext(
      w, h, layout.number, w, h, AV_PIX_FMT_BGR24,
      SWS_POINT | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT | SWS_BITEXACT, nullptr, nullptr, nullptr);
  if (context == nullptr) return {};
  const int* bt601 = sws_getCoefficients(SWS_CS_ITU601);
  sws_setColorspaceDetails(context, bt601, 0, bt601, 1, 0, 1 << 16, 1 << 16);
  const bool planar = layout.number == AV_PIX_FMT_YUV420P;
  const uint8* planes[4] = {frame.data(), frame.data() + kPixels, frame.data() + kPixels * 5 / 4,
                            nullptr};
  const int pitches[4] = {planar ? w : 2 * w, w / 2, w / 2, 0};
  Bytes picture(kPixels * 3);
  uint8* out[4] = {picture.data(), nullptr, nullptr, nullptr};
  const int outPitches[4] = {3 * w, 0, 0, 0};
  sws_scale(context, planes, pitches, 0, h, out, outPitches);
  sws_freeContext(context);
  return picture;
}

Bytes byUs(const Bytes& frame, const Layout& layout) {
  Bytes picture(kPixels * 3);
  Raster_YUVtoRGB(frame.data(), picture.data(), kWidth, kHeight, layout.code, 24);
  return picture;
}

int largestDifference(const Bytes& a, const Bytes& b) {
  int largest = a.size() == b.size() ? 0 : 256;
  for (size_t i = 0; i < a.size() && i < b.size(); ++i)
    largest = std::max(largest, std::abs(int{a[i]} - int{b[i]}));
  return largest;
}

/// Calls body(layout, frame, name) for every pattern in every layout.
template <class Body> void forAllPatterns(Body body) {
  for (const Layout& layout : kLayouts) {
    for (const char* pattern : kPatterns) {
      const Bytes frame = patternOf(pattern, layout);
      const std::string name = std::string(pattern) + " as " + layout.name;
      ASSERT_EQ(frame.size(), layout.frameBytes) << name << ": ffmpeg gave no frame";
      body(layout, frame, name);
    }
  }
}

class FfmpegYuv : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    if (system("ffmpeg -version >/dev/null 2>&1") == 0) return;
    printf("skipped: the ffmpeg program is not installed\n");
    exit(kSkipped);
  }
};

TEST_F(FfmpegYuv, GivesTheSamePictureWithin2OfAFrameInOurOrder) {
  forAllPatterns([](const Layout& layout, const Bytes& frame, const std::string& name) {
    EXPECT_LE(largestDifference(byUs(inOurOrder(frame, layout), layout), bySwscale(frame, layout)),
              2)
        << name;
  });
}

// Deliberate: the roles of the chroma bytes and planes are not the usual ones.
TEST_F(FfmpegYuv, GivesAPictureWithExchangedDifferencesOfAStandardFrame) {
  forAllPatterns([](const Layout& layout, const Bytes& frame, const std::string& name) {
    // A standard frame: ffmpeg's, but with the planes of YV12 in their standard order.
    const bool planar = layout.number == AV_PIX_FMT_YUV420P;
    const Bytes standard = planar ? exchanged(frame, layout) : frame;
    EXPECT_LE(
        largestDifference(byUs(standard, layout), bySwscale(exchanged(frame, layout), layout)), 2)
        << name;
  });
}

}  // namespace
