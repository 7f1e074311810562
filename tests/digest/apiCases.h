// SPDX-License-Identifier: MIT
//
// Cases of every function: valid arguments from any numbers, in buffers of exactly the bytes that
// the call may touch.

#ifndef TESTS_API_CASES_H
#define TESTS_API_CASES_H

#include "digest/apiTable.h"
#include "digest/choices.h"

namespace tests {

/// Takes what a call gave back: results, records and whole buffers.
class Sink {
 public:
  virtual ~Sink() = default;
  virtual void add(const void* bytes, size_t size) = 0;
  template <class T> void addNumber(T value) { add(&value, sizeof value); }
};

/// Runs the case that the choices make and tells the sink all that came of it.
void runApiCase(const Api& api, Choices& choices, Sink& sink);

}  // namespace tests

#endif
