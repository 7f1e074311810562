// SPDX-License-Identifier: MIT
//
// blend: a picture with an alpha channel composited over another.

#include <memory>
#include <optional>

#include "commands.h"
#include "drawing.h"
#include "geometry.h"
#include "imageOptions.h"
#include "names.h"
#include "numbers.h"
#include "picture.h"
#include "raster.h"

namespace tool {
namespace {

/// By number: our own name, and others in use.
constexpr const char* kOperatorNames[RASTER_BLEND_COUNT] = {"clear",
                                                            "source src copy",
                                                            "destination dst",
                                                            "over sourceOver srcOver",
                                                            "overReverse destinationOver dstOver",
                                                            "in sourceIn srcIn",
                                                            "inReverse destinationIn dstIn",
                                                            "out sourceOut srcOut",
                                                            "outReverse destinationOut dstOut",
                                                            "atop sourceAtop srcAtop",
                                                            "atopReverse destinationAtop dstAtop",
                                                            "xor",
                                                            "add plus lighter",
                                                            "saturate"};

struct BlendOptions {
  std::string destination;
  std::string source;
  OutputOptions output;
  uint32 op = RASTER_BLEND_OVER;
  std::optional<uint32> srcAlpha;
  std::optional<uint32> dstAlpha;
  Point at = {0, 0};
  uint32 code = 32;
  bool staged = false;
};

int blend(const BlendOptions& options) {
  const SaveOptions saving = options.output.forSave();
  if (options.op == RASTER_BLEND_SATURATE && options.dstAlpha == 0u)
    throw UsageError("saturate divides by the destination's alpha: --dst-alpha 0");
  Picture picture = Picture::loadAs(options.code, options.destination);
  Picture source = Picture::loadAs(32, options.source, true);
  premultiply(source);
  const Placement placed = place(source, options.at, picture);
  uint32 flags = 0;
  if (options.srcAlpha) flags |= RASTER_BLEND_USE_SRC_ALPHA;
  if (options.dstAlpha) flags |= RASTER_BLEND_USE_DST_ALPHA;
  Raster_AlphaBlend(picture.data(), static_cast<uint32>(placed.onTarget.left),
                    static_cast<uint32>(placed.onTarget.top), picture.pitch(), source.data(),
                    placed.srcX, placed.srcY, source.pitch(), widthOf(placed.onTarget),
                    heightOf(placed.onTarget), picture.record.depth, picture.record.bpp, options.op,
                    flags, options.srcAlpha.value_or(0), options.dstAlpha.value_or(0),
                    options.staged ? 1 : 0);
  save(picture, options.output.path, saving);
  return kSuccess;
}

uint32 parseOperator(const std::string& text) { return numberOfName(text, kOperatorNames); }

}  // namespace

void addBlendCommand(Commands& commands) {
  auto options = std::make_shared<BlendOptions>();
  Command command =
      commands.add("blend", "Composites a picture with alpha onto another, which counts as opaque.",
                   [options] { return blend(*options); });
  command.add("DST", options->destination, "the PNG picture to draw on").required();
  command.add("SRC", options->source, "the PNG picture to draw").required();
  options->output.addTo(command);
  command.addParsed("--op", options->op, parseOperator, "NAME|0-13", "the operator (over)");
  command.add("--src-alpha", options->srcAlpha, "scales the source, alpha included")
      .check(count(0, 255));
  command.add("--dst-alpha", options->dstAlpha, "scales the destination and is its alpha")
      .check(count(0, 255));
  command.addParsed("--at", options->at, parsePoint, "X,Y",
                    "where the top left corner of SRC goes");
  addDepth(command, options->code, {6, 8, 15, 16, 24, 32}, "the pixel format of the destination")
      .withDefault();
  command.addFlag("--staged", options->staged, "blend through a small buffer; the same pixels");
  command.footer("Operators, in upper or lower case: " + listOf(kOperatorNames));
}

}  // namespace tool
