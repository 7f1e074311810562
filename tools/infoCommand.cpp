// SPDX-License-Identifier: MIT
//
// info: what a file is.

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <utility>
#include <vector>

#include "commands.h"
#include "picture.h"
#include "pngFile.h"
#include "rasterBlock.h"
#include "recording.h"

namespace tool {
namespace {

using live::RecordingReader;

uint32 littleEndian(const std::vector<uint8>& bytes, size_t at) {
  return uint32{bytes[at]} | uint32{bytes[at + 1]} << 8 | uint32{bytes[at + 2]} << 16 |
         uint32{bytes[at + 3]} << 24;
}

std::string counted(uint64 count, const char* what) {
  return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

/// A file of which the first bytes have been read.
struct File {
  InputStream& input;
  std::vector<uint8> start;
  std::string shown;
};

void describePng(File& file) {
  const PngFile png = readPng(file.input, std::move(file.start));
  std::string inMemory = "too large to be read";
  if (!isTooLarge(png)) {
    const Picture picture = Picture::decode(png, file.input.name(), true);
    const ImageUtilImage& record = picture.record;
    inMemory = "depth " + std::to_string(record.depth) + ", " + std::to_string(record.bpp) +
               " bits per pixel, " + std::to_string(record.bytesPerLine) + " bytes per line";
    if (record.numColors != 0) inMemory += ", " + counted(record.numColors, "colour");
  }
  printf("%s: PNG, %ux%u pixels, %s, %s per sample%s%s\n", file.shown.c_str(), png.width,
         png.height, colorTypeName(png.colorType), counted(png.bitDepth, "bit").c_str(),
         png.hasTransparency ? ", transparency" : "", png.isInterlaced ? ", interlaced" : "");
  printf("in memory: %s\n", inMemory.c_str());
}

/// The two kinds of headers that a BMP file begins with, by their size: OS/2's, and Windows' with
/// what later ones have added at the end.
constexpr size_t kBmpFileHeader = 14;
constexpr uint32 kOldBmpHeader = 12;
constexpr uint32 kBmpHeader = 40;

bool beginsBmp(const std::vector<uint8>& start) {
  if (start.size() < kBmpFileHeader + kOldBmpHeader || start[0] != 'B' || start[1] != 'M')
    return false;
  const uint32 header = littleEndian(start, 14);
  return header == kOldBmpHeader ||
         (header >= kBmpHeader && start.size() >= kBmpFileHeader + kBmpHeader);
}

struct BmpHeader {
  uint32 width;
  int32 height;  // below zero: the rows go from the top down
  uint32 bits;
  uint32 colors = 0;
  bool isCompressed = false;
};

BmpHeader bmpHeader(const std::vector<uint8>& start) {
  const auto word = [&](size_t at) { return littleEndian(start, at); };
  if (word(14) == kOldBmpHeader)
    return {word(18) & 0xFFFF, static_cast<int32>(word(18) >> 16), word(22) >> 16};
  return {word(18), static_cast<int32>(word(22)), word(26) >> 16, word(46), word(30) != 0};
}

void describeBmp(const File& file) {
  const BmpHeader bmp = bmpHeader(file.start);
  printf("%s: BMP, %ux%u pixels, %s", file.shown.c_str(), bmp.width,
         static_cast<uint32>(std::abs(int64{bmp.height})), counted(bmp.bits, "bit").c_str());
  printf(" per pixel");
  if (bmp.bits != 0 && bmp.bits <= 8)
    printf(", %s", counted(bmp.colors != 0 ? bmp.colors : 1u << bmp.bits, "colour").c_str());
  if (bmp.isCompressed) printf(", compressed");
  if (bmp.height < 0) printf(", top row first");
  printf("\n");
}

bool beginsBlock(const std::vector<uint8>& start) {
  try {
    blockHeader(start);
    return true;
  } catch (const Failure&) {
    return false;
  }
}

void describeBlock(File& file) {
  const BlockHeader header = blockHeader(file.start);
  unpackBlock(readBlock(file.input, std::move(file.start)));  // fails when it is not sound
  printf("%s: raster block, %ux%u pixels, %u bits per pixel, ", file.shown.c_str(), header.width,
         header.height, header.bpp);
  if (header.isCoded()) {
    printf("%s of code for %s of pixels\n", counted(header.codeWords, "word").c_str(),
           counted(uint64{header.pitch} * header.height, "byte").c_str());
  } else {
    printf("not compressed\n");
  }
}

bool beginsRecording(const std::vector<uint8>& start) {
  return RecordingReader(start.data(), start.size()).fault().empty();
}

/// What a recording comes to when it is played. One that breaks off is described up to there.
struct Played {
  uint64 updates = 0;
  uint64 microseconds = 0;
};

Played playAll(RecordingReader& reader) {
  Played played;
  while (const auto time = reader.nextTime()) {
    played = {played.updates + 1, *time};
    reader.drawNext();
  }
  return played;
}

std::string sizeOf(const RecordingReader& reader) {
  const live::PixelView picture = reader.picture();
  return std::to_string(picture.width) + "x" + std::to_string(picture.height);
}

void describeRecording(File& file) {
  constexpr uint64 kLargestRecording = uint64{1} << 32;
  const std::vector<uint8> bytes = readWhole(file.input, kLargestRecording, std::move(file.start));
  RecordingReader reader(bytes.data(), bytes.size());
  const std::string atFirst = sizeOf(reader);
  const Played played = playAll(reader);
  if (!reader.isAtEnd() && !reader.isBrokenOff())
    throw Failure(file.input.name() + ": " + reader.fault());
  const std::string atLast = sizeOf(reader);
  printf("%s: recording, %s pixels, %s in %.3f seconds", file.shown.c_str(), atFirst.c_str(),
         counted(played.updates, "update").c_str(), static_cast<double>(played.microseconds) / 1e6);
  if (atLast != atFirst) printf(", at last %s pixels", atLast.c_str());
  if (reader.isBrokenOff()) printf(", broken off within an update");
  printf("\n");
}

int showInfo(const std::string& path) {
  constexpr size_t kEnoughToTell = 54;
  InputStream input(path);
  File file = {input, {}, path == "-" ? input.name() : path};
  input.append(file.start, kEnoughToTell);
  if (beginsPng(file.start)) {
    describePng(file);
  } else if (beginsBmp(file.start)) {
    describeBmp(file);
  } else if (beginsBlock(file.start)) {
    describeBlock(file);
  } else if (beginsRecording(file.start)) {
    describeRecording(file);
  } else {
    throw Failure(input.name() +
                  " is not a PNG picture, a BMP picture, a raster block or a recording");
  }
  return kSuccess;
}

}  // namespace

void addInfoCommand(Commands& commands) {
  auto path = std::make_shared<std::string>();
  Command command = commands.add("info", "Says what a picture, a raster block or a recording is.",
                                 [path] { return showInfo(*path); });
  command.add("FILE", *path, "a PNG or BMP picture, a raster block or a recording").required();
}

}  // namespace tool
