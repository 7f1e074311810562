// SPDX-License-Identifier: MIT

#include "screenWatch.h"

#include <xcb/xfixes.h>
#include <xcb/xinput.h>

#include <algorithm>
#include <array>
#include <type_traits>
#include <utility>

#include "failure.h"
#include "geometry.h"
#include "raster.h"
#include "rectLists.h"
#include "xReply.h"

namespace tool::live {
namespace {

using EventPointer = std::unique_ptr<xcb_generic_event_t, decltype(&free)>;

constexpr uint8 kSentBit = 0x80;  // set in events that another client made

uint8 firstEventOf(xcb_connection_t* connection, xcb_extension_t& extension) {
  return xcb_get_extension_data(connection, &extension)->first_event;
}

[[noreturn]] void failWithDisplay() { throw Failure("the display went away"); }

/// Whether the display has an extension and answers when it is told the version that is used.
template <class Cookie, class Number, class Reply>
bool speaks(xcb_connection_t* connection, xcb_extension_t& extension,
            Cookie (*tell)(xcb_connection_t*, Number, Number),
            Reply* (*wait)(xcb_connection_t*, Cookie, xcb_generic_error_t**),
            std::type_identity_t<Number> major, std::type_identity_t<Number> minor) {
  return hasExtension(connection, extension) &&
         replyTo(connection, tell(connection, major, minor), wait) != nullptr;
}

bool findDamage(xcb_connection_t* connection) {
  return speaks(connection, xcb_damage_id, xcb_damage_query_version, xcb_damage_query_version_reply,
                XCB_DAMAGE_MAJOR_VERSION, XCB_DAMAGE_MINOR_VERSION);
}

bool findFixes(xcb_connection_t* connection) {
  return speaks(connection, xcb_xfixes_id, xcb_xfixes_query_version, xcb_xfixes_query_version_reply,
                XCB_XFIXES_MAJOR_VERSION, XCB_XFIXES_MINOR_VERSION);
}

/// The opcode of the input extension, or 0 without it.
uint8 findInput(xcb_connection_t* connection) {
  constexpr uint16 kMajor = 2;
  constexpr uint16 kMinor = 2;  // from which on motion is told during grabs as well
  const bool found = speaks(connection, xcb_input_id, xcb_input_xi_query_version,
                            xcb_input_xi_query_version_reply, kMajor, kMinor);
  return found ? xcb_get_extension_data(connection, &xcb_input_id)->major_opcode : 0;
}

}  // namespace

ScreenWatch::ScreenWatch(const std::string& displayName, const std::optional<Rect>& region,
                         const std::vector<Rect>& hiddenRects)
    : screen(displayName), wantedPart(region), hidden(hiddenRects) {
  xcb_connection_t* connection = screen.handle();
  hasDamage = findDamage(connection);
  hasCursor = findFixes(connection);
  inputOpcode = findInput(connection);
  const uint32 mask = XCB_EVENT_MASK_STRUCTURE_NOTIFY;  // the root's size is the screen's
  xcb_change_window_attributes(connection, screen.root(), XCB_CW_EVENT_MASK, &mask);
  xcb_flush(connection);
  resize();
}

ScreenWatch::~ScreenWatch() { shared.reset(); }

void ScreenWatch::begin() {
  xcb_connection_t* connection = screen.handle();
  if (hasDamage && damageId == XCB_NONE) {
    damageId = xcb_generate_id(connection);
    // What was told since the last capture is not told again.
    xcb_damage_create(connection, damageId, screen.root(),
                      XCB_DAMAGE_REPORT_LEVEL_DELTA_RECTANGLES);
  }
  if (hasCursor)
    xcb_xfixes_select_cursor_input(connection, screen.root(),
                                   XCB_XFIXES_CURSOR_NOTIFY_MASK_DISPLAY_CURSOR);
  xcb_flush(connection);
}

void ScreenWatch::end() {
  xcb_connection_t* connection = screen.handle();
  if (damageId != XCB_NONE) xcb_damage_destroy(connection, std::exchange(damageId, XCB_NONE));
  if (hasCursor) xcb_xfixes_select_cursor_input(connection, screen.root(), 0);
  followPointer(false);
}

void ScreenWatch::followPointer(bool wanted) {
  struct {
    xcb_input_event_mask_t head;
    uint32 mask;
  } events = {{XCB_INPUT_DEVICE_ALL_MASTER, 1},
              wanted ? uint32{XCB_INPUT_XI_EVENT_MASK_RAW_MOTION} : 0};
  if (inputOpcode != 0) xcb_input_xi_select_events(screen.handle(), screen.root(), 1, &events.head);
  xcb_flush(screen.handle());
}

Point ScreenWatch::pointer() {
  const auto reply = replyTo(screen.handle(), xcb_query_pointer(screen.handle(), screen.root()),
                             xcb_query_pointer_reply);
  if (!reply) failWithDisplay();
  return {reply->root_x - shown.left, reply->root_y - shown.top};
}

void ScreenWatch::take(const xcb_generic_event_t& event, ChangeList& damage, ScreenNews& news) {
  const uint8 type = event.response_type & static_cast<uint8>(~kSentBit);
  xcb_connection_t* connection = screen.handle();
  if (hasDamage && type == firstEventOf(connection, xcb_damage_id) + XCB_DAMAGE_NOTIFY) {
    const auto& notify = reinterpret_cast<const xcb_damage_notify_event_t&>(event);
    Rect rect;
    Rect_SetFromXYWH(&rect, notify.area.x, notify.area.y, notify.area.width, notify.area.height);
    const Point origin = {shown.left, shown.top};
    Rect_TranslateInv(&rect, &rect, &origin);
    damage.add(rect);
    ++news.rectangles;
    news.pixels += areaOf(rect);
  } else if (hasCursor &&
             type == firstEventOf(connection, xcb_xfixes_id) + XCB_XFIXES_CURSOR_NOTIFY) {
    news.cursorChanged = true;
  } else if (type == XCB_GE_GENERIC) {
    const auto& generic = reinterpret_cast<const xcb_ge_generic_event_t&>(event);
    if (generic.extension == inputOpcode) news.pointerMoved = true;
  } else if (type == XCB_CONFIGURE_NOTIFY) {
    const auto& notify = reinterpret_cast<const xcb_configure_notify_event_t&>(event);
    if (notify.window == screen.root()) news.resized = true;
  }
  news.any = true;
}

ScreenNews ScreenWatch::listen(ChangeList& damage) {
  ScreenNews news;
  xcb_connection_t* connection = screen.handle();
  while (const EventPointer event{xcb_poll_for_event(connection), free}) take(*event, damage, news);
  if (xcb_connection_has_error(connection) != 0) failWithDisplay();
  for (const Rect& rect : hidden) {
    Rect inPart = rect;
    const Point origin = {shown.left, shown.top};
    Rect_TranslateInv(&inPart, &rect, &origin);
    damage.subtract(inPart);
  }
  return news;
}

void ScreenWatch::resize() {
  screen.measure();
  const Rect whole = screen.bounds();
  const Rect region = wantedPart.value_or(whole);
  if (!Rect_Intersect(&shown, &region, &whole))
    throw Failure(regionText(region) + " does not lie within the screen of " + regionText(whole));
  makeMemory();
}

void ScreenWatch::makeMemory() {
  rowPitch = screen.rowBytes(width());
  const size_t size = size_t{rowPitch} * height();
  shared.reset();
  ownRows = {};
  if (SharedMemory::isOffered(screen.handle()))
    shared = std::make_unique<SharedMemory>(screen.handle(), size);
  if (shared != nullptr && shared->isAttached()) {
    rows = shared->data();
  } else {
    shared.reset();
    ownRows.resize(size);
    rows = ownRows.data();
  }
  if (screen.code() != 32) asTrueColor = Picture(width(), height(), 32);
}

std::vector<ScreenWatch::Rows> ScreenWatch::damagedRows(const ChangeList& damage) {
  std::vector<Rows> bands;
  for (const RectList& list : damage.lists()) {
    Rect box = {};
    for (const Rect& rect : rectsOf(list)) Rect_Union(&box, &rect);
    if (isEmpty(box)) continue;
    if (!bands.empty() && bands.back().bottom == box.top) {
      bands.back().bottom = box.bottom;
    } else {
      bands.push_back({box.top, box.bottom});
    }
  }
  return bands;
}

bool ScreenWatch::captureShared(const std::vector<Rows>& bands) {
  xcb_connection_t* connection = screen.handle();
  std::vector<xcb_shm_get_image_cookie_t> cookies;
  cookies.reserve(bands.size());
  for (const Rows& band : bands)
    cookies.push_back(xcb_shm_get_image(
        connection, screen.root(), static_cast<int16>(shown.left),
        static_cast<int16>(shown.top + band.top), static_cast<uint16>(width()),
        static_cast<uint16>(band.bottom - band.top), ~0u, XCB_IMAGE_FORMAT_Z_PIXMAP, shared->id(),
        rowPitch * static_cast<uint32>(band.top)));
  bool isWhole = true;
  for (const auto& cookie : cookies)
    if (!replyTo(connection, cookie, xcb_shm_get_image_reply)) isWhole = false;
  return isWhole;
}

bool ScreenWatch::captureRows(const Rows& band) {
  const auto height = static_cast<uint32>(band.bottom - band.top);
  const auto reply = replyTo(
      screen.handle(),
      xcb_get_image(screen.handle(), XCB_IMAGE_FORMAT_Z_PIXMAP, screen.root(),
                    static_cast<int16>(shown.left), static_cast<int16>(shown.top + band.top),
                    static_cast<uint16>(width()), static_cast<uint16>(height), ~0u),
      xcb_get_image_reply);
  if (!reply) return false;
  const size_t size = size_t{rowPitch} * height;
  if (static_cast<size_t>(xcb_get_image_data_length(reply.get())) < size) return false;
  std::copy_n(xcb_get_image_data(reply.get()), size,
              rows + size_t{rowPitch} * static_cast<uint32>(band.top));
  return true;
}

void ScreenWatch::hide(const Rows& band) {
  const Rect inBand = {shown.left, shown.top + band.top, shown.right, shown.top + band.bottom};
  for (const Rect& rect : hidden) {
    Rect covered;
    if (!Rect_Intersect(&covered, &rect, &inBand)) continue;
    const Point origin = {shown.left, shown.top};
    Rect_TranslateInv(&covered, &covered, &origin);
    Raster_RectFill(rows, rowPitch, screen.bytesPerPixel(), 0, static_cast<uint32>(covered.left),
                    static_cast<uint32>(covered.top), widthOf(covered), heightOf(covered));
  }
}

PixelView ScreenWatch::converted(const ChangeList& damage) {
  std::array<uint32, 256> palette;
  std::transform(screen.colors(), screen.colors() + palette.size(), palette.begin(),
                 [](const ImageUtilColor& color) {
                   return uint32{color.red} << 16 | uint32{color.green} << 8 | color.blue;
                 });
  for (const RectList& list : damage.lists()) {
    for (const Rect& rect : rectsOf(list)) {
      const auto x = static_cast<uint32>(rect.left);
      const auto y = static_cast<uint32>(rect.top);
      Raster_ConvertPixels(asTrueColor.data(), asTrueColor.pitch(), 32, rows, rowPitch,
                           static_cast<int32>(screen.code()), screen.isIndexed(), palette.data(), x,
                           y, x, y, widthOf(rect), heightOf(rect));
    }
  }
  return {asTrueColor.data(), asTrueColor.pitch(), width(), height()};
}

std::optional<PixelView> ScreenWatch::capture(const ChangeList& damage) {
  xcb_connection_t* connection = screen.handle();
  // Before the capture, so that what changes meanwhile is told again.
  if (damageId != XCB_NONE) xcb_damage_subtract(connection, damageId, XCB_NONE, XCB_NONE);
  const std::vector<Rows> bands = damagedRows(damage);
  bool isWhole = true;
  if (shared != nullptr) {
    isWhole = captureShared(bands);
  } else {
    for (const Rows& band : bands) isWhole = captureRows(band) && isWhole;
  }
  if (xcb_connection_has_error(connection) != 0) failWithDisplay();
  if (!isWhole) return std::nullopt;
  for (const Rows& band : bands) hide(band);
  if (screen.code() != 32) return converted(damage);
  return PixelView{rows, rowPitch, width(), height()};
}

}  // namespace tool::live
