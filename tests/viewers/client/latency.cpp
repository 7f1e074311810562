// SPDX-License-Identifier: MIT
//
// How long it takes from a change on an X screen to its arrival at a viewer: a window becomes
// white, or black again, and a viewer waits for that in one of its pixels.
//
// usage: rfbLatency ADDRESS DISPLAY ENCODING COUNT     (prints: median, 99 % and longest, in ms)

#include <xcb/xcb.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "link.h"
#include "session.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kPatience = 10000;
constexpr int16_t kLeft = 40, kTop = 50;
constexpr uint16_t kSide = 64;

/// A square on the screen that is black or white at once.
class Lamp {
 public:
  explicit Lamp(const std::string& display)
      : x_(xcb_connect(display.c_str(), nullptr), xcb_disconnect) {
    if (xcb_connection_has_error(x_.get()) != 0) throw viewers::Broken("no display " + display);
    const xcb_screen_t& screen = *xcb_setup_roots_iterator(xcb_get_setup(x_.get())).data;
    window_ = xcb_generate_id(x_.get());
    black_ = screen.black_pixel;
    white_ = screen.white_pixel;
    const uint32_t values[] = {black_, 1};  // and no business of a window manager
    xcb_create_window(x_.get(), XCB_COPY_FROM_PARENT, window_, screen.root, kLeft, kTop, kSide,
                      kSide, 0, XCB_WINDOW_CLASS_INPUT_OUTPUT, screen.root_visual,
                      XCB_CW_BACK_PIXEL | XCB_CW_OVERRIDE_REDIRECT, values);
    xcb_map_window(x_.get(), window_);
    xcb_flush(x_.get());
  }

  void show(bool white) {
    const uint32_t color = white ? white_ : black_;
    xcb_change_window_attributes(x_.get(), window_, XCB_CW_BACK_PIXEL, &color);
    xcb_clear_area(x_.get(), 0, window_, 0, 0, 0, 0);
    xcb_flush(x_.get());
  }

 private:
  std::unique_ptr<xcb_connection_t, decltype(&xcb_disconnect)> x_;
  xcb_window_t window_ = 0;
  uint32_t black_ = 0;
  uint32_t white_ = 0;
};

/// Pauses of 20 to 60 ms, so that no server's clock is met at the same point again and again.
void pauseBefore(int turn) {
  std::this_thread::sleep_for(std::chrono::milliseconds(20 + turn * 17 % 41));
}

double millisecondsUntilSeen(viewers::Session& session, Lamp& lamp, bool white) {
  const uint32_t color = white ? 0xFFFFFF : 0;
  const auto start = Clock::now();
  lamp.show(white);
  while (session.picture().at(kLeft + kSide / 2, kTop + kSide / 2) != color) {
    if (session.readMessage()) session.request(true);
  }
  return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

void measure(const std::string& address, const std::string& display, int32_t encoding, int count) {
  viewers::Link link(address, kPatience);
  viewers::Session session(link, "3.8");
  session.useFormat(viewers::formatNamed("32"));
  session.useEncodings({encoding});
  Lamp lamp(display);
  session.request(false);
  while (!session.readMessage()) {
  }
  session.request(true);

  std::vector<double> times;
  for (int turn = 0; turn < count; ++turn) {
    pauseBefore(turn);
    times.push_back(millisecondsUntilSeen(session, lamp, turn % 2 == 0));
  }
  std::sort(times.begin(), times.end());
  printf("%.2f %.2f %.2f\n", times[times.size() / 2], times[times.size() * 99 / 100], times.back());
}

}  // namespace

int main(int count, char** arguments) {
  if (count != 5) return 2;
  const int32_t encoding = std::string(arguments[3]) == "zrle" ? viewers::kZrle : viewers::kRaw;
  try {
    measure(arguments[1], arguments[2], encoding, std::max(1, atoi(arguments[4])));
  } catch (const std::exception& trouble) {
    fprintf(stderr, "rfbLatency: %s\n", trouble.what());
    return 1;
  }
  return 0;
}
