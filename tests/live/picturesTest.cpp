// SPDX-License-Identifier: MIT
//
// What is done with the picture before it is shown: scaled, tinted, with the cursor in it.

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "cursorRects.h"
#include "drawnCursor.h"
#include "imageUtil.h"
#include "pngEncoder.h"
#include "scaledPicture.h"
#include "support/random.h"
#include "tintedPicture.h"

namespace tool::live {
namespace {

using tests::Random;

constexpr uint32 kWidth = 90;
constexpr uint32 kHeight = 70;

PixelView viewOf(const std::vector<uint8>& pixels) {
  return {pixels.data(), 4 * kWidth, kWidth, kHeight};
}

Rect randomRect(Random& random) {
  const int32 x = random.between(0, kWidth - 1);
  const int32 y = random.between(0, kHeight - 1);
  return {x, y, random.between(x + 1, std::min<int32>(x + 12, kWidth)),
          random.between(y + 1, std::min<int32>(y + 12, kHeight))};
}

void repaint(Random& random, std::vector<uint8>& pixels, const Rect& rect) {
  for (int32 y = rect.top; y < rect.bottom; ++y)
    for (int32 x = rect.left; x < rect.right; ++x)
      for (int32 i = 0; i < 4; ++i)
        pixels[static_cast<size_t>((y * static_cast<int32>(kWidth) + x) * 4 + i)] =
            static_cast<uint8>(random.word());
}

std::vector<uint8> bytesOf(const PixelView& view) {
  return {view.data, view.data + size_t{view.pitch} * view.height};
}

ChangeList everything(uint32 width, uint32 height) {
  ChangeList list(width, height);
  list.addAll();
  return list;
}

/// A picture that is shown at a scale and changes in one rectangle after the other.
class ScaledAndChanging {
 public:
  ScaledAndChanging(Random& numbers, double scale)
      : random(numbers), scaled(kWidth, kHeight, scale) {
    drawAll(scaled);
  }

  void drawAll(ScaledPicture& picture) const {
    ChangeList drawn(picture.view().width, picture.view().height);
    picture.draw(viewOf(pixels), everything(kWidth, kHeight), drawn);
  }
  /// Changes a rectangle and returns what of the scaled picture was drawn for it.
  ChangeList change() {
    const Rect rect = randomRect(random);
    repaint(random, pixels, rect);
    ChangeList changed(kWidth, kHeight);
    changed.add(rect);
    ChangeList drawn(shown().width, shown().height);
    scaled.draw(viewOf(pixels), changed, drawn);
    return drawn;
  }
  PixelView shown() const { return scaled.view(); }

 private:
  Random& random;
  std::vector<uint8> pixels = random.bytes(kWidth * kHeight * 4);
  ScaledPicture scaled;
};

TEST(ScaledPicture, DrawsPartsAsItDrawsTheWhole) {
  Random random(1);
  for (const double scale : {0.1, 0.31, 0.5, 0.77, 1.3, 2.0, 3.7}) {
    ScaledAndChanging parts(random, scale);
    for (int round = 0; round < 40; ++round) {
      parts.change();
      ScaledPicture whole(kWidth, kHeight, scale);
      parts.drawAll(whole);
      ASSERT_EQ(bytesOf(parts.shown()), bytesOf(whole.view())) << "scale " << scale;
    }
  }
}

TEST(ScaledPicture, TellsAllThatItDrew) {
  Random random(2);
  for (const double scale : {0.31, 0.5, 1.3, 3.7}) {
    ScaledAndChanging scaled(random, scale);
    const uint32 width = scaled.shown().width;
    for (int round = 0; round < 40; ++round) {
      const std::vector<uint8> before = bytesOf(scaled.shown());
      const std::vector<Rect> told = scaled.change().all();
      const std::vector<uint8> after = bytesOf(scaled.shown());
      for (size_t i = 0; i < after.size(); i += 4) {
        const Point at = {static_cast<int32>(i / 4 % width), static_cast<int32>(i / 4 / width)};
        const bool isTold = std::any_of(told.begin(), told.end(), [&](const Rect& part) {
          return Rect_ContainsPoint(&part, &at);
        });
        ASSERT_TRUE(isTold || memcmp(&after[i], &before[i], 4) == 0);
      }
    }
  }
}

TEST(TintedPicture, ShowsThePictureAgainAfterAMoment) {
  using Clock = TintedPicture::Clock;
  Random random(3);
  std::vector<uint8> pixels = random.bytes(kWidth * kHeight * 4);
  TintedPicture tinted(kWidth, kHeight);
  tinted.takeAll(viewOf(pixels));
  EXPECT_EQ(bytesOf(tinted.view()), pixels);
  EXPECT_FALSE(tinted.nextExpiry());
  std::vector<uint8> shown = pixels;  // by a viewer that takes over what is told
  Clock::time_point now;
  for (int round = 0; round < 200; ++round, now += std::chrono::milliseconds(70)) {
    ChangeList drawn(kWidth, kHeight);
    if (round % 40 < 30) {
      ChangeList changed(kWidth, kHeight);
      for (int i = 0; i < 3; ++i) {
        const Rect rect = randomRect(random);
        repaint(random, pixels, rect);
        changed.add(rect);
      }
      tinted.draw(viewOf(pixels), changed, now, drawn);
      ASSERT_TRUE(tinted.nextExpiry());
      ASSERT_NE(bytesOf(tinted.view()), pixels);
    }
    tinted.expire(viewOf(pixels), now, drawn);
    for (const Rect& rect : drawn.all())
      Raster_RectCopy(shown.data(), 4 * kWidth, tinted.view().data, 4 * kWidth, 4,
                      static_cast<uint32>(rect.left), static_cast<uint32>(rect.top),
                      static_cast<uint32>(rect.left), static_cast<uint32>(rect.top),
                      static_cast<uint32>(rect.right - rect.left),
                      static_cast<uint32>(rect.bottom - rect.top));
    ASSERT_EQ(shown, bytesOf(tinted.view()));
    if (round % 40 == 39) {
      ASSERT_EQ(bytesOf(tinted.view()), pixels);
      ASSERT_FALSE(tinted.nextExpiry());
    }
  }
}

LiveCursor blackAndClear() {
  LiveCursor cursor = {{0, 0}, {1, 1}, 10, 3, std::vector<uint32>(30, 0)};
  for (size_t i = 0; i < 30; i += 3) cursor.pixels[i] = 0xFF000000;
  cursor.pixels[1] = 0x80404040;  // half of a light grey
  cursor.pixels[2] = 0x7F404040;
  return cursor;
}

TEST(CursorRects, MakeAMaskOfWhatIsAtLeastHalfThere) {
  Bytes out;
  putCursor(blackAndClear(), ViewerFormat(), out);
  ASSERT_EQ(out.size(), 12u + 30 * 4 + 3 * 2);
  const std::vector<uint8> header = {0, 1, 0, 1, 0, 10, 0, 3, 0xFF, 0xFF, 0xFF, 0x11};
  EXPECT_EQ(std::vector<uint8>(out.data(), out.data() + 12), header);
  const uint8* mask = out.data() + 12 + 30 * 4;
  EXPECT_EQ(mask[0], 0xD2);  // 1101 0010
  EXPECT_EQ(mask[1], 0x40);  // 01
  const uint8* grey = out.data() + 12 + 4;
  EXPECT_EQ(grey[0], 0x7F);
}

TEST(CursorRects, KeepAlpha) {
  Bytes out;
  putCursorWithAlpha(blackAndClear(), out);
  ASSERT_EQ(out.size(), 12u + 4 + 30 * 4);
  const std::vector<uint8> half = {0x40, 0x40, 0x40, 0x80};
  EXPECT_EQ(std::vector<uint8>(out.data() + 20, out.data() + 24), half);
}

TEST(DrawnCursor, IsThereForAMoment) {
  Random random(4);
  std::vector<uint8> pixels = random.bytes(kWidth * kHeight * 4);
  const std::vector<uint8> before = pixels;
  const LiveCursor cursor = blackAndClear();
  for (const Point at : {Point{40, 30}, Point{0, 0}, Point{kWidth, kHeight}, Point{-50, 9}}) {
    const Rect box = cursorBox(cursor, at, kWidth, kHeight);
    {
      const DrawnCursor drawn(pixels.data(), 4 * kWidth, kWidth, kHeight, cursor, at);
      for (size_t i = 0; i < pixels.size(); i += 4) {
        const Point pixel = {static_cast<int32>(i / 4 % kWidth),
                             static_cast<int32>(i / 4 / kWidth)};
        ASSERT_TRUE(Rect_ContainsPoint(&box, &pixel) || memcmp(&pixels[i], &before[i], 4) == 0);
      }
      EXPECT_EQ(pixels == before, at.x == -50);
    }
    EXPECT_EQ(pixels, before);
  }
}

/// The PNG file in a rectangle, read by the library.
ImageUtilImage decode(const Bytes& out) {
  const uint8* at = out.data();
  EXPECT_EQ(*at++, 0xA0);
  uint32 length = 0;
  uint32 shift = 0;
  do {
    length |= (shift < 14 ? *at & 0x7Fu : *at) << shift;
    shift += 7;
  } while ((*at++ & 0x80) != 0 && shift < 21);
  EXPECT_EQ(at + length, out.data() + out.size());
  ImageUtilImage image = {};
  EXPECT_TRUE(ImageUtil_ReadPNGBuffer(&image, at, length, 0));
  return image;
}

TEST(PngEncoder, KeepsEveryPixel) {
  Random random(5);
  PngEncoder encoder;
  for (const uint32 colors : {1u, 2u, 255u, 256u, 257u, 6000u}) {
    std::vector<uint32> palette(colors);
    for (uint32& color : palette) color = random.word();
    std::vector<uint32> pixels(kWidth * kHeight);
    for (size_t i = 0; i < pixels.size(); ++i)
      pixels[i] = palette[i < colors ? i : random.below(colors)];
    const PixelView view = {reinterpret_cast<const uint8*>(pixels.data()), 4 * kWidth, kWidth,
                            kHeight};
    for (const Rect rect : {view.bounds(), Rect{3, 5, 60, 50}, Rect{89, 69, 90, 70}}) {
      Bytes out;
      encoder.setLevel(static_cast<int>(random.below(10)));
      encoder.put(view, rect, out);
      ImageUtilImage image = decode(out);
      ASSERT_EQ(image.width, static_cast<uint32>(rect.right - rect.left));
      ASSERT_EQ(image.height, static_cast<uint32>(rect.bottom - rect.top));
      for (uint32 y = 0; y < image.height; ++y) {
        for (uint32 x = 0; x < image.width; ++x) {
          const uint8* pixel = image.data + size_t{y} * image.bytesPerLine + x * (image.bpp / 8);
          uint32 color = pixel[0];
          if (image.bpp == 8) {
            const ImageUtilColor& entry = image.palette[*pixel];
            color = uint32{entry.red} << 16 | uint32{entry.green} << 8 | entry.blue;
          } else {
            color = uint32{pixel[2]} << 16 | uint32{pixel[1]} << 8 | pixel[0];
          }
          uint32 expected;
          memcpy(&expected,
                 view.at(rect.left + static_cast<int32>(x), rect.top + static_cast<int32>(y)),
                 sizeof expected);
          ASSERT_EQ(color, expected & 0xFFFFFF);
        }
      }
      ImageUtil_FreeImageData(&image);
    }
  }
}

}  // namespace
}  // namespace tool::live
