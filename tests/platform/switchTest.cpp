// SPDX-License-Identifier: MIT
//
// A program that sets rasterops_mmx is seen by the library, whether the program is position
// independent or has a copy of the word in its own data (this source is built both ways).
//
// The fast copy ends by emptying the x87 register stack; nothing else in a copy touches it. So a
// register loaded before the call is gone after it exactly when the library saw the switch.

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "raster.h"

namespace {

constexpr uint32 kPitch = 4 * 64;
constexpr uint32 kRows = 32;
uint8 source[kPitch * kRows];
uint8 target[kPitch * kRows];

struct X87State {
  uint16 words[14];  // the tags are the fifth word on a 4-byte grid
};

__attribute__((noinline)) bool copyTakesFastPath() {
  X87State state;
  asm volatile("fninit\n\tfld1" ::: "memory");
  Raster_RectCopy(target, kPitch, source, kPitch, 4, 0, 0, 0, 0, 64, kRows);
  asm volatile("fnstenv %0\n\tfninit" : "=m"(state)::"memory");
  constexpr int kTagWord = 4;
  return state.words[kTagWord] == 0xFFFF;  // every register empty
}

bool expect(bool good, const char* what) {
  if (!good) fprintf(stderr, "failed: %s\n", what);
  return good;
}

}  // namespace

int main() {
  for (size_t i = 0; i < sizeof source; ++i) source[i] = static_cast<uint8>(rand());
  bool good = expect(rasterops_mmx == 0, "the switch is 0 at the start");
  good &= expect(!copyTakesFastPath(), "a copy with the switch at 0 is the plain one");
  good &= expect(memcmp(source, target, sizeof source) == 0, "the plain copy copies");
  memset(target, 0, sizeof target);
  rasterops_mmx = 1;
  good &= expect(copyTakesFastPath(), "a copy with the switch at 1 is the fast one");
  good &= expect(memcmp(source, target, sizeof source) == 0, "the fast copy copies");
  rasterops_mmx = 0;
  good &= expect(!copyTakesFastPath(), "the switch can be set back");
  return good ? EXIT_SUCCESS : EXIT_FAILURE;
}
