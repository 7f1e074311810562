// SPDX-License-Identifier: MIT
//
// scale, crop.

#include <memory>
#include <optional>
#include <utility>

#include "commands.h"
#include "drawing.h"
#include "geometry.h"
#include "imageOptions.h"
#include "picture.h"
#include "raster.h"

namespace tool {
namespace {

constexpr uint32 kLargestScaledSide = 32767;

struct ScaleOptions {
  std::string input;
  OutputOptions output;
  SizeRequest size;
  bool nearest = false;
};

void checkSides(uint32 width, uint32 height) {
  if (width > kLargestScaledSide || height > kLargestScaledSide)
    throw Failure("no side of a scaled picture may be over " + std::to_string(kLargestScaledSide) +
                  " pixels");
}

/// Colours are smoothed by as much as they are seen, or those of transparent pixels would show.
template <class Resize> Picture smoothed(Picture picture, Resize resize) {
  premultiply(picture);
  Picture result = resize(picture);
  unpremultiply(result);
  return result;
}

Picture resized(const Picture& picture, const Size& size, bool nearest) {
  Picture result(size.width, size.height, 32);
  const bool done =
      Raster_Scale(result.data(), result.pitch(), 32, 24, size.width, size.height, 0, 0, 0,
                   static_cast<int32>(size.width), static_cast<int32>(size.height), picture.data(),
                   static_cast<int32>(picture.pitch()), 32, 24, 0, picture.width(),
                   picture.height(), 0, double{1} * size.width / picture.width(),
                   double{1} * size.height / picture.height(), nearest ? 0 : 1);
  if (!done) throw Failure("the factors are out of range");
  return result;
}

int scale(const ScaleOptions& options) {
  options.output.forSave();
  Picture picture = Picture::load(options.input, !options.output.noAlpha);
  const bool hasAlpha = picture.code() == 32;
  if (!hasAlpha) picture = picture.convertedTo(32);
  const Size size = options.size.of({picture.width(), picture.height()});
  checkSides(picture.width(), picture.height());
  checkSides(size.width, size.height);
  const auto resize = [&](const Picture& from) { return resized(from, size, options.nearest); };
  Picture result = options.nearest ? resize(picture) : smoothed(std::move(picture), resize);
  if (!hasAlpha) result = result.convertedTo(24);
  options.output.saveWithAlpha(result);
  return kSuccess;
}

/// The arguments and options of a command that makes a picture of another one.
void addPictures(OptionList& command, std::string& input, OutputOptions& output) {
  command.add("IN", input, "a PNG picture").required();
  output.addTo(command);
  output.addAlphaTo(command);
}

void addScale(Commands& commands) {
  auto options = std::make_shared<ScaleOptions>();
  Command command = commands.add("scale", "Enlarges or reduces a picture.",
                                 [options] { return scale(*options); });
  addPictures(command, options->input, options->output);
  command
      .addParsed("SIZE", options->size, parseSizeRequest, "SIZE",
                 "the new size: WxH, Wx or xH to keep the sides' ratio, a factor, or a percentage")
      .required();
  command.addFlag("--nearest", options->nearest, "repeat or drop pixels instead of smoothing");
}

struct CropOptions {
  std::string input;
  OutputOptions output;
  Rect region = {};
  std::optional<SizeRequest> size;
};

/// A part of a picture of colours, of which the library makes a record of its own.
Picture cropped(const Picture& picture, const Rect& region, const Size& size) {
  Picture result;
  if (!ImageUtil_CropAndScaleImage(&picture.record, region.left, region.top, region.right,
                                   region.bottom, 0, 0, static_cast<int32>(size.width),
                                   static_cast<int32>(size.height), &result.record))
    throw Failure("the picture cannot be cropped to " + regionText(region));
  return result;
}

int crop(const CropOptions& options) {
  options.output.forSave();
  Picture picture = Picture::load(options.input, !options.output.noAlpha);
  if (picture.record.bpp == 8) picture = picture.convertedTo(24);  // a crop has no palette
  const Rect bounds = picture.bounds();
  if (!Rect_ContainsRect(&bounds, &options.region))
    throw Failure(regionText(options.region) + " does not lie within the picture of " +
                  regionText(bounds));
  const Size part = {widthOf(options.region), heightOf(options.region)};
  const Size size = options.size ? options.size->of(part) : part;
  checkSides(part.width, part.height);
  checkSides(size.width, size.height);
  const auto cut = [&](const Picture& from) { return cropped(from, options.region, size); };
  const bool isSmoothed = options.size && picture.code() == 32;
  options.output.saveWithAlpha(isSmoothed ? smoothed(std::move(picture), cut) : cut(picture));
  return kSuccess;
}

void addCrop(Commands& commands) {
  auto options = std::make_shared<CropOptions>();
  Command command =
      commands.add("crop", "Cuts a rectangle out of a picture, and scales it if so asked.",
                   [options] { return crop(*options); });
  addPictures(command, options->input, options->output);
  command
      .addParsed("REGION", options->region, parseRegion, "WxH[+X+Y]",
                 "the part to keep; without +X+Y at the top left corner")
      .required();
  command.addParsed("--scale", options->size, parseSizeRequest, "SIZE",
                    "the size to scale it to: WxH, Wx, xH, a factor or a percentage");
}

}  // namespace

void addScaleCommands(Commands& commands) {
  addScale(commands);
  addCrop(commands);
}

}  // namespace tool
