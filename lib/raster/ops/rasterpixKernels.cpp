// SPDX-License-Identifier: MIT
//
// Rows filled with a repeated pixmap row, by plain copy or through a raster operation.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/ops/rasterpixKernels.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include <algorithm>

#include "ops/rasterpixInternal.h"
#include "ops/rop-inl.h"
#include "vector/rows-inl.h"
#include "vector/streams-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

using Bytes = hn::ScalableTag<uint8>;
using Copy = std::remove_const_t<decltype(kCopy)>;

/// Where a rectangle lies: in the inner caches, beyond them, or beyond all caches.
enum class Reach { kNear, kFar, kBeyond };

#if HWY_TARGET == HWY_SCALAR

constexpr size_t kBlockBytes = 1024;

/// Combines a row with a source of the same length.
template <class Rop, Reach kReach> void combineRow(uint8* dst, const uint8* src, size_t bytes) {
  combineInOrder<Rop, Walk::kToRight>(dst, src, bytes);
}

void copyRow(uint8* dst, const uint8* src, size_t bytes) { memcpy(dst, src, bytes); }

void repeatShortRow(Bytes /*d*/, uint8* dst, const uint8* src, size_t period, size_t bytes) {
  for (size_t i = 0; i < bytes; i += period) memcpy(dst + i, src, period);
}

/// Combines a row with a pattern that repeats after `period` bytes.
template <class Rop, Reach kReach>
void combinePeriods(uint8* dst, const uint8* pattern, size_t bytes, size_t period,
                    size_t /*lastPhase*/) {
  for (size_t i = 0; i != bytes; i += std::min(bytes - i, period))
    combineInOrder<Rop, Walk::kToRight>(dst + i, pattern, std::min(bytes - i, period));
}

#else

/// Rows are combined in blocks of so many bytes.
constexpr size_t kBlockBytes = 128;
static_assert(kBlockBytes >= 2 * kLanes<Bytes>);

/// What is beyond all caches and not read goes past them; what is far or read is fetched ahead.
template <class Rop, Reach kReach>
inline constexpr bool kStreams = kReach == Reach::kBeyond && !kReadsDst<Rop>;
template <class Rop, Reach kReach>
inline constexpr bool kFetches = kReach != Reach::kNear && !kStreams<Rop, kReach>;

/// Combines whole blocks from `dst` to less than a block before `end` with one that repeats.
/// Returns where it stopped. The block stays in registers. Memory that is far is fetched ahead.
template <class Rop, Reach kReach>
HWY_INLINE uint8* combineBlocks(uint8* dst, const uint8* end, const uint8* pattern) {
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  hn::Vec<Bytes> block[kBlockBytes / n];
  for (size_t k = 0; k < kBlockBytes; k += n) block[k / n] = loadLanes(d, pattern + k);
  for (; static_cast<size_t>(end - dst) >= kBlockBytes; dst += kBlockBytes) {
    for (size_t k = 0; kFetches<Rop, kReach> && k < kBlockBytes; k += kCacheLine)
      fetchAhead(dst + k);
    for (size_t k = 0; k < kBlockBytes; k += n)
      putLanes<kStreams<Rop, kReach>>(d, combinedWith<Rop>(d, block[k / n], dst + k), dst + k);
  }
  return dst;
}

/// Combines a row of at least a vector with a pattern that repeats after `period` bytes, at least
/// a block, and is there for another block. The byte `lastPhase` of the pattern falls on the start
/// of the row's last vector.
template <class Rop, Reach kReach>
HWY_INLINE void combinePeriods(uint8* dst, const uint8* pattern, size_t bytes, size_t period,
                               size_t lastPhase) {
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  const auto first = combined<Rop>(d, pattern, dst);
  uint8* const end = dst + bytes;
  const size_t phase = n - reinterpret_cast<uintptr_t>(dst) % n;
  uint8* at = dst + phase;
  const uint8* source = pattern + phase;
  const uint8* const wrap = pattern + period;
  const auto left = [&] { return static_cast<size_t>(end - at); };
  if (period == kBlockBytes && left() >= kBlockBytes + n)
    at = combineBlocks<Rop, kReach>(at, end - n, source);
  for (; left() > kBlockBytes + n; at += kBlockBytes) {
    for (size_t k = 0; kFetches<Rop, kReach> && k < kBlockBytes; k += kCacheLine)
      fetchAhead(at + k);
    for (size_t k = 0; k < kBlockBytes; k += n)
      putLanes<kStreams<Rop, kReach>>(d, combined<Rop>(d, source + k, at + k), at + k);
    source += kBlockBytes;
    if (source >= wrap) source -= period;
  }
  const auto last = combined<Rop>(d, pattern + lastPhase, end - n);
  for (; left() > n; at += n, source += n) combine<Rop>(d, source, at);
  storeLanes(d, first, dst);
  storeLanes(d, last, end - n);
}

/// Combines a row with a source of the same length.
template <class Rop, Reach kReach>
HWY_INLINE void combineRow(uint8* dst, const uint8* src, size_t bytes) {
  if (bytes > kLanes<Bytes>) {
    combinePeriods<Rop, kReach>(dst, src, bytes, bytes, bytes - kLanes<Bytes>);
  } else {
    withShortRow(Bytes(), bytes, CombinedAt<Rop>(),
                 [&](auto row) HWY_ATTR { row(dst, src, bytes); });
  }
}

/// Copies a row of at least a vector.
HWY_INLINE void copyRow(uint8* dst, const uint8* src, size_t bytes) {
  const Bytes d;
  constexpr size_t n = kLanes<Bytes>;
  storeLanes(d, loadLanes(d, src), dst);
  for (size_t i = n - reinterpret_cast<uintptr_t>(dst) % n; bytes - i > n; i += n)
    storeLanes(d, loadLanes(d, src + i), dst + i);
  storeLanes(d, loadLanes(d, src + bytes - n), dst + bytes - n);
}

/// Repeats `period` bytes, less than two vectors, up to `bytes` and a period more at most. What was
/// stored is not read again: that would have to wait for the stores.
template <class D>
HWY_INLINE void repeatShortRow(D d, uint8* dst, const uint8* src, size_t period, size_t bytes) {
  constexpr size_t n = kLanes<D>;
  if (period > n) {
    const auto first = loadLanes(d, src);
    const auto last = loadLanes(d, src + period - n);
    for (size_t i = 0; i < bytes; i += period) {
      storeLanes(d, first, dst + i);
      storeLanes(d, last, dst + i + period - n);
    }
  } else if (period == n) {
    const auto all = loadLanes(d, src);
    for (size_t i = 0; i < bytes; i += n) storeLanes(d, all, dst + i);
  } else if constexpr (n > 1) {
    repeatShortRow(hn::Half<D>(), dst, src, period, bytes);
  }
}

#endif

/// Calls row(dst, src, bytes) for the parts of a row that a pixmap row falls on, from its phase on
/// and over and over.
template <class Row>
HWY_INLINE void tileRow(uint8* dst, const uint8* src, size_t bytes, size_t period, size_t phase,
                        const Row& row) {
  size_t i = std::min(bytes, period - phase);
  row(dst, src + phase, i);
  for (; i != bytes; i += std::min(bytes - i, period))
    row(dst + i, src, std::min(bytes - i, period));
}

template <class Rop> void tileRows(const TileRows& t) {
  uint8* dst = t.dst;
  uint32 srcY = t.srcY;
  for (uint32 y = t.height; y != 0; --y, dst = nextRow(dst, t.dstStep)) {
    tileRow(dst, rowAt(t.src, t.srcStep, srcY, 0, 0), t.bytes, t.period, t.phase,
            combineRow<Rop, Reach::kFar>);
    srcY = srcY + 1 == t.srcRows ? 0 : srcY + 1;
  }
}

constexpr size_t kLongestVector = 64;
constexpr size_t kBufferBytes = 32768;

/// How pixmap rows lie in a buffer: repeated, and short ones from their start, others from a byte
/// that leaves no less than a vector in front of their end.
struct WideRows {
  size_t skipped;  ///< bytes of a pixmap row that are left out at the start
  size_t start;    ///< the place of the byte that the phase asks for
  size_t bytes;    ///< what there is from there: all that a row needs, or a period and a block
  size_t period;   ///< what it repeats after: whole periods of the pixmap
  size_t step;
};

/// Periods of whole vectors let a row read its pattern at vector boundaries where it writes at
/// them; they are chosen where they are not too long.
HWY_INLINE WideRows wideRowsOf(const TileRows& t) {
  constexpr size_t n = kLanes<Bytes>;
  constexpr size_t kLongPeriod = 1024;
  const size_t powerOfTwo = std::min(t.period & (0 - t.period), kLongestVector);
  const size_t whole = t.period * (kLongestVector / powerOfTwo);
  const size_t unit = whole <= kLongPeriod ? whole : t.period;
  WideRows w{};
  w.period = unit;
  while (w.period < kBlockBytes) w.period += unit;
  w.bytes = w.period + kBlockBytes;
  if (t.bytes <= w.bytes) w.period = w.bytes = t.bytes;
  w.skipped = t.period < n ? 0 : std::min(t.phase, t.period - n);
  w.start = t.phase - w.skipped;
  w.step = (w.start + w.bytes + n + kLongestVector - 1) & (0 - kLongestVector);
  return w;
}

/// Copies rows of at least a vector.
HWY_NOINLINE void copyRows(uint8* dst, size_t dstStep, const uint8* src, intptr_t srcStep,
                           size_t bytes, uint32 rows) {
  for (; rows != 0; --rows, dst += dstStep, src = nextRow(src, srcStep)) copyRow(dst, src, bytes);
}

/// Lays out `rows` pixmap rows from `src` on.
HWY_NOINLINE void widenRows(const uint8* src, intptr_t srcStep, size_t period, uint32 rows,
                            const WideRows& w, uint8* wide) {
  constexpr size_t n = kLanes<Bytes>;
  const size_t end = w.start + w.bytes;
  const size_t step = w.step;
  if (period < n) {
    for (; rows != 0; --rows, wide += step, src = nextRow(src, srcStep))
      repeatShortRow(Bytes(), wide, src, period, end);
    return;
  }
  const size_t first = period - w.skipped;
  copyRows(wide, step, src + w.skipped, srcStep, std::min(first, std::max(end, n)), rows);
  for (size_t i = first; i < end; i += period)
    copyRows(wide + i, step, src, srcStep, std::min(period, std::max(end - i, n)), rows);
}

/// Combines rows with `wideRows` widened ones, from the one with the number `y` on.
template <class Rop, Reach kReach>
HWY_NOINLINE void combineWideRows(uint8* dst, intptr_t dstStep, size_t bytes, uint32 height,
                                  const uint8* wide, size_t wideStep, uint32 wideRows, uint32 y,
                                  size_t period) {
  constexpr size_t n = kLanes<Bytes>;
  const uint8* const end = wide + wideRows * wideStep;
  const uint8* pattern = wide + y * wideStep;
  const size_t lastPhase = bytes <= n ? 0 : period == bytes ? bytes - n : (bytes - n) % period;
  for (; height != 0; --height, dst = nextRow(dst, dstStep)) {
    if (bytes <= n) {
      combineRow<Rop, kReach>(dst, pattern, bytes);
    } else {
      combinePeriods<Rop, kReach>(dst, pattern, bytes, period, lastPhase);
    }
    pattern += wideStep;
    if (pattern == end) pattern = wide;
  }
}

#if HWY_TARGET != HWY_SCALAR

template <class Rop>
HWY_NOINLINE void streamWideRows(uint8* dst, intptr_t dstStep, size_t bytes, uint32 height,
                                 const uint8* wide, size_t wideStep, uint32 wideRows, uint32 y,
                                 size_t period) {
  combineWideRows<Rop, Reach::kBeyond>(dst, dstStep, bytes, height, wide, wideStep, wideRows, y,
                                       period);
  endStreams();
}

#endif

/// What combines rows, for the distance at which they lie.
template <class Rop> HWY_INLINE auto combineWideRowsAt(const TileRows& t) {
#if HWY_TARGET != HWY_SCALAR
  if (!kReadsDst<Rop> && isStreamed(t.bytes, t.bytes, t.height)) return streamWideRows<Rop>;
#endif
  return isFar(t.bytes, t.height) ? combineWideRows<Rop, Reach::kFar>
                                  : combineWideRows<Rop, Reach::kNear>;
}

/// Widens all pixmap rows, or as many as there is room for before they are used.
template <class Rop> void tileWidened(const TileRows& t) {
  alignas(kLongestVector) uint8 buffer[kBufferBytes];
  const WideRows w = wideRowsOf(t);
  // Rows that are used only once or twice are not to leave the innermost cache before that.
  const size_t bytes = t.height / 2 >= t.srcRows ? kBufferBytes : kBufferBytes / 4;
  const auto room = static_cast<uint32>((bytes - kLongestVector) / w.step);
  const bool all = t.srcRows <= room && t.srcRows <= t.height;
  const auto combineRows = combineWideRowsAt<Rop>(t);
  uint8* dst = t.dst;
  uint32 srcY = t.srcY;
  uint32 height = t.height;
  while (height != 0) {
    const uint32 first = all ? 0 : srcY;
    const uint32 rows = std::min(all ? t.srcRows : std::min(height, room), t.srcRows - first);
    const uint32 slice = all ? height : rows;
    // The rows of the buffer lie to vector boundaries as those of the destination do.
    uint8* wide = buffer + (reinterpret_cast<uintptr_t>(dst) - w.start) % kLongestVector;
    widenRows(rowAt(t.src, t.srcStep, first, 0, 0), t.srcStep, t.period, rows, w, wide);
    combineRows(dst, t.dstStep, t.bytes, slice, wide + w.start, w.step, rows, srcY - first,
                w.period);
    dst = rowAt(dst, t.dstStep, slice, 0, 0);
    srcY = srcY + slice == t.srcRows ? 0 : srcY + slice;
    height -= slice;
  }
}

constexpr auto kTileRows = ropTable([](auto rop) -> TileKernels::Tile {
  if constexpr (kReadsSrc<decltype(rop)>) return tileRows<decltype(rop)>;
  return nullptr;
});
constexpr auto kTileWidened = ropTable([](auto rop) -> TileKernels::Tile {
  if constexpr (kReadsSrc<decltype(rop)>) return tileWidened<decltype(rop)>;
  return nullptr;
});
constexpr TileKernels kKernels = {kTileRows.data(), kTileWidened.data()};

}  // namespace

const TileKernels* tileKernels() { return &kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {
namespace {

HWY_EXPORT(tileKernels);

}  // namespace

const TileKernels* lookUpTile() { return HWY_DYNAMIC_DISPATCH(tileKernels)(); }

}  // namespace raster

#endif
