// SPDX-License-Identifier: MIT
//
// The form of a recording: what docs/live.md describes, written and read.

#ifndef RASTER_TOOLS_LIVE_RECORDING_H
#define RASTER_TOOLS_LIVE_RECORDING_H

#include <optional>
#include <string>
#include <vector>

#include "bytes.h"
#include "pixelView.h"

namespace tool::live {

/// Writes into memory, from where the caller takes the bytes.
class RecordingWriter {
 public:
  static void putHeader(uint32 width, uint32 height, Bytes& out);
  /// One update: the pixels of rectangles, `time` microseconds after the start.
  void putUpdate(uint64 time, const PixelView& pixels, const std::vector<Rect>& rects, Bytes& out);
  /// From here on the picture has another size, and is black.
  static void putSize(uint64 time, uint32 width, uint32 height, Bytes& out);

 private:
  void putRect(const PixelView& pixels, const Rect& rect, Bytes& out);

  std::vector<uint8> rows;
};

/// Plays a recording from memory that must outlive it.
class RecordingReader {
 public:
  /// `fault()` says when this is no recording.
  RecordingReader(const uint8* bytes, size_t size);

  const std::string& fault() const { return what; }
  bool isAtEnd() const { return at == end || next != nullptr; }
  /// Whether the file ends within an update; otherwise a fault is damage.
  bool isBrokenOff() const { return brokenOff; }
  size_t position() const { return static_cast<size_t>(at - start); }

  /// The time of the next update, or nothing at the end or where the recording is broken off or
  /// damaged, which fault() then tells. What is told has been checked as a whole.
  std::optional<uint64> nextTime();
  /// Draws it.
  void drawNext();

  PixelView picture() const { return {pixels.data(), 4 * width, width, height}; }

 private:
  struct Part {
    Rect rect;
    const uint8* block;
    uint32 blockBytes;  // 0: a new size
  };
  bool readHeader();
  void readUpdate();
  bool readParts();
  bool checkPart(const Part& part);
  void draw(const Part& part);
  void resize(uint32 newWidth, uint32 newHeight);

  const uint8* start;
  const uint8* at;
  const uint8* end;
  const uint8* next = nullptr;  // after the update that was read
  uint64 time = 0;
  std::vector<Part> parts;
  uint32 width = 0;
  uint32 height = 0;
  std::vector<uint8> pixels;
  std::string what;
  bool brokenOff = false;
};

}  // namespace tool::live

#endif
