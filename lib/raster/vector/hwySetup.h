// SPDX-License-Identifier: MIT
//
// To be included before Highway's headers: the one name that its 512-bit code lacks on 32-bit x86.

#ifndef RASTER_HWY_SETUP_H
#define RASTER_HWY_SETUP_H

#ifdef __i386__
static inline unsigned long long _bzhi_u64(unsigned long long value, unsigned count) {
  return count >= 64 ? value : value & ((1ULL << count) - 1);
}
#endif

#endif
