// SPDX-License-Identifier: MIT

#include "support/guardedBuffer.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

namespace tests {

GuardedBuffer::GuardedBuffer(size_t size, Guard guard) : size_(size) {
  const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
  const size_t inner = (size + page - 1) / page * page;
  mappedSize_ = inner + 2 * page;
  mapping_ = mmap(nullptr, mappedSize_, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (mapping_ == MAP_FAILED) abort();
  uint8* first = static_cast<uint8*>(mapping_) + page;
  if (inner != 0 && mprotect(first, inner, PROT_READ | PROT_WRITE) != 0) abort();
  data_ = guard == Guard::kBefore ? first : first + (inner - size);
}

GuardedBuffer::~GuardedBuffer() { munmap(mapping_, mappedSize_); }

void GuardedBuffer::assign(const std::vector<uint8>& bytes) {
  if (bytes.size() != size_) abort();
  if (size_ != 0) memcpy(data_, bytes.data(), size_);
}

void GuardedBuffer::forbid() {
  if (mprotect(mapping_, mappedSize_, PROT_NONE) != 0) abort();
}

void GuardedBuffer::forbidWriting() {
  if (mprotect(mapping_, mappedSize_, PROT_READ) != 0) abort();
}

}  // namespace tests
