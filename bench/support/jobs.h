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

/// The sizes of the usual jobs: a frame, a rectangle that stays in the cache, a very small one.
inline constexpr Extent kExtents[] = {{1920, 1080}, {256, 64}, {16, 16}};

/// Shared memory, filled with noise when the program starts: kBuffers blocks of kBufferBytes,
/// aligned to a page. Contenders of a job use the same ones.
inline constexpr size_t kBufferBytes = size_t{16} << 20;
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
        units_(units) {}

  template <class Work> void add(const std::string& contender, Work work) {
    remember(prefix_, contender, units_);
    benchmark::RegisterBenchmark((prefix_ + contender).c_str(),
                                 [work](benchmark::State& state) mutable {
                                   for (auto _ : state) {
                                     work();
                                     used();
                                   }
                                 });
  }

 private:
  static void remember(const std::string& prefix, const std::string& contender, double units);
  std::string prefix_;
  double units_;
};

/// Registers a job at the usual sizes (or those given): `describe(contenders, extent)` adds the
/// contenders. Rates are in pixels.
template <class Describe> void job(const std::string& name, Describe describe) {
  for (const Extent extent : kExtents) {
    Contenders contenders(name, extent, extent.pixels());
    describe(contenders, extent);
  }
}

/// Runs what was registered and prints the table. To be returned from main. Arguments are Google
/// Benchmark's; --benchmark_filter=fill/32 picks jobs.
int run(int argc, char** argv);

}  // namespace bench

#endif
