// SPDX-License-Identifier: MIT

#include "sharedMemory.h"

#include <sys/ipc.h>
#include <sys/shm.h>

#include <cstdlib>

#include "xReply.h"

namespace tool {

SharedMemory::SharedMemory(xcb_connection_t* to, size_t size) : connection(to) {
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

SharedMemory::~SharedMemory() {
  if (segment != XCB_NONE) {
    xcb_shm_detach(connection, segment);
    xcb_flush(connection);
  }
  if (bytes != nullptr) shmdt(bytes);
}

bool SharedMemory::isOffered(xcb_connection_t* connection) {
  return hasExtension(connection, xcb_shm_id);
}

/// A server on another machine, or in another container, refuses.
void SharedMemory::attach(uint32 systemId) {
  const xcb_shm_seg_t wanted = xcb_generate_id(connection);
  xcb_generic_error_t* error =
      xcb_request_check(connection, xcb_shm_attach_checked(connection, wanted, systemId, 0));
  if (error == nullptr) segment = wanted;
  free(error);
}

}  // namespace tool
