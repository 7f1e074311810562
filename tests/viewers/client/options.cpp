// SPDX-License-Identifier: MIT

#include "options.h"

#include <getopt.h>

#include <cstdio>
#include <cstdlib>
#include <sstream>

#include "link.h"

namespace viewers {
namespace {

const char kHelp[] =
    "usage: rfbViewer ADDRESS [OPTION...]     ADDRESS is HOST:PORT or the path of a UNIX socket\n"
    "Follows a screen by incremental updates and compares it with what the X server shows.\n"
    "  --version 3.3|3.7|3.8   of the protocol\n"
    "  --format NAME[,NAME...] pixel format; several are used in turn, changed after each update\n"
    "  --encoding NAME[,...]   of raw copyrect zrle tightpng; first one preferred (raw)\n"
    "  --cursor mask|alpha     takes the cursor apart from the picture\n"
    "  --no-resize             does not know that screens change their size\n"
    "  --compare DISPLAY       compares with this display once the screen stands still\n"
    "  --beside-pointer        leaves out what lies under the pointer\n"
    "  --until-end-of-input    before that follows the screen until standard input ends\n"
    "  --save FILE             writes the picture as a portable pixmap\n"
    "  --pointer X,Y           moves the pointer there\n"
    "  --where DISPLAY         prints where the pointer is then, as X,Y\n"
    "  --type TEXT             presses keys; the end of a line is Return\n"
    "  --patience SECONDS      for the picture to become equal (30)\n"
    "Exit status: 0 for equal, 1 for different, 2 for trouble.\n";

std::vector<std::string> split(const std::string& list) {
  std::vector<std::string> parts;
  std::istringstream in(list);
  for (std::string part; std::getline(in, part, ',');) parts.push_back(part);
  return parts;
}

int32_t encodingNamed(const std::string& name) {
  if (name == "raw") return kRaw;
  if (name == "copyrect") return kCopyRect;
  if (name == "zrle") return kZrle;
  if (name == "tightpng") return kTightPng;
  throw Broken("there is no encoding '" + name + "'");
}

void setEncodings(Options& options, const std::string& names) {
  options.encodingNames = names;
  options.encodings.clear();
  for (const std::string& name : split(names)) options.encodings.push_back(encodingNamed(name));
}

void setPointer(Options& options, const std::string& position) {
  const std::vector<std::string> parts = split(position);
  if (parts.size() != 2) throw Broken("a position is X,Y");
  options.pointerX = std::stoi(parts[0]);
  options.pointerY = std::stoi(parts[1]);
}

void setCursor(Options& options, const std::string& kind) {
  if (kind != "alpha" && kind != "mask") throw Broken("there is no cursor '" + kind + "'");
  options.cursor = kind == "alpha" ? kCursorWithAlpha : kCursor;
}

enum Choice {
  kHelpWanted,
  kVersion,
  kFormat,
  kEncoding,
  kCursorKind,
  kNoResize,
  kCompare,
  kBesidePointer,
  kUntilEnd,
  kSave,
  kPointer,
  kWhere,
  kType,
  kPatience
};

const option kOptions[] = {{"help", no_argument, nullptr, kHelpWanted},
                           {"version", required_argument, nullptr, kVersion},
                           {"format", required_argument, nullptr, kFormat},
                           {"encoding", required_argument, nullptr, kEncoding},
                           {"cursor", required_argument, nullptr, kCursorKind},
                           {"no-resize", no_argument, nullptr, kNoResize},
                           {"compare", required_argument, nullptr, kCompare},
                           {"beside-pointer", no_argument, nullptr, kBesidePointer},
                           {"until-end-of-input", no_argument, nullptr, kUntilEnd},
                           {"save", required_argument, nullptr, kSave},
                           {"pointer", required_argument, nullptr, kPointer},
                           {"where", required_argument, nullptr, kWhere},
                           {"type", required_argument, nullptr, kType},
                           {"patience", required_argument, nullptr, kPatience},
                           {nullptr, 0, nullptr, 0}};

[[noreturn]] void showHelp(int status) {
  fputs(kHelp, status == 0 ? stdout : stderr);
  exit(status);
}

void apply(Options& options, int choice, const std::string& value) {
  switch (choice) {
    case kVersion:
      options.version = value;
      break;
    case kFormat:
      for (const std::string& name : split(value)) options.formats.push_back(formatNamed(name));
      break;
    case kEncoding:
      setEncodings(options, value);
      break;
    case kCursorKind:
      setCursor(options, value);
      break;
    case kNoResize:
      options.resizes = false;
      break;
    case kCompare:
      options.display = value;
      break;
    case kBesidePointer:
      options.besidePointer = true;
      break;
    case kUntilEnd:
      options.untilEndOfInput = true;
      break;
    case kSave:
      options.saveTo = value;
      break;
    case kPointer:
      setPointer(options, value);
      break;
    case kWhere:
      options.whereOn = value;
      break;
    case kType:
      options.typed = value;
      break;
    case kPatience:
      options.patienceSeconds = std::stoi(value);
      break;
    default:
      showHelp(choice == kHelpWanted ? 0 : 2);
  }
}

}  // namespace

Options parseOptions(int count, char** arguments) {
  Options options;
  for (int choice; (choice = getopt_long(count, arguments, "", kOptions, nullptr)) != -1;)
    apply(options, choice, optarg == nullptr ? "" : optarg);
  if (optind + 1 != count) showHelp(2);
  options.address = arguments[optind];
  if (options.cursor != 0) options.encodings.push_back(options.cursor);
  if (options.resizes) options.encodings.push_back(kDesktopSize);
  return options;
}

}  // namespace viewers
