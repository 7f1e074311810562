// SPDX-License-Identifier: MIT
//
// Viewers that do what no viewer should: they keep silent, talk nonsense, or ask for the
// impossible.

#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <functional>
#include <map>

#include "link.h"
#include "session.h"

namespace viewers {
namespace {

constexpr int kPatience = 30000;

/// Exit statuses.
constexpr int kAsWanted = 0, kOtherwise = 1;

/// Reads until the server has closed the connection; it has time until its reader loses patience.
int expectDropped(Link& link) {
  try {
    for (;;) link.read8();
  } catch (const Broken&) {
  }
  if (link.readable(0)) return kAsWanted;
  printf("the server did not close the connection\n");
  return kOtherwise;
}

/// Asks for the whole screen and gets it.
int expectServed(Session& session) {
  session.request(false);
  while (!session.readMessage()) {
  }
  return kAsWanted;
}

using Deed = std::function<int(const std::string& address)>;

/// What is sent after a proper greeting, and has to be the end of the connection.
Deed dropped(const std::vector<uint8_t>& bytes) {
  return [bytes](const std::string& address) {
    Link link(address, kPatience);
    const Session session(link, "3.8");
    link.write(bytes);
    return expectDropped(link);
  };
}

Deed droppedAsGreeting(const std::string& text) {
  return [text](const std::string& address) {
    Link link(address, kPatience);
    link.write(Message().add(text).bytes());
    return expectDropped(link);
  };
}

/// What is sent before the connection is closed in the middle of it.
Deed cutShort(const std::vector<uint8_t>& bytes) {
  return [bytes](const std::string& address) {
    Link link(address, kPatience);
    const Session session(link, "3.8");
    link.write(bytes);
    return kAsWanted;
  };
}

std::vector<uint8_t> updateRequest(unsigned x, unsigned y, unsigned width, unsigned height) {
  return Message().add8(3).add8(0).add16(x).add16(y).add16(width).add16(height).bytes();
}

std::vector<uint8_t> pixelFormat(unsigned bits, unsigned depth, unsigned max, unsigned shift) {
  Message message;
  message.add32(0).add8(bits).add8(depth).add8(0).add8(1);
  for (int channel = 0; channel < 3; ++channel) message.add16(max);
  for (int channel = 0; channel < 3; ++channel) message.add8(shift);
  return message.add16(0).add8(0).bytes();
}

/// Sends requests without end and never reads.
int stall(const std::string& address) {
  Link link(address, kPatience);
  Session session(link, "3.8");
  for (int i = 0; i < 1000; ++i) session.request(i % 2 == 0);
  printf("stalled\n");
  fflush(stdout);
  pause();
  return kAsWanted;
}

void sendCutText(Link& link, uint32_t announced, uint32_t sent) {
  link.write(Message().add32(6U << 24).add32(announced).bytes());
  const std::vector<uint8_t> block(1 << 16, 'x');
  for (; sent >= block.size(); sent -= static_cast<uint32_t>(block.size())) link.write(block);
  link.write(std::vector<uint8_t>(sent, 'x'));
}

/// A cut text of 80 MB is skipped, and the connection goes on.
int longCutText(const std::string& address) {
  Link link(address, kPatience);
  Session session(link, "3.8");
  constexpr uint32_t kSize = 80 << 20;
  sendCutText(link, kSize, kSize);
  return expectServed(session);
}

/// Half of a cut text, and then nothing any more.
int endlessCutText(const std::string& address) {
  Link link(address, kPatience);
  const Session session(link, "3.8");
  sendCutText(link, 0x7FFFFFFF, 1 << 20);
  printf("stalled\n");
  fflush(stdout);
  pause();
  return kAsWanted;
}

/// What a later version may add is not an error: unknown encodings are passed over.
int unknownEncodings(const std::string& address) {
  Link link(address, kPatience);
  Session session(link, "3.8");
  std::vector<int32_t> encodings;
  for (int32_t i = 1000; i < 3000; ++i) encodings.push_back(i * 7919);
  encodings.push_back(kRaw);
  session.useEncodings(encodings);
  return expectServed(session);
}

const std::map<std::string, Deed>& deeds() {
  static const std::map<std::string, Deed> all = {
      {"greeting-of-another-protocol", droppedAsGreeting("GET / HTTP/1.0\r\n\r\n")},
      {"greeting-without-numbers", droppedAsGreeting("RFB abc.def\n")},
      {"security-nobody-offered", droppedAsGreeting("RFB 003.008\n\x77")},
      {"unknown-message", dropped({200, 1, 2, 3})},
      {"nothing-wanted", dropped(updateRequest(0, 0, 0, 0))},
      {"outside", dropped(updateRequest(60000, 60000, 10, 10))},
      {"reaches-outside", dropped(updateRequest(1, 1, 65535, 65535))},
      {"seven-bits", dropped(pixelFormat(7, 7, 3, 0))},
      {"no-bits", dropped(pixelFormat(0, 0, 0, 0))},
      {"shift-beyond", dropped(pixelFormat(32, 24, 255, 200))},
      {"field-beyond", dropped(pixelFormat(8, 8, 255, 4))},
      {"half-a-format", cutShort({0, 0, 0, 0, 32, 24})},
      {"half-a-request", cutShort({3, 0, 0})},
      {"half-the-encodings", cutShort({2, 0, 255, 255, 0, 0, 0})},
      {"half-a-text", cutShort({6, 0, 0, 0, 0, 1, 0, 0, 'x'})},
      {"stall", stall},
      {"long-cut-text", longCutText},
      {"endless-cut-text", endlessCutText},
      {"unknown-encodings", unknownEncodings},
  };
  return all;
}

int usage() {
  fprintf(stderr, "usage: rfbRude ADDRESS DEED     a DEED is one of:\n");
  for (const auto& [name, deed] : deeds()) fprintf(stderr, "  %s\n", name.c_str());
  return 2;
}

}  // namespace
}  // namespace viewers

int main(int count, char** arguments) {
  signal(SIGPIPE, SIG_IGN);
  if (count != 3) return viewers::usage();
  const auto deed = viewers::deeds().find(arguments[2]);
  if (deed == viewers::deeds().end()) return viewers::usage();
  try {
    return deed->second(arguments[1]);
  } catch (const std::exception& trouble) {
    fprintf(stderr, "rfbRude %s: %s\n", arguments[2], trouble.what());
    return 2;
  }
}
