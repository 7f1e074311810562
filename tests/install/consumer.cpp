// SPDX-License-Identifier: MIT
//
// The same from C++, with the headers by their full names.

#include <raster/dynBuf.h>
#include <raster/imageUtil.h>
#include <raster/raster.h>
#include <raster/rect.h>

#include <vector>

int main() {
  std::vector<uint8> from(16 * 4, 0x5A);
  std::vector<uint8> to(16 * 4);
  Raster_RectCopy(to.data(), 16, from.data(), 16, 4, 0, 0, 0, 0, 4, 4);
  DynBuf buffer;
  DynBuf_Init(&buffer);
  const bool appended = DynBuf_Append(&buffer, to.data(), to.size());
  DynBuf_Destroy(&buffer);
  return appended && from == to ? 0 : 1;
}
