// SPDX-License-Identifier: MIT
//
// Qt's names of our pixel formats.

#include <QImage>

#include "formatNames.h"

namespace {

void expectName(int32 code, QImage::Format name) {
  expectReads(code,
              [name](const uint8* bytes) { return QImage(bytes, 1, 1, 16, name).pixel(0, 0); });
}

TEST(QtFormats, Names) {
  expectName(15, QImage::Format_RGB555);
  expectName(16, QImage::Format_RGB16);
  expectName(24, QImage::Format_BGR888);
  expectName(32, QImage::Format_ARGB32);
  expectName(32, QImage::Format_RGB32);
}

}  // namespace
