// SPDX-License-Identifier: MIT

#include "listener.h"

#include <netdb.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <memory>
#include <utility>

#include "failure.h"

namespace tool::live {
namespace {

constexpr int kWaitingViewers = 16;

[[noreturn]] void fail(const std::string& what) { throw Failure(what + ": " + strerror(errno)); }

struct HostAndPort {
  std::string host;
  std::string port;
};

HostAndPort splitAddress(const std::string& text) {
  const size_t colon = text.rfind(':');
  if (colon == std::string::npos || colon == 0 || colon + 1 == text.size())
    throw UsageError("'" + text + "' is not of the form HOST:PORT");
  std::string host = text.substr(0, colon);
  if (host.front() == '[' && host.back() == ']') host = host.substr(1, host.size() - 2);
  if (host == "localhost") host = "127.0.0.1";
  return {host, text.substr(colon + 1)};
}

using Addresses = std::unique_ptr<addrinfo, decltype(&freeaddrinfo)>;

Addresses lookUp(const std::string& text) {
  const HostAndPort parts = splitAddress(text);
  addrinfo hints = {};
  hints.ai_socktype = SOCK_STREAM;
  hints.ai_flags = AI_NUMERICHOST | AI_NUMERICSERV | AI_PASSIVE;
  addrinfo* found = nullptr;
  if (getaddrinfo(parts.host.c_str(), parts.port.c_str(), &hints, &found) != 0)
    throw UsageError("'" + text + "' is not an address in numbers and a port");
  return {found, freeaddrinfo};
}

bool isLoopback(const sockaddr* address) {
  if (address->sa_family == AF_INET) {
    constexpr uint32_t kLoopbackNet = 127;
    sockaddr_in v4;
    memcpy(&v4, address, sizeof v4);
    return ntohl(v4.sin_addr.s_addr) >> 24 == kLoopbackNet;
  }
  sockaddr_in6 v6;
  memcpy(&v6, address, sizeof v6);
  return IN6_IS_ADDR_LOOPBACK(&v6.sin6_addr);
}

std::string textOf(int socket) {
  sockaddr_storage address = {};
  socklen_t size = sizeof address;
  auto* general = reinterpret_cast<sockaddr*>(&address);
  char host[NI_MAXHOST] = "";
  char port[NI_MAXSERV] = "";
  if (getsockname(socket, general, &size) != 0 ||
      getnameinfo(general, size, host, sizeof host, port, sizeof port,
                  NI_NUMERICHOST | NI_NUMERICSERV) != 0)
    fail("cannot tell the port");
  const std::string shown = address.ss_family == AF_INET6 ? "[" + std::string(host) + "]" : host;
  return shown + ":" + port;
}

sockaddr_un pathAddress(const std::string& path) {
  sockaddr_un address = {};
  address.sun_family = AF_UNIX;
  if (path.empty() || path.size() >= sizeof address.sun_path)
    throw UsageError("'" + path + "' is too long for a socket, or empty");
  memcpy(address.sun_path, path.c_str(), path.size() + 1);
  return address;
}

/// Whether somebody answers at a socket that exists.
bool isAnswered(const sockaddr_un& address) {
  const Descriptor probe(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
  return connect(probe.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
}

/// Removes a socket that a server left behind, and nothing else.
void removeAbandoned(const sockaddr_un& address) {
  struct stat file = {};
  if (lstat(address.sun_path, &file) != 0 || !S_ISSOCK(file.st_mode)) return;
  if (!isAnswered(address)) unlink(address.sun_path);
}

}  // namespace

Descriptor::~Descriptor() {
  if (number >= 0) close(number);
}

Descriptor::Descriptor(Descriptor&& from) noexcept : number(std::exchange(from.number, -1)) {}

Descriptor& Descriptor::operator=(Descriptor&& from) noexcept {
  std::swap(number, from.number);
  return *this;
}

Listener::Listener(Descriptor owned, std::string where, std::string owns)
    : socket(std::move(owned)), reached(std::move(where)), path(std::move(owns)) {
  if (listen(socket.get(), kWaitingViewers) != 0) fail("cannot listen on " + reached);
}

Listener::~Listener() {
  if (!path.empty() && socket.get() >= 0) unlink(path.c_str());
}

Listener Listener::onPort(const std::string& address, bool anyone) {
  const Addresses found = lookUp(address);
  if (!anyone && !isLoopback(found->ai_addr))
    throw UsageError("other machines can reach " + address +
                     ", without a password and unencrypted: use ssh -L, or say --anyone");
  Descriptor socket(
      ::socket(found->ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, IPPROTO_TCP));
  const int on = 1;
  setsockopt(socket.get(), SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
  if (bind(socket.get(), found->ai_addr, found->ai_addrlen) != 0)
    fail("cannot listen on " + address);
  std::string reached = textOf(socket.get());
  return {std::move(socket), std::move(reached), {}};
}

Listener Listener::onPath(const std::string& path) {
  const sockaddr_un address = pathAddress(path);
  removeAbandoned(address);
  Descriptor socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
  constexpr mode_t kOwnerOnly = 0177;
  const mode_t before = umask(kOwnerOnly);
  const int result =
      bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address);
  umask(before);
  if (result != 0) fail("cannot listen on " + path);
  return {std::move(socket), path, path};
}

Descriptor Listener::accept() const {
  Descriptor viewer(accept4(socket.get(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC));
  if (viewer.get() >= 0 && path.empty()) {
    const int on = 1;
    setsockopt(viewer.get(), IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
  }
  return viewer;
}

}  // namespace tool::live
