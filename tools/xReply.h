// SPDX-License-Identifier: MIT
//
// Replies of an X server, owned.

#ifndef RASTER_TOOLS_X_REPLY_H
#define RASTER_TOOLS_X_REPLY_H

#include <xcb/xcb.h>

#include <cstdlib>
#include <memory>
#include <string>

#include "failure.h"

namespace tool {

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

inline bool hasExtension(xcb_connection_t* connection, xcb_extension_t& extension) {
  const xcb_query_extension_reply_t* reply = xcb_get_extension_data(connection, &extension);
  return reply != nullptr && reply->present != 0;
}

}  // namespace tool

#endif
