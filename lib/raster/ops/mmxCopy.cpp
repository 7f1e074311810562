// SPDX-License-Identifier: MIT
//
// The copy that bypasses the cache. Nothing else in the library touches MMX.

#include "mmxCopy.h"

#include <cstring>

#include "frame/frameBuffer.h"

namespace raster {
namespace {

// Assembler, because compilers turn the intrinsics into other registers on 64-bit x86.
inline void streamWord(uint8* dst, const uint8* src) {
  asm volatile(
      "movq (%1), %%mm0\n\t"
      "movntq %%mm0, (%0)"
      :
      : "r"(dst), "r"(src)
      : "memory", "mm0");
}

inline void streamBlock(uint8* dst, const uint8* src) {
  asm volatile(
      "movq (%1), %%mm0\n\t"
      "movq 8(%1), %%mm1\n\t"
      "movq 16(%1), %%mm2\n\t"
      "movq 24(%1), %%mm3\n\t"
      "movntq %%mm0, (%0)\n\t"
      "movntq %%mm1, 8(%0)\n\t"
      "movntq %%mm2, 16(%0)\n\t"
      "movntq %%mm3, 24(%0)"
      :
      : "r"(dst), "r"(src)
      : "memory", "mm0", "mm1", "mm2", "mm3");
}

void streamRow(uint8* dst, const uint8* src, size_t head, size_t rest) {
  memcpy(dst, src, head);
  dst += head;
  src += head;
  for (size_t words = rest / 8 % 4; words != 0; --words, dst += 8, src += 8) streamWord(dst, src);
  for (size_t blocks = rest / 32; blocks != 0; --blocks, dst += 32, src += 32)
    streamBlock(dst, src);
  memcpy(dst, src, rest % 8);
}

}  // namespace

void mmxCopyRows(const RowPair& rows) {
  const size_t head = -reinterpret_cast<uintptr_t>(rows.dst) & 7;
  uint8* dst = rows.dst;
  const uint8* src = rows.src;
  for (uint32 y = rows.rows; y != 0; --y) {
    streamRow(dst, src, head, rows.bytes - head);
    dst = nextRow(dst, rows.dstStep);
    src = nextRow(src, rows.srcStep);
  }
  asm volatile("sfence\n\temms" ::: "memory");
}

}  // namespace raster
