// SPDX-License-Identifier: MIT

#include "picture.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdlib>
#include <utility>

#include "anyPng.h"
#include "failure.h"
#include "dynBuf.h"
#include "pngFile.h"
#include "raster.h"
#include "rasterChecked.h"
#include "standardError.h"
#include "pictureLimits.h"
#include "standardOutput.h"

namespace tool {
namespace {

/// What stands beside the pixels of a file is passed over and may be as much as the file holds.
constexpr RasterLimits kPngLimits = {kLargestSide, kLargestSide, kLargestPicture,
                                     UINT64_MAX,   UINT32_MAX,   UINT32_MAX};

struct Storage {
  uint32 depth;
  uint32 bpp;
};

Storage storageOf(uint32 code) {
  switch (code) {
    case 6:
    case 8:
      return {code, 8};
    case 15:
    case 16:
      return {code, 16};
    case 24:
      return {24, 24};
    default:
      return {24, 32};
  }
}

/// One channel of a one-byte colour.
struct Field {
  int shift;
  int bits;

  uint8 widened(uint32 value) const {
    const uint32 field = value >> shift & ((1u << bits) - 1);
    if (bits == 2) return static_cast<uint8>(field * 0x55);
    return static_cast<uint8>(field << 5 | field << 2 | field >> 1);
  }
};

std::array<uint32, 256> paletteWords(const ImageUtilImage& image) {
  std::array<uint32, 256> words;
  std::transform(std::begin(image.palette), std::end(image.palette), words.begin(),
                 [](const ImageUtilColor& color) {
                   return 0xFF000000u | uint32{color.red} << 16 | uint32{color.green} << 8 |
                          color.blue;
                 });
  return words;
}

std::string lowerCaseEnding(const std::string& path) {
  const size_t dot = path.rfind('.');
  if (dot == std::string::npos) return {};
  std::string ending = path.substr(dot + 1);
  for (char& letter : ending)
    letter = static_cast<char>(tolower(static_cast<unsigned char>(letter)));
  return ending;
}

/// A growable buffer that releases its bytes.
struct Buffer : DynBuf {
  Buffer() { DynBuf_Init(this); }
  ~Buffer() { DynBuf_Destroy(this); }
  Buffer(const Buffer&) = delete;
  Buffer& operator=(const Buffer&) = delete;
};

}  // namespace

Picture::Picture(uint32 width, uint32 height, uint32 code) {
  const Storage storage = storageOf(code);
  const uint64 pitch = (uint64{width} * (storage.bpp / 8) + 3) & ~uint64{3};
  const bool fits = height == 0 || pitch <= kLargestPicture / height;
  if (fits) record.data = static_cast<uint8*>(calloc(static_cast<size_t>(pitch * height) + 1, 1));
  if (record.data == nullptr)
    throw Failure("a picture of " + std::to_string(width) + "x" + std::to_string(height) +
                  " pixels is too large");
  record.width = width;
  record.height = height;
  record.depth = storage.depth;
  record.bpp = storage.bpp;
  record.bytesPerLine = static_cast<uint32>(pitch);
  if (storage.bpp == 8) describeLowDepth();
}

Picture& Picture::operator=(Picture&& from) noexcept {
  std::swap(record, from.record);
  return *this;
}

/// A palette that shows one-byte colours as the colours that they are.
void Picture::describeLowDepth() {
  const bool is222 = record.depth == 6;
  const Field red = is222 ? Field{4, 2} : Field{0, 3};
  const Field green = is222 ? Field{2, 2} : Field{3, 3};
  const Field blue = is222 ? Field{0, 2} : Field{6, 2};
  record.numColors = 256;
  for (uint32 value = 0; value < 256; ++value)
    record.palette[value] = {blue.widened(value), green.widened(value), red.widened(value), 0};
}

namespace {

/// The library reads colour and palettes at 8 bits and fewer. Of what stands beside the pixels it
/// keeps the palette, not its transparency.
bool isForLibrary(const PngFile& png, bool keepAlpha) {
  const bool isColor = png.colorType == kRgb || png.colorType == kRgba;
  return png.bitDepth <= 8 && (isColor || png.colorType == kPalette) &&
         !(keepAlpha && png.hasTransparency);
}

void checkExtent(const PngFile& png, const std::string& name) {
  if (isTooLarge(png))
    throw Failure(name + " is too large: " + std::to_string(png.width) + "x" +
                  std::to_string(png.height) + " pixels");
}

}  // namespace

bool isTransparent(const Picture& picture) {
  for (uint32 y = 0; y < picture.height(); ++y) {
    const uint8* row = picture.data() + size_t{picture.pitch()} * y;
    for (uint32 x = 0; x < picture.width(); ++x)
      if (row[4 * x + 3] != 0xFF) return true;
  }
  return false;
}

bool isTooLarge(const PngFile& png) {
  return png.height != 0 && uint64{png.width} * 4 > kLargestPicture / png.height;
}

Picture Picture::decode(const PngFile& png, const std::string& name, bool keepAlpha) {
  checkExtent(png, name);
  if (!isForLibrary(png, keepAlpha)) {
    Picture picture = decodeAnyPng(png, name);
    return keepAlpha && png.hasAlpha() ? std::move(picture) : picture.convertedTo(24);
  }
  Picture picture;
  char message[128];
  const uint32 flags = keepAlpha ? uint32{RASTER_CHECKED_KEEP_ALPHA} : 0;
  const RasterStatus status =
      RasterChecked_ReadPngBuffer(png.bytes.data(), png.bytes.size(), flags, &kPngLimits,
                                  &picture.record, message, sizeof message);
  if (status != RASTER_STATUS_OK)
    throw Failure("cannot read the picture " + name + " (" +
                  (message[0] != 0 ? message : RasterChecked_Text(status)) + ")");
  return picture;
}

Picture Picture::load(const std::string& path, bool keepAlpha) {
  InputStream input(path);
  return decode(readPng(input), input.name(), keepAlpha);
}

Picture Picture::loadAs(uint32 code, const std::string& path, bool keepAlpha) {
  Picture picture = load(path, keepAlpha);
  if (picture.code() == code && !picture.isIndexed()) return picture;
  return picture.convertedTo(code);
}

Picture Picture::convertedTo(uint32 code) const {
  Picture result(width(), height(), code);
  const std::array<uint32, 256> palette = paletteWords(record);
  Raster_ConvertPixels(result.data(), result.pitch(), static_cast<int32>(code), data(), pitch(),
                       static_cast<int32>(this->code()), isIndexed(), palette.data(), 0, 0, 0, 0,
                       width(), height());
  return result;
}

uint32 Picture::code() const { return Raster_GetBPPDepth(record.depth, record.bpp); }

Rect Picture::bounds() const {
  return {0, 0, static_cast<int32>(width()), static_cast<int32>(height())};
}

RasterView Picture::view() const {
  return {record.data, size_t{pitch()} * height(), pitch(), width(), height(), record.depth,
          record.bpp};
}

FileType typeFromName(const std::string& path, FileType given) {
  if (given != FileType::fromName) return given;
  if (isStandardOutput(path)) return FileType::png;
  const std::string ending = lowerCaseEnding(path);
  if (ending == "png") return FileType::png;
  if (ending == "bmp") return FileType::bmp;
  throw UsageError("'" + path + "' ends neither in .png nor in .bmp");
}

void save(const Picture& picture, const std::string& path, const SaveOptions& options) {
  const ImageUtilPNGWriteParams params = {options.compression, !options.keepAlpha};
  Buffer buffer;
  CaughtStandardError messages;
  const bool done = typeFromName(path, options.type) == FileType::bmp
                        ? ImageUtil_ConstructBMPBuffer(&picture.record, &buffer)
                        : ImageUtil_ConstructPNGBuffer(&picture.record, &params, &buffer);
  if (!done) throw Failure("cannot encode '" + path + "'" + messages.remark());
  writeOutput(path, buffer.data, buffer.size);
}

}  // namespace tool
