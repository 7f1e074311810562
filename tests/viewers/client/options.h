// SPDX-License-Identifier: MIT
//
// What a viewer is asked to do on its command line.

#ifndef VIEWERS_OPTIONS_H
#define VIEWERS_OPTIONS_H

#include <string>
#include <vector>

#include "pixelFormat.h"
#include "rectangles.h"

namespace viewers {

struct Options {
  std::string address;
  std::string version = "3.8";
  /// In turn; the last one stays. None: the server's own.
  std::vector<PixelFormat> formats;
  std::vector<int32_t> encodings = {kRaw};
  std::string encodingNames = "raw";
  /// The display to compare with; empty: nothing is compared.
  std::string display;
  /// Follow the screen until standard input ends before comparing.
  bool untilEndOfInput = false;
  /// The encoding in which the cursor comes; 0: it is part of the picture.
  int32_t cursor = 0;
  /// What lies under the pointer is not compared.
  bool besidePointer = false;
  bool resizes = true;
  int patienceSeconds = 30;
  std::string saveTo;
  /// The display of which to tell where the pointer is, once the input was given.
  std::string whereOn;
  std::string typed;
  int pointerX = -1, pointerY = -1;
};

/// Ends the program after --help and after a mistake.
Options parseOptions(int count, char** arguments);

}  // namespace viewers

#endif
