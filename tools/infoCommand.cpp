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

namespace tool {
namespace {

uint32 littleEndian(const std::vector<uint8>& bytes, size_t at) {
  return uint32{bytes[at]} | uint32{bytes[at + 1]} << 8 | uint32{bytes[at + 2]} << 16 |
         uint32{bytes[at + 3]} << 24;
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
    if (record.numColors != 0) inMemory += ", " + std::to_string(record.numColors) + " colours";
  }
  printf("%s: PNG, %ux%u pixels, %s, %u bits per sample%s%s\n", file.shown.c_str(), png.width,
         png.height, colourTypeName(png.colourType), png.bitDepth,
         png.hasTransparency ? ", transparency" : "", png.isInterlaced ? ", interlaced" : "");
  printf("in memory: %s\n", inMemory.c_str());
}

bool beginsBmp(const std::vector<uint8>& start) {
  constexpr size_t kHeaders = 14 + 40;
  constexpr uint32 kSmallestInfo = 40;
  return start.size() >= kHeaders && start[0] == 'B' && start[1] == 'M' &&
         littleEndian(start, 14) >= kSmallestInfo;
}

/// A height below zero says that the rows go from the top down.
void describeBmp(const File& file) {
  const auto height = static_cast<int32>(littleEndian(file.start, 22));
  const uint32 bits = littleEndian(file.start, 28) & 0xFFFF;
  const uint32 colours = littleEndian(file.start, 46);
  printf("%s: BMP, %ux%u pixels, %u bits per pixel", file.shown.c_str(),
         littleEndian(file.start, 18), static_cast<uint32>(std::abs(int64{height})), bits);
  if (bits <= 8) printf(", %u colours", colours != 0 ? colours : 1u << bits);
  if (littleEndian(file.start, 30) != 0) printf(", compressed");
  if (height < 0) printf(", top row first");
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
    printf("%u words of code for %llu bytes of pixels\n", header.codeWords,
           static_cast<unsigned long long>(header.pitch) * header.height);
  } else {
    printf("not compressed\n");
  }
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
  } else {
    throw Failure(input.name() + " is not a PNG picture, a BMP picture or a raster block");
  }
  return kSuccess;
}

}  // namespace

void addInfoCommand(Commands& commands) {
  auto path = std::make_shared<std::string>();
  CLI::App* command = commands.add("info", "Says what a picture or a raster block is.",
                                   [path] { return showInfo(*path); });
  command->add_option("FILE", *path, "a PNG or BMP picture or a raster block")->required();
}

}  // namespace tool
