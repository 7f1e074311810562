// SPDX-License-Identifier: MIT
//
// rop: a picture combined bit by bit with another, with a colour or with a tile.

#include <memory>
#include <optional>

#include "commands.h"
#include "drawing.h"
#include "geometry.h"
#include "imageOptions.h"
#include "names.h"
#include "picture.h"
#include "raster.h"

namespace tool {
namespace {

/// By number: our own name, and those of the X protocol and of Windows.
constexpr const char* kRopNames[RASTER_ROP_COUNT] = {"clear GXclear blackness",
                                                     "and GXand srcAnd",
                                                     "andReverse GXandReverse srcErase",
                                                     "copy GXcopy srcCopy source src",
                                                     "andInverted GXandInverted",
                                                     "noop GXnoop nop",
                                                     "xor GXxor srcInvert",
                                                     "or GXor srcPaint",
                                                     "nor GXnor notSrcErase",
                                                     "equiv GXequiv xnor",
                                                     "invert GXinvert dstInvert not",
                                                     "orReverse GXorReverse",
                                                     "copyInverted GXcopyInverted notSrcCopy",
                                                     "orInverted GXorInverted mergePaint",
                                                     "nand GXnand",
                                                     "set GXset whiteness"};

struct RopOptions {
  std::string destination;
  OutputOptions output;
  uint32 rop = RASTER_ROP_CLEAR;
  std::string source;
  Point at = {0, 0};
  std::optional<uint32> color;
  std::string tile;
  Point phase = {0, 0};
  uint32 code = 24;
};

void ropWithSource(Picture& picture, const RopOptions& options) {
  const Picture source = Picture::loadAs(options.code, options.source);
  const Placement placed = place(source, options.at, picture);
  Raster_RectROPcopy(picture.data(), static_cast<int32>(picture.pitch()), source.data(),
                     static_cast<int32>(source.pitch()), picture.bytesPerPixel(), placed.srcX,
                     placed.srcY, options.rop, static_cast<uint32>(placed.onTarget.left),
                     static_cast<uint32>(placed.onTarget.top), widthOf(placed.onTarget),
                     heightOf(placed.onTarget));
}

void ropWithColor(Picture& picture, const RopOptions& options) {
  const uint32 pixel =
      Raster_ConvertOnePixel(*options.color, 24, static_cast<int32>(options.code), false, nullptr);
  Raster_RectROPfill(picture.data(), static_cast<int32>(picture.pitch()), picture.bytesPerPixel(),
                     pixel, options.rop, 0, 0, picture.width(), picture.height());
}

void ropWithTile(Picture& picture, const RopOptions& options) {
  const Picture tile = Picture::loadAs(options.code, options.tile);
  Raster_RectPixmapROPcopy(picture.data(), picture.pitch(), tile.data(), tile.pitch(),
                           static_cast<int32>(picture.bytesPerPixel()),
                           static_cast<uint32>(options.phase.x),
                           static_cast<uint32>(options.phase.y), tile.width(), tile.height(),
                           options.rop, 0, 0, picture.width(), picture.height());
}

int rop(const RopOptions& options) {
  const SaveOptions saving = options.output.forSave();
  Picture picture = Picture::loadAs(options.code, options.destination);
  if (!options.source.empty()) ropWithSource(picture, options);
  if (options.color) ropWithColor(picture, options);
  if (!options.tile.empty()) ropWithTile(picture, options);
  save(picture, options.output.path, saving);
  return kSuccess;
}

uint32 parseRop(const std::string& text) { return numberOfName(text, kRopNames); }

Point parsePhase(const std::string& text) {
  const Point phase = parsePoint(text);
  if (phase.x < 0 || phase.y < 0) throw UsageError("a phase is not negative");
  return phase;
}

}  // namespace

void addRopCommand(Commands& commands) {
  auto options = std::make_shared<RopOptions>();
  Command command = commands.add(
      "rop",
      "Combines a picture with another, with a colour or with a tile by one of the sixteen raster "
      "operations.",
      [options] { return rop(*options); });
  command.add("DST", options->destination, "the PNG picture to draw on").required();
  options->output.addTo(command);
  command.addParsed("--op", options->rop, parseRop, "NAME|0-15", "the operation").required();
  OptionList from = command.addChoice("source", "What is combined with it, one of");
  Option source = from.add("--source", options->source, "a PNG picture").form("FILE");
  from.addParsed("--color,--colour", options->color, parseColor, "COLOUR",
                 "one colour: RRGGBB, #RGB, 0xRRGGBB");
  Option tile = from.add("--tile", options->tile, "a PNG picture that is repeated").form("FILE");
  command
      .addParsed("--at", options->at, parsePoint, "X,Y",
                 "where the top left corner of --source goes")
      .needs(source);
  command
      .addParsed("--phase", options->phase, parsePhase, "X,Y",
                 "the pixel of --tile that lands on the top left corner")
      .needs(tile);
  addDepth(command, options->code, {16, 24, 32}, "the pixel format to work in").withDefault();
  command.footer(
      "Operations, in upper or lower case; X11's and Windows' names are known as well: " +
      listOf(kRopNames));
}

}  // namespace tool
