// SPDX-License-Identifier: MIT
//
// An X display that says anything: what it sends is there before it is asked, so no process and no
// thread is needed. Each reply has its right number; all else is the input's.

#include <sys/socket.h>
#include <unistd.h>
#include <xcb/xcb.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "display.h"
#include "fuzzing.h"

using fuzz::Bytes;
using fuzz::Choices;

namespace {

int clientEnd = -1;

template <class Record> void append(Bytes& to, const Record& record) {
  const auto* bytes = reinterpret_cast<const uint8*>(&record);
  to.insert(to.end(), bytes, bytes + sizeof record);
}

void storeWord(Bytes& to, size_t at, uint32 word) { memcpy(to.data() + at, &word, sizeof word); }

/// A sound setup of one screen.
Bytes soundSetup(uint8 depth, uint8 bpp) {
  xcb_setup_t head = {};
  head.status = 1;
  head.protocol_major_version = 11;
  head.resource_id_mask = 0x1FFFFF;
  head.maximum_request_length = 0xFFFF;
  head.roots_len = 1;
  head.pixmap_formats_len = 1;
  xcb_screen_t screen = {};
  screen.root = 1;
  screen.root_visual = 2;
  screen.root_depth = depth;
  screen.allowed_depths_len = 1;
  xcb_visualtype_t visual = {};
  visual.visual_id = 2;
  visual._class = XCB_VISUAL_CLASS_TRUE_COLOR;
  visual.colormap_entries = 256;
  visual.red_mask = depth == 16 ? 0xF800 : depth == 15 ? 0x7C00 : 0xFF0000;
  visual.green_mask = depth == 16 ? 0x07E0 : depth == 15 ? 0x03E0 : 0xFF00;
  visual.blue_mask = depth == 24 ? 0xFF : 0x1F;
  Bytes bytes;
  append(bytes, head);
  append(bytes, xcb_format_t{depth, bpp, 32, {}});
  append(bytes, screen);
  append(bytes, xcb_depth_t{depth, 0, 1, {}});
  append(bytes, visual);
  return bytes;
}

void appendSetup(Bytes& stream, Choices& c) {
  struct Format {
    uint8 depth, bpp;
  };
  const auto format = c.oneOf<Format>({{24, 32}, {24, 24}, {16, 16}, {15, 16}, {8, 8}});
  Bytes setup = soundSetup(format.depth, format.bpp);
  for (uint32 lies = c.below(4); lies != 0; --lies)
    setup[c.below(static_cast<uint32>(setup.size()))] = c.byte();
  if (c.chance(8)) setup.resize(setup.size() - 4 * c.below(16));
  const auto words = static_cast<uint16>((setup.size() - 8) / 4);
  memcpy(setup.data() + 6, &words, sizeof words);
  stream.insert(stream.end(), setup.begin(), setup.end());
}

/// A reply, an error or an event with a number.
void appendAnswer(Bytes& stream, Choices& c, uint32 number) {
  constexpr size_t kHead = 32;
  const uint32 words = c.chance(2) ? 0 : c.chance(4) ? c.below(6000) : c.below(80);
  Bytes answer(kHead);
  answer[0] = c.chance(16) ? c.byte() : 1;
  answer[1] = c.byte();
  answer[2] = static_cast<uint8>(number);
  for (size_t i = 8; i < kHead; ++i) answer[i] = c.chance(2) ? c.byte() % 16 : 0;
  const Bytes rest = c.fill(size_t{4} * words);
  answer.insert(answer.end(), rest.begin(), rest.end());
  if (answer[0] == 1) storeWord(answer, 4, words);
  stream.insert(stream.end(), answer.begin(), answer.end());
}

void look() {
  tool::Display display("");
  const Rect all = display.bounds();
  const Rect part = {0, 0, std::min(all.right, 48), std::min(all.bottom, 32)};
  display.capture(part);
  if (display.isIndexed()) display.refreshColors();
  if (const auto cursor = display.cursor()) fuzz::require(cursor->pixels.size() != 0);
}

}  // namespace

// The tool's way to a display leads here.
extern "C" xcb_connection_t* xcb_connect(const char* /*name*/, int* screen) {
  if (screen != nullptr) *screen = 0;
  return xcb_connect_to_fd(clientEnd, nullptr);
}

// The program's own way out: no command runs here.
extern "C" [[noreturn]] void rastertoolExit(int /*status*/) { __builtin_trap(); }

extern "C" int LLVMFuzzerTestOneInput(const uint8* bytes, size_t size) {
  constexpr uint32 kAnswers = 16;
  Choices c(bytes, size);
  Bytes stream;
  appendSetup(stream, c);
  for (uint32 number = 1; number <= kAnswers; ++number) appendAnswer(stream, c, number);
  int ends[2];
  if (socketpair(AF_UNIX, SOCK_STREAM, 0, ends) != 0) return 0;
  clientEnd = ends[0];
  // What does not fit into the socket's buffer is not sent.
  (void)send(ends[1], stream.data(), stream.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
  shutdown(ends[1], SHUT_WR);
  try {
    look();
  } catch (const tool::Failure&) {  // one line and exit status 1
  }
  close(ends[1]);
  return 0;
}
