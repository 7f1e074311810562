// SPDX-License-Identifier: MIT
//
// A viewer at the other end of a socket. What it does not read is kept: at most one update, since
// it gets no further one before.

#ifndef RASTER_TOOLS_LIVE_CONNECTION_H
#define RASTER_TOOLS_LIVE_CONNECTION_H

#include <memory>
#include <string>

#include "listener.h"
#include "session.h"

namespace tool::live {

class Connection {
 public:
  Connection(Descriptor to, uint32 number, uint32 width, uint32 height, const std::string& title,
             std::unique_ptr<InputSink> input);

  int descriptor() const { return socket.get(); }
  Session& viewer() { return session; }
  const Session& viewer() const { return session; }
  bool hasUnsent() const { return sent < out.size(); }
  /// Whether it waits for an update and one can be made for it.
  bool isReady() const { return session.isWaiting() && !hasUnsent(); }
  uint64 sentBytes() const { return bytesSent; }

  // Each returns false when the viewer has left or is to be dropped; a drop is said in a line.
  bool receive();
  bool flush();
  bool update(const Scene& scene);
  /// Says why the viewer is dropped; false.
  bool drop(const std::string& why) const;

 private:
  bool leave() const;

  Descriptor socket;
  uint32 id;
  std::unique_ptr<InputSink> sink;
  Session session;
  Bytes out;
  size_t sent = 0;
  uint64 bytesSent = 0;
};

}  // namespace tool::live

#endif
