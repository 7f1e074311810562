// SPDX-License-Identifier: MIT

#include "connection.h"

#include <sys/socket.h>

#include <cerrno>
#include <cstdio>
#include <utility>

namespace tool::live {
namespace {

bool wouldWait() { return errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR; }

}  // namespace

Connection::Connection(Descriptor to, uint32 number, uint32 width, uint32 height,
                       const std::string& title, std::unique_ptr<InputSink> input)
    : socket(std::move(to)),
      id(number),
      sink(std::move(input)),
      session(width, height, title, sink.get()) {
  Session::greet(out);
}

bool Connection::drop(const std::string& why) const {
  fprintf(stderr, "viewer %u dropped: %s\n", static_cast<unsigned>(id), why.c_str());
  return false;
}

bool Connection::leave() const {
  return session.isWithinMessage() ? drop("it left in mid-message") : false;
}

bool Connection::receive() {
  uint8 bytes[16384];
  const ssize_t count = recv(socket.get(), bytes, sizeof bytes, 0);
  if (count < 0) return wouldWait() || leave();
  if (count == 0) return leave();
  if (!session.receive(bytes, static_cast<size_t>(count), out)) return drop(session.fault());
  return flush();
}

bool Connection::flush() {
  while (hasUnsent()) {
    const ssize_t count = send(socket.get(), out.data() + sent, out.size() - sent, MSG_NOSIGNAL);
    if (count < 0) return wouldWait() || leave();
    sent += static_cast<size_t>(count);
    bytesSent += static_cast<uint64>(count);
  }
  out.clear();
  sent = 0;
  return true;
}

bool Connection::update(const Scene& scene) { return !session.putUpdate(scene, out) || flush(); }

}  // namespace tool::live
