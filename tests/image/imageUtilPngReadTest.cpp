// SPDX-License-Identifier: MIT
//
// Decoding PNG: files made by libpng with every setting, broken files, and the state in which each
// failure leaves the record.

#include <gtest/gtest.h>

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <string>

#include "fileIO.h"
#include "image/pngFiles.h"
#include "imageUtil.h"
#include "support/guardedBuffer.h"
#include "support/nextFunction.h"
#include "support/random.h"

namespace {

using tests::Bytes;
using tests::GuardedBuffer;
using tests::PngExtras;
using tests::PngPicture;
using tests::Random;

// What the functions below, which stand in front of those of the libraries, do next.
struct Interposed {
  int readStructs = 0;  // calls of png_create_read_struct
  bool failReadStruct = false;
  bool failInfoStruct = false;
  bool failFileSize = false;
  bool failFileRead = false;
  size_t unreported = 0;  // bytes that FileIO_Read reads but does not count
  int closedFiles = 0;
} interposed;

}  // namespace

extern "C" {

png_structp png_create_read_struct(png_const_charp version, png_voidp errorPtr,
                                   png_error_ptr errorFn, png_error_ptr warningFn) {
  ++interposed.readStructs;
  if (interposed.failReadStruct) return nullptr;
  return tests::next<decltype(&png_create_read_struct)>("png_create_read_struct")(
      version, errorPtr, errorFn, warningFn);
}

png_infop png_create_info_struct(png_const_structp png) {
  if (interposed.failInfoStruct) return nullptr;
  return tests::next<png_infop (*)(png_const_structp)>("png_create_info_struct")(png);
}

int64 FileIO_GetSize(const FileIODescriptor* file) {
  return interposed.failFileSize ? -1
                                 : tests::next<decltype(&FileIO_GetSize)>("FileIO_GetSize")(file);
}

FileIOResult FileIO_Read(const FileIODescriptor* file, void* bytes, size_t size, size_t* actual) {
  if (interposed.failFileRead) {
    if (actual != nullptr) *actual = size;
    return FILEIO_ERROR;
  }
  const auto result = tests::next<decltype(&FileIO_Read)>("FileIO_Read")(file, bytes, size, actual);
  if (actual != nullptr) *actual -= interposed.unreported;
  return result;
}

FileIOResult FileIO_Close(FileIODescriptor* file) {
  ++interposed.closedFiles;
  return tests::next<decltype(&FileIO_Close)>("FileIO_Close")(file);
}

}  // extern "C"

namespace {

/// Puts the stand-ins back to doing nothing when a test ends.
class ImageUtilRead : public testing::Test {
 protected:
  ImageUtilRead() { interposed = Interposed{}; }
  ~ImageUtilRead() override { interposed = Interposed{}; }
};
using ImageUtil_ReadPNGBuffer = ImageUtilRead;
using ImageUtil_ReadPNG = ImageUtilRead;

/// A record that no decoding would produce.
ImageUtilImage usedRecord() {
  ImageUtilImage image;
  memset(&image, 0xA5, sizeof image);
  return image;
}
const ImageUtilImage kUsed = usedRecord();
const ImageUtilImage kZero{};

bool same(const ImageUtilImage& a, const ImageUtilImage& b) {
  return memcmp(&a, &b, sizeof a) == 0;
}

/// A decoded image and the release of its pixels.
struct Decoded {
  ImageUtilImage image = usedRecord();
  bool result = false;
  explicit Decoded(const Bytes& png, uint8 flags = 0) {
    // In front of an inaccessible page, so that one byte too many faults.
    GuardedBuffer stream(png.size());
    stream.assign(png);
    result =
        ::ImageUtil_ReadPNGBuffer(&image, stream.data(), static_cast<uint32>(png.size()), flags);
  }
  ~Decoded() { ImageUtil_FreeImageData(&image); }
  Decoded(const Decoded&) = delete;
  Decoded& operator=(const Decoded&) = delete;
};

/// No picture, and a record of zeros.
void expectRefused(const Bytes& png) {
  const Decoded decoded(png);
  EXPECT_FALSE(decoded.result);
  EXPECT_TRUE(same(decoded.image, kZero));
}

/// A picture of one row of these bytes, at depth 24.
void expectOneRow(const Bytes& png, uint8 flags, uint32 bpp, const Bytes& row) {
  const Decoded decoded(png, flags);
  ASSERT_TRUE(decoded.result);
  EXPECT_EQ(decoded.image.depth, 24u);
  EXPECT_EQ(decoded.image.bpp, bpp);
  ASSERT_EQ(decoded.image.bytesPerLine, row.size());
  EXPECT_EQ(Bytes(decoded.image.data, decoded.image.data + row.size()), row);
}

/// A file that exists while the object does.
class TemporaryFile {
 public:
  explicit TemporaryFile(const Bytes& bytes) {
    char name[] = "/tmp/imageUtilPngReadTest.XXXXXX";
    const int file = mkstemp(name);
    if (file == -1 || write(file, bytes.data(), bytes.size()) != ssize_t(bytes.size())) abort();
    close(file);
    path_ = name;
  }
  ~TemporaryFile() { unlink(path_.c_str()); }
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;
  const char* path() const { return path_.c_str(); }

 private:
  std::string path_;
};

PngPicture noise(Random& random, uint32 width, uint32 height, int colorType, int bitDepth) {
  PngPicture p;
  p.width = width;
  p.height = height;
  p.colorType = colorType;
  p.bitDepth = bitDepth;
  if (colorType == PNG_COLOR_TYPE_PALETTE) {
    p.palette.resize(size_t{1} << bitDepth);
    for (png_color& c : p.palette)
      c = {uint8(random.below(256)), uint8(random.below(256)), uint8(random.below(256))};
  }
  p.rows = random.bytes(height * tests::rowBytesOf(p));
  return p;
}

/// The bytes of pixel (x, y) as the decoder is to store them.
Bytes expectedPixel(const PngPicture& p, uint32 x, uint32 y, bool keepAlpha) {
  const uint8* row = p.rows.data() + y * tests::rowBytesOf(p);
  if (p.colorType == PNG_COLOR_TYPE_PALETTE) {
    const uint32 perByte = 8 / static_cast<uint32>(p.bitDepth);
    const uint32 shift = 8 - static_cast<uint32>(p.bitDepth) * (x % perByte + 1);
    return {uint8(row[x / perByte] >> shift & ((1 << p.bitDepth) - 1))};
  }
  const size_t sample = static_cast<size_t>(p.bitDepth) / 8;
  const size_t samples = p.colorType == PNG_COLOR_TYPE_RGB_ALPHA ? 4 : 3;
  Bytes pixel;
  for (const size_t channel : {2, 1, 0, 3}) {
    if (channel == 3 && !keepAlpha) continue;
    const uint8* at = row + (x * samples + channel) * sample;
    pixel.insert(pixel.end(), at, at + sample);
  }
  return pixel;
}

void expectPixels(const ImageUtilImage& image, const PngPicture& p, bool keepAlpha) {
  for (uint32 y = 0; y < p.height; ++y) {
    Bytes row;
    for (uint32 x = 0; x < p.width; ++x) {
      const Bytes pixel = expectedPixel(p, x, y, keepAlpha);
      row.insert(row.end(), pixel.begin(), pixel.end());
    }
    row.resize((row.size() + 3) & ~size_t{3});  // the padding is zero
    ASSERT_EQ(image.bytesPerLine, row.size());
    const uint8* actual = image.data + size_t{y} * image.bytesPerLine;
    ASSERT_EQ(Bytes(actual, actual + image.bytesPerLine), row) << "row " << y;
  }
}

void expectDecodes(const PngPicture& p, const PngExtras& extras, uint8 flags) {
  const bool palette = p.colorType == PNG_COLOR_TYPE_PALETTE;
  const bool keepAlpha = p.colorType == PNG_COLOR_TYPE_RGB_ALPHA && (flags & 1) != 0;
  const Decoded decoded(makePng(p, extras), flags);
  const ImageUtilImage& image = decoded.image;
  ASSERT_TRUE(decoded.result);
  EXPECT_EQ(image.width, p.width);
  EXPECT_EQ(image.height, p.height);
  EXPECT_EQ(image.depth, palette ? 8u : 24u);
  EXPECT_EQ(image.bpp, palette ? 8u : keepAlpha ? 32u : 24u);
  EXPECT_EQ(image.flags, 0u);
  EXPECT_EQ(image.numColors, p.palette.size());
  for (size_t i = 0; i < 256; ++i) {
    const bool valid = palette && i < p.palette.size();
    const png_color c = valid ? p.palette[i] : png_color{0, 0, 0};
    const uint8 entry[] = {c.blue, c.green, c.red, 0};
    ASSERT_EQ(0, memcmp(&image.palette[i], entry, 4)) << "entry " << i;
  }
  expectPixels(image, p, keepAlpha);
}

TEST_F(ImageUtil_ReadPNGBuffer, DecodesEveryFormatWithEverySettingOfLibpng) {
  struct Kind {
    int colorType, bitDepth;
  };
  const Kind kinds[] = {{PNG_COLOR_TYPE_PALETTE, 1},   {PNG_COLOR_TYPE_PALETTE, 2},
                        {PNG_COLOR_TYPE_PALETTE, 4},   {PNG_COLOR_TYPE_PALETTE, 8},
                        {PNG_COLOR_TYPE_RGB, 8},       {PNG_COLOR_TYPE_RGB, 16},
                        {PNG_COLOR_TYPE_RGB_ALPHA, 8}, {PNG_COLOR_TYPE_RGB_ALPHA, 16}};
  const int filters[] = {PNG_FILTER_NONE, PNG_FILTER_SUB,   PNG_FILTER_UP,
                         PNG_FILTER_AVG,  PNG_FILTER_PAETH, PNG_ALL_FILTERS};
  Random random(1);
  for (int round = 0; round < tests::rounds(600); ++round) {
    const Kind kind = kinds[random.below(8)];
    PngPicture p =
        noise(random, 1 + random.below(40), 1 + random.below(20), kind.colorType, kind.bitDepth);
    p.interlace = random.below(2) == 0 ? PNG_INTERLACE_NONE : PNG_INTERLACE_ADAM7;
    PngExtras extras;
    extras.filters = filters[random.below(6)];
    extras.level = random.between(0, 9);
    extras.texts = random.below(3) == 0;
    extras.idatBytes = random.below(2) == 0 ? 0 : 6 + random.below(100);
    if (kind.colorType == PNG_COLOR_TYPE_PALETTE && random.below(2) == 0)
      extras.paletteAlpha = random.bytes(1 + random.below(1u << kind.bitDepth));
    const uint8 flags = random.oneOf<uint8>({0, 1, 0xFE, 0xFF});
    ASSERT_NO_FATAL_FAILURE(expectDecodes(p, extras, flags))
        << "round " << round << ": " << p.width << "x" << p.height << " type " << p.colorType
        << " depth " << p.bitDepth << " interlace " << p.interlace << " flags " << int{flags};
  }
}

TEST_F(ImageUtil_ReadPNGBuffer, UnpacksPalettesOfOneTwoAndFourBitsToBytes) {
  Random random(2);
  for (const int bits : {1, 2, 4}) {
    const PngPicture p = noise(random, 7, 3, PNG_COLOR_TYPE_PALETTE, bits);
    const Decoded decoded(makePng(p));
    ASSERT_TRUE(decoded.result);
    EXPECT_EQ(decoded.image.depth, 8u);
    EXPECT_EQ(decoded.image.bpp, 8u);
    EXPECT_EQ(decoded.image.bytesPerLine, 8u);
    EXPECT_EQ(decoded.image.numColors, 1u << bits);
    expectPixels(decoded.image, p, false);
  }
}

TEST_F(ImageUtil_ReadPNGBuffer, GivesLibpngNoReasonToWarnOfInterlacing) {
  Random random(17);
  PngPicture p = noise(random, 7, 5, PNG_COLOR_TYPE_PALETTE, 4);
  p.interlace = PNG_INTERLACE_ADAM7;
  testing::internal::CaptureStderr();
  const Decoded decoded(makePng(p));
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
  ASSERT_TRUE(decoded.result);
  expectPixels(decoded.image, p, false);
}

TEST_F(ImageUtil_ReadPNGBuffer, TakesTheNumberOfColorsFromThePaletteChunk) {
  PngPicture p;
  p.width = p.height = 1;
  p.colorType = PNG_COLOR_TYPE_PALETTE;
  p.palette = {{255, 0, 0}, {1, 2, 3}, {4, 5, 6}};
  p.rows = {2};
  const Decoded decoded(makePng(p));
  ASSERT_TRUE(decoded.result);
  EXPECT_EQ(decoded.image.numColors, 3u);
  EXPECT_EQ(0, memcmp(decoded.image.palette, "\0\0\xFF\0\x03\x02\x01\0\x06\x05\x04\0\0\0\0\0", 16));
  EXPECT_EQ(decoded.image.data[0], 2);
}

TEST_F(ImageUtil_ReadPNGBuffer, KeepsOrStripsTheAlphaOfRgba) {
  PngPicture p;
  p.width = 3;
  p.height = 1;
  p.colorType = PNG_COLOR_TYPE_RGB_ALPHA;
  p.rows = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12};
  expectOneRow(makePng(p), 0, 24, {3, 2, 1, 7, 6, 5, 11, 10, 9, 0, 0, 0});
  expectOneRow(makePng(p), IMAGE_UTIL_READ_KEEP_ALPHA, 32, {3, 2, 1, 4, 7, 6, 5, 8, 11, 10, 9, 12});
}

// Deliberate: samples of 16 bits stay, while depth and bpp say 24.
TEST_F(ImageUtil_ReadPNGBuffer, LeavesSixteenBitSamplesAsTheyAre) {
  PngPicture p;
  p.width = p.height = 1;
  p.bitDepth = 16;
  p.rows = {1, 2, 3, 4, 5, 6};
  expectOneRow(makePng(p), 0, 24, {5, 6, 3, 4, 1, 2, 0, 0});
}

// Deliberate: grey images are not decoded.
TEST_F(ImageUtil_ReadPNGBuffer, RefusesGreyAndLeavesTheRecordZeroed) {
  Random random(3);
  for (const int type : {PNG_COLOR_TYPE_GRAY, PNG_COLOR_TYPE_GRAY_ALPHA}) {
    expectRefused(makePng(noise(random, 5, 5, type, 8)));
  }
}

TEST_F(ImageUtil_ReadPNGBuffer, LeavesTheRecordAloneWithoutInput) {
  const uint8 byte = 0x89;
  ImageUtilImage image = kUsed;
  EXPECT_FALSE(::ImageUtil_ReadPNGBuffer(&image, nullptr, 100, 0));
  EXPECT_TRUE(same(image, kUsed));
  EXPECT_FALSE(::ImageUtil_ReadPNGBuffer(&image, &byte, 0, 0));
  EXPECT_TRUE(same(image, kUsed));
  EXPECT_FALSE(::ImageUtil_ReadPNGBuffer(nullptr, &byte, 1, 0));
}

TEST_F(ImageUtil_ReadPNGBuffer, RefusesSevenBytesWithoutLibpngsReader) {
  expectRefused(Bytes{0x89, 'P', 'N', 'G', 13, 10, 26});
  EXPECT_EQ(interposed.readStructs, 0);
}

TEST_F(ImageUtil_ReadPNGBuffer, RefusesAWrongSignatureWithoutLibpngsReader) {
  Random random(4);
  Bytes png = makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8));
  for (size_t i = 0; i < 8; ++i) {
    Bytes wrong = png;
    wrong[i] ^= 0x20;
    expectRefused(wrong);
  }
  EXPECT_EQ(interposed.readStructs, 0);
}

// Deliberate: the buffer is trusted to hold the whole stream.
TEST_F(ImageUtil_ReadPNGBuffer, ComparesTheSizeWithTheSignaturesOnly) {
  Random random(5);
  const PngPicture p = noise(random, 9, 4, PNG_COLOR_TYPE_RGB, 8);
  const Bytes png = makePng(p);
  ImageUtilImage image = kUsed;
  EXPECT_TRUE(::ImageUtil_ReadPNGBuffer(&image, png.data(), 8, 0));
  expectPixels(image, p, false);
  ImageUtil_FreeImageData(&image);
}

TEST_F(ImageUtil_ReadPNGBuffer, FailsZeroedWhenLibpngHasNoStructures) {
  Random random(6);
  const Bytes png = makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8));
  for (bool* fail : {&interposed.failReadStruct, &interposed.failInfoStruct}) {
    *fail = true;
    expectRefused(png);
    *fail = false;
  }
}

TEST_F(ImageUtil_ReadPNGBuffer, FailsZeroedWhenTheHeaderIsBroken) {
  Random random(7);
  Bytes png = makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8));
  png[29] ^= 1;  // the header's checksum
  expectRefused(png);
  EXPECT_EQ(interposed.readStructs, 1);
}

TEST_F(ImageUtil_ReadPNGBuffer, KeepsFieldsAndPixelsWhenTheErrorComesInThePixels) {
  Random random(8);
  const PngPicture p = noise(random, 30, 30, PNG_COLOR_TYPE_RGB, 8);
  PngExtras extras;
  extras.idatBytes = 500;
  Bytes png = makePng(p, extras);
  const auto chunks = tests::chunksOf(png);
  ASSERT_EQ(chunks[2].name, "IDAT");
  png[chunks[2].offset + chunks[2].length] ^= 1;  // the second IDAT's checksum
  const Decoded decoded(png);
  EXPECT_FALSE(decoded.result);
  EXPECT_EQ(decoded.image.width, 30u);
  EXPECT_EQ(decoded.image.height, 30u);
  EXPECT_EQ(decoded.image.depth, 24u);
  EXPECT_EQ(decoded.image.bpp, 24u);
  EXPECT_EQ(decoded.image.bytesPerLine, 92u);
  ASSERT_NE(decoded.image.data, nullptr);
  EXPECT_EQ(0, memcmp(decoded.image.data, (Bytes{p.rows[2], p.rows[1], p.rows[0]}).data(), 3));
}

TEST_F(ImageUtil_ReadPNGBuffer, KeepsThePixelsWhenTheErrorComesAfterThem) {
  Random random(9);
  const PngPicture p = noise(random, 5, 5, PNG_COLOR_TYPE_RGB, 8);
  Bytes png = makePng(p);
  png[png.size() - 1] ^= 1;  // the last chunk's checksum
  const Decoded decoded(png);
  ASSERT_NE(decoded.image.data, nullptr);
  expectPixels(decoded.image, p, false);
}

void putBigEndian(uint8* at, uint32 value) {
  for (int i = 0; i < 4; ++i) at[i] = static_cast<uint8>(value >> (24 - 8 * i));
}

/// A file whose header promises a picture of another size than it has.
Bytes promising(uint32 width, uint32 height, Bytes png) {
  putBigEndian(&png[16], width);
  putBigEndian(&png[20], height);
  // The checksum of the changed header, bit by bit.
  uint32 crc = 0xFFFFFFFFu;
  for (size_t i = 12; i < 29; ++i) {
    crc ^= png[i];
    for (int bit = 0; bit < 8; ++bit) crc = (crc & 1) != 0 ? crc >> 1 ^ 0xEDB88320u : crc >> 1;
  }
  putBigEndian(&png[29], ~crc);
  return png;
}

TEST_F(ImageUtil_ReadPNGBuffer, RefusesSizesThatMemoryCannotAddress) {
  if (sizeof(size_t) > 4) GTEST_SKIP() << "libpng's own limit is within 64-bit addresses";
  Random random(10);
  const Decoded decoded(
      promising(1000000, 1000000, makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8))));
  EXPECT_FALSE(decoded.result);
  EXPECT_EQ(decoded.image.width, 1000000u);
  EXPECT_EQ(decoded.image.height, 1000000u);
  EXPECT_EQ(decoded.image.bytesPerLine, 3000000u);
  EXPECT_EQ(decoded.image.data, nullptr);
}

TEST(ImageUtil_FreeImageData, ReleasesThePixelsAndNothingElse) {
  ImageUtilImage image = kUsed;
  image.data = static_cast<uint8*>(malloc(10));
  ImageUtil_FreeImageData(&image);
  ImageUtilImage expected = kUsed;
  expected.data = nullptr;
  EXPECT_TRUE(same(image, expected));
  ImageUtil_FreeImageData(&image);
  EXPECT_TRUE(same(image, expected));
}

TEST(ImageUtilReadPngCallback, ServesALibpngThatAHostDrives) {
  Random random(11);
  const PngPicture p = noise(random, 6, 4, PNG_COLOR_TYPE_RGB, 8);
  const Bytes file = makePng(p);
  ImageUtilReadPngCtx ctx = {file.data(), 0};
  png_structp png =
      png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, tests::failOnPngError, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_read_fn(png, &ctx, ::ImageUtilReadPngCallback);
  png_read_png(png, info, PNG_TRANSFORM_IDENTITY, nullptr);
  EXPECT_EQ(ctx.consumed, file.size());
  EXPECT_EQ(ctx.start, file.data());
  EXPECT_EQ(0, memcmp(png_get_rows(png, info)[3], p.rows.data() + 54, 18));
  png_destroy_read_struct(&png, &info, nullptr);
}

TEST_F(ImageUtil_ReadPNG, DecodesAFile) {
  Random random(12);
  for (const uint8 flags : {uint8{0}, uint8{1}}) {
    const PngPicture p = noise(random, 50, 20, PNG_COLOR_TYPE_RGB_ALPHA, 8);
    const TemporaryFile file(makePng(p));
    ImageUtilImage image = kUsed;
    ASSERT_TRUE(::ImageUtil_ReadPNG(&image, file.path(), flags));
    EXPECT_EQ(image.bpp, flags != 0 ? 32u : 24u);
    expectPixels(image, p, flags != 0);
    ImageUtil_FreeImageData(&image);
  }
  EXPECT_EQ(interposed.closedFiles, 2);
}

TEST_F(ImageUtil_ReadPNG, LeavesTheRecordAloneWhenTheFileCannotBeRead) {
  const TemporaryFile empty{Bytes{}};
  const TemporaryFile some{Bytes(100, 1)};
  ImageUtilImage image = kUsed;
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, "/tmp/no such folder/no such file.png", 0));
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, "/tmp", 0));
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, empty.path(), 0));
  EXPECT_FALSE(::ImageUtil_ReadPNG(nullptr, some.path(), 0));
  EXPECT_TRUE(same(image, kUsed));
}

TEST_F(ImageUtil_ReadPNG, ClosesTheFileWhenItsSizeOrItsBytesCannotBeTold) {
  Random random(13);
  const TemporaryFile file(makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8)));
  ImageUtilImage image = kUsed;
  interposed.failFileSize = true;
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, file.path(), 0));
  EXPECT_EQ(interposed.closedFiles, 1);
  interposed.failFileSize = false;
  interposed.failFileRead = true;
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, file.path(), 0));
  EXPECT_EQ(interposed.closedFiles, 2);
  EXPECT_TRUE(same(image, kUsed));
}

TEST_F(ImageUtil_ReadPNG, SendsAnEightByteFileWithASignatureToLibpng) {
  const TemporaryFile file{Bytes{0x89, 'P', 'N', 'G', 13, 10, 26, 10}};
  ImageUtilImage image = kUsed;
  EXPECT_FALSE(::ImageUtil_ReadPNG(&image, file.path(), 0));
  EXPECT_EQ(interposed.readStructs, 1);
  EXPECT_TRUE(same(image, kZero));
}

/// Reads `bytes` as a file; whatever happens, the record must be one that can be released.
bool readsAsFile(const Bytes& bytes) {
  const TemporaryFile file(bytes);
  ImageUtilImage image = kUsed;
  const bool read = ::ImageUtil_ReadPNG(&image, file.path(), 0);
  if (bytes.empty()) {
    EXPECT_TRUE(same(image, kUsed));
    return read;
  }
  if (read) {
    EXPECT_NE(image.data, nullptr);
  }
  if (image.width == 0) {
    EXPECT_TRUE(same(image, kZero));
  }
  ImageUtil_FreeImageData(&image);
  return read;
}

/// How much memory a call makes resident, in bytes, measured in a process of its own.
template <class Call> int64 residentBytesOf(Call call) {
  const pid_t child = fork();
  if (child == 0) {
    call();
    _exit(0);
  }
  int status = 0;
  rusage used{};
  EXPECT_EQ(wait4(child, &status, 0, &used), child);
  EXPECT_EQ(status, 0);
  return int64{used.ru_maxrss} * 1024;
}

TEST_F(ImageUtil_ReadPNG, TakesNoMemoryForRowsThatNeverCome) {
  Random random(18);
  const Bytes png = makePng(noise(random, 3, 3, PNG_COLOR_TYPE_RGB, 8));
  const TemporaryFile file(promising(341, 1000000, png));
  const int64 resident = residentBytesOf([&] {
    ImageUtilImage image;
    if (::ImageUtil_ReadPNG(&image, file.path(), 0)) _exit(1);
    if (image.data == nullptr || image.bytesPerLine != 1024) _exit(2);
    ImageUtil_FreeImageData(&image);
  });
  EXPECT_LT(resident, int64{500} << 20);  // of the 1 GB that the file promises
}

/// libpng tells its errors on standard error; thousands of them would hide everything else.
class WithoutStandardError {
 public:
  WithoutStandardError() : saved_(dup(2)) {
    if (freopen("/dev/null", "w", stderr) == nullptr) abort();
  }
  ~WithoutStandardError() {
    fflush(stderr);
    dup2(saved_, 2);
    close(saved_);
  }
  WithoutStandardError(const WithoutStandardError&) = delete;
  WithoutStandardError& operator=(const WithoutStandardError&) = delete;

 private:
  int saved_;
};

TEST_F(ImageUtil_ReadPNG, FailsAtEveryLengthOfATruncatedFile) {
  const WithoutStandardError quiet;
  Random random(14);
  for (const int type : {PNG_COLOR_TYPE_PALETTE, PNG_COLOR_TYPE_RGB, PNG_COLOR_TYPE_RGB_ALPHA}) {
    for (const int interlace : {PNG_INTERLACE_NONE, PNG_INTERLACE_ADAM7}) {
      PngPicture p = noise(random, 5, 4, type, 8);
      p.palette.resize(type == PNG_COLOR_TYPE_PALETTE ? 10 : 0);
      for (uint8& byte : p.rows) byte %= 10;
      p.interlace = interlace;
      const Bytes png = makePng(p);
      for (size_t length = 0; length < png.size(); ++length) {
        const Bytes cut(png.begin(), png.begin() + static_cast<ptrdiff_t>(length));
        ASSERT_FALSE(readsAsFile(cut)) << "length " << length << " of " << png.size();
      }
      ASSERT_TRUE(readsAsFile(png));
    }
  }
}

TEST_F(ImageUtil_ReadPNG, EndsWithTheBytesThatWereReadWhateverFollowsThem) {
  const WithoutStandardError quiet;
  Random random(16);
  const Bytes png = makePng(noise(random, 5, 4, PNG_COLOR_TYPE_RGB, 8));
  for (interposed.unreported = 1; interposed.unreported < png.size(); ++interposed.unreported)
    ASSERT_FALSE(readsAsFile(png)) << "but for " << interposed.unreported << " bytes";
  interposed.unreported = 0;
  EXPECT_TRUE(readsAsFile(png));
}

TEST_F(ImageUtil_ReadPNG, SurvivesRandomDamage) {
  const WithoutStandardError quiet;
  Random random(15);
  for (int round = 0; round < tests::rounds(1500); ++round) {
    const int type =
        random.oneOf<int>({PNG_COLOR_TYPE_PALETTE, PNG_COLOR_TYPE_RGB, PNG_COLOR_TYPE_RGB_ALPHA});
    PngPicture p = noise(random, 1 + random.below(20), 1 + random.below(10), type, 8);
    PngExtras extras;
    extras.texts = random.below(2) == 0;
    extras.idatBytes = random.below(2) == 0 ? 0 : 20;
    Bytes png = makePng(p, extras);
    for (uint32 flips = 1 + random.below(4); flips != 0; --flips)
      png[random.below(static_cast<uint32>(png.size()))] ^= uint8(1u << random.below(8));
    readsAsFile(png);
    ASSERT_FALSE(HasFailure()) << "round " << round;
  }
}

}  // namespace
