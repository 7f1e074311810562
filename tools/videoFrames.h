// SPDX-License-Identifier: MIT
//
// Frames of uncompressed video: how they lie in a file, one after the other out of a stream, and
// what the library needs to know to convert one.

#ifndef RASTER_TOOLS_VIDEO_FRAMES_H
#define RASTER_TOOLS_VIDEO_FRAMES_H

#include <optional>
#include <string>
#include <vector>

#include "geometry.h"
#include "inputStream.h"
#include "picture.h"

namespace tool {

/// A frame layout under the name that other programs give it, or of the library's own order.
struct VideoLayout {
  std::string name;
  uint32 code;    ///< the library's layout that it is brought into
  bool isPlanar;  ///< Y, then two planes of colour differences; otherwise groups of four bytes
  bool swapsDifferences;
  bool hasPaddedPlanes;  ///< rows and columns of luma are rounded up to even numbers, as in the
                         ///< library
};

/// Usual names in upper or lower case, and those of FFmpeg. With `libraryOrder` only the three
/// names of the library, with its roles of the differences. A usage error lists the names.
VideoLayout videoLayout(const std::string& name, bool libraryOrder);
std::string videoLayoutNames();

uint64 frameBytes(const VideoLayout& layout, const Size& size);

/// A frame as a picture of the code 15, 16, 24 or 32.
Picture decodeFrame(const VideoLayout& layout, const Size& size, const std::vector<uint8>& frame,
                    uint32 code);

/// Frames of a stream, one at a time: raw ones, or those of a YUV4MPEG2 file, which says itself
/// what they are.
class FrameReader {
 public:
  FrameReader(InputStream& from, VideoLayout raw, const Size& size);
  explicit FrameReader(InputStream& yuv4mpeg);

  /// The next frame; false at the end. Fails when the stream ends within a frame.
  bool read(std::vector<uint8>& frame);
  /// Goes forward to a frame by its number, counted from 0; false when there is none.
  bool goTo(uint64 wanted);

  /// How many frames there are, when that can be told beforehand.
  std::optional<uint64> total() const { return frames; }
  const VideoLayout& layout() const { return frameLayout; }
  const Size& size() const { return frameSize; }
  /// The number of the next frame.
  uint64 position() const { return number; }

 private:
  void countFrames();
  std::string readLine();
  bool atFrame();
  void parseHeader(const std::string& line);
  [[noreturn]] void endsWithinFrame() const;

  InputStream& input;
  VideoLayout frameLayout = {};
  Size frameSize = {};
  bool hasFrameHeaders = false;
  uint64 number = 0;
  std::optional<uint64> frames;
};

/// WxH of a frame, within what is converted.
Size parseFrameSize(const std::string& text);

}  // namespace tool

#endif
