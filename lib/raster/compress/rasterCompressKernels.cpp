// SPDX-License-Identifier: MIT
//
// Blocks of pixels behind a header, as a run-length code over 32-bit words or as they are.
//
// In the code a word that equals the one before it is followed by a count of further copies; after
// a count the comparison starts afresh. Encoder and decoder are made of three steps that run in
// vectors: copy words up to the first pair of equal ones, measure a run, write a run.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/compress/rasterCompressKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <algorithm>
#include <bit>

#include "frame/frameBuffer.h"
#include "compress/rasterCompressInternal.h"
#include "vector/rows-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using WordLanes = hn::ScalableTag<uint32>;
using Word = hn::Vec<WordLanes>;

HWY_INLINE uint32 wordAt(const uint8* words, size_t i) { return loadPixel<4>(words + 4 * i); }
HWY_INLINE void putWord(uint8* words, size_t i, uint32 word) { storePixel<4>(words + 4 * i, word); }

/// Copies words as long as each differs from the next one, at most `count`, and returns how many.
/// `src` has a word more than that; `dst` has room for `room` words, of which those after the ones
/// copied may change too.
HWY_INLINE size_t copyUpToPair(const uint8* src, uint8* dst, size_t count, size_t room) {
  size_t i = 0;
#if HWY_TARGET != HWY_SCALAR
  const WordLanes d;
  const size_t most = std::min(count, room);
  for (; most - i >= hn::Lanes(d); i += hn::Lanes(d)) {
    const Word words = loadLanes(d, src + 4 * i);
    const auto pairs = hn::Eq(words, loadLanes(d, src + 4 * i + 4));
    storeLanes(d, words, dst + 4 * i);
    const intptr_t first = hn::FindFirstTrue(d, pairs);
    if (first >= 0) return i + static_cast<size_t>(first);
  }
#else
  (void)room;
#endif
  for (; i < count && wordAt(src, i) != wordAt(src, i + 1); ++i) putWord(dst, i, wordAt(src, i));
  return i;
}

/// How many of `count` words equal `word`, from the first one on.
HWY_INLINE size_t runLength(const uint8* words, size_t count, uint32 word) {
  size_t i = 0;
#if HWY_TARGET != HWY_SCALAR
  const WordLanes d;
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
  const WordLanes d;
  const size_t n = hn::Lanes(d);
  const Word same = hn::Set(d, word);
  const size_t whole = std::min(count, room / n * n);
  for (; i < whole; i += n) storeLanes(d, same, dst + 4 * i);
#else
  (void)room;
#endif
  for (; i < count; ++i) putWord(dst, i, word);
}

/// How far the encoder or the decoder is, in words.
struct Progress {
  size_t in, out;
};

/// The last count that the encoder wrote ends what is `unchanged` for good.
struct EncoderProgress : Progress {
  size_t unchanged;
};

HWY_INLINE void putCount(uint8* code, EncoderProgress& at, size_t count) {
  at.unchanged = std::min(at.unchanged, at.out);
  putWord(code, at.out++, static_cast<uint32>(count));
}

/// Encodes literals up to a pair, and the run that it begins. A code that has become as long as the
/// pixels is given up by the caller.
void encodeStep(const uint8* src, size_t total, uint8* code, EncoderProgress& at) {
  const size_t most = std::min(total - at.in - 1, total - at.out);
  const size_t literals = copyUpToPair(src + 4 * at.in, code + 4 * at.out, most, most);
  at.in += literals;
  at.out += literals;
  const uint32 pixel = wordAt(src, at.in++);
  putWord(code, at.out++, pixel);
  if (literals == most) return;
  putWord(code, at.out++, pixel);
  const size_t run = runLength(src + 4 * (at.in + 1), total - at.in - 1, pixel);
  at.in += 1 + run;
  putCount(code, at, run);
}

/// Decodes literals up to a pair, and its run.
void decodeStep(const uint8* code, size_t codeWords, uint8* dst, size_t room, Progress& at) {
  const size_t most = codeWords - at.in - 1;
  const size_t literals =
      copyUpToPair(code + 4 * at.in, dst + 4 * at.out, most, room - std::min(room, at.out));
  at.in += literals;
  at.out += literals;
  const uint32 pixel = wordAt(code, at.in++);
  putWord(dst, at.out++, pixel);
  if (literals == most) return;
  putWord(dst, at.out++, pixel);
  if (++at.in == codeWords) return;
  const size_t count = wordAt(code, at.in++);
  writeRun(dst + 4 * at.out, count, room - std::min(room, at.out), pixel);
  at.out += count;
}

#if HWY_TARGET != HWY_SCALAR

// Away from the ends, words are handled in blocks: first every pair of the block is found, as a bit
// each; then the steps are taken from the bits, without a look at the words and, as literals are
// copied in whole chunks, mostly without a branch that depends on them.

using PairBits = uintptr_t;
constexpr size_t kBlock = 8 * sizeof(PairBits);
constexpr size_t kChunk = 16;

/// What a block may read, or write, at most: its own words, a count to each pair, and the rest of a
/// chunk.
constexpr size_t kBlockReads = kBlock + kChunk + 2;
constexpr size_t kBlockWrites = 2 * kBlock + kChunk;

/// Copies a block and returns which of its words equal the next one.
HWY_INLINE PairBits copyAndFindPairs(const uint8* src, uint8* dst) {
  const WordLanes d;
  PairBits pairs = 0;
  for (size_t i = 0; i < kBlock; i += hn::Lanes(d)) {
    const Word words = loadLanes(d, src + 4 * i);
    storeLanes(d, words, dst + 4 * i);
    uint8 bits[8] = {};
    hn::StoreMaskBits(d, hn::Eq(words, loadLanes(d, src + 4 * i + 4)), bits);
    uint32 low = 0;
    memcpy(&low, bits, sizeof low);
    pairs |= PairBits{low} << i;
  }
  return pairs;
}

HWY_INLINE void copyChunks(const uint8* src, uint8* dst, size_t count) {
  const WordLanes d;
  for (size_t i = 0; i < count; i += kChunk) {
    for (size_t j = i; j < i + kChunk; j += hn::Lanes(d))
      storeLanes(d, loadLanes(d, src + 4 * j), dst + 4 * j);
  }
}

/// Encodes a block, and further if it ends within a run.
HWY_INLINE void encodeBlock(const uint8* src, size_t total, uint8* code, EncoderProgress& at) {
  const uint8* const block = src + 4 * at.in;
  const PairBits pairs = copyAndFindPairs(block, code + 4 * at.out);
  size_t done = 0;
  while (done < kBlock) {
    const PairBits rest = pairs >> done;
    const size_t toPair = rest == 0 ? kBlock - done : static_cast<size_t>(std::countr_zero(rest));
    const size_t pair = done + toPair;
    if (toPair != kBlock) copyChunks(block + 4 * done, code + 4 * at.out, toPair + 2);
    at.out += toPair;
    done = pair;
    if (rest == 0) break;
    at.out += 2;
    const size_t equal = static_cast<size_t>(std::countr_one(pairs >> pair));
    if (pair + equal < kBlock) {
      putCount(code, at, equal - 1);
      done = pair + equal + 1;
    } else {
      const size_t known = kBlock - pair - 1;
      const size_t further =
          runLength(block + 4 * (kBlock + 1), total - at.in - kBlock - 1, wordAt(block, pair));
      putCount(code, at, known + further);
      done = kBlock + 1 + further;
    }
  }
  at.in += done;
}

/// Decodes a block of the code as long as the output has room, at most `last` words before it.
HWY_INLINE void decodeBlock(const uint8* code, uint8* dst, size_t room, size_t last, Progress& at) {
  const uint8* const block = code + 4 * at.in;
  const PairBits pairs = copyAndFindPairs(block, dst + 4 * at.out);
  size_t done = 0;
  while (done < kBlock && at.out <= last) {
    const PairBits rest = pairs >> done;
    const size_t toPair = rest == 0 ? kBlock - done : static_cast<size_t>(std::countr_zero(rest));
    if (toPair != kBlock) copyChunks(block + 4 * done, dst + 4 * at.out, toPair + 2);
    at.out += toPair;
    done += toPair;
    if (rest == 0) break;
    at.out += 2;
    const size_t count = wordAt(block, done + 2);
    writeRun(dst + 4 * at.out, count, room - at.out, wordAt(block, done));
    at.out += count;
    done += 3;
  }
  at.in += done;
}

#endif

EncodedWords encode(const uint8* src, size_t total, uint8* code) {
  EncoderProgress at = {{0, 0}, total};
#if HWY_TARGET != HWY_SCALAR
  while (total - at.in >= kBlockReads && total - std::min(total, at.out) >= kBlockWrites)
    encodeBlock(src, total, code, at);
#endif
  while (at.in < total && at.out < total) encodeStep(src, total, code, at);
  return {at.out, at.unchanged};
}

size_t decode(const uint8* code, size_t codeWords, uint8* dst, size_t room) {
  Progress at = {0, 0};
#if HWY_TARGET != HWY_SCALAR
  const size_t last = room - std::min(room, kBlockWrites);
  while (codeWords - at.in >= kBlockReads && at.out < last) decodeBlock(code, dst, room, last, at);
#endif
  while (at.in < codeWords) decodeStep(code, codeWords, dst, room, at);
  return at.out;
}

constexpr CompressKernels kKernels = {encode, decode};

}  // namespace

const CompressKernels* compressKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(compressKernels);

}  // namespace

const CompressKernels* lookUpCompress() { return HWY_DYNAMIC_DISPATCH(compressKernels)(); }

}  // namespace raster

#endif
