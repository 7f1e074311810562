// SPDX-License-Identifier: MIT
//
// A host may define Log, Warning, Panic or a function of FileIO itself: its definition is then used
// in place of the library's, by the utility library and by the raster library.

#include <gtest/gtest.h>

#include <csetjmp>
#include <csignal>
#include <cstdarg>
#include <cstdio>
#include <filesystem>
#include <string>

#include "fileIO.h"
#include "imageUtil.h"
#include "message.h"
#include "raster.h"
#include "utilAlloc.h"

namespace {

std::string heard;
bool panicReturns = false;
jmp_buf afterPanic;
int writes = 0;
size_t writtenBytes = 0;

void hear(const char* kind, const char* format, va_list arguments) {
  char text[500];
  vsnprintf(text, sizeof text, format, arguments);
  heard += std::string(kind) + ": " + text;
}

}  // namespace

// The host's own. Its Panic may return, against the declaration, so it stands under another name.
extern "C" {
void hostPanic(const char* format, ...) __asm__("Panic");

void Log(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  hear("log", format, arguments);
  va_end(arguments);
}

void Warning(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  hear("warning", format, arguments);
  va_end(arguments);
}

void hostPanic(const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  hear("panic", format, arguments);
  va_end(arguments);
  if (!panicReturns) longjmp(afterPanic, 1);
}

FileIOResult FileIO_Write(const FileIODescriptor* /*file*/, const void* /*bytes*/, size_t size,
                          size_t* actual) {
  ++writes;
  writtenBytes = size;
  if (actual != nullptr) *actual = size;
  return FILEIO_SUCCESS;
}

}  // extern "C"

namespace {

/// A picture of one pixel.
ImageUtilImage onePixel(uint8* pixel) {
  ImageUtilImage image = {};
  image.width = 1;
  image.height = 1;
  image.depth = 24;
  image.bpp = 32;
  image.bytesPerLine = 4;
  image.data = pixel;
  return image;
}

TEST(Interposition, TakesTheHostsWarningAndPanicForTheRasterLibrary) {
  heard.clear();
  if (setjmp(afterPanic) == 0) Raster_RectFill(nullptr, 0, 5, 0, 0, 0, 0, 0);
  EXPECT_TRUE(
      heard.starts_with("warning: Raster: Unsupported frame buffer depth\n"
                        "panic: NOT_IMPLEMENTED lib/raster/rasterops:"))
      << heard;
}

TEST(Interposition, TakesTheHostsPanicForTheUtilityLibrary) {
  heard.clear();
  static volatile size_t tooMuch = SIZE_MAX / 16 * 15;
  if (setjmp(afterPanic) == 0) UtilSafeMalloc0(tooMuch);
  EXPECT_EQ(heard, "panic: Out of memory: " + std::to_string(tooMuch) + " bytes\n");
}

TEST(InterpositionDeathTest, EndsInATrapWhenTheHostsPanicReturns) {
  panicReturns = true;
  static volatile size_t tooMuch = SIZE_MAX / 16 * 15;
  EXPECT_EXIT(Raster_RectFill(nullptr, 0, 5, 0, 0, 0, 0, 0), testing::KilledBySignal(SIGILL), "");
  EXPECT_EXIT(UtilSafeMalloc0(tooMuch), testing::KilledBySignal(SIGILL), "");
  EXPECT_EXIT(UtilSafeCalloc0(tooMuch, 16), testing::KilledBySignal(SIGILL), "");
  panicReturns = false;
}

TEST(Interposition, TakesTheHostsLogForTheRasterLibrary) {
  heard.clear();
  uint8 pixel[4] = {};
  const ImageUtilImage image = onePixel(pixel);
  EXPECT_FALSE(ImageUtil_WriteImage(&image, "/no such folder/picture.bmp", 1));
  EXPECT_EQ(heard,
            "log: ImageUtilWriteBuf: Failed open file '/no such folder/picture.bmp': "
            "File not found (2)\n");
}

TEST(Interposition, TakesTheHostsFileWriteForTheRasterLibrary) {
  writes = 0;
  uint8 pixel[4] = {};
  const ImageUtilImage image = onePixel(pixel);
  const std::string path =
      (std::filesystem::temp_directory_path() / "interpositionTest.bmp").string();
  EXPECT_TRUE(ImageUtil_WriteImage(&image, path.c_str(), 1));
  EXPECT_EQ(writes, 1);
  EXPECT_EQ(writtenBytes, 14u + 40 + 4);
  EXPECT_EQ(std::filesystem::file_size(path), 0u);  // the host wrote nothing
  std::filesystem::remove(path);
}

}  // namespace
