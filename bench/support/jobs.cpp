// SPDX-License-Identifier: MIT

#include "support/jobs.h"

#include <sys/mman.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <vector>

#include "support/peers.h"

namespace bench {
namespace {

struct Contender {
  std::string name;
  double units = 0;
  double seconds = 0;  // of the best run, 0 while there was none
  double rate() const { return seconds > 0 ? units / seconds / 1e6 : 0; }
};

/// The contenders by job and size, in the order of their registration.
struct Table {
  std::vector<std::string> jobs;
  std::map<std::string, std::vector<Contender>> contenders;
};

Table& table() {
  static Table all;
  return all;
}

/// Collects the best time of every contender; prints nothing while the benchmarks run but a dot on
/// a terminal's error output.
class BestTimes : public benchmark::BenchmarkReporter {
 public:
  bool ReportContext(const Context& /*context*/) override { return true; }

  void ReportRuns(const std::vector<Run>& runs) override {
    for (const Run& run : runs) {
      if (run.run_type != Run::RT_Iteration || run.error_occurred) continue;
      note(run.run_name.function_name,
           run.real_accumulated_time / static_cast<double>(run.iterations));
    }
  }

 private:
  static void note(const std::string& name, double seconds) {
    const size_t slash = name.rfind('/') + 1;
    for (Contender& c : table().contenders[name.substr(0, slash)]) {
      if (c.name == name.substr(slash) && (c.seconds == 0 || seconds < c.seconds))
        c.seconds = seconds;
    }
  }
};

const Contender* find(const std::vector<Contender>& all, const char* name) {
  const auto at =
      std::find_if(all.begin(), all.end(), [&](const auto& c) { return c.name == name; });
  return at != all.end() && at->seconds > 0 ? &*at : nullptr;
}

const Contender* bestPeer(const std::vector<Contender>& all) {
  const Contender* best = nullptr;
  for (const Contender& c : all) {
    const bool peer = c.name != "raster" && c.name != "limit" && c.seconds > 0;
    if (peer && (best == nullptr || c.rate() > best->rate())) best = &c;
  }
  return best;
}

void printRatio(const Contender* ours, const Contender* other) {
  if (ours != nullptr && other != nullptr) {
    printf(" %7.2f", ours->rate() / other->rate());
  } else {
    printf(" %7s", "-");
  }
}

void printTable() {
  printf("%-44s %9s %9s %7s %9s %7s  %s\n", "job (million units/s)", "raster", "limit", "/limit",
         "peer", "/peer", "best peer");
  for (const std::string& job : table().jobs) {
    const auto& all = table().contenders[job];
    const Contender* ours = find(all, "raster");
    const Contender* limit = find(all, "limit");
    const Contender* peer = bestPeer(all);
    if (ours == nullptr && limit == nullptr && peer == nullptr) continue;
    printf("%-44s %9.4g %9.4g", job.substr(0, job.size() - 1).c_str(), ours ? ours->rate() : 0,
           limit ? limit->rate() : 0);
    printRatio(ours, limit);
    printf(" %9.4g", peer ? peer->rate() : 0);
    printRatio(ours, peer);
    printf("  %s\n", peer ? peer->name.c_str() : "none");
  }
}

void printLines() {
  for (const std::string& job : table().jobs) {
    const size_t slash = job.rfind('/', job.size() - 2);
    for (const Contender& c : table().contenders[job]) {
      if (c.seconds == 0) continue;
      printf("%s,%s,%g,%s,%.4g\n", job.substr(0, slash).c_str(),
             job.substr(slash + 1, job.size() - slash - 2).c_str(), c.units, c.name.c_str(),
             c.seconds * 1e9);
    }
  }
}

/// Takes the option out of the arguments.
bool takeOption(std::vector<char*>& arguments, const char* option) {
  const auto at = std::find_if(arguments.begin(), arguments.end(),
                               [&](const char* given) { return strcmp(given, option) == 0; });
  if (at == arguments.end()) return false;
  arguments.erase(at);
  return true;
}

void fillWithNoise(uint8* bytes, size_t count) {
  uint64 state = 1;
  for (size_t i = 0; i < count; ++i) {
    state = state * 6364136223846793005u + 1442695040888963407u;
    bytes[i] = static_cast<uint8>(state >> 56);
  }
}

}  // namespace

uint8* buffer(int index) {
  static uint8* const base = [] {
    void* memory = mmap(nullptr, kBuffers * kLargestBytes, PROT_READ | PROT_WRITE,
                        MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    if (memory == MAP_FAILED) abort();
    auto* bytes = static_cast<uint8*>(memory);
    for (size_t i = 0; i < kBuffers; ++i) fillWithNoise(bytes + i * kLargestBytes, kBufferBytes);
    return bytes;
  }();
  return base + static_cast<size_t>(index) * kLargestBytes;
}

void Contenders::fillLargeBuffers() {
  static const bool filled = [] {
    for (int i = 0; i < kBuffers; ++i) {
      for (size_t at = kBufferBytes; at < kLargestBytes; at += kBufferBytes)
        memcpy(buffer(i) + at, buffer(i), kBufferBytes);
    }
    return true;
  }();
  (void)filled;
}

bool grows(const std::string& job) {
  static const char* const kJobs[] = {
      "fill/32",       "copy/32",          "ropcopy/32-xor",         "tile/32-copy-64x64",
      "bits/32",       "convert/32-to-16", "compare/32-equal",       "blend/over-32",
      "blend/over-16", "yuv/YUY2-to-32",   "scale/bilinear-32-x1.5", "scale/box-32-x0.5"};
  return std::find(std::begin(kJobs), std::end(kJobs), job) != std::end(kJobs);
}

void Contenders::remember(const std::string& prefix, const std::string& contender, double units) {
  auto& all = table().contenders[prefix];
  if (all.empty()) table().jobs.push_back(prefix);
  all.push_back({contender, units});
}

int run(int argc, char** argv) {
  std::vector<char*> arguments(argv, argv + argc);
  const bool asLines = takeOption(arguments, "--csv");
  std::string defaults[] = {"--benchmark_enable_random_interleaving=true",
                            "--benchmark_repetitions=7", "--benchmark_min_time=0.01"};
  size_t at = 1;  // before the caller's, which then prevail
  for (std::string& argument : defaults)
    arguments.insert(arguments.begin() + static_cast<std::ptrdiff_t>(at++), argument.data());
  int count = static_cast<int>(arguments.size());
  benchmark::Initialize(&count, arguments.data());
  if (benchmark::ReportUnrecognizedArguments(count, arguments.data())) return 2;
  preparePeers();
  buffer(0);  // filled now, or the first contender's first call would take that long
  BestTimes best;
  benchmark::RunSpecifiedBenchmarks(&best);
  if (asLines)
    printLines();
  else
    printTable();
  return 0;
}

}  // namespace bench
