// SPDX-License-Identifier: MIT

#include "displaySetup.h"

#include <string>

#include "failure.h"

namespace tool {
namespace {

/// The records of a setup, one after the other.
class Reader {
 public:
  explicit Reader(const xcb_setup_t* setup)
      : at(reinterpret_cast<const uint32*>(setup)), rest(kStartWords + setup->length) {}

  template <class Record> const Record* take(size_t count = 1) {
    return reinterpret_cast<const Record*>(words(count * sizeof(Record) / 4));
  }
  void skipText(size_t length) { words((length + 3) / 4); }

 private:
  static constexpr size_t kStartWords = 2;  // which the length does not count

  const uint32* words(size_t count) {
    if (count > rest) throw Failure("the display does not say all of its screens");
    const uint32* taken = at;
    at += count;
    rest -= count;
    return taken;
  }

  const uint32* at;
  size_t rest;  // in words, of which all records are made
};

/// Reads past the depths of a screen and returns the visual of its root window.
const xcb_visualtype_t* takeVisuals(Reader& reader, const xcb_screen_t& screen) {
  const xcb_visualtype_t* found = nullptr;
  for (uint32 depth = 0; depth < screen.allowed_depths_len; ++depth) {
    const uint32 count = reader.take<xcb_depth_t>()->visuals_len;
    const auto* visuals = reader.take<xcb_visualtype_t>(count);
    for (uint32 i = 0; i < count; ++i)
      if (visuals[i].visual_id == screen.root_visual && found == nullptr) found = &visuals[i];
  }
  return found;
}

}  // namespace

ScreenSetup readSetup(const xcb_setup_t* setup, int screenNumber) {
  Reader reader(setup);
  reader.take<xcb_setup_t>();
  reader.skipText(setup->vendor_len);
  const auto* formats = reader.take<xcb_format_t>(setup->pixmap_formats_len);
  ScreenSetup result;
  for (int number = 0; number < setup->roots_len; ++number) {
    const auto* screen = reader.take<xcb_screen_t>();
    const xcb_visualtype_t* visual = takeVisuals(reader, *screen);
    if (number == screenNumber) result = {screen, visual};
  }
  if (result.screen == nullptr)
    throw Failure("the display has no screen " + std::to_string(screenNumber));
  for (uint32 i = 0; i < setup->pixmap_formats_len; ++i) {
    if (formats[i].depth != result.screen->root_depth) continue;
    result.bitsPerPixel = formats[i].bits_per_pixel;
    result.scanlinePad = formats[i].scanline_pad;
  }
  return result;
}

}  // namespace tool
