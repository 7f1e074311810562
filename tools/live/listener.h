// SPDX-License-Identifier: MIT
//
// Where viewers knock: a TCP port or a UNIX socket.

#ifndef RASTER_TOOLS_LIVE_LISTENER_H
#define RASTER_TOOLS_LIVE_LISTENER_H

#include <string>

namespace tool::live {

/// A file descriptor that is closed when it goes out of scope.
class Descriptor {
 public:
  Descriptor() = default;
  explicit Descriptor(int owned) : number(owned) {}
  ~Descriptor();
  Descriptor(Descriptor&& from) noexcept;
  Descriptor& operator=(Descriptor&& from) noexcept;
  int get() const { return number; }

 private:
  int number = -1;
};

class Listener {
 public:
  /// HOST:PORT, an address in numbers or "localhost"; port 0 chooses a free one. Unless anyone may
  /// come, an address that other machines can reach is a usage error.
  static Listener onPort(const std::string& address, bool anyone);
  /// A UNIX socket for this user only; it is removed at the end.
  static Listener onPath(const std::string& path);

  ~Listener();
  Listener(Listener&&) noexcept = default;
  Listener& operator=(Listener&&) = delete;

  int descriptor() const { return socket.get(); }
  /// Where viewers reach it.
  const std::string& address() const { return reached; }
  /// The next viewer, or a descriptor below 0 when nobody is there.
  Descriptor accept() const;

 private:
  Listener(Descriptor owned, std::string where, std::string owns);

  Descriptor socket;
  std::string reached;
  std::string path;  // to be removed
};

}  // namespace tool::live

#endif
