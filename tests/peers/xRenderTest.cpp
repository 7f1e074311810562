// SPDX-License-Identifier: MIT
//
// Blending beside an X server: the RENDER extension composites the same premultiplied pictures with
// the operators that it shares with us. It rounds products where we truncate them.

#include <gtest/gtest.h>
#include <xcb/render.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

#include "raster.h"
#include "support/random.h"
#include "support/xServer.h"

namespace {

using tests::Random;
using Bytes = std::vector<uint8>;

constexpr uint16_t kWidth = 128;
constexpr uint16_t kHeight = 64;
constexpr size_t kPixels = size_t{kWidth} * kHeight;

// All but 11, which we compute otherwise, and 13, which takes the destination's alpha.
constexpr uint8_t kOperators[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 12};

xcb_connection_t* x() { return tests::theXServer().connection(); }

/// A field of a pixel.
struct Channel {
  uint32 shift, bits;
  uint32 of(uint32 pixel) const { return pixel >> shift & ((1u << bits) - 1); }
};

/// A format that both know, with the channels' places.
struct Format {
  uint8_t depth;
  uint32 bpp;
  Channel channels[3];  // blue, green, red
  Channel alpha;        // of no bits where there is none
};
constexpr Format kSource = {32, 32, {{0, 8}, {8, 8}, {16, 8}}, {24, 8}};
constexpr Format kFormats[] = {{24, 32, {{0, 8}, {8, 8}, {16, 8}}, {0, 0}},
                               {16, 16, {{0, 5}, {5, 6}, {11, 5}}, {0, 0}}};

uint32 pixelAt(const Bytes& pixels, size_t index, uint32 bpp) {
  uint32 pixel = 0;
  for (uint32 k = 0; k < bpp / 8; ++k) pixel |= uint32{pixels[index * bpp / 8 + k]} << (8 * k);
  return pixel;
}

/// The server's picture format with these fields, 0 where it has none.
xcb_render_pictformat_t formatId(const Format& f) {
  auto* reply =
      xcb_render_query_pict_formats_reply(x(), xcb_render_query_pict_formats(x()), nullptr);
  if (reply == nullptr) return 0;
  xcb_render_pictformat_t found = 0;
  auto at = xcb_render_query_pict_formats_formats_iterator(reply);
  for (; at.rem != 0; xcb_render_pictforminfo_next(&at)) {
    const auto& d = at.data->direct;
    const bool same = at.data->depth == f.depth && d.blue_shift == f.channels[0].shift &&
                      d.green_shift == f.channels[1].shift && d.red_shift == f.channels[2].shift &&
                      d.green_mask == (1u << f.channels[1].bits) - 1 &&
                      d.alpha_mask == (1u << f.alpha.bits) - 1;
    if (same) found = at.data->id;
  }
  free(reply);
  return found;
}

/// Pixels as a picture of the server.
class Picture {
 public:
  Picture(const Format& format, const Bytes& pixels)
      : pixmap_(xcb_generate_id(x())), id_(xcb_generate_id(x())) {
    xcb_create_pixmap(x(), format.depth, pixmap_, tests::theXServer().screen().root, kWidth,
                      kHeight);
    const xcb_gcontext_t gc = xcb_generate_id(x());
    xcb_create_gc(x(), gc, pixmap_, 0, nullptr);
    xcb_put_image(x(), XCB_IMAGE_FORMAT_Z_PIXMAP, pixmap_, gc, kWidth, kHeight, 0, 0, 0,
                  format.depth, static_cast<uint32_t>(pixels.size()), pixels.data());
    xcb_free_gc(x(), gc);
    xcb_render_create_picture(x(), id_, pixmap_, formatId(format), 0, nullptr);
  }
  ~Picture() {
    xcb_render_free_picture(x(), id_);
    xcb_free_pixmap(x(), pixmap_);
  }
  Picture(const Picture&) = delete;
  Picture& operator=(const Picture&) = delete;

  void composite(uint8_t op, const Picture& source) const {
    xcb_render_composite(x(), op, source.id_, XCB_NONE, id_, 0, 0, 0, 0, 0, 0, kWidth, kHeight);
  }

  Bytes pixels() const {
    const auto request =
        xcb_get_image(x(), XCB_IMAGE_FORMAT_Z_PIXMAP, pixmap_, 0, 0, kWidth, kHeight, 0xFFFFFFFF);
    auto* reply = xcb_get_image_reply(x(), request, nullptr);
    if (reply == nullptr) return {};
    const uint8* data = xcb_get_image_data(reply);
    Bytes result(data, data + xcb_get_image_data_length(reply));
    free(reply);
    return result;
  }

 private:
  xcb_pixmap_t pixmap_;
  xcb_render_picture_t id_;
};

/// Random pixels, their colors premultiplied; a third of them is clear or opaque.
Bytes somePixels(Random& random) {
  Bytes pixels = random.bytes(kPixels * 4);
  for (size_t i = 0; i < pixels.size(); i += 4) {
    const uint8 alpha =
        random.oneOf<uint8>({pixels[i + 3], pixels[i + 3], 0, 255, pixels[i + 3], pixels[i + 3]});
    for (size_t k = 0; k < 3; ++k) pixels[i + k] = static_cast<uint8>(pixels[i + k] * alpha / 255);
    pixels[i + 3] = alpha;
  }
  return pixels;
}

/// Counts of the differences theirs - ours from -2 or less to 2 or more.
using Histogram = std::array<int, 5>;

void compare(const Format& format, uint8_t op, Random& random) {
  const Bytes source = somePixels(random);
  Bytes ours = random.bytes(kPixels * format.bpp / 8);
  const Picture from(kSource, source);
  const Picture to(format, ours);
  to.composite(op, from);
  Raster_AlphaBlend(ours.data(), 0, 0, kWidth * format.bpp / 8, source.data(), 0, 0, kWidth * 4,
                    kWidth, kHeight, format.depth, format.bpp, op, 0, 0, 0, 0);
  const Bytes theirs = to.pixels();
  ASSERT_EQ(theirs.size(), ours.size());

  Histogram counts{};
  for (size_t i = 0; i < kPixels; ++i) {
    for (const Channel& channel : format.channels) {
      const int difference = static_cast<int>(channel.of(pixelAt(theirs, i, format.bpp))) -
                             static_cast<int>(channel.of(pixelAt(ours, i, format.bpp)));
      ++counts[static_cast<size_t>(std::max(-2, std::min(2, difference)) + 2)];
    }
  }
  printf("depth %2d operator %2d: -1 %6d, equal %6d, +1 %6d\n", format.depth, op, counts[1],
         counts[2], counts[3]);
  EXPECT_EQ(counts[0] + counts[4], 0) << "depth " << int{format.depth} << " operator " << int{op};
}

TEST(Raster_AlphaBlend, DiffersFromTheServerByAtMostOneStepOfAChannel) {
  ASSERT_NE(formatId(kSource), 0u);
  Random random(31);
  for (const Format& format : kFormats) {
    ASSERT_NE(formatId(format), 0u) << "depth " << int{format.depth};
    for (const uint8_t op : kOperators) compare(format, op, random);
  }
}

}  // namespace
