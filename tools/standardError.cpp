// SPDX-License-Identifier: MIT

#include "standardError.h"

#include <cstdlib>
#include <cstring>

namespace tool {

// libpng reports to the stream `stderr` and the library installs nothing else, on purpose. With the
// GNU C library that stream is a variable.
CaughtStandardError::CaughtStandardError() : before(stderr), caught(open_memstream(&text, &size)) {
  if (caught != nullptr) stderr = caught;
}

CaughtStandardError::~CaughtStandardError() {
  stderr = before;
  if (caught != nullptr) fclose(caught);
  free(text);
}

std::string CaughtStandardError::remark() {
  if (caught == nullptr || fflush(caught) != 0 || size == 0) return {};
  return " (" + std::string(text, strcspn(text, "\n")) + ")";
}

}  // namespace tool
