// SPDX-License-Identifier: MIT
//
// Callers built for the old i386 convention enter with a stack that is aligned to 4 bytes only.
// Each family of functions is called from such a stack, at each of the four offsets, and must give
// what it gives from an aligned one.

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <type_traits>

#include "imageUtil.h"
#include "raster.h"

/// Calls `function` with `count` argument words from a stack pointer that is `offset` above a
/// multiple of 16, and returns its 32-bit result.
extern "C" uint32 callFromStack(const void* function, const uint32* words, uint32 count,
                                uint32 offset);
asm(R"(
    .text
    .type callFromStack, @function
callFromStack:
    push %ebp
    mov %esp, %ebp
    push %esi
    push %edi
    mov 12(%ebp), %esi
    mov 16(%ebp), %ecx
    lea (,%ecx,4), %eax
    sub %eax, %esp
    sub $32, %esp
    and $-16, %esp
    add 20(%ebp), %esp
    mov %esp, %edi
    cld
    rep movsl
    call *8(%ebp)
    lea -8(%ebp), %esp
    pop %edi
    pop %esi
    pop %ebp
    ret
    .size callFromStack, . - callFromStack
)");

namespace {

constexpr uint32 kPitch = 4 * 80;
constexpr uint32 kRows = 40;

/// The memory that the functions work on; each call begins with the same bytes.
struct Memory {
  uint8 dst[kPitch * kRows];
  uint8 src[kPitch * kRows];
  uint32 result = 0;
  uint32 size = 0;

  Memory() {
    srand(1);
    for (uint8& byte : dst) byte = static_cast<uint8>(rand());
    for (uint8& byte : src) byte = static_cast<uint8>(rand());
  }
};

struct ArgumentWords {
  uint32 words[32];
  uint32 count = 0;

  template <class T> void add(T value) {
    static_assert(sizeof value <= 8);
    uint32 raw[2] = {};
    memcpy(raw, &value, sizeof value);
    words[count++] = raw[0];
    if (sizeof value == 8) words[count++] = raw[1];
  }
};

uint32 currentOffset;

template <class... Parameters, class Result, class... Arguments>
void call(Memory& memory, Result (*function)(Parameters...), Arguments... arguments) {
  ArgumentWords packed;
  (packed.add(static_cast<Parameters>(arguments)), ...);
  const uint32 result = callFromStack(reinterpret_cast<const void*>(function), packed.words,
                                      packed.count, currentOffset);
  if constexpr (!std::is_void_v<Result>) memcpy(&memory.result, &result, sizeof(Result));
}

struct Case {
  const char* name;
  void (*run)(Memory& m);
};

const Case kCases[] = {
    {"Raster_RectFill",
     [](Memory& m) { call(m, Raster_RectFill, m.dst, kPitch, 4, 0x12345678, 1, 1, 70, 30); }},
    {"Raster_RectCopy",
     [](Memory& m) {
       call(m, Raster_RectCopy, m.dst, kPitch, m.src, kPitch, 3, 1, 1, 2, 2, 70, 30);
     }},
    {"Raster_RectFillAlpha",
     [](Memory& m) { call(m, Raster_RectFillAlpha, m.dst, kPitch, 0x80, 1, 1, 70, 30); }},
    {"Raster_RectROPfill",
     [](Memory& m) { call(m, Raster_RectROPfill, m.dst, kPitch, 3, 0x123456, 6, 1, 1, 70, 30); }},
    {"Raster_RectROPcopy",
     [](Memory& m) {
       call(m, Raster_RectROPcopy, m.dst, kPitch, m.src, kPitch, 4, 1, 1, 9, 2, 2, 70, 30);
     }},
    {"Raster_RectPixmapROPcopy",
     [](Memory& m) {
       call(m, Raster_RectPixmapROPcopy, m.dst, kPitch, m.src, kPitch, 3, 2, 1, 7, 5, 6, 1, 1, 70,
            30);
     }},
    {"Raster_BitsToPixels",
     [](Memory& m) {
       call(m, Raster_BitsToPixels, m.src, 16, m.dst, kPitch, 4, 70, 30, 0x12345678, 0x9ABCDEF0);
     }},
    {"Raster_ConvertPixels",
     [](Memory& m) {
       call(m, Raster_ConvertPixels, m.dst, kPitch, 16, m.src, kPitch, 32, false, nullptr, 1, 1, 2,
            2, 70, 30);
     }},
    {"Raster_ComparePixels",
     [](Memory& m) {
       call(m, Raster_ComparePixels, m.dst, kPitch, 32, m.src, kPitch, 32, 1, 1, 1, 1, 70, 30);
     }},
    {"Raster_AddRect",
     [](Memory& m) {
       RectList list = {{{0, 0, 10, 10}}};
       call(m, Raster_AddRect, &list, 5, 5, 10, 10);
       memcpy(m.dst, &list, sizeof list);
     }},
    {"Raster_AlphaBlendOver",
     [](Memory& m) {
       call(m, Raster_AlphaBlendOver, m.dst, 1, 1, kPitch, m.src, 2, 2, kPitch, 70, 30, 24, 32, 1);
     }},
    {"Raster_Scale",
     [](Memory& m) {
       call(m, Raster_Scale, m.dst, kPitch, 32, 24, 80, 40, 0, 0, 0, 80, 40, m.src, kPitch, 32, 24,
            0, 40, 30, 0, 2.0, 40.0 / 30, 1);
     }},
    {"Raster_YUVtoRGB",
     [](Memory& m) { call(m, Raster_YUVtoRGB, m.src, m.dst, 80, 40, RASTER_VIDEO_YUY2, 32); }},
    {"Raster_Compress",
     [](Memory& m) {
       uint8* block = nullptr;
       call(m, Raster_Compress, m.src, kPitch, 32, 80, kRows, &block, &m.size);
       memcpy(m.dst, block, sizeof m.dst);
       free(block);
     }},
    {"ImageUtil_ConstructPNGBuffer",
     [](Memory& m) {
       const ImageUtilImage image = {80, kRows, 24, 32, kPitch, 0, 0, {}, m.src};
       DynBuf out;
       call(m, ImageUtil_ConstructPNGBuffer, &image, nullptr, &out);
       memcpy(m.dst, out.data, std::min(out.size, sizeof m.dst));
       DynBuf_Destroy(&out);
     }},
};

bool sameFromEveryOffset(const Case& item) {
  Memory aligned;
  currentOffset = 0;
  item.run(aligned);
  for (currentOffset = 4; currentOffset < 16; currentOffset += 4) {
    Memory misaligned;
    item.run(misaligned);
    if (memcmp(aligned.dst, misaligned.dst, sizeof aligned.dst) != 0 ||
        aligned.result != misaligned.result || aligned.size != misaligned.size) {
      fprintf(stderr, "%s: another result from stack offset %u\n", item.name, currentOffset);
      return false;
    }
  }
  return true;
}

}  // namespace

int main() {
  bool good = true;
  for (const Case& item : kCases) {
    fprintf(stderr, "%s\n", item.name);
    good &= sameFromEveryOffset(item);
  }
  return good ? EXIT_SUCCESS : EXIT_FAILURE;
}
