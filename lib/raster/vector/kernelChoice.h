// SPDX-License-Identifier: MIT
//
// The choice of a module's kernels: looked up by Highway's dispatch on the first call, then one
// load.

#ifndef RASTER_KERNEL_CHOICE_H
#define RASTER_KERNEL_CHOICE_H

#include <atomic>

namespace raster {

template <auto kLookUp> inline constinit std::atomic<decltype(kLookUp())> lookedUpKernels{nullptr};

/// The first call's way, kept out of the functions that call kernels. The level does not change
/// within a process, so threads that race here store the same pointer.
template <auto kLookUp> [[gnu::noinline, gnu::cold]] auto lookUpKernelsOnce() {
  const auto kernels = kLookUp();
  lookedUpKernels<kLookUp>.store(kernels, std::memory_order_release);
  return kernels;
}

/// The kernels that `kLookUp` finds for this processor.
template <auto kLookUp> inline const auto& chosenKernels() {
  auto kernels = lookedUpKernels<kLookUp>.load(std::memory_order_acquire);
  if (kernels == nullptr) [[unlikely]]
    kernels = lookUpKernelsOnce<kLookUp>();
  return *kernels;
}

}  // namespace raster

#endif
