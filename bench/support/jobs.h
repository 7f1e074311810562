// SPDX-License-Identifier: MIT
//
// Benchmarks as jobs: one piece of work, done by several contenders on the same memory, at a few
// sizes. The program runs all contenders of a job interleaved and prints their ratios.

#ifndef BENCH_JOBS_H
#define BENCH_JOBS_H

#include <benchmark/benchmark.h>

#include <string>

#include "baseTypes.h"

namespace bench {

/// A rectangle in pixels.
struct Extent {
  uint32 width;
  uint32 height;
  double pixels() const { return static_cast<double>(width) * height; }
};

/// The sizes of the usual jobs: beyond every cache, a frame, a rectangle that stays in the cache, a
/// very small one, a glyph. Jobs that make files or allocate pictures leave the first one out.
inline constexpr Extent kExtents[] = {{4096, 4096}, {1920, 1080}, {256, 64}, {16, 16}, {4, 4}};
inline constexpr Extent kFileExtents[] = {{1920, 1080}, {256, 64}, {16, 16}, {4, 4}};

/// The sizes at which some jobs are measured once more, to see how they grow: squares, single
/// columns and single rows.
inline constexpr Extent kGrowth[] = {{4, 4},       {16, 16},     {64, 64}, {256, 256}, {1024, 1024},
                                     {4096, 4096}, {8192, 8192}, {1, 16},  {1, 256},   {1, 4096},
                                     {1, 16384},   {16, 1},      {256, 1}, {4096, 1},  {16384, 1}};

/// Shared memory: kBuffers blocks, aligned to a page. The first kBufferBytes of each are noise when
/// the program starts, and what it makes of them; behind them, for 8192x8192 pixels of four bytes,
/// lies their repetition, which is made when a large job runs. Contenders of a job use the same
/// ones.
inline constexpr size_t kBufferBytes = size_t{16} << 20;
inline constexpr size_t kLargestBytes = size_t{256} << 20;
inline constexpr int kBuffers = 4;
uint8* buffer(int index);

/// The same memory as the peers' interfaces want it.
inline uint32* words(uint8* bytes) { return static_cast<uint32*>(static_cast<void*>(bytes)); }

/// Tells the compiler that memory was used.
inline void used() { benchmark::ClobberMemory(); }

/// The contenders of one job at one size. The names "raster" (our library) and "limit" (memcpy or
/// memset of the same bytes) stand out in the report; every other one is a peer.
class Contenders {
 public:
  Contenders(const std::string& job, Extent extent, double units)
      : prefix_(job + "/" + std::to_string(extent.width) + "x" + std::to_string(extent.height) +
                "/"),
        units_(units),
        large_(extent.pixels() * 4 > kBufferBytes) {}

  template <class Work> void add(const std::string& contender, Work work) {
    remember(prefix_, contender, units_);
    auto* added = benchmark::RegisterBenchmark(
        (prefix_ + contender).c_str(), [work, large = large_](benchmark::State& state) mutable {
          if (large) fillLargeBuffers();
          for (auto _ : state) {
            work();
            used();
          }
        });
    if (large_) added->Repetitions(kLargeRepetitions);
  }

 private:
  /// A run of a large job takes long; but its times differ by a quarter, as memory is shared.
  static constexpr int kLargeRepetitions = 5;

  static void remember(const std::string& prefix, const std::string& contender, double units);
  static void fillLargeBuffers();
  std::string prefix_;
  double units_;
  bool large_;
};

/// Whether a job is one of those whose growth is measured.
bool grows(const std::string& job);

/// Registers a job at the usual sizes (or those given), and one that grows as growth/<job> at its
/// sizes, too: `describe(contenders, extent)` adds the contenders. Rates are in pixels.
template <class Describe, class Extents>
void job(const std::string& name, const Extents& extents, Describe describe) {
  const auto describeAt = [&](const std::string& as, Extent extent) {
    Contenders contenders(as, extent, extent.pixels());
    describe(contenders, extent);
  };
  for (const Extent extent : extents) describeAt(name, extent);
  if (!grows(name)) return;
  for (const Extent extent : kGrowth) describeAt("growth/" + name, extent);
}

template <class Describe> void job(const std::string& name, Describe describe) {
  job(name, kExtents, describe);
}

/// Runs what was registered and prints the table. To be returned from main. Arguments are Google
/// Benchmark's; --benchmark_filter=fill/32 picks jobs. With --csv it prints, in place of the table,
/// a line for each contender: job, size, units of a call, contender, nanoseconds of a call.
int run(int argc, char** argv);

}  // namespace bench

#endif
