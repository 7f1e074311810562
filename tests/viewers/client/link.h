// SPDX-License-Identifier: MIT
//
// A byte stream to a server, over TCP or a UNIX socket. Numbers are big-endian, as the protocol has
// them.

#ifndef VIEWERS_LINK_H
#define VIEWERS_LINK_H

#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

namespace viewers {

/// The server closed the stream, kept silent for too long, or said what the protocol does not
/// allow.
struct Broken : std::runtime_error {
  using std::runtime_error::runtime_error;
};

class Link {
 public:
  /// `address` is HOST:PORT, or the path of a UNIX socket (with a slash). Throws Broken.
  Link(const std::string& address, int patienceMilliseconds);
  ~Link();
  Link(const Link&) = delete;
  Link& operator=(const Link&) = delete;

  /// True when there is something to read within the time; the end of the stream counts.
  bool readable(int milliseconds);
  void read(uint8_t* to, size_t size);
  std::vector<uint8_t> read(size_t size);
  uint8_t read8();
  uint16_t read16();
  uint32_t read32();
  void write(const std::vector<uint8_t>& bytes) const;
  /// Bytes that were taken from the socket so far.
  uint64_t received() const { return received_; }

 private:
  void fill();

  int socket_;
  int patience_;
  uint64_t received_ = 0;
  std::vector<uint8_t> buffer_;
  size_t next_ = 0;
  size_t end_ = 0;
};

/// A message under construction.
class Message {
 public:
  Message& add8(unsigned value);
  Message& add16(unsigned value);
  Message& add32(uint32_t value);
  Message& add(const std::string& text);
  const std::vector<uint8_t>& bytes() const { return bytes_; }

 private:
  std::vector<uint8_t> bytes_;
};

}  // namespace viewers

#endif
