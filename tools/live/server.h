// SPDX-License-Identifier: MIT
//
// The loop: one thread that waits for the screen, for viewers and for the end. Without viewers it
// captures nothing, and the screen tells it nothing.

#ifndef RASTER_TOOLS_LIVE_SERVER_H
#define RASTER_TOOLS_LIVE_SERVER_H

#include <chrono>
#include <list>
#include <memory>
#include <optional>

#include "connection.h"
#include "listener.h"
#include "liveScreen.h"
#include "recorder.h"
#include "serveOptions.h"
#include "stopSignals.h"

namespace tool::live {

class Server {
 public:
  explicit Server(const ServeOptions& chosen);

  /// Serves until a signal or, with --once, until the viewer has left.
  void run();

 private:
  using Clock = LiveScreen::Clock;

  bool turn();
  void attend(Clock::time_point now);
  void admit();
  void update();
  void updateThose(bool withCursor);
  template <class Condition> void dropIf(Condition isGone);
  void retire(Connection& viewer);

  bool isWatched() const { return recorder.has_value() || !viewers.empty(); }
  void listenToScreen(Clock::time_point now);
  void tellChanges();
  bool isAnyViewer(bool (Session::*is)() const) const;
  bool isAnyoneReady() const;
  bool isCapturePending() const { return screen.needsCapture() && isAnyoneReady(); }
  /// Whether one comes that needs no news of the display.
  bool isCaptureCertain() const { return screen.isDamaged() && isAnyoneReady(); }
  int timeout(Clock::time_point now) const;
  void printStatistics() const;

  const ServeOptions& options;
  Listener listener;
  StopSignals signals;
  LiveScreen screen;
  std::optional<Recorder> recorder;
  std::list<Connection> viewers;
  Changes changed;
  Clock::time_point nextListening;
  uint64 viewerCount = 0;
  uint64 sentPixels = 0;
  uint64 sentBytes = 0;
  uint64 movedPixels = 0;
};

}  // namespace tool::live

#endif
