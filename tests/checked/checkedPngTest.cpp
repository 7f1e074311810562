// SPDX-License-Identifier: MIT
//
// PNG streams of every type, cut off anywhere, changed anywhere, and encoded to the same bytes as
// by the exact encoder.

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "checked/checkedImages.h"
#include "image/pngFiles.h"
#include "imageUtil.h"
#include "rasterChecked.h"
#include "support/random.h"

namespace {

using tests::Bytes;
using tests::GuardedBuffer;
using tests::GuardedView;
using tests::PngExtras;
using tests::PngPicture;
using tests::Random;

constexpr uint32 kEverything =
    RASTER_CHECKED_KEEP_ALPHA | RASTER_CHECKED_EXPAND_GREY | RASTER_CHECKED_REDUCE_16;

/// A record that no call has touched.
ImageUtilImage untouched() {
  ImageUtilImage image;
  memset(&image, 0x5A, sizeof image);
  return image;
}

/// Reads from memory that ends with the stream. The image is left alone unless the result is OK,
/// and nothing is said but into `message`.
RasterStatus read(const Bytes& stream, uint32 flags, ImageUtilImage* image,
                  const RasterLimits* limits = nullptr, std::string* message = nullptr) {
  GuardedBuffer memory(stream.size());
  memory.assign(stream);
  char words[100] = "x";
  const ImageUtilImage before = untouched();
  memcpy(image, &before, sizeof before);
  testing::internal::CaptureStderr();
  const RasterStatus status = RasterChecked_ReadPngBuffer(memory.data(), memory.size(), flags,
                                                          limits, image, words, sizeof words);
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
  if (status != RASTER_STATUS_OK) {
    EXPECT_EQ(0, memcmp(image, &before, sizeof before));
  }
  if (message != nullptr) *message = words;
  return status;
}

RasterStatus statusOf(const Bytes& stream, uint32 flags = kEverything,
                      const RasterLimits* limits = nullptr) {
  ImageUtilImage image;
  const RasterStatus status = read(stream, flags, &image, limits);
  if (status == RASTER_STATUS_OK) free(image.data);
  return status;
}

struct PngKind {
  int colorType;
  int bitDepth;
};
constexpr PngKind kKinds[] = {
    {PNG_COLOR_TYPE_GRAY, 1},        {PNG_COLOR_TYPE_GRAY, 2},      {PNG_COLOR_TYPE_GRAY, 4},
    {PNG_COLOR_TYPE_GRAY, 8},        {PNG_COLOR_TYPE_GRAY, 16},     {PNG_COLOR_TYPE_RGB, 8},
    {PNG_COLOR_TYPE_RGB, 16},        {PNG_COLOR_TYPE_PALETTE, 1},   {PNG_COLOR_TYPE_PALETTE, 2},
    {PNG_COLOR_TYPE_PALETTE, 4},     {PNG_COLOR_TYPE_PALETTE, 8},   {PNG_COLOR_TYPE_GRAY_ALPHA, 8},
    {PNG_COLOR_TYPE_GRAY_ALPHA, 16}, {PNG_COLOR_TYPE_RGB_ALPHA, 8}, {PNG_COLOR_TYPE_RGB_ALPHA, 16}};

PngPicture somePicture(Random& random, PngKind kind, uint32 width, uint32 height, bool interlaced) {
  PngPicture p;
  p.width = width;
  p.height = height;
  p.bitDepth = kind.bitDepth;
  p.colorType = kind.colorType;
  p.interlace = interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE;
  if (kind.colorType == PNG_COLOR_TYPE_PALETTE) {
    p.palette.resize(size_t{1} << kind.bitDepth);
    for (png_color& c : p.palette)
      c = {static_cast<png_byte>(random.word()), static_cast<png_byte>(random.word()),
           static_cast<png_byte>(random.word())};
  }
  p.rows = random.bytes(rowBytesOf(p) * height);
  return p;
}

bool isGrey(int colorType) { return (colorType & PNG_COLOR_MASK_COLOR) == 0; }

/// A sample of a picture, 16-bit ones by their upper byte, smaller grey ones spread to 8 bits.
uint8 sampleOf(const PngPicture& p, uint32 x, uint32 y, uint32 sample, uint32 samples) {
  const size_t bit = (size_t{x} * samples + sample) * static_cast<size_t>(p.bitDepth);
  const uint8* row = p.rows.data() + rowBytesOf(p) * y;
  if (p.bitDepth >= 8) return row[bit / 8];
  const uint32 most = (1u << p.bitDepth) - 1;
  const uint32 value = row[bit / 8] >> (8 - p.bitDepth - static_cast<int>(bit % 8)) & most;
  return static_cast<uint8>(isGrey(p.colorType) ? value * 255 / most : value);
}

/// What the header promises for a picture, worked out pixel by pixel.
Bytes naivePixels(const PngPicture& p, uint32 flags, uint32* bpp) {
  const bool palette = p.colorType == PNG_COLOR_TYPE_PALETTE;
  const bool alpha = (p.colorType & PNG_COLOR_MASK_ALPHA) != 0;
  const uint32 colors = isGrey(p.colorType) || palette ? 1 : 3;
  const uint32 samples = colors + (alpha ? 1 : 0);
  const bool keeps = alpha && (flags & RASTER_CHECKED_KEEP_ALPHA) != 0;
  *bpp = palette ? 8 : keeps ? 32 : 24;
  Bytes rows;
  for (uint32 y = 0; y < p.height; ++y) {
    for (uint32 x = 0; x < p.width; ++x) {
      for (uint32 channel = 0; channel < (palette ? 1u : 3u); ++channel)
        rows.push_back(sampleOf(p, x, y, colors == 3 ? 2 - channel : 0, samples));
      if (keeps) rows.push_back(sampleOf(p, x, y, colors, samples));
    }
    while (rows.size() % 4 != 0) rows.push_back(0);
  }
  return rows;
}

TEST(RasterChecked_ReadPngBuffer, ReadsEveryTypeAsTheHeaderSays) {
  Random random(71);
  for (const PngKind kind : kKinds) {
    for (const bool interlaced : {false, true}) {
      for (int round = 0; round < 12; ++round) {
        const PngPicture p =
            somePicture(random, kind, 1 + random.below(50), 1 + random.below(50), interlaced);
        PngExtras extras;
        extras.texts = round % 2 == 0;
        const Bytes stream = makePng(p, extras);
        const uint32 flags = random.below(8);
        const bool wanted =
            (!isGrey(kind.colorType) || (flags & RASTER_CHECKED_EXPAND_GREY) != 0) &&
            (kind.bitDepth != 16 || (flags & RASTER_CHECKED_REDUCE_16) != 0);
        ImageUtilImage image;
        const RasterStatus status = read(stream, flags, &image);
        ASSERT_EQ(status, wanted ? RASTER_STATUS_OK : RASTER_STATUS_UNSUPPORTED);
        if (!wanted) continue;
        uint32 bpp = 0;
        const Bytes expected = naivePixels(p, flags, &bpp);
        ASSERT_EQ(image.width, p.width);
        ASSERT_EQ(image.height, p.height);
        ASSERT_EQ(image.bpp, bpp);
        ASSERT_EQ(image.depth, std::min(bpp, 24u));
        ASSERT_EQ(image.flags, 0u);
        ASSERT_EQ(image.numColors, p.palette.size());
        for (size_t i = 0; i < p.palette.size(); ++i) {
          ASSERT_EQ(image.palette[i].red, p.palette[i].red);
          ASSERT_EQ(image.palette[i].green, p.palette[i].green);
          ASSERT_EQ(image.palette[i].blue, p.palette[i].blue);
          ASSERT_EQ(image.palette[i].reserved, 0);
        }
        const size_t bytes = size_t{image.bytesPerLine} * image.height;
        ASSERT_EQ(Bytes(image.data, image.data + bytes), expected)
            << kind.colorType << "/" << kind.bitDepth << " flags " << flags;
        free(image.data);
      }
    }
  }
}

TEST(RasterChecked_ReadPngBuffer, EqualsTheExactReader) {
  Random random(72);
  for (const PngKind kind : kKinds) {
    if (isGrey(kind.colorType) || kind.bitDepth == 16) continue;
    for (int round = 0; round < 20; ++round) {
      const PngPicture p =
          somePicture(random, kind, 1 + random.below(90), 1 + random.below(90), round % 2 == 0);
      PngExtras extras;
      if (kind.colorType == PNG_COLOR_TYPE_PALETTE) extras.paletteAlpha = random.bytes(2);
      const Bytes stream = makePng(p, extras);
      const uint32 flags = random.below(2);
      ImageUtilImage exact;
      ImageUtilImage image;
      ASSERT_TRUE(ImageUtil_ReadPNGBuffer(&exact, stream.data(), static_cast<uint32>(stream.size()),
                                          static_cast<uint8>(flags)));
      ASSERT_EQ(read(stream, flags, &image), RASTER_STATUS_OK);
      uint8* const data = image.data;
      image.data = exact.data;
      ASSERT_EQ(0, memcmp(&image, &exact, sizeof image));
      ASSERT_EQ(0, memcmp(data, exact.data, size_t{image.bytesPerLine} * image.height));
      free(data);
      free(exact.data);
    }
  }
}

TEST(RasterChecked_ReadPngBuffer, IsTruncatedAtEveryByte) {
  Random random(73);
  for (const bool interlaced : {false, true}) {
    const Bytes good = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 20, 20, interlaced));
    for (size_t size = 0; size < good.size(); ++size)
      ASSERT_EQ(statusOf({good.begin(), good.begin() + static_cast<ptrdiff_t>(size)}),
                RASTER_STATUS_TRUNCATED)
          << size;
    Bytes longer = good;
    longer.resize(good.size() + 100, 0xAA);
    EXPECT_EQ(statusOf(longer), RASTER_STATUS_OK);
  }
}

TEST(RasterChecked_ReadPngBuffer, TakesEveryByteChanged) {
  Random random(74);
  for (const PngKind kind : {PngKind{PNG_COLOR_TYPE_PALETTE, 4}, {PNG_COLOR_TYPE_RGB_ALPHA, 8}}) {
    PngExtras extras;
    extras.texts = true;
    const Bytes good = makePng(somePicture(random, kind, 13, 9, true), extras);
    for (size_t at = 0; at < good.size(); ++at) {
      for (const int change : {1, 0x20, 0x80, 0xFF}) {
        Bytes bad = good;
        bad[at] = static_cast<uint8>(bad[at] ^ change);
        const RasterStatus status = statusOf(bad);
        ASSERT_TRUE(at >= 8 || status == RASTER_STATUS_NOT_PNG);
        ASSERT_TRUE(at < 8 || at >= 33 || status == RASTER_STATUS_DAMAGED);
      }
    }
  }
}

TEST(RasterChecked_ReadPngBuffer, TellsLibpngsWords) {
  Random random(75);
  const PngPicture p = somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 20, 20, false);
  Bytes bad = makePng(p);
  for (const tests::PngChunk& chunk : tests::chunksOf(bad))
    if (chunk.name == "IDAT") bad[chunk.offset + 10] ^= 0xFF;
  ImageUtilImage image;
  std::string message;
  EXPECT_EQ(read(bad, 0, &image, nullptr, &message), RASTER_STATUS_DAMAGED);
  EXPECT_NE(message, "");
  char two[2] = {'x', 'x'};
  EXPECT_EQ(RasterChecked_ReadPngBuffer(bad.data(), bad.size(), 0, nullptr, &image, two, 2),
            RASTER_STATUS_DAMAGED);
  EXPECT_EQ(two[0], message[0]);
  EXPECT_EQ(two[1], 0);
  EXPECT_EQ(RasterChecked_ReadPngBuffer(bad.data(), bad.size(), 0, nullptr, &image, two, 0),
            RASTER_STATUS_DAMAGED);
  EXPECT_EQ(read(makePng(p), 0, &image, nullptr, &message), RASTER_STATUS_OK);
  EXPECT_EQ(message, "");
  free(image.data);
}

/// Puts a chunk in front of the first one of a name.
Bytes withChunk(const Bytes& stream, const char* name, const Bytes& added) {
  Bytes result = stream;
  for (const tests::PngChunk& chunk : tests::chunksOf(stream)) {
    if (chunk.name != name) continue;
    result.insert(result.begin() + static_cast<ptrdiff_t>(chunk.offset) - 8, added.begin(),
                  added.end());
    break;
  }
  return result;
}

// A chunk whose name begins with a capital letter is one without which there is no picture.
TEST(RasterChecked_ReadPngBuffer, RefusesUnknownChunksThatCount) {
  const Bytes critical = {0, 0, 0, 0, 'I', 'E', 'N', 'T', 0xB3, 0xF5, 'p', 0xE6};
  const Bytes other = {0, 0, 0, 0, 'i', 'e', 'N', 't', 0x10, 0xE4, 0xB9, 0xF0};
  Random random(77);
  for (const bool interlaced : {false, true}) {
    const Bytes stream = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 9, 9, interlaced));
    for (const char* before : {"IDAT", "IEND"}) {
      EXPECT_EQ(statusOf(withChunk(stream, before, critical)), RASTER_STATUS_DAMAGED) << before;
      EXPECT_EQ(statusOf(withChunk(stream, before, other)), RASTER_STATUS_OK) << before;
    }
  }
}

TEST(RasterChecked_ReadPngBuffer, KeepsEveryLimit) {
  Random random(76);
  PngExtras extras;
  extras.texts = true;
  extras.idatBytes = 100;  // many chunks of pixels, which do not count
  const Bytes stream = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 21, 20, false), extras);
  uint32 others = 0;
  size_t longest = 0;
  for (const tests::PngChunk& chunk : tests::chunksOf(stream)) {
    if (chunk.name == "IDAT" || chunk.name == "IEND") continue;
    ++others;
    longest = std::max(longest, chunk.length);
  }
  const RasterLimits exact = {21, 20, 64 * 20, stream.size(), static_cast<uint32>(longest), others};
  EXPECT_EQ(statusOf(stream, 0, &exact), RASTER_STATUS_OK);
  for (int which = 0; which < 6; ++which) {
    RasterLimits less = exact;
    switch (which) {
      case 0:
        --less.width;
        break;
      case 1:
        --less.height;
        break;
      case 2:
        --less.pixelBytes;
        break;
      case 3:
        --less.inputBytes;
        break;
      case 4:
        --less.chunkBytes;
        break;
      default:
        --less.chunks;
    }
    EXPECT_EQ(statusOf(stream, 0, &less), RASTER_STATUS_LIMIT) << which;
  }
}

TEST(RasterChecked_ReadPngBuffer, RefusesWrongArguments) {
  Random random(77);
  const Bytes good = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 2, 2, false));
  ImageUtilImage image;
  EXPECT_EQ(RasterChecked_ReadPngBuffer(nullptr, 9, 0, nullptr, &image, nullptr, 0),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_ReadPngBuffer(good.data(), good.size(), 0, nullptr, nullptr, nullptr, 0),
            RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_ReadPngBuffer(good.data(), good.size(), 8, nullptr, &image, nullptr, 0),
            RASTER_STATUS_BAD_ARGUMENT);
}

/// The checksum of a chunk's name and data.
uint32 crcOf(const uint8* bytes, size_t size) {
  uint32 crc = ~0u;
  for (size_t i = 0; i < size; ++i) {
    crc ^= bytes[i];
    for (int bit = 0; bit < 8; ++bit) crc = (crc & 1) != 0 ? crc >> 1 ^ 0xEDB88320u : crc >> 1;
  }
  return ~crc;
}
void storeBig(uint8* at, uint32 value) {
  for (int i = 0; i < 4; ++i) at[i] = static_cast<uint8>(value >> (24 - 8 * i));
}

/// A good stream whose header says something else, with the right checksum.
Bytes withHeader(Bytes stream, uint32 width, uint32 height, uint8 bitDepth, uint8 colorType,
                 uint8 compression = 0, uint8 filter = 0, uint8 interlace = 0) {
  storeBig(&stream[16], width);
  storeBig(&stream[20], height);
  const uint8 rest[] = {bitDepth, colorType, compression, filter, interlace};
  memcpy(&stream[24], rest, sizeof rest);
  storeBig(&stream[29], crcOf(&stream[12], 17));
  return stream;
}

TEST(RasterChecked_ReadPngBuffer, RefusesPixelsThatCannotBeThere) {
  Random random(78);
  const Bytes good = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 4, 4, false));
  EXPECT_EQ(statusOf(withHeader(good, 4, 4, 8, 2)), RASTER_STATUS_OK);
  EXPECT_EQ(statusOf(withHeader(good, 9000, 9000, 8, 2)), RASTER_STATUS_TRUNCATED);
  EXPECT_EQ(statusOf(withHeader(good, 16384, 16384, 8, 2)), RASTER_STATUS_LIMIT);
  EXPECT_EQ(statusOf(withHeader(good, 0x7FFFFFFF, 0x7FFFFFFF, 16, 6)), RASTER_STATUS_LIMIT);
  const RasterLimits none = {~0u, ~0u, ~uint64{0}, ~uint64{0}, ~0u, ~0u};
  EXPECT_NE(statusOf(withHeader(good, 0x7FFFFFFF, 0x7FFFFFFF, 16, 6), kEverything, &none),
            RASTER_STATUS_OK);
  EXPECT_EQ(statusOf(withHeader(good, 4, 40, 8, 2)), RASTER_STATUS_DAMAGED);
}

// ---- Information -------------------------------------------------------------------------------

TEST(RasterChecked_PngInfo, SaysWhatTheHeaderSays) {
  Random random(79);
  for (const PngKind kind : kKinds) {
    for (const bool interlaced : {false, true}) {
      const Bytes stream = makePng(somePicture(random, kind, 5, 6, interlaced));
      GuardedBuffer start(RASTER_CHECKED_PNG_INFO_BYTES);
      start.assign({stream.begin(), stream.begin() + RASTER_CHECKED_PNG_INFO_BYTES});
      RasterPngInfo info = {};
      ASSERT_EQ(RasterChecked_PngInfo(start.data(), start.size(), &info), RASTER_STATUS_OK);
      EXPECT_EQ(info.width, 5u);
      EXPECT_EQ(info.height, 6u);
      EXPECT_EQ(info.bitDepth, kind.bitDepth);
      EXPECT_EQ(info.colorType, kind.colorType);
      EXPECT_EQ(info.interlaced, interlaced);
    }
  }
}

TEST(RasterChecked_PngInfo, RefusesHeadersOfNoPicture) {
  Random random(80);
  const Bytes good = makePng(somePicture(random, {PNG_COLOR_TYPE_RGB, 8}, 4, 4, false));
  RasterPngInfo info = {};
  const auto infoOf = [&](const Bytes& bytes) {
    return RasterChecked_PngInfo(bytes.data(), bytes.size(), &info);
  };
  EXPECT_EQ(infoOf(withHeader(good, 0, 4, 8, 2)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 4, 0, 8, 2)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 0x80000000, 4, 8, 2)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 4, 0x80000000, 8, 2)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 4, 4, 8, 2, 1)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 4, 4, 8, 2, 0, 1)), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(infoOf(withHeader(good, 4, 4, 8, 2, 0, 0, 2)), RASTER_STATUS_DAMAGED);
  for (int colorType = 0; colorType < 256; ++colorType) {
    for (int bitDepth = 0; bitDepth < 33; ++bitDepth) {
      bool known = false;
      for (const PngKind kind : kKinds)
        known |= kind.colorType == colorType && kind.bitDepth == bitDepth;
      ASSERT_EQ(infoOf(withHeader(good, 4, 4, static_cast<uint8>(bitDepth),
                                  static_cast<uint8>(colorType))),
                known ? RASTER_STATUS_OK : RASTER_STATUS_DAMAGED);
    }
  }
  EXPECT_EQ(RasterChecked_PngInfo(nullptr, 33, &info), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_PngInfo(good.data(), 33, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_PngInfo(good.data(), 32, &info), RASTER_STATUS_TRUNCATED);
  EXPECT_EQ(RasterChecked_PngInfo(good.data() + 1, 3, &info), RASTER_STATUS_NOT_PNG);
}

// ---- Encoding ----------------------------------------------------------------------------------

TEST(RasterChecked_EncodePng, MakesTheBytesOfTheExactEncoder) {
  Random random(81);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    const GuardedView view = tests::somePicture(random);
    const ImageUtilImage image = tests::imageOf(random, view.view(), 256);
    const ImageUtilPNGWriteParams params = {random.between(-2, 11), random.below(2) == 0};
    const ImageUtilPNGWriteParams* given = random.below(4) == 0 ? nullptr : &params;
    uint8* file = nullptr;
    size_t size = 0;
    ASSERT_EQ(RasterChecked_EncodePng(&image, view.view().bytes, given, &file, &size),
              RASTER_STATUS_OK);
    DynBuf exact;
    ASSERT_TRUE(ImageUtil_ConstructPNGBuffer(&image, given, &exact));
    ASSERT_EQ(Bytes(file, file + size), Bytes(exact.data, exact.data + exact.size));
    DynBuf_Destroy(&exact);
    free(file);
  }
}

TEST(RasterChecked_EncodePng, RefusesWhatNoFileCanHold) {
  Random random(82);
  const GuardedView view(random, {8, 8}, 10, 10);
  ImageUtilImage image = tests::imageOf(random, view.view(), 256);
  const size_t bytes = view.view().bytes;
  uint8* file = nullptr;
  size_t size = 77;
  const auto statusNow = [&](size_t given) {
    testing::internal::CaptureStderr();
    const RasterStatus status = RasterChecked_EncodePng(&image, given, nullptr, &file, &size);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
    return status;
  };
  EXPECT_EQ(statusNow(bytes - 1), RASTER_STATUS_BAD_VIEW);
  image.numColors = 0;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_ARGUMENT);
  image.numColors = 257;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_ARGUMENT);
  image.numColors = 5;
  view.view().data[3] = 5;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_ARGUMENT);
  image.numColors = 256;
  image.bpp = 4;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_FORMAT);
  image.bpp = 8;
  image.width = 0;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_ARGUMENT);
  image.width = 10;
  image.height = 0;
  EXPECT_EQ(statusNow(bytes), RASTER_STATUS_BAD_ARGUMENT);
  Bytes wide(1000001);
  image.height = 1;
  image.width = image.bytesPerLine = 1000001;
  image.data = wide.data();
  EXPECT_EQ(statusNow(wide.size()), RASTER_STATUS_TOO_BIG);
  EXPECT_EQ(RasterChecked_EncodePng(nullptr, 0, nullptr, &file, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_EncodePng(&image, 0, nullptr, nullptr, &size), RASTER_STATUS_NULL);
  EXPECT_EQ(RasterChecked_EncodePng(&image, 0, nullptr, &file, nullptr), RASTER_STATUS_NULL);
  EXPECT_EQ(file, nullptr);
  EXPECT_EQ(size, 77u);
}

}  // namespace
