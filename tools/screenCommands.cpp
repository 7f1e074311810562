// SPDX-License-Identifier: MIT
//
// screenshot, watch: a live X display.

#include <chrono>
#include <cstdio>
#include <memory>
#include <optional>
#include <thread>
#include <utility>

#include "changedRects.h"
#include "commands.h"
#include "cursorImage.h"
#include "display.h"
#include "geometry.h"
#include "imageOptions.h"
#include "numbers.h"
#include "picture.h"
#include "progress.h"
#include "standardOutput.h"

namespace tool {
namespace {

struct ScreenOptions {
  std::string display;
  std::optional<Rect> region;

  void addTo(OptionList& command) {
    command.add("--display", display, "the X display; without it, the one in DISPLAY").form("NAME");
    command.addParsed("--region", region, parseRegion, "WxH+X+Y", "a part of the screen");
  }

  Rect regionOf(const Display& from) const {
    const Rect screen = from.bounds();
    if (!region) return screen;
    if (!Rect_ContainsRect(&screen, &*region))
      throw Failure(regionText(*region) + " does not lie within the screen of " +
                    regionText(screen));
    return *region;
  }
};

struct ScreenshotOptions {
  ScreenOptions screen;
  OutputOptions output;
  bool withCursor = false;
  double cursorScale = 1;
};

void drawCursor(Picture& picture, const Rect& region, LiveCursor live, double scale) {
  CursorImage cursor =
      CursorImage::ofPixels(live.width, live.height, live.hotSpot, std::move(live.pixels));
  cursor.scaleBy(scale);
  cursor.drawOn(picture,
                {live.hotSpotOnScreen.x - region.left, live.hotSpotOnScreen.y - region.top});
}

int screenshot(const ScreenshotOptions& options) {
  const SaveOptions saving = options.output.forSave();
  Display display(options.screen.display);
  const Rect region = options.screen.regionOf(display);
  Picture picture = display.capture(region);
  if (options.withCursor) {
    if (picture.record.bpp == 8) picture = picture.convertedTo(32);  // no index for a mixed colour
    const std::optional<LiveCursor> cursor = display.cursor();
    if (cursor) drawCursor(picture, region, *cursor, options.cursorScale);
  }
  save(picture, options.output.path, saving);
  fprintf(textBeside(options.output.path), "%s: %s of a screen with %s\n",
          options.output.path.c_str(), regionText(region).c_str(), display.description().c_str());
  return kSuccess;
}

void addScreenshot(Commands& commands) {
  auto options = std::make_shared<ScreenshotOptions>();
  Command command = commands.add("screenshot", "Saves the screen of an X display.",
                                 [options] { return screenshot(*options); });
  options->output.addTo(command);
  options->screen.addTo(command);
  Option cursor = command.addFlag("--cursor", options->withCursor, "draw the mouse cursor as well");
  command.add("--cursor-scale", options->cursorScale, "draw it larger or smaller")
      .check(finiteNumber(0.1, 16))
      .needs(cursor);
}

struct WatchOptions {
  ScreenOptions screen;
  double interval = 1;
  uint64 count = 1;
  uint32 tileSize = 16;
  std::string raw;
};

void printChanges(FILE* text, uint64 number, const Picture& before, const Picture& after,
                  const std::vector<Rect>& rects) {
  if (rects.empty()) {
    fprintf(text, "%llu: no change\n", static_cast<unsigned long long>(number));
  } else {
    fprintf(text, "%llu: changes within %s\n", static_cast<unsigned long long>(number),
            regionText(boundingRect(before, after, rects)).c_str());
  }
  for (const Rect& rect : rects) fprintf(text, "  %s\n", regionText(rect).c_str());
  flushText(text);
}

/// Captures as they come, four bytes a pixel without gaps: blue, green, red and one that says
/// nothing.
class RawFrames {
 public:
  explicit RawFrames(const std::string& path) {
    if (!path.empty()) output.emplace(path);
  }

  void write(const Picture& picture) {
    if (!output) return;
    const Picture wide = picture.convertedTo(32);
    for (uint32 y = 0; y < wide.height(); ++y)
      output->write(wide.data() + size_t{wide.pitch()} * y, size_t{4} * wide.width());
  }

 private:
  std::optional<OutputStream> output;
};

int watch(const WatchOptions& options) {
  Display display(options.screen.display);
  const Rect region = options.screen.regionOf(display);
  FILE* text = textBeside(options.raw);
  RawFrames frames(options.raw);
  Picture before = display.capture(region);
  frames.write(before);
  Progress progress("captures", options.count);
  for (uint64 number = 1; options.count == 0 || number <= options.count; ++number) {
    std::this_thread::sleep_for(std::chrono::duration<double>(options.interval));
    Picture after = display.capture(region);
    frames.write(after);
    printChanges(text, number, before, after, changedRects(before, after, options.tileSize));
    progress.show(number);
    before = std::move(after);
  }
  return kSuccess;
}

void addWatch(Commands& commands) {
  auto options = std::make_shared<WatchOptions>();
  Command command = commands.add(
      "watch", "Prints the rectangles of a screen that change from one capture to the next.",
      [options] { return watch(*options); });
  options->screen.addTo(command);
  command.add("--interval", options->interval, "seconds between captures")
      .check(finiteNumber(0, 86400))
      .withDefault();
  command.add("--count", options->count, "how many times; 0 goes on until interrupted")
      .check(count(0, UINT64_MAX))
      .withDefault();
  command.add("--tile", options->tileSize, "side of the tiles that are compared")
      .check(count(1, 4096))
      .withDefault();
  command
      .add("--raw", options->raw,
           "also write every capture, the first one included, as raw video: four bytes a "
           "pixel, blue first (FFmpeg's bgr0)")
      .form("FILE");
}

}  // namespace

void addScreenCommands(Commands& commands) {
  addScreenshot(commands);
  addWatch(commands);
}

}  // namespace tool
