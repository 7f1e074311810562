// SPDX-License-Identifier: MIT
//
// Encoding PNG: what libpng finds in the files, and every way that an encoding can fail.

#include <gtest/gtest.h>

#include <cstring>
#include <set>
#include <string>

#include "image/pngFiles.h"
#include "imageUtil.h"
#include "raster.h"
#include "support/nextFunction.h"
#include "support/random.h"

namespace {

using tests::Bytes;
using tests::PngPicture;
using tests::Random;

// What the functions below, which stand in front of those of the libraries, do next.
struct Interposed {
  int appends = 0;
  int failingAppend = -1;  // counted from 0
  bool failWriteStruct = false;
  bool failInfoStruct = false;
} interposed;

}  // namespace

extern "C" {

bool DynBuf_Append(DynBuf* buffer, const void* bytes, size_t length) {
  if (interposed.appends++ == interposed.failingAppend) return false;
  return tests::next<decltype(&DynBuf_Append)>("DynBuf_Append")(buffer, bytes, length);
}

png_structp png_create_write_struct(png_const_charp version, png_voidp errorPtr,
                                    png_error_ptr errorFn, png_error_ptr warningFn) {
  if (interposed.failWriteStruct) return nullptr;
  return tests::next<decltype(&png_create_write_struct)>("png_create_write_struct")(
      version, errorPtr, errorFn, warningFn);
}

png_infop png_create_info_struct(png_const_structp png) {
  if (interposed.failInfoStruct) return nullptr;
  return tests::next<png_infop (*)(png_const_structp)>("png_create_info_struct")(png);
}

}  // extern "C"

namespace {

class PngWriting : public testing::Test {
 protected:
  PngWriting() { interposed = Interposed{}; }
  ~PngWriting() override { interposed = Interposed{}; }
};
using ImageUtil_ConstructPNGBuffer = PngWriting;
using ImageUtil_ConstructPNGBufferWithMemOps = PngWriting;

/// An image and its pixels.
struct Picture {
  ImageUtilImage image{};
  Bytes pixels;
  Picture(uint32 width, uint32 height, uint32 depth, uint32 bpp, Bytes rows, uint32 extraPitch = 0)
      : pixels(std::move(rows)) {
    image.width = width;
    image.height = height;
    image.depth = depth;
    image.bpp = bpp;
    image.bytesPerLine = width * ((bpp + 7) / 8) + extraPitch;
    pixels.resize(size_t{height} * image.bytesPerLine);
    image.data = pixels.data();
  }
  Picture(const Picture&) = delete;
  Picture& operator=(const Picture&) = delete;

  /// Stores the same picture bottom row first.
  void turnOver() {
    Bytes turned;
    for (size_t y = image.height; y-- != 0;) {
      const auto row = pixels.begin() + static_cast<ptrdiff_t>(y * image.bytesPerLine);
      turned.insert(turned.end(), row, row + image.bytesPerLine);
    }
    pixels = turned;
    image.data = pixels.data();
    image.flags ^= IMAGE_FLAG_BOTTOM_UP;
  }
};

Picture noise(Random& random, uint32 width, uint32 height, uint32 depth, uint32 bpp,
              uint32 extraPitch = 0) {
  return {width,
          height,
          depth,
          bpp,
          random.bytes(size_t{height} * (width * ((bpp + 7) / 8) + extraPitch)),
          extraPitch};
}

Bytes encode(const ImageUtilImage& image, const ImageUtilPNGWriteParams* params = nullptr) {
  DynBuf out;
  if (!::ImageUtil_ConstructPNGBuffer(&image, params, &out)) return {};
  Bytes file(out.data, out.data + out.size);
  DynBuf_Destroy(&out);
  return file;
}

/// The colour of a pixel as red, green, blue and the fourth byte; of a palette image its index.
Bytes colorAt(const ImageUtilImage& image, uint32 x, uint32 y) {
  const bool bottomUp = (image.flags & 1) != 0;
  const uint8* row = image.data + size_t{bottomUp ? image.height - 1 - y : y} * image.bytesPerLine;
  const uint8* at = row + size_t{x} * ((image.bpp + 7) / 8);
  if (image.bpp <= 8) return {*at};
  if (image.bpp == 24) return {at[2], at[1], at[0], 0};
  if (image.bpp == 32) return {at[2], at[1], at[0], at[3]};
  const uint32 v = at[0] | uint32{at[1]} << 8;
  const uint32 pixel = Raster_ConvertOnePixel(v, int32(image.depth), 24, false, nullptr);
  return {uint8(pixel >> 16), uint8(pixel >> 8), uint8(pixel), 0};
}

void expectFile(const Bytes& file, const ImageUtilImage& image, int colorType) {
  ASSERT_FALSE(file.empty());
  const PngPicture p = tests::readPng(file);
  EXPECT_EQ(p.width, image.width);
  EXPECT_EQ(p.height, image.height);
  EXPECT_EQ(p.bitDepth, 8);
  EXPECT_EQ(p.colorType, colorType);
  EXPECT_EQ(p.interlace, PNG_INTERLACE_NONE);
  const bool palette = colorType == PNG_COLOR_TYPE_PALETTE;
  EXPECT_EQ(tests::chunkNames(file), palette ? "IHDR PLTE IDAT IEND " : "IHDR IDAT IEND ");
  ASSERT_EQ(p.palette.size(), palette ? image.numColors : 0);
  for (size_t i = 0; i < p.palette.size(); ++i) {
    ASSERT_EQ(p.palette[i].red, image.palette[i].red);
    ASSERT_EQ(p.palette[i].green, image.palette[i].green);
    ASSERT_EQ(p.palette[i].blue, image.palette[i].blue);
  }
  const size_t samples = palette ? 1 : colorType == PNG_COLOR_TYPE_RGB ? 3 : 4;
  Bytes rows;
  for (uint32 y = 0; y < image.height; ++y) {
    for (uint32 x = 0; x < image.width; ++x) {
      const Bytes color = colorAt(image, x, y);
      rows.insert(rows.end(), color.begin(), color.begin() + static_cast<ptrdiff_t>(samples));
    }
  }
  EXPECT_EQ(p.rows, rows);
}

void setPalette(Random& random, ImageUtilImage* image, uint32 colors) {
  image->numColors = colors;
  const Bytes bytes = random.bytes(4 * size_t{colors});
  if (colors != 0) memcpy(image->palette, bytes.data(), bytes.size());
}

TEST_F(ImageUtil_ConstructPNGBuffer, WritesEveryFormatInBothDirections) {
  struct Format {
    uint32 depth, bpp;
  };
  const Format formats[] = {{8, 8}, {1, 1}, {4, 4}, {15, 16}, {16, 16}, {24, 24}, {24, 32}};
  Random random(1);
  for (int round = 0; round < tests::rounds(400); ++round) {
    const Format f = formats[random.below(7)];
    Picture picture = noise(random, 1 + random.below(40), 1 + random.below(20), f.depth, f.bpp,
                            2 * random.below(4));
    const uint32 colors = 1 + random.below(256);
    setPalette(random, &picture.image, f.bpp <= 8 ? colors : 0);
    if (f.bpp <= 8) {
      for (uint8& index : picture.pixels) index = uint8(index % colors);
    }
    const ImageUtilPNGWriteParams params = {random.between(-1, 10), random.below(2) == 0};
    const bool alpha = f.bpp == 32 && !params.stripAlpha;
    const int type = f.bpp <= 8 ? PNG_COLOR_TYPE_PALETTE
                     : alpha    ? PNG_COLOR_TYPE_RGB_ALPHA
                                : PNG_COLOR_TYPE_RGB;
    const Bytes file = encode(picture.image, &params);
    expectFile(file, picture.image, type);
    picture.image.flags = 0xFFFFFFFE;  // other bits are ignored
    EXPECT_EQ(encode(picture.image, &params), file);
    picture.turnOver();
    EXPECT_EQ(encode(picture.image, &params), file) << "bottom-up";
    ASSERT_FALSE(HasFailure()) << "round " << round << ": " << f.bpp << " bpp, "
                               << picture.image.width << "x" << picture.image.height;
  }
}

TEST_F(ImageUtil_ConstructPNGBuffer, DropsTheFourthByteUnlessAskedToKeepIt) {
  const Picture picture(2, 1, 24, 32, {1, 2, 3, 4, 5, 6, 7, 8});
  PngPicture p = tests::readPng(encode(picture.image));
  EXPECT_EQ(p.colorType, PNG_COLOR_TYPE_RGB);
  EXPECT_EQ(p.rows, (Bytes{3, 2, 1, 7, 6, 5}));
  const ImageUtilPNGWriteParams keep = {-1, false};
  p = tests::readPng(encode(picture.image, &keep));
  EXPECT_EQ(p.colorType, PNG_COLOR_TYPE_RGB_ALPHA);
  EXPECT_EQ(p.rows, (Bytes{3, 2, 1, 4, 7, 6, 5, 8}));
}

TEST_F(ImageUtil_ConstructPNGBuffer, ConvertsSixteenBitsToRgb) {
  const Picture of16(2, 1, 16, 16, {0xFF, 0xFF, 0x10, 0x84});
  PngPicture p = tests::readPng(encode(of16.image));
  EXPECT_EQ(p.colorType, PNG_COLOR_TYPE_RGB);
  EXPECT_EQ(p.rows, (Bytes{255, 255, 255, 0x84, 0x82, 0x84}));
  const Picture of15(2, 1, 15, 16, {0xFF, 0x7F, 0x00, 0x02});
  p = tests::readPng(encode(of15.image));
  EXPECT_EQ(p.rows, (Bytes{255, 255, 255, 0, 0x84, 0}));
}

TEST_F(ImageUtil_ConstructPNGBuffer, RoundsAnOddPitchOfSixteenBitsDown) {
  Picture picture(1, 3, 16, 16, {0x1F, 0, 0xE0, 7, 0, 0xF8, 0, 0, 0});
  picture.image.bytesPerLine = 3;
  const PngPicture p = tests::readPng(encode(picture.image));
  EXPECT_EQ(p.rows, (Bytes{0, 0, 255, 0, 255, 0, 255, 0, 0}));
}

// Deliberate: pixels of fewer than 8 bits are one byte each.
TEST_F(ImageUtil_ConstructPNGBuffer, DoesNotRepackFewerThanEightBits) {
  Picture picture(3, 1, 4, 4, {5, 0, 15});
  Random random(2);
  setPalette(random, &picture.image, 16);
  const PngPicture p = tests::readPng(encode(picture.image));
  EXPECT_EQ(p.colorType, PNG_COLOR_TYPE_PALETTE);
  EXPECT_EQ(p.bitDepth, 8);
  EXPECT_EQ(p.rows, (Bytes{5, 0, 15}));
}

TEST_F(ImageUtil_ConstructPNGBuffer, WritesAPaletteOfAsManyEntriesAsTheImageHas) {
  Random random(3);
  for (const uint32 colors : {1u, 16u, 256u}) {
    Picture picture(1, 1, 8, 8, {0});
    setPalette(random, &picture.image, colors);
    const Bytes file = encode(picture.image);
    const auto chunks = tests::chunksOf(file);
    ASSERT_EQ(chunks[1].name, "PLTE");
    EXPECT_EQ(chunks[1].length, 3 * colors);
    EXPECT_EQ(file[chunks[1].offset], picture.image.palette[0].red);
    EXPECT_EQ(file[chunks[1].offset + 2], picture.image.palette[0].blue);
  }
}

/// The file of the same pixels by a libpng left at its defaults but for the level, if any.
Bytes plainLibpng(const Picture& picture, const int* level) {
  Bytes file;
  Bytes rows = picture.pixels;
  auto pointers = tests::rowPointers(rows, picture.image.bytesPerLine, picture.image.height);
  png_structp png =
      png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, tests::failOnPngError, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_write_fn(png, &file, tests::appendTo, nullptr);
  png_set_IHDR(png, info, picture.image.width, picture.image.height, 8, PNG_COLOR_TYPE_RGB, 0, 0,
               0);
  if (level != nullptr) png_set_compression_level(png, *level);
  png_set_bgr(png);
  png_write_info(png, info);
  png_write_image(png, pointers.data());
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  return file;
}

TEST_F(ImageUtil_ConstructPNGBuffer, PassesOnlyTheLevelsZeroToNine) {
  Random random(4);
  Picture picture(64, 64, 24, 24, random.bytes(64 * 64 * 3));
  for (size_t i = 0; i < picture.pixels.size(); i += 2) picture.pixels[i] = 7;
  const Bytes byDefault = plainLibpng(picture, nullptr);
  EXPECT_EQ(encode(picture.image), byDefault);
  for (const int32 level : {-1, 10, -5, INT32_MAX, INT32_MIN}) {
    const ImageUtilPNGWriteParams params = {level, true};
    EXPECT_EQ(encode(picture.image, &params), byDefault) << level;
  }
  for (int32 level = 0; level <= 9; ++level) {
    const ImageUtilPNGWriteParams params = {level, true};
    EXPECT_EQ(encode(picture.image, &params), plainLibpng(picture, &level)) << level;
  }
}

TEST_F(ImageUtil_ConstructPNGBuffer, StoresWithoutCompressionAtLevelZero) {
  Random random(5);
  const Picture picture = noise(random, 20, 20, 24, 24);
  const ImageUtilPNGWriteParams params = {0, true};
  const Bytes file = encode(picture.image, &params);
  const auto chunks = tests::chunksOf(file);
  ASSERT_EQ(chunks[1].name, "IDAT");
  const uint8* deflated = &file[chunks[1].offset + 2];  // after zlib's header
  EXPECT_EQ(deflated[0], 1);                            // the last block, stored
  EXPECT_EQ(deflated[1] | deflated[2] << 8, 20 * 61);   // with its length
}

TEST_F(ImageUtil_ConstructPNGBuffer, TouchesNothingWithoutImageOrOutput) {
  DynBuf out = {nullptr, 123, 456};
  EXPECT_FALSE(::ImageUtil_ConstructPNGBuffer(nullptr, nullptr, &out));
  EXPECT_EQ(out.size, 123u);
  EXPECT_EQ(out.allocated, 456u);
  const Picture picture(1, 1, 24, 24, {1, 2, 3});
  EXPECT_FALSE(::ImageUtil_ConstructPNGBuffer(&picture.image, nullptr, nullptr));
}

TEST_F(ImageUtil_ConstructPNGBuffer, DestroysTheBufferWhenAnAppendFails) {
  Random random(6);
  Picture picture = noise(random, 40, 40, 16, 16);
  encode(picture.image);
  const int appends = interposed.appends;
  ASSERT_GT(appends, 5);
  for (int i = 0; i < appends; ++i) {
    interposed = Interposed{};
    interposed.failingAppend = i;
    DynBuf out = {nullptr, 123, 456};
    EXPECT_FALSE(::ImageUtil_ConstructPNGBuffer(&picture.image, nullptr, &out));
    EXPECT_EQ(interposed.appends, i + 1) << "went on after the failure";
    EXPECT_EQ(out.data, nullptr);
    EXPECT_EQ(out.size, 0u);
    DynBuf_Destroy(&out);  // harmless a second time
  }
}

TEST_F(ImageUtil_ConstructPNGBuffer, FailsWhenLibpngHasNoStructures) {
  const Picture picture(1, 1, 24, 24, {1, 2, 3});
  for (bool* fail : {&interposed.failWriteStruct, &interposed.failInfoStruct}) {
    *fail = true;
    DynBuf out = {nullptr, 123, 456};
    EXPECT_FALSE(::ImageUtil_ConstructPNGBuffer(&picture.image, nullptr, &out));
    EXPECT_EQ(out.size, 0u);
    *fail = false;
  }
}

TEST_F(ImageUtil_ConstructPNGBuffer, FailsForImagesThatPngCannotHold) {
  Random random(7);
  for (const uint32 colors : {0u, 257u, 0xFFFFFFFFu}) {
    Picture picture(1, 1, 8, 8, {0});
    picture.image.numColors = colors;
    EXPECT_TRUE(encode(picture.image).empty()) << colors;
  }
  for (const uint32 size : {0u, 0x80000000u}) {
    Picture wide(1, 1, 24, 24, {1, 2, 3});
    wide.image.width = size;
    EXPECT_TRUE(encode(wide.image).empty()) << size;
  }
  Picture flat(1, 1, 24, 32, {1, 2, 3, 4});
  flat.image.height = 0;
  EXPECT_TRUE(encode(flat.image).empty());
  Picture many(1, 1, 24, 24, {1, 2, 3});
  many.image.numColors = 257;  // not looked at above 8 bits
  EXPECT_FALSE(encode(many.image).empty());
}

/// Memory that counts, and that fails from some request on.
struct CountingMemory {
  int requests = 0;
  int failing = -1;  // counted from 0
  bool failedGrowth = false;
  bool askedAgain = false;
  std::vector<size_t> growths;
  std::vector<void*> freed;
  std::set<void*> live;
  ImageUtilMemOps ops{this, alloc, release, grow};

  CountingMemory() = default;
  CountingMemory(const CountingMemory&) = delete;
  CountingMemory& operator=(const CountingMemory&) = delete;

  static CountingMemory& of(void* context) { return *static_cast<CountingMemory*>(context); }
  bool refuses() { return requests++ == failing; }

  static void* alloc(void* context, size_t size) {
    CountingMemory& m = of(context);
    if (m.refuses()) return nullptr;
    void* block = malloc(size);
    m.live.insert(block);
    return block;
  }
  static void release(void* context, void* block) {
    CountingMemory& m = of(context);
    m.freed.push_back(block);
    if (block != nullptr) {
      EXPECT_EQ(m.live.erase(block), 1u);
    }
    free(block);
  }
  static void* grow(void* context, void* block, size_t size) {
    CountingMemory& m = of(context);
    m.askedAgain |= m.failedGrowth;
    m.growths.push_back(size);
    if (m.refuses()) {
      m.failedGrowth = true;
      return nullptr;
    }
    if (block != nullptr) {
      EXPECT_EQ(m.live.erase(block), 1u);
    }
    void* moved = malloc(size);  // always another block
    if (block != nullptr) memcpy(moved, block, m.growths.end()[-2]);
    free(block);
    m.live.insert(moved);
    return moved;
  }
};

struct Outcome {
  bool result;
  uint8* buffer;
  uint32 size;
};

uint8 untouched;

Outcome encodeInto(CountingMemory& memory, const ImageUtilImage* image,
                   const ImageUtilPNGWriteParams* params = nullptr) {
  Outcome outcome{false, &untouched, 77};
  outcome.result = ::ImageUtil_ConstructPNGBufferWithMemOps(image, params, &outcome.buffer,
                                                            &outcome.size, &memory.ops);
  return outcome;
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, GivesTheSameFileAndHandsTheBufferOver) {
  Random random(8);
  for (const uint32 bpp : {8u, 16u, 24u, 32u}) {
    Picture picture = noise(random, 100, 60, bpp == 32 ? 24 : bpp, bpp);
    setPalette(random, &picture.image, 256);
    const ImageUtilPNGWriteParams params = {3, false};
    CountingMemory memory;
    const Outcome o = encodeInto(memory, &picture.image, &params);
    ASSERT_TRUE(o.result);
    EXPECT_EQ(Bytes(o.buffer, o.buffer + o.size), encode(picture.image, &params));
    EXPECT_EQ(memory.live, std::set<void*>{o.buffer});
    memory.ops.free(&memory, o.buffer);
  }
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, AsksForTwiceTheBytesAnd1024) {
  Random random(9);
  const Picture picture = noise(random, 100, 60, 24, 24);
  CountingMemory memory;
  const Outcome o = encodeInto(memory, &picture.image);
  ASSERT_TRUE(o.result);
  ASSERT_GE(memory.growths.size(), 2u);
  EXPECT_EQ(memory.growths[0], 2 * 8 + 1024u);  // the signature is written first
  EXPECT_GE(memory.growths.back(), o.size);
  memory.ops.free(&memory, o.buffer);
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, ReleasesEverythingWhicheverRequestFails) {
  Random random(10);
  for (const uint32 bpp : {16u, 24u}) {
    const Picture picture = noise(random, 100, 60, bpp, bpp);
    CountingMemory counting;
    Outcome o = encodeInto(counting, &picture.image);
    ASSERT_TRUE(o.result);
    counting.ops.free(&counting, o.buffer);
    ASSERT_GE(counting.requests, bpp == 16 ? 4 : 3);
    for (int i = 0; i < counting.requests; ++i) {
      CountingMemory memory;
      memory.failing = i;
      o = encodeInto(memory, &picture.image);
      EXPECT_FALSE(o.result);
      EXPECT_EQ(o.size, 0u);
      EXPECT_EQ(o.buffer, &untouched);
      EXPECT_TRUE(memory.live.empty()) << "request " << i << " of " << counting.requests;
      EXPECT_FALSE(memory.askedAgain);
      EXPECT_EQ(memory.freed.back(), nullptr);  // the buffer that is no more
    }
  }
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, FreesNullOnceForANullImage) {
  CountingMemory memory;
  const Outcome o = encodeInto(memory, nullptr);
  EXPECT_FALSE(o.result);
  EXPECT_EQ(o.size, 0u);
  EXPECT_EQ(o.buffer, &untouched);
  EXPECT_EQ(memory.freed, std::vector<void*>{nullptr});
  EXPECT_EQ(memory.requests, 0);
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, DoesNothingWithoutOutput) {
  const Picture picture(1, 1, 24, 24, {1, 2, 3});
  CountingMemory memory;
  uint8* buffer = &untouched;
  uint32 size = 77;
  EXPECT_FALSE(::ImageUtil_ConstructPNGBufferWithMemOps(&picture.image, nullptr, nullptr, &size,
                                                        &memory.ops));
  EXPECT_FALSE(::ImageUtil_ConstructPNGBufferWithMemOps(&picture.image, nullptr, &buffer, nullptr,
                                                        &memory.ops));
  EXPECT_FALSE(
      ::ImageUtil_ConstructPNGBufferWithMemOps(&picture.image, nullptr, &buffer, &size, nullptr));
  EXPECT_EQ(size, 77u);
  EXPECT_EQ(buffer, &untouched);
  EXPECT_EQ(memory.requests, 0);
}

TEST_F(ImageUtil_ConstructPNGBufferWithMemOps, RefusesHeightsWithoutRoomForTheRows) {
  if (sizeof(size_t) > 4) GTEST_SKIP() << "every height has room in 64-bit addresses";
  Picture picture(1, 1, 24, 24, {1, 2, 3});
  picture.image.height = 0x40000000;
  CountingMemory memory;
  EXPECT_FALSE(encodeInto(memory, &picture.image).result);
  EXPECT_EQ(memory.requests, 0);
}

/// libpng as far as the write callbacks need it: an I/O pointer and an error that returns here.
template <class Work> std::string errorOf(void* ioPtr, Work work) {
  static std::string message;
  message.clear();
  const auto remember = [](png_structp png, png_const_charp text) {
    message = text;
    png_longjmp(png, 1);
  };
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, remember, nullptr);
  png_set_write_fn(png, ioPtr, ::ImageUtilBufferWriteCallback, nullptr);
  if (setjmp(png_jmpbuf(png)) == 0) work(png);
  png_destroy_write_struct(&png, nullptr);
  return message;
}

TEST(ImageUtilBufferWriteCallback, GrowsCopiesAndCounts) {
  CountingMemory memory;
  ImageUtilBufferWriteCtx ctx = {nullptr, 0, 0, &memory.ops};
  Bytes data(3000);
  for (size_t i = 0; i < data.size(); ++i) data[i] = uint8(i * 7);
  EXPECT_EQ(errorOf(&ctx,
                    [&](png_structp png) {
                      ::ImageUtilBufferWriteCallback(png, data.data(), 100);
                      EXPECT_EQ(ctx.capacity, 1224u);
                      ::ImageUtilBufferWriteCallback(png, data.data() + 100, 1124);
                      EXPECT_EQ(ctx.capacity, 1224u);
                      ::ImageUtilBufferWriteCallback(png, data.data() + 1224, 1);
                      EXPECT_EQ(ctx.capacity, 2u * 1225 + 1024);
                    }),
            "");
  EXPECT_EQ(ctx.used, 1225u);
  EXPECT_EQ(memory.growths, (std::vector<size_t>{1224, 3474}));
  EXPECT_EQ(0, memcmp(ctx.buffer, data.data(), 1225));
  memory.ops.free(&memory, ctx.buffer);
}

TEST(ImageUtilBufferWriteCallback, RaisesAnErrorAndKeepsNothingWhenItCannotGrow) {
  CountingMemory memory;
  memory.failing = 1;
  ImageUtilBufferWriteCtx ctx = {nullptr, 0, 0, &memory.ops};
  Bytes data(3000);
  EXPECT_EQ(errorOf(&ctx,
                    [&](png_structp png) {
                      ::ImageUtilBufferWriteCallback(png, data.data(), 100);
                      ::ImageUtilBufferWriteCallback(png, data.data(), 2000);
                    }),
            "Unable to append data: Out of memory");
  EXPECT_EQ(ctx.buffer, nullptr);
  EXPECT_EQ(ctx.capacity, 0u);
  EXPECT_EQ(ctx.used, 0u);
  EXPECT_TRUE(memory.live.empty());
}

TEST(ImageUtilBufferWriteCallback, RaisesAnErrorWhenTheSizeDoesNotFitTheRecord) {
  CountingMemory memory;
  uint8 byte = 1;
  ImageUtilBufferWriteCtx ctx = {static_cast<uint8*>(CountingMemory::alloc(&memory, 1)), 0xFFFFFFFF,
                                 0xFFFFFFFF, &memory.ops};
  EXPECT_EQ(errorOf(&ctx, [&](png_structp png) { ::ImageUtilBufferWriteCallback(png, &byte, 1); }),
            "Unable to append data: Out of memory");
  EXPECT_TRUE(memory.growths.empty());
  EXPECT_TRUE(memory.live.empty());
  EXPECT_EQ(ctx.buffer, nullptr);
}

TEST(ImageUtilDynBufWriteCallback, AppendsOrRaisesAnError) {
  DynBuf buffer;
  DynBuf_Init(&buffer);
  Bytes data = {1, 2, 3};
  EXPECT_EQ(errorOf(&buffer,
                    [&](png_structp png) {
                      ::ImageUtilDynBufWriteCallback(png, data.data(), 3);
                      interposed = Interposed{};
                      interposed.failingAppend = 0;
                      ::ImageUtilDynBufWriteCallback(png, data.data(), 3);
                    }),
            "Unable to append data");
  interposed = Interposed{};
  EXPECT_EQ(Bytes(buffer.data, buffer.data + buffer.size), data);
  DynBuf_Destroy(&buffer);
}

}  // namespace
