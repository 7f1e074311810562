// SPDX-License-Identifier: MIT

#include <xcb/xcb.h>
#include <xcb/xfixes.h>

#include <cstdlib>
#include <memory>
#include <vector>

#include "link.h"
#include "screen.h"

namespace viewers {
namespace {

using Connection = std::unique_ptr<xcb_connection_t, decltype(&xcb_disconnect)>;
template <class Reply> using Owned = std::unique_ptr<Reply, decltype(&free)>;

Connection connected(const std::string& display) {
  Connection x(xcb_connect(display.c_str(), nullptr), xcb_disconnect);
  if (xcb_connection_has_error(x.get()) != 0) throw Broken("no connection to display " + display);
  return x;
}

using Reply = Owned<xcb_xfixes_get_cursor_image_reply_t>;

Reply ask(xcb_connection_t* x) {
  return {xcb_xfixes_get_cursor_image_reply(x, xcb_xfixes_get_cursor_image(x), nullptr), free};
}

/// X servers tell the cursor of a client that has left only while somebody else has its number.
Reply askInCompany(xcb_connection_t* x, const std::string& display) {
  std::vector<Connection> others;
  Reply reply = ask(x);
  while (reply == nullptr && others.size() < 100) {
    others.push_back(connected(display));
    reply = ask(x);
  }
  return reply;
}

}  // namespace

Pointer pointerOf(const std::string& display) {
  const Connection x = connected(display);
  // The extension has to hear which version is spoken.
  const auto version = xcb_xfixes_query_version(x.get(), 4, 0);
  const Owned<xcb_xfixes_query_version_reply_t> known(
      xcb_xfixes_query_version_reply(x.get(), version, nullptr), free);
  const Reply reply = askInCompany(x.get(), display);
  if (known == nullptr || reply == nullptr) throw Broken("the X server tells no cursor");
  const uint32_t* words = xcb_xfixes_get_cursor_image_cursor_image(reply.get());
  const int count = xcb_xfixes_get_cursor_image_cursor_image_length(reply.get());
  return {{reply->width, reply->height, reply->xhot, reply->yhot, {words, words + count}, false},
          reply->x - reply->xhot,
          reply->y - reply->yhot};
}

}  // namespace viewers
