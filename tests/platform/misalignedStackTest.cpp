// SPDX-License-Identifier: MIT
//
// Callers built for the old i386 convention enter with a stack that is aligned to 4 bytes only.
// Each family of functions is called from such a stack, at each of the four offsets, and must give
// what it gives from an aligned one.

#include <cstdio>
#include <cstdlib>
#include <cstring>

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
  uint32 result;

  Memory() : result(0) {
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
  memory.result = callFromStack(reinterpret_cast<const void*>(function), packed.words, packed.count,
                                currentOffset);
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
};

bool sameFromEveryOffset(const Case& item) {
  Memory aligned;
  currentOffset = 0;
  item.run(aligned);
  for (currentOffset = 4; currentOffset < 16; currentOffset += 4) {
    Memory misaligned;
    item.run(misaligned);
    if (memcmp(aligned.dst, misaligned.dst, sizeof aligned.dst) != 0) {
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
