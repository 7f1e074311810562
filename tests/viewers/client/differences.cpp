// SPDX-License-Identifier: MIT
//
// Counts the pixels in which what a viewer shows is not what is on an X screen. The viewer is a
// picture that it saved, or the X screen that its window is on.

#include <png.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "link.h"
#include "screen.h"

namespace viewers {
namespace {

const char kHelp[] =
    "usage: screenDifferences DISPLAY VIEWER [--format NAME] [--at X,Y] [--pointer]\n"
    "  VIEWER          a PNG file, or the display of the viewer's window\n"
    "  --format NAME   only what is left in this pixel format counts\n"
    "  --at X,Y        where on the viewer's side the screen begins\n"
    "  --pointer       the pointer is part of the picture\n"
    "Exit status: 0 for equal, 1 for different, 2 for trouble.\n";

Screen pictureFrom(const std::string& path) {
  png_image image = {};
  image.version = PNG_IMAGE_VERSION;
  if (png_image_begin_read_from_file(&image, path.c_str()) == 0)
    throw Broken(path + ": " + image.message);
  image.format = PNG_FORMAT_RGB;
  std::vector<uint8_t> rgb(PNG_IMAGE_SIZE(image));
  if (png_image_finish_read(&image, nullptr, rgb.data(), 0, nullptr) == 0)
    throw Broken(path + ": " + image.message);
  Screen screen = {static_cast<int>(image.width), static_cast<int>(image.height), {}};
  for (size_t i = 0; i + 2 < rgb.size(); i += 3)
    screen.colors.push_back({rgb[i], rgb[i + 1], rgb[i + 2]});
  return screen;
}

/// What the viewer shows of a screen of that size, as it would hold it in the format.
Picture shown(Screen viewer, int left, int top, const Screen& screen, const PixelFormat& format) {
  if (left + screen.width > viewer.width || top + screen.height > viewer.height)
    throw Broken("the viewer shows " + std::to_string(viewer.width) + "x" +
                 std::to_string(viewer.height) + " pixels");
  Picture picture(screen.width, screen.height);
  for (int y = 0; y < screen.height; ++y)
    for (int x = 0; x < screen.width; ++x)
      picture.at(x, y) = format.pixel(viewer.at(left + x, top + y));
  return picture;
}

int compare(const std::vector<std::string>& arguments) {
  std::string format = "32";
  int left = 0;
  int top = 0;
  bool withPointer = false;
  for (size_t i = 2; i < arguments.size(); ++i) {
    const bool valued = i + 1 < arguments.size();
    if (arguments[i] == "--pointer") {
      withPointer = true;
    } else if (arguments[i] == "--format" && valued) {
      format = arguments[++i];
    } else if (arguments[i] != "--at" || !valued ||
               sscanf(arguments[++i].c_str(), "%d,%d", &left, &top) != 2) {
      throw Broken(kHelp);
    }
  }
  Screen screen = dumpOf(arguments[0]);
  if (withPointer) drawPointer(pointerOf(arguments[0]), screen);
  const std::string& viewer = arguments[1];
  const PixelFormat& used = formatNamed(format);
  const Picture picture =
      shown(viewer[0] == ':' ? dumpOf(viewer) : pictureFrom(viewer), left, top, screen, used);
  const size_t different = differences(screen, picture, used);
  printf("%zu of %zu pixels differ\n", different, screen.colors.size());
  return different == 0 ? 0 : 1;
}

}  // namespace
}  // namespace viewers

int main(int count, char** arguments) {
  try {
    if (count < 3) throw viewers::Broken(viewers::kHelp);
    return viewers::compare({arguments + 1, arguments + count});
  } catch (const std::exception& trouble) {
    fprintf(stderr, "%s\n", trouble.what());
    return 2;
  }
}
