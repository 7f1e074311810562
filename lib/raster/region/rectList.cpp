// SPDX-License-Identifier: MIT

#include "region/rectList.h"

#include <cstring>

namespace raster {

void clearFrom(RectList* list, uint32 first) {
  memset(list->rects + first, 0, sizeof(RectListEntry) * (kListSize - first));
}

}  // namespace raster
