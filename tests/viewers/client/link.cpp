// SPDX-License-Identifier: MIT

#include "link.h"

#include <arpa/inet.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace viewers {
namespace {

constexpr size_t kBufferSize = 1 << 18;

int connected(int family, const void* address, socklen_t size, const std::string& name) {
  const int descriptor = socket(family, SOCK_STREAM | SOCK_CLOEXEC, 0);
  if (descriptor < 0) throw Broken("no socket");
  if (connect(descriptor, static_cast<const sockaddr*>(address), size) != 0) {
    close(descriptor);
    throw Broken("cannot connect to " + name + ": " + strerror(errno));
  }
  return descriptor;
}

int connectPath(const std::string& path) {
  sockaddr_un address = {};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof address.sun_path) throw Broken("the path is too long: " + path);
  memcpy(address.sun_path, path.c_str(), path.size());
  return connected(AF_UNIX, &address, sizeof address, path);
}

int connectPort(const std::string& name) {
  const size_t colon = name.rfind(':');
  if (colon == std::string::npos) throw Broken(name + " is not of the form HOST:PORT");
  sockaddr_in address = {};
  address.sin_family = AF_INET;
  address.sin_port = htons(static_cast<uint16_t>(std::stoi(name.substr(colon + 1))));
  if (inet_pton(AF_INET, name.substr(0, colon).c_str(), &address.sin_addr) != 1)
    throw Broken(name + " has no numeric address");
  const int descriptor = connected(AF_INET, &address, sizeof address, name);
  const int on = 1;  // requests leave at once
  setsockopt(descriptor, IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
  return descriptor;
}

}  // namespace

Link::Link(const std::string& address, int patienceMilliseconds)
    : socket_(address.find('/') != std::string::npos ? connectPath(address) : connectPort(address)),
      patience_(patienceMilliseconds),
      buffer_(kBufferSize) {}

Link::~Link() { close(socket_); }

bool Link::readable(int milliseconds) {
  if (next_ < end_) return true;
  pollfd ready = {socket_, POLLIN, 0};
  return poll(&ready, 1, milliseconds) == 1;
}

void Link::fill() {
  if (!readable(patience_)) throw Broken("the server keeps silent in the middle of a message");
  const ssize_t got = recv(socket_, buffer_.data(), buffer_.size(), 0);
  if (got <= 0) throw Broken("the server closed the connection");
  next_ = 0;
  end_ = static_cast<size_t>(got);
  received_ += end_;
}

void Link::read(uint8_t* to, size_t size) {
  while (size > 0) {
    if (next_ == end_) fill();
    const size_t some = std::min(size, end_ - next_);
    memcpy(to, buffer_.data() + next_, some);
    next_ += some;
    to += some;
    size -= some;
  }
}

std::vector<uint8_t> Link::read(size_t size) {
  std::vector<uint8_t> bytes(size);
  read(bytes.data(), size);
  return bytes;
}

uint8_t Link::read8() {
  uint8_t byte = 0;
  read(&byte, 1);
  return byte;
}

uint16_t Link::read16() {
  const int high = read8();
  return static_cast<uint16_t>(high << 8 | read8());
}

uint32_t Link::read32() {
  const uint32_t high = read16();
  return high << 16 | read16();
}

void Link::write(const std::vector<uint8_t>& bytes) const {
  for (size_t sent = 0; sent < bytes.size();) {
    const ssize_t some = send(socket_, bytes.data() + sent, bytes.size() - sent, MSG_NOSIGNAL);
    if (some <= 0) throw Broken("the server does not take what is sent to it");
    sent += static_cast<size_t>(some);
  }
}

Message& Message::add8(unsigned value) {
  bytes_.push_back(static_cast<uint8_t>(value));
  return *this;
}

Message& Message::add16(unsigned value) { return add8(value >> 8).add8(value); }

Message& Message::add32(uint32_t value) { return add16(value >> 16).add16(value); }

Message& Message::add(const std::string& text) {
  bytes_.insert(bytes_.end(), text.begin(), text.end());
  return *this;
}

}  // namespace viewers
