// SPDX-License-Identifier: MIT

#include "session.h"

#include <algorithm>
#include <utility>

#include "cursorRects.h"

namespace tool::live {
namespace {

constexpr uint32 kFramebufferUpdate = 0;
/// As many pixels take fewer bytes, compressed, than another rectangle.
constexpr uint64 kCheapPixels = 1024;

/// Begins an update; the number of its rectangles is stored at the returned place later.
size_t beginUpdate(Bytes& out) {
  out.put8(kFramebufferUpdate);
  out.put8(0);
  out.put16(0);
  return out.size() - 2;
}

}  // namespace

Session::Session(uint32 width, uint32 height, std::string name, InputSink* input)
    : title(std::move(name)), sink(input), owed(width, height), everShown(owed.bounds()) {}

void Session::addChanges(const Changes& changes) {
  if (takesMoves()) {
    owed.add(changes, drawnBox);
  } else {
    owed.add(changes.all);
  }
}

bool Session::resize(uint32 width, uint32 height) {
  owed = Owed(width, height);
  const Rect now = owed.bounds();
  Rect_Union(&everShown, &now);
  drawnBox = {};
  owesSize = isStarted;
  return !isStarted || understood.desktopSize;
}

void Session::onStart(Bytes& out) {
  isStarted = true;
  const Rect area = owed.bounds();
  out.put16(widthOf(area));
  out.put16(heightOf(area));
  putPixelFormat(out, standardFormat());
  out.put32(static_cast<uint32>(title.size()));
  out.append(title.data(), title.size());
}

void Session::onFormat(const PixelFormat& wanted) {
  format = ViewerFormat(wanted);
  owesColorMap = format.needsColorMap();
  sentCursor = 0;  // its pixels are in the new format from now on
}

void Session::onEncoding(int32 encoding) {
  switch (encoding) {
    case kRaw:
    case kZrle:
    case kTightPng:
      if (!std::exchange(understood.choseOne, true)) understood.pixels = encoding;
      break;
    case kCopyRect:
      understood.copyRect = true;
      break;
    case kDesktopSize:
      understood.desktopSize = true;
      break;
    case kCursor:
      understood.cursor = true;
      break;
    case kCursorWithAlpha:
      understood.cursorWithAlpha = true;
      break;
    case kPointerPosition:
      understood.pointerPosition = true;
      break;
    default:
      if (encoding < kCompressLevel0 || encoding > kCompressLevel9) break;
      zrle.setLevel(encoding - kCompressLevel0);
      png.setLevel(encoding - kCompressLevel0);
  }
}

bool Session::onRequest(const UpdateRequest& request) {
  if (isEmpty(request.area) || !Rect_ContainsRect(&everShown, &request.area)) return false;
  if (!asked) asked.emplace();
  Rect_Union(&*asked, &request.area);
  if (request.incremental) return true;
  owed.forgetMoves();
  owed.add(request.area);
  return true;
}

void Session::onKey(bool down, uint32 keySymbol) {
  if (sink != nullptr) sink->key(down, keySymbol);
}

void Session::onPointer(uint32 buttons, const Point& at) {
  sentPointer = at;  // it knows where it put the pointer
  if (sink != nullptr) sink->pointer(buttons, at);
}

/// Where the cursor was drawn and where it is now, the viewer lacks pixels.
void Session::followDrawnCursor(const Scene& scene) {
  const Rect box = needsDrawnCursor() && scene.cursor != nullptr ? scene.cursorBox : Rect{};
  if (Rect_IsEqual(&box, &drawnBox) && drawnSerial == scene.cursorSerial) return;
  owed.add(drawnBox);
  owed.add(box);
  drawnBox = box;
  drawnSerial = scene.cursorSerial;
}

/// An update of its own: what the viewer asked for was of the old size.
void Session::putNewSize(Bytes& out) {
  const size_t count = beginUpdate(out);
  const Rect area = owed.bounds();
  putRectHeader(out, area, kDesktopSize);
  storeBigEndian16(out.data() + count, 1);
  owesSize = false;
  asked.reset();
}

uint32 Session::putCursorRects(const Scene& scene, Bytes& out) {
  uint32 rects = 0;
  if (scene.cursor != nullptr && drawsCursor() && sentCursor != scene.cursorSerial) {
    if (understood.cursorWithAlpha) {
      putCursorWithAlpha(*scene.cursor, out);
    } else {
      putCursor(*scene.cursor, format, out);
    }
    sentCursor = scene.cursorSerial;
    ++rects;
  }
  const bool hasMoved = scene.pointer.x != sentPointer.x || scene.pointer.y != sentPointer.y;
  const Rect area = owed.bounds();
  if (understood.pointerPosition && hasMoved && Rect_ContainsPoint(&area, &scene.pointer)) {
    putRectHeader(out, static_cast<uint32>(scene.pointer.x), static_cast<uint32>(scene.pointer.y),
                  0, 0, kPointerPosition);
    sentPointer = scene.pointer;
    ++rects;
  }
  return rects;
}

void Session::putOne(const PixelView& pixels, const Rect& rect, Bytes& out) {
  putRectHeader(out, rect, understood.pixels);
  if (understood.pixels == kZrle) {
    zrle.put(pixels, rect, format, out);
  } else if (understood.pixels == kTightPng) {
    png.put(pixels, rect, out);
  } else {
    const uint32 pitch = widthOf(rect) * format.bytesPerPixel();
    uint8* rows = out.extend(size_t{pitch} * heightOf(rect));
    format.convert(rows, pitch, pixels, rect);
  }
}

/// Returns the number of rectangles.
uint32 Session::putMoves(Bytes& out) {
  if (!takesMoves()) owed.forgetMoves();
  const std::vector<Move> moves = owed.takeMoves(*asked);
  for (const Move& move : moves) {
    const Rect from = move.from();
    putRectHeader(out, move.to, kCopyRect);
    out.put16(static_cast<uint32>(from.left));
    out.put16(static_cast<uint32>(from.top));
    pixelsMoved += areaOf(move.to);
  }
  return static_cast<uint32>(moves.size());
}

/// Cuts a rectangle into bands where it is too large for one, and returns their number.
uint32 Session::putPixels(const PixelView& pixels, const Rect& rect, Bytes& out) {
  const auto most = static_cast<int32>(std::max(1u, PngEncoder::kMostPixels / widthOf(rect)));
  const int32 step = understood.pixels == kTightPng ? most : rect.bottom - rect.top;
  uint32 rects = 0;
  for (int32 top = rect.top; top < rect.bottom; top += step, ++rects)
    putOne(pixels, {rect.left, top, rect.right, std::min(top + step, rect.bottom)}, out);
  pixelsSent += areaOf(rect);
  return rects;
}

bool Session::putUpdate(const Scene& scene, Bytes& out) {
  if (!asked) return false;
  if (owesSize) {
    putNewSize(out);
    return true;
  }
  followDrawnCursor(scene);
  const size_t before = out.size();
  if (owesColorMap) ViewerFormat::putColorMap(out);
  const size_t count = beginUpdate(out);
  uint32 rects = putCursorRects(scene, out) + putMoves(out);
  std::vector<Rect> lacking = owed.pixelsWithin(*asked);
  joinNear(lacking, understood.pixels == kRaw ? 0 : kCheapPixels);
  for (const Rect& rect : lacking) rects += putPixels(scene.pixels, rect, out);
  if (rects == 0) {
    out.truncate(before);
    return false;
  }
  storeBigEndian16(out.data() + count, rects);
  owesColorMap = false;
  owed.subtractPixels(*asked);
  asked.reset();
  return true;
}

}  // namespace tool::live
