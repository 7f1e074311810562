// SPDX-License-Identifier: MIT
//
// The choice of a module's kernels: looked up by Highway's dispatch on the first call, then one
// load.

#ifndef RASTER_KERNEL_CHOICE_H
#define RASTER_KERNEL_CHOICE_H

#include <atomic>

namespace raster {

/// The kernels that `kLookUp` finds for this processor. The level does not change within a process,
/// so threads that race here store the same pointer.
template <auto kLookUp> inline const auto& chosenKernels() {
  static constinit std::atomic<decltype(kLookUp())> chosen{nullptr};
  auto kernels = chosen.load(std::memory_order_acquire);
  if (kernels == nullptr) [[unlikely]] {
    kernels = kLookUp();
    chosen.store(kernels, std::memory_order_release);
  }
  return *kernels;
}

}  // namespace raster

#endif
