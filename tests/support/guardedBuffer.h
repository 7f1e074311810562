// SPDX-License-Identifier: MIT
//
// Memory that begins or ends at an inaccessible page, so that one byte too many faults.

#ifndef TESTS_GUARDED_BUFFER_H
#define TESTS_GUARDED_BUFFER_H

#include <cstddef>
#include <vector>

#include "baseTypes.h"

namespace tests {

/// Which end of the buffer lies at the inaccessible page.
enum class Guard { kBefore, kAfter };

/// `size` bytes with guard pages on both sides; the chosen side is exact to the byte. The alignment
/// of data() follows from the size (kAfter) or is that of a page (kBefore).
class GuardedBuffer {
 public:
  explicit GuardedBuffer(size_t size, Guard guard = Guard::kAfter);
  ~GuardedBuffer();
  GuardedBuffer(const GuardedBuffer&) = delete;
  GuardedBuffer& operator=(const GuardedBuffer&) = delete;

  uint8* data() { return data_; }
  const uint8* data() const { return data_; }
  size_t size() const { return size_; }
  uint8* end() { return data_ + size_; }

  /// Fills the buffer with `bytes`, which must have its size.
  void assign(const std::vector<uint8>& bytes);
  std::vector<uint8> bytes() const { return {data_, data_ + size_}; }

  /// Makes every page of the buffer inaccessible: for inputs that must not be read.
  void forbid();
  /// Makes every page of the buffer read-only: for outputs that must not be written.
  void forbidWriting();

 private:
  void* mapping_ = nullptr;
  size_t mappedSize_ = 0;
  uint8* data_ = nullptr;
  size_t size_ = 0;
};

}  // namespace tests

#endif
