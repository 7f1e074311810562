// SPDX-License-Identifier: MIT
//
// Raster operations, tiling and bit planes beside an X server: random drawing with all sixteen
// functions of a graphics context, every pixel read back and compared.

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <vector>

#include "raster.h"
#include "support/random.h"
#include "support/xServer.h"

namespace {

using tests::Random;

constexpr uint16_t kWidth = 97;
constexpr uint16_t kHeight = 61;

xcb_connection_t* x() { return tests::theXServer().connection(); }

/// A picture, in our memory and as a pixmap of the server.
class Picture {
 public:
  Picture(Random& random, uint8_t depth, uint16_t width, uint16_t height)
      : depth_(depth),
        width_(width),
        height_(height),
        pitch_((width * bytesPerPixel() + 3) / 4 * 4),
        bytes_(random.bytes(size_t{pitch_} * height)),
        id_(xcb_generate_id(x())),
        gc_(xcb_generate_id(x())) {
    xcb_create_pixmap(x(), depth, id_, tests::theXServer().screen().root, width, height);
    xcb_create_gc(x(), gc_, id_, 0, nullptr);
    set(XCB_GC_GRAPHICS_EXPOSURES, {0});  // no events
    xcb_put_image(x(), XCB_IMAGE_FORMAT_Z_PIXMAP, id_, gc_, width, height, 0, 0, 0, depth,
                  static_cast<uint32_t>(bytes_.size()), bytes_.data());
  }
  ~Picture() {
    xcb_free_gc(x(), gc_);
    xcb_free_pixmap(x(), id_);
  }
  Picture(const Picture&) = delete;
  Picture& operator=(const Picture&) = delete;

  uint8_t depth() const { return depth_; }
  uint32 bytesPerPixel() const { return depth_ == 16 ? 2 : 4; }
  uint32 pitch() const { return pitch_; }
  uint8* data() { return bytes_.data(); }
  uint8* pixel(uint32 px, uint32 py) {
    return &bytes_[size_t{py} * pitch_ + size_t{px} * bytesPerPixel()];
  }
  xcb_pixmap_t id() const { return id_; }
  xcb_gcontext_t gc() const { return gc_; }
  void set(uint32_t mask, std::initializer_list<uint32_t> values) const {
    xcb_change_gc(x(), gc_, mask, std::data(values));
  }

  /// Compares all pixels; the bits beyond the depth are none of the server's.
  void expectEqual() const {
    const auto request =
        xcb_get_image(x(), XCB_IMAGE_FORMAT_Z_PIXMAP, id_, 0, 0, width_, height_, 0xFFFFFFFF);
    xcb_get_image_reply_t* reply = xcb_get_image_reply(x(), request, nullptr);
    ASSERT_NE(reply, nullptr);
    const uint8* theirs = xcb_get_image_data(reply);
    ASSERT_EQ(static_cast<size_t>(xcb_get_image_data_length(reply)), bytes_.size());
    const size_t used = depth_ == 16 ? 2 : 3;
    int64 different = -1;
    for (uint32 py = 0; py < height_; ++py) {
      for (uint32 px = 0; px < width_; ++px) {
        const size_t at = size_t{py} * pitch_ + size_t{px} * bytesPerPixel();
        if (memcmp(&bytes_[at], theirs + at, used) != 0) different = py * 1000 + px;
      }
    }
    free(reply);
    ASSERT_EQ(different, -1) << "the last pixel that differs, as y * 1000 + x";
  }

 private:
  uint8_t depth_;
  uint16_t width_;
  uint16_t height_;
  uint32 pitch_;
  std::vector<uint8> bytes_;
  xcb_pixmap_t id_;
  xcb_gcontext_t gc_;
};

/// A bit plane in our memory and as a bitmap of the server.
class Bitmap {
 public:
  Bitmap(Random& random, uint16_t width, uint16_t height)
      : pitch_((width + 31u) / 32 * 4),
        bits_(random.bytes(size_t{pitch_} * height)),
        id_(xcb_generate_id(x())) {
    std::vector<uint8> sent = bits_;
    if (xcb_get_setup(x())->bitmap_format_bit_order == XCB_IMAGE_ORDER_LSB_FIRST) {
      for (uint8& byte : sent) byte = reversed(byte);
    }
    const xcb_gcontext_t gc = xcb_generate_id(x());
    xcb_create_pixmap(x(), 1, id_, tests::theXServer().screen().root, width, height);
    xcb_create_gc(x(), gc, id_, 0, nullptr);
    xcb_put_image(x(), XCB_IMAGE_FORMAT_XY_PIXMAP, id_, gc, width, height, 0, 0, 0, 1,
                  static_cast<uint32_t>(sent.size()), sent.data());
    xcb_free_gc(x(), gc);
  }
  ~Bitmap() { xcb_free_pixmap(x(), id_); }
  Bitmap(const Bitmap&) = delete;
  Bitmap& operator=(const Bitmap&) = delete;

  const uint8* data() const { return bits_.data(); }
  uint32 pitch() const { return pitch_; }
  xcb_pixmap_t id() const { return id_; }

 private:
  static uint8 reversed(uint8 byte) {
    uint32 result = 0;
    for (uint32 bit = 0; bit < 8; ++bit) result |= (uint32{byte} >> bit & 1) << (7 - bit);
    return static_cast<uint8>(result);
  }

  uint32 pitch_;
  std::vector<uint8> bits_;
  xcb_pixmap_t id_;
};

/// A rectangle within a picture.
struct Area {
  uint16_t px, py, width, height;
};
Area someArea(Random& random, uint32 width = kWidth, uint32 height = kHeight) {
  const auto px = static_cast<uint16_t>(random.below(width));
  const auto py = static_cast<uint16_t>(random.below(height));
  return {px, py, static_cast<uint16_t>(1 + random.below(width - px)),
          static_cast<uint16_t>(1 + random.below(height - py))};
}

void fillArea(const Picture& picture, const Area& a) {
  const xcb_rectangle_t area = {static_cast<int16_t>(a.px), static_cast<int16_t>(a.py), a.width,
                                a.height};
  xcb_poly_fill_rectangle(x(), picture.id(), picture.gc(), 1, &area);
}

/// Runs `draw(random, picture, rop)` with all functions on both depths.
template <class Draw> void withAllFunctions(uint64 seed, const Draw& draw) {
  Random random(seed);
  for (const uint8_t depth : {uint8_t{24}, uint8_t{16}}) {
    Picture picture(random, depth, kWidth, kHeight);
    for (int round = 0; round < tests::rounds(8); ++round) {
      for (uint32 rop = 0; rop < 16; ++rop) {
        draw(random, picture, rop);
        picture.expectEqual();
        if (testing::Test::HasFatalFailure())
          FAIL() << "depth " << int{depth} << " round " << round << " rop " << rop;
      }
    }
  }
}

TEST(Raster_RectROPfill, EqualsTheServersFilledRectangles) {
  withAllFunctions(1, [](Random& random, Picture& picture, uint32 rop) {
    const Area a = someArea(random);
    const uint32 pixel = random.word();
    picture.set(XCB_GC_FUNCTION | XCB_GC_FOREGROUND, {rop, pixel});
    fillArea(picture, a);
    Raster_RectROPfill(picture.data(), static_cast<int32>(picture.pitch()), picture.bytesPerPixel(),
                       pixel, rop, a.px, a.py, a.width, a.height);
  });
}

void copyArea(const Picture& from, const Picture& to, const Area& a, uint16_t dx, uint16_t dy) {
  xcb_copy_area(x(), from.id(), to.id(), to.gc(), static_cast<int16_t>(a.px),
                static_cast<int16_t>(a.py), static_cast<int16_t>(dx), static_cast<int16_t>(dy),
                a.width, a.height);
}

void ropCopy(Picture& from, Picture& to, uint32 rop, const Area& a, uint16_t dx, uint16_t dy) {
  Raster_RectROPcopy(to.data(), static_cast<int32>(to.pitch()), from.data(),
                     static_cast<int32>(from.pitch()), to.bytesPerPixel(), a.px, a.py, rop, dx, dy,
                     a.width, a.height);
}

TEST(Raster_RectROPcopy, EqualsTheServersCopiesBetweenPixmaps) {
  withAllFunctions(2, [](Random& random, Picture& picture, uint32 rop) {
    Picture source(random, picture.depth(), kWidth, kHeight);
    const Area a = someArea(random);
    const auto dx = static_cast<uint16_t>(random.below(kWidth - a.width + 1u));
    const auto dy = static_cast<uint16_t>(random.below(kHeight - a.height + 1u));
    picture.set(XCB_GC_FUNCTION, {rop});
    copyArea(source, picture, a, dx, dy);
    ropCopy(source, picture, rop, a, dx, dy);
  });
}

TEST(Raster_RectROPcopy, EqualsTheServersCopiesWithinAPixmap) {
  withAllFunctions(3, [](Random& random, Picture& picture, uint32 rop) {
    const Area a = someArea(random);
    const auto dx = static_cast<uint16_t>(random.below(kWidth - a.width + 1u));
    const uint32 anyY = random.below(kHeight - a.height + 1u);
    const auto dy = static_cast<uint16_t>(random.below(2) == 0 ? a.py : anyY);
    picture.set(XCB_GC_FUNCTION, {rop});
    copyArea(picture, picture, a, dx, dy);
    ropCopy(picture, picture, rop, a, dx, dy);
  });
}

TEST(Raster_RectPixmapROPcopy, EqualsTheServersTiledRectangles) {
  withAllFunctions(4, [](Random& random, Picture& picture, uint32 rop) {
    const auto width = static_cast<uint16_t>(1 + random.below(20));
    const auto height = static_cast<uint16_t>(1 + random.below(20));
    Picture tile(random, picture.depth(), width, height);
    const Area a = someArea(random);
    const uint32 originX = random.below(50);
    const uint32 originY = random.below(50);
    picture.set(XCB_GC_FUNCTION | XCB_GC_FILL_STYLE | XCB_GC_TILE | XCB_GC_TILE_STIPPLE_ORIGIN_X |
                    XCB_GC_TILE_STIPPLE_ORIGIN_Y,
                {rop, XCB_FILL_STYLE_TILED, tile.id(), originX, originY});
    fillArea(picture, a);
    Raster_RectPixmapROPcopy(picture.data(), picture.pitch(), tile.data(), tile.pitch(),
                             static_cast<int32>(picture.bytesPerPixel()),
                             a.px + 50u * width - originX, a.py + 50u * height - originY, width,
                             height, rop, a.px, a.py, a.width, a.height);
  });
}

TEST(Raster_BitsToPixels, EqualsTheServersCopyOfAPlane) {
  withAllFunctions(5, [](Random& random, Picture& picture, uint32 rop) {
    const Area a = someArea(random);
    const Bitmap plane(random, a.width, a.height);
    const uint32 foreground = random.word();
    const uint32 background = random.word();
    picture.set(XCB_GC_FUNCTION | XCB_GC_FOREGROUND | XCB_GC_BACKGROUND,
                {rop, foreground, background});
    xcb_copy_plane(x(), plane.id(), picture.id(), picture.gc(), 0, 0, static_cast<int16_t>(a.px),
                   static_cast<int16_t>(a.py), a.width, a.height, 1);
    const auto bytesPerPixel = static_cast<int32>(picture.bytesPerPixel());
    if (rop == RASTER_ROP_COPY) {
      Raster_BitsToPixels(plane.data(), plane.pitch(), picture.pixel(a.px, a.py), picture.pitch(),
                          bytesPerPixel, a.width, a.height, foreground, background);
      return;
    }
    Picture expanded(random, picture.depth(), a.width, a.height);
    Raster_BitsToPixels(plane.data(), plane.pitch(), expanded.data(), expanded.pitch(),
                        bytesPerPixel, a.width, a.height, foreground, background);
    ropCopy(expanded, picture, rop, {0, 0, a.width, a.height}, a.px, a.py);
  });
}

TEST(Raster_BitsToPixelsStencil, EqualsTheServersStippledRectangles) {
  withAllFunctions(6, [](Random& random, Picture& picture, uint32 /*rop*/) {
    const Area a = someArea(random);
    const Bitmap plane(random, a.width, a.height);
    const uint32 foreground = random.word();
    picture.set(XCB_GC_FOREGROUND | XCB_GC_FILL_STYLE | XCB_GC_STIPPLE |
                    XCB_GC_TILE_STIPPLE_ORIGIN_X | XCB_GC_TILE_STIPPLE_ORIGIN_Y,
                {foreground, XCB_FILL_STYLE_STIPPLED, plane.id(), a.px, a.py});
    fillArea(picture, a);
    Raster_BitsToPixelsStencil(plane.data(), plane.pitch(), picture.pixel(a.px, a.py),
                               picture.pitch(), static_cast<int32>(picture.bytesPerPixel()),
                               a.width, a.height, foreground);
  });
}

}  // namespace
