// SPDX-License-Identifier: MIT
//
// yuv: frames of uncompressed video as pictures.

#include <cstdio>
#include <memory>
#include <optional>
#include <vector>

#include "commands.h"
#include "geometry.h"
#include "imageOptions.h"
#include "inputStream.h"
#include "numbers.h"
#include "picture.h"
#include "progress.h"
#include "standardOutput.h"
#include "videoFrames.h"

namespace tool {
namespace {

struct YuvOptions {
  std::string input;
  OutputOptions output;
  std::string layout;
  bool libraryOrder = false;
  std::optional<Size> size;
  uint32 code = 32;
  uint64 frame = 0;
  bool all = false;
};

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

/// A file that begins as YUV4MPEG2 files do says all that raw video has to be told about.
FrameReader readerFor(const YuvOptions& options, InputStream& input) {
  if (options.layout.empty() && !options.size) return FrameReader(input);
  if (options.input.ends_with(".y4m"))
    throw UsageError(
        "a .y4m file says its format and size itself: leave --format and "
        "--size out");
  if (options.layout.empty() || !options.size)
    throw UsageError("raw video needs both --format and --size");
  return {input, videoLayout(options.layout, options.libraryOrder), *options.size};
}

[[noreturn]] void noSuchFrame(const InputStream& input, const FrameReader& frames) {
  const uint64 bytes = frameBytes(frames.layout(), frames.size());
  const uint64 count = frames.total().value_or(frames.position());
  throw Failure(input.name() + " holds " + std::to_string(count) + " whole frames of " +
                std::to_string(bytes) + " bytes");
}

int convertFrames(const YuvOptions& options) {
  const SaveOptions saving = options.output.forSave();
  if (!options.layout.empty()) videoLayout(options.layout, options.libraryOrder);
  InputStream input(options.input);
  FrameReader frames = readerFor(options, input);
  const uint64 first = options.all ? 0 : options.frame;
  std::vector<uint8> frame;
  if (!frames.goTo(first) || !frames.read(frame)) noSuchFrame(input, frames);
  Progress progress("frames", frames.total().value_or(0));
  const bool isNumbered = options.all && !isStandardOutput(options.output.path);
  do {
    const uint64 number = frames.position() - 1;
    save(decodeFrame(frames.layout(), frames.size(), frame, options.code),
         isNumbered ? numberedPath(options.output.path, number) : options.output.path, saving);
    progress.show(number + 1);
  } while (options.all && frames.read(frame));
  return kSuccess;
}

}  // namespace

void addYuvCommand(Commands& commands) {
  auto options = std::make_shared<YuvOptions>();
  Command command = commands.add("yuv", "Converts frames of uncompressed video to pictures.",
                                 [options] { return convertFrames(*options); });
  command.add("IN", options->input, "frames one after the other, raw or as .y4m").required();
  options->output.addPathTo(command);
  command.add("--format", options->layout, "how a frame of raw video lies in memory").form("NAME");
  command.addFlag("--library-order", options->libraryOrder,
                  "YUY2, UYVY and YV12 as the library has them, with the colour differences the "
                  "other way round");
  command.addParsed("--size", options->size, parseFrameSize, "WxH",
                    "pixels of a frame of raw video");
  addDepth(command, options->code, {15, 16, 24, 32}, "the pixel format to convert to")
      .withDefault();
  Option frame = command.add("--frame", options->frame, "the number of the frame, from 0")
                     .check(count(0, UINT64_MAX));
  command
      .addFlag("--all", options->all,
               "every frame: OUT gets a number before its ending; on standard output "
               "the pictures follow each other")
      .excludes(frame);
  command.footer("Formats, in upper or lower case: " + videoLayoutNames());
}

}  // namespace tool
