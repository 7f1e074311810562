// SPDX-License-Identifier: MIT
//
// ROP fill and ROP copy against memset, memcpy and the public libraries with bitwise operations.

#include <cstring>
#include <memory>

#include "raster.h"
#include "support/jobs.h"
#include "support/peers.h"

namespace {

using bench::Contenders;
using bench::Extent;

constexpr uint32 kPixel = 0x5A3C21F7;

/// The operations that write and depend on source or destination.
constexpr uint32 kThirteen[] = {1, 2, 3, 4, 6, 7, 8, 9, 10, 11, 12, 13, 14};

#ifdef HAVE_OPENCV
void addOpenCv(Contenders& c, uint32 rop, const cv::Mat& src, const cv::Mat& dst) {
  if (rop == RASTER_ROP_XOR) c.add("OpenCV", [=] { cv::bitwise_xor(src, dst, dst); });
  if (rop == RASTER_ROP_AND) c.add("OpenCV", [=] { cv::bitwise_and(src, dst, dst); });
  if (rop == RASTER_ROP_INVERT) c.add("OpenCV", [=] { cv::bitwise_not(dst, dst); });
  if (rop == RASTER_ROP_COPY_INVERTED) c.add("OpenCV", [=] { cv::bitwise_not(src, dst); });
}

void addOpenCv(Contenders& c, uint32 rop, const cv::Scalar& pixel, const cv::Mat& dst) {
  if (rop == RASTER_ROP_XOR) c.add("OpenCV", [=] { cv::bitwise_xor(dst, pixel, dst); });
  if (rop == RASTER_ROP_AND) c.add("OpenCV", [=] { cv::bitwise_and(dst, pixel, dst); });
  if (rop == RASTER_ROP_INVERT) c.add("OpenCV", [=] { cv::bitwise_not(dst, dst); });
}
#endif

#ifdef HAVE_QT6
QPainter::CompositionMode qtMode(uint32 rop) {
  static constexpr QPainter::CompositionMode kModes[] = {
      QPainter::RasterOp_ClearDestination,
      QPainter::RasterOp_SourceAndDestination,
      QPainter::RasterOp_SourceAndNotDestination,
      QPainter::CompositionMode_Source,
      QPainter::RasterOp_NotSourceAndDestination,
      QPainter::CompositionMode_Destination,
      QPainter::RasterOp_SourceXorDestination,
      QPainter::RasterOp_SourceOrDestination,
      QPainter::RasterOp_NotSourceAndNotDestination,
      QPainter::RasterOp_NotSourceXorDestination,
      QPainter::RasterOp_NotDestination,
      QPainter::RasterOp_SourceOrNotDestination,
      QPainter::RasterOp_NotSource,
      QPainter::RasterOp_NotSourceOrDestination,
      QPainter::RasterOp_NotSourceOrNotDestination,
      QPainter::RasterOp_SetDestination};
  return kModes[rop];
}

QImage image(uint8* pixels, Extent e) {
  return bench::qImage(QImage::Format_RGB32, pixels, e, e.width * 4);
}

/// A picture with an open painter: the engine sets the top byte of a pixel, hence "~x".
struct Canvas {
  explicit Canvas(const QImage& of) : picture(of), painter(&picture) {}
  QImage picture;
  QPainter painter;
};
#endif

void fillJob(const std::string& name, uint32 bytes, uint32 rop) {
  bench::job("ropfill/" + name, [=](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    const uint32 pitch = e.width * bytes;
    c.add("raster", [=] {
      Raster_RectROPfill(dst, static_cast<int32>(pitch), bytes, kPixel, rop, 0, 0, e.width,
                         e.height);
    });
    c.add("limit", [=] { memset(dst, 0x5A, size_t{pitch} * e.height); });
#ifdef HAVE_OPENCV
    addOpenCv(c, rop, cv::Scalar(0xF7, 0x21, 0x3C, 0x5A),
              bench::mat(bench::kMatTypes[bytes], dst, e, pitch));
#endif
#ifdef HAVE_QT6
    if (bytes != 4) return;
    const auto canvas = std::make_shared<Canvas>(image(dst, e));
    canvas->painter.setCompositionMode(qtMode(rop));
    c.add("Qt6~x", [=] { canvas->painter.fillRect(canvas->picture.rect(), QColor(QRgb(kPixel))); });
#endif
  });
}

void copyJob(const std::string& name, uint32 bytes, uint32 rop) {
  bench::job("ropcopy/" + name, [=](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    uint8* src = bench::buffer(1);
    const uint32 pitch = e.width * bytes;
    c.add("raster", [=] {
      Raster_RectROPcopy(dst, static_cast<int32>(pitch), src, static_cast<int32>(pitch), bytes, 0,
                         0, rop, 0, 0, e.width, e.height);
    });
    c.add("limit", [=] { memcpy(dst, src, size_t{pitch} * e.height); });
#ifdef HAVE_OPENCV
    const int type = bench::kMatTypes[bytes];
    addOpenCv(c, rop, bench::mat(type, src, e, pitch), bench::mat(type, dst, e, pitch));
#endif
#ifdef HAVE_QT6
    if (bytes != 4) return;
    const auto canvas = std::make_shared<Canvas>(image(dst, e));
    canvas->painter.setCompositionMode(qtMode(rop));
    c.add("Qt6~x",
          [canvas, from = image(src, e)] { canvas->painter.drawImage(QPoint(0, 0), from); });
#endif
  });
}

/// All thirteen operations in turn, one a run.
void all13Job() {
  bench::job("ropcopy/32-all13", [](Contenders& c, Extent e) {
    uint8* dst = bench::buffer(0);
    uint8* src = bench::buffer(1);
    const uint32 pitch = e.width * 4;
    c.add("raster", [=, turn = size_t{0}]() mutable {
      Raster_RectROPcopy(dst, static_cast<int32>(pitch), src, static_cast<int32>(pitch), 4, 0, 0,
                         kThirteen[turn++ % std::size(kThirteen)], 0, 0, e.width, e.height);
    });
    c.add("limit", [=] { memcpy(dst, src, size_t{pitch} * e.height); });
#ifdef HAVE_QT6
    const auto canvas = std::make_shared<Canvas>(image(dst, e));
    c.add("Qt6~x", [canvas, from = image(src, e), turn = size_t{0}]() mutable {
      canvas->painter.setCompositionMode(qtMode(kThirteen[turn++ % std::size(kThirteen)]));
      canvas->painter.drawImage(QPoint(0, 0), from);
    });
#endif
  });
}

/// A rectangle onto itself, one pixel to the right.
void right1Job(const std::string& name, uint32 bytes) {
  bench::job("ropcopy/" + name, [=](Contenders& c, Extent e) {
    uint8* fb = bench::buffer(0);
    const uint32 pitch = (e.width + 1) * bytes;
    c.add("raster", [=] {
      Raster_RectROPcopy(fb, static_cast<int32>(pitch), fb, static_cast<int32>(pitch), bytes, 0, 0,
                         RASTER_ROP_XOR, 1, 0, e.width, e.height);
    });
    c.add("limit", [=] { memmove(fb + bytes, fb, size_t{e.width} * bytes * e.height); });
  });
}

}  // namespace

int main(int argc, char** argv) {
  fillJob("32-xor", 4, RASTER_ROP_XOR);
  fillJob("32-and", 4, RASTER_ROP_AND);
  fillJob("32-invert", 4, RASTER_ROP_INVERT);
  fillJob("32-andrev", 4, RASTER_ROP_AND_REVERSE);
  fillJob("24-xor", 3, RASTER_ROP_XOR);
  fillJob("16-xor", 2, RASTER_ROP_XOR);
  fillJob("8-xor", 1, RASTER_ROP_XOR);
  copyJob("32-xor", 4, RASTER_ROP_XOR);
  copyJob("32-and", 4, RASTER_ROP_AND);
  copyJob("32-nand", 4, RASTER_ROP_NAND);
  copyJob("32-copyinv", 4, RASTER_ROP_COPY_INVERTED);
  copyJob("32-andinv", 4, RASTER_ROP_AND_INVERTED);
  copyJob("24-xor", 3, RASTER_ROP_XOR);
  copyJob("16-xor", 2, RASTER_ROP_XOR);
  copyJob("8-xor", 1, RASTER_ROP_XOR);
  copyJob("24-andinv", 3, RASTER_ROP_AND_INVERTED);
  all13Job();
  right1Job("32-xor-right1", 4);
  right1Job("24-xor-right1", 3);
  return bench::run(argc, argv);
}
