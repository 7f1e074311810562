// SPDX-License-Identifier: MIT

#include "display.h"

#include <xcb/shm.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "failure.h"
#include "cursorImage.h"
#include "geometry.h"
#include "progress.h"
#include "raster.h"

namespace tool {
namespace {

/// Whether a reply, whose length is told in words, is long enough for what it says to carry.
bool carries(uint32 replyLength, uint64 bytes) { return uint64{replyLength} * 4 >= bytes; }

const char* className(uint8 visualClass) {
  static constexpr const char* kNames[] = {"StaticGray",  "GrayScale", "StaticColor",
                                           "PseudoColor", "TrueColor", "DirectColor"};
  return visualClass < std::size(kNames) ? kNames[visualClass] : "unknown";
}

/// Whether the channels lie where the library has them.
bool hasKnownMasks(uint32 depth, const xcb_visualtype_t& visual) {
  const auto is = [&](uint32 red, uint32 green, uint32 blue) {
    return visual.red_mask == red && visual.green_mask == green && visual.blue_mask == blue;
  };
  switch (depth) {
    case 15:
      return is(0x7C00, 0x03E0, 0x001F);
    case 16:
      return is(0xF800, 0x07E0, 0x001F);
    case 24:
      return is(0xFF0000, 0x00FF00, 0x0000FF);
    default:
      return false;
  }
}

xcb_connection_t* connectTo(const std::string& name, int* screenNumber) {
  return xcb_connect(name.empty() ? nullptr : name.c_str(), screenNumber);
}

/// Rows from the server into a picture, from its row `top` down.
void copyRows(Picture& picture, uint32 top, const uint8* rows, uint32 rowPitch, uint32 height) {
  Raster_RectCopy(picture.data(), picture.pitch(), rows, rowPitch, picture.bytesPerPixel(), 0, 0, 0,
                  top, picture.width(), height);
}

}  // namespace

Display::Display(const std::string& name)
    : displayName(name), connection(nullptr, xcb_disconnect), placeholder(nullptr, xcb_disconnect) {
  int number = 0;
  connection.reset(connectTo(name, &number));
  if (xcb_connection_has_error(connection.get()) != 0) {
    const char* standard = getenv("DISPLAY");
    const std::string shown = !name.empty() ? name : standard != nullptr ? standard : "";
    throw Failure(shown.empty() ? "no display: give --display or set DISPLAY"
                                : "cannot connect to the display '" + shown + "'");
  }
  format = readSetup(xcb_get_setup(connection.get()), number);
  measure();
  checkFormat();
}

void Display::measure() {
  const auto geometry =
      needReply(connection.get(), xcb_get_geometry(connection.get(), format.screen->root),
                xcb_get_geometry_reply, "the size of the screen");
  if (geometry->width == 0 || geometry->height == 0) throw Failure("the screen has no pixels");
  area = {0, 0, geometry->width, geometry->height};
}

Display::~Display() { sharedMemory.reset(); }

void Display::checkFormat() {
  const xcb_setup_t* setup = xcb_get_setup(connection.get());
  const uint32 depth = format.screen->root_depth;
  const bool isIndexed = depth == 8;
  const bool knownPad =
      format.scanlinePad == 8 || format.scanlinePad == 16 || format.scanlinePad == 32;
  const bool known =
      format.visual != nullptr && knownPad && (isIndexed || hasKnownMasks(depth, *format.visual)) &&
      Raster_IsModeReasonable(depth, format.bitsPerPixel, isIndexed) &&
      (setup->image_byte_order == XCB_IMAGE_ORDER_LSB_FIRST || format.bitsPerPixel == 8);
  if (!known) throw Failure("a screen of this kind is not supported: " + description());
  if (isIndexed) readPalette();
}

/// The bytes from one row of the server's pixels to the next.
uint32 Display::rowBytes(uint32 width) const {
  const uint32 padBits = format.scanlinePad - 1;
  return ((width * format.bitsPerPixel + padBits) & ~padBits) / 8;
}

std::string Display::description() const {
  return std::string(format.visual != nullptr ? className(format.visual->_class) : "unknown") +
         ", depth " + std::to_string(format.screen->root_depth) + " in " +
         std::to_string(format.bitsPerPixel) + " bits per pixel";
}

bool Display::refreshColors() {
  ImageUtilColor before[256];
  std::copy(std::begin(palette), std::end(palette), before);
  readPalette();
  return memcmp(before, palette, sizeof palette) != 0;
}

void Display::readPalette() {
  uint32 pixels[256];
  for (uint32 i = 0; i < 256; ++i) pixels[i] = i;
  const uint32 count = std::min<uint32>(256, format.visual->colormap_entries);
  const auto reply =
      needReply(connection.get(),
                xcb_query_colors(connection.get(), format.screen->default_colormap, count, pixels),
                xcb_query_colors_reply, "the colours of the screen");
  const xcb_rgb_t* colors = xcb_query_colors_colors(reply.get());
  const uint32 length = reply->colors_len;
  if (length > count || !carries(reply->length, uint64{length} * sizeof *colors))
    throw Failure("the display sent other colours than it was asked for");
  for (uint32 i = 0; i < length; ++i)
    palette[i] = {static_cast<uint8>(colors[i].blue >> 8), static_cast<uint8>(colors[i].green >> 8),
                  static_cast<uint8>(colors[i].red >> 8), 0};
}

bool Display::captureShared(Picture& picture, const Rect& region) {
  const uint32 rowPitch = rowBytes(picture.width());
  if (!SharedMemory::isOffered(connection.get())) return false;
  sharedMemory.reset();  // one segment at a time, of the size of this region
  sharedMemory =
      std::make_unique<SharedMemory>(connection.get(), size_t{rowPitch} * picture.height());
  if (!sharedMemory->isAttached()) return false;
  const auto reply = replyTo(
      connection.get(),
      xcb_shm_get_image(connection.get(), format.screen->root, static_cast<int16>(region.left),
                        static_cast<int16>(region.top), static_cast<uint16>(picture.width()),
                        static_cast<uint16>(picture.height()), ~0u, XCB_IMAGE_FORMAT_Z_PIXMAP,
                        sharedMemory->id(), 0),
      xcb_shm_get_image_reply);
  if (!reply) return false;
  copyRows(picture, 0, sharedMemory->data(), rowPitch, picture.height());
  return true;
}

void Display::captureInBands(Picture& picture, const Rect& region) {
  constexpr uint32 kBandBytes = 1 << 20;
  const uint32 rowPitch = rowBytes(picture.width());
  const uint32 bandRows = std::max(1u, kBandBytes / rowPitch);
  Progress progress("rows", picture.height());
  for (uint32 top = 0; top < picture.height(); top += bandRows) {
    const uint32 rows = std::min(bandRows, picture.height() - top);
    const auto reply = needReply(
        connection.get(),
        xcb_get_image(connection.get(), XCB_IMAGE_FORMAT_Z_PIXMAP, format.screen->root,
                      static_cast<int16>(region.left),
                      static_cast<int16>(region.top + static_cast<int32>(top)),
                      static_cast<uint16>(picture.width()), static_cast<uint16>(rows), ~0u),
        xcb_get_image_reply, "the pixels of the screen");
    if (static_cast<uint32>(xcb_get_image_data_length(reply.get())) < rowPitch * rows)
      throw Failure("the display sent fewer pixels than it was asked for");
    copyRows(picture, top, xcb_get_image_data(reply.get()), rowPitch, rows);
    progress.show(top + rows);
  }
}

uint32 Display::code() const {
  return Raster_GetBPPDepth(format.screen->root_depth, format.bitsPerPixel);
}

Picture Display::capture(const Rect& region) {
  Picture picture(widthOf(region), heightOf(region), code());
  if (!captureShared(picture, region)) captureInBands(picture, region);
  if (isIndexed()) {
    readPalette();  // after the pixels, so that it has their colours
    std::copy(std::begin(palette), std::end(palette), picture.record.palette);
  }
  return picture;
}

Display::CursorReply Display::cursorReply(bool& isRefused) {
  xcb_generic_error_t* answer = nullptr;
  CursorReply reply(xcb_xfixes_get_cursor_image_reply(
                        connection.get(), xcb_xfixes_get_cursor_image(connection.get()), &answer),
                    free);
  const ReplyPointer<xcb_generic_error_t> error(answer, free);
  isRefused = error && error->error_code == XCB_ACCESS;
  return reply;
}

/// Null when there is none at the moment. An X server gives a cursor away only while the number of
/// the client that made it is in use; a new client gets the lowest number that is not. So for
/// cursors of clients that have left, as xsetroot does, we come in once more, until we have theirs.
Display::CursorReply Display::cursorOfAny() {
  constexpr size_t kMostGuests = 48;
  constexpr std::chrono::seconds kPause(1);
  bool isRefused = false;
  CursorReply reply = cursorReply(isRefused);
  const auto now = std::chrono::steady_clock::now();
  if (!isRefused || now < nextSearch) return reply;
  std::vector<Connection> guests;
  while (isRefused && guests.size() < kMostGuests) {
    guests.emplace_back(connectTo(displayName, nullptr), xcb_disconnect);
    if (xcb_connection_has_error(guests.back().get()) != 0) break;
    reply = cursorReply(isRefused);
  }
  if (isRefused) nextSearch = now + kPause;
  placeholder = std::move(guests.back());  // the moving ones are asked for again and again
  return reply;
}

std::optional<LiveCursor> Display::cursor() {
  if (!hasExtension(connection.get(), xcb_xfixes_id))
    throw Failure("the display does not tell its cursor: it has no XFIXES extension");
  needReply(connection.get(),
            xcb_xfixes_query_version(connection.get(), XCB_XFIXES_MAJOR_VERSION,
                                     XCB_XFIXES_MINOR_VERSION),
            xcb_xfixes_query_version_reply, "the version of XFIXES");
  const CursorReply reply = cursorOfAny();
  if (!reply && xcb_connection_has_error(connection.get()) == 0) return std::nullopt;
  if (!reply) throw Failure("the display went away");
  const uint32* pixels = xcb_xfixes_get_cursor_image_cursor_image(reply.get());
  const size_t length = size_t{reply->width} * reply->height;
  if (!isCursorSize(reply->width, reply->height)) throw Failure("the cursor is too large");
  if (!carries(reply->length, length * sizeof *pixels))
    throw Failure("the display sent fewer pixels of the cursor than it has");
  return LiveCursor{{reply->x, reply->y},
                    {reply->xhot, reply->yhot},
                    reply->width,
                    reply->height,
                    {pixels, pixels + length}};
}

}  // namespace tool
