// SPDX-License-Identifier: MIT

#include "recorder.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "failure.h"

namespace tool::live {

Recorder::Recorder(const std::string& name, uint32 width, uint32 height)
    : path(name), start(Clock::now()) {
  constexpr mode_t kOwnerOnly = 0600;  // it shows all that the screen showed
  file = Descriptor(open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, kOwnerOnly));
  RecordingWriter::putHeader(width, height, out);
  write();
}

uint64 Recorder::timeOf(Clock::time_point now) const {
  const auto passed = std::chrono::duration_cast<std::chrono::microseconds>(now - start);
  return static_cast<uint64>(passed.count());
}

void Recorder::write() {
  const uint8* at = out.data();
  for (size_t left = out.size(); left != 0;) {
    const ssize_t count = ::write(file.get(), at, left);
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) throw Failure("cannot write '" + path + "': " + strerror(errno));
    at += count;
    left -= static_cast<size_t>(count);
  }
  out.clear();
}

void Recorder::record(Clock::time_point now, const PixelView& pixels, const ChangeList& changed) {
  writer.putUpdate(timeOf(now), pixels, changed.all(), out);
  write();
}

void Recorder::resize(Clock::time_point now, uint32 width, uint32 height) {
  RecordingWriter::putSize(timeOf(now), width, height, out);
  write();
}

void Recorder::finish() {
  if (fsync(file.get()) != 0 && errno != EINVAL && errno != EROFS)
    throw Failure("cannot write '" + path + "': " + strerror(errno));
}

}  // namespace tool::live
