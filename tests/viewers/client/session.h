// SPDX-License-Identifier: MIT
//
// One viewer: the greeting, the requests, and a picture that follows the server's updates.

#ifndef VIEWERS_SESSION_H
#define VIEWERS_SESSION_H

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "link.h"
#include "picture.h"
#include "rectangles.h"

namespace viewers {

/// A cursor's image as the server sent it.
struct CursorImage {
  int width = 0, height = 0, hotX = 0, hotY = 0;
  /// One word a pixel: alpha, red, green, blue, premultiplied. A pixel outside the mask is 0.
  std::vector<uint32_t> pixels;
  /// It came with a mask and without alpha.
  bool isMasked = false;
};

struct Counters {
  uint64_t updates = 0;
  uint64_t pixels = 0;                     // that came, not those that were there and moved
  std::map<int32_t, uint64_t> rectangles;  // by encoding
};

class Session {
 public:
  /// Greets the server in a version of the protocol ("3.3", "3.7" or "3.8"), shares the screen.
  Session(Link& link, const std::string& version);

  int width() const { return picture_.width(); }
  int height() const { return picture_.height(); }
  const std::string& name() const { return name_; }
  /// The pixels are in `format()`.
  const Picture& picture() const { return picture_; }
  const PixelFormat& format() const { return format_; }
  const std::optional<CursorImage>& cursor() const { return cursor_; }
  const Counters& counters() const { return counters_; }

  /// Everything from now on comes in this format. To be called between an update and the request
  /// for the next one, so that it is clear which updates have which format.
  void useFormat(const PixelFormat& format);
  void useEncodings(const std::vector<int32_t>& encodings);
  void request(bool incremental);
  void request(bool incremental, Box box);
  void movePointer(int x, int y, int buttons);
  void pressKey(uint32_t key, bool down);

  /// Reads the next message of the server; true when it was an update of the picture.
  bool readMessage();

 private:
  void greet(const std::string& version);
  void readServerFormat();
  bool readUpdate();
  bool readRectangle();
  void readCursor(Box box);
  void readCursorWithAlpha(Box box);

  Link& link_;
  Inflater inflater_;
  PixelFormat format_;
  Picture picture_;
  std::string name_;
  std::optional<CursorImage> cursor_;
  Counters counters_;
};

}  // namespace viewers

#endif
