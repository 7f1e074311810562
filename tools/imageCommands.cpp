// SPDX-License-Identifier: MIT
//
// convert, combine: pictures as files.

#include <algorithm>
#include <memory>
#include <vector>

#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "picture.h"

namespace tool {
namespace {

struct ConvertOptions {
  std::string input;
  OutputOptions output;
  uint32 code = 0;
};

int convert(const ConvertOptions& options) {
  const bool isNarrow = options.code != 0 && options.code != 32;
  if (isNarrow) options.output.refuseToKeepAlphaOf(options.code);
  options.output.forSave();
  Picture picture = Picture::load(options.input, !options.output.noAlpha);
  const bool hadAlpha = picture.code() == 32 && isTransparent(picture);
  if (options.code != 0) picture = picture.convertedTo(options.code);
  options.output.saveWithAlpha(picture);
  if (hadAlpha && isNarrow)
    note("pixels of --depth " + std::to_string(options.code) +
         " keep no alpha: all pixels became opaque");
  return kSuccess;
}

void addConvert(Commands& commands) {
  auto options = std::make_shared<ConvertOptions>();
  Command command = commands.add("convert", "Writes a PNG picture as PNG or BMP.",
                                 [options] { return convert(*options); });
  command.add("IN", options->input, "a PNG picture").required();
  options->output.addTo(command);
  options->output.addCompressionTo(command);
  options->output.addAlphaTo(command);
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
    throw UsageError("'" + text + "' is not of the form FILE@X,Y");
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
  output.forSave();
  std::vector<PlacedFile> files(inputs.size());
  std::transform(inputs.begin(), inputs.end(), files.begin(), parsePlacedFile);
  std::vector<Picture> pictures;
  std::vector<ImageUtilImage> records;
  std::vector<int32> positions;
  bool hasAlpha = false;
  for (const PlacedFile& file : files) {
    pictures.push_back(Picture::load(file.path, !output.noAlpha));
    hasAlpha |= pictures.back().code() == 32;
    positions.insert(positions.end(), {file.at.x, file.at.y});
  }
  for (Picture& picture : pictures) {
    picture = picture.convertedTo(hasAlpha ? 32 : 24);  // one format for all of them
    records.push_back(picture.record);
  }
  checkExtent(records, positions);
  Picture result;
  if (!ImageUtil_Combine(records.data(), positions.data(), static_cast<uint32>(records.size()),
                         &result.record))
    throw Failure("the combined picture is too large");
  output.saveWithAlpha(result);  // gaps are transparent
  return kSuccess;
}

void addCombine(Commands& commands) {
  auto output = std::make_shared<OutputOptions>();
  auto inputs = std::make_shared<std::vector<std::string>>();
  Command command = commands.add(
      "combine",
      "Lays pictures out in one. Later ones cover earlier ones; gaps are transparent in a PNG.",
      [output, inputs] { return combine(*output, *inputs); });
  output->addTo(command);
  output->addAlphaTo(command);
  command.add("PICTURES", *inputs, "a PNG picture and where its top left corner goes")
      .required()
      .form("FILE@X,Y");
}

}  // namespace

void addImageCommands(Commands& commands) {
  addConvert(commands);
  addCombine(commands);
}

}  // namespace tool
