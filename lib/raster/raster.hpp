// SPDX-License-Identifier: MIT
/// \file
/// The C++ face of raster.h: a view of a frame buffer, which clips, and names with types. Header
/// only, C++17; it adds no names to the library.
///
/// Conventions beside those of raster.h:
/// - A FrameView owns nothing. It is two words and four numbers: pass it by value.
/// - Rectangles are clipped to their frame buffers, so coordinates may be any; what lies outside is
///   left out, and the parts that are left stay where they belong.
/// - Pitches should be multiples of the pixel size: with others, rows of 2- and 4-byte pixels drift
/// as
///   raster.h says of each function.
/// - Formats that a function cannot do are fatal as in the function that it calls.
/// - No function throws, keeps state or allocates but as the called one does.

#ifndef RASTER_RASTER_HPP
#define RASTER_RASTER_HPP

#include "raster.h"

/// The C++ face of the library.
namespace raster {

/// \defgroup raster_cpp C++: views of frame buffers
/// @{

/// Pixel formats: the bits of red, green and blue, from the top (\ref raster_formats).
enum class Format : int32 {
  k111 = RASTER_FORMAT_111,
  k222 = RASTER_FORMAT_222,
  k233 = RASTER_FORMAT_233,
  k555 = RASTER_FORMAT_555,
  k565 = RASTER_FORMAT_565,
  k888 = RASTER_FORMAT_888,
  k8888 = RASTER_FORMAT_8888
};

/// Raster operations (\ref raster_rops).
enum class Rop : uint32 {
  kClear = RASTER_ROP_CLEAR,
  kAnd = RASTER_ROP_AND,
  kAndReverse = RASTER_ROP_AND_REVERSE,
  kCopy = RASTER_ROP_COPY,
  kAndInverted = RASTER_ROP_AND_INVERTED,
  kNoop = RASTER_ROP_NOOP,
  kXor = RASTER_ROP_XOR,
  kOr = RASTER_ROP_OR,
  kNor = RASTER_ROP_NOR,
  kEquiv = RASTER_ROP_EQUIV,
  kInvert = RASTER_ROP_INVERT,
  kOrReverse = RASTER_ROP_OR_REVERSE,
  kCopyInverted = RASTER_ROP_COPY_INVERTED,
  kOrInverted = RASTER_ROP_OR_INVERTED,
  kNand = RASTER_ROP_NAND,
  kSet = RASTER_ROP_SET
};

/// Blend operators (\ref raster_blending).
enum class Blend : uint32 {
  kClear = RASTER_BLEND_CLEAR,
  kSource = RASTER_BLEND_SOURCE,
  kDestination = RASTER_BLEND_DESTINATION,
  kOver = RASTER_BLEND_OVER,
  kOverReverse = RASTER_BLEND_OVER_REVERSE,
  kIn = RASTER_BLEND_IN,
  kInReverse = RASTER_BLEND_IN_REVERSE,
  kOut = RASTER_BLEND_OUT,
  kOutReverse = RASTER_BLEND_OUT_REVERSE,
  kAtop = RASTER_BLEND_ATOP,
  kAtopReverse = RASTER_BLEND_ATOP_REVERSE,
  kXor = RASTER_BLEND_XOR,
  kAdd = RASTER_BLEND_ADD,
  kSaturate = RASTER_BLEND_SATURATE
};

/// The bytes of a pixel.
constexpr uint32 bytesPerPixel(Format format) noexcept {
  const auto code = static_cast<uint32>(format);
  return code <= 8 ? 1 : code == 15 ? 2 : code / 8;
}

/// The colour depth in bits, as the functions want it that take a depth and bits per pixel.
constexpr uint32 depth(Format format) noexcept {
  return format == Format::k8888 ? 24 : static_cast<uint32>(format);
}

/// A colour 0xAARRGGBB as a pixel value, by Raster_ConvertOnePixel.
inline uint32 pixel(Format format, uint32 argb) noexcept {
  return Raster_ConvertOnePixel(argb, 32, static_cast<int32>(format), false, nullptr);
}

/// A rectangle from its origin and size; a negative size gives an empty one.
inline Rect area(int32 x, int32 y, int32 width, int32 height) noexcept {
  Rect result;
  Rect_SetFromXYWH(&result, x, y, width, height);
  return result;
}

/// Somebody else's frame buffer of at most 2^31 - 1 pixels each way.
class FrameView {
 public:
  /// Rows of `pitch` bytes at `pixels`; 0 stands for rows without gaps.
  FrameView(uint8* pixels, uint32 width, uint32 height, Format format, uint32 pitch = 0) noexcept
      : pixels_(pixels),
        width_(width),
        height_(height),
        pitch_(pitch != 0 ? pitch : width * bytesPerPixel(format)),
        format_(format) {}

  uint8* pixels() const noexcept { return pixels_; }  ///< byte 0 of row 0
  uint32 width() const noexcept { return width_; }    ///< in pixels
  uint32 height() const noexcept { return height_; }  ///< in rows
  uint32 pitch() const noexcept { return pitch_; }    ///< bytes from one row to the next
  Format format() const noexcept { return format_; }  ///< of every pixel
  uint32 pixelSize() const noexcept { return bytesPerPixel(format_); }  ///< in bytes

  /// The whole of it.
  Rect bounds() const noexcept {
    return {0, 0, static_cast<int32>(width_), static_cast<int32>(height_)};
  }

 private:
  uint8* pixels_;
  uint32 width_;
  uint32 height_;
  uint32 pitch_;
  Format format_;
};

/// What is left of a transfer between two frame buffers: both rectangles, of one size, lie inside.
class Transfer {
 public:
  /// Clips the rectangle `part` of `from`, whose top left corner is to fall on `at` in `to`.
  Transfer(FrameView to, Point at, FrameView from, Rect part) noexcept {
    const Rect whole = from.bounds();
    const Rect target = to.bounds();
    if (!Rect_Intersect(&source_, &whole, &part)) return;
    // A distance that does not fit has no pixel of both buffers at its ends.
    const int64 right = int64{at.x} - part.left;
    const int64 down = int64{at.y} - part.top;
    const Point there = {static_cast<int32>(right), static_cast<int32>(down)};
    if (there.x != right || there.y != down) return;
    Rect moved;
    Rect_Translate(&moved, &source_, &there);
    any_ = Rect_Intersect(&moved, &moved, &target);
    Rect_TranslateInv(&source_, &moved, &there);
    at_ = {moved.left, moved.top};
  }

  explicit operator bool() const noexcept { return any_; }  ///< is anything left?
  uint32 fromX() const noexcept { return static_cast<uint32>(source_.left); }  ///< source column
  uint32 fromY() const noexcept { return static_cast<uint32>(source_.top); }   ///< source row
  uint32 toX() const noexcept { return static_cast<uint32>(at_.x); }           ///< target column
  uint32 toY() const noexcept { return static_cast<uint32>(at_.y); }           ///< target row
  /// In pixels.
  uint32 width() const noexcept { return static_cast<uint32>(source_.right - source_.left); }
  /// In rows.
  uint32 height() const noexcept { return static_cast<uint32>(source_.bottom - source_.top); }

 private:
  Rect source_ = {};
  Point at_ = {};
  bool any_ = false;
};

/// Combines a pixel value with a rectangle; by default stores it (Raster_RectROPfill).
inline void fill(FrameView frame, Rect part, uint32 value, Rop rop = Rop::kCopy) noexcept {
  const Transfer what(frame, {part.left, part.top}, frame, part);
  if (!what) return;
  Raster_RectROPfill(frame.pixels(), static_cast<int32>(frame.pitch()), frame.pixelSize(), value,
                     static_cast<uint32>(rop), what.toX(), what.toY(), what.width(), what.height());
}

/// Combines a rectangle of `from` with `to`, of the same format; by default copies it. Within one
/// frame buffer the two may overlap (Raster_RectROPcopy).
inline void copy(FrameView to, Point at, FrameView from, Rect part, Rop rop = Rop::kCopy) noexcept {
  const Transfer what(to, at, from, part);
  if (!what) return;
  Raster_RectROPcopy(to.pixels(), static_cast<int32>(to.pitch()), from.pixels(),
                     static_cast<int32>(from.pitch()), to.pixelSize(), what.fromX(), what.fromY(),
                     static_cast<uint32>(rop), what.toX(), what.toY(), what.width(), what.height());
}

/// Converts a rectangle into another format; the two must not overlap (Raster_ConvertPixels).
inline void convert(FrameView to, Point at, FrameView from, Rect part) noexcept {
  const Transfer what(to, at, from, part);
  if (!what) return;
  Raster_ConvertPixels(to.pixels(), to.pitch(), static_cast<int32>(to.format()), from.pixels(),
                       from.pitch(), static_cast<int32>(from.format()), false, nullptr,
                       what.fromX(), what.fromY(), what.toX(), what.toY(), what.width(),
                       what.height());
}

/// Composites a rectangle of `from`, which is Format::k8888 with premultiplied alpha, by default
/// over what is there. `alpha` scales the source (Raster_AlphaBlend).
inline void blend(FrameView to, Point at, FrameView from, Rect part, Blend op = Blend::kOver,
                  uint8 alpha = 255) noexcept {
  const Transfer what(to, at, from, part);
  const uint32 flags = alpha != 255 ? uint32{RASTER_BLEND_USE_SRC_ALPHA} : 0;
  if (!what) return;
  Raster_AlphaBlend(to.pixels(), what.toX(), what.toY(), to.pitch(), from.pixels(), what.fromX(),
                    what.fromY(), from.pitch(), what.width(), what.height(), depth(to.format()),
                    8 * to.pixelSize(), static_cast<uint32>(op), flags, alpha, 255, 0);
}

/// Scales the whole of `from` to the size of `to`. False where Raster_Scale refuses.
inline bool scale(FrameView to, FrameView from, bool smooth = true) noexcept {
  if (from.width() == 0 || from.height() == 0) return true;
  return Raster_Scale(
      to.pixels(), to.pitch(), 8 * to.pixelSize(), depth(to.format()), to.width(), to.height(), 0,
      0, 0, static_cast<int32>(to.width()), static_cast<int32>(to.height()), from.pixels(),
      static_cast<int32>(from.pitch()), 8 * from.pixelSize(),
      static_cast<int32>(depth(from.format())), 0, from.width(), from.height(), 0,
      double(to.width()) / from.width(), double(to.height()) / from.height(), smooth ? 1 : 0);
}

/// Whether two frame buffers of one size and format have the same pixels; the fourth byte of
/// Format::k8888 does not count (Raster_ComparePixels).
inline bool equal(FrameView a, FrameView b) noexcept {
  const auto bits = static_cast<int32>(8 * a.pixelSize());
  return a.width() == b.width() && a.height() == b.height() && a.format() == b.format() &&
         Raster_ComparePixels(a.pixels(), a.pitch(), bits, b.pixels(), b.pitch(), bits, 0, 0, 0, 0,
                              a.width(), a.height()) == 0;
}

/// @}

}  // namespace raster

#endif
