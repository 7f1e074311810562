// SPDX-License-Identifier: MIT

#include "imageOptions.h"

#include "failure.h"
#include "numbers.h"

namespace tool {

void OutputOptions::addPathTo(OptionList& command) {
  command.add("OUT", path, "the picture to write").required();
}

void OutputOptions::addTo(OptionList& command) {
  addPathTo(command);
  command.add("--format", format, "the kind of file, when the name does not say it")
      .oneOf({"png", "bmp"});
}

void OutputOptions::addCompressionTo(OptionList& command) {
  command.add("--compression", compression, "effort of the PNG compression").check(count(0, 9));
}

void OutputOptions::addAlphaTo(OptionList& command) {
  Option without = command.addFlag("--no-alpha", noAlpha, "leave the alpha channel out");
  command
      .addFlag("--keep-alpha", keepAlpha,
               "fail rather than leave out alpha, which is kept where it can be")
      .excludes(without);
}

SaveOptions OutputOptions::forSave() const {
  const FileType given = format == "png"   ? FileType::png
                         : format == "bmp" ? FileType::bmp
                                           : FileType::fromName;
  const FileType type = typeFromName(path, given);
  if (type == FileType::bmp && (keepAlpha || compression != -1))
    throw UsageError("a BMP file has neither alpha nor compression");
  return {type, compression, keepAlpha};
}

void OutputOptions::refuseToKeepAlphaOf(uint32 code) const {
  if (keepAlpha)
    throw UsageError("pixels of --depth " + std::to_string(code) + " have no alpha to keep");
}

void OutputOptions::saveWithAlpha(const Picture& picture) const {
  SaveOptions saving = forSave();
  saving.keepAlpha = picture.code() == 32 && !noAlpha;
  save(picture, path, saving);
  if (saving.keepAlpha && saving.type == FileType::bmp && isTransparent(picture))
    note("a BMP file keeps no alpha: all pixels became opaque");
}

Option addDepth(OptionList& command, uint32& code, const std::vector<uint32>& allowed,
                const std::string& description) {
  return command.add("--depth", code, description).oneOf(allowed);
}

}  // namespace tool
