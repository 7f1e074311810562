// SPDX-License-Identifier: MIT

#include "imageOptions.h"

#include "commands.h"
#include "numbers.h"

namespace tool {

void OutputOptions::addPathTo(CLI::App* command) {
  command->add_option("OUT", path, "the picture to write")->required();
}

void OutputOptions::addTo(CLI::App* command) {
  addPathTo(command);
  command->add_option("--format", format, "the kind of file, when the name does not say it")
      ->check(CLI::IsMember({"png", "bmp"}));
}

void OutputOptions::addCompressionTo(CLI::App* command) {
  command->add_option("--compression", compression, "effort of the PNG compression")
      ->check(count(0, 9));
}

void OutputOptions::addAlphaTo(CLI::App* command) {
  CLI::Option* without = command->add_flag("--no-alpha", noAlpha, "leave the alpha channel out");
  command
      ->add_flag("--keep-alpha", keepAlpha,
                 "fail rather than leave out alpha, which is kept where it can be")
      ->excludes(without);
}

SaveOptions OutputOptions::forSave() const {
  const FileType given = format == "png"   ? FileType::png
                         : format == "bmp" ? FileType::bmp
                                           : FileType::fromName;
  const FileType type = typeFromName(path, given);
  if (type == FileType::bmp && (keepAlpha || compression != -1))
    throw CLI::ValidationError("a BMP file has neither alpha nor compression");
  return {type, compression, keepAlpha};
}

void OutputOptions::saveWithAlpha(const Picture& picture) const {
  SaveOptions saving = forSave();
  saving.keepAlpha = picture.code() == 32 && !noAlpha;
  save(picture, path, saving);
  if (saving.keepAlpha && saving.type == FileType::bmp && isTransparent(picture))
    note("a BMP file keeps no alpha: all pixels became opaque");
}

CLI::Option* addDepth(CLI::App* command, uint32& code, const std::vector<uint32>& allowed,
                      const std::string& description) {
  return command->add_option("--depth", code, description)->check(CLI::IsMember(allowed));
}

}  // namespace tool
