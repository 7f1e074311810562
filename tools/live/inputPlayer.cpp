// SPDX-License-Identifier: MIT

#include "inputPlayer.h"

#include <xcb/xtest.h>

#include "failure.h"
#include "xReply.h"

namespace tool::live {
namespace {

constexpr uint32 kShiftLeft = 0xFFE1;
constexpr uint32 kFirstFunctionKey = 0xFD00;  // symbols from here on do not depend on Shift

bool isLetterOrSign(uint32 keySymbol) { return keySymbol < kFirstFunctionKey; }

}  // namespace

InputPlayer::InputPlayer(LiveScreen& onto)
    : screen(onto),
      connection(onto.display().handle()),
      symbols(xcb_key_symbols_alloc(connection), xcb_key_symbols_free) {
  if (!hasExtension(connection, xcb_test_id))
    throw Failure("the display takes no input from programs: it has no XTEST extension");
}

InputPlayer::~InputPlayer() {
  for (const xcb_keycode_t code : held) send(XCB_KEY_RELEASE, code);
  pointer(0, {-1, -1});
}

void InputPlayer::send(uint8 type, uint8 detail, const Point& at) {
  xcb_test_fake_input(connection, type, detail, XCB_CURRENT_TIME, screen.display().root(),
                      static_cast<int16>(at.x), static_cast<int16>(at.y), 0);
  xcb_flush(connection);
}

void InputPlayer::pointer(uint32 buttons, const Point& at) {
  constexpr uint32 kButtons = 8;
  if (at.x >= 0) send(XCB_MOTION_NOTIFY, 0, screen.onScreen(at));
  for (uint32 i = 0; i < kButtons; ++i) {
    const bool isDown = (buttons >> i & 1) != 0;
    const bool wasDown = (heldButtons >> i & 1) != 0;
    if (isDown != wasDown)
      send(isDown ? XCB_BUTTON_PRESS : XCB_BUTTON_RELEASE, static_cast<uint8>(i + 1));
  }
  heldButtons = buttons;
}

/// The key that has a symbol, or one that gets it; 0 when all keys have others.
xcb_keycode_t InputPlayer::codeOf(uint32 keySymbol) {
  const std::unique_ptr<xcb_keycode_t, decltype(&free)> codes(
      xcb_key_symbols_get_keycode(symbols.get(), keySymbol), free);
  if (codes && *codes != XCB_NO_SYMBOL) return *codes;
  return bindSpareCode(keySymbol);
}

xcb_keycode_t InputPlayer::bindSpareCode(uint32 keySymbol) {
  constexpr int kColumns = 4;
  const xcb_setup_t* setup = xcb_get_setup(connection);
  for (uint32 code = setup->max_keycode; code >= setup->min_keycode; --code) {
    bool isFree = true;
    for (int column = 0; column < kColumns; ++column)
      if (xcb_key_symbols_get_keysym(symbols.get(), static_cast<xcb_keycode_t>(code), column) !=
          XCB_NO_SYMBOL)
        isFree = false;
    if (!isFree) continue;
    const xcb_keysym_t both[2] = {keySymbol, keySymbol};
    xcb_change_keyboard_mapping(connection, 1, static_cast<xcb_keycode_t>(code), 2, both);
    symbols.reset(xcb_key_symbols_alloc(connection));
    return static_cast<xcb_keycode_t>(code);
  }
  return 0;
}

bool InputPlayer::isShifted(xcb_keycode_t code, uint32 keySymbol) {
  return xcb_key_symbols_get_keysym(symbols.get(), code, 0) != keySymbol &&
         xcb_key_symbols_get_keysym(symbols.get(), code, 1) == keySymbol;
}

xcb_keycode_t InputPlayer::shiftCode() { return codeOf(kShiftLeft); }

bool InputPlayer::holdsShift() {
  constexpr uint32 kShiftRight = 0xFFE2;
  return held.contains(shiftCode()) || held.contains(codeOf(kShiftRight));
}

void InputPlayer::press(xcb_keycode_t code) {
  send(XCB_KEY_PRESS, code);
  held.insert(code);
}

/// For viewers whose keyboard has the symbol elsewhere.
void InputPlayer::pressWithShift(xcb_keycode_t code, bool shift) {
  send(shift ? XCB_KEY_PRESS : XCB_KEY_RELEASE, shiftCode());
  press(code);
  send(shift ? XCB_KEY_RELEASE : XCB_KEY_PRESS, shiftCode());
}

void InputPlayer::key(bool down, uint32 keySymbol) {
  const xcb_keycode_t code = codeOf(keySymbol);
  if (code == 0) return;
  if (!down) {
    send(XCB_KEY_RELEASE, code);
    held.erase(code);
    return;
  }
  const bool shift = isShifted(code, keySymbol);
  if (isLetterOrSign(keySymbol) && shift != holdsShift()) {
    pressWithShift(code, shift);
  } else {
    press(code);
  }
}

}  // namespace tool::live
