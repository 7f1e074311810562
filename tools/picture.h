// SPDX-License-Identifier: MIT
//
// Pictures in memory: an image record of the library that owns its pixels, read from a PNG file,
// brought into the pixel format that a command works in, and written as PNG or BMP.

#ifndef RASTER_TOOLS_PICTURE_H
#define RASTER_TOOLS_PICTURE_H

#include <string>

#include "imageUtil.h"
#include "rasterChecked.h"
#include "rect.h"

namespace tool {

struct PngFile;

/// The codes of the pixel formats: 6 and 8 are one byte of colour, 15 and 16 two, 24 three, 32
/// four.
class Picture {
 public:
  Picture() = default;
  /// A black picture. Fails when it would be too large.
  Picture(uint32 width, uint32 height, uint32 code);
  ~Picture() { ImageUtil_FreeImageData(&record); }
  Picture(Picture&& from) noexcept : record(from.record) { from.record.data = nullptr; }
  Picture& operator=(Picture&& from) noexcept;

  /// Reads a PNG file ("-": standard input); its colours are indices into a palette, or code 24,
  /// or code 32 when it has alpha that is to be kept.
  static Picture load(const std::string& path, bool keepAlpha = false);
  /// The same of a file that has been read; messages call it `name`.
  static Picture decode(const PngFile& png, const std::string& name, bool keepAlpha = false);
  /// Reads a PNG file and brings it into a format.
  static Picture loadAs(uint32 code, const std::string& path, bool keepAlpha = false);

  Picture convertedTo(uint32 code) const;

  uint32 code() const;
  uint32 width() const { return record.width; }
  uint32 height() const { return record.height; }
  uint32 pitch() const { return record.bytesPerLine; }
  uint32 bytesPerPixel() const { return record.bpp / 8; }
  uint8* data() { return record.data; }  // NOLINT(readability-make-member-function-const)
  const uint8* data() const { return record.data; }
  Rect bounds() const;
  /// Its memory, for the checked functions.
  RasterView view() const;

  ImageUtilImage record = {};

 private:
  bool isIndexed() const { return record.bpp == 8; }
  void describeLowDepth();
};

/// Whether a picture of code 32 has pixels that are not opaque.
bool isTransparent(const Picture& picture);

/// Whether a picture has more pixels than this program takes.
bool isTooLarge(const PngFile& png);

enum class FileType { fromName, png, bmp };

struct SaveOptions {
  FileType type = FileType::fromName;
  int compression = -1;
  bool keepAlpha = false;
};

/// The type that a path's ending names; PNG for standard output, a usage error when it names none.
FileType typeFromName(const std::string& path, FileType given = FileType::fromName);

void save(const Picture& picture, const std::string& path, const SaveOptions& options = {});

}  // namespace tool

#endif
