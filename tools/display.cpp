// SPDX-License-Identifier: MIT

#include "display.h"

#include <sys/ipc.h>
#include <sys/shm.h>
#include <xcb/shm.h>
#include <xcb/xfixes.h>

#include <algorithm>
#include <cstdlib>

#include "commands.h"
#include "cursorImage.h"
#include "geometry.h"
#include "progress.h"
#include "raster.h"

namespace tool {
namespace {

template <class Reply> using ReplyPointer = std::unique_ptr<Reply, decltype(&free)>;

/// The reply to a request, or null where the server answered with an error.
template <class Reply, class Cookie>
ReplyPointer<Reply> replyTo(xcb_connection_t* connection, Cookie cookie,
                            Reply* (*wait)(xcb_connection_t*, Cookie, xcb_generic_error_t**)) {
  xcb_generic_error_t* error = nullptr;
  Reply* reply = wait(connection, cookie, &error);
  free(error);
  return {reply, free};
}

template <class Reply, class Cookie>
ReplyPointer<Reply> needReply(xcb_connection_t* connection, Cookie cookie,
                              Reply* (*wait)(xcb_connection_t*, Cookie, xcb_generic_error_t**),
                              const char* what) {
  auto reply = replyTo(connection, cookie, wait);
  if (!reply) throw Failure(std::string("the display does not answer a request for ") + what);
  return reply;
}

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

/// Rows from the server into a picture, from its row `top` down.
void copyRows(Picture& picture, uint32 top, const uint8* rows, uint32 rowPitch, uint32 height) {
  Raster_RectCopy(picture.data(), picture.pitch(), rows, rowPitch, picture.bytesPerPixel(), 0, 0, 0,
                  top, picture.width(), height);
}

}  // namespace

/// A segment that this program and the server on the same machine both see.
class Display::SharedMemory {
 public:
  SharedMemory(xcb_connection_t* to, size_t size) : connection(to) {
    constexpr int kOwnerOnly = 0600;
    const int id = shmget(IPC_PRIVATE, size, IPC_CREAT | kOwnerOnly);
    if (id == -1) return;
    void* memory = shmat(id, nullptr, 0);
    if (memory != reinterpret_cast<void*>(-1)) {
      bytes = static_cast<uint8*>(memory);
      attach(static_cast<uint32>(id));
    }
    shmctl(id, IPC_RMID, nullptr);  // it goes when both have let go
  }
  ~SharedMemory() {
    if (segment != XCB_NONE) {
      xcb_shm_detach(connection, segment);
      xcb_flush(connection);
    }
    if (bytes != nullptr) shmdt(bytes);
  }
  SharedMemory(const SharedMemory&) = delete;
  SharedMemory& operator=(const SharedMemory&) = delete;

  static bool isOffered(xcb_connection_t* connection) {
    const xcb_query_extension_reply_t* extension = xcb_get_extension_data(connection, &xcb_shm_id);
    return extension != nullptr && extension->present != 0;
  }

  bool isAttached() const { return segment != XCB_NONE; }
  const uint8* data() const { return bytes; }
  xcb_shm_seg_t id() const { return segment; }

 private:
  /// A server on another machine, or in another container, refuses.
  void attach(uint32 systemId) {
    const xcb_shm_seg_t wanted = xcb_generate_id(connection);
    xcb_generic_error_t* error =
        xcb_request_check(connection, xcb_shm_attach_checked(connection, wanted, systemId, 0));
    if (error == nullptr) segment = wanted;
    free(error);
  }

  xcb_connection_t* connection;
  uint8* bytes = nullptr;
  xcb_shm_seg_t segment = XCB_NONE;
};

Display::Display(const std::string& name) : connection(nullptr, xcb_disconnect) {
  int number = 0;
  connection.reset(xcb_connect(name.empty() ? nullptr : name.c_str(), &number));
  if (xcb_connection_has_error(connection.get()) != 0) {
    const char* standard = getenv("DISPLAY");
    const std::string shown = !name.empty() ? name : standard != nullptr ? standard : "";
    throw Failure(shown.empty() ? "no display: give --display or set DISPLAY"
                                : "cannot connect to the display '" + shown + "'");
  }
  format = readSetup(xcb_get_setup(connection.get()), number);
  const auto geometry =
      needReply(connection.get(), xcb_get_geometry(connection.get(), format.screen->root),
                xcb_get_geometry_reply, "the size of the screen");
  if (geometry->width == 0 || geometry->height == 0) throw Failure("the screen has no pixels");
  area = {0, 0, geometry->width, geometry->height};
  checkFormat();
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
uint32 Display::rowPitchOf(const Picture& picture) const {
  const uint32 padBits = format.scanlinePad - 1;
  return ((picture.width() * format.bitsPerPixel + padBits) & ~padBits) / 8;
}

std::string Display::description() const {
  return std::string(format.visual != nullptr ? className(format.visual->_class) : "unknown") +
         ", depth " + std::to_string(format.screen->root_depth) + " in " +
         std::to_string(format.bitsPerPixel) + " bits per pixel";
}

void Display::readPalette() {
  uint32 pixels[256];
  for (uint32 i = 0; i < 256; ++i) pixels[i] = i;
  const uint32 count = std::min<uint32>(256, format.visual->colormap_entries);
  const auto reply =
      needReply(connection.get(),
                xcb_query_colors(connection.get(), format.screen->default_colormap, count, pixels),
                xcb_query_colors_reply, "the colours of the screen");
  const xcb_rgb_t* colours = xcb_query_colors_colors(reply.get());
  const uint32 length = reply->colors_len;
  if (length > count || !carries(reply->length, uint64{length} * sizeof *colours))
    throw Failure("the display sent other colours than it was asked for");
  for (uint32 i = 0; i < length; ++i)
    palette[i] = {static_cast<uint8>(colours[i].blue >> 8),
                  static_cast<uint8>(colours[i].green >> 8),
                  static_cast<uint8>(colours[i].red >> 8), 0};
}

bool Display::captureShared(Picture& picture, const Rect& region) {
  const uint32 rowPitch = rowPitchOf(picture);
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
  const uint32 rowPitch = rowPitchOf(picture);
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

Picture Display::capture(const Rect& region) {
  const uint32 code = Raster_GetBPPDepth(format.screen->root_depth, format.bitsPerPixel);
  Picture picture(widthOf(region), heightOf(region), code);
  if (format.screen->root_depth == 8)
    std::copy(std::begin(palette), std::end(palette), picture.record.palette);
  if (!captureShared(picture, region)) captureInBands(picture, region);
  return picture;
}

LiveCursor Display::cursor() {
  const xcb_query_extension_reply_t* extension =
      xcb_get_extension_data(connection.get(), &xcb_xfixes_id);
  if (extension == nullptr || extension->present == 0)
    throw Failure("the display does not tell its cursor: it has no XFIXES extension");
  needReply(connection.get(),
            xcb_xfixes_query_version(connection.get(), XCB_XFIXES_MAJOR_VERSION,
                                     XCB_XFIXES_MINOR_VERSION),
            xcb_xfixes_query_version_reply, "the version of XFIXES");
  const auto reply = needReply(connection.get(), xcb_xfixes_get_cursor_image(connection.get()),
                               xcb_xfixes_get_cursor_image_reply, "the cursor");
  const uint32* pixels = xcb_xfixes_get_cursor_image_cursor_image(reply.get());
  const size_t length = size_t{reply->width} * reply->height;
  if (!isCursorSize(reply->width, reply->height)) throw Failure("the cursor is too large");
  if (!carries(reply->length, length * sizeof *pixels))
    throw Failure("the display sent fewer pixels of the cursor than it has");
  return {{reply->x, reply->y},
          {reply->xhot, reply->yhot},
          reply->width,
          reply->height,
          {pixels, pixels + length}};
}

}  // namespace tool
