// SPDX-License-Identifier: MIT

#include "stopSignals.h"

#include <sys/signalfd.h>

#include <csignal>

#include "failure.h"

namespace tool::live {

StopSignals::StopSignals() {
  sigset_t set;
  sigemptyset(&set);
  sigaddset(&set, SIGTERM);
  sigaddset(&set, SIGINT);
  sigprocmask(SIG_BLOCK, &set, nullptr);
  readable = Descriptor(signalfd(-1, &set, SFD_CLOEXEC | SFD_NONBLOCK));
  if (readable.get() < 0) throw Failure("cannot wait for signals");
}

}  // namespace tool::live
