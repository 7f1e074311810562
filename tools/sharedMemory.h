// SPDX-License-Identifier: MIT
//
// Memory that this program and an X server on the same machine both see.

#ifndef RASTER_TOOLS_SHARED_MEMORY_H
#define RASTER_TOOLS_SHARED_MEMORY_H

#include <xcb/shm.h>

#include "baseTypes.h"

namespace tool {

class SharedMemory {
 public:
  SharedMemory(xcb_connection_t* to, size_t size);
  ~SharedMemory();
  SharedMemory(const SharedMemory&) = delete;
  SharedMemory& operator=(const SharedMemory&) = delete;

  static bool isOffered(xcb_connection_t* connection);

  bool isAttached() const { return segment != XCB_NONE; }
  uint8* data() { return bytes; }
  const uint8* data() const { return bytes; }
  xcb_shm_seg_t id() const { return segment; }

 private:
  void attach(uint32 systemId);

  xcb_connection_t* connection;
  uint8* bytes = nullptr;
  xcb_shm_seg_t segment = XCB_NONE;
};

}  // namespace tool

#endif
