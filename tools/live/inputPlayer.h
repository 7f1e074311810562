// SPDX-License-Identifier: MIT
//
// A viewer's pointer and keys on the X screen, by XTEST.

#ifndef RASTER_TOOLS_LIVE_INPUT_PLAYER_H
#define RASTER_TOOLS_LIVE_INPUT_PLAYER_H

#include <xcb/xcb_keysyms.h>

#include <memory>
#include <set>

#include "liveScreen.h"

namespace tool::live {

class InputPlayer final : public InputSink {
 public:
  /// Fails when the display takes no input from programs.
  explicit InputPlayer(LiveScreen& onto);
  /// Releases what the viewer held when it left.
  ~InputPlayer() override;
  InputPlayer(const InputPlayer&) = delete;
  InputPlayer& operator=(const InputPlayer&) = delete;

  void key(bool down, uint32 keySymbol) override;
  void pointer(uint32 buttons, const Point& at) override;

 private:
  xcb_keycode_t codeOf(uint32 keySymbol);
  xcb_keycode_t bindSpareCode(uint32 keySymbol);
  bool isShifted(xcb_keycode_t code, uint32 keySymbol);
  void send(uint8 type, uint8 detail, const Point& at = {0, 0});
  void press(xcb_keycode_t code);
  void pressWithShift(xcb_keycode_t code, bool shift);
  bool holdsShift();
  xcb_keycode_t shiftCode();

  LiveScreen& screen;
  xcb_connection_t* connection;
  std::unique_ptr<xcb_key_symbols_t, void (*)(xcb_key_symbols_t*)> symbols;
  std::set<xcb_keycode_t> held;
  uint32 heldButtons = 0;
};

}  // namespace tool::live

#endif
