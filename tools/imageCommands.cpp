// SPDX-License-Identifier: MIT
//
// info, convert, combine: pictures as files.

#include <algorithm>
#include <cstdio>
#include <memory>
#include <vector>

#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "picture.h"
#include "pngHeader.h"

namespace tool {
namespace {

int showInfo(const std::string& path) {
  const PngHeader header = readPngHeader(path);
  printf("%s: PNG, %ux%u pixels, %s, %u bits per sample%s\n", path.c_str(), header.width,
         header.height, colourTypeName(header.colourType), header.bitDepth,
         header.interlaced ? ", interlaced" : "");
  const Picture picture = Picture::load(path, true);
  printf("in memory: depth %u, %u bits per pixel, %u bytes per line", picture.record.depth,
         picture.record.bpp, picture.pitch());
  if (picture.record.numColors != 0) printf(", %u colours", picture.record.numColors);
  printf("\n");
  return kSuccess;
}

void addInfo(Commands& commands) {
  auto path = std::make_shared<std::string>();
  CLI::App* command =
      commands.add("info", "Says what a PNG picture is.", [path] { return showInfo(*path); });
  command->add_option("FILE", *path, "a PNG picture")->required();
}

struct ConvertOptions {
  std::string input;
  OutputOptions output;
  uint32 code = 0;
};

int convert(const ConvertOptions& options) {
  Picture picture = Picture::load(options.input, options.output.keepAlpha);
  if (options.code != 0) picture = picture.convertedTo(options.code);
  save(picture, options.output.path, options.output.forSave());
  return kSuccess;
}

void addConvert(Commands& commands) {
  auto options = std::make_shared<ConvertOptions>();
  CLI::App* command = commands.add("convert", "Writes a PNG picture as PNG or BMP.",
                                   [options] { return convert(*options); });
  command->add_option("IN", options->input, "a PNG picture")->required();
  options->output.addTo(command);
  options->output.addEncodingTo(command);
  addDepth(command, options->code, {8, 15, 16, 24, 32},
           "the pixel format that the picture goes through");
}

struct PlacedFile {
  std::string path;
  Point at;
};

/// FILE@X,Y; the last at-sign counts.
PlacedFile parsePlacedFile(const std::string& text) {
  const size_t sign = text.rfind('@');
  if (sign == std::string::npos || sign == 0)
    throw CLI::ValidationError("'" + text + "' is not of the form FILE@X,Y");
  return {text.substr(0, sign), parsePoint(text.substr(sign + 1))};
}

/// The library adds up areas and sides in 32 bits; stay far below.
void checkExtent(const std::vector<ImageUtilImage>& records, const std::vector<int32>& positions) {
  Rect bounds = {};
  for (size_t i = 0; i < records.size(); ++i) {
    Rect placed;
    if (!Rect_SetFromXYWH(&placed, positions[2 * i], positions[2 * i + 1],
                          static_cast<int32>(records[i].width),
                          static_cast<int32>(records[i].height)))
      throw Failure("a position is out of range");
    Rect_Union(&bounds, &placed);
  }
  const int64 width = int64{bounds.right} - bounds.left;
  const int64 height = int64{bounds.bottom} - bounds.top;
  constexpr int64 kMostPixels = 1 << 28;
  if (width > kMostPixels || height > kMostPixels || width * height > kMostPixels)
    throw Failure("the combined picture would be too large");
}

int combine(const OutputOptions& output, const std::vector<std::string>& inputs) {
  std::vector<PlacedFile> files(inputs.size());
  std::transform(inputs.begin(), inputs.end(), files.begin(), parsePlacedFile);
  std::vector<Picture> pictures;
  std::vector<ImageUtilImage> records;
  std::vector<int32> positions;
  for (const PlacedFile& file : files) {
    pictures.push_back(Picture::loadAs(24, file.path));  // one format for all of them
    records.push_back(pictures.back().record);
    positions.insert(positions.end(), {file.at.x, file.at.y});
  }
  checkExtent(records, positions);
  Picture result;
  if (!ImageUtil_Combine(records.data(), positions.data(), static_cast<uint32>(records.size()),
                         &result.record))
    throw Failure("the combined picture is too large");
  SaveOptions saving = output.forSave();
  saving.keepAlpha = result.record.bpp == 32;  // gaps are transparent
  save(result, output.path, saving);
  return kSuccess;
}

void addCombine(Commands& commands) {
  auto output = std::make_shared<OutputOptions>();
  auto inputs = std::make_shared<std::vector<std::string>>();
  CLI::App* command = commands.add(
      "combine",
      "Lays pictures out in one. Later ones cover earlier ones; gaps are transparent in a PNG.",
      [output, inputs] { return combine(*output, *inputs); });
  output->addTo(command);
  command->add_option("PICTURES", *inputs, "a PNG picture and where its top left corner goes")
      ->required()
      ->type_name("FILE@X,Y");
}

}  // namespace

void addImageCommands(Commands& commands) {
  addInfo(commands);
  addConvert(commands);
  addCombine(commands);
}

}  // namespace tool
