// SPDX-License-Identifier: MIT
//
// Blocks of pixels behind a header, as a run-length code over 32-bit words or as they are.
//
// In the code a word that equals the one before it is followed by a count of further copies; after
// a count the comparison starts afresh. Encoder and decoder are made of three steps that run in
// vectors: copy words up to the first pair of equal ones, measure a run, write a run.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/rasterCompress.cpp"
#include "hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <algorithm>

#include "frameBuffer.h"
#include "rasterCompressInternal.h"
#include "rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Words = hn::ScalableTag<uint32>;
using Word = hn::Vec<Words>;

HWY_INLINE uint32 wordAt(const uint8* words, size_t i) { return loadPixel<4>(words + 4 * i); }
HWY_INLINE void putWord(uint8* words, size_t i, uint32 word) { storePixel<4>(words + 4 * i, word); }

/// Copies words as long as each differs from the next one, at most `count`, and returns how many.
/// `src` has a word more than that; what `dst` has beyond the words copied, up to `count`, is
/// undefined.
HWY_INLINE size_t copyUpToPair(const uint8* src, uint8* dst, size_t count) {
  size_t i = 0;
#if HWY_TARGET != HWY_SCALAR
  const Words d;
  for (; count - i >= hn::Lanes(d); i += hn::Lanes(d)) {
    const Word words = loadLanes(d, src + 4 * i);
    const auto pairs = hn::Eq(words, loadLanes(d, src + 4 * i + 4));
    storeLanes(d, words, dst + 4 * i);
    const intptr_t first = hn::FindFirstTrue(d, pairs);
    if (first >= 0) return i + static_cast<size_t>(first);
  }
#endif
  for (; i < count && wordAt(src, i) != wordAt(src, i + 1); ++i) putWord(dst, i, wordAt(src, i));
  return i;
}

/// How many of `count` words equal `word`, from the first one on.
HWY_INLINE size_t runLength(const uint8* words, size_t count, uint32 word) {
  size_t i = 0;
#if HWY_TARGET != HWY_SCALAR
  const Words d;
  const size_t n = hn::Lanes(d);
  const Word same = hn::Set(d, word);
  const auto differ = [&](size_t at)
                          HWY_ATTR { return hn::Xor(loadLanes(d, words + 4 * at), same); };
  for (; count - i >= n; i += n) {
    const intptr_t first = hn::FindFirstTrue(d, hn::Ne(differ(i), hn::Zero(d)));
    if (first >= 0) return i + static_cast<size_t>(first);
    for (; count - i >= 5 * n; i += 4 * n) {
      const Word any = hn::Or(hn::Or(differ(i + n), differ(i + 2 * n)),
                              hn::Or(differ(i + 3 * n), differ(i + 4 * n)));
      if (!hn::AllTrue(d, hn::Eq(any, hn::Zero(d)))) break;
    }
  }
#endif
  while (i < count && wordAt(words, i) == word) ++i;
  return i;
}

/// Writes a word `count` times; `dst` has room for `room` words, of which those after the run may
/// change too.
HWY_INLINE void writeRun(uint8* dst, size_t count, size_t room, uint32 word) {
  size_t i = 0;
#if HWY_TARGET != HWY_SCALAR
  const Words d;
  const size_t n = hn::Lanes(d);
  const Word same = hn::Set(d, word);
  for (; i < count && room - i >= n; i += n) storeLanes(d, same, dst + 4 * i);
#else
  (void)room;
#endif
  for (; i < count; ++i) putWord(dst, i, word);
}

EncodedWords encode(const uint8* src, size_t total, uint8* code) {
  size_t in = 0;
  size_t out = 0;
  size_t unchanged = total;
  while (in < total && out < total) {
    const size_t most = std::min(total - in - 1, total - out);
    const size_t literals = copyUpToPair(src + 4 * in, code + 4 * out, most);
    in += literals;
    out += literals;
    if (out == total) break;
    const uint32 pixel = wordAt(src, in);
    putWord(code, out++, pixel);
    if (++in == total || literals == most) continue;
    putWord(code, out++, pixel);
    const size_t run = runLength(src + 4 * (in + 1), total - in - 1, pixel);
    in += 1 + run;
    unchanged = std::min(unchanged, out);
    putWord(code, out++, static_cast<uint32>(run));
  }
  return {out, unchanged};
}

size_t decode(const uint8* code, size_t codeWords, uint8* dst, size_t room) {
  size_t in = 0;
  size_t out = 0;
  while (in < codeWords) {
    const size_t most = std::min(codeWords - in - 1, room - std::min(room, out));
    const size_t literals = copyUpToPair(code + 4 * in, dst + 4 * out, most);
    in += literals;
    out += literals;
    const uint32 pixel = wordAt(code, in++);
    putWord(dst, out++, pixel);
    if (in == codeWords || wordAt(code, in) != pixel) continue;
    putWord(dst, out++, pixel);
    if (++in == codeWords) break;
    const size_t count = wordAt(code, in++);
    writeRun(dst + 4 * out, count, room - std::min(room, out), pixel);
    out += count;
  }
  return out;
}

constexpr CompressKernels kKernels = {encode, decode};

}  // namespace

const CompressKernels* compressKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "kernelChoice.h"
#include "panicPlace.h"
#include "raster.h"
#include "utilAlloc.h"

namespace raster {
namespace {

HWY_EXPORT(compressKernels);

constexpr char kSource[] = "lib/raster/rasterCompress";
// Part of the messages, whatever line the calls stand on.
constexpr int kBadEncodeDepthLine = 114;
constexpr int kBadDecodeDepthLine = 187;

const CompressKernels* lookUpKernels() { return HWY_DYNAMIC_DISPATCH(compressKernels)(); }
const CompressKernels& kernels() { return chosenKernels<lookUpKernels>(); }

/// The start of a block, in memory order. With 0 code words the pixels follow as they are.
struct Header {
  uint32 width, height, pitch, bpp, codeWords;
};
static_assert(sizeof(Header) == 20);

// A block's room beyond its pixels: for the header, for the last words of a code that proves too
// long, and for the bytes that the decoder reads beyond pixels whose total is no whole number.
constexpr size_t kSpareBytes = 32;

/// Depths whose pixels are stored as they are, without a look at them.
constexpr bool isStoredDepth(uint32 bpp) { return bpp == 8 || bpp == 16 || bpp == 24; }

/// Writes the payload of a block of 32-bit pixels and returns the number of its code words.
size_t writePayload(const uint8* src, size_t total, uint8* payload) {
  const EncodedWords code = kernels().encode(src, total, payload);
  if (code.count < total) return code.count;
  // The start of the code is the pixels already.
  memcpy(payload + 4 * code.unchanged, src + 4 * code.unchanged, 4 * (total - code.unchanged));
  return 0;
}

}  // namespace
}  // namespace raster

extern "C" {

void Raster_Compress(const void* src, uint32 pitch, uint32 bpp, uint32 width, uint32 height,
                     uint8** outBlock, uint32* outSize) {
  using namespace raster;
  const uint8* const pixels = static_cast<const uint8*>(src);
  const uint32 bytesPerPixel = bpp >> 3;
  if (bytesPerPixel == 0) notImplemented({kSource, kBadEncodeDepthLine});
  if (pitch == 0) pitch = width * bytesPerPixel;
  const size_t total = size_t{height} * pitch / bytesPerPixel;
  size_t payloadBytes = total * bytesPerPixel;
  uint8* const block = static_cast<uint8*>(UtilSafeMalloc0(payloadBytes + kSpareBytes));
  *outBlock = block;
  Header header = {width, height, pitch, bpp, 0};
  memcpy(block, &header, sizeof header);
  uint8* const payload = block + sizeof header;
  if (isStoredDepth(bpp)) {
    if (payloadBytes != 0) memcpy(payload, pixels, payloadBytes);
  } else if (bpp != 32) {
    notImplemented({kSource, kBadEncodeDepthLine});
  } else if (total != 0) {
    const size_t codeWords = writePayload(pixels, total, payload);
    if (codeWords != 0) payloadBytes = codeWords * 4;
    header.codeWords = static_cast<uint32>(codeWords);
    memcpy(block, &header, sizeof header);
  }
  *outSize = static_cast<uint32>(payloadBytes + sizeof header);
}

void Raster_Decompress(const uint8* block, uint8** outData, uint32* outPitch, uint32* outBpp,
                       uint32* outWidth, uint32* outHeight) {
  using namespace raster;
  Header header;
  memcpy(&header, block, sizeof header);
  const uint8* const payload = block + sizeof header;
  const size_t bytes = size_t{header.height} * header.pitch;
  *outWidth = header.width;
  *outHeight = header.height;
  *outPitch = header.pitch;
  *outBpp = header.bpp;
  uint8* const pixels = static_cast<uint8*>(UtilSafeMalloc0(bytes));
  *outData = pixels;
  if (header.codeWords == 0) {
    // Deliberate: stored pixels go over the caller's pointer and what follows it, not to the
    // buffer.
    memcpy(static_cast<void*>(outData), payload, bytes);
    return;
  }
  if (isStoredDepth(header.bpp)) notImplemented({kSource, kBadDecodeDepthLine});
  if (header.bpp != 32) return;
  const size_t written = 4 * kernels().decode(payload, header.codeWords, pixels, bytes / 4);
  if (written < bytes) memset(pixels + written, 0, bytes - written);
}

}  // extern "C"

#endif
