// SPDX-License-Identifier: MIT
//
// One viewer without its socket: what it asked for, what it does not have yet, and the updates
// that it gets.

#ifndef RASTER_TOOLS_LIVE_SESSION_H
#define RASTER_TOOLS_LIVE_SESSION_H

#include <optional>
#include <string>

#include "encodings.h"
#include "liveCursor.h"
#include "owed.h"
#include "pixelView.h"
#include "pngEncoder.h"
#include "protocol.h"
#include "viewerFormat.h"
#include "zrleEncoder.h"

namespace tool::live {

/// What viewers do with the pointer and the keys.
class InputSink {
 public:
  virtual ~InputSink() = default;
  virtual void key(bool down, uint32 keySymbol) = 0;
  virtual void pointer(uint32 buttons, const Point& at) = 0;
};

/// What there is to be seen.
struct Scene {
  PixelView pixels;
  const LiveCursor* cursor;  // null when the screen does not tell
  uint32 cursorSerial;       // another one for every other shape
  Rect cursorBox;            // where it is drawn for viewers that do not draw it
  Point pointer;
};

class Session : private ProtocolEvents {
 public:
  /// `input` may be null: the viewer then only looks.
  Session(uint32 width, uint32 height, std::string name, InputSink* input);

  static void greet(Bytes& out) { Protocol::greet(out); }
  /// Takes bytes from the viewer; answers go to `out`. False: it is to be dropped, for fault().
  bool receive(const uint8* bytes, size_t count, Bytes& out) {
    return protocol.receive(bytes, count, out);
  }
  const std::string& fault() const { return protocol.fault(); }
  bool isWithinMessage() const { return protocol.isWithinMessage(); }

  /// Whether it waits for an update.
  bool isWaiting() const { return asked.has_value(); }
  /// Whether its pictures need the cursor in them.
  bool needsDrawnCursor() const { return !drawsCursor(); }
  bool needsPointer() const { return needsDrawnCursor() || understood.pointerPosition; }

  /// Whether it can move what it has.
  bool takesMoves() const { return understood.copyRect; }
  void addChanges(const Changes& changes);
  /// The picture has another size from now on. False when the viewer cannot be told.
  bool resize(uint32 width, uint32 height);

  /// Answers the viewer's request when there is something to say; false without one.
  bool putUpdate(const Scene& scene, Bytes& out);

  uint64 sentPixels() const { return pixelsSent; }
  uint64 movedPixels() const { return pixelsMoved; }

 private:
  /// What the viewer says it understands.
  struct Understood {
    int32 pixels = kRaw;  // the first one of its list that is known here
    bool choseOne = false;
    bool copyRect = false;
    bool desktopSize = false;
    bool cursor = false;
    bool cursorWithAlpha = false;
    bool pointerPosition = false;
  };

  void onStart(Bytes& out) override;
  void onFormat(const PixelFormat& wanted) override;
  void onEncodingsBegin() override { understood = {}; }
  void onEncoding(int32 encoding) override;
  void onEncodingsEnd() override {}
  bool onRequest(const UpdateRequest& request) override;
  void onKey(bool down, uint32 keySymbol) override;
  void onPointer(uint32 buttons, const Point& at) override;

  bool drawsCursor() const { return understood.cursor || understood.cursorWithAlpha; }
  void followDrawnCursor(const Scene& scene);
  void putNewSize(Bytes& out);
  uint32 putCursorRects(const Scene& scene, Bytes& out);
  uint32 putMoves(Bytes& out);
  uint32 putPixels(const PixelView& pixels, const Rect& rect, Bytes& out);
  void putOne(const PixelView& pixels, const Rect& rect, Bytes& out);

  Protocol protocol{*this};
  std::string title;
  InputSink* sink;
  ViewerFormat format;
  Understood understood;
  ZrleEncoder zrle;
  PngEncoder png;
  bool isStarted = false;  // it knows the picture's size
  bool owesColorMap = false;
  bool owesSize = false;
  Owed owed;
  Rect everShown;  // all sizes that the viewer may still take for the picture's
  std::optional<Rect> asked;
  uint32 sentCursor = 0;
  Point sentPointer = {-1, -1};
  Rect drawnBox = {};
  uint32 drawnSerial = 0;
  uint64 pixelsSent = 0;
  uint64 pixelsMoved = 0;
};

}  // namespace tool::live

#endif
