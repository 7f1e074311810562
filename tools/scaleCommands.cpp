// SPDX-License-Identifier: MIT
//
// scale, crop.

#include <charconv>
#include <memory>
#include <optional>

#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "picture.h"
#include "raster.h"

namespace tool {
namespace {

constexpr uint32 kLargestSide = 32767;

struct ScaleOptions {
  std::string input;
  OutputOptions output;
  std::string size;
  bool nearest = false;
};

/// WxH, or a factor.
Size scaledSize(const std::string& text, const Picture& picture) {
  if (text.find('x') != std::string::npos) return parseSize(text);
  double factor = 0;
  const char* end = text.data() + text.size();
  const auto [next, error] = std::from_chars(text.data(), end, factor);
  if (error != std::errc() || next != end || !(factor > 0) || factor > kLargestSide)
    throw CLI::ValidationError("'" + text + "' is neither of the form WxH nor a factor above 0");
  const auto scaled = [factor](uint32 side) {
    return side * factor < 1 ? 1u : static_cast<uint32>(side * factor);
  };
  return {scaled(picture.width()), scaled(picture.height())};
}

void checkSides(uint32 width, uint32 height) {
  if (width > kLargestSide || height > kLargestSide)
    throw Failure("no side of a scaled picture may be over " + std::to_string(kLargestSide) +
                  " pixels");
}

int scale(const ScaleOptions& options) {
  const SaveOptions saving = options.output.forSave();
  const Picture picture = Picture::loadAs(32, options.input);
  const Size size = scaledSize(options.size, picture);
  checkSides(picture.width(), picture.height());
  checkSides(size.width, size.height);
  Picture result(size.width, size.height, 32);
  const bool done =
      Raster_Scale(result.data(), result.pitch(), 32, 24, size.width, size.height, 0, 0, 0,
                   static_cast<int32>(size.width), static_cast<int32>(size.height), picture.data(),
                   static_cast<int32>(picture.pitch()), 32, 24, 0, picture.width(),
                   picture.height(), 0, double{1} * size.width / picture.width(),
                   double{1} * size.height / picture.height(), options.nearest ? 0 : 1);
  if (!done) throw Failure("the factors are out of range");
  save(result, options.output.path, saving);
  return kSuccess;
}

void addScale(Commands& commands) {
  auto options = std::make_shared<ScaleOptions>();
  CLI::App* command = commands.add("scale", "Enlarges or reduces a picture.",
                                   [options] { return scale(*options); });
  command->add_option("IN", options->input, "a PNG picture")->required();
  options->output.addTo(command);
  command->add_option("SIZE", options->size, "the new size, or a factor")
      ->required()
      ->type_name("WxH|FACTOR");
  command->add_flag("--nearest", options->nearest, "repeat or drop pixels instead of smoothing");
}

struct CropOptions {
  std::string input;
  OutputOptions output;
  Rect region = {};
  std::optional<Size> size;
};

int crop(const CropOptions& options) {
  const SaveOptions saving = options.output.forSave();
  Picture picture = Picture::load(options.input);
  if (picture.record.bpp == 8) picture = picture.convertedTo(24);  // a crop has no palette
  const Rect bounds = picture.bounds();
  if (!Rect_ContainsRect(&bounds, &options.region))
    throw Failure(regionText(options.region) + " does not lie within the picture of " +
                  regionText(bounds));
  const Size size = options.size.value_or(Size{widthOf(options.region), heightOf(options.region)});
  checkSides(widthOf(options.region), heightOf(options.region));
  checkSides(size.width, size.height);
  Picture result;
  if (!ImageUtil_CropAndScaleImage(&picture.record, options.region.left, options.region.top,
                                   options.region.right, options.region.bottom, 0, 0,
                                   static_cast<int32>(size.width), static_cast<int32>(size.height),
                                   &result.record))
    throw Failure("the picture cannot be cropped to " + regionText(options.region));
  save(result, options.output.path, saving);
  return kSuccess;
}

void addCrop(Commands& commands) {
  auto options = std::make_shared<CropOptions>();
  CLI::App* command =
      commands.add("crop", "Cuts a rectangle out of a picture, and scales it if so asked.",
                   [options] { return crop(*options); });
  command->add_option("IN", options->input, "a PNG picture")->required();
  options->output.addTo(command);
  addParsed(command, "REGION", options->region, parseRegion, "WxH+X+Y", "the part to keep")
      ->required();
  addParsed(command, "--scale", options->size, parseSize, "WxH", "the size to scale it to");
}

}  // namespace

void addScaleCommands(Commands& commands) {
  addScale(commands);
  addCrop(commands);
}

}  // namespace tool
