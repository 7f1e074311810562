// SPDX-License-Identifier: MIT
//
// What a viewer says, byte by byte: the greeting of RFB 3.3, 3.7 and 3.8 (RFC 6143) and the
// messages after it. Knows no socket. Nothing is kept of a message but its fixed part, so that a
// viewer cannot make the server hold more than a few bytes.

#ifndef RASTER_TOOLS_LIVE_PROTOCOL_H
#define RASTER_TOOLS_LIVE_PROTOCOL_H

#include <string>

#include "bytes.h"
#include "viewerFormat.h"

namespace tool::live {

struct UpdateRequest {
  bool incremental;
  Rect area;
};

/// Who is told what a viewer says.
class ProtocolEvents {
 public:
  virtual ~ProtocolEvents() = default;
  /// The viewer waits for the server's description of the picture, which goes to `out`.
  virtual void onStart(Bytes& out) = 0;
  virtual void onFormat(const PixelFormat& format) = 0;
  /// A new list of encodings begins, the best one first.
  virtual void onEncodingsBegin() = 0;
  virtual void onEncoding(int32 encoding) = 0;
  virtual void onEncodingsEnd() = 0;
  /// False when the request makes no sense.
  virtual bool onRequest(const UpdateRequest& request) = 0;
  virtual void onKey(bool down, uint32 keySymbol) = 0;
  virtual void onPointer(uint32 buttons, const Point& at) = 0;
};

class Protocol {
 public:
  explicit Protocol(ProtocolEvents& told) : events(told) {}

  /// The server speaks first.
  static void greet(Bytes& out);

  /// Takes bytes from the viewer; answers go to `out`. False when they make no sense: fault() then
  /// says what was wrong, and nothing more is to be given.
  bool receive(const uint8* bytes, size_t count, Bytes& out);

  /// Whether the bytes so far end within a message or before the pictures begin.
  bool isWithinMessage() const { return step != Step::message || heldBytes != 0; }
  const std::string& fault() const { return what; }

 private:
  enum class Step { greeting, security, clientInit, message, encodings, skip };

  size_t needed() const;
  bool take(const uint8* piece, Bytes& out);
  bool takeGreeting(const uint8* text, Bytes& out);
  bool takeSecurity(uint32 type, Bytes& out);
  void takeInit(Bytes& out);
  bool takeMessage(const uint8* message);
  bool takeFormat(const uint8* message);
  bool takeRequest(const uint8* message);
  void takeEncodings(const uint8* message);
  void takeOneEncoding(const uint8* word);
  void skipText(const uint8* message);
  bool nonsense(std::string why);

  ProtocolEvents& events;
  Step step = Step::greeting;
  uint32 minorVersion = 8;
  uint32 remaining = 0;               // encodings that follow, or bytes to be skipped
  uint8 held[4 + kPixelFormatBytes];  // the beginning of a piece that is not whole yet
  size_t heldBytes = 0;
  std::string what;
};

}  // namespace tool::live

#endif
