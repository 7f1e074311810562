// SPDX-License-Identifier: MIT
//
// A recording on its way to a file.

#ifndef RASTER_TOOLS_LIVE_RECORDER_H
#define RASTER_TOOLS_LIVE_RECORDER_H

#include <chrono>
#include <string>

#include "changeList.h"
#include "listener.h"
#include "recording.h"

namespace tool::live {

class Recorder {
 public:
  using Clock = std::chrono::steady_clock;

  Recorder(const std::string& name, uint32 width, uint32 height);

  void record(Clock::time_point now, const PixelView& pixels, const ChangeList& changed);
  void resize(Clock::time_point now, uint32 width, uint32 height);
  /// Fails when not everything could be written.
  void finish();

 private:
  uint64 timeOf(Clock::time_point now) const;
  void write();

  std::string path;
  Descriptor file;
  Clock::time_point start;
  RecordingWriter writer;
  Bytes out;
};

}  // namespace tool::live

#endif
