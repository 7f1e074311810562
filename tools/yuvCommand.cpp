// SPDX-License-Identifier: MIT
//
// yuv: frames of raw video as pictures.

#include <cstdio>
#include <memory>
#include <optional>
#include <vector>

#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "numbers.h"
#include "outputFile.h"
#include "picture.h"
#include "progress.h"
#include "raster.h"

namespace tool {
namespace {

struct Layout {
  const char* name;
  uint32 code;
  uint64 (*frameSize)(uint64 width, uint64 height);
};

uint64 packedSize(uint64 width, uint64 height) { return height * 2 * ((width + 1) & ~uint64{1}); }

uint64 planarSize(uint64 width, uint64 height) {
  const uint64 chroma = ((width + 1) / 2) * ((height + 1) / 2);
  return ((width + 1) & ~uint64{1}) * ((height + 1) & ~uint64{1}) + 2 * chroma;
}

constexpr Layout kLayouts[] = {{"YUY2", RASTER_VIDEO_YUY2, packedSize},
                               {"UYVY", RASTER_VIDEO_UYVY, packedSize},
                               {"YV12", RASTER_VIDEO_YV12, planarSize}};

const Layout& layoutOfName(const std::string& name) {
  for (const Layout& layout : kLayouts)
    if (name == layout.name) return layout;
  throw CLI::ValidationError("there is no frame layout '" + name + "'");
}

struct YuvOptions {
  std::string input;
  OutputOptions output;
  std::string layout;
  Size size = {};
  uint32 code = 32;
  uint64 frame = 0;
  bool all = false;
};

/// The video conversion has its 5-5-5 fields one bit higher than every other function.
void lowerFields(std::vector<uint8>& pixels) {
  for (size_t i = 0; i + 1 < pixels.size(); i += 2) {
    const uint32 pixel = (uint32{pixels[i]} | uint32{pixels[i + 1]} << 8) >> 1;
    pixels[i] = static_cast<uint8>(pixel);
    pixels[i + 1] = static_cast<uint8>(pixel >> 8);
  }
}

Picture decodeFrame(const YuvOptions& options, const uint8* frame) {
  Picture picture(options.size.width, options.size.height, options.code);
  const uint32 rowBytes = picture.width() * picture.bytesPerPixel();
  std::vector<uint8> rows(size_t{rowBytes} * picture.height());
  Raster_YUVtoRGB(frame, rows.data(), picture.width(), picture.height(),
                  layoutOfName(options.layout).code, static_cast<int32>(options.code));
  if (options.code == 15) lowerFields(rows);
  Raster_RectCopy(picture.data(), picture.pitch(), rows.data(), rowBytes, picture.bytesPerPixel(),
                  0, 0, 0, 0, picture.width(), picture.height());
  return picture;
}

/// shot.png becomes shot-0007.png.
std::string numberedPath(const std::string& path, uint64 number) {
  char digits[32];
  snprintf(digits, sizeof digits, "-%04llu", static_cast<unsigned long long>(number));
  const size_t slash = path.rfind('/');
  const size_t dot = path.rfind('.');
  const bool hasEnding = dot != std::string::npos && (slash == std::string::npos || dot > slash);
  std::string numbered = path;
  return numbered.insert(hasEnding ? dot : path.size(), digits);
}

int convertFrames(const YuvOptions& options) {
  const SaveOptions saving = options.output.forSave();
  const Layout& layout = layoutOfName(options.layout);
  const uint64 frameSize = layout.frameSize(options.size.width, options.size.height);
  const std::vector<uint8> video = readFile(options.input);
  const uint64 frames = video.size() / frameSize;
  const uint64 first = options.all ? 0 : options.frame;
  const uint64 end = options.all ? frames : first + 1;
  if (frames == 0 || end > frames)
    throw Failure("'" + options.input + "' holds " + std::to_string(frames) + " whole frames of " +
                  std::to_string(frameSize) + " bytes" +
                  (options.all ? "" : ", not one of number " + std::to_string(first)));
  Progress progress("frames", frames);
  for (uint64 number = first; number < end; ++number) {
    const Picture picture =
        decodeFrame(options, video.data() + static_cast<size_t>(number * frameSize));
    save(picture, options.all ? numberedPath(options.output.path, number) : options.output.path,
         saving);
    progress.show(number + 1);
  }
  return kSuccess;
}

Size parseFrameSize(const std::string& text) {
  constexpr uint32 kLargestSide = 16384;
  const Size size = parseSize(text);
  if (size.width > kLargestSide || size.height > kLargestSide)
    throw CLI::ValidationError("no side of a frame may be over " + std::to_string(kLargestSide));
  return size;
}

}  // namespace

void addYuvCommand(Commands& commands) {
  auto options = std::make_shared<YuvOptions>();
  CLI::App* command = commands.add("yuv", "Converts frames of raw video to pictures.",
                                   [options] { return convertFrames(*options); });
  command->add_option("IN", options->input, "frames of raw video, one after the other")->required();
  options->output.addPathTo(command);
  std::vector<std::string> names;
  for (const Layout& layout : kLayouts) names.emplace_back(layout.name);
  command->add_option("--format", options->layout, "how a frame lies in memory")
      ->required()
      ->check(CLI::IsMember(names));
  addParsed(command, "--size", options->size, parseFrameSize, "WxH", "pixels of a frame")
      ->required();
  addDepth(command, options->code, {15, 16, 24, 32}, "the pixel format to convert to")
      ->capture_default_str();
  CLI::Option* frame =
      command->add_option("--frame", options->frame, "the number of the frame, from 0")
          ->check(count(0, UINT64_MAX));
  command->add_flag("--all", options->all, "every frame: OUT gets a number before its ending")
      ->excludes(frame);
}

}  // namespace tool
