// SPDX-License-Identifier: MIT
//
// An X display that says whatever it is told to, sound or not, to one program.
// usage: fakeDisplay [NAME=NUMBER...] -- PROGRAM [ARGUMENT...]
//
// Runs the program with DISPLAY set, and ends as the program does. The names are in the table
// below; without them the display is a sound one: one screen of 16x8 pixels, with XFIXES, without
// MIT-SHM.

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <unistd.h>
#include <xcb/xfixes.h>
#include <xcb/xproto.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;

constexpr unsigned char kXfixesOpcode = 140;
constexpr unsigned kRoot = 1;
constexpr unsigned kVisual = 2;

// What is said, and how much is sent of it.
std::map<std::string, unsigned> values = {
    {"depth", 24},        {"bpp", 32},     {"pad", 32},        {"width", 16},
    {"height", 8},        {"roots", 1},    {"formats", 1},     {"depths", 1},
    {"visuals", 1},       {"vendor", 0},   {"setupCut", 0},    {"colours", 256},
    {"coloursSent", 256}, {"imageCut", 0}, {"cursorWidth", 4}, {"cursorHeight", 4},
    {"cursorSent", 16},   {"hotX", 1},     {"hotY", 1},
};

template <class Number> Number value(const char* name) {
  return static_cast<Number>(values.at(name));
}

template <class Record> void append(Bytes& to, const Record& record) {
  const auto* bytes = reinterpret_cast<const unsigned char*>(&record);
  to.insert(to.end(), bytes, bytes + sizeof record);
}

void send(int to, const Bytes& bytes) {
  for (size_t done = 0; done < bytes.size();) {
    const ssize_t sent = write(to, bytes.data() + done, bytes.size() - done);
    if (sent <= 0) _exit(0);  // the program has gone
    done += static_cast<size_t>(sent);
  }
}

Bytes receive(int from, size_t size) {
  Bytes bytes(size);
  for (size_t done = 0; done < size;) {
    const ssize_t got = read(from, bytes.data() + done, size - done);
    if (got <= 0) _exit(0);
    done += static_cast<size_t>(got);
  }
  return bytes;
}

/// A reply: its record, and what follows that, whose length is told in words from byte 32 on.
template <class Reply> Bytes replyOf(Reply reply, unsigned short sequence, const Bytes& rest = {}) {
  reply.response_type = 1;
  reply.sequence = sequence;
  Bytes bytes;
  append(bytes, reply);
  bytes.insert(bytes.end(), rest.begin(), rest.end());
  bytes.resize(std::max<size_t>(32, (bytes.size() + 3) & ~size_t{3}));
  const auto words = static_cast<unsigned>((bytes.size() - 32) / 4);
  memcpy(bytes.data() + 4, &words, sizeof words);
  return bytes;
}

xcb_screen_t screen() {
  xcb_screen_t record = {};
  record.root = kRoot;
  record.root_visual = kVisual;
  record.width_in_pixels = value<uint16_t>("width");
  record.height_in_pixels = value<uint16_t>("height");
  record.root_depth = value<uint8_t>("depth");
  record.allowed_depths_len = value<uint8_t>("depths");
  return record;
}

xcb_visualtype_t visual() {
  xcb_visualtype_t record = {};
  record.visual_id = kVisual;
  record._class = XCB_VISUAL_CLASS_TRUE_COLOR;
  record.colormap_entries = 256;
  record.red_mask = 0xFF0000;
  record.green_mask = 0x00FF00;
  record.blue_mask = 0x0000FF;
  return record;
}

/// The one of the counts that says more than is there hides the rest: the root's visual is not
/// found by then, so whoever looks for it goes on.
Bytes setup() {
  xcb_setup_t head = {};
  head.status = 1;
  head.protocol_major_version = 11;
  head.resource_id_mask = 0xFFFFF;
  head.maximum_request_length = 0xFFFF;
  head.vendor_len = value<uint16_t>("vendor");
  head.roots_len = value<uint8_t>("roots");
  head.pixmap_formats_len = value<uint8_t>("formats");
  head.min_keycode = 8;
  head.max_keycode = 255;
  Bytes bytes;
  append(bytes, head);
  append(bytes,
         xcb_format_t{value<uint8_t>("depth"), value<uint8_t>("bpp"), value<uint8_t>("pad"), {}});
  append(bytes, screen());
  xcb_visualtype_t only = visual();
  if (values["visuals"] != 1 || values["depths"] != 1) only.visual_id = 0;
  append(bytes, xcb_depth_t{value<uint8_t>("depth"), 0, value<uint16_t>("visuals"), {}});
  append(bytes, only);
  bytes.resize(bytes.size() - std::min<size_t>(bytes.size() - 8, values["setupCut"]));
  const auto words = static_cast<uint16_t>((bytes.size() - 8) / 4);
  memcpy(bytes.data() + 6, &words, sizeof words);
  return bytes;
}

void greet(int client) {
  const Bytes request = receive(client, sizeof(xcb_setup_request_t));
  xcb_setup_request_t said;
  memcpy(&said, request.data(), sizeof said);
  const auto padded = [](size_t size) { return (size + 3) & ~size_t{3}; };
  receive(client, padded(said.authorization_protocol_name_len) +
                      padded(said.authorization_protocol_data_len));
  send(client, setup());
}

Bytes geometry(unsigned short sequence) {
  xcb_get_geometry_reply_t reply = {};
  reply.root = kRoot;
  reply.depth = value<uint8_t>("depth");
  reply.width = value<uint16_t>("width");
  reply.height = value<uint16_t>("height");
  return replyOf(reply, sequence);
}

Bytes colors(unsigned short sequence) {
  xcb_query_colors_reply_t reply = {};
  reply.colors_len = value<uint16_t>("colours");
  return replyOf(reply, sequence, Bytes(sizeof(xcb_rgb_t) * values["coloursSent"], 0x40));
}

Bytes extension(const Bytes& body, unsigned short sequence) {
  constexpr size_t kNameAt = 4;
  const std::string name(body.begin() + kNameAt, body.end());
  xcb_query_extension_reply_t reply = {};
  reply.present = name.starts_with("XFIXES");
  reply.major_opcode = kXfixesOpcode;
  return replyOf(reply, sequence);
}

Bytes image(const Bytes& body, unsigned short sequence) {
  xcb_get_image_request_t asked = {};
  memcpy(reinterpret_cast<unsigned char*>(&asked) + 4, body.data(),
         std::min(body.size(), sizeof asked - 4));
  xcb_get_image_reply_t reply = {};
  reply.depth = value<uint8_t>("depth");
  const size_t bytes = size_t{asked.width} * asked.height * values["bpp"] / 8;
  return replyOf(reply, sequence, Bytes(bytes - std::min<size_t>(bytes, values["imageCut"]), 0x55));
}

Bytes fixes(unsigned char minor, unsigned short sequence) {
  if (minor == XCB_XFIXES_QUERY_VERSION) {
    xcb_xfixes_query_version_reply_t reply = {};
    reply.major_version = 5;
    return replyOf(reply, sequence);
  }
  xcb_xfixes_get_cursor_image_reply_t reply = {};
  reply.x = 8;
  reply.y = 4;
  reply.width = value<uint16_t>("cursorWidth");
  reply.height = value<uint16_t>("cursorHeight");
  reply.xhot = value<uint16_t>("hotX");
  reply.yhot = value<uint16_t>("hotY");
  return replyOf(reply, sequence, Bytes(size_t{4} * values["cursorSent"], 0xFF));
}

/// The answer to a request, or none.
Bytes answer(unsigned char opcode, unsigned char minor, const Bytes& body,
             unsigned short sequence) {
  switch (opcode) {
    case XCB_GET_GEOMETRY:
      return geometry(sequence);
    case XCB_QUERY_COLORS:
      return colors(sequence);
    case XCB_QUERY_EXTENSION:
      return extension(body, sequence);
    case XCB_GET_IMAGE:
      return image(body, sequence);
    case XCB_GET_INPUT_FOCUS:
      return replyOf(xcb_get_input_focus_reply_t{}, sequence);
    case kXfixesOpcode:
      return fixes(minor, sequence);
    default:
      return {};
  }
}

[[noreturn]] void serve(int listener) {
  const int client = accept(listener, nullptr, nullptr);
  greet(client);
  for (unsigned short sequence = 1;; ++sequence) {
    const Bytes head = receive(client, 4);
    const size_t words = size_t{head[2]} | size_t{head[3]} << 8;
    const Bytes body = receive(client, words == 0 ? 0 : 4 * words - 4);
    send(client, answer(head[0], head[1], body, sequence));
  }
}

[[noreturn]] void giveUp(const char* why) {
  perror(why);
  exit(99);
}

/// Listens on a free port and returns the name of the display that it is.
std::string listenAnywhere(int listener) {
  constexpr int kFirstPort = 6000;
  sockaddr_in address = {};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  socklen_t size = sizeof address;
  auto* general = reinterpret_cast<sockaddr*>(&address);
  if (bind(listener, general, size) != 0 || listen(listener, 1) != 0 ||
      getsockname(listener, general, &size) != 0)
    giveUp("fakeDisplay: socket");
  return "127.0.0.1:" + std::to_string(ntohs(address.sin_port) - kFirstPort);
}

/// Takes the values and returns the program's place among the arguments.
int takeValues(int argc, char** argv) {
  int i = 1;
  for (; i < argc && strcmp(argv[i], "--") != 0; ++i) {
    const std::string text = argv[i];
    const size_t sign = text.find('=');
    values.at(text.substr(0, sign)) = static_cast<unsigned>(atol(text.c_str() + sign + 1));
  }
  if (i + 1 >= argc) exit(99);
  return i + 1;
}

}  // namespace

int main(int argc, char** argv) {
  const int program = takeValues(argc, argv);
  const int listener = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
  const std::string display = listenAnywhere(listener);
  const pid_t parent = getpid();
  const pid_t server = fork();
  if (server < 0) giveUp("fakeDisplay: fork");
  if (server == 0) {
    signal(SIGPIPE, SIG_IGN);
    prctl(PR_SET_PDEATHSIG, SIGKILL);  // with the program
    if (getppid() != parent) _exit(0);
    serve(listener);
  }
  setenv("DISPLAY", display.c_str(), 1);
  execv(argv[program], argv + program);
  giveUp(argv[program]);
}
