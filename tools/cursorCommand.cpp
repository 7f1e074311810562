// SPDX-License-Identifier: MIT
//
// cursor: a mouse cursor drawn into a picture, of pixels with alpha or of two bit planes.

#include <memory>
#include <vector>

#include "commands.h"
#include "cursorImage.h"
#include "drawing.h"
#include "geometry.h"
#include "imageOptions.h"
#include "numbers.h"
#include "picture.h"

namespace tool {
namespace {

struct CursorOptions {
  std::string destination;
  OutputOptions output;
  std::string image;
  std::vector<std::string> planes;
  Point at = {0, 0};
  Point hotSpot = {0, 0};
  double scale = 1;
};

void checkSize(const Picture& picture, const std::string& path) {
  if (!isCursorSize(picture.width(), picture.height()))
    throw Failure("'" + path + "' is too large for a cursor");
}

CursorImage alphaCursor(const CursorOptions& options) {
  Picture picture = Picture::loadAs(32, options.image, true);
  checkSize(picture, options.image);
  premultiply(picture);
  std::vector<uint32> pixels(size_t{picture.width()} * picture.height());
  Raster_RectCopy(reinterpret_cast<uint8*>(pixels.data()), 4 * picture.width(), picture.data(),
                  picture.pitch(), 4, 0, 0, 0, 0, picture.width(), picture.height());
  return CursorImage::ofPixels(picture.width(), picture.height(), options.hotSpot,
                               std::move(pixels));
}

/// One bit a pixel, the highest first; set where the picture's green is bright.
std::vector<uint8> bitPlane(const Picture& picture) {
  const uint32 pitch = Raster_CalculateCursorSize(picture.width(), 1, 1);
  std::vector<uint8> bits(size_t{pitch} * picture.height());
  for (uint32 y = 0; y < picture.height(); ++y) {
    const uint8* row = picture.data() + size_t{picture.pitch()} * y;
    for (uint32 x = 0; x < picture.width(); ++x) {
      constexpr int kGreen = 1;
      const bool isSet = row[4 * x + kGreen] >= 0x80;
      if (isSet) bits[size_t{pitch} * y + x / 8] |= static_cast<uint8>(0x80 >> x % 8);
    }
  }
  return bits;
}

CursorImage maskCursor(const CursorOptions& options) {
  const Picture andPlane = Picture::loadAs(32, options.planes[0]);
  const Picture xorPlane = Picture::loadAs(32, options.planes[1]);
  const Rect andBounds = andPlane.bounds();
  const Rect xorBounds = xorPlane.bounds();
  if (!Rect_IsSizeEqual(&andBounds, &xorBounds))
    throw Failure("the two planes are not of one size");
  checkSize(andPlane, options.planes[0]);
  return CursorImage::ofBitPlanes(andPlane.width(), andPlane.height(), options.hotSpot,
                                  bitPlane(andPlane), bitPlane(xorPlane));
}

int drawCursor(const CursorOptions& options) {
  const SaveOptions saving = options.output.forSave();
  Picture picture = Picture::loadAs(32, options.destination);
  CursorImage cursor = options.image.empty() ? maskCursor(options) : alphaCursor(options);
  cursor.scaleBy(options.scale);
  if (!cursor.drawOn(picture, options.at))
    throw Failure("at " + std::to_string(options.at.x) + "," + std::to_string(options.at.y) +
                  " nothing of the cursor lies on the destination");
  save(picture, options.output.path, saving);
  return kSuccess;
}

}  // namespace

void addCursorCommand(Commands& commands) {
  auto options = std::make_shared<CursorOptions>();
  Command command = commands.add("cursor", "Draws a mouse cursor into a picture.",
                                 [options] { return drawCursor(*options); });
  command.add("DST", options->destination, "the PNG picture to draw on").required();
  options->output.addTo(command);
  OptionList kind = command.addChoice("kind", "What the cursor is made of, one of");
  kind.add("--image", options->image, "a PNG picture with alpha").form("FILE");
  kind.add("--planes", options->planes,
           "two PNG pictures, white where a bit is set: the screen is kept where the first "
           "one is set, and inverted where the second one then is")
      .values(2)
      .form("AND XOR");
  command.addParsed("--at", options->at, parsePoint, "X,Y", "where the hot spot goes");
  command.addParsed("--hot", options->hotSpot, parsePoint, "X,Y",
                    "the hot spot, in pixels of the cursor");
  command.add("--scale", options->scale, "draw it larger or smaller").check(finiteNumber(0.1, 16));
}

}  // namespace tool
