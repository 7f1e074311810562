// SPDX-License-Identifier: MIT
//
// play: a recording of the live screen as a picture, or as frames for other programs.

#include <cstdio>
#include <limits>
#include <memory>
#include <optional>

#include "commands.h"
#include "inputStream.h"
#include "numbers.h"
#include "outputFile.h"
#include "picture.h"
#include "progress.h"
#include "raster.h"
#include "recording.h"

namespace tool {
namespace {

using live::PixelView;
using live::RecordingReader;

constexpr uint64 kSecond = 1000000;  // in the units of a recording
constexpr uint64 kForever = std::numeric_limits<uint64>::max();

struct PlayOptions {
  std::string input;
  std::string output;
  std::optional<double> at;
  uint32 rate = 25;
};

std::vector<uint8> recordingIn(const std::string& path) {
  constexpr uint64 kLargestRecording = uint64{1} << 32;
  InputStream input(path);
  return readWhole(input, kLargestRecording);
}

/// A file that is being played, and what is said about it.
class Player {
 public:
  explicit Player(const std::string& name)
      : path(name),
        bytes(recordingIn(name)),
        reader(bytes.data(), bytes.size()),
        progress("bytes", bytes.size()) {
    if (!reader.fault().empty()) throw Failure("'" + path + "': " + reader.fault());
  }

  /// Draws the updates up to a time. False once there are no more.
  bool playTo(uint64 time) {
    std::optional<uint64> next = reader.nextTime();
    for (; next && *next <= time; next = reader.nextTime()) {
      reader.drawNext();
      ++updates;
      progress.show(reader.position());
    }
    return next.has_value();
  }
  PixelView picture() const { return reader.picture(); }

  /// Says when the file does not end where an update does.
  void judgeEnd() const {
    if (reader.isAtEnd()) return;
    const std::string text = "'" + path + "': " + reader.fault() + "; " + std::to_string(updates) +
                             " updates were played";
    if (reader.isBrokenOff()) {
      fprintf(stderr, "%s\n", text.c_str());
    } else {
      throw Failure(text);
    }
  }

 private:
  std::string path;
  std::vector<uint8> bytes;
  RecordingReader reader;
  Progress progress;
  uint64 updates = 0;
};

/// The part of a picture that fits another one, from its top left corner.
void copyFitting(const PixelView& from, Picture& to) {
  Raster_RectCopy(to.data(), to.pitch(), from.data, from.pitch, to.bytesPerPixel(), 0, 0, 0, 0,
                  std::min(from.width, to.width()), std::min(from.height, to.height()));
}

void writeFrame(const Picture& frame) {
  for (uint32 y = 0; y < frame.height(); ++y)
    if (fwrite(frame.data() + size_t{frame.pitch()} * y, size_t{4} * frame.width(), 1, stdout) != 1)
      throw Failure("cannot write the frames");
}

/// Frames at a constant rate, all of the size that the recording begins with.
void playFrames(Player& player, const PlayOptions& options) {
  const PixelView first = player.picture();
  fprintf(stderr, "frames of %ux%u pixels of 32 bits, blue first, %u a second\n",
          static_cast<unsigned>(first.width), static_cast<unsigned>(first.height),
          static_cast<unsigned>(options.rate));
  Picture frame(first.width, first.height, 32);
  const uint64 end = options.at ? static_cast<uint64>(*options.at * kSecond) : kForever;
  bool goesOn = true;
  for (uint64 number = 0; goesOn && number * kSecond / options.rate <= end; ++number) {
    goesOn = player.playTo(number * kSecond / options.rate);
    copyFitting(player.picture(), frame);
    writeFrame(frame);
  }
  fflush(stdout);
}

void playPicture(Player& player, const PlayOptions& options) {
  player.playTo(options.at ? static_cast<uint64>(*options.at * kSecond) : kForever);
  const PixelView shown = player.picture();
  Picture picture(shown.width, shown.height, 32);
  copyFitting(shown, picture);
  save(picture, options.output);
}

int play(const PlayOptions& options) {
  Player player(options.input);
  if (options.output == "-") {
    playFrames(player, options);
  } else {
    playPicture(player, options);
  }
  player.judgeEnd();
  return kSuccess;
}

}  // namespace

void addPlayCommand(Commands& commands) {
  auto options = std::make_shared<PlayOptions>();
  Command command = commands.add("play", "Shows what `serve --record` has written.",
                                 [options] { return play(*options); });
  command.add("FILE", options->input, "a recording").required();
  command
      .add("OUT", options->output,
           "a PNG or BMP picture, or - for frames of 32 bits a pixel on standard output")
      .required();
  command.add("--at", options->at, "seconds after the start; without it, the end")
      .check(finiteNumber(0, 1e9))
      .form("SECONDS");
  command.add("--rate", options->rate, "frames a second")
      .check(count(1, 1000))
      .form("FPS")
      .withDefault();
}

}  // namespace tool
