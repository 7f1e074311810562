// SPDX-License-Identifier: MIT

#include "videoFrames.h"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <sstream>
#include <string>
#include <utility>

#include "failure.h"
#include "names.h"
#include "raster.h"
#include "rasterChecked.h"

namespace tool {
namespace {

/// The library takes the red difference first in a packed group, and last of the planes. Names of
/// one layout are separated by blanks; the first one is the usual one.
struct NamedLayout {
  const char* names;
  uint32 code;
  bool isPlanar;
  bool swapsDifferences;
};
constexpr NamedLayout kLayouts[] = {{"I420 IYUV yuv420p", RASTER_VIDEO_YV12, true, false},
                                    {"YV12", RASTER_VIDEO_YV12, true, true},
                                    {"YUY2 YUYV yuyv422", RASTER_VIDEO_YUY2, false, true},
                                    {"YVYU yvyu422", RASTER_VIDEO_YUY2, false, false},
                                    {"UYVY uyvy422", RASTER_VIDEO_UYVY, false, true},
                                    {"VYUY", RASTER_VIDEO_UYVY, false, false}};

bool isOfLibrary(const NamedLayout& layout) { return layout.swapsDifferences; }

constexpr uint32 even(uint32 side) { return (side + 1) & ~1u; }

/// A frame's planes, one after the other.
struct Planes {
  uint32 lumaPitch;
  uint32 lumaRows;
  uint32 chromaPitch;
  uint32 chromaRows;

  Planes(const Size& size, bool padded)
      : lumaPitch(padded ? even(size.width) : size.width),
        lumaRows(padded ? even(size.height) : size.height),
        chromaPitch((size.width + 1) / 2),
        chromaRows((size.height + 1) / 2) {}

  size_t lumaBytes() const { return size_t{lumaPitch} * lumaRows; }
  size_t chromaBytes() const { return size_t{chromaPitch} * chromaRows; }
  size_t bytes() const { return lumaBytes() + 2 * chromaBytes(); }
};

/// Luma with sides of even numbers (the last column and row are repeated), then the differences.
std::vector<uint8> libraryPlanes(const VideoLayout& layout, const Size& size,
                                 const std::vector<uint8>& frame) {
  const Planes from(size, layout.hasPaddedPlanes);
  const Planes to(size, true);
  std::vector<uint8> planes(to.bytes());
  for (uint32 y = 0; y < to.lumaRows; ++y) {
    const uint8* row = frame.data() + size_t{from.lumaPitch} * std::min(y, from.lumaRows - 1);
    uint8* out = planes.data() + size_t{to.lumaPitch} * y;
    std::copy_n(row, from.lumaPitch, out);
    out[to.lumaPitch - 1] = row[from.lumaPitch - 1];
  }
  const uint8* first = frame.data() + from.lumaBytes();
  const uint8* second = first + from.chromaBytes();
  if (layout.swapsDifferences) std::swap(first, second);
  std::copy_n(first, to.chromaBytes(), planes.data() + to.lumaBytes());
  std::copy_n(second, to.chromaBytes(), planes.data() + to.lumaBytes() + to.chromaBytes());
  return planes;
}

std::vector<uint8> libraryGroups(const VideoLayout& layout, std::vector<uint8> frame) {
  const size_t difference = layout.code == RASTER_VIDEO_YUY2 ? 1 : 0;
  if (layout.swapsDifferences)
    for (size_t i = difference; i + 2 < frame.size(); i += 4) std::swap(frame[i], frame[i + 2]);
  return frame;
}

/// The video conversion has its 5-5-5 fields one bit higher than every other function.
void lowerFields(std::vector<uint8>& pixels) {
  for (size_t i = 0; i + 1 < pixels.size(); i += 2) {
    const uint32 pixel = (uint32{pixels[i]} | uint32{pixels[i + 1]} << 8) >> 1;
    pixels[i] = static_cast<uint8>(pixel);
    pixels[i + 1] = static_cast<uint8>(pixel >> 8);
  }
}

constexpr uint32 kLargestFrameSide = 16384;

/// The side that a word of a YUV4MPEG2 header gives after its letter, or 0.
uint32 sideIn(const std::string& word) {
  uint32 side = 0;
  const char* end = word.data() + word.size();
  const auto [next, error] = std::from_chars(word.data() + 1, end, side);
  return error == std::errc() && next == end ? side : 0;
}

bool isFrameSize(const Size& size) {
  return size.width != 0 && size.height != 0 && size.width <= kLargestFrameSide &&
         size.height <= kLargestFrameSide;
}

}  // namespace

std::string videoLayoutNames() {
  std::string list;
  for (const NamedLayout& layout : kLayouts)
    list += (list.empty() ? "" : ", ") + firstOf(layout.names);
  return list;
}

VideoLayout videoLayout(const std::string& name, bool libraryOrder) {
  const auto* found =
      std::find_if(std::begin(kLayouts), std::end(kLayouts),
                   [&](const NamedLayout& layout) { return isOneOf(layout.names, name); });
  if (found == std::end(kLayouts))
    throw UsageError("there is no video format '" + name + "'; the names are " +
                     videoLayoutNames());
  if (libraryOrder && !isOfLibrary(*found))
    throw UsageError("the library's own order has no format '" + name +
                     "'; its names are YV12, YUY2 and UYVY");
  return {firstOf(found->names), found->code, found->isPlanar,
          found->swapsDifferences && !libraryOrder, libraryOrder};
}

uint64 frameBytes(const VideoLayout& layout, const Size& size) {
  if (layout.isPlanar) return Planes(size, layout.hasPaddedPlanes).bytes();
  return uint64{size.height} * 2 * even(size.width);
}

Picture decodeFrame(const VideoLayout& layout, const Size& size, const std::vector<uint8>& frame,
                    uint32 code) {
  Picture picture(size.width, size.height, code);
  const std::vector<uint8> source =
      layout.isPlanar ? libraryPlanes(layout, size, frame) : libraryGroups(layout, frame);
  const Size whole = {even(size.width), layout.isPlanar ? even(size.height) : size.height};
  const uint32 rowBytes = whole.width * picture.bytesPerPixel();
  std::vector<uint8> rows(size_t{rowBytes} * whole.height);
  const RasterView view = {rows.data(),  rows.size(),          rowBytes,          whole.width,
                           whole.height, picture.record.depth, picture.record.bpp};
  const RasterStatus status =
      RasterChecked_YuvToRgb(&view, source.data(), source.size(), layout.code);
  if (status != RASTER_STATUS_OK)
    throw Failure(std::string("cannot convert a frame: ") + RasterChecked_Text(status));
  if (code == 15) lowerFields(rows);
  Raster_RectCopy(picture.data(), picture.pitch(), rows.data(), rowBytes, picture.bytesPerPixel(),
                  0, 0, 0, 0, size.width, size.height);
  return picture;
}

FrameReader::FrameReader(InputStream& from, VideoLayout raw, const Size& size)
    : input(from), frameLayout(std::move(raw)), frameSize(size) {
  countFrames();
}

/// What can be known of a file before it is read, its damage included.
void FrameReader::countFrames() {
  const auto bytes = input.left();
  if (!bytes) return;
  const uint64 each = frameBytes(frameLayout, frameSize);
  frames = *bytes / each;
  if (*bytes % each != 0)
    throw Failure(input.name() + " holds " + std::to_string(*frames) + " whole frames of " +
                  std::to_string(each) + " bytes and " + std::to_string(*bytes % each) +
                  " bytes more");
}

FrameReader::FrameReader(InputStream& yuv4mpeg) : input(yuv4mpeg), hasFrameHeaders(true) {
  parseHeader(readLine());
}

/// A line of a YUV4MPEG2 file without its end; empty at the end of the file.
std::string FrameReader::readLine() {
  constexpr size_t kLongestLine = 4096;
  std::string line;
  for (uint8 letter = 0; line.size() < kLongestLine; line += static_cast<char>(letter))
    if (input.read(&letter, 1) == 0 || letter == '\n') break;
  return line;
}

void FrameReader::parseHeader(const std::string& line) {
  std::istringstream words(line);
  std::string word;
  std::string chroma = "420";
  if (!(words >> word) || word != "YUV4MPEG2")
    throw Failure(input.name() + " is no YUV4MPEG2 video; raw video needs --format and --size");
  while (words >> word) {
    if (word[0] == 'W') frameSize.width = sideIn(word);
    if (word[0] == 'H') frameSize.height = sideIn(word);
    if (word[0] == 'C') chroma = word.substr(1);
  }
  if (!isFrameSize(frameSize)) throw Failure(input.name() + " has frames of no sound size");
  static constexpr const char* kSupported[] = {"420", "420jpeg", "420mpeg2", "420paldv"};
  if (std::find(std::begin(kSupported), std::end(kSupported), chroma) == std::end(kSupported))
    throw Failure(input.name() + " has frames of the kind " + chroma +
                  "; only 4:2:0 in 8 bits is "
                  "read");
  frameLayout = videoLayout("I420", false);
}

/// Reads what stands before a frame; false at the end.
bool FrameReader::atFrame() {
  if (!hasFrameHeaders) return true;
  const std::string line = readLine();
  if (line.empty()) return false;
  if (line.compare(0, 5, "FRAME") != 0)
    throw Failure(input.name() + " has no frame where frame " + std::to_string(number) +
                  " should be");
  return true;
}

void FrameReader::endsWithinFrame() const {
  throw Failure(input.name() + " ends within frame " + std::to_string(number));
}

bool FrameReader::read(std::vector<uint8>& frame) {
  if (!atFrame()) return false;
  frame.resize(static_cast<size_t>(frameBytes(frameLayout, frameSize)));
  const size_t actual = input.read(frame.data(), frame.size());
  if (actual == 0 && !hasFrameHeaders) return false;
  if (actual < frame.size()) endsWithinFrame();
  ++number;
  return true;
}

bool FrameReader::goTo(uint64 wanted) {
  const uint64 each = frameBytes(frameLayout, frameSize);
  if (frames) {
    if (wanted >= *frames || !input.skip((wanted - number) * each)) return false;
    number = wanted;
  }
  for (; number < wanted; ++number)
    if (!atFrame() || !input.skip(each)) return false;
  return true;
}

Size parseFrameSize(const std::string& text) {
  const Size size = parseSize(text);
  if (!isFrameSize(size))
    throw UsageError("no side of a frame may be over " + std::to_string(kLargestFrameSide));
  return size;
}

}  // namespace tool
