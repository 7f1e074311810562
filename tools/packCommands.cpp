// SPDX-License-Identifier: MIT
//
// pack, unpack: pictures as blocks of the raster compression, in files that end in .rblk.

#include <memory>
#include <vector>

#include "commands.h"
#include "imageOptions.h"
#include "inputStream.h"
#include "picture.h"
#include "rasterBlock.h"
#include "standardOutput.h"

namespace tool {
namespace {

struct PackOptions {
  std::string input;
  OutputOptions output;
  uint32 code = 32;
};

int pack(const PackOptions& options) {
  if (options.code != 32) options.output.refuseToKeepAlphaOf(options.code);
  const Picture picture = Picture::loadAs(options.code, options.input, options.output.keepAlpha);
  const std::vector<uint8> block = packBlock(picture);
  writeOutput(options.output.path, block.data(), block.size());
  return kSuccess;
}

int unpack(const std::string& path, const OutputOptions& output) {
  const SaveOptions saving = output.forSave();
  InputStream input(path);
  const Picture picture = unpackBlock(readBlock(input));
  save(picture, output.path, saving);
  return kSuccess;
}

void addPack(Commands& commands) {
  auto options = std::make_shared<PackOptions>();
  Command command = commands.add("pack", "Compresses a picture to a raster block.",
                                 [options] { return pack(*options); });
  command.add("IN", options->input, "a PNG picture").required();
  command.add("OUT", options->output.path, "the block to write").required();
  command.addFlag("--keep-alpha", options->output.keepAlpha,
                  "keep the alpha channel of the picture");
  addDepth(command, options->code, {8, 16, 24, 32}, "the pixel format; only 32 is compressed")
      .withDefault();
}

void addUnpack(Commands& commands) {
  auto input = std::make_shared<std::string>();
  auto output = std::make_shared<OutputOptions>();
  Command command = commands.add("unpack", "Writes the picture in a raster block.",
                                 [input, output] { return unpack(*input, *output); });
  command.add("IN", *input, "a raster block").required();
  output->addTo(command);
  output->addCompressionTo(command);
  command.addFlag("--keep-alpha", output->keepAlpha, "take the fourth byte of a pixel for alpha");
}

}  // namespace

void addPackCommands(Commands& commands) {
  addPack(commands);
  addUnpack(commands);
}

}  // namespace tool
